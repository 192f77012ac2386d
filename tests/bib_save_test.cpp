// tests/bib_save_test.cpp - what a save writes, what it keeps, and what its failures leave behind.

#include "store/BibStore.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <csignal>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <fstream>
#include <string>
#include <vector>

#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include "tests/support/LogWatch.h"
#include "tests/support/TempFolder.h"

using testing::ElementsAre;
using testing::IsEmpty;

namespace
{

using Lines = std::vector<std::string>;
using Names = std::set<std::string>;

const std::string OldText = "@misc{old, note = {old contents}}\n";
const std::string NewText = "@Misc{new,\n\tnote = {new}\n}\n";

// --- Values ---

std::string Written(const std::string &value)
{
    char *text = nullptr;
    size_t size = 0;
    FILE *stream = open_memstream(&text, &size);
    Bib_WriteValue(value.c_str(), stream);
    fclose(stream);
    std::string written(text, size);
    free(text);
    return written;
}

std::string Replaced(std::string text, const std::string &from, const std::string &to)
{
    for (size_t at; (at = text.find(from)) != std::string::npos;)
        text.replace(at, from.size(), to);
    return text;
}

// The text with every digit as a 9.
std::string WithNines(std::string text)
{
    for (char &c : text)
        if (c >= '0' && c <= '9')
            c = '9';
    return text;
}

std::vector<Lines> Blocks(const std::string &path)
{
    std::vector<Lines> blocks;
    std::ifstream stream(path);
    bool inBlock = false;
    for (std::string line; std::getline(stream, line);) {
        if (line.empty() || line[0] == '%') {
            inBlock = false;
            continue;
        }
        if (!inBlock)
            blocks.emplace_back();
        inBlock = true;
        blocks.back().push_back(Replaced(Replaced(line, "\\2", "\2"), "\\5", "\5"));
    }
    return blocks;
}

TEST(BibWriteValue, WritesTheTable)
{
    LogWatch log;
    std::vector<Lines> blocks = Blocks(TEST_DATA "/values.test");
    EXPECT_LT(30u, blocks.size());
    for (const Lines &block : blocks) {
        ASSERT_LE(2u, block.size()) << block[0];
        EXPECT_EQ(block[1], Written(block[0])) << block[0];
        EXPECT_EQ(Lines(block.begin() + 2, block.end()), log.Lines()) << block[0];
    }
}

TEST(BibWriteValue, WritesNothingAsBraces)
{
    EXPECT_EQ("{}", Written(""));
}

TEST(BibWriteValue, WritesNothingForAnAbbreviationWithoutAName)
{
    EXPECT_EQ("", Written("\2\5"));
}

TEST(BibWriteValue, KeepsEveryOtherByte)
{
    std::string value;
    for (int c = 1; c < 256; ++c)
        if (!strchr("\2\5{}", c))
            value += static_cast<char>(c);
    EXPECT_EQ("{" + value + "}", Written(value));
}

TEST(BibWriteValue, WritesLongValues)
{
    for (size_t size : {4096, 1048574, 1048575, 1048576, 1048577, 3000000}) {
        std::string text(size, 'x');
        EXPECT_TRUE("{" + text + "} # jan # {" + text + "}" == Written(text + "\2jan\5" + text))
            << size;
    }
}

TEST(BibWriteValue, LeavesAWriteErrorWithTheStream)
{
    FILE *stream = fopen("/dev/full", "w");
    ASSERT_TRUE(stream);
    Bib_WriteValue(std::string(100000, 'x').c_str(), stream);
    EXPECT_TRUE(ferror(stream));
    fclose(stream);
}

// --- Files ---

struct BibSave : testing::Test {
    LogWatch log;
    TempFolder folder;
    BibFile *file = nullptr;

    void SetUp() override
    {
        Bib_Initialize();
        Make(folder.Path("refs.bib"));
    }
    void TearDown() override { Bib_FreeFile(file); }

