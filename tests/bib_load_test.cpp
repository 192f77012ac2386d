// tests/bib_load_test.cpp - what a load makes of files, sound and broken.
#include "store/BibStore.h"

#include <gtest/gtest.h>

#include <clocale>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <filesystem>
#include <string>

#include <btparse.h>
#include <dirent.h>
#include <pthread.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include "tests/support/LoadText.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TempFolder.h"

namespace
{

class BibLoad : public testing::Test
{
protected:
    BibFile *file = nullptr;

    void SetUp() override { Bib_Initialize(); }
    void TearDown() override
    {
        if (file)
            Bib_FreeFile(file);
    }

    void Load(const std::string &text)
    {
        if (file)
            Bib_FreeFile(file);
        file = LoadText(text);
    }

    // "name=value|name=value" of the first entry.
    std::string Fields() const
    {
        std::string fields;
        for (int i = 0; i < file->entries->fieldCount; ++i)
            fields += (i ? "|" : "") + FieldName(file->entries->fields[i]) + "=" +
                      file->entries->fields[i].value;
        return fields;
    }

    std::string Keys() const
    {
        std::string keys;
        for (BibEntry *entry = file->entries; entry; entry = entry->next)
            keys += std::string(entry->key) + " ";
        return keys;
    }
};

std::string ManyFields(int count)
{
    std::string text = "@misc{many";
    for (int i = 0; i < count; ++i)
        text += ",\n f" + std::to_string(i) + " = 1";
    return text + "}\n";
}

} // namespace

TEST_F(BibLoad, JoinsThePiecesOfAValue)
{
    Load("@article{k, title = \"A\" # jan # {B}}");
    EXPECT_EQ("title=A\x02jan\x05"
              "B",
              Fields());
}

TEST_F(BibLoad, KeepsNumbersAndBracesAsWritten)
{
    Load("@article{k, year = 0042, title = {a {B} \"c\"}, note = \"d {e} f\", empty = {}}");
    EXPECT_EQ("year=0042|title=a {B} \"c\"|note=d {e} f|empty=", Fields());
}

TEST_F(BibLoad, MovesCrossrefToTheFront)
{
    Load("@article{k, author = {a}, crossref = {p}, title = {t}}");
    EXPECT_EQ("crossref=p|author=a|title=t", Fields());
}

TEST_F(BibLoad, LeavesALeadingCrossrefInPlace)
{
    Load("@article{k, crossref = {p}, author = {a}}");
    EXPECT_EQ("crossref=p|author=a", Fields());
}

TEST_F(BibLoad, MovesTheLaterOfTwoCrossrefs)
{
    Load("@article{k, a = 1, CrossRef = {first}, b = 2, CROSSREF = {second}, c = 3}");
    EXPECT_EQ("crossref=second|a=1|crossref=first|b=2|c=3", Fields());
}

TEST_F(BibLoad, EntersCrossrefInTheFieldTableFirst)
{
    Load("@article{k, author = {a}}");
    EXPECT_STREQ("crossref", BibFieldTable[0]);
    EXPECT_STREQ("author", BibFieldTable[1]);
}

TEST(BibLoadLog, TellsOfAnEntryWithoutAKey)
{
    std::string log = LogOf("1", [] {
        Bib_Initialize();
        BibFile *file = LoadText("@misc{, title={x}}\n@misc{good, title={y}}\n");
        if (!file->entries || strcmp(file->entries->key, "good") != 0 || file->entries->next)
            _exit(1);
        Bib_FreeFile(file);
    });
    EXPECT_NE(std::string::npos, log.find("Cartulo: ERROR: invalid entry will be just skipped.\n"))
        << log;
}

