#ifndef NIB_WORKER_THREAD_H
#define NIB_WORKER_THREAD_H

/// @file
/// Threads with a queue of tasks, alone and in pools.

#include <nib/base.h>
#include <nib/export.h>

namespace Nib
{

class ITask;

/// A thread that runs tasks one at a time: queued ones in the order in which they came, and
/// synchronous ones for which the caller waits.
///
/// Owner    the caller, from a factory, not started. Deleting it is Terminate() and more.
/// Threads  [blocks] waits without time-out for the worker, and deadlocks when called by a task of
///          that same worker. No mark: never blocks. Any thread may call, but no synchronous call
///          may overlap the termination of its worker.
/// Order    Start(), then the rest. Tasks may be queued before; they run once it is started.
/// Failure  false, and a log line. What a task throws is not caught.
///
/// Virtual operations: the order is exported.
class NIB_EXPORT IWorkerThread
{
public:
    /// [blocks] Terminates. Tasks that were queued during that are neither run nor deleted. Resume
    /// a paused worker first, or this never returns.
    virtual ~IWorkerThread();

    /// [blocks] while another thread has a synchronous task run. Starts the thread, paused or
    /// running. True when it runs after the call; a thread that ran already stays as it is, paused
    /// or not.
    virtual bool Start(bool paused) = 0;

    /// [blocks] Runs all tasks queued so far, then ends and joins the thread; it may be started
    /// again. Nothing when not started. Resume a paused worker first, or this never returns.
    virtual void Terminate() = 0;

    /// Lets the running task end, then runs only synchronous tasks that are ahead of the queue,
    /// until resumed. Always true.
    virtual bool Pause() = 0;

    /// False when it was not paused.
    virtual bool Resume() = 0;

    /// Appends @p task, which now belongs to the worker. Always true.
    virtual bool EnqueueAsyncTask(ITask* task) = 0;

    /// Whether it is started and not paused.
    virtual bool IsRunning() = 0;

    /// Whether it is started.
    virtual bool IsStarted() = 0;

    /// [blocks] until all tasks queued before the call have run, then stores the number queued
    /// behind them into @p queuedAfter, if that is not null. False at once, storing nothing, when
    /// it is not started or paused.
    virtual bool WaitForExecution(int* queuedAfter) = 0;

    /// [blocks] until the worker has run @p task: before all queued tasks and also when paused
    /// (@p aheadOfQueue), or behind them and only when not paused. With @p deleteAfterRun the
    /// worker then deletes it, else it stays the caller's. Never while holding the guard that the
    /// tasks of a worker in global-lock mode run in.
    virtual void RunSyncTask(ITask* task, bool aheadOfQueue, bool deleteAfterRun) = 0;

    /// A worker. @p name is kept, not copied; a literal does. @p priority is a nice value.
    static IWorkerThread* CreateInstance_NoLock(const char* name, Thread::ThreadPriority priority);

    /// A worker that holds one process-wide guard while it runs a task: of all workers made by this
    /// function, one task runs at a time.
    static IWorkerThread* CreateInstance_GlobalLock(const char* name,
                                                    Thread::ThreadPriority priority);

    /// @p count workers behind one face. Each hand-over goes to the next of them in turn, exactly
    /// so with one thread handing over; tasks of different members run at the same time. The other
    /// operations go through the members in order and stop at the first that answers false; only
    /// Terminate() reaches all. WaitForExecution() leaves its argument alone. Below 1 there are no
    /// members: every bool is false, a task that is refused stays the caller's, and RunSyncTask()
    /// returns without running anything.
    static IWorkerThread* CreatePoolInstance(const char* name, Thread::ThreadPriority priority,
                                             int count);
};

} // namespace Nib

#endif
