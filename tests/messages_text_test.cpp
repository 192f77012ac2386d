// tests/messages_text_test.cpp - what the loading-messages window says.
#include <cstring>

#include <gtest/gtest.h>

#include "encoding/Encoding.h"
#include "session/MessagesText.h"

static std::wstring Widen(const char *text)
{
    return std::wstring(text, text + strlen(text));
}

class MessagesText : public testing::Test
{
protected:
    void SetUp() override
    {
        Enc_Select("CP1252");
        file.path = path;
        set.files = files;
        set.count = 1;
    }

    char path[32] = "/b/refs.bib";
    char log[64] = "";
    char loadErrors[64] = "ERROR: The file 'gone' not found\n";
    BibFile file = {};
    BibFile *files[2] = {&file, &file};
    BibFileSet set = {};
};

TEST_F(MessagesText, NamesACleanFileAndNothingElse)
{
    EXPECT_EQ(L"The file: '/b/refs.bib':\n\n", Messages_Text(&set, Widen));
    EXPECT_EQ(MESSAGES_NONE, Messages_Verdict(&set));
    EXPECT_FALSE(Messages_HasCounts(&set));
    EXPECT_STREQ("There is no any messages related with loading BIB-files",
                 Messages_Heading(MESSAGES_NONE));
}

TEST_F(MessagesText, CountsOneErrorAndThreeWarnings)
{
    file.errorCount = 1;
    file.warningCount = 3;
    file.messages = strcpy(log, "SYNTAX ERROR: line 12: bad\n");
    EXPECT_EQ(L"The file: '/b/refs.bib' has 1 error and 3 warnings:\n"
              L"SYNTAX ERROR: line 12: bad\n\n",
              Messages_Text(&set, Widen));
}

TEST_F(MessagesText, LeavesOutACountOfZero)
{
    file.errorCount = 2;
    EXPECT_EQ(L"The file: '/b/refs.bib' has 2 errors:\n\n", Messages_Text(&set, Widen));
    file.errorCount = 0;
    file.warningCount = 1;
    EXPECT_EQ(L"The file: '/b/refs.bib' has 1 warning:\n\n", Messages_Text(&set, Widen));
}

TEST_F(MessagesText, StartsWithTheLoadErrorsAndListsEveryFile)
{
    set.loadErrors = loadErrors;
    set.count = 2;
    EXPECT_EQ(L"ERROR: The file 'gone' not found\n"
              L"The file: '/b/refs.bib':\n\nThe file: '/b/refs.bib':\n\n",
              Messages_Text(&set, Widen));
}

TEST_F(MessagesText, ShowsBytesOfTheFileInTheSelectedCodePage)
{
    file.messages = strcpy(log, "near \xFC\n");
    EXPECT_EQ(L"The file: '/b/refs.bib':\nnear \u00FC\n\n", Messages_Text(&set, Widen));
}

TEST_F(MessagesText, TurnsToWarningsAndThenToErrors)
{
    file.warningCount = 1;
    EXPECT_EQ(MESSAGES_WARNINGS, Messages_Verdict(&set));
    EXPECT_TRUE(Messages_HasCounts(&set));
    EXPECT_STREQ("There are warnings in loading BIB files", Messages_Heading(MESSAGES_WARNINGS));
    file.errorCount = 1;
    EXPECT_EQ(MESSAGES_ERRORS, Messages_Verdict(&set));
    EXPECT_STREQ("There are errors in loading BIB files", Messages_Heading(MESSAGES_ERRORS));
}

TEST_F(MessagesText, TreatsAMissingFileAloneAsAnError)
{
    set.count = 0;
    set.loadErrors = loadErrors;
    EXPECT_EQ(MESSAGES_ERRORS, Messages_Verdict(&set));
    EXPECT_FALSE(Messages_HasCounts(&set));
}

TEST_F(MessagesText, TreatsAnEmptyErrorTextAsNone)
{
    loadErrors[0] = 0;
    set.loadErrors = loadErrors;
    EXPECT_EQ(MESSAGES_NONE, Messages_Verdict(&set));
}
