// app/IpcMessage.cpp - the messages of the command channel as they stand on the wire.
#include "app/IpcMessage.h"

#include <cstdint>
#include <cstring>

#include "encoding/Encoding.h"

namespace
{

enum { HAS_NAME = 1, HAS_FORMAT = 2, HAS_DATA = 4 };

struct Layout {
    IpcSide from;
    int code;
    int parts; // in this order
};

const Layout Layouts[] = {
    {IPC_FROM_CLIENT, IPC_EXECUTE, HAS_FORMAT | HAS_DATA},
    {IPC_FROM_CLIENT, IPC_REQUEST, HAS_NAME | HAS_FORMAT},
    {IPC_FROM_CLIENT, IPC_POKE, HAS_NAME | HAS_FORMAT | HAS_DATA},
    {IPC_FROM_CLIENT, IPC_ADVISE_START, HAS_NAME},
    {IPC_FROM_CLIENT, IPC_ADVISE_STOP, HAS_NAME},
    {IPC_FROM_CLIENT, IPC_CONNECT, HAS_NAME},
    {IPC_FROM_CLIENT, IPC_DISCONNECT, 0},
    {IPC_FROM_SERVER, IPC_ADVISE_START, 0},
    {IPC_FROM_SERVER, IPC_ADVISE, HAS_NAME | HAS_FORMAT | HAS_DATA},
    {IPC_FROM_SERVER, IPC_ADVISE_STOP, 0},
    {IPC_FROM_SERVER, IPC_REQUEST_REPLY, HAS_DATA},
    {IPC_FROM_SERVER, IPC_FAIL, 0},
    {IPC_FROM_SERVER, IPC_CONNECT, 0},
    {IPC_FROM_SERVER, IPC_DISCONNECT, 0},
};

struct Reader {
    const char *at;
    size_t left;
};

} // namespace

// --- Reading ---

static const Layout *FindLayout(IpcSide from, int code)
{
    for (const Layout &layout : Layouts)
        if (layout.from == from && layout.code == code)
            return &layout;
    return nullptr;
}

static IpcResult TakeByte(Reader *reader, int *value)
{
    if (reader->left < 1)
        return IPC_MORE;
    *value = static_cast<unsigned char>(*reader->at);
    ++reader->at;
    --reader->left;
    return IPC_COMPLETE;
}

static uint32_t Number(const char *bytes)
{
    uint32_t number = 0;
    for (int i = 3; i >= 0; --i)
        number = number << 8 | static_cast<unsigned char>(bytes[i]);
    return number;
}

static IpcResult TakeBlock(Reader *reader, size_t bound, std::string *block)
{
    if (reader->left < 4)
        return IPC_MORE;
    size_t size = Number(reader->at);
    if (size > bound)
        return IPC_BAD;
    if (reader->left - 4 < size)
        return IPC_MORE;
    block->assign(reader->at + 4, size);
    reader->at += 4 + size;
    reader->left -= 4 + size;
    return IPC_COMPLETE;
}

static IpcResult TakeParts(Reader *reader, int parts, IpcMessage *message)
{
    IpcResult result = IPC_COMPLETE;
    if (parts & HAS_NAME)
        result = TakeBlock(reader, IPC_NAME_SIZE, &message->name);
    if (result == IPC_COMPLETE && (parts & HAS_FORMAT))
        result = TakeByte(reader, &message->format);
    if (result == IPC_COMPLETE && (parts & HAS_DATA))
        result = TakeBlock(reader, IPC_DATA_SIZE, &message->data);
    return result;
}

IpcResult Ipc_Decode(IpcSide from, const char *bytes, size_t length, IpcMessage *message,
                     size_t *used)
{
    Reader reader = {bytes, length};
    IpcMessage taken = {};
    if (TakeByte(&reader, &taken.code) == IPC_MORE)
        return IPC_MORE;
    const Layout *layout = FindLayout(from, taken.code);
    if (!layout)
        return IPC_BAD;
    IpcResult result = TakeParts(&reader, layout->parts, &taken);
    if (result != IPC_COMPLETE)
        return result;
    *message = taken;
    *used = length - reader.left;
    return IPC_COMPLETE;
}