TEST(BibLoadLog, TellsOfPreamblesAndCommentsInFileOrder)
{
    std::string log = LogOf("1", [] {
        Bib_Initialize();
        Bib_FreeFile(LoadText("@comment{one}\nx\n@Preamble{{p}}\n@COMMENT{two}\n"));
    });
    size_t one = log.find("Cartulo: Comment: one\n");
    size_t junk = log.find("1 characters of junk");
    size_t preamble = log.find("Cartulo: Preamble: Preamble\n");
    size_t two = log.find("Cartulo: Comment: two\n");
    ASSERT_NE(std::string::npos, two) << log;
    EXPECT_LT(one, preamble);
    EXPECT_LT(junk, preamble);
    EXPECT_LT(preamble, two);
}

TEST_F(BibLoad, KeepsTheListsInFileOrder)
{
    Load("@comment{c1}\n@string{a = \"x\", b = {y}}\n@misc{k1, x = 1}\n@string{c = 3}\n"
         "@misc{k2, x = 1}\n@comment{c2}\n");
    EXPECT_EQ("k1 k2 ", Keys());
    ASSERT_TRUE(file->strings && file->strings->next && file->strings->next->next);
    EXPECT_STREQ("a", file->strings->name);
    EXPECT_STREQ("b", file->strings->next->name);
    EXPECT_STREQ("c", file->strings->next->next->name);
    EXPECT_STREQ("c1", file->comments->text);
    EXPECT_STREQ("c2", file->comments->next->text);
    EXPECT_EQ(nullptr, file->comments->next->next);
}

TEST_F(BibLoad, KeepsBothDefinitionsOfAnAbbreviation)
{
    Load("@STRING{a = \"x\"}\n@STRING{a = \"y\"}\n");
    EXPECT_STREQ("x", file->strings->value);
    EXPECT_STREQ("y", file->strings->next->value);
    EXPECT_EQ(0, file->errorCount + file->warningCount);
}

TEST_F(BibLoad, DoesNotEnterAbbreviationsInTheFieldTable)
{
    Load("@string{ACM = {x} # other}\n");
    EXPECT_EQ(0, BibFieldCount);
    EXPECT_STREQ("x\x02other\x05", file->strings->value);
}

TEST_F(BibLoad, KeepsNamesAsWritten)
{
    Load("@String{JACM = {x}}\n@ArTicle{KeY, AuThor = JACM # Jan}\n");
    EXPECT_STREQ("JACM", file->strings->name);
    EXPECT_STREQ("ArTicle", BibTypeTable[file->entries->type]);
    EXPECT_STREQ("KeY", file->entries->key);
    EXPECT_EQ("AuThor=\x02JACM\x05\x02Jan\x05", Fields());
}

// In Turkish I and i are two letters, neither of which is the other's other case.
TEST_F(BibLoad, KnowsTheFourKindsOfItemInAnyCaseAndLocale)
{
    TempFolder folder;
    std::string locale = folder.Path("tr_TR.UTF-8");
    ASSERT_EQ(0, system(("localedef -i tr_TR -f UTF-8 " + locale).c_str()));
    setenv("LOCPATH", folder.Path().c_str(), 1);
    ASSERT_NE(nullptr, setlocale(LC_ALL, "tr_TR.UTF-8"));
    ASSERT_NE('I', toupper('i'));

    Load("@sTrInG{i = {x}}\n@PREAMBLE{{p}}\n@CoMmEnT{c}\n@INBOOK{k, TITLE = {t}}\n@inbook{l,}\n");
    ASSERT_NE(nullptr, file->strings);
    EXPECT_STREQ("p\r\n", file->preamble);
    EXPECT_NE(nullptr, file->comments);
    ASSERT_EQ("k l ", Keys());
    EXPECT_EQ(file->entries->type, file->entries->next->type);
}

TEST_F(BibLoad, CollectsThePiecesOfAllPreambles)
{
    Load("@preamble{{\\def\\a{x}} # \"B\"}\n@preamble{{C}}\n");
    EXPECT_STREQ("\\def\\a{x}\r\nB\r\nC\r\n", file->preamble);
}