    // An empty, modified file.
    void Make(const std::string &path)
    {
        if (file)
            Bib_FreeFile(file);
        file = static_cast<BibFile *>(calloc(1, sizeof(BibFile)));
        file->path = strdup(path.c_str());
        file->baseName = strdup("refs");
        file->modified = 3;
    }

    // The lists grow at the end, as after loading.
    void AddComment(const char *text)
    {
        BibComment **end = &file->comments;
        while (*end)
            end = &(*end)->next;
        *end = static_cast<BibComment *>(calloc(1, sizeof(BibComment)));
        (*end)->text = strdup(text);
    }
    void AddString(const char *name, const char *value)
    {
        BibString **end = &file->strings;
        while (*end)
            end = &(*end)->next;
        *end = static_cast<BibString *>(calloc(1, sizeof(BibString)));
        (*end)->name = strdup(name);
        (*end)->value = strdup(value);
    }
    void AddEntry(const char *type, const char *key,
                  const std::vector<std::pair<const char *, std::string>> &fields)
    {
        BibEntry **end = &file->entries;
        while (*end)
            end = &(*end)->next;
        *end = Bib_AllocEntry(static_cast<int>(fields.size()));
        (*end)->type = Bib_TypeIndex(type);
        (*end)->key = strdup(key);
        for (size_t i = 0; i < fields.size(); ++i) {
            (*end)->fields[i].name = Bib_FieldIndex(fields[i].first);
            (*end)->fields[i].value = strdup(fields[i].second.c_str());
        }
    }

    // What is saved as NewText.
    void AddNew() { AddEntry("Misc", "new", {{"note", "new"}}); }

    std::string Saved()
    {
        EXPECT_EQ(1, Bib_SaveFile(file));
        return folder.Read("refs.bib");
    }

    // The one name in the folder that begins with "refs.bib.Backup".
    std::string BackupName()
    {
        std::string found;
        for (const std::string &name : folder.Names()) {
            if (name.rfind("refs.bib.Backup", 0) != 0)
                continue;
            EXPECT_EQ("", found) << "a second backup: " << name;
            found = name;
        }
        return found;
    }

    // Takes the dated names of the next seconds, without a letter and with B up to `last`. Returns
    // all names in the folder.
    Names TakeNames(char last)
    {
        time_t now = time(nullptr);
        for (time_t second = now; second < now + 20; ++second) {
            char date[64];
            strftime(date, sizeof date, "%Y%m%d-%H%M%S", localtime(&second));
            std::string name = std::string("refs.bib.Backup-") + date;
            folder.Write(name, "taken");
            for (char letter = 'B'; letter <= last; ++letter)
                folder.Write(name + letter, "taken");
        }
        return folder.Names();
    }

