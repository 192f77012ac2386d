// tests/sys_test.cpp - files, locks and small questions to the system.

#include "base/Sys.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <string>

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include "store/BibStore.h"
#include "tests/support/TempFolder.h"
#include "tests/support/ToldLater.h"

namespace
{

using Names = std::set<std::string>;

// Runs `test` in another process: 1 when it returned nonzero there.
template <typename Test> int InAnotherProcess(Test test)
{
    pid_t child = fork();
    if (child == 0)
        _exit(test() ? 0 : 1);
    int status = -1;
    waitpid(child, &status, 0);
    EXPECT_TRUE(WIFEXITED(status));
    return WEXITSTATUS(status) == 0;
}

int IsLockable(const std::string &path)
{
    return InAnotherProcess([&] { return Sys_LockFile(path.c_str()) != 0; });
}

// --- Small functions ---

TEST(SysLastErrorText, DescribesTheLastError)
{
    errno = ENOENT;
    EXPECT_STREQ("No such file or directory", Sys_LastErrorText());
    errno = EACCES;
    EXPECT_STREQ("Permission denied", Sys_LastErrorText());
    EXPECT_EQ(0, Sys_LockFile("/no/such/folder/file"));
    EXPECT_STREQ("No such file or directory", Sys_LastErrorText());
    EXPECT_EQ(0, Sys_LockFile("/"));
    EXPECT_STREQ("Is a directory", Sys_LastErrorText());
    errno = ETXTBSY;
    EXPECT_STREQ("The file is in use by another program", Sys_LastErrorText());
}

TEST(SysToBackslashes, TurnsEverySlash)
{
    char path[] = "/a/b\\c//d.bib/";
    EXPECT_EQ(path, Sys_ToBackslashes(path));
    EXPECT_STREQ("\\a\\b\\c\\\\d.bib\\", path);
}

TEST(SysToBackslashes, LeavesNothingAlone)
{
    char empty[] = "";
    EXPECT_EQ(empty, Sys_ToBackslashes(empty));
    EXPECT_EQ(nullptr, Sys_ToBackslashes(nullptr));
}

TEST(SysModulePath, IsThisProgram)
{
    EXPECT_EQ(std::filesystem::canonical("/proc/self/exe").string().substr(0, 260),
              Sys_ModulePath());
}

TEST(SysMilliseconds, Passes)
{
    int32_t before = Sys_Milliseconds();
    usleep(30000);
    int32_t passed = Sys_Milliseconds() - before;
    EXPECT_LE(29, passed);
    EXPECT_GT(10000, passed);
}

TEST(SysCurrentFolder, FitsOrFails)
{
    TempFolder folder;
    std::string path = std::filesystem::canonical(folder.Path());
    ASSERT_EQ(0, chdir(path.c_str()));
    char buffer[PATH_MAX];
    EXPECT_EQ(1, Sys_CurrentFolder(buffer, sizeof buffer));
    EXPECT_EQ(path, buffer);
    EXPECT_EQ(1, Sys_CurrentFolder(buffer, path.size() + 1));
    EXPECT_EQ(0, Sys_CurrentFolder(buffer, path.size()));
}

// --- Questions about files ---

TEST(SysFileExists, LooksThroughLinks)
{
    TempFolder folder;
    std::string path = folder.Write("file", "");
    std::string link = folder.Path("link");
    ASSERT_EQ(0, symlink("file", link.c_str()));
    EXPECT_EQ(1, Sys_FileExists(path.c_str()));
    EXPECT_EQ(1, Sys_FileExists(link.c_str()));
    EXPECT_EQ(1, Sys_FileExists(folder.Path().c_str()));
    unlink(path.c_str());
    EXPECT_EQ(0, Sys_FileExists(path.c_str()));
    EXPECT_EQ(0, Sys_FileExists(link.c_str()));
    EXPECT_EQ(0, Sys_FileExists(""));
}

TEST(SysIsWritable, IsFalseWhereWritingIsRefused)
{
    TempFolder folder;
    std::string path = folder.Write("file", "");
    EXPECT_EQ(1, Sys_IsWritable(path.c_str()));
    EXPECT_EQ(0, Sys_IsWritable(folder.Path("missing").c_str()));
    chmod(path.c_str(), 0444);
    chmod(folder.Path().c_str(), 0755);
    EXPECT_TRUE(InAnotherProcess([&] {
        return (geteuid() != 0 || setuid(65534) == 0) && Sys_IsWritable(path.c_str()) == 0;
    }));
}

TEST(SysSameFile, SeesThroughNames)
{
    TempFolder folder;
    std::string a = folder.Write("a", "text");
    std::string b = folder.Write("b", "text");
    std::string link = folder.Path("link");
    std::string hard = folder.Path("hard");
    ASSERT_EQ(0, symlink("a", link.c_str()));
    ASSERT_EQ(0, ::link(a.c_str(), hard.c_str()));
    EXPECT_EQ(1, Sys_SameFile(a.c_str(), a.c_str()));
    EXPECT_EQ(1, Sys_SameFile(a.c_str(), link.c_str()));
    EXPECT_EQ(1, Sys_SameFile(hard.c_str(), a.c_str()));
    EXPECT_EQ(1, Sys_SameFile(a.c_str(), folder.Path("./a").c_str()));
    EXPECT_EQ(0, Sys_SameFile(a.c_str(), b.c_str()));
    EXPECT_EQ(0, Sys_SameFile("/missing", "/missing"));
}

TEST(SysFileStamp, ChangesWithTheFile)
{
    TempFolder folder;
    std::string path = folder.Write("file", "text");
    uint64_t first = Sys_FileStamp(path.c_str());
    EXPECT_EQ(first, Sys_FileStamp(path.c_str()));
    FILE *stream = Sys_OpenRegular(path.c_str());
    ASSERT_TRUE(stream);
    EXPECT_EQ(first, Sys_StreamStamp(stream));
    fclose(stream);
    folder.Write("file", "texts");
    uint64_t written = Sys_FileStamp(path.c_str());
    EXPECT_NE(first, written);
    folder.Write("other", "texts");
    ASSERT_EQ(0, rename(folder.Path("other").c_str(), path.c_str()));
    EXPECT_NE(written, Sys_FileStamp(path.c_str()));
}

TEST(SysFileStamp, IsNothingForWhatIsNoRegularFile)
{
    TempFolder folder;
    EXPECT_EQ(0u, Sys_FileStamp(folder.Path("missing").c_str()));
    EXPECT_EQ(0u, Sys_FileStamp(folder.Path().c_str()));
    EXPECT_EQ(0u, Sys_FileStamp("/dev/null"));
}

// --- Reading ---

std::string ReadAll(FILE *stream)
{
    size_t length = 0;
    char *text = Sys_ReadAll(stream, &length);
    EXPECT_TRUE(text);
    text[length] = 'x'; // the spare byte is ours
    std::string all(text, length);
    free(text);
    return all;
}

TEST(SysReadAll, ReadsAFile)
{
    TempFolder folder;
    for (size_t size : {0, 1, 4095, 4096, 4097, 1000000}) {
        std::string text(size, 'a');
        if (size > 0)
            text[size / 2] = 0;
        FILE *stream = Sys_OpenRegular(folder.Write("file", text).c_str());
        ASSERT_TRUE(stream);
        EXPECT_TRUE(text == ReadAll(stream)) << size;
        fclose(stream);
    }
}

TEST(SysReadAll, ReadsTheRest)
{
    TempFolder folder;
    FILE *stream = Sys_OpenRegular(folder.Write("file", "abcdef").c_str());
    ASSERT_TRUE(stream);
    fgetc(stream);
    fgetc(stream);
    EXPECT_EQ("cdef", ReadAll(stream));
    EXPECT_EQ("", ReadAll(stream));
    fclose(stream);
}

TEST(SysReadAll, ReadsAStreamOfUnknownLength)
{
    FILE *stream = popen("head -c 300000 /dev/zero", "r");
    ASSERT_TRUE(stream);
    EXPECT_TRUE(std::string(300000, '\0') == ReadAll(stream));
    pclose(stream);
}

TEST(SysReadAll, FailsWhereReadingFails)
{
    SysReason why = {};
    FILE *stream = fopen("/", "r");
    ASSERT_TRUE(stream);
    size_t length;
    EXPECT_EQ(nullptr, Sys_ReadAll(stream, &length, &why));
    fclose(stream);
    EXPECT_EQ("Is a directory", ToldLater(why));
}

TEST(SysReadAll, SaysThatAnEarlierReadFailed)
{
    SysReason why = {};
    FILE *stream = fopen("/", "r");
    ASSERT_TRUE(stream);
    EXPECT_EQ(EOF, fgetc(stream));
    FILE *file = fopen("/dev/null", "r");
    ASSERT_LE(0, dup2(fileno(file), fileno(stream)));
    fclose(file);
    size_t length;
    errno = EDOM;
    EXPECT_EQ(nullptr, Sys_ReadAll(stream, &length, &why));
    fclose(stream);
    EXPECT_EQ("Input/output error", ToldLater(why));
}

// --- Writing ---

TEST(SysWriteStream, SaysWhyItFails)
{
    SysReason why = {};
    std::string large(100000, 'x');
    FILE *stream = fopen("/dev/full", "w");
    ASSERT_TRUE(stream);
    EXPECT_EQ(0, Sys_WriteStream(stream, large.data(), large.size(), &why));
    fclose(stream);
    EXPECT_EQ("No space left on device", ToldLater(why));
}

TEST(SysWriteStream, WritesToFiles)
{
    SysReason why = {};
    TempFolder folder;
    std::string large(100000, 'x');
    FILE *stream = fopen(folder.Path("file").c_str(), "w");
    ASSERT_TRUE(stream);
    EXPECT_EQ(1, Sys_WriteStream(stream, large.data(), large.size(), &why));
    EXPECT_EQ(1, Sys_WriteStream(stream, "", 0, &why));
    fclose(stream);
    EXPECT_TRUE(large == folder.Read("file"));
    EXPECT_STREQ("", why.text);
}

TEST(SysOpenRegular, RefusesEverythingElseWithoutWaiting)
{
    SysReason why = {};
    TempFolder folder;
    std::string pipe = folder.Path("pipe");
    ASSERT_EQ(0, mkfifo(pipe.c_str(), 0600));
    EXPECT_EQ(nullptr, Sys_OpenRegular(pipe.c_str(), &why));
    EXPECT_EQ("Operation not supported", ToldLater(why));
    EXPECT_EQ(nullptr, Sys_OpenRegular("/dev/null"));
    EXPECT_EQ(nullptr, Sys_OpenRegular(folder.Path().c_str(), &why));
    EXPECT_EQ("Is a directory", ToldLater(why));
    EXPECT_EQ(nullptr, Sys_OpenRegular(folder.Path("missing").c_str(), &why));
    EXPECT_EQ("No such file or directory", ToldLater(why));
}

// --- Locks ---

struct SysLockFile : testing::Test {
    TempFolder folder;
    std::string path = folder.Write("refs.bib", "text");
    SysReason why = {};
    int handle = 0;