TEST_F(BibLoad, KeepsMacrosAndNumbersOfAPreambleAsText)
{
    Load("@preamble{{A} # jan # 17}\n");
    EXPECT_STREQ("A\r\njan\r\n17\r\n", file->preamble);
    EXPECT_EQ(0, file->errorCount);
}

TEST_F(BibLoad, DropsOnlyThePreamblePieceThatDoesNotFit)
{
    std::string big(8000, 'x');
    Load("@preamble{{" + big + "} # {" + std::string(188, 'y') + "} # {" + std::string(187, 'z') +
         "}}\n");
    EXPECT_EQ(big + "\r\n" + std::string(187, 'z') + "\r\n", file->preamble);
    EXPECT_EQ("ERROR: line 1: the preamble is too long, a part of it was not loaded\r\n",
              Messages(file));
    EXPECT_EQ(1, file->errorCount);
}

// A save would make abbreviations of what follows them.
TEST_F(BibLoad, CountsMarksOfAbbreviationsInAFile)
{
    for (const char *mark : {"\2", "\5"}) {
        Load("@misc{k, a = {x}}\n\n@misc{l, b = {y" + std::string(mark) + "z}}\n");
        EXPECT_EQ("k l ", Keys());
        EXPECT_EQ(1, file->errorCount);
        EXPECT_EQ(0u, Messages(file).find("ERROR: line 3: control character")) << Messages(file);
    }
}

TEST(BibLoadLog, TellsOfAPreambleThatIsTooLong)
{
    std::string log = LogOf("1", [] {
        Bib_Initialize();
        Bib_FreeFile(LoadText("@preamble{{" + std::string(9000, 'x') + "}}\n"));
    });
    EXPECT_NE(std::string::npos, log.find("Cartulo: ERROR: Preamble too long in /tmp/"));
    EXPECT_NE(std::string::npos,
              log.find("Cartulo: ERROR: call Quarlo Technical support to solve the problem\n"));
}

TEST_F(BibLoad, LoadsAnEmptyFileCleanAndWritable)
{
    for (const char *text : {"", "\n", "  \t\r\n\r\n \f", "\xEF\xBB\xBF", "\xEF\xBB\xBF \n"}) {
        Load(text);
        EXPECT_EQ(nullptr, file->messages) << Messages(file);
        EXPECT_EQ(0, file->errorCount + file->warningCount + file->readOnly);
        EXPECT_EQ(nullptr, file->entries);
    }
    Load(std::string(3, '\0'));
    EXPECT_EQ(0, file->errorCount);
}

TEST_F(BibLoad, ReadsAllLineEnds)
{
    for (const char *end : {"\n", "\r\n", "\r"}) {
        std::string text = "@misc{k,|title = {one|two},|note = {x|}|}|@misc{l, y = {z}}|";
        for (size_t at; (at = text.find('|')) != std::string::npos;)
            text.replace(at, 1, end);
        Load(text);
        EXPECT_EQ("k l ", Keys());
        EXPECT_EQ("title=one two|note=x ", Fields());
        EXPECT_EQ(0, file->errorCount + file->warningCount);
    }
}

TEST_F(BibLoad, CountsLinesTheSameForAllLineEnds)
{
    for (const char *end : {"\n", "\r\n", "\r"}) {
        Load(std::string(end) + end + "@misc{k, title = , }" + end);
        EXPECT_EQ(0u, Messages(file).find("SYNTAX ERROR: line 3: ")) << Messages(file);
    }
}

TEST_F(BibLoad, ReadsNulAsABlank)
{
    Load(std::string("@misc{k, title = {a\0b}}", 23));
    EXPECT_EQ("title=a b", Fields());
    EXPECT_EQ(0, file->errorCount);
    Load(std::string("\r\n@misc{k,\r\n\ttitle = {a\0b\0}}\r\n", 30));
    EXPECT_EQ("WARNING: line 3: a NUL character is not kept, a blank takes its place (more may "
              "follow)\r\n",
              Messages(file));
}

