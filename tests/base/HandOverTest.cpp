#include "base/HandOver.h"

#include <nib/base.h>

#include <gtest/gtest.h>

#include <atomic>
#include <optional>
#include <thread>

using namespace Nib;

namespace
{

constexpr int kNoTimeout = -1;

/// A thread that waits once, and has begun to when this is made.
class WaitingThread
{
public:
    WaitingThread()
    {
        while (!m_entered.load()) // then it holds the section until its wait has begun
            std::this_thread::yield();
        AutoCriticalSection lock(m_section);
    }
    ~WaitingThread() { m_thread.join(); }

    void Signal()
    {
        AutoCriticalSection lock(m_section);
        m_condition.Signal();
    }
    bool HasEnded() const { return m_ended.load(); }

private:
    void Run()
    {
        AutoCriticalSection lock(m_section);
        m_entered.store(true);
        m_condition.Wait(&m_section, kNoTimeout);
        m_ended.store(true);
    }

    CriticalSection m_section;
    ConditionalVariable m_condition;
    std::atomic<bool> m_entered{false};
    std::atomic<bool> m_ended{false};
    std::thread m_thread{[this] { Run(); }};
};

/// Gives the other threads every occasion.
void LetOthersRun()
{
    for (int turn = 0; turn < 1000; ++turn)
        std::this_thread::yield();
}

} // namespace

TEST(HandOver, AWaitGoesOnUntilItEnds)
{
    WaitingThread thread;
    std::optional<HandOver> handOver(std::in_place);
    thread.Signal();
    LetOthersRun();
    EXPECT_FALSE(thread.HasEnded());
    handOver.reset();
    while (!thread.HasEnded())
        std::this_thread::yield();
}

TEST(HandOver, OneWithinAnotherEndsNothing)
{
    WaitingThread thread;
    std::optional<HandOver> outer(std::in_place);
    {
        const HandOver inner;
        thread.Signal();
    }
    LetOthersRun();
    EXPECT_FALSE(thread.HasEnded());
    outer.reset();
    while (!thread.HasEnded())
        std::this_thread::yield();
}

TEST(HandOver, EachOfTwoWaitsIsEnded)
{
    WaitingThread one;
    WaitingThread other;
    const HandOver handOver;
    one.Signal();
    other.Signal();
    while (!one.HasEnded()) // at once, to make room for the next
        std::this_thread::yield();
    LetOthersRun();
    EXPECT_FALSE(other.HasEnded());
}

TEST(HandOver, AWaitOfItsThreadEndsTheOtherOnceTheSectionIsLeft)
{
    CriticalSection section;
    ConditionalVariable answered;
    std::atomic<bool> left{false};
    WaitingThread thread;
    std::thread answering(
        [&]
        {
            while (!thread.HasEnded())
                std::this_thread::yield();
            AutoCriticalSection lock(section);
            EXPECT_TRUE(left.load());
            answered.Signal();
        });

    HandOver handOver;
    handOver.TellWhenLeft(&left);
    {
        AutoCriticalSection lock(section);
        thread.Signal();
        EXPECT_TRUE(
            answered.Wait(&section, kNoTimeout)); // for ever, if that thread went on waiting
    }
    answering.join();
}

TEST(HandOver, AWaitSpinsWhenToldTo)
{
    CriticalSection section;
    ConditionalVariable nobodySignals;
    AutoCriticalSection lock(section);
    {
        const HandOver handOver;
        EXPECT_FALSE(nobodySignals.Wait(&section, 1));
        EXPECT_FALSE(handOver.HasSpunInVain());
    }
    HandOver handOver;
    handOver.SpinInWait();
    EXPECT_FALSE(nobodySignals.Wait(&section, 1));
    EXPECT_TRUE(handOver.HasSpunInVain());
}