// --- Text ---

// 0 when the value is no character.
static int AppendCharacter(std::string *text, uint32_t character)
{
    if (!Enc_IsCharacter(character))
        return 0;
    char bytes[ENC_LONGEST];
    text->append(bytes, Enc_PutUtf8(bytes, character));
    return 1;
}

// Senders write these in the order of their machine, which is this one.
template <typename Unit> static Unit UnitAt(const std::string &data, size_t index)
{
    Unit unit;
    memcpy(&unit, data.data() + index * sizeof unit, sizeof unit);
    return unit;
}

// How many come before the first zero.
template <typename Unit> static size_t CountUnits(const std::string &data)
{
    size_t count = 0;
    while (count < data.size() / sizeof(Unit) && UnitAt<Unit>(data, count) != 0)
        ++count;
    return count;
}

static int TextFromUtf32(const std::string &data, std::string *text)
{
    if (data.size() % 4 != 0)
        return 0;
    size_t count = CountUnits<uint32_t>(data);
    for (size_t i = 0; i < count; ++i)
        if (!AppendCharacter(text, UnitAt<uint32_t>(data, i)))
            return 0;
    return 1;
}

static int TextFromUtf16(const std::string &data, std::string *text)
{
    if (data.size() % 2 != 0)
        return 0;
    size_t count = CountUnits<uint16_t>(data);
    for (size_t i = 0; i < count; ++i) {
        uint32_t unit = UnitAt<uint16_t>(data, i);
        uint32_t next = i + 1 < count ? UnitAt<uint16_t>(data, i + 1) : 0;
        uint32_t joined = Enc_JoinSurrogates(unit, next);
        if (!AppendCharacter(text, joined ? joined : unit))
            return 0;
        i += joined != 0;
    }
    return 1;
}

int Ipc_CommandText(const IpcMessage *message, std::string *text)
{
    text->clear();
    switch (message->format) {
    case IPC_TEXT:
    case IPC_PRIVATE:
    case IPC_UTF8_TEXT:
        text->assign(message->data.c_str());
        return 1;
    case IPC_UTF16_TEXT:
        return TextFromUtf16(message->data, text);
    case IPC_UTF32_TEXT:
        return TextFromUtf32(message->data, text);
    }
    return 0;
}

// --- Writing ---

static std::string Block(const char *bytes, size_t size)
{
    std::string block;
    for (int shift = 0; shift < 32; shift += 8)
        block += static_cast<char>(size >> shift & 0xFF);
    return block.append(bytes, size);
}

static std::string Name(const char *name)
{
    return Block(name, strlen(name));
}

// Format and data.
static std::string Text(const char *text)
{
    char format = Enc_IsUtf8(text, strlen(text)) ? IPC_UTF8_TEXT : IPC_TEXT;
    return format + Block(text, strlen(text) + 1);
}

std::string Ipc_CodeAlone(IpcCode code)
{
    return std::string(1, static_cast<char>(code));
}

std::string Ipc_Connect(const char *topic)
{
    return Ipc_CodeAlone(IPC_CONNECT) + Name(topic);
}

std::string Ipc_Execute(const char *text)
{
    return Ipc_CodeAlone(IPC_EXECUTE) + Text(text);
}

std::string Ipc_Request(const char *item)
{
    return Ipc_CodeAlone(IPC_REQUEST) + Name(item) + static_cast<char>(IPC_TEXT);
}

std::string Ipc_Poke(const char *item, const char *text)
{
    return Ipc_CodeAlone(IPC_POKE) + Name(item) + Text(text);
}

std::string Ipc_Advise(const char *item, const char *text)
{
    return Ipc_CodeAlone(IPC_ADVISE) + Name(item) + Text(text);
}

std::string Ipc_Reply(const std::string &data)
{
    return Ipc_CodeAlone(IPC_REQUEST_REPLY) + Block(data.data(), data.size());
}
