#include "TraceCapture.h"

#include <nib/base.h>
#include <nib/trace.h>

#include <gtest/gtest.h>

#include <atomic>
#include <thread>

using namespace Nib;

namespace
{

using Texts = std::vector<std::string>;
using Kind = TraceEvent::Kind;

TEST(Trace, IsOffWithoutASink)
{
    EXPECT_FALSE(Trace::IsOn());
    Trace::Begin("work", "nothing");
    Trace::End();
    const TraceCapture capture;
    EXPECT_TRUE(Trace::IsOn());
    EXPECT_TRUE(capture.Events().empty());
}

TEST(Trace, TellsThreadLaneTimeAndArgumentsOfABeginning)
{
    const TraceCapture capture;
    const TraceLane lane("pen");
    Trace::Begin("work", "stroke", {{"points", 12}, {"brush", "marker"}});
    Trace::End();

    const std::vector<CapturedEvent> events = capture.Events();
    ASSERT_EQ(events.size(), 2u);
    EXPECT_EQ(events[0].kind, Kind::Begin);
    EXPECT_EQ(events[0].thread, GetNibCurrentThreadId());
    EXPECT_EQ(events[0].lane, "pen");
    EXPECT_EQ(events[0].category, "work");
    EXPECT_EQ(events[0].name, "stroke");
    EXPECT_EQ(events[0].Argument("points"), "12");
    EXPECT_EQ(events[0].Argument("brush"), "marker");
    EXPECT_EQ(events[1].kind, Kind::End);
    EXPECT_EQ(events[1].lane, "pen");
    EXPECT_GT(events[0].time, 0);
    EXPECT_GE(events[1].time, events[0].time);
}

TEST(Trace, TellsInstantsAndCounters)
{
    const TraceCapture capture;
    const TraceLane lane("pen");
    Trace::Instant("work", "lifted");
    Trace::Counter("work", "points", 7);
    Trace::Counter("work", "points", 8, 4711, "other");

    EXPECT_EQ(capture.Lane("pen"), Texts({"!lifted", "points=7"}));
    EXPECT_EQ(capture.Lane("other"), Texts({"points=8"}));
    EXPECT_EQ(capture.Events().back().thread, 4711u);
}

TEST(Trace, ALaneHasItsNameWhileTheObjectThatNamesItLives)
{
    const TraceCapture capture;
    {
        const TraceLane outer("outer");
        {
            const TraceLane inner("inner");
            Trace::Instant("work", "one");
        }
        Trace::Instant("work", "two");
    }
    Trace::Instant("work", "three");

    EXPECT_EQ(capture.Lane("inner"), Texts({"!one"}));
    EXPECT_EQ(capture.Lane("outer"), Texts({"!two"}));
    EXPECT_EQ(capture.Lane("-"), Texts({"!three"}));
}

TEST(Trace, AScopeEndsHoweverItIsLeft)
{
    const TraceCapture capture;
    try
    {
        const TraceScope scope("work", "outer");
        const TraceScope inner("work", "inner");
        throw 1;
    }
    catch (int)
    {
    }
    EXPECT_EQ(capture.Lane("-"), Texts({"+outer", "+inner", "-", "-"}));
}

TEST(Trace, AnEndWhoseBeginningTheSinkHasNotSeenDoesNotReachIt)
{
    Trace::Begin("work", "before");
    const TraceScope scope("work", "before too");
    const TraceCapture first;
    Trace::Begin("work", "first");
    const TraceScope seenByFirst("work", "first too");
    {
        const TraceCapture second;
        Trace::End();
        Trace::Begin("work", "second");
        Trace::End();
        Trace::End();
        EXPECT_EQ(second.Lane("-"), Texts({"+second", "-"}));
    }
    EXPECT_EQ(first.Lane("-"), Texts({"+first", "+first too"}));
}

TEST(Trace, WhatTheSinkCausesIsNotTraced)
{
    struct Echo : TraceCapture
    {
        void OnTraceEvent(const TraceEvent& event) override
        {
            const TraceScope scope("work", "echo");
            TraceCapture::OnTraceEvent(event);
        }
    } echo;
    Trace::Instant("work", "call");
    EXPECT_EQ(echo.Lane("-"), Texts({"!call"}));
}

TEST(Trace, ASinkIsCalledNoMoreOnceItIsReplaced)
{
    class Mortal : public ITraceSink
    {
    public:
        void OnTraceEvent(const TraceEvent&) override
        {
            ASSERT_TRUE(m_isAlive.load());
            m_count.fetch_add(1);
        }
        void Kill() { m_isAlive.store(false); }
        int Count() const { return m_count.load(); }

    private:
        std::atomic<bool> m_isAlive{true};
        std::atomic<int> m_count{0};
    };

    std::atomic<bool> stop{false};
    std::vector<std::thread> threads;
    for (int number = 0; number < 3; ++number)
    {
        threads.emplace_back(
            [&]
            {
                const TraceLane lane("busy");
                while (!stop.load())
                    const TraceScope scope("work", "busy");
            });
    }
    for (int round = 0; round < 30; ++round)
    {
        Mortal sink;
        Trace::SetSink(&sink);
        while (sink.Count() == 0)
            std::this_thread::yield();
        if (round % 2 == 0)
            Trace::Stop();
        else
            Trace::SetSink(nullptr);
        sink.Kill();
    }
    stop.store(true);
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_FALSE(Trace::IsOn());
}

TEST(Trace, LinuxHasNoTraceOfItsOwn)
{
    const TraceCapture capture;
    EXPECT_FALSE(Trace::StartSystem());
    Trace::Instant("work", "still here");
    EXPECT_EQ(capture.Lane("-"), Texts({"!still here"}));
}

} // namespace
