#include "thread/WorkerThreadImpl.h"

#include "base/HandOver.h"
#include "base/Log.h"
#include "thread/GlobalLocker.h"
#include "thread/TaskScope.h"

#include <algorithm>
#include <memory>
#include <new>
#include <optional>
#include <utility>

namespace Nib
{

namespace
{

constexpr bool kReentrant = true;
constexpr bool kGlobalLock = true;
constexpr bool kAheadOfQueue = true;
constexpr bool kDeleteAfterRun = true;
constexpr int kNoTimeout = -1;

} // namespace

/// Ends the worker's loop; stands behind everything that was queued before.
class WorkerThreadImpl::TerminateTask : public ITask
{
public:
    explicit TerminateTask(WorkerThreadImpl* worker) : m_worker(worker) {}
    void run() override { m_worker->m_quit.store(true, std::memory_order_relaxed); }

private:
    WorkerThreadImpl* m_worker;
};

/// Notes how many tasks are queued behind it.
class WorkerThreadImpl::WaitTask : public ITask
{
public:
    explicit WaitTask(WorkerThreadImpl* worker) : m_worker(worker) {}
    void run() override { m_queuedAfter = m_worker->m_pending.load(std::memory_order_acquire); }
    int QueuedAfter() const { return m_queuedAfter; }

private:
    WorkerThreadImpl* m_worker;
    int m_queuedAfter = 0;
};

/// Carries a synchronous task through the queue.
class WorkerThreadImpl::QueuedSyncTask : public ITask
{
public:
    QueuedSyncTask(WorkerThreadImpl* worker, ITask* task, bool deleteAfterRun)
        : m_worker(worker), m_task(task), m_deleteAfterRun(deleteAfterRun)
    {
    }
    void run() override { m_worker->RunSynchronously(m_task, m_deleteAfterRun); }

private:
    WorkerThreadImpl* m_worker;
    std::atomic<ITask*> m_task;
    bool m_deleteAfterRun;
};

IWorkerThread::~IWorkerThread() = default;

IWorkerThread* IWorkerThread::CreateInstance_NoLock(const char* name,
                                                    Thread::ThreadPriority priority)
{
    return new WorkerThreadImpl(name, priority, !kGlobalLock);
}

IWorkerThread* IWorkerThread::CreateInstance_GlobalLock(const char* name,
                                                        Thread::ThreadPriority priority)
{
    return new WorkerThreadImpl(name, priority, kGlobalLock);
}

WorkerThreadImpl::WorkerThreadImpl(const char* name, Thread::ThreadPriority priority,
                                   bool globalLock)
    : m_globalLock(globalLock), m_priority(priority), m_name(name), m_outerLock(kReentrant),
      m_syncLock(!kReentrant), m_wakeLock(!kReentrant)
{
    NIB_FUNCTION("Nib::WorkerThreadImpl::WorkerThreadImpl(const char *, "
                 "Thread::ThreadPriority, bool)");
    NIB_LOG_INFO("%s Initialize", function);
    ReadWatchdogEnvironment();
    Trace::StartFromEnvironment();
}

WorkerThreadImpl::~WorkerThreadImpl()
{
    NIB_FUNCTION("virtual Nib::WorkerThreadImpl::~WorkerThreadImpl()");
    NIB_LOG_INFO("%s Cleanup", function);
    Terminate();
}

// ---- start and end ----

bool WorkerThreadImpl::Start(bool paused)
{
    NIB_FUNCTION("virtual bool Nib::WorkerThreadImpl::Start(bool)");
    NIB_LOG_INFO("%s Starting", function);
    AutoCriticalSection lock(m_outerLock);
    if (IsStarted())
        return true;
    m_paused.store(paused, std::memory_order_seq_cst);
    m_pending.fetch_add(m_leftBehind, std::memory_order_acq_rel);
    m_leftBehind = 0;
    auto thread = std::make_unique<Thread>(&ThreadProcedure, this, m_name, m_priority);
    m_thread.store(thread.get(), std::memory_order_release);
    if (!thread->start())
    {
        m_thread.store(nullptr, std::memory_order_release);
        NIB_LOG_ERROR("%s: Failed to start thrtead", function);
        return false;
    }
    static_cast<void>(thread.release());
    return true;
}

void WorkerThreadImpl::Terminate()
{
    AutoCriticalSection lock(m_outerLock);
    if (!IsStarted())
        return;
    TerminateTask terminateTask(this);
    RunSyncTask(&terminateTask, !kAheadOfQueue, !kDeleteAfterRun);
    const std::unique_ptr<Thread> thread(m_thread.load(std::memory_order_acquire));
    thread->join();
    m_threadNumber.store(0, std::memory_order_relaxed);
    m_thread.store(nullptr, std::memory_order_release);
    m_quit.store(false, std::memory_order_relaxed);
    // What came behind the last task stays linked; the next start counts it again. An exchange, so
    // that a producer that counts at this moment is not lost.
    m_leftBehind += m_pending.exchange(0, std::memory_order_acq_rel);
}

bool WorkerThreadImpl::Pause()
{
    m_paused.store(true, std::memory_order_seq_cst);
    return true;
}

bool WorkerThreadImpl::Resume()
{
    if (!m_paused.exchange(false, std::memory_order_seq_cst))
        return false;
    Wakeup();
    return true;
}

void WorkerThreadImpl::Wakeup()
{
    const HandOver wakesWithoutLock;
    AutoCriticalSection lock(m_wakeLock);
    m_wakeCondition.Signal();
}

bool WorkerThreadImpl::IsRunning()
{
    return IsStarted() && !IsPaused();
}

bool WorkerThreadImpl::IsStarted()
{
    return m_thread.load(std::memory_order_acquire) != nullptr;
}

// ---- handing over ----

bool WorkerThreadImpl::EnqueueAsyncTask(ITask* task)
{
    // Before the worker can take the task and tell of it: what it tells last is how it is.
    if (Trace::IsOn())
        TraceQueue(m_pending.load(std::memory_order_relaxed) + 1);
    m_queue.Push(task);
    OnNewAsyncTask();
    return true;
}

void WorkerThreadImpl::OnNewAsyncTask()
{
    // Only the step from idle to busy wakes the worker: a system call a task would cost more than
    // the task. Sequentially consistent against the worker's look at the count under m_wakeLock.
    const std::int32_t pending = m_pending.fetch_add(1, std::memory_order_seq_cst) + 1;
    if (pending < 2 && !IsPaused())
        Wakeup();
}

/// The number of tasks that wait, on the lane of the worker, which has one while it has a thread.
void WorkerThreadImpl::TraceQueue(std::int32_t pending) const
{
    if (const std::uint64_t thread = m_threadNumber.load(std::memory_order_relaxed))
        Trace::Counter("queue", "queue", std::max(pending, 0), thread, m_name);
}

bool WorkerThreadImpl::WaitForExecution(int* queuedAfter)
{
    NIB_FUNCTION("virtual bool Nib::WorkerThreadImpl::WaitForExecution(int *)");
    if (!IsRunning())
    {
        NIB_LOG_ERROR("%s. Worker is on pause (Queued task: %d). No task executed.", function,
                      m_pending.load(std::memory_order_acquire));
        return false;
    }
    WaitTask waitTask(this);
    RunSyncTask(&waitTask, !kAheadOfQueue, !kDeleteAfterRun);
    if (queuedAfter != nullptr)
        *queuedAfter = waitTask.QueuedAfter();
    return true;
}

void WorkerThreadImpl::RunSyncTask(ITask* task, bool aheadOfQueue, bool deleteAfterRun)
{
    const WatchedCall wait(WatchedCall::Kind::Wait, m_watched, task);
    const TaskScope trace(m_name, *task);
    AutoCriticalSection outer(m_outerLock);
    HandOver handOver; // so that the worker comes when m_syncLock is free
    handOver.TellWhenLeft(&m_isSyncLockLeft);
    if (!IsPaused() && m_partners.CallerMaySpin(m_threadNumber))
        handOver.SpinInWait();
    HandOverAndWait(task, aheadOfQueue, deleteAfterRun);
    if (handOver.HasSpunInVain())
        m_partners.CallerSpunInVain();
}

void WorkerThreadImpl::HandOverAndWait(ITask* task, bool aheadOfQueue, bool deleteAfterRun)
{
    AutoCriticalSection sync(m_syncLock);
    m_isSyncLockLeft.store(false, std::memory_order_relaxed);
    if (aheadOfQueue)
    {
        m_deleteDirectTask = deleteAfterRun;
        m_directTask.store(task, std::memory_order_release);
        m_pending.fetch_add(1, std::memory_order_seq_cst);
        Wakeup();
    }
    else
    {
        EnqueueAsyncTask(new QueuedSyncTask(this, task, deleteAfterRun));
    }
    // Once, without a predicate: the worker needs m_syncLock to finish the task, and this thread
    // holds it until the wait has begun.
    m_doneCondition.Wait(&m_syncLock, kNoTimeout);
}

// ---- the worker's own thread ----

void WorkerThreadImpl::ThreadProcedure(void* worker)
{
    auto* self = static_cast<WorkerThreadImpl*>(worker);
    self->m_threadNumber.store(GetNibCurrentThreadId(), std::memory_order_relaxed);
    const TraceLane lane(self->m_name);
    self->RunUntilQuit();
}

void WorkerThreadImpl::RunUntilQuit()
{
    while (!m_quit.load(std::memory_order_relaxed)) // set by a task on this thread
        RunTurn();
}

void WorkerThreadImpl::RunTurn()
{
    const bool paused = IsPaused();
    const bool hasWork = paused ? HasDirectTask() : m_pending.load(std::memory_order_acquire) > 0;
    if (!hasWork)
    {
        const TraceScope idle("wait", "idle");
        SleepUntilNeeded();
    }
    if (HasDirectTask())
        RunDirectTask();
    else if (hasWork ? !paused : !IsPaused())
        RunOneAsyncTask();
}

void WorkerThreadImpl::SleepUntilNeeded()
{
    if (ExpectsCall() && SpinForWork())
        return;
    AutoCriticalSection lock(m_wakeLock);
    const bool isIdle =
        IsPaused() ? !HasDirectTask() : m_pending.load(std::memory_order_seq_cst) < 1;
    // Whoever changes what was just looked at signals under this lock afterwards, so no signal is
    // missed.
    if (isIdle)
        m_wakeCondition.Wait(&m_wakeLock, kNoTimeout);
}

// Behind a synchronous call: who waited for it comes again soon, with tasks perhaps before the next
// call. Who only posts does not wait, and to spin for the next task would take the processor from
// others: one call allows for one limit in all.
bool WorkerThreadImpl::ExpectsCall() const
{
    return m_spinLeft > Spin::Duration::zero() && !IsPaused() && m_partners.WorkerMaySpin();
}

bool WorkerThreadImpl::SpinForWork()
{
    const auto isIdle = [this]
    { return !IsPaused() && m_pending.load(std::memory_order_acquire) < 1; };
    const bool found = Spin::While(isIdle, m_spinLeft);
    if (!found)
        m_partners.WorkerSpunInVain();
    return found;
}

void WorkerThreadImpl::RunDirectTask()
{
    const std::int32_t pending = m_pending.fetch_sub(1, std::memory_order_acq_rel) - 1;
    if (Trace::IsOn())
        TraceQueue(pending);
    RunSynchronously(m_directTask, m_deleteDirectTask);
}

void WorkerThreadImpl::RunOneAsyncTask()
{
    ITask* const task = m_queue.Pop();
    if (task == nullptr)
        return;
    const std::int32_t pending = m_pending.fetch_sub(1, std::memory_order_acq_rel) - 1;
    if (Trace::IsOn())
        TraceQueue(pending);
    RunGuarded(task);
    delete task;
}

bool WorkerThreadImpl::RunSynchronously(std::atomic<ITask*>& task, bool deleteAfterRun)
{
    AwaitSyncLock();
    std::optional<HandOver> answersWithoutLock; // from the signal on: the task signals at once
    AutoCriticalSection lock(m_syncLock);
    ITask* const run = task.load(std::memory_order_acquire);
    RunGuarded(run);
    WatchedCall::Answer(m_watched, run);
    if (deleteAfterRun)
        delete run;
    task.store(nullptr, std::memory_order_release);
    m_spinLeft = Spin::kLimit;
    answersWithoutLock.emplace();
    m_doneCondition.Signal();
    return true;
}

// The caller is about to leave the lock; to sleep for that would take both a system call.
void WorkerThreadImpl::AwaitSyncLock() const
{
    if (m_partners.WorkerMaySpin())
        Spin::While([this] { return !m_isSyncLockLeft.load(std::memory_order_relaxed); });
}

void WorkerThreadImpl::RunGuarded(ITask* task)
{
    const WatchedCall call(WatchedCall::Kind::Run, m_watched, task);
    const TaskScope trace(*task, &typeid(QueuedSyncTask));
    if (!m_globalLock || !task->isGlobalLockAllowed())
        return task->run();
    AutoCriticalSection guard(GlobalLocker::m_guard);
    task->run();
}

} // namespace Nib
