// tests/sys_child_test.cpp - child processes.
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

using Body = void (*)(const SysInput *);

int Start(SysChild *child, Body body, const SysInput &input = {}, int cpuSeconds = 10,
          SysReason *why = nullptr)
{
    const SysTask task = {"test", body};
    return Sys_StartChild(child, &task, &input, cpuSeconds, why);
}

Outcome Finish(SysChild *child)
{
    Outcome outcome;
    outcome.written = ReadAll(child);
    outcome.end = Sys_EndChild(child);
    return outcome;
}

Outcome RunChild(Body body, int cpuSeconds = 10)
{
    SysChild child;
    EXPECT_EQ(1, Start(&child, body, {}, cpuSeconds));
    return Finish(&child);
}

void SayLastWords()
{
    Sys_WriteParent("crash", 5);
}

volatile int Endless = 1;

} // namespace

TEST(SysChild, SendsWhatItWrites)
{
    Outcome outcome = RunChild([](const SysInput *) { Sys_WriteParent("hello", 5); });
    EXPECT_EQ("hello", outcome.written);
    EXPECT_EQ(SYS_CHILD_DONE, outcome.end);
}

TEST(SysChild, GetsItsBlock)
{
    std::string block("block\0of bytes", 14);
    SysChild child;
    ASSERT_EQ(1, Start(&child,
                       [](const SysInput *input) {
                           Sys_WriteParent(input->bytes, input->size);
                           Sys_LeaveChild(input->stream ? 3 : 0);
                       },
                       {block.data(), block.size(), nullptr}));
    std::string sent = block;
    block.assign(14, '-'); // it is the parent's again
    Outcome outcome = Finish(&child);
    EXPECT_EQ(sent, outcome.written);
    EXPECT_EQ(SYS_CHILD_DONE, outcome.end);
}

TEST(SysChild, ReadsItsStreamFromWhereItStands)
{
    FILE *stream = tmpfile();
    fputs("first second", stream);
    fseek(stream, 6, SEEK_SET);
    SysChild child;
    ASSERT_EQ(1, Start(&child,
                       [](const SysInput *input) {
                           char text[100];
                           Sys_WriteParent(text, fread(text, 1, sizeof text, input->stream));
                       },
                       {nullptr, 0, stream}));
    EXPECT_EQ("second", Finish(&child).written);
    fclose(stream);
}

TEST(SysChild, SendsMoreThanAPipeHolds)
{
    Outcome outcome = RunChild([](const SysInput *) {
        std::string much(1000000, 'x');
        Sys_WriteParent(much.data(), much.size());
    });
    EXPECT_EQ(1000000u, outcome.written.size());
    EXPECT_EQ(SYS_CHILD_DONE, outcome.end);
}

TEST(SysChild, TellsOfAnotherStatus)
{
    EXPECT_EQ(SYS_CHILD_LEFT, RunChild([](const SysInput *) { Sys_LeaveChild(3); }).end);
}

TEST(SysChild, TellsOfACrashAndItsLastWords)
{
    Outcome outcome = RunChild([](const SysInput *) {
        Sys_OnChildCrash(SayLastWords);
        raise(SIGSEGV);
    });
    EXPECT_EQ("crash", outcome.written);
    EXPECT_EQ(SYS_CHILD_CRASHED, outcome.end);
}

TEST(SysChild, IsStoppedAtItsTimeLimit)
{
    Outcome outcome = RunChild(
        [](const SysInput *) {
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
    EXPECT_EQ(SYS_CHILD_LEFT, RunChild([](const SysInput *) { Sys_LeaveChild(3); }).end);
}

TEST(SysChild, SaysItsLastWordsWhereSignalsWereBlocked)
{
    sigset_t all;
    sigfillset(&all);
    sigprocmask(SIG_BLOCK, &all, nullptr);
    Outcome outcome = RunChild([](const SysInput *) {
        Sys_OnChildCrash(SayLastWords);
        raise(SIGSEGV);
    });
    EXPECT_EQ("crash", outcome.written);
    EXPECT_EQ(SYS_CHILD_CRASHED, outcome.end);
}

TEST(SysChild, IsGivenUpWhenItIsSilent)
{
    SysChild child;
    ASSERT_EQ(1, Start(&child, [](const SysInput *) { pause(); }));
    char buffer[10];
    EXPECT_EQ(-1, Sys_ReadChild(&child, buffer, sizeof buffer, 1));
    EXPECT_EQ(SYS_CHILD_CRASHED, Sys_EndChild(&child));
}

TEST(SysChild, SeesThatNobodyReads)
{
    SysChild child;
    ASSERT_EQ(1, Start(&child, [](const SysInput *) {
                  char block[100000] = {};
                  while (Sys_WriteParent(block, sizeof block)) {
                  }
              }));
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
    int started = Start(
        &child, [](const SysInput *) {}, {}, 10, &why);
    int startedUnasked = Start(&child, [](const SysInput *) {});
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
        Outcome outcome = RunChild([](const SysInput *) { Sys_WriteParent("hello", 5); });
        EXPECT_EQ("hello", outcome.written);
        EXPECT_EQ(SYS_CHILD_DONE, outcome.end);
    }
}

TEST(SysChild, IsTheFirstToGoWhenMemoryRunsOut)
{
    Outcome outcome = RunChild([](const SysInput *) {
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
    RunChild([](const SysInput *) {});
    fflush(file);
    EXPECT_EQ(4, ftell(file));
    fclose(file);
}
