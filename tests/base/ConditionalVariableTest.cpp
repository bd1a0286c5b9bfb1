#include <nib/base.h>

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <csignal>
#include <memory>
#include <thread>
#include <vector>

#include <pthread.h>

using namespace Nib;

namespace
{

constexpr bool kReentrant = true;
constexpr int kNoTimeOut = -1;

/// A thread that waits once, and says how its wait ended.
class WaitingThread
{
public:
    WaitingThread(CriticalSection& section, ConditionalVariable& condition, int milliseconds)
        : m_section(section)
    {
        m_thread = std::thread(
            [this, &condition, milliseconds]
            {
                const AutoCriticalSection lock(m_section);
                m_entered.store(true);
                m_result = condition.Wait(&m_section, milliseconds);
                m_ended.store(true);
            });
        // The thread holds the lock from before m_entered until its wait has begun.
        while (!m_entered.load())
            std::this_thread::yield();
        const AutoCriticalSection lock(m_section);
    }

    ~WaitingThread()
    {
        if (m_thread.joinable())
            m_thread.join();
    }

    bool Result()
    {
        m_thread.join();
        return m_result;
    }

    bool HasEnded() const { return m_ended.load(); }
    pthread_t Handle() { return m_thread.native_handle(); }

private:
    CriticalSection& m_section;
    std::atomic<bool> m_entered{false};
    std::atomic<bool> m_ended{false};
    bool m_result = false;
    std::thread m_thread;
};

class ConditionalVariableTest : public testing::Test
{
protected:
    std::unique_ptr<WaitingThread> Waiting(int milliseconds = kNoTimeOut)
    {
        return std::make_unique<WaitingThread>(section, condition, milliseconds);
    }

    bool WaitHere(int milliseconds)
    {
        const AutoCriticalSection lock(section);
        return condition.Wait(&section, milliseconds);
    }

    CriticalSection section{!kReentrant};
    ConditionalVariable condition;
};

} // namespace

TEST_F(ConditionalVariableTest, SignalEndsAWait)
{
    auto waiting = Waiting();
    condition.Signal();
    EXPECT_TRUE(waiting->Result());
}

TEST_F(ConditionalVariableTest, SignalInsideTheLockEndsAWait)
{
    auto waiting = Waiting();
    section.Enter();
    condition.Signal();
    section.Leave();
    EXPECT_TRUE(waiting->Result());
}

TEST_F(ConditionalVariableTest, SignalEndsTheOldestWaitAlone)
{
    auto first = Waiting();
    auto second = Waiting();

    condition.Signal();

    EXPECT_TRUE(first->Result());
    EXPECT_FALSE(second->HasEnded());
    condition.Signal();
    EXPECT_TRUE(second->Result());
}

TEST_F(ConditionalVariableTest, SignalAllEndsAllWaits)
{
    auto first = Waiting();
    auto second = Waiting();
    auto third = Waiting();

    condition.SignalAll();

    EXPECT_TRUE(first->Result());
    EXPECT_TRUE(second->Result());
    EXPECT_TRUE(third->Result());
}

TEST_F(ConditionalVariableTest, ASignalBeforeTheWaitIsLost)
{
    condition.Signal();
    condition.SignalAll();
    EXPECT_FALSE(WaitHere(0));
    EXPECT_FALSE(WaitHere(1));
}

TEST_F(ConditionalVariableTest, ALaterWaitDoesNotTakeAnEarlierSignal)
{
    auto waiting = Waiting();
    section.Enter();
    condition.Signal(); // given to the thread, which cannot return before the lock is left
    EXPECT_FALSE(condition.Wait(&section, 0));
    section.Leave();
    EXPECT_TRUE(waiting->Result());
}

TEST_F(ConditionalVariableTest, TheTimeOutEndsAWait)
{
    const auto before = std::chrono::steady_clock::now();
    EXPECT_FALSE(WaitHere(30));
    EXPECT_GE(std::chrono::steady_clock::now() - before, std::chrono::milliseconds(30));
}

TEST_F(ConditionalVariableTest, ATimeOutAboveASecondIsKept)
{
    const auto before = std::chrono::steady_clock::now();
    EXPECT_FALSE(WaitHere(1050));
    const auto waited = std::chrono::steady_clock::now() - before;
    EXPECT_GE(waited, std::chrono::milliseconds(1050));
    EXPECT_LT(waited, std::chrono::seconds(30));
}