    void Lock() { ASSERT_NE(0, handle = Sys_LockFile(path.c_str())); }
    void TearDown() override { Sys_UnlockFile(handle); }
};

TEST_F(SysLockFile, ShutsOthersOutUntilItIsReleased)
{
    Lock();
    EXPECT_FALSE(IsLockable(path));
    Sys_UnlockFile(handle);
    handle = 0;
    EXPECT_TRUE(IsLockable(path));
}

TEST_F(SysLockFile, SaysWhyItFails)
{
    Lock();
    EXPECT_EQ(0, Sys_LockFile(path.c_str(), &why));
    EXPECT_EQ("The file is in use by another program", ToldLater(why));
    EXPECT_EQ(1, why.isTaken);
    EXPECT_EQ(0, Sys_LockFile(folder.Path("missing/refs.bib").c_str(), &why));
    EXPECT_EQ("No such file or directory", ToldLater(why));
    EXPECT_EQ(0, why.isTaken);
}

TEST_F(SysLockFile, LetsOthersRead)
{
    Lock();
    EXPECT_EQ("text", folder.Read("refs.bib"));
}

TEST_F(SysLockFile, CreatesAMissingFile)
{
    path = folder.Path("new.bib");
    Lock();
    EXPECT_EQ("", folder.Read("new.bib"));
    EXPECT_EQ((Names{"new.bib", "refs.bib"}), folder.Names());
}

TEST_F(SysLockFile, OutlivesOtherDescriptorsOfTheFile)
{
    Lock();
    fclose(fopen(path.c_str(), "r+"));
    EXPECT_FALSE(IsLockable(path));
}

TEST_F(SysLockFile, IsReleasedEvenWhenAChildHoldsACopy)
{
    Lock();
    int hold[2];
    ASSERT_EQ(0, pipe(hold));
    pid_t child = fork();
    if (child == 0) {
        char byte;
        close(hold[1]);
        _exit(static_cast<int>(read(hold[0], &byte, 1)));
    }
    Sys_UnlockFile(handle);
    handle = 0;
    EXPECT_TRUE(IsLockable(path));
    close(hold[0]);
    close(hold[1]);
    waitpid(child, nullptr, 0);
}

TEST_F(SysLockFile, IsNotInheritedByPrograms)
{
    Lock();
    EXPECT_TRUE(fcntl(handle, F_GETFD) & FD_CLOEXEC);
}

TEST_F(SysLockFile, IsNeverDescriptorZero)
{
    EXPECT_TRUE(InAnotherProcess([&] {
        close(0);
        int lock = Sys_LockFile(path.c_str());
        bool isZeroFree = fcntl(0, F_GETFD) == -1;
        return lock > 0 && isZeroFree && (fcntl(lock, F_GETFD) & FD_CLOEXEC) &&
               Sys_LockFile(path.c_str()) == 0;
    }));
}

// A line of the log would land in the user's file.
TEST_F(SysLockFile, IsNeverAStandardStream)
{
    for (int closed : {1, 2})
        EXPECT_TRUE(InAnotherProcess([&] {
            close(closed);
            return Sys_LockFile(path.c_str()) > 2 && fcntl(closed, F_GETFD) == -1;
        }));
}

TEST_F(SysLockFile, RefusesEverythingButRegularFilesWithoutWaiting)
{
    std::string pipe = folder.Path("pipe");
    ASSERT_EQ(0, mkfifo(pipe.c_str(), 0600));
    EXPECT_EQ(0, Sys_LockFile(pipe.c_str(), &why));
    EXPECT_EQ("Operation not supported", ToldLater(why));
    EXPECT_EQ(0, Sys_LockFile(folder.Path().c_str(), &why));
    EXPECT_EQ("Is a directory", ToldLater(why));
    EXPECT_EQ(0, Sys_LockFile("/dev/null"));
}

TEST_F(SysLockFile, BelongsToTheFileNotToThePath)
{
    Lock();
    folder.Write("other", "text");
    ASSERT_EQ(0, rename(folder.Path("other").c_str(), path.c_str()));
    EXPECT_TRUE(IsLockable(path));
    EXPECT_EQ(0, Sys_IsLockedHere(path.c_str()));
}

TEST_F(SysLockFile, IsKnownUnderEveryNameOfTheFile)
{
    std::string link = folder.Path("link");
    ASSERT_EQ(0, symlink("refs.bib", link.c_str()));
    EXPECT_EQ(0, Sys_IsLockedHere(path.c_str()));
    Lock();
    EXPECT_EQ(1, Sys_IsLockedHere(path.c_str()));
    EXPECT_EQ(1, Sys_IsLockedHere(link.c_str()));
    EXPECT_EQ(0, Sys_IsLockedHere(folder.Path("missing").c_str()));
    Sys_UnlockFile(handle);
    handle = 0;
    EXPECT_EQ(0, Sys_IsLockedHere(path.c_str()));
}

TEST_F(SysLockFile, OfSomebodyElseIsNotOurs)
{
    int other = open(path.c_str(), O_RDWR);
    ASSERT_EQ(0, flock(other, LOCK_EX));
    EXPECT_EQ(0, Sys_LockFile(path.c_str()));
    EXPECT_EQ(0, Sys_IsLockedHere(path.c_str()));
    close(other);
}

TEST_F(SysLockFile, LeavesNoDescriptorBehindWhenItFails)
{
    Lock();
    int before = open("/dev/null", O_RDONLY);
    close(before);
    EXPECT_EQ(0, Sys_LockFile(path.c_str()));
    EXPECT_EQ(0, Sys_LockFile(folder.Path().c_str()));
    EXPECT_EQ(0, Sys_LockFile("/dev/null"));
    int after = open("/dev/null", O_RDONLY);
    close(after);
    EXPECT_EQ(before, after);
}

// --- Keeping and replacing ---

TEST(SysKeepCopy, NeverReplaces)
{
    TempFolder folder;
    std::string path = folder.Write("file", "text");
    std::string copy = folder.Write("copy", "mine");
    EXPECT_EQ(0, Sys_KeepCopy(path.c_str(), copy.c_str()));
    EXPECT_EQ("mine", folder.Read("copy"));
    unlink(copy.c_str());
    ASSERT_EQ(0, symlink("missing", copy.c_str()));
    EXPECT_EQ(0, Sys_KeepCopy(path.c_str(), copy.c_str()));
    EXPECT_EQ((Names{"copy", "file"}), folder.Names());
}

TEST(SysKeepCopy, NeverReplacesOnAnotherFileSystem)
{
    TempFolder folder;
    TempFolder other("/dev/shm");
    std::string path = folder.Write("file", "text");
    std::string copy = other.Write("copy", "mine");
    EXPECT_EQ(0, Sys_KeepCopy(path.c_str(), copy.c_str()));
    EXPECT_EQ("mine", other.Read("copy"));
    unlink(copy.c_str());
    EXPECT_EQ(1, Sys_KeepCopy(path.c_str(), copy.c_str()));
    EXPECT_EQ("text", other.Read("copy"));
    EXPECT_EQ("text", folder.Read("file"));
}

TEST(SysKeepCopy, FailsWithoutAFile)
{
    SysReason why = {};
    TempFolder folder;
    EXPECT_EQ(0, Sys_KeepCopy(folder.Path("missing").c_str(), folder.Path("copy").c_str(), &why));
    EXPECT_EQ("No such file or directory", ToldLater(why));
    EXPECT_EQ(0, Sys_KeepCopy(folder.Path().c_str(), folder.Path("copy").c_str()));
    EXPECT_TRUE(folder.Names().empty());
}

TEST(SysKeepCopy, SaysWhyACopyToAnotherFileSystemFails)
{
    SysReason why = {};
    TempFolder folder;
    TempFolder other("/dev/shm");
    std::string path = folder.Write("file", "text");
    std::string copy = other.Write("copy", "mine");
    EXPECT_EQ(0, Sys_KeepCopy(path.c_str(), copy.c_str(), &why));
    EXPECT_EQ("File exists", ToldLater(why));
}

TEST(SysRemoveFile, SaysWhyItFails)
{
    SysReason why = {};
    TempFolder folder;
    std::string path = folder.Write("file", "text");
    EXPECT_EQ(1, Sys_RemoveFile(path.c_str(), &why));
    EXPECT_EQ(0, Sys_RemoveFile(path.c_str(), &why));
    EXPECT_EQ("No such file or directory", ToldLater(why));
    EXPECT_EQ(0, Sys_RemoveFile(folder.Path().c_str(), &why));
    EXPECT_EQ("Is a directory", ToldLater(why));
}

struct SysReplaceFile : testing::Test {
    TempFolder folder;
    SysReason why = {};
    std::string path = folder.Write("file", "old");
    SysReplace replace = {};

