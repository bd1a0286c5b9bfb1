#ifndef NIB_THREAD_WORKER_THREAD_POOL_H
#define NIB_THREAD_WORKER_THREAD_POOL_H

#include <nib/worker_thread.h>

#include <atomic>
#include <memory>
#include <vector>

namespace Nib
{

/// Workers that are given tasks in turn. What concerns all of them goes to one after the other and,
/// except for Terminate(), ends at the first that answers false.
class WorkerThreadPool : public IWorkerThread
{
public:
    WorkerThreadPool(const char* name, Thread::ThreadPriority priority, int count);
    ~WorkerThreadPool() override;

    bool Start(bool paused) override;
    void Terminate() override;
    bool Pause() override;
    bool Resume() override;
    bool EnqueueAsyncTask(ITask* task) override;
    bool IsRunning() override;
    bool IsStarted() override;
    bool WaitForExecution(int* queuedAfter) override;
    void RunSyncTask(ITask* task, bool aheadOfQueue, bool deleteAfterRun) override;

private:
    template <typename Ask>
    bool AllOf(Ask ask);
    IWorkerThread& Next() const;
    void Advance();

    std::vector<std::unique_ptr<IWorkerThread>> m_members;
    // Relaxed, and not one step: with several producers two tasks may go to the same member.
    std::atomic<int> m_next{0};
};

} // namespace Nib

#endif