TEST_F(ConditionalVariableTest, ASignalBeforeTheTimeOutWins)
{
    auto waiting = Waiting(60000);
    condition.Signal();
    EXPECT_TRUE(waiting->Result());
}

TEST_F(ConditionalVariableTest, AnEndedWaitTakesNoSignal)
{
    auto first = Waiting();
    EXPECT_FALSE(WaitHere(1)); // stood behind the first one
    auto third = Waiting();

    condition.Signal();
    condition.Signal();

    EXPECT_TRUE(first->Result());
    EXPECT_TRUE(third->Result());
}

TEST_F(ConditionalVariableTest, TheFirstOfSeveralWaitsMayTimeOut)
{
    auto first = Waiting(1);
    EXPECT_FALSE(first->Result());
    auto second = Waiting();
    condition.Signal();
    EXPECT_TRUE(second->Result());
}

TEST_F(ConditionalVariableTest, TheLockIsHeldAgainAfterTheWait)
{
    // Under a thread sanitizer this also shows that the wait hands the lock over.
    int turns = 0;
    std::atomic<bool> stop{false};
    std::thread other(
        [&]
        {
            while (!stop.load())
            {
                const AutoCriticalSection lock(section);
                ++turns;
                condition.Signal();
            }
        });
    for (int i = 0; i < 500; ++i)
    {
        const AutoCriticalSection lock(section);
        EXPECT_TRUE(condition.Wait(&section, kNoTimeOut));
        ++turns;
    }
    stop.store(true);
    other.join();
    EXPECT_GE(turns, 1000);
}

TEST_F(ConditionalVariableTest, SystemSignalsDoNotEndAWait)
{
    struct sigaction action = {};
    action.sa_handler = [](int) {}; // without SA_RESTART: sleeps are interrupted
    struct sigaction before = {};
    ASSERT_EQ(sigaction(SIGUSR1, &action, &before), 0);
    auto waiting = Waiting();

    for (int i = 0; i < 200; ++i)
    {
        ASSERT_EQ(pthread_kill(waiting->Handle(), SIGUSR1), 0);
        std::this_thread::yield();
    }

    EXPECT_FALSE(waiting->HasEnded());
    condition.Signal();
    EXPECT_TRUE(waiting->Result());
    sigaction(SIGUSR1, &before, nullptr);
}

TEST_F(ConditionalVariableTest, HandsOverWithoutALoop)
{
    // Two threads, each waiting once for each turn of the other: a lost or invented signal stops
    // them or breaks the order.
    constexpr int kTurns = 20000;
    ConditionalVariable answer;
    std::atomic<bool> ready{false};
    int asked = 0;
    int answered = 0;
    std::thread other(
        [&]
        {
            const AutoCriticalSection lock(section);
            ready.store(true);
            for (int i = 1; i <= kTurns; ++i)
            {
                condition.Wait(&section, kNoTimeOut);
                EXPECT_EQ(asked, i);
                answered = i;
                answer.Signal();
            }
        });
    while (!ready.load())
        std::this_thread::yield();
    section.Enter();
    for (int i = 1; i <= kTurns; ++i)
    {
        asked = i;
        condition.Signal();
        answer.Wait(&section, kNoTimeOut);
        EXPECT_EQ(answered, i);
    }
    section.Leave();
    other.join();
}

TEST_F(ConditionalVariableTest, SurvivesTimeOutsAndSignalsAtTheSameTime)
{
    std::atomic<bool> stop{false};
    std::atomic<int> ended{0};
    std::vector<std::thread> waiters;
    for (int i = 0; i < 4; ++i)
    {
        waiters.emplace_back(
            [&, i]
            {
                for (int n = 0; n < 300; ++n)
                {
                    const AutoCriticalSection lock(section);
                    condition.Wait(&section, (n + i) % 2);
                    ended.fetch_add(1);
                }
            });
    }
    std::thread signaller(
        [&]
        {
            while (!stop.load())
            {
                condition.Signal();
                condition.SignalAll();
            }
        });
    for (std::thread& waiter : waiters)
        waiter.join();
    stop.store(true);
    signaller.join();
    EXPECT_EQ(ended.load(), 1200);
    EXPECT_FALSE(WaitHere(0)); // nothing was left behind
}