    void Start()
    {
        ASSERT_EQ(1, Sys_StartReplace(&replace, path.c_str()));
        fputs("new", replace.stream);
    }
};

TEST_F(SysReplaceFile, LeavesThePathAloneUntilTheEnd)
{
    Start();
    fflush(replace.stream);
    EXPECT_EQ("old", folder.Read("file"));
    EXPECT_EQ(1, Sys_CommitReplace(&replace));
    EXPECT_EQ("new", folder.Read("file"));
    EXPECT_EQ(Names{"file"}, folder.Names());
}

TEST_F(SysReplaceFile, LeavesNoTraceWhenCancelled)
{
    Start();
    Sys_CancelReplace(&replace);
    EXPECT_EQ("old", folder.Read("file"));
    EXPECT_EQ(Names{"file"}, folder.Names());
}

TEST_F(SysReplaceFile, IsNotCommittedAfterAWriteError)
{
    Start();
    // The stream goes on as one to a full disk.
    int full = open("/dev/full", O_WRONLY);
    ASSERT_LE(0, dup2(full, fileno(replace.stream)));
    close(full);
    EXPECT_EQ(0, Sys_CommitReplace(&replace, &why));
    EXPECT_EQ("No space left on device", ToldLater(why));
    EXPECT_EQ("old", folder.Read("file"));
    EXPECT_EQ(Names{"file"}, folder.Names());
}

TEST_F(SysReplaceFile, IsNotCommittedWhenTheTargetBecameAFolder)
{
    Start();
    unlink(path.c_str());
    ASSERT_EQ(0, mkdir(path.c_str(), 0700));
    EXPECT_EQ(0, Sys_CommitReplace(&replace, &why));
    EXPECT_EQ("Is a directory", ToldLater(why));
    EXPECT_EQ(Names{"file"}, folder.Names());
}

TEST_F(SysReplaceFile, IsNotCommittedWhenAnEarlierWriteFailed)
{
    Start();
    int file = dup(fileno(replace.stream));
    int full = open("/dev/full", O_WRONLY);
    ASSERT_LE(0, dup2(full, fileno(replace.stream)));
    EXPECT_EQ(EOF, fflush(replace.stream));
    // There is room again.
    ASSERT_LE(0, dup2(file, fileno(replace.stream)));
    close(file);
    close(full);
    errno = EDOM;
    EXPECT_EQ(0, Sys_CommitReplace(&replace, &why));
    EXPECT_EQ("Input/output error", ToldLater(why));
    EXPECT_EQ("old", folder.Read("file"));
}

TEST_F(SysReplaceFile, SaysWhyItCannotStart)
{
    EXPECT_EQ(0, Sys_StartReplace(&replace, folder.Path("missing/file").c_str(), &why));
    EXPECT_EQ("No such file or directory", ToldLater(why));
    EXPECT_EQ(0, Sys_StartReplace(&replace, folder.Path().c_str(), &why));
    EXPECT_EQ("Is a directory", ToldLater(why));
    std::string link = folder.Path("link");
    ASSERT_EQ(0, symlink("link", link.c_str()));
    EXPECT_EQ(0, Sys_StartReplace(&replace, link.c_str(), &why));
    EXPECT_EQ("Too many levels of symbolic links", ToldLater(why));
}

TEST_F(SysReplaceFile, DoesNotWriteToAStandardStream)
{
    EXPECT_TRUE(InAnotherProcess([&] {
        close(2);
        return Sys_StartReplace(&replace, path.c_str()) && fileno(replace.stream) > 2;
    }));
}

TEST_F(SysReplaceFile, DoesNotReuseATemporaryName)
{
    Start();
    SysReplace second = {};
    ASSERT_EQ(1, Sys_StartReplace(&second, path.c_str()));
    EXPECT_STRNE(replace.temporary, second.temporary);
    Sys_CancelReplace(&second);
    EXPECT_EQ(1, Sys_CommitReplace(&replace));
    EXPECT_EQ("new", folder.Read("file"));
}

TEST_F(SysReplaceFile, HidesTheNewContentsOfAPrivateFile)
{
    chmod(path.c_str(), 0600);
    Start();
    struct stat status;
    ASSERT_EQ(0, stat(replace.temporary, &status));
    EXPECT_EQ(0600u, status.st_mode & 07777u);
    Sys_CancelReplace(&replace);
}

TEST_F(SysReplaceFile, LetsGoOfTheGroupsRightsWithTheGroup)
{
    if (geteuid() != 0)
        GTEST_SKIP() << "only root can make a file of a group that the user is not in";
    ASSERT_EQ(0, chown(path.c_str(), 65534, 65533));
    chmod(path.c_str(), 0664);
    chmod(folder.Path().c_str(), 0777);
    ASSERT_EQ(0, setresgid(65534, 65534, 0));
    ASSERT_EQ(0, setresuid(65534, 65534, 0));
    Start();
    EXPECT_EQ(1, Sys_CommitReplace(&replace));
    struct stat status;
    ASSERT_EQ(0, stat(path.c_str(), &status));
    EXPECT_EQ(65534u, status.st_gid);
    EXPECT_EQ(0644u, status.st_mode & 07777u);
    ASSERT_EQ(0, setresuid(0, 0, 0));
    ASSERT_EQ(0, setresgid(0, 0, 0));
}

} // namespace

TEST(SysSurviveFailedWrites, TurnsSignalsIntoFailures)
{
    Sys_SurviveFailedWrites();
    int ends[2];
    ASSERT_EQ(0, pipe(ends));
    close(ends[0]);
    EXPECT_EQ(-1, write(ends[1], "x", 1));
    EXPECT_EQ(EPIPE, errno);
    close(ends[1]);
}

// --- Standard streams ---

TEST(SysFillStandard, KeepsOtherFilesOffTheStandardNumbers)
{
    pid_t child = fork();
    if (child == 0) {
        close(0);
        close(2);
        Sys_FillStandard();
        int next = open("/dev/null", O_RDONLY);
        _exit(fcntl(0, F_GETFD) == 0 && fcntl(2, F_GETFD) == 0 && next > 2 ? 0 : 1);
    }
    int status = -1;
    waitpid(child, &status, 0);
    EXPECT_EQ(0, status);
}
