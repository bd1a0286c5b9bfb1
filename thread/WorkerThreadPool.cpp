#include "thread/WorkerThreadPool.h"

namespace Nib
{

IWorkerThread* IWorkerThread::CreatePoolInstance(const char* name, Thread::ThreadPriority priority,
                                                 int count)
{
    return new WorkerThreadPool(name, priority, count);
}

WorkerThreadPool::WorkerThreadPool(const char* name, Thread::ThreadPriority priority, int count)
{
    for (int i = 0; i < count; ++i)
        m_members.emplace_back(CreateInstance_NoLock(name, priority));
}

WorkerThreadPool::~WorkerThreadPool()
{
    for (std::unique_ptr<IWorkerThread>& member : m_members) // in this order, as exported
        member.reset();
}

/// Asks the members in turn; true when there is one and all say so.
template <typename Ask>
bool WorkerThreadPool::AllOf(Ask ask)
{
    for (const std::unique_ptr<IWorkerThread>& member : m_members)
    {
        if (!ask(*member))
            return false;
    }
    return !m_members.empty();
}

bool WorkerThreadPool::Start(bool paused)
{
    return AllOf([paused](IWorkerThread& member) { return member.Start(paused); });
}

void WorkerThreadPool::Terminate()
{
    for (const std::unique_ptr<IWorkerThread>& member : m_members)
        member->Terminate();
}

bool WorkerThreadPool::Pause()
{
    return AllOf([](IWorkerThread& member) { return member.Pause(); });
}

bool WorkerThreadPool::Resume()
{
    return AllOf([](IWorkerThread& member) { return member.Resume(); });
}

bool WorkerThreadPool::IsRunning()
{
    return AllOf([](IWorkerThread& member) { return member.IsRunning(); });
}

bool WorkerThreadPool::IsStarted()
{
    return AllOf([](IWorkerThread& member) { return member.IsStarted(); });
}

bool WorkerThreadPool::WaitForExecution(int*)
{
    return AllOf(
        [](IWorkerThread& member)
        {
            int queuedAfter = 0;
            return member.WaitForExecution(&queuedAfter);
        });
}

bool WorkerThreadPool::EnqueueAsyncTask(ITask* task)
{
    if (m_members.empty())
        return false;
    const bool taken = Next().EnqueueAsyncTask(task);
    Advance();
    return taken;
}

void WorkerThreadPool::RunSyncTask(ITask* task, bool aheadOfQueue, bool deleteAfterRun)
{
    if (m_members.empty())
        return;
    Next().RunSyncTask(task, aheadOfQueue, deleteAfterRun);
    Advance();
}

IWorkerThread& WorkerThreadPool::Next() const
{
    return *m_members[static_cast<std::size_t>(m_next.load(std::memory_order_relaxed))];
}

void WorkerThreadPool::Advance()
{
    const int next = m_next.load(std::memory_order_relaxed) + 1;
    m_next.store(next == static_cast<int>(m_members.size()) ? 0 : next, std::memory_order_relaxed);
}

} // namespace Nib
