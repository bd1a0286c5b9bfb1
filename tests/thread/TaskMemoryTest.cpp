// Where tasks come from and go to: any size, any thread, and no allocation in the long run.

#include "thread/InstructionCount.h"
#include "thread/ThreadTestSupport.h"

#include <gtest/gtest.h>

#include <array>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <stdexcept>

#if defined(__SANITIZE_ADDRESS__)
#define NIB_TEST_ADDRESS_SANITIZER 1
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
#define NIB_TEST_ADDRESS_SANITIZER 1
#endif
#endif

#if defined(NIB_TEST_ADDRESS_SANITIZER)
constexpr bool kUnderAddressSanitizer = true;
#else
constexpr bool kUnderAddressSanitizer = false;
#endif

using namespace Nib;

namespace
{

/// A task of at least @p Size bytes that knows when somebody else wrote into it.
template <std::size_t Size>
class FilledTask : public ITask
{
public:
    explicit FilledTask(unsigned char fill = 0x5a) : m_fill(fill) { m_bytes.fill(fill); }
    ~FilledTask() override { EXPECT_TRUE(IsWhole()); }
    void run() override { EXPECT_TRUE(IsWhole()); }

private:
    bool IsWhole() const
    {
        for (const unsigned char byte : m_bytes)
        {
            if (byte != m_fill)
                return false;
        }
        return true;
    }

    unsigned char m_fill;
    std::array<unsigned char, Size> m_bytes;
};

using SmallTask = FilledTask<8>;

/// Makes many of one size, so that they would overlap if anything did, and deletes half of them
/// before the others.
template <std::size_t Size>
void MakeAndDelete()
{
    std::vector<std::unique_ptr<ITask>> tasks;
    for (int number = 0; number < 200; ++number)
    {
        tasks.emplace_back(new FilledTask<Size>(static_cast<unsigned char>(number)));
        const auto address = reinterpret_cast<std::uintptr_t>(tasks.back().get());
        EXPECT_EQ(address % alignof(std::max_align_t), 0u);
    }
    for (std::size_t index = 0; index < tasks.size(); index += 2)
        tasks[index].reset();
    for (std::unique_ptr<ITask>& task : tasks)
    {
        if (task)
            task->run();
    }
}

} // namespace

TEST(TaskMemory, ServesEverySize)
{
    for (int round = 0; round < 3; ++round)
    {
        MakeAndDelete<1>();
        MakeAndDelete<15>();
        MakeAndDelete<16>();
        MakeAndDelete<40>();
        MakeAndDelete<100>();
        MakeAndDelete<200>();
        MakeAndDelete<238>();
        MakeAndDelete<239>();
        MakeAndDelete<240>();
        MakeAndDelete<1000>();
        MakeAndDelete<100000>();
    }
}

TEST(TaskMemory, KeepsTheAlignmentThatATaskAsksFor)
{
    class alignas(128) AlignedTask : public SmallTask
    {
    };
    for (int number = 0; number < 100; ++number)
    {
        const std::unique_ptr<ITask> task(new AlignedTask);
        EXPECT_EQ(reinterpret_cast<std::uintptr_t>(task.get()) % 128, 0u);
    }
}

TEST(TaskMemory, LeavesTasksAtAGivenPlaceThere)
{
    alignas(SmallTask) unsigned char place[sizeof(SmallTask)];
    auto* const task = new (place) SmallTask;
    EXPECT_EQ(static_cast<void*>(task), static_cast<void*>(place));
    task->run();
    task->~FilledTask();
}

TEST(TaskMemory, HasTheFormThatDoesNotThrow)
{
    const std::unique_ptr<ITask> task(new (std::nothrow) SmallTask);
    ASSERT_NE(task, nullptr);
    task->run();
}

TEST(TaskMemory, TakesBackWhatAConstructorThatThrowsLeaves)
{
    class ThrowingTask : public SmallTask
    {
    public:
        ThrowingTask() { throw std::runtime_error("not this one"); }
    };
    for (int number = 0; number < 100; ++number)
    {
        EXPECT_THROW(delete new ThrowingTask, std::runtime_error);
        EXPECT_THROW(delete new (std::nothrow) ThrowingTask, std::runtime_error);
    }
    const std::unique_ptr<ITask> task(new SmallTask);
    task->run();
}

