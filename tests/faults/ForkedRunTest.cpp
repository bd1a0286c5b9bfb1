#include "faults/ForkedRun.h"

#include <nib/base.h>

#include <gtest/gtest.h>

#include <condition_variable>
#include <mutex>

namespace
{

void WaitForEver(void*)
{
    std::mutex mutex;
    std::condition_variable never;
    std::unique_lock lock(mutex);
    never.wait(lock, [] { return false; });
}

} // namespace

TEST(ForkedRun, GivesWhatTheRunReports)
{
    const RunResult result = RunInChild([] { return std::string("done"); });

    EXPECT_EQ(result.report, "done");
    EXPECT_EQ(result.end, "");
    EXPECT_EQ(result.messages, "");
}

TEST(ForkedRun, TellsHowARunWasEnded)
{
    const RunResult result = RunInChild([]() -> std::string { abort(); });

    EXPECT_NE(result.end, "");
}

TEST(ForkedRun, NamesTheThreadsOfARunThatHangs)
{
    const auto hang = []
    {
        Nib::Thread stuck(&WaitForEver, nullptr, "stuck one", 0);
        stuck.start();
        stuck.join();
        return std::string();
    };

    const RunResult result = RunInChild(hang, std::chrono::seconds(2));

    EXPECT_EQ(result.end, "stuck");
    EXPECT_NE(result.stuck.find("thread stuck one\n"), std::string::npos) << result.stuck;
}