    // A save that failed: nothing has changed, and the user can try again.
    void ExpectFailedSave(const char *line, const std::string &name)
    {
        EXPECT_EQ(0, Bib_SaveFile(file));
        EXPECT_EQ(3, file->modified);
        EXPECT_EQ(0, file->backupDone);
        EXPECT_THAT(log.Lines(), ElementsAre(line + name));
    }
};

TEST_F(BibSave, WritesAnEmptyFile)
{
    EXPECT_EQ("", Saved());
    EXPECT_EQ(Names{"refs.bib"}, folder.Names());
}

TEST_F(BibSave, WritesAllKindsInOrder)
{
    AddEntry("Article", "k1", {{"title", "A\2jan\5B"}, {"Year", "1998"}, {"note", ""}});
    AddEntry("misc", "k2", {});
    AddEntry("book", "k3", {{"title", "{T}"}});
    AddString("jan", "January");
    AddString("long", "\2jan\5 98");
    AddComment("one");
    AddComment("two {x}");
    strcpy(file->preamble, "\\def\\a{x}\r\n");
    EXPECT_EQ("@COMMENT{one}\n"
              "@COMMENT{two {x}}\n"
              "\n"
              "@PREAMBLE{{\\def\\a{x}} }\n"
              "\n"
              "@STRING{jan = {January}}\n"
              "@STRING{long = jan # { 98}}\n"
              "\n"
              "@Article{k1,\n"
              "\ttitle = {A} # jan # {B},\n"
              "\tYear = 1998,\n"
              "\tnote = {}\n"
              "}\n"
              "@misc{k2,\n"
              "}\n"
              "@book{k3,\n"
              "\ttitle = {{T}}\n"
              "}\n",
              Saved());
    EXPECT_THAT(log.Lines(), IsEmpty());
}

TEST_F(BibSave, StartsWithTheFirstEntryWhenThereIsNothingElse)
{
    AddNew();
    EXPECT_EQ(NewText, Saved());
}

TEST_F(BibSave, WritesAPieceOfThePreamblePerLine)
{
    strcpy(file->preamble, "\\def\\a{x}\r\n\\def\\b{y}\r\n");
    EXPECT_EQ("@PREAMBLE{{\\def\\a{x}}\n\t# {\\def\\b{y}} }\n\n", Saved());
}

TEST_F(BibSave, WritesAPreambleWithoutTheLastLineEnd)
{
    strcpy(file->preamble, "a\r\r\nb\n\r12");
    EXPECT_EQ("@PREAMBLE{{a}\n\t# {}\n\t# {b\n}\n\t# 12 }\n\n", Saved());
}

TEST_F(BibSave, WritesAFullPreamble)
{
    memset(file->preamble, 'p', BIB_PREAMBLE_SIZE - 1);
    EXPECT_EQ("@PREAMBLE{{" + std::string(BIB_PREAMBLE_SIZE - 1, 'p') + "} }\n\n", Saved());
}

TEST_F(BibSave, WritesMoreThanABlock)
{
    std::string expected;
    for (int i = 0; i < 3000; ++i) {
        std::string key = "key" + std::to_string(i);
        std::string value(i, 'v');
        AddEntry("Misc", key.c_str(), {{"note", "x" + value}});
        expected += "@Misc{" + key + ",\n\tnote = {x" + value + "}\n}\n";
    }
    EXPECT_TRUE(expected == Saved());
}

TEST_F(BibSave, ClearsModified)
{
    EXPECT_EQ(1, Bib_SaveFile(file));
    EXPECT_EQ(0, file->modified);
    EXPECT_EQ(1, file->backupDone);
}

TEST_F(BibSave, NeverWritesAReadOnlyFile)
{
    folder.Write("refs.bib", OldText);
    for (int readOnly : {-1, 1}) {
        file->readOnly = readOnly;
        ExpectFailedSave("ERROR: ReadOnly Bib-file: ", file->path);
    }
    EXPECT_EQ(Names{"refs.bib"}, folder.Names());
    EXPECT_EQ(OldText, folder.Read("refs.bib"));
}

// --- Backups ---

TEST_F(BibSave, KeepsTheOldContentsUnderADatedName)
{
    folder.Write("refs.bib", OldText);
    AddNew();
    EXPECT_EQ(NewText, Saved());
    EXPECT_EQ("refs.bib.Backup-99999999-999999", WithNines(BackupName()));
    EXPECT_EQ(OldText, folder.Read(BackupName()));
    EXPECT_EQ(2u, folder.Names().size());
    EXPECT_THAT(log.Lines(), IsEmpty());
}

TEST_F(BibSave, MakesOneBackupInARun)
{
    folder.Write("refs.bib", OldText);
    EXPECT_EQ("", Saved());
    AddNew();
    file->modified = 1;
    EXPECT_EQ(NewText, Saved());
    EXPECT_EQ(OldText, folder.Read(BackupName()));
}

TEST_F(BibSave, KeepsWhatAnotherProgramWroteInBetween)
{
    folder.Write("refs.bib", OldText);
    EXPECT_EQ("", Saved());
    std::set<std::string> before = folder.Names();
    folder.Write("refs.bib", "written by another program");
    AddNew();
    EXPECT_EQ(NewText, Saved());
    int kept = 0;
    for (const std::string &name : folder.Names())
        kept += before.count(name) == 0 && folder.Read(name) == "written by another program";
    EXPECT_EQ(1, kept);
    EXPECT_EQ(3u, folder.Names().size());
    EXPECT_THAT(log.Lines(), ElementsAre("WARNING: Another program has changed the Bib-file: " +
                                         std::string(file->path)));
    EXPECT_EQ(NewText, Saved()); // and that was all
    EXPECT_EQ(3u, folder.Names().size());
}

TEST_F(BibSave, DealsWithTheBackupOnceEvenWithoutAnOldFile)
{
    EXPECT_EQ("", Saved());
    AddNew();
    EXPECT_EQ(NewText, Saved());
    EXPECT_EQ(Names{"refs.bib"}, folder.Names());
}

TEST_F(BibSave, MakesNoBackupInANegativeMode)
{
    BibBackupMode = -1;
    folder.Write("refs.bib", OldText);
    AddNew();
    EXPECT_EQ(NewText, Saved());
    EXPECT_EQ(1, file->backupDone);
    EXPECT_EQ(Names{"refs.bib"}, folder.Names());
}

TEST_F(BibSave, UsesThePlainBackupNameInModes0And1)
{
    for (int mode : {0, 1}) {
        BibBackupMode = mode;
        file->backupDone = 0;
        folder.Write("refs.bib", OldText + std::to_string(mode));
        EXPECT_EQ("", Saved());
        EXPECT_EQ(OldText + std::to_string(mode), folder.Read("refs.bib.Backup"));
        EXPECT_EQ((Names{"refs.bib", "refs.bib.Backup"}), folder.Names());
    }
    EXPECT_THAT(log.Lines(), IsEmpty());
}

TEST_F(BibSave, DeletesTheOlderPlainBackupWhenNoDatedNameIsPossible)
{
    std::string name(240, 'n'); // takes ".Backup" but no date
    BibBackupMode = 1;
    Make(folder.Write(name, OldText));
    folder.Write(name + ".Backup", "older");
    EXPECT_EQ(1, Bib_SaveFile(file));
    EXPECT_EQ(OldText, folder.Read(name + ".Backup"));
    EXPECT_EQ((Names{name, name + ".Backup"}), folder.Names());
}

TEST_F(BibSave, ReportsAPlainBackupThatCannotBeRemoved)
{
    BibBackupMode = 1;
    folder.Write("refs.bib", OldText);
    ASSERT_EQ(0, mkdir(folder.Path("refs.bib.Backup").c_str(), 0700));
    ExpectFailedSave("ERROR: Can't remove backup file: ", folder.Path("refs.bib.Backup"));
    EXPECT_STREQ("Is a directory", Bib_SaveReason());
    EXPECT_EQ(OldText, folder.Read("refs.bib"));
    EXPECT_EQ((Names{"refs.bib", "refs.bib.Backup"}), folder.Names());
}

TEST_F(BibSave, TakesTheNextLetterWhenTheDatedNameIsTaken)
{
    for (char last : {'B', 'Y'}) {
        folder.Write("refs.bib", OldText);
        Names before = TakeNames(last);
        file->backupDone = 0;
        EXPECT_EQ("", Saved());
        Names added;
        for (const std::string &name : folder.Names()) {
            if (before.count(name) == 0)
                added.insert(name);
        }
        ASSERT_EQ(1u, added.size());
        EXPECT_EQ(std::string("refs.bib.Backup-99999999-999999") + ++last,
                  WithNines(*added.begin()));
        EXPECT_EQ(OldText, folder.Read(*added.begin()));
        unlink(folder.Path(*added.begin()).c_str());
        for (const std::string &name : before)
            EXPECT_EQ(name == "refs.bib" ? "" : "taken", folder.Read(name));
    }
}

TEST_F(BibSave, FailsWhenAllDatedNamesAreTaken)
{
    folder.Write("refs.bib", OldText);
    Names before = TakeNames('Z');
    ExpectFailedSave("ERROR: Can't rename to BAK-file the Bib-file: ", file->path);
    EXPECT_STREQ("File exists", Bib_SaveReason());
    EXPECT_EQ(before, folder.Names());
    for (const std::string &name : before)
        EXPECT_EQ(name == "refs.bib" ? OldText : "taken", folder.Read(name));
}

TEST_F(BibSave, FailsWhenTheBackupNameIsTooLong)
{
    Make(folder.Write(std::string(250, 'n'), OldText));
    ExpectFailedSave("ERROR: Can't rename to BAK-file the Bib-file: ", file->path);
    EXPECT_EQ(1u, folder.Names().size());
    EXPECT_EQ(OldText, folder.Read(std::string(250, 'n')));
}

// --- Names of backups ---

std::string DateNow()
{
    char date[64];
    time_t now = time(nullptr);
    strftime(date, sizeof date, "%Y%m%d-%H%M%S", localtime(&now));
    return date;
}

// Asked again when the second changed meanwhile.
std::string BackupSuffix(const BibFile *file, int n)
{
    for (;;) {
        std::string before = DateNow();
        std::string name = Bib_BackupName(file, n);
        if (before == DateNow())
            return Replaced(name, before, "NOW").substr(strlen(file->path));
    }
}

TEST_F(BibSave, NamesBackupsByAttempt)
{
    EXPECT_EQ(".Backup", BackupSuffix(file, -1));
    EXPECT_EQ(".Backup-NOW", BackupSuffix(file, 0));
    EXPECT_EQ(".Backup-NOWB", BackupSuffix(file, 1));
    EXPECT_EQ(".Backup-NOWZ", BackupSuffix(file, 25));
    EXPECT_EQ(".Backup-NOWA", BackupSuffix(file, 26));
    EXPECT_EQ(".Backup-NOWB", BackupSuffix(file, 27));
}

TEST_F(BibSave, NamesBackupsByTheLocalTime)
{
    setenv("TZ", "Far-05:45", 1);
    tzset();
    EXPECT_EQ(".Backup-NOW", BackupSuffix(file, 0));
}

TEST_F(BibSave, NamesBackupsOfLongPaths)
{
    Make(std::string(10000, 'p'));
    EXPECT_EQ(std::string(10000, 'p') + ".Backup", Bib_BackupName(file, -1));
}

// --- Links, modes, owners ---

TEST_F(BibSave, LeavesASymbolicLinkALink)
{
    TempFolder other;
    other.Write("target.bib", OldText);
    ASSERT_EQ(0, symlink(other.Path("target.bib").c_str(), folder.Path("middle").c_str()));
    ASSERT_EQ(0, symlink("middle", file->path));
    AddNew();
    EXPECT_EQ(NewText, Saved());

    struct stat status;
    ASSERT_EQ(0, lstat(file->path, &status));
    EXPECT_TRUE(S_ISLNK(status.st_mode));
    EXPECT_EQ(NewText, other.Read("target.bib"));
    EXPECT_EQ(Names{"target.bib"}, other.Names());
    ASSERT_EQ(0, lstat(folder.Path(BackupName()).c_str(), &status));
    EXPECT_TRUE(S_ISREG(status.st_mode));
    EXPECT_EQ(OldText, folder.Read(BackupName()));
    EXPECT_EQ((Names{"refs.bib", "middle", BackupName()}), folder.Names());
}

TEST_F(BibSave, KeepsABackupOfALinkToAnotherFileSystem)
{
    TempFolder other("/dev/shm");
    other.Write("target.bib", OldText);
    struct stat here, there;
    ASSERT_EQ(0, stat(folder.Path().c_str(), &here));
    ASSERT_EQ(0, stat(other.Path().c_str(), &there));
    ASSERT_NE(here.st_dev, there.st_dev);
    chmod(other.Path("target.bib").c_str(), 0640);
    ASSERT_EQ(0, symlink(other.Path("target.bib").c_str(), file->path));
    AddNew();
    EXPECT_EQ(NewText, Saved());
    EXPECT_EQ(NewText, other.Read("target.bib"));
    EXPECT_EQ(Names{"target.bib"}, other.Names());
    EXPECT_EQ(OldText, folder.Read(BackupName()));
    ASSERT_EQ(0, stat(folder.Path(BackupName()).c_str(), &here));
    EXPECT_EQ(0640u, here.st_mode & 07777u);
}

TEST_F(BibSave, CreatesTheTargetOfADanglingLink)
{
    ASSERT_EQ(0, symlink("missing.bib", file->path));
    AddNew();
    EXPECT_EQ(NewText, Saved());
    EXPECT_EQ(NewText, folder.Read("missing.bib"));
    EXPECT_EQ((Names{"refs.bib", "missing.bib"}), folder.Names());
}

TEST_F(BibSave, FailsOnALinkToItself)
{
    ASSERT_EQ(0, symlink("refs.bib", file->path));
    ExpectFailedSave("ERROR: Can't open file: ", file->path);
    EXPECT_EQ(Names{"refs.bib"}, folder.Names());
}

TEST_F(BibSave, KeepsTheMode)
{
    for (mode_t mode : {0600, 0644, 0664, 0640, 0700}) {
        folder.Write("refs.bib", OldText);
        chmod(file->path, mode);
        file->backupDone = 1;
        EXPECT_EQ("", Saved());
        struct stat status;
        ASSERT_EQ(0, stat(file->path, &status));
        EXPECT_EQ(mode, status.st_mode & 07777u);
    }
}

TEST_F(BibSave, KeepsTheOwner)
{
    folder.Write("refs.bib", OldText);
    uid_t owner = geteuid() == 0 ? 65534 : geteuid(); // nobody but root can give files away
    ASSERT_EQ(0, chown(file->path, owner, static_cast<gid_t>(-1)));
    EXPECT_EQ("", Saved());
    struct stat status;
    ASSERT_EQ(0, stat(file->path, &status));
    EXPECT_EQ(owner, status.st_uid);
}

TEST_F(BibSave, GivesANewFileTheUsualMode)
{
    umask(027);
    EXPECT_EQ("", Saved());
    struct stat status;
    ASSERT_EQ(0, stat(file->path, &status));
    EXPECT_EQ(0640u, status.st_mode & 07777u);
}

TEST_F(BibSave, WorksWithARelativePath)
{
    ASSERT_EQ(0, chdir(folder.Path().c_str()));
    folder.Write("refs.bib", OldText);
    Make("refs.bib");
    AddNew();
    EXPECT_EQ(NewText, Saved());
    EXPECT_EQ(OldText, folder.Read(BackupName()));
    EXPECT_EQ(2u, folder.Names().size());
}

// --- Failures ---

// From here on a file of this process can hold no more than `size` bytes, as on a full disk.
struct DiskFullAt {
    struct rlimit old;
    explicit DiskFullAt(rlim_t size)
    {
        signal(SIGXFSZ, SIG_IGN);
        getrlimit(RLIMIT_FSIZE, &old);
        struct rlimit limit = {size, old.rlim_max};
        setrlimit(RLIMIT_FSIZE, &limit);
    }
    ~DiskFullAt() { setrlimit(RLIMIT_FSIZE, &old); }
};

TEST_F(BibSave, LeavesTheOldFileWhenTheDiskIsFull)
{
    folder.Write("refs.bib", OldText);
    // One that fails when the stream is flushed, one that fails in a write before.
    for (size_t size : {2000, 5000000}) {
        AddEntry("Misc", "k", {{"note", std::string(size, 'v')}});
        DiskFullAt limit(1000);
        ExpectFailedSave("ERROR: Can't open file: ", file->path);
        EXPECT_STREQ("File too large", Bib_SaveReason());
        EXPECT_EQ(Names{"refs.bib"}, folder.Names());
        EXPECT_EQ(OldText, folder.Read("refs.bib"));
    }
}

TEST_F(BibSave, SavesOnceThereIsRoomAgain)
{
    folder.Write("refs.bib", OldText);
    AddEntry("Misc", "k", {{"note", std::string(2000, 'v')}});
    {
        DiskFullAt limit(1000);
        EXPECT_EQ(0, Bib_SaveFile(file));
    }
    EXPECT_EQ(1, Bib_SaveFile(file));
    EXPECT_EQ(0, file->modified);
    EXPECT_EQ(OldText, folder.Read(BackupName()));
}

TEST_F(BibSave, LeavesTheOlderPlainBackupWhenTheDiskIsFull)
{
    for (int mode : {0, 1}) {
        BibBackupMode = mode;
        folder.Write("refs.bib", OldText);
        folder.Write("refs.bib.Backup", "older");
        AddEntry("Misc", "k", {{"note", std::string(2000, 'v')}});
        DiskFullAt limit(1000);
        ExpectFailedSave("ERROR: Can't open file: ", file->path);
        EXPECT_EQ(OldText, folder.Read("refs.bib"));
        EXPECT_EQ("older", folder.Read("refs.bib.Backup"));
        EXPECT_EQ((Names{"refs.bib", "refs.bib.Backup"}), folder.Names());
    }
}

TEST_F(BibSave, LeavesALinkAndItsTargetWhenTheDiskIsFull)
{
    TempFolder other("/dev/shm");
    other.Write("target.bib", OldText);
    ASSERT_EQ(0, symlink(other.Path("target.bib").c_str(), file->path));
    AddEntry("Misc", "k", {{"note", std::string(2000, 'v')}});
    DiskFullAt limit(1000);
    ExpectFailedSave("ERROR: Can't open file: ", file->path);
    EXPECT_EQ(Names{"refs.bib"}, folder.Names());
    EXPECT_EQ(Names{"target.bib"}, other.Names());
    EXPECT_EQ(OldText, other.Read("target.bib"));
}

TEST_F(BibSave, FailsWhenTheCopyToAnotherFileSystemDoesNotFit)
{
    TempFolder other("/dev/shm");
    std::string large(5000, ' ');
    other.Write("target.bib", large);
    ASSERT_EQ(0, symlink(other.Path("target.bib").c_str(), file->path));
    AddNew();
    DiskFullAt limit(1000);
    ExpectFailedSave("ERROR: Can't rename to BAK-file the Bib-file: ", file->path);
    EXPECT_EQ(Names{"refs.bib"}, folder.Names());
    EXPECT_EQ(large, other.Read("target.bib"));
}

TEST_F(BibSave, FailsInAMissingFolder)
{
    Make(folder.Path("missing/refs.bib"));
    ExpectFailedSave("ERROR: Can't open file: ", file->path);
    EXPECT_STREQ("No such file or directory", Bib_SaveReason());
    EXPECT_THAT(folder.Names(), IsEmpty());
}

TEST_F(BibSave, FailsWhenTheNameIsTooLong)
{
    Make(folder.Path(std::string(256, 'n')));
    ExpectFailedSave("ERROR: Can't open file: ", file->path);
    EXPECT_THAT(folder.Names(), IsEmpty());
}

TEST_F(BibSave, ReplacesNothingButRegularFiles)
{
    BibBackupMode = -1;
    ASSERT_EQ(0, mkfifo(file->path, 0600));
    ExpectFailedSave("ERROR: Can't open file: ", file->path);
    Make(folder.Path("folder"));
    ASSERT_EQ(0, mkdir(file->path, 0700));
    ExpectFailedSave("ERROR: Can't open file: ", file->path);
    EXPECT_EQ((Names{"folder", "refs.bib"}), folder.Names());
}

TEST_F(BibSave, TakesTheBackupOfAPipeBack)
{
    ASSERT_EQ(0, mkfifo(file->path, 0600));
    ExpectFailedSave("ERROR: Can't open file: ", file->path);
    EXPECT_EQ(Names{"refs.bib"}, folder.Names());
}

// Permissions mean nothing to root, so such a test goes on as a user without rights.
void BecomePlainUser()
{
    if (geteuid() == 0) {
        ASSERT_EQ(0, setresuid(65534, 65534, 0));
    }
}

void BecomeRootAgain()
{
    if (setresuid(0, 0, 0) != 0)
        return; // was not root
}

struct BibSaveWithoutRights : BibSave {
    // A file that we may write in a folder where we may not.
    void SetUp() override
    {
        BibSave::SetUp();
        chmod(folder.Write("refs.bib", OldText).c_str(), 0666);
    }

