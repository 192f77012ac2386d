#include "base/Sys.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <string>

#include <sys/resource.h>
#include <unistd.h>

namespace
{

// Reads to the end and returns what came.
std::string ReadAll(SysChild *child)
{
    std::string all;
    char buffer[1000];
    long got;
    while ((got = Sys_ReadChild(child, buffer, sizeof buffer, 30)) > 0)
        all.append(buffer, static_cast<size_t>(got));
    EXPECT_EQ(0, got);
    return all;
}

struct Outcome {
    std::string written;
    SysChildEnd end;
};

Outcome RunChild(void (*body)(void *), int cpuSeconds = 10)
{
    SysChild child;
    EXPECT_EQ(1, Sys_StartChild(&child, body, nullptr, cpuSeconds, nullptr));
    Outcome outcome;
    outcome.written = ReadAll(&child);
    outcome.end = Sys_EndChild(&child);
    return outcome;
}

void SayLastWords()
{
    Sys_WriteParent("crash", 5);
}

volatile int Endless = 1;

} // namespace

TEST(SysChild, SendsWhatItWrites)
{
    Outcome outcome = RunChild([](void *) { Sys_WriteParent("hello", 5); });
    EXPECT_EQ("hello", outcome.written);
    EXPECT_EQ(SYS_CHILD_DONE, outcome.end);
}

TEST(SysChild, GetsItsArgument)
{
    SysChild child;
    char text[] = "argument";
    ASSERT_EQ(1, Sys_StartChild(
                     &child,
                     [](void *argument) {
                         const char *given = static_cast<const char *>(argument);
                         Sys_WriteParent(given, strlen(given));
                     },
                     text, 10, nullptr));
    EXPECT_EQ("argument", ReadAll(&child));
    EXPECT_EQ(SYS_CHILD_DONE, Sys_EndChild(&child));
}

TEST(SysChild, SendsMoreThanAPipeHolds)
{
    Outcome outcome = RunChild([](void *) {
        std::string much(1000000, 'x');
        Sys_WriteParent(much.data(), much.size());
    });
    EXPECT_EQ(1000000u, outcome.written.size());
    EXPECT_EQ(SYS_CHILD_DONE, outcome.end);
}

TEST(SysChild, TellsOfAnotherStatus)
{
    EXPECT_EQ(SYS_CHILD_LEFT, RunChild([](void *) { Sys_LeaveChild(3); }).end);
}

TEST(SysChild, TellsOfACrashAndItsLastWords)
{
    Outcome outcome = RunChild([](void *) {
        Sys_OnChildCrash(SayLastWords);
        raise(SIGSEGV);
    });
    EXPECT_EQ("crash", outcome.written);
    EXPECT_EQ(SYS_CHILD_CRASHED, outcome.end);
}

TEST(SysChild, IsStoppedAtItsTimeLimit)
{
    Outcome outcome = RunChild(
        [](void *) {
            Sys_OnChildCrash(SayLastWords);
            while (Endless) {
            }
        },
        1);
    EXPECT_EQ("crash", outcome.written);
    EXPECT_EQ(SYS_CHILD_TIME_LIMIT, outcome.end);
}

TEST(SysChild, TellsHowItEndedWhereEndedChildrenWereIgnored)
{
    signal(SIGCHLD, SIG_IGN);
    EXPECT_EQ(SYS_CHILD_LEFT, RunChild([](void *) { Sys_LeaveChild(3); }).end);
}

TEST(SysChild, SaysItsLastWordsWhereSignalsWereBlocked)
{
    sigset_t all;
    sigfillset(&all);
    sigprocmask(SIG_BLOCK, &all, nullptr);
    Outcome outcome = RunChild([](void *) {
        Sys_OnChildCrash(SayLastWords);
        raise(SIGSEGV);
    });
    EXPECT_EQ("crash", outcome.written);
    EXPECT_EQ(SYS_CHILD_CRASHED, outcome.end);
}

TEST(SysChild, IsGivenUpWhenItIsSilent)
{
    SysChild child;
    ASSERT_EQ(1, Sys_StartChild(
                     &child, [](void *) { pause(); }, nullptr, 10, nullptr));
    char buffer[10];
    EXPECT_EQ(-1, Sys_ReadChild(&child, buffer, sizeof buffer, 1));
    EXPECT_EQ(SYS_CHILD_CRASHED, Sys_EndChild(&child));
}

TEST(SysChild, SeesThatNobodyReads)
{
    SysChild child;
    ASSERT_EQ(1, Sys_StartChild(
                     &child,
                     [](void *) {
                         char block[100000] = {};
                         while (Sys_WriteParent(block, sizeof block)) {
                         }
                     },
                     nullptr, 10, nullptr));
    EXPECT_EQ(SYS_CHILD_CRASHED, Sys_EndChild(&child)); // killed: it was in mid-write
}

TEST(SysChild, TellsWhyItDoesNotStart)
{
    struct rlimit limit;
    getrlimit(RLIMIT_NOFILE, &limit);
    struct rlimit none = {0, limit.rlim_max};
    setrlimit(RLIMIT_NOFILE, &none);
    SysChild child;
    SysReason why = {"", -1};
    int started = Sys_StartChild(
        &child, [](void *) {}, nullptr, 10, &why);
    int startedUnasked = Sys_StartChild(
        &child, [](void *) {}, nullptr, 10, nullptr);
    setrlimit(RLIMIT_NOFILE, &limit);
    EXPECT_EQ(0, started);
    EXPECT_EQ(0, startedUnasked);
    EXPECT_STREQ(strerror(EMFILE), why.text);
    EXPECT_EQ(0, why.isTaken);
}

// The child turns its standard error away, which must not be the pipe.
TEST(SysChild, SendsWhereTheProgramHasNoStandardStreams)
{
    for (int stream : {2, 1, 0}) {
        close(stream);
        Outcome outcome = RunChild([](void *) { Sys_WriteParent("hello", 5); });
        EXPECT_EQ("hello", outcome.written);
        EXPECT_EQ(SYS_CHILD_DONE, outcome.end);
    }
}

TEST(SysChild, IsTheFirstToGoWhenMemoryRunsOut)
{
    Outcome outcome = RunChild([](void *) {
        char score[10] = "";
        FILE *stream = fopen("/proc/self/oom_score_adj", "r");
        if (stream && fgets(score, sizeof score, stream))
            Sys_WriteParent(score, strlen(score));
    });
    EXPECT_EQ("1000\n", outcome.written);
}

TEST(SysChild, DoesNotRepeatUnwrittenLinesOfTheParent)
{
    FILE *file = tmpfile();
    fputs("once", file);
    RunChild([](void *) {});
    fflush(file);
    EXPECT_EQ(4, ftell(file));
    fclose(file);
}
