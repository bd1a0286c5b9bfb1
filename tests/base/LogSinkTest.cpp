#include "base/ChildProcess.h"

#include <nib/log.h>

#include <android/log.h>
#include <gtest/gtest.h>

#include <atomic>
#include <cerrno>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include <dlfcn.h>

namespace
{

using Print = int (*)(int, const char*, const char*, ...);
using Lines = std::vector<std::pair<int, std::string>>;

// The base library's own; the simulated driver's stands before it in this program.
Print BasePrint()
{
    void* library = dlopen("libNibBase.so.1", RTLD_NOW | RTLD_NOLOAD);
    return reinterpret_cast<Print>(dlsym(library, "__android_log_print"));
}

void Collect(void* context, int priority, const char* message)
{
    static_cast<Lines*>(context)->emplace_back(priority, message);
}

/// With a sink set during the life of the object, and nothing on standard error.
class LogSink : public testing::Test
{
protected:
    ~LogSink() override { Nib::SetLogSink(nullptr, nullptr); }

    const Variable m_silent{"NIB_LOG", "silent"};
    const Print m_print = BasePrint();
    Lines m_lines;
};

TEST_F(LogSink, TakesLinesThatTheLogLeavesOut)
{
    ASSERT_TRUE(Nib::SetLogSink(&Collect, &m_lines));
    m_print(ANDROID_LOG_WARN, "nib_log", "%s %d", "width", 7);
    EXPECT_EQ(m_lines, (Lines{{5, "width 7"}}));
}

TEST_F(LogSink, TakesInfoAndAboveUnlessToldOtherwise)
{
    Nib::SetLogSink(&Collect, &m_lines);
    m_print(ANDROID_LOG_DEBUG, "nib_log", "debug");
    m_print(ANDROID_LOG_INFO, "nib_log", "info");
    Nib::SetLogSink(&Collect, &m_lines, 3);
    m_print(ANDROID_LOG_DEBUG, "nib_log", "debug again");
    m_print(ANDROID_LOG_VERBOSE, "nib_log", "verbose");
    EXPECT_EQ(m_lines, (Lines{{4, "info"}, {3, "debug again"}}));
}

TEST_F(LogSink, TakesLinesThoughThoseBeforeItWereLeftOut)
{
    m_print(ANDROID_LOG_ERROR, "nib_log", "before");
    Nib::SetLogSink(&Collect, &m_lines);
    m_print(ANDROID_LOG_ERROR, "nib_log", "after");
    Nib::SetLogSink(nullptr, nullptr);
    EXPECT_EQ(m_print(ANDROID_LOG_ERROR, "nib_log", "dropped"), -EPERM);
    Nib::SetLogSink(&Collect, &m_lines);
    m_print(ANDROID_LOG_ERROR, "nib_log", "again");
    EXPECT_EQ(m_lines, (Lines{{6, "after"}, {6, "again"}}));
}

TEST_F(LogSink, IsCalledNoMoreOnceEnded)
{
    Nib::SetLogSink(&Collect, &m_lines);
    m_print(ANDROID_LOG_ERROR, "nib_log", "one");
    Nib::SetLogSink(nullptr, nullptr);
    m_print(ANDROID_LOG_ERROR, "nib_log", "two");
    EXPECT_EQ(m_lines, (Lines{{6, "one"}}));
}

TEST_F(LogSink, MayLogItselfWithoutBeingCalledAgain)
{
    struct Echo
    {
        Print print;
        int calls;
    } echo{m_print, 0};
    Nib::SetLogSink(
        [](void* context, int, const char*)
        {
            Echo& self = *static_cast<Echo*>(context);
            ++self.calls;
            self.print(ANDROID_LOG_ERROR, "nib_log", "from the sink");
        },
        &echo);
    m_print(ANDROID_LOG_ERROR, "nib_log", "one");
    EXPECT_EQ(echo.calls, 1);
}

TEST_F(LogSink, TakesLinesOfManyThreads)
{
    std::atomic<int> count{0};
    Nib::SetLogSink([](void* context, int, const char*)
                    { static_cast<std::atomic<int>*>(context)->fetch_add(1); },
                    &count);
    std::vector<std::thread> threads;
    for (int i = 0; i < 4; ++i)
    {
        threads.emplace_back(
            [this]
            {
                for (int line = 0; line < 100; ++line)
                    m_print(ANDROID_LOG_INFO, "nib_log", "%d", line);
            });
    }
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_EQ(count.load(), 400);
}

TEST(LogSinkBesideTheLog, LinesGoToTheLogAsWell)
{
    const Variable variable("NIB_LOG", "info");
    Lines lines;
    const ChildResult child = RunInChild(
        [&]
        {
            Nib::SetLogSink(&Collect, &lines);
            BasePrint()(ANDROID_LOG_INFO, "nib_log", "both");
            EXPECT_EQ(lines, (Lines{{4, "both"}}));
        });
    EXPECT_EQ(child.exitCode, 0);
    ASSERT_EQ(child.writes.size(), 1u);
    EXPECT_NE(child.writes[0].find("both"), std::string::npos);
}

} // namespace
