// tests/file_set_test.cpp - the open files of a run: locks, saving, questions.

#include "session/FileSet.h"
#include "ui/PanelRules.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include <fcntl.h>
#include <pthread.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include "base/Sys.h"
#include "tests/support/LogWatch.h"
#include "tests/support/TempFolder.h"

using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Not;

namespace
{

const std::string Good = "@Misc{a,\n\tnote = {x}\n}\n";
const std::string Broken = "@Misc{a,\n\tnote = {x}\n}\n@Misc{b, note = }\n";

// What other programs see: 1 when somebody holds the lock.
int IsLocked(const std::string &path)
{
    int other = open(path.c_str(), O_RDWR);
    EXPECT_LE(0, other);
    int locked = flock(other, LOCK_EX | LOCK_NB) != 0;
    close(other);
    return locked;
}

// A lock held by what looks like another program.
struct OtherProgram {
    int descriptor;
    explicit OtherProgram(const std::string &path) : descriptor(open(path.c_str(), O_RDWR))
    {
        EXPECT_EQ(0, flock(descriptor, LOCK_EX | LOCK_NB));
    }
    ~OtherProgram() { close(descriptor); }
};

struct FileSet : testing::Test {
    LogWatch log;
    TempFolder folder;
    BibFileSet set = {};
    std::vector<std::string> boxes; // "caption|text"

    void SetUp() override
    {
        Bib_Initialize();
        set.boxOwner = this;
        set.box = [](void *owner, const char *caption, const char *text) {
            static_cast<FileSet *>(owner)->boxes.push_back(std::string(caption) + "|" + text);
        };
    }
    void TearDown() override { FileSet_Free(&set); }

    // Opens a new file; returns its record.
    BibFile *Open(const std::string &name, const std::string &text)
    {
        EXPECT_EQ(0, FileSet_Open(&set, folder.Write(name, text).c_str()));
        return set.files[set.count - 1];
    }
    std::string LoadErrors() const { return set.loadErrors ? set.loadErrors : ""; }
    std::string Question() const { return Panel_SaveQuestion(&set); }

