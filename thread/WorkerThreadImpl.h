#ifndef NIB_THREAD_WORKER_THREAD_IMPL_H
#define NIB_THREAD_WORKER_THREAD_IMPL_H

#include "base/Spin.h"
#include "base/ThreadAnnotations.h"
#include "thread/SpinPartners.h"
#include "thread/TaskQueue.h"
#include "thread/WatchedCall.h"

#include <nib/base.h>
#include <nib/worker_thread.h>

#include <atomic>
#include <cstdint>

namespace Nib
{

/// A thread that runs tasks one at a time: asynchronous ones in their order, and synchronous ones,
/// for which the caller waits, either behind those or ahead of them.
//
//  state     Start(false)  Start(true)  Pause   Resume   Terminate               ('.' no change)
//  created   running       paused       .       .        .
//  running   .             .            paused  .        created, after the queued tasks
//  paused    .             .            .       running  blocks until resumed
class WorkerThreadImpl : public IWorkerThread
{
public:
    WorkerThreadImpl(const char* name, Thread::ThreadPriority priority, bool globalLock);
    ~WorkerThreadImpl() override;

    bool Start(bool paused) override;
    void Terminate() override;
    bool Pause() override;
    bool Resume() override;
    bool EnqueueAsyncTask(ITask* task) override;
    bool IsRunning() override;
    bool IsStarted() override;
    bool WaitForExecution(int* queuedAfter) override;
    void RunSyncTask(ITask* task, bool aheadOfQueue, bool deleteAfterRun) override;

    void Wakeup();         ///< ends the worker's sleep; any thread
    void OnNewAsyncTask(); ///< counts a task that was linked, and wakes an idle worker; any thread

private:
    class TerminateTask;
    class WaitTask;
    class QueuedSyncTask;

    static void ThreadProcedure(void* worker);
    void RunUntilQuit();
    void HandOverAndWait(ITask* task, bool aheadOfQueue, bool deleteAfterRun);
    void RunTurn();
    void SleepUntilNeeded();
    bool ExpectsCall() const;
    bool SpinForWork();
    void RunDirectTask();
    void RunOneAsyncTask();
    bool RunSynchronously(std::atomic<ITask*>& task, bool deleteAfterRun);
    void AwaitSyncLock() const;
    void RunGuarded(ITask* task);
    void TraceQueue(std::int32_t pending) const;

    // Sequentially consistent together with m_pending: a producer that counts after the worker's
    // last look must see that the worker is no longer paused, or it would not wake it.
    bool IsPaused() const { return m_paused.load(std::memory_order_seq_cst); }
    bool HasDirectTask() const { return m_directTask.load(std::memory_order_acquire) != nullptr; }

    // What everybody reads and hardly anybody writes.
    std::atomic<bool> m_paused{true}; // the worker reads it again at every turn
    std::atomic<bool> m_quit{false};
    const bool m_globalLock;
    std::atomic<Thread*> m_thread{nullptr}; // owned; written under m_outerLock
    const Thread::ThreadPriority m_priority;
    const char* const m_name;                     // the caller's
    std::atomic<std::uint64_t> m_threadNumber{0}; // the system's, 0 without a thread
    const WatchTarget m_watched{m_name, &m_threadNumber, &m_paused};
    SpinPartners m_partners;
    std::int32_t m_leftBehind = 0;             // tasks that stayed queued at the last termination
    std::atomic<ITask*> m_directTask{nullptr}; // filled under m_syncLock, looked at without it
    bool m_deleteDirectTask = false;           // published by m_directTask

    // Order: m_outerLock, m_syncLock, m_wakeLock. The worker takes the last two, never together.
    // What the caller and the worker write in turn lies apart from what only the caller writes.
    alignas(kCacheLine) CriticalSection m_outerLock; // one synchronous caller at a time;
                                                     // re-entrant for Terminate
    alignas(kCacheLine) CriticalSection m_syncLock NIB_ACQUIRED_AFTER(m_outerLock);
    std::atomic<bool> m_isSyncLockLeft{true}; // by the latest caller, which waits
    alignas(kCacheLine) CriticalSection m_wakeLock NIB_ACQUIRED_AFTER(m_syncLock);
    ConditionalVariable m_wakeCondition; // with m_wakeLock; the worker sleeps on it
    alignas(kCacheLine) ConditionalVariable m_doneCondition; // with m_syncLock; the synchronous
                                                             // caller sleeps on it

    // Tasks in the queue, and one for a direct task. -1 for a moment when the worker takes a task
    // that its producer has linked but not yet counted.
    alignas(kCacheLine) std::atomic<std::int32_t> m_pending{0};
    alignas(kCacheLine) TaskQueue m_queue;
    Spin::Duration m_spinLeft{}; // of what the latest synchronous call allows
};

} // namespace Nib

#endif
