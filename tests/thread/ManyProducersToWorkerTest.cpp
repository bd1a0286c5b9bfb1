#include "thread/ThreadTestSupport.h"

#include <gtest/gtest.h>

#include <array>

using namespace Nib;

namespace
{

constexpr int kProducers = 8;

/// What the worker saw; touched by its thread alone.
struct Seen
{
    std::array<int, kProducers> next{}; ///< the number that each producer's next task has
    int outOfOrder = 0;
    int ran = 0;
    int deleted = 0;
};

class NumberedTask : public ITask
{
public:
    NumberedTask(Seen* seen, int producer, int number)
        : m_seen(seen), m_producer(producer), m_number(number)
    {
    }
    ~NumberedTask() override { ++m_seen->deleted; }

    void run() override
    {
        ++m_seen->ran;
        int& expected = m_seen->next[static_cast<std::size_t>(m_producer)];
        m_seen->outOfOrder += expected != m_number;
        expected = m_number + 1;
    }

private:
    Seen* m_seen;
    int m_producer;
    int m_number;
};

} // namespace

TEST(ManyProducers, EachTaskRunsOnceInItsProducersOrderAndIsDeletedOnce)
{
    const std::unique_ptr<IWorkerThread> worker(IWorkerThread::CreateInstance_NoLock("worker", 0));
    worker->Start(!kPaused);
    constexpr int kEach = kManyTasks / kProducers;
    Seen seen;
    std::vector<std::thread> producers;
    for (int producer = 0; producer < kProducers; ++producer)
    {
        producers.emplace_back(
            [&, producer]
            {
                for (int number = 0; number < kEach; ++number)
                    worker->EnqueueAsyncTask(new NumberedTask(&seen, producer, number));
            });
    }
    for (std::thread& producer : producers)
        producer.join();
    int queuedAfter = -1;
    EXPECT_TRUE(worker->WaitForExecution(&queuedAfter));

    EXPECT_EQ(queuedAfter, 0);
    EXPECT_EQ(seen.ran, kProducers * kEach);
    EXPECT_EQ(seen.outOfOrder, 0);
    for (const int next : seen.next)
        EXPECT_EQ(next, kEach);
    worker->Terminate(); // the last task is deleted behind the wait
    EXPECT_EQ(seen.deleted, kProducers * kEach);
}

TEST(ManyProducers, WorkersStartAndEndUnderFire)
{
    // Tasks that arrive while a worker ends are left for its next start; none is lost.
    constexpr int kEach = kUnderThreadSanitizer ? 5000 : 20000;
    const std::unique_ptr<IWorkerThread> worker(IWorkerThread::CreateInstance_NoLock("worker", 0));
    Seen seen;
    std::atomic<int> posting{kProducers};
    std::vector<std::thread> producers;
    for (int producer = 0; producer < kProducers; ++producer)
    {
        producers.emplace_back(
            [&, producer]
            {
                for (int number = 0; number < kEach; ++number)
                    worker->EnqueueAsyncTask(new NumberedTask(&seen, producer, number));
                posting.fetch_sub(1);
            });
    }
    while (posting.load() > 0)
    {
        ASSERT_TRUE(worker->Start(!kPaused));
        worker->Terminate();
    }
    for (std::thread& producer : producers)
        producer.join();
    worker->Start(!kPaused);
    worker->Terminate();

    EXPECT_EQ(seen.ran, kProducers * kEach);
    EXPECT_EQ(seen.outOfOrder, 0);
    EXPECT_EQ(seen.deleted, kProducers * kEach);
}