TEST(TaskMemory, AConstructorThatThrowsCostsNoMemoryInTheLongRun)
{
    if (kUnderAddressSanitizer)
        GTEST_SKIP() << "under an address sanitizer every task is allocated";
    class ThrowingTask : public SmallTask
    {
    public:
        ThrowingTask() { throw 1; }
    };
    const auto fail = []
    {
        for (int number = 0; number < 1000; ++number)
            EXPECT_THROW(delete new (std::nothrow) ThrowingTask, int);
    };
    fail();
    const long before = AllocationsOfAllThreads();
    fail();
    EXPECT_EQ(AllocationsOfAllThreads() - before, 0);
}

TEST(TaskMemory, SaysWhenThereIsNoMemoryAndServesAgainLater)
{
    if (kUnderAddressSanitizer)
        GTEST_SKIP() << "under an address sanitizer every task is allocated";
    std::vector<std::unique_ptr<ITask>> tasks;
    tasks.reserve(1000);
    const auto makeMany = [&tasks]
    {
        while (tasks.size() < 1000)
            tasks.emplace_back(new SmallTask);
    };
    RefuseAlignedMemory(true);
    EXPECT_THROW(makeMany(), std::bad_alloc);
    EXPECT_EQ(new (std::nothrow) SmallTask, nullptr);
    EXPECT_LT(tasks.size(), 1000u);
    RefuseAlignedMemory(false);
    makeMany();
    for (const std::unique_ptr<ITask>& task : tasks)
        task->run();
}

// ---- across threads -----------------------------------------------------------------------------

namespace
{

/// Posts to a paused worker and then lets it run, so that each round has the same tasks at once.
void PostRound(IWorkerThread& worker, int tasks)
{
    worker.Pause();
    for (int number = 0; number < tasks; ++number)
        worker.EnqueueAsyncTask(new SmallTask);
    worker.Resume();
    worker.WaitForExecution(nullptr);
}

} // namespace

TEST(TaskMemory, PostingDoesNotAllocateInTheLongRun)
{
    if (kUnderAddressSanitizer)
        GTEST_SKIP() << "under an address sanitizer every task is allocated";
    const std::unique_ptr<IWorkerThread> worker(IWorkerThread::CreateInstance_NoLock("worker", 0));
    worker->Start(!kPaused);
    for (int round = 0; round < 100; ++round) // until every thread has as much as it ever keeps
        PostRound(*worker, 1000);
    const long before = AllocationsOfAllThreads();
    for (int round = 0; round < 20; ++round)
        PostRound(*worker, 1000);
    EXPECT_EQ(AllocationsOfAllThreads() - before, 0);
}

TEST(TaskMemory, WhatAThreadLeavesIsUsedByOthers)
{
    if (kUnderAddressSanitizer)
        GTEST_SKIP() << "under an address sanitizer every task is allocated";
    std::vector<std::unique_ptr<ITask>> tasks(1000);
    const auto make = [&tasks]
    {
        for (std::unique_ptr<ITask>& task : tasks)
            task.reset(new SmallTask);
    };
    make();
    std::thread(
        [&tasks]
        {
            for (std::unique_ptr<ITask>& task : tasks)
                task.reset();
        })
        .join();

    const long before = AllocationsOfAllThreads();
    make();
    EXPECT_LE(AllocationsOfAllThreads() - before, 1); // one of eight, for what this thread holds
}

