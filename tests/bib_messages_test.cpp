// tests/bib_messages_test.cpp - the parser's messages: counted, logged, kept.
#include "store/BibStore.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "tests/support/LoadText.h"
#include "tests/support/LogCapture.h"

namespace
{

class BibMessages : public testing::Test
{
protected:
    void SetUp() override { Bib_Initialize(); }
};

void Report(int errorClass, int line, const std::string &message)
{
    Bib_ReportMessage("ignored", errorClass, "ignored.bib", line, "ignored", 7, message.c_str());
}

} // namespace

TEST_F(BibMessages, NameTheLineOfASyntaxError)
{
    BibFile *file = LoadText(std::string(11, '\n') + "@article{key, title = , }\n");
    EXPECT_EQ(1, file->errorCount);
    EXPECT_EQ(0, file->warningCount);
    EXPECT_EQ(0u, Messages(file).find("SYNTAX ERROR: line 12: "));
    EXPECT_EQ(Messages(file).size() - 2, Messages(file).find("\r\n"));
    Bib_FreeFile(file);
}

TEST_F(BibMessages, ArePrefixedAndCountedByTheirClass)
{
    BibFile *file = LoadText("");
    EXPECT_EQ(nullptr, file->messages);
    BibCurrentFile = file;
    for (int errorClass = 0; errorClass < 8; ++errorClass)
        Report(errorClass, 10 + errorClass, "text");
    EXPECT_STREQ("INFO: line 10: text\r\n"
                 "WARNING: line 11: text\r\n"
                 "WARNING: line 12: text\r\n"
                 "WARNING: line 13: text\r\n"
                 "ERROR: line 14: text\r\n"
                 "SYNTAX ERROR: line 15: text\r\n"
                 "FATAL ERROR: line 16: text\r\n"
                 "INTERNAL ERROR: line 17: text\r\n",
                 file->messages);
    EXPECT_EQ(3, file->warningCount);
    EXPECT_EQ(4, file->errorCount);
    Bib_FreeFile(file);
}

TEST_F(BibMessages, AreTextNotAFormat)
{
    BibFile *file = LoadText("@a{k, x = y {%n%s%999999999d}}\n@b{l, z = 1}\n");
    EXPECT_NE(std::string::npos, Messages(file).find("found \"{%n%s%999999999d}\""))
        << Messages(file);
    EXPECT_EQ(1, file->errorCount);
    Bib_FreeFile(file);
}

TEST_F(BibMessages, NameTheFieldThatStartsWithADigit)
{
    BibFile *file = LoadText("@a{k, 1title = {x}}\n");
    EXPECT_NE(std::string::npos,
              Messages(file).find("invalid field name \"1title\": cannot start with digit"));
    Bib_FreeFile(file);
}

TEST_F(BibMessages, LeaveAFileWithWarningsWritable)
{
    BibFile *file = LoadText("junk\n@misc{k, title = {x}}\n");
    EXPECT_EQ(1, file->warningCount);
    EXPECT_EQ(0, file->errorCount);
    EXPECT_EQ(0, file->readOnly);
    Bib_FreeFile(file);
}

TEST_F(BibMessages, AreKeptUpToEightKilobytesAndCountedBeyond)
{
    BibFile *file = LoadText("");
    BibCurrentFile = file;
    // "ERROR: line 1: " is 15 characters; each line takes 117 bytes.
    for (int i = 0; i < 100; ++i)
        Report(4, 1, std::string(100, 'x'));
    EXPECT_EQ(100, file->errorCount);
    EXPECT_EQ(117u * 69, strlen(file->messages)); // the 70th would need 69 * 117 + 115 < 8188
    Bib_FreeFile(file);
}

TEST_F(BibMessages, FillTheBufferToItsBoundExactly)
{
    BibFile *file = LoadText("");
    BibCurrentFile = file;
    Report(4, 1, std::string(8187 - 15, 'x')); // sum 8187: fits
    EXPECT_EQ(8189u, strlen(file->messages));
    Report(4, 1, "x");
    EXPECT_EQ(8189u, strlen(file->messages));
    EXPECT_EQ(2, file->errorCount);
    Bib_FreeFile(file);

    file = LoadText("");
    BibCurrentFile = file;
    Report(4, 1, std::string(8188 - 15, 'x')); // sum 8188: dropped
    EXPECT_STREQ("", file->messages);
    Bib_FreeFile(file);
}

TEST(BibMessagesLog, TellsOfEveryMessageAndEveryDrop)
{
    std::string log = LogOf("1", [] {
        Bib_Initialize();
        BibFile *file = LoadText("");
        BibCurrentFile = file;
        Report(2, 3, "something odd");
        Report(4, 1, std::string(9000, 'x'));
        Bib_FreeFile(file);
    });
    EXPECT_NE(std::string::npos, log.find("Cartulo: WARNING: line 3: something odd\n"));
    EXPECT_NE(std::string::npos,
              log.find("Cartulo: WARNIG: Too many errors/warnings, forget last messages.\n"));
}

TEST_F(BibMessages, ReachTheFileAlsoInThisProcess)
{
    BibFile *file = LoadText("");
    BibCurrentFile = nullptr;
    Report(4, 1, "nobody is loading");
    EXPECT_EQ(0, file->errorCount);
    Bib_FreeFile(file);
}