    void Close()
    {
        chmod(folder.Path().c_str(), 0555);
        BecomePlainUser();
    }

    void TearDown() override
    {
        BecomeRootAgain();
        chmod(folder.Path().c_str(), 0700);
        BibSave::TearDown();
    }
};

TEST_F(BibSaveWithoutRights, ReportsTheBackupFirst)
{
    Close();
    ExpectFailedSave("ERROR: Can't rename to BAK-file the Bib-file: ", file->path);
    EXPECT_EQ(OldText, folder.Read("refs.bib"));
    EXPECT_EQ(Names{"refs.bib"}, folder.Names());
}

TEST_F(BibSaveWithoutRights, ReportsThePlainBackupFirst)
{
    BibBackupMode = 1;
    folder.Write("refs.bib.Backup", "older");
    Close();
    ExpectFailedSave("ERROR: Can't remove backup file: ", folder.Path("refs.bib.Backup"));
    EXPECT_EQ(OldText, folder.Read("refs.bib"));
    EXPECT_EQ((Names{"refs.bib", "refs.bib.Backup"}), folder.Names());
}

TEST_F(BibSaveWithoutRights, ReportsTheFileWhenNoBackupIsWanted)
{
    BibBackupMode = -1;
    Close();
    ExpectFailedSave("ERROR: Can't open file: ", file->path);
    EXPECT_EQ(OldText, folder.Read("refs.bib"));
    EXPECT_EQ(Names{"refs.bib"}, folder.Names());
}

TEST_F(BibSaveWithoutRights, DoesNotReplaceAFileThatIsProtectedItself)
{
    BibBackupMode = -1;
    chmod(file->path, 0444);
    chmod(folder.Path().c_str(), 0777);
    BecomePlainUser();
    ExpectFailedSave("ERROR: Can't open file: ", file->path);
    EXPECT_EQ(OldText, folder.Read("refs.bib"));
    EXPECT_EQ(Names{"refs.bib"}, folder.Names());
}

TEST_F(BibSaveWithoutRights, TakesTheBackupOfALinkBack)
{
    // The link's folder takes the backup, the target's folder takes no new file.
    TempFolder links;
    chmod(links.Path().c_str(), 0777);
    ASSERT_EQ(0, symlink(folder.Path("refs.bib").c_str(), links.Path("refs.bib").c_str()));
    Make(links.Path("refs.bib"));
    Close();
    ExpectFailedSave("ERROR: Can't open file: ", file->path);
    EXPECT_EQ(OldText, folder.Read("refs.bib"));
    EXPECT_EQ(Names{"refs.bib"}, links.Names());
    BecomeRootAgain();
}

} // namespace
