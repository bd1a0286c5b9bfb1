// Worker threads: calls as tasks, posted or waited for, and a pool of workers.

#include <nib/task.h>
#include <nib/worker_thread.h>

#include <atomic>
#include <cstdio>
#include <memory>

namespace
{

class Counter
{
public:
    void Add(int a, int b) { m_sum += a + b; } // runs on the worker alone: no lock
    void Report(int* sum, const char*) { *sum = m_sum; }

private:
    int m_sum = 0;
};

std::atomic<int> g_poolCalls{0};
void CountCall()
{
    ++g_poolCalls;
}

} // namespace

int main()
{
    using namespace Nib;
    constexpr bool kPaused = true, kAheadOfQueue = true, kDeleteAfterRun = true;

    const std::unique_ptr<IWorkerThread> worker(IWorkerThread::CreateInstance_NoLock("example", 0));
    worker->Start(!kPaused);

    // Posted tasks belong to the worker and run in this order; posting never blocks.
    Counter counter;
    for (int i = 1; i <= 10; ++i)
        worker->EnqueueAsyncTask(
            new WorkerTask::Member2<Counter, void (Counter::*)(int, int), int, int>(
                &counter, &Counter::Add, i, 0));

    // A synchronous task runs behind them, and this thread waits for it.
    int sum = 0;
    worker->RunSyncTask(
        new WorkerTask::Member2<Counter, void (Counter::*)(int*, const char*), int*, const char*>(
            &counter, &Counter::Report, &sum, ""),
        !kAheadOfQueue, kDeleteAfterRun);

    // A pool gives tasks to its members in turn.
    const std::unique_ptr<IWorkerThread> pool(IWorkerThread::CreatePoolInstance("pool", 0, 3));
    pool->Start(!kPaused);
    for (int i = 0; i < 30; ++i)
        pool->EnqueueAsyncTask(new WorkerTask::Func0<void (*)()>(&CountCall));
    pool->WaitForExecution(nullptr);

    std::printf("sum %d, calls on the pool %d\n", sum, g_poolCalls.load());
    return sum == 55 && g_poolCalls == 30 ? 0 : 1;
}