TEST_F(BibLoad, TakesOffAByteOrderMark)
{
    Load("\xEF\xBB\xBF% a comment with an @ in it\n@misc{k, title = {x}}\n");
    EXPECT_EQ("k ", Keys());
    EXPECT_EQ(0, file->errorCount + file->warningCount);
}

TEST_F(BibLoad, ReadsALastCommentLineWithoutALineEnd)
{
    Load("@misc{k, title = {x}}\n% the end");
    EXPECT_EQ("k ", Keys());
    EXPECT_EQ(0, file->errorCount);
}

TEST_F(BibLoad, TellsOfASignThatHidesInAType)
{
    Load("@misc{k, a = 1}\n@\n@misc{l, b = 2}\n");
    EXPECT_EQ("k l ", Keys());
    EXPECT_STREQ("@misc", BibTypeTable[file->entries->next->type]);
    EXPECT_EQ("WARNING: line 3: an @ stands before that of this entry, it becomes a part of the "
              "type\r\n",
              Messages(file));
}

TEST_F(BibLoad, CountsATokenThatTheParserDrops)
{
    Load("@misc{k'z, title = {x}}\n");
    EXPECT_EQ(1, file->errorCount);
    EXPECT_EQ("ERROR: line 1: invalid token (text was \"'\")\r\n", Messages(file));
}

TEST_F(BibLoad, KeepsWhatCameBeforeAnItemThatEndsTheParser)
{
    Load("@misc{first, title = {x}}\n" + ManyFields(98) + "@misc{last, title = {x}}\n");
    EXPECT_EQ("first ", Keys());
    EXPECT_EQ(1, file->errorCount);
    EXPECT_EQ(0u, Messages(file).find("INTERNAL ERROR: line ")) << Messages(file);
}

TEST_F(BibLoad, ReadsAsManyFieldsAsTheParserCan)
{
    Load(ManyFields(97));
    EXPECT_EQ(97, file->entries->fieldCount);
    EXPECT_EQ(0, file->errorCount);
}

TEST_F(BibLoad, KeepsWhatCameBeforeAFatalError)
{
    Load("@misc{first, title = {x}}\n@article \"x\"\n@misc{last, title = {x}}\n");
    EXPECT_EQ("first ", Keys());
    EXPECT_EQ(1, file->errorCount);
    EXPECT_NE(std::string::npos, Messages(file).find("FATAL ERROR: line -1: ")) << Messages(file);
    EXPECT_EQ(std::string::npos, Messages(file).find("INTERNAL ERROR")) << Messages(file);
}

// The file itself still gets a descriptor, the child's pipe does not.
TEST_F(BibLoad, TellsWhyNoChildStarts)
{
    TempFolder folder;
    std::string path = folder.Write("refs.bib", "@misc{k, x = 1}\n");
    int next = dup(0);
    close(next);
    struct rlimit limit;
    getrlimit(RLIMIT_NOFILE, &limit);
    struct rlimit low = {static_cast<rlim_t>(next) + 1, limit.rlim_max};
    setrlimit(RLIMIT_NOFILE, &low);
    BibFile *loaded = Bib_LoadFile(path.c_str()); // a sanitizer that looks at `this` needs pipes
    setrlimit(RLIMIT_NOFILE, &limit);
    file = loaded;
    ASSERT_NE(nullptr, file);
    EXPECT_EQ(nullptr, file->entries);
    EXPECT_EQ("INTERNAL ERROR: line 0: Too many open files\r\n", Messages(file));
}

TEST_F(BibLoad, IsNotDisturbedByTheFileBefore)
{
    BibFile *alone = LoadText("@misc{k title = {x}}\n@misc{l, y = {z}}\n");
    Load("@misc{bad, x = {y}\n@misc{worse, = }\n@{\n@@ @comment");
    Load("@misc{k title = {x}}\n@misc{l, y = {z}}\n");
    EXPECT_EQ(Messages(alone), Messages(file));
    EXPECT_EQ("k l ", Keys());
    Bib_FreeFile(alone);
}