    // A record that a save fails for, without a message box.
    BibFile *AddUnsavable()
    {
        BibFile *file = Open("unsavable.bib", Good);
        file->modified = 1;
        file->readOnly = 1;
        return file;
    }
};

// --- Opening ---

TEST_F(FileSet, OpensAFileAndLocksIt)
{
    BibFile *file = Open("refs.bib", Good);
    EXPECT_EQ(1, set.count);
    EXPECT_EQ(folder.Path("refs.bib"), file->path);
    EXPECT_STREQ("a", file->entries->key);
    EXPECT_EQ(0, file->readOnly);
    EXPECT_NE(0, file->lockHandle);
    EXPECT_TRUE(IsLocked(file->path));
    EXPECT_THAT(boxes, IsEmpty());
    EXPECT_EQ("", LoadErrors());
    EXPECT_THAT(log.Lines(), Contains("Loading: " + folder.Path("refs.bib")));
}

TEST_F(FileSet, AppendsInOrder)
{
    Open("b.bib", Good);
    Open("a.bib", Good);
    ASSERT_EQ(2, set.count);
    EXPECT_EQ(folder.Path("b.bib"), set.files[0]->path);
    EXPECT_EQ(folder.Path("a.bib"), set.files[1]->path);
}

TEST_F(FileSet, ProtectsAFileWithErrors)
{
    std::string path = folder.Write("broken.bib", Broken);
    int errors = FileSet_Open(&set, path.c_str());
    ASSERT_EQ(1, set.count);
    EXPECT_LT(0, errors);
    EXPECT_EQ(errors, set.files[0]->errorCount);
    EXPECT_EQ(1, set.files[0]->readOnly);
    EXPECT_EQ(1, set.files[0]->readOnlyByErrors);
    EXPECT_EQ(0, set.files[0]->lockHandle);
    EXPECT_FALSE(IsLocked(path));
    EXPECT_EQ("", LoadErrors());
}

TEST_F(FileSet, KeepsAFileWithWarningsAloneWritable)
{
    std::string path = folder.Write("refs.bib", "junk\n@misc{k, title = {x}}\n");
    EXPECT_EQ(0, FileSet_Open(&set, path.c_str()));
    ASSERT_EQ(1, set.count);
    EXPECT_EQ(1, set.files[0]->warningCount);
    EXPECT_EQ(0, set.files[0]->errorCount);
    EXPECT_EQ(0, set.files[0]->readOnly);
    EXPECT_EQ(0, set.files[0]->readOnlyByErrors);
    EXPECT_NE(0, set.files[0]->lockHandle);
    EXPECT_TRUE(IsLocked(path));
}

TEST_F(FileSet, IsLockedWhileItLoads)
{
    std::string path = folder.Write("refs.bib", Good);
    static const std::string *loading = &path;
    static int locked = 0;
    // When the process of the parser is about to start.
    pthread_atfork([] { locked = loading && IsLocked(*loading); }, nullptr, nullptr);
    EXPECT_EQ(0, FileSet_Open(&set, path.c_str()));
    loading = nullptr;
    EXPECT_EQ(1, locked);
    EXPECT_TRUE(IsLocked(path));
}

TEST_F(FileSet, TellsThatAnotherProgramHasTheFile)
{
    std::string path = folder.Write("refs.bib", Good);
    OtherProgram other(path);
    EXPECT_EQ(1, FileSet_Open(&set, path.c_str()));
    EXPECT_EQ(0, set.count);
    std::string reason = "The file is in use by another program";
    EXPECT_THAT(boxes, ElementsAre("Openning BIB file|File: `" + path + "'\n" + reason));
    // The log keeps to one line.
    EXPECT_THAT(log.Lines(), ElementsAre("ERROR: File: `" + path + "' " + reason));
    EXPECT_EQ("ERROR: File: `" + path + "'\n" + reason + "\n", LoadErrors());
}

TEST_F(FileSet, OnlyLogsWithoutABox)
{
    std::string path = folder.Write("refs.bib", Good);
    OtherProgram other(path);
    set.box = nullptr;
    EXPECT_EQ(1, FileSet_Open(&set, path.c_str()));
    EXPECT_EQ(1u, log.Lines().size());
}

TEST_F(FileSet, OpensTheSameFileASecondTimeForReading)
{
    BibFile *first = Open("refs.bib", Good);
    std::string link = folder.Path("link.bib");
    ASSERT_EQ(0, symlink("refs.bib", link.c_str()));
    for (const std::string &path : {folder.Path("refs.bib"), link}) {
        EXPECT_EQ(0, FileSet_Open(&set, path.c_str()));
        BibFile *second = set.files[set.count - 1];
        EXPECT_NE(first, second);
        EXPECT_EQ(path, second->path);
        EXPECT_EQ(1, second->readOnly);
        EXPECT_EQ(0, second->readOnlyByErrors);
        EXPECT_EQ(0, second->lockHandle);
        EXPECT_STREQ("a", second->entries->key);
    }
    EXPECT_NE(0, first->lockHandle);
    EXPECT_THAT(boxes, IsEmpty());
}

TEST_F(FileSet, OpensForReadingWhatAnotherSetHasLocked)
{
    BibFileSet before = {};
    std::string path = folder.Write("refs.bib", Good);
    EXPECT_EQ(0, FileSet_Open(&before, path.c_str()));
    EXPECT_EQ(0, FileSet_Open(&set, path.c_str()));
    EXPECT_EQ(0, before.files[0]->readOnly);
    EXPECT_EQ(1, set.files[0]->readOnly);
    EXPECT_THAT(boxes, IsEmpty());
    FileSet_Free(&before);
}

TEST_F(FileSet, KeepsBrokenSecondRecordsApartFromErrors)
{
    std::string path = folder.Write("broken.bib", Broken);
    EXPECT_LT(0, FileSet_Open(&set, path.c_str()));
    EXPECT_LT(0, FileSet_Open(&set, path.c_str()));
    ASSERT_EQ(2, set.count);
    EXPECT_EQ(1, set.files[1]->readOnlyByErrors);
    EXPECT_FALSE(IsLocked(path));
}

TEST_F(FileSet, OpensAProtectedFileWithoutALock)
{
    for (const std::string &text : {Good, Broken}) {
        std::string path = folder.Write("refs.bib", text);
        chmod(path.c_str(), 0444);
        chmod(folder.Path().c_str(), 0755);
        // Root may write everything.
        bool root = geteuid() == 0;
        if (root) {
            ASSERT_EQ(0, setresuid(65534, 65534, 0));
        }
        int errors = FileSet_Open(&set, path.c_str());
        if (root) {
            ASSERT_EQ(0, setresuid(0, 0, 0));
        }
        EXPECT_EQ(text == Broken, errors > 0);
        BibFile *file = set.files[set.count - 1];
        EXPECT_EQ(-1, file->readOnly);
        EXPECT_EQ(0, file->readOnlyByErrors);
        EXPECT_EQ(0, file->lockHandle);
        unlink(path.c_str());
    }
    EXPECT_EQ(2, set.count);
}

TEST_F(FileSet, TellsThatAFileIsMissing)
{
    std::string path = folder.Path("missing.bib");
    EXPECT_EQ(1, FileSet_Open(&set, path.c_str()));
    EXPECT_EQ(0, set.count);
    EXPECT_EQ("ERROR: The file '" + path + "' not found\n", LoadErrors());
    EXPECT_THAT(boxes, IsEmpty());
    EXPECT_THAT(log.Lines(), ElementsAre("Loading: " + path, "ERROR: Can't open file: " + path));
    EXPECT_THAT(folder.Names(), IsEmpty());
}

TEST_F(FileSet, TellsThatAPipeCannotBeOpened)
{
    std::string path = folder.Path("pipe.bib");
    ASSERT_EQ(0, mkfifo(path.c_str(), 0600));
    EXPECT_EQ(1, FileSet_Open(&set, path.c_str()));
    EXPECT_EQ(0, set.count);
    EXPECT_EQ("ERROR: File: `" + path + "'\nOperation not supported\n", LoadErrors());
    EXPECT_EQ(1u, boxes.size());
}

TEST_F(FileSet, CollectsTheErrorsOfARun)
{
    EXPECT_EQ(1, FileSet_Open(&set, folder.Path("a.bib").c_str()));
    FileSet_AppendError(&set, "%s and %d\n", "more", 7);
    EXPECT_EQ("ERROR: The file '" + folder.Path("a.bib") + "' not found\nmore and 7\n",
              LoadErrors());
}

TEST_F(FileSet, GoesOnAfterABadFile)
{
    EXPECT_EQ(1, FileSet_Open(&set, folder.Path("missing.bib").c_str()));
    Open("refs.bib", Good);
    EXPECT_EQ(1, set.count);
}

// --- Finding and counting ---

TEST_F(FileSet, FindsAFileByItsPath)
{
    Open("a.bib", Good);
    Open("b.bib", Good);
    EXPECT_EQ(0, FileSet_Find(&set, folder.Path("a.bib").c_str()));
    EXPECT_EQ(1, FileSet_Find(&set, folder.Path("b.bib").c_str()));
    EXPECT_EQ(-1, FileSet_Find(&set, folder.Path("c.bib").c_str()));
    EXPECT_EQ(-1, FileSet_Find(&set, folder.Path("a.bi").c_str()));
}

TEST_F(FileSet, FindsTheSameFileInAnotherCase)
{
    Open("Refs.bib", Good);
    std::string other = folder.Path("REFS.BIB");
    // As on a system that ignores case.
    ASSERT_EQ(0, link(folder.Path("Refs.bib").c_str(), other.c_str()));
    EXPECT_EQ(0, FileSet_Find(&set, other.c_str()));
}

TEST_F(FileSet, TellsTwoFilesApartThatDifferInCase)
{
    Open("Refs.bib", Good);
    EXPECT_EQ(-1, FileSet_Find(&set, folder.Write("refs.bib", Good).c_str()));
}

TEST_F(FileSet, FindsAFileThatIsGone)
{
    Open("Refs.bib", Good);
    unlink(folder.Path("Refs.bib").c_str());
    EXPECT_EQ(0, FileSet_Find(&set, folder.Path("Refs.bib").c_str()));
    EXPECT_EQ(0, FileSet_Find(&set, folder.Path("refs.BIB").c_str()));
    EXPECT_EQ(-1, FileSet_Find(&set, folder.Write("refs.bib", Good).c_str()));
}

TEST_F(FileSet, CountsEntriesOfAllFiles)
{
    EXPECT_EQ(0, FileSet_EntryCount(&set));
    Open("a.bib", Good + "@Misc{b, note = 1}\n");
    Open("b.bib", "");
    Open("c.bib", Good);
    EXPECT_EQ(3, FileSet_EntryCount(&set));
}

TEST_F(FileSet, TreatsARecordThatIsListedTwiceAsOneFile)
{
    BibFile *file = Open("a.bib", Good);
    FileSet_Append(&set, file);
    file->modified = 5;
    EXPECT_EQ(2, FileSet_EntryCount(&set));
    EXPECT_EQ(1, FileSet_ModifiedCount(&set));
    EXPECT_EQ("There are modified Bib-files:\n\n" + folder.Path("a.bib") +
                  "\n\nDo you want to save them ?",
              Question());
    EXPECT_EQ(1, FileSet_SaveAll(&set));
    FileSet_Free(&set);
    EXPECT_EQ(0, set.count);
}

TEST_F(FileSet, TriesARecordThatIsListedTwiceOnce)
{
    FileSet_Append(&set, AddUnsavable());
    log.Lines();
    EXPECT_EQ(0, FileSet_SaveAll(&set));
    EXPECT_EQ(1u, log.Lines().size());
}

TEST_F(FileSet, ReleasesTheLocksWhenFreed)
{
    Open("a.bib", Good);
    Open("b.bib", Good)->modified = 1;
    FileSet_AppendError(&set, "text");
    FileSet_Free(&set);
    EXPECT_EQ(0, set.count);
    EXPECT_EQ(nullptr, set.files);
    EXPECT_EQ("", LoadErrors());
    EXPECT_FALSE(IsLocked(folder.Path("a.bib")));
    EXPECT_FALSE(IsLocked(folder.Path("b.bib")));
    EXPECT_EQ((std::set<std::string>{"a.bib", "b.bib"}), folder.Names());
}

// --- Saving ---

TEST_F(FileSet, SavesAllModifiedFiles)
{
    Open("a.bib", "@misc{a,note={x}}\n")->modified = 1;
    Open("b.bib", "@misc{b,note={x}}\n");
    Open("c.bib", "@misc{c,note={x}}\n")->modified = 2;
    EXPECT_EQ(2, FileSet_ModifiedCount(&set));
    EXPECT_EQ("There are modified Bib-files:\n\n" + folder.Path("a.bib") + "\n" +
                  folder.Path("c.bib") + "\n\nDo you want to save them ?",
              Question());
    EXPECT_EQ(1, FileSet_SaveAll(&set));
    EXPECT_EQ(0, FileSet_ModifiedCount(&set));
    EXPECT_EQ("@misc{a,\n\tnote = {x}\n}\n", folder.Read("a.bib"));
    EXPECT_EQ("@misc{b,note={x}}\n", folder.Read("b.bib"));
    EXPECT_EQ("@misc{c,\n\tnote = {x}\n}\n", folder.Read("c.bib"));
    EXPECT_THAT(boxes, IsEmpty());
}

TEST_F(FileSet, SavesNothingWhenNothingIsModified)
{
    EXPECT_EQ(0, FileSet_SaveAll(&set));
    Open("a.bib", Good);
    EXPECT_EQ(0, FileSet_SaveAll(&set));
    EXPECT_EQ(std::set<std::string>{"a.bib"}, folder.Names());
}

TEST_F(FileSet, SavesTheOthersWhenOneFails)
{
    BibFile *first = AddUnsavable();
    BibFile *second = Open("b.bib", Good);
    second->modified = 1;
    EXPECT_EQ(0, FileSet_SaveAll(&set));
    EXPECT_EQ(1, first->modified);
    EXPECT_EQ(0, second->modified);
    EXPECT_EQ(1, FileSet_ModifiedCount(&set));
    // A failure at the end is no success either.
    second->modified = 1;
    std::swap(set.files[0], set.files[1]);
    EXPECT_EQ(0, FileSet_SaveAll(&set));
}

TEST_F(FileSet, LocksTheNewFileAfterSaving)
{
    BibFile *file = Open("a.bib", Good);
    for (int save = 0; save < 3; ++save) {
        file->modified = 1;
        EXPECT_EQ(1, FileSet_SaveOne(&set, file));
        EXPECT_NE(0, file->lockHandle);
        EXPECT_TRUE(IsLocked(file->path));
    }
    for (const std::string &name : folder.Names())
        EXPECT_EQ(name == "a.bib", IsLocked(folder.Path(name))) << name;
    EXPECT_EQ(2u, folder.Names().size());
}

TEST_F(FileSet, LeavesAFileUnlockedThatIsSavedForTheLastTime)
{
    BibFile *file = Open("a.bib", Good);
    file->modified = 1;
    EXPECT_EQ(1, FileSet_SaveLast(&set, file));
    EXPECT_EQ(0, file->lockHandle);
    EXPECT_FALSE(IsLocked(file->path));

    BibFile *failing = Open("b.bib", Good);
    failing->modified = 1;
    failing->readOnly = 1;
    EXPECT_EQ(0, FileSet_SaveLast(&set, failing));
    EXPECT_NE(0, failing->lockHandle);
}

TEST_F(FileSet, LocksTheOldFileAgainAfterAFailure)
{
    BibFile *file = Open("a.bib", Good);
    file->modified = 1;
    file->readOnly = 1;
    EXPECT_EQ(0, FileSet_SaveOne(&set, file));
    EXPECT_EQ(1, file->modified);
    EXPECT_NE(0, file->lockHandle);
    EXPECT_TRUE(IsLocked(file->path));
}

TEST_F(FileSet, TakesNoLockThatItDidNotHold)
{
    BibFile *file = Open("a.bib", Good);
    Sys_UnlockFile(file->lockHandle);
    file->lockHandle = 0;
    file->modified = 1;
    EXPECT_EQ(1, FileSet_SaveOne(&set, file));
    EXPECT_EQ(0, file->lockHandle);
    EXPECT_FALSE(IsLocked(file->path));
}

TEST_F(FileSet, TellsThatTheLockIsLost)
{
    BibFile *file = Open("a.bib", Good);
    std::string path = file->path;
    // Saving fails, and so does locking: the path has become a folder.
    unlink(path.c_str());
    ASSERT_EQ(0, mkdir(path.c_str(), 0700));
    file->backupDone = 1;
    file->modified = 1;
    log.Lines();
    EXPECT_EQ(0, FileSet_SaveOne(&set, file));
    EXPECT_EQ(0, file->lockHandle);
    EXPECT_EQ(1, file->modified);
    EXPECT_THAT(boxes, ElementsAre("ReLocking BIB file|File: `" + path + "'\nIs a directory"));
    EXPECT_THAT(log.Lines(), ElementsAre("ERROR: Can't open file: " + path,
                                         "ERROR: File: `" + path + "' Is a directory"));
    EXPECT_EQ("File: `" + path + "'\nIs a directory\n", std::string(set.saveErrors));
}

TEST_F(FileSet, TellsWhyFilesWereNotSaved)
{
    BibFile *a = Open("a.bib", Good);
    BibFile *b = Open("b.bib", Good);
    a->modified = b->modified = 1;
    b->readOnly = 1;
    EXPECT_EQ(0, FileSet_SaveAll(&set));
    EXPECT_EQ("File: `" + std::string(b->path) + "'\nThe file is read-only\n",
              std::string(set.saveErrors));
    b->readOnly = 0;
    EXPECT_EQ(1, FileSet_SaveAll(&set));
    EXPECT_EQ(nullptr, set.saveErrors);
}

TEST_F(FileSet, ListsEachModifiedFileOnce)
{
    BibFile *a = Open("a.bib", Good);
    BibFile *b = Open("b.bib", Good);
    Open("c.bib", Good);
    FileSet_Append(&set, a);
    a->modified = b->modified = 1;
    EXPECT_EQ(std::string(a->path) + "\n" + b->path + "\n", FileSet_ModifiedPaths(&set));
}

} // namespace