TEST(TaskMemory, OneAllocationServesManyTasks)
{
    if (kUnderAddressSanitizer)
        GTEST_SKIP() << "under an address sanitizer every task is allocated";
    std::vector<std::unique_ptr<ITask>> tasks(10'000);
    const long before = AllocationsOfAllThreads();
    for (std::unique_ptr<ITask>& task : tasks)
        task.reset(new SmallTask);
    EXPECT_EQ(AllocationsOfAllThreads() - before, 80); // 126 of 64 bytes in each 8 KiB
}

TEST(TaskMemory, TasksThatAreMadeOneBehindTheOtherLieSo)
{
    if (kUnderAddressSanitizer)
        GTEST_SKIP() << "under an address sanitizer every task is allocated";
    std::vector<std::unique_ptr<ITask>> tasks(1000);
    for (std::unique_ptr<ITask>& task : tasks)
        task.reset(new SmallTask);
    int steps = 0;
    for (std::size_t index = 1; index < tasks.size(); ++index)
        steps += reinterpret_cast<std::uintptr_t>(tasks[index].get()) ==
                 reinterpret_cast<std::uintptr_t>(tasks[index - 1].get()) + 64;
    EXPECT_GE(steps, 999 - 9); // but from one 8 KiB to the next
}

TEST(TaskMemory, GivesBackWhatManyTasksLeave)
{
    if (kUnderAddressSanitizer)
        GTEST_SKIP() << "under an address sanitizer every task is allocated";
    if (kUnderThreadSanitizer)
        GTEST_SKIP() << "the thread sanitizer's heap is not the C library's";
    std::vector<std::unique_ptr<ITask>> tasks(400'000);
    const std::size_t before = MemoryInUse();
    for (std::unique_ptr<ITask>& task : tasks)
        task.reset(new SmallTask);
    EXPECT_GE(MemoryInUse() - before, 400'000u * 64);
    EXPECT_LE(MemoryInUse() - before, 400'000u * 66);
    tasks.clear();
    constexpr std::size_t kKept = 8u << 20;
    EXPECT_LE(MemoryInUse() - before, kKept + 8 * 8192); // and slabs that the thread holds
    EXPECT_GE(MemoryInUse() - before, kKept - 8192);
}

TEST(TaskMemory, ATaskThatIsKeptKeepsItsNeighboursMemoryOnly)
{
    if (kUnderAddressSanitizer)
        GTEST_SKIP() << "under an address sanitizer every task is allocated";
    if (kUnderThreadSanitizer)
        GTEST_SKIP() << "the thread sanitizer's heap is not the C library's";
    std::vector<std::unique_ptr<ITask>> tasks(400'000);
    std::vector<std::unique_ptr<ITask>> kept;
    const std::size_t before = MemoryInUse();
    for (std::size_t index = 0; index < tasks.size(); ++index)
    {
        tasks[index].reset(new SmallTask);
        if (index % 40'000 == 0)
            kept.emplace_back(std::move(tasks[index]));
    }
    tasks.clear();
    EXPECT_LE(MemoryInUse() - before, (8u << 20) + (8 + 10) * 8192);
    for (const std::unique_ptr<ITask>& task : kept)
        task->run();
}

TEST(TaskMemory, TasksMayEndWithTheThreadThatMadeThem)
{
    struct Holder
    {
        std::unique_ptr<ITask> task;
        ~Holder()
        {
            task.reset(new SmallTask); // after the thread's blocks were given away
            task->run();
        }
    };
    for (int number = 0; number < 10; ++number)
    {
        std::thread(
            []
            {
                static thread_local Holder holder; // made first, so it ends last
                holder.task.reset(new SmallTask);
                holder.task->run();
            })
            .join();
    }
}

TEST(TaskMemory, ManyThreadsMakeAndDeleteEachOthersTasks)
{
    constexpr int kEach = kUnderThreadSanitizer ? 5'000 : 50'000;
    const std::unique_ptr<IWorkerThread> pool(IWorkerThread::CreatePoolInstance("pool", 0, 3));
    pool->Start(!kPaused);
    for (int round = 0; round < 3; ++round) // with new threads each time
    {
        std::vector<std::thread> producers;
        for (int producer = 0; producer < 4; ++producer)
        {
            producers.emplace_back(
                [&pool]
                {
                    for (int number = 0; number < kEach / 3; ++number)
                    {
                        pool->EnqueueAsyncTask(new FilledTask<20>(0x11));
                        pool->EnqueueAsyncTask(new FilledTask<90>(0x22));
                        pool->EnqueueAsyncTask(new FilledTask<300>(0x33));
                    }
                });
        }
        for (std::thread& producer : producers)
            producer.join();
    }
    pool->WaitForExecution(nullptr);
    pool->Terminate();
}

// ---- misuse -------------------------------------------------------------------------------------

TEST(TaskMemoryDeathTest, AnAddressSanitizerSeesATaskThatIsUsedAfterItsEnd)
{
    if (!kUnderAddressSanitizer)
        GTEST_SKIP() << "needs an address sanitizer";
    EXPECT_DEATH(
        {
            const ITask* const task = new SmallTask;
            const volatile char* volatile const bytes = reinterpret_cast<const char*>(task);
            delete task;
            static_cast<void>(bytes[8]);
        },
        "heap-use-after-free");
}
