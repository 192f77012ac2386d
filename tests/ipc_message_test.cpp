// tests/ipc_message_test.cpp - the messages of the command channel.

#include "app/IpcMessage.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <string>
#include <vector>

namespace
{

using namespace std::string_literals;

// What one message came to, in a line.
std::string Show(IpcResult result, const IpcMessage &message)
{
    if (result != IPC_COMPLETE)
        return result == IPC_BAD ? "bad" : "more";
    return std::to_string(message.code) + " name=" + message.name +
           " format=" + std::to_string(message.format) + " data=" + message.data;
}

std::string Decoded(IpcSide from, const std::string &bytes)
{
    IpcMessage message = {};
    size_t used = 0;
    IpcResult result = Ipc_Decode(from, bytes.data(), bytes.size(), &message, &used);
    EXPECT_EQ(result == IPC_COMPLETE ? bytes.size() : 0, used);
    return Show(result, message);
}

struct Case {
    IpcSide from;
    std::string bytes, shown;
};

const Case Messages[] = {
    {IPC_FROM_CLIENT, "\x0A\x0B\0\0\0CommandLine"s, "10 name=CommandLine format=0 data="},
    {IPC_FROM_CLIENT, "\x0A\0\0\0\0"s, "10 name= format=0 data="},
    {IPC_FROM_CLIENT, "\x01\x11\x06\0\0\0a.bib\0"s, "1 name= format=17 data=a.bib\0"s},
    {IPC_FROM_CLIENT, "\x01\x14\0\0\0\0"s, "1 name= format=20 data="},
    {IPC_FROM_CLIENT, "\x02\x04\0\0\0Date\x01"s, "2 name=Date format=1 data="},
    {IPC_FROM_CLIENT, "\x03\x04\0\0\0Date\x01\x02\0\0\0x\0"s, "3 name=Date format=1 data=x\0"s},
    {IPC_FROM_CLIENT, "\x04\x02\0\0\0me"s, "4 name=me format=0 data="},
    {IPC_FROM_CLIENT, "\x07\x02\0\0\0me"s, "7 name=me format=0 data="},
    {IPC_FROM_CLIENT, "\x0B"s, "11 name= format=0 data="},
    {IPC_FROM_SERVER, "\x04"s, "4 name= format=0 data="},
    {IPC_FROM_SERVER, "\x06\x02\0\0\0me\x11\x03\0\0\0abc"s, "6 name=me format=17 data=abc"},
    {IPC_FROM_SERVER, "\x07"s, "7 name= format=0 data="},
    {IPC_FROM_SERVER,
     "\x08\x03\0\0\0"
     "123"s,
     "8 name= format=0 data=123"},
    {IPC_FROM_SERVER, "\x09"s, "9 name= format=0 data="},
    {IPC_FROM_SERVER, "\x0A"s, "10 name= format=0 data="},
    {IPC_FROM_SERVER, "\x0B"s, "11 name= format=0 data="},
};

TEST(IpcDecode, ReadsEveryMessage)
{
    for (const Case &item : Messages)
        EXPECT_EQ(item.shown, Decoded(item.from, item.bytes));
}

TEST(IpcDecode, WaitsAtEverySplitPoint)
{
    for (const Case &item : Messages)
        for (size_t length = 0; length < item.bytes.size(); ++length)
            EXPECT_EQ("more", Decoded(item.from, item.bytes.substr(0, length)))
                << item.shown << " at " << length;
}

TEST(IpcDecode, TakesNoByteOfTheNextMessage)
{
    std::string all;
    for (const Case &item : Messages)
        if (item.from == IPC_FROM_CLIENT)
            all += item.bytes;
    for (const Case &item : Messages) {
        if (item.from != IPC_FROM_CLIENT)
            continue;
        IpcMessage message = {};
        size_t used = 0;
        IpcResult result = Ipc_Decode(IPC_FROM_CLIENT, all.data(), all.size(), &message, &used);
        EXPECT_EQ(item.shown, Show(result, message));
        EXPECT_EQ(item.bytes.size(), used);
        all.erase(0, used);
    }
    EXPECT_EQ("", all);
}

TEST(IpcDecode, RefusesWhatTheOtherSideSends)
{
    for (int code = 0; code < 256; ++code) {
        for (IpcSide from : {IPC_FROM_CLIENT, IPC_FROM_SERVER}) {
            bool known = false;
            for (const Case &item : Messages)
                known |= item.from == from && item.bytes[0] == static_cast<char>(code);
            std::string bytes(1, static_cast<char>(code));
            EXPECT_EQ(!known, Decoded(from, bytes) == "bad") << code;
        }
    }
}

std::string Length(uint32_t length)
{
    std::string bytes;
    for (int i = 0; i < 4; ++i)
        bytes += static_cast<char>(length >> (8 * i));
    return bytes;
}

TEST(IpcDecode, BoundsNamesAsSoonAsItSeesTheirLength)
{
    for (const char *code : {"\x02", "\x03", "\x04", "\x07", "\x0A"}) {
        EXPECT_EQ("more", Decoded(IPC_FROM_CLIENT, code + Length(256)));
        EXPECT_EQ("bad", Decoded(IPC_FROM_CLIENT, code + Length(257)));
        EXPECT_EQ("bad", Decoded(IPC_FROM_CLIENT, code + Length(0xFFFFFFFF)));
    }
    EXPECT_EQ("4 name=" + std::string(256, 'x') + " format=0 data=",
              Decoded(IPC_FROM_CLIENT, "\x04" + Length(256) + std::string(256, 'x')));
}

TEST(IpcDecode, BoundsDataAsSoonAsItSeesItsLength)
{
    for (const std::string &start : {"\x01\x11"s, "\x03\x01\0\0\0x\x01"s}) {
        EXPECT_EQ("more", Decoded(IPC_FROM_CLIENT, start + Length(65536)));
        EXPECT_EQ("bad", Decoded(IPC_FROM_CLIENT, start + Length(65537)));
        EXPECT_EQ("bad", Decoded(IPC_FROM_CLIENT, start + Length(0x80000000)));
    }
    EXPECT_EQ("bad", Decoded(IPC_FROM_SERVER, "\x08" + Length(0xFFFFFFFF)));
    EXPECT_EQ("1 name= format=17 data=" + std::string(65536, 'x'),
              Decoded(IPC_FROM_CLIENT, "\x01\x11" + Length(65536) + std::string(65536, 'x')));
}

TEST(IpcDecode, LeavesTheMessageAloneUntilItIsComplete)
{
    IpcMessage message = {1, 2, "name", "data"};
    size_t used = 7;
    std::string bytes = "\x03\x01\0\0\0x\x01\x03\0\0\0a"s;
    EXPECT_EQ(IPC_MORE, Ipc_Decode(IPC_FROM_CLIENT, bytes.data(), bytes.size(), &message, &used));
    EXPECT_EQ("1 name=name format=2 data=data", Show(IPC_COMPLETE, message));
    EXPECT_EQ(7u, used);
}

// --- Text ---

const std::string Refused = "(refused)";

std::string CommandText(int format, const std::string &data)
{
    std::string text = "old";
    IpcMessage message = {IPC_EXECUTE, format, "", data};
    return Ipc_CommandText(&message, &text) ? text : Refused;
}

template <typename Character> std::string Bytes(const std::basic_string<Character> &text)
{
    return {reinterpret_cast<const char *>(text.data()), text.size() * sizeof(Character)};
}

TEST(IpcCommandText, TakesBytesAsTheyAre)
{
    for (int format : {IPC_TEXT, IPC_PRIVATE, IPC_UTF8_TEXT}) {
        EXPECT_EQ("\"M\xFCller.bib\" \xC3\xBC", CommandText(format, "\"M\xFCller.bib\" \xC3\xBC"));
        EXPECT_EQ("a.bib", CommandText(format, "a.bib\0"s));
        EXPECT_EQ("a", CommandText(format, "a\0b.bib\0"s));
        EXPECT_EQ("", CommandText(format, ""));
    }
}

TEST(IpcCommandText, ConvertsWideText)
{
    EXPECT_EQ("a\xC3\xBC\xE2\x82\xAC\xF0\x9F\x98\x80",
              CommandText(IPC_UTF32_TEXT, Bytes(U"a\u00FC\u20AC\U0001F600\0rest"s)));
    EXPECT_EQ("a\xC3\xBC\xE2\x82\xAC\xF0\x9F\x98\x80",
              CommandText(IPC_UTF16_TEXT, Bytes(u"a\u00FC\u20AC\U0001F600\0rest"s)));
    EXPECT_EQ("\x7F\xC2\x80\xDF\xBF\xE0\xA0\x80\xEF\xBF\xBF\xF0\x90\x80\x80\xF4\x8F\xBF\xBF",
              CommandText(IPC_UTF32_TEXT, Bytes(U"\x7F\x80\x7FF\x800\xFFFF\x10000\x10FFFF"s)));
    EXPECT_EQ("ab", CommandText(IPC_UTF32_TEXT, Bytes(U"ab"s)));
    EXPECT_EQ("", CommandText(IPC_UTF16_TEXT, ""));
}

TEST(IpcCommandText, RefusesBrokenWideText)
{
    EXPECT_EQ(Refused, CommandText(IPC_UTF32_TEXT, "abc"));
    EXPECT_EQ(Refused, CommandText(IPC_UTF16_TEXT, "abc"));
    for (char32_t character : {0xD800, 0xDFFF, 0x110000, 0x7FFFFFFF})
        EXPECT_EQ(Refused, CommandText(IPC_UTF32_TEXT, Bytes(std::u32string(1, character))));
    for (const std::u16string &text : {u"\xD83D"s, u"\xDE00"s, u"\xD83Dx"s, u"\xDE00\xD83D"s})
        EXPECT_EQ(Refused, CommandText(IPC_UTF16_TEXT, Bytes(text)));
}

TEST(IpcCommandText, RefusesEveryOtherFormat)
{
    for (int format = 0; format < 256; ++format) {
        bool text = format == 1 || format == 13 || format == 17 || format == 18 || format == 20;
        EXPECT_EQ(text ? "" : Refused, CommandText(format, "")) << format;
    }
}

// --- Building ---

TEST(IpcBuild, WritesWhatTheToolkitWrites)
{
    EXPECT_EQ("\x0A\x0B\0\0\0CommandLine"s, Ipc_Connect("CommandLine"));
    EXPECT_EQ("\x01\x11\x06\0\0\0a.bib\0"s, Ipc_Execute("a.bib"));
    EXPECT_EQ("\x02\x04\0\0\0Date\x01"s, Ipc_Request("Date"));
    EXPECT_EQ("\x03\x04\0\0\0Date\x11\x02\0\0\0x\0"s, Ipc_Poke("Date", "x"));
    EXPECT_EQ("\x06\x02\0\0\0me\x11\x02\0\0\0x\0"s, Ipc_Advise("me", "x"));
    EXPECT_EQ("\x08\x03\0\0\0"
              "123"s,
              Ipc_Reply("123"));
    EXPECT_EQ("\x0B", Ipc_CodeAlone(IPC_DISCONNECT));
    EXPECT_EQ("\x01\x11"s + Length(0x203) + std::string(0x202, 'a') + '\0',
              Ipc_Execute(std::string(0x202, 'a').c_str()));
}

TEST(IpcExecute, NamesTheFormatThatTheBytesHave)
{
    for (const char *text : {"", "abc", "\xC2\x80", "\xDF\xBF", "\xE0\xA0\x80", "\xED\x9F\xBF",
                             "\xEE\x80\x80", "\xF0\x90\x80\x80", "\xF4\x8F\xBF\xBF"})
        EXPECT_EQ(IPC_UTF8_TEXT, Ipc_Execute(text)[1]) << text;
    for (const char *text : {"M\xFCller", "\x80", "\xC3", "\xC3(", "\xC1\x81", "\xE0\x80\x80",
                             "\xE2\x82", "\xE2\x82(", "\xED\xA0\x80", "\xF0\x80\x80\x80",
                             "\xF0\x9F\x98", "\xF4\x90\x80\x80", "\xF5\x80\x80\x80", "\xFF"})
        EXPECT_EQ(IPC_TEXT, Ipc_Execute(text)[1]) << text;
}

} // namespace