// Most of a child's single second is gone before it starts to work.
void WasteTime()
{
    while (clock() < CLOCKS_PER_SEC * 7 / 10) {
    }
}

TEST_F(BibLoad, StopsAFileThatTakesTooLong)
{
    BibLoadSeconds = 1;
    pthread_atfork(nullptr, nullptr, WasteTime);
    std::string value = "1";
    for (int i = 1; i < 90000; ++i)
        value += "#1";
    std::string text = "@misc{first, title = {x}}\n";
    while (text.size() < 20u * 1024 * 1024) // needs more than a second
        text += "@misc{next, x = " + value + "}\n";
    Load(text);
    EXPECT_EQ(0u, Keys().find("first next next "));
    EXPECT_EQ(1, file->errorCount);
    EXPECT_NE(std::string::npos, Messages(file).find("took too long")) << Messages(file);
}

TEST_F(BibLoad, StopsAtTooManyMessages)
{
    setenv("CARTULO_LOG", "6", 1);
    std::string text = "@misc{first, title = {x}}\n";
    for (int i = 0; i < 300000; ++i)
        text += "@a{b,c}\n";
    Load(text);
    EXPECT_EQ(0u, Keys().find("first b b "));
    EXPECT_EQ(100001, file->errorCount + file->warningCount);
}

TEST_F(BibLoad, EndsWhereTheFieldTableIsFull)
{
    for (int i = 0; i < 510; ++i)
        Bib_FieldIndex(("field" + std::to_string(i)).c_str());
    Load("@misc{first, title = {x}}\n@misc{second, title = {x}, new = {y}}\n@misc{third}\n");
    EXPECT_EQ("first ", Keys());
    EXPECT_EQ(1, file->errorCount);
    EXPECT_EQ(0u, Messages(file).find("INTERNAL ERROR: line 2: the table of field names is full"))
        << Messages(file);
}

TEST_F(BibLoad, EndsWhereTheTypeTableIsFull)
{
    for (int i = 0; i < 123; ++i)
        Bib_TypeIndex(("type" + std::to_string(i)).c_str());
    Load("@misc{first, title = {x}}\n@other{second, title = {x}}\n");
    EXPECT_EQ("first ", Keys());
    EXPECT_EQ(0u, Messages(file).find("INTERNAL ERROR: line 2: the table of entry types is full"))
        << Messages(file);
}

TEST_F(BibLoad, ReadsAValueOfManyPieces)
{
    std::string text = "@misc{k, x = 1";
    for (int i = 0; i < 900000; ++i)
        text += "#1";
    Load(text + "}\n@misc{l, y = {z}}\n");
    EXPECT_EQ("k l ", Keys());
    EXPECT_EQ(900001u, strlen(file->entries->fields[0].value));
    EXPECT_EQ(0, file->errorCount);
}

TEST(BibLoadLog, TellsOfAFileThatCannotBeOpened)
{
    std::string log = LogOf("1", [] {
        Bib_Initialize();
        if (Bib_LoadFile("/nonexistent/refs.bib"))
            _exit(1);
    });
    EXPECT_EQ("Cartulo: ERROR: Can't open file: /nonexistent/refs.bib\n", log);
}

TEST_F(BibLoad, RefusesWhatIsNoRegularFile)
{
    EXPECT_EQ(nullptr, Bib_LoadFile("/tmp"));
    EXPECT_EQ(nullptr, Bib_LoadFile("/dev/zero"));
    TempFolder folder;
    std::string pipe = folder.Path("pipe.bib");
    ASSERT_EQ(0, mkfifo(pipe.c_str(), 0600));
    EXPECT_EQ(nullptr, Bib_LoadFile(pipe.c_str())); // and does not wait for a writer
}

