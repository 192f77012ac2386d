// tests/log_test.cpp - the program's trace lines.
#include "tests/support/LogCapture.h"

#include <fstream>
#include <sstream>

#include <sys/socket.h>

#include "base/Companion.h"
#include "base/Log.h"

namespace
{

// The level that AppLog gives to a text: the highest one at which the line is still shown.
int LevelOf(const char *first, const char *second = nullptr)
{
    for (int level = 6; level > 0; --level) {
        if (!LogOf(std::to_string(level).c_str(), [&] { AppLog(first, second); }).empty())
            return level;
    }
    return 0;
}

std::string LineOf(const std::string &first, const char *second = nullptr)
{
    return LogOf("1", [&] { AppLog(first.c_str(), second); });
}

std::string LevelsShown(const char *setting)
{
    return LogOf(setting, [] {
        for (int level : {1, 2, 3, 4, 5, 260})
            TNSMessage("", std::to_string(level).c_str(), level);
    });
}

struct LogFile : testing::Test {
    void SetUp() override
    {
        char name[] = "/tmp/cartulo-log-XXXXXX";
        ASSERT_TRUE(mkdtemp(name));
        folder = name;
        path = folder + "/log";
    }

    void TearDown() override
    {
        unlink(path.c_str());
        rmdir(folder.c_str());
    }

    std::string Contents() const
    {
        std::stringstream text;
        text << std::ifstream(path).rdbuf();
        return text.str();
    }

    std::string folder, path;
};

} // namespace

TEST(AppLog, WritesOneLineWithThePrefixAndBothTexts)
{
    EXPECT_EQ("Cartulo: one, two\n", LineOf("one, ", "two"));
    EXPECT_EQ("Cartulo: one\n", LineOf("one"));
    EXPECT_EQ("Cartulo: \n", LineOf(""));
}

TEST(AppLog, TakesPercentSignsLiterally)
{
    EXPECT_EQ("Cartulo: 100%s %n%d\n", LineOf("100%s ", "%n%d"));
}

TEST(AppLog, TracesAtLevelOne)
{
    EXPECT_EQ(1, LevelOf("strconv in: x"));
    EXPECT_EQ(1, LevelOf("INFO: Selecting Encoding: ", "CP1250"));
}

TEST(AppLog, PutsStartsOfProgramsAndFilesAtLevelTwo)
{
    EXPECT_EQ(2, LevelOf("Run metahelp"));
    EXPECT_EQ(2, LevelOf("Open refs.bib"));
    EXPECT_EQ(2, LevelOf("Launch it"));
    EXPECT_EQ(2, LevelOf("Opening refs.bib")); // it starts with "Open"
    EXPECT_EQ(2, LevelOf("Open", "ed with an ERROR and a WARNING"));
}

TEST(AppLog, LooksForThoseWordsAtTheVeryStartAndInThisCase)
{
    EXPECT_EQ(1, LevelOf(" Open"));
    EXPECT_EQ(1, LevelOf("Will Run"));
    EXPECT_EQ(1, LevelOf("open"));
    EXPECT_EQ(1, LevelOf("RUN"));
    EXPECT_EQ(1, LevelOf("Laun"));
}

TEST(AppLog, RanksWarningsAndErrorsOneStepLower)
{
    EXPECT_EQ(3, LevelOf("a WARNING"));
    EXPECT_EQ(4, LevelOf("an ERROR"));
    EXPECT_EQ(1, LevelOf("a warning, an error"));
}

TEST(AppLog, TestsForWarningBeforeError)
{
    EXPECT_EQ(3, LevelOf("ERROR or WARNING"));
    EXPECT_EQ(3, LevelOf("WARNING or ERROR"));
}

TEST(AppLog, FindsTheLevelInTheJoinedText)
{
    EXPECT_EQ(4, LevelOf("ERR", "OR: no"));
    EXPECT_EQ(2, LevelOf("", "Run"));
}

TEST(AppLog, IgnoresLevelWordsThatWereCutOff)
{
    EXPECT_EQ(1, LevelOf(std::string(507, 'x').c_str(), "ERROR"));
    EXPECT_EQ(4, LevelOf(std::string(506, 'x').c_str(), "ERROR"));
}

TEST(AppLog, CutsALongFirstTextAndDropsTheSecond)
{
    EXPECT_EQ("Cartulo: " + std::string(511, 'x') + "\n", LineOf(std::string(600, 'x'), "second"));
}

TEST(AppLog, CutsTheSecondTextToTheRoomThatIsLeft)
{
    std::string first(508, 'x');
    EXPECT_EQ("Cartulo: " + first + "sec\n", LineOf(first, "second"));
    std::string full(511, 'x');
    EXPECT_EQ("Cartulo: " + full + "\n", LineOf(full, "second"));
}

TEST(TNSMessage, ShowsWarningsErrorsAndAssertionsByDefault)
{
    EXPECT_EQ("4\n5\n260\n", LevelsShown(nullptr));
}

TEST(TNSMessage, ShowsFromTheLevelOfTheSettingOn)
{
    EXPECT_EQ("1\n2\n3\n4\n5\n260\n", LevelsShown("1"));
    EXPECT_EQ("3\n4\n5\n260\n", LevelsShown("3"));
    EXPECT_EQ("", LevelsShown("6"));
    EXPECT_EQ("1\n2\n3\n4\n5\n260\n", LevelsShown("-1"));
    EXPECT_EQ("", LevelsShown("99999999999999999999"));
}

