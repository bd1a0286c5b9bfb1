#include "sim/SimDriver.h"
#include "thread/Tasks.h"

#include <gtest/gtest.h>

#include <atomic>
#include <set>
#include <thread>
#include <vector>

using Nib::IWorkerThread;

namespace
{

Worker MakePool(int count)
{
    return Worker(IWorkerThread::CreatePoolInstance("pool", 0, count));
}

class WorkerPool : public testing::Test
{
protected:
    SimDriver driver;
};

/// The thread that runs each of @p count tasks, in the order of posting.
std::vector<std::thread::id> ThreadsOf(IWorkerThread& pool, std::size_t count)
{
    std::vector<std::thread::id> threads(count);
    for (std::thread::id& thread : threads)
        pool.EnqueueAsyncTask(new LambdaTask([&thread] { thread = std::this_thread::get_id(); }));
    EXPECT_TRUE(pool.WaitForExecution(nullptr));
    return threads;
}

} // namespace

TEST_F(WorkerPool, GivesTasksToItsMembersInTurn)
{
    const Worker pool = MakePool(3);
    ASSERT_TRUE(pool->Start(!kPaused));
    const std::vector<std::thread::id> threads = ThreadsOf(*pool, 5);
    EXPECT_EQ(threads[0], threads[3]);
    EXPECT_EQ(threads[1], threads[4]);
    EXPECT_EQ((std::set{threads[0], threads[1], threads[2]}.size()), 3u);
}

TEST_F(WorkerPool, SynchronousTasksShareTheTurn)
{
    const Worker pool = MakePool(2);
    pool->Start(!kPaused);
    std::thread::id first, second, third;
    pool->RunSyncTask(new LambdaTask([&] { first = std::this_thread::get_id(); }), kAheadOfQueue,
                      kDeleteAfterRun);
    pool->EnqueueAsyncTask(new LambdaTask([&] { second = std::this_thread::get_id(); }));
    pool->RunSyncTask(new LambdaTask([&] { third = std::this_thread::get_id(); }), !kAheadOfQueue,
                      kDeleteAfterRun);
    pool->WaitForExecution(nullptr);
    EXPECT_EQ(first, third);
    EXPECT_NE(first, second);
}

TEST_F(WorkerPool, WithoutMembersFailsAndTakesNothing)
{
    for (const int count : {0, -1, -100})
    {
        const Worker pool = MakePool(count);
        EXPECT_FALSE(pool->Start(!kPaused));
        EXPECT_FALSE(pool->Pause());
        EXPECT_FALSE(pool->Resume());
        EXPECT_FALSE(pool->IsRunning());
        EXPECT_FALSE(pool->IsStarted());
        int untouched = 5;
        EXPECT_FALSE(pool->WaitForExecution(&untouched));
        EXPECT_EQ(untouched, 5);
        bool ran = false;
        LambdaTask task([&] { ran = true; });
        EXPECT_FALSE(pool->EnqueueAsyncTask(&task));
        pool->RunSyncTask(&task, kAheadOfQueue, !kDeleteAfterRun);
        EXPECT_FALSE(ran);
        pool->Terminate();
    }
}

TEST_F(WorkerPool, StartStopsAtTheFirstMemberThatFails)
{
    const Worker pool = MakePool(3);
    driver.FailNext("pthread_create", EAGAIN);
    EXPECT_FALSE(pool->Start(!kPaused));
    EXPECT_EQ(driver.CountLogContaining("Starting"), 1u);
    EXPECT_FALSE(pool->IsStarted());
    EXPECT_TRUE(pool->Start(!kPaused));
    EXPECT_EQ(driver.CountLogContaining("Starting"), 4u);
    EXPECT_TRUE(pool->IsStarted());
}

TEST_F(WorkerPool, ResumeStopsAtAMemberThatIsNotPaused)
{
    const Worker pool = MakePool(3);
    pool->Start(!kPaused);
    EXPECT_FALSE(pool->Resume());
    EXPECT_TRUE(pool->Pause());
    EXPECT_FALSE(pool->IsRunning());
    EXPECT_TRUE(pool->IsStarted());
    EXPECT_TRUE(pool->Resume());
    EXPECT_TRUE(pool->IsRunning());
}

TEST_F(WorkerPool, WaitLeavesTheCountUntouchedAndStopsAtTheFirstFailure)
{
    const Worker pool = MakePool(2);
    pool->Start(!kPaused);
    int untouched = 9;
    EXPECT_TRUE(pool->WaitForExecution(&untouched));
    EXPECT_EQ(untouched, 9);
    pool->Pause();
    driver.ForgetLog();
    EXPECT_FALSE(pool->WaitForExecution(&untouched));
    EXPECT_EQ(driver.CountLogContaining("Worker is on pause"), 1u);
    pool->Resume();
}

TEST_F(WorkerPool, TerminateEndsAllMembersAndTheyCanStartAgain)
{
    const Worker pool = MakePool(3);
    pool->Start(!kPaused);
    std::atomic<int> ran{0};
    for (int i = 0; i < 9; ++i)
        pool->EnqueueAsyncTask(new LambdaTask([&ran] { ++ran; }));
    pool->Terminate();
    EXPECT_EQ(ran, 9);
    EXPECT_FALSE(pool->IsStarted());
    EXPECT_TRUE(pool->Start(!kPaused));
    EXPECT_TRUE(pool->IsRunning());
}

TEST_F(WorkerPool, DestructionEndsTheMembersInOrder)
{
    Worker pool = MakePool(2);
    pool->Start(!kPaused);
    driver.ForgetLog();
    pool.reset();
    EXPECT_EQ(driver.CountLogContaining("Cleanup"), 2u);
}

TEST_F(WorkerPool, AMillionTasksOnEightMembersRunOnceEach)
{
#if defined(__SANITIZE_THREAD__)
    constexpr int kTasks = 100000;
#else
    constexpr int kTasks = 1000000;
#endif
    driver.RecordCalls(false);
    std::atomic<int> ran{0}, deleted{0};
    {
        const Worker pool = MakePool(8);
        ASSERT_TRUE(pool->Start(!kPaused));
        for (int i = 0; i < kTasks; ++i)
            pool->EnqueueAsyncTask(
                new LambdaTask([&ran] { ran.fetch_add(1, std::memory_order_relaxed); },
                               [&deleted] { deleted.fetch_add(1, std::memory_order_relaxed); }));
        pool->Terminate();
    }
    EXPECT_EQ(ran, kTasks);
    EXPECT_EQ(deleted, kTasks);
}