TEST_F(BibLoad, CutsTheBaseNameAtItsFirstDot)
{
    TempFolder folder;
    std::string path = folder.Write("b.c\\refs.old.bib", "@misc{k, x = 1}\n");
    file = Bib_LoadFile(path.c_str());
    ASSERT_NE(nullptr, file);
    EXPECT_STREQ("refs", file->baseName);
    EXPECT_EQ(path, file->path);
}

TEST_F(BibLoad, LeavesNoDescriptorAndNoChildBehind)
{
    auto descriptors = [] {
        int count = 0;
        DIR *folder = opendir("/proc/self/fd");
        while (readdir(folder))
            ++count;
        closedir(folder);
        return count;
    };
    int before = descriptors();
    Load("@misc{k, x = 1}\n");
    Load("@article \"x\"\n");
    Load(ManyFields(99));
    EXPECT_EQ(before, descriptors());
    EXPECT_EQ(-1, waitpid(-1, nullptr, WNOHANG));
    EXPECT_EQ(nullptr, file->stream);
    EXPECT_EQ(0, file->lockHandle);
}

TEST_F(BibLoad, ConvertsParsedItemsInThisProcessToo)
{
    Load("");
    char path[] = "memory";
    auto parse = [&](const char *text) {
        boolean status;
        return bt_parse_entry_s(const_cast<char *>(text), path, 1, BTO_NOSTORE, &status);
    };
    for (bt_metatype metatype : {BTE_MACRODEF, BTE_REGULAR, BTE_COMMENT, BTE_PREAMBLE})
        bt_set_stringopts(metatype, 0);
    AST *entry = parse("@Misc{k, a = 1, crossref = {p} # jan}");
    EXPECT_EQ(1, Bib_AddEntryFromAst(file, entry));
    AST *keyless = parse("@misc{, a = 1}");
    EXPECT_EQ(0, Bib_AddEntryFromAst(file, keyless));
    AST *strings = parse("@string{s = {t}, u = {v}}");
    EXPECT_EQ(1, Bib_AddStringsFromAst(file, strings));
    AST *preamble = parse("@preamble{{p} # q # 3}");
    EXPECT_EQ(1, Bib_AddPreambleFromAst(file, preamble));
    AST *comment = parse("@comment{c}");
    EXPECT_EQ(1, Bib_AddCommentFromAst(file, comment));
    EXPECT_EQ("crossref=p\x02jan\x05|a=1", Fields());
    EXPECT_STREQ("u", file->strings->name); // at the head; only a load reverses
    EXPECT_STREQ("p\r\nq\r\n3\r\n", file->preamble);
    EXPECT_STREQ("c", file->comments->text);
    for (AST *ast : {entry, keyless, strings, preamble, comment})
        bt_free_ast(ast);
}

TEST_F(BibLoad, ProvesThatMessagesArrive)
{
    EXPECT_EQ(1, Bib_SelfTest());
}

// Every broken file loads or is refused, this process goes on, and the next file is not harmed.
TEST_F(BibLoad, SurvivesEveryHostileFile)
{
    int count = 0;
    for (const auto &item : std::filesystem::directory_iterator(TEST_DATA "/hostile")) {
        SCOPED_TRACE(item.path().filename());
        ++count;
        BibFile *hostile = Bib_LoadFile(item.path().c_str());
        ASSERT_NE(nullptr, hostile);
        if (hostile->messages) {
            EXPECT_LT(0, hostile->errorCount + hostile->warningCount);
        }
        Bib_FreeFile(hostile);
        Load("@misc{good, title = {x}}\n");
        EXPECT_EQ("good ", Keys());
        EXPECT_EQ("title=x", Fields());
        EXPECT_EQ(nullptr, file->messages) << Messages(file);
    }
    EXPECT_LT(90, count);
}