TEST(TNSMessage, CountsAnAssertionAsLevelFour)
{
    EXPECT_EQ("5\n", LevelsShown("5"));
}

TEST(TNSMessage, UsesTheDefaultWhenTheLevelIsNoNumber)
{
    for (const char *setting : {"", "all", "1x", ":", "x:", "+"})
        EXPECT_EQ("4\n5\n260\n", LevelsShown(setting)) << setting;
}

TEST(TNSMessage, UsesStandardErrorWhenTheFileNameIsEmpty)
{
    EXPECT_EQ("5\n", LevelsShown("5:"));
}

TEST(TNSMessage, UsesStandardErrorWhenTheFileCannotBeOpened)
{
    EXPECT_EQ("5\n", LevelsShown("5:/no such folder/log"));
}

TEST(TNSMessage, ShowsControlCharactersAsBlanks)
{
    std::string log = LogOf(nullptr, [] { TNSMessage("a\nb: ", "one\r\ntwo\x1B[2Jend\n", 5); });
    EXPECT_EQ("a b: one  two [2Jend \n", log);
    std::string controls = "\x7F";
    for (char c = 1; c < ' '; ++c)
        controls += c;
    EXPECT_EQ(std::string(32, ' ') + "\n",
              LogOf(nullptr, [&] { TNSMessage("", controls.c_str(), 5); }));
}

TEST(TNSMessage, KeepsEveryOtherByte)
{
    std::string bytes;
    for (int c = ' '; c < 256; ++c)
        bytes += c == 127 ? "" : std::string(1, static_cast<char>(c));
    EXPECT_EQ(bytes + "\n", LogOf(nullptr, [&] { TNSMessage("", bytes.c_str(), 5); }));
}

TEST(TNSMessage, WritesEveryLineAtOnceAndInOnePiece)
{
    int ends[2]; // keeps writes apart
    ASSERT_EQ(0, socketpair(AF_UNIX, SOCK_DGRAM, 0, ends));
    std::string text(20000, 'x');
    LogOf(nullptr, [&] {
        dup2(ends[1], STDERR_FILENO);
        TNSMessage("first ", text.c_str(), 5);
        TNSMessage("second ", "line", 5);
    });
    std::string received(30000, 0);
    ssize_t length = recv(ends[0], &received[0], received.size(), MSG_DONTWAIT);
    ASSERT_GT(length, 0);
    EXPECT_EQ("first " + text + "\n", received.substr(0, length));
    length = recv(ends[0], &received[0], received.size(), MSG_DONTWAIT);
    ASSERT_GT(length, 0);
    EXPECT_EQ("second line\n", received.substr(0, length));
    close(ends[0]);
    close(ends[1]);
}

TEST(TNSMessage, SurvivesAFullDisk)
{
    LogOf("1:/dev/full", [] { TNSMessage("a ", "b", 5); }); // expects a clean end
}

TEST_F(LogFile, IsAppendedTo)
{
    std::ofstream(path) << "from before\n";
    EXPECT_EQ("", LogOf(("5:" + path).c_str(), [] { TNSMessage("ERROR: ", "now", 5); }));
    EXPECT_EQ("from before\nERROR: now\n", Contents());
}

TEST_F(LogFile, HoldsEveryLineBeforeTheProgramEnds)
{
    LogOf(("1:" + path).c_str(), [this] {
        TNSMessage("a ", "b", 1);
        if (Contents() != "a b\n")
            abort();
    });
}

TEST_F(LogFile, IsUsedWhenTheLevelIsNoNumber)
{
    LogOf((":" + path).c_str(), [] {
        TNSMessage("", "hidden", 3);
        TNSMessage("", "shown", 4);
    });
    EXPECT_EQ("shown\n", Contents());
}

TEST_F(LogFile, MayHaveAColonInItsName)
{
    path = folder + "/a:b";
    LogOf(("1:" + path).c_str(), [] { TNSMessage("", "here", 1); });
    EXPECT_EQ("here\n", Contents());
}

TEST_F(LogFile, GetsLongLinesInOneWrite)
{
    // Two programs share the file: whole lines, whoever writes when.
    std::string setting = "1:" + path;
    auto writer = [](char letter) {
        std::string text(9000, letter);
        for (int i = 0; i < 200; ++i)
            TNSMessage("", text.c_str(), 1);
    };
    LogOf(setting.c_str(), [&] {
        pid_t other = fork();
        writer(other == 0 ? 'a' : 'b');
        if (other == 0)
            _exit(0);
        waitpid(other, nullptr, 0);
    });
    std::istringstream lines(Contents());
    int count = 0;
    for (std::string line; std::getline(lines, line); ++count)
        ASSERT_TRUE(line == std::string(9000, 'a') || line == std::string(9000, 'b'));
    EXPECT_EQ(400, count);
}

TEST(LogCharacter, IsABlankForWhatCannotBeShown)
{
    for (uint32_t c : {0x0, 0x1, 0x9, 0xD, 0x1B, 0x1F, 0x7F, 0x80, 0x9F, 0xD800, 0xDFFF})
        EXPECT_EQ(uint32_t(' '), Log_Character(c)) << c;
    for (uint32_t c : {0x20, 0x41, 0x7E, 0xA0, 0xFC, 0x44C, 0xD7FF, 0xE000, 0xFFFD})
        EXPECT_EQ(c, Log_Character(c));
}
