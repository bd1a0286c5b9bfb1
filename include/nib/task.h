#ifndef NIB_TASK_H
#define NIB_TASK_H

/// @file
/// Units of work that are handed to another thread, and wrappers that make one of a call.

#include <nib/export.h>

#include <atomic>
#include <cstddef>
#include <new>
#include <utility>

namespace Nib
{

/// The link by which a queue chains its items, so that queueing allocates nothing. Only the queue
/// that holds the item touches it.
template <typename T>
struct QueueItemBase
{
    /// The next item's link, or null. Stored with release, loaded with acquire: who finds an item
    /// through it sees the item complete.
    std::atomic<QueueItemBase*> next{nullptr};
};

/// A unit of work.
///
/// Owner    handed over asynchronously, the queue: it runs the task once and deletes it. Handed
/// over
///          synchronously, the caller, unless it asks for deletion after the run; such a task may
///          live on the caller's stack and carry results.
/// Threads  made on any thread, run on the worker's, never at the same time as another task of that
///          worker.
/// Failure  a task has no result, and nobody catches what run() throws.
///
/// A task is in one queue at most and is never queued again.
///
/// What `new` and `delete` take for a task of up to 256 bytes is kept for the next tasks, whichever
/// threads make and delete them, so that posting does not allocate in the long run.
class NIB_EXPORT ITask : public QueueItemBase<ITask>
{
public:
    ITask() = default;
    virtual ~ITask();

    ITask(const ITask&) = delete;
    ITask& operator=(const ITask&) = delete;

    /// Does the work.
    virtual void run() = 0;

    /// Whether a worker in global-lock mode runs this task inside the process-wide guard. True
    /// here.
    virtual bool isGlobalLockAllowed();

    /// From what earlier tasks left, else from the heap; throws std::bad_alloc. Any thread.
    static void* operator new(std::size_t size);
    /// Any thread, not only that which made the task.
    static void operator delete(void* memory, std::size_t size) noexcept;
    /// Over-aligned tasks, always from the heap.
    static void* operator new(std::size_t size, std::align_val_t alignment)
    {
        return ::operator new(size, alignment);
    }
    /// Over-aligned tasks.
    static void operator delete(void* memory, std::size_t, std::align_val_t alignment) noexcept
    {
        ::operator delete(memory, alignment);
    }
    /// At a given place.
    static void* operator new(std::size_t, void* place) noexcept { return place; }
    /// After a constructor at a given place threw.
    static void operator delete(void*, void*) noexcept {}
    /// Null instead of an exception.
    static void* operator new(std::size_t size, const std::nothrow_t&) noexcept;
    /// After a constructor of such a task threw.
    static void operator delete(void* memory, const std::nothrow_t&) noexcept;
};

/// Wrappers of one call each: of a member function on an object, which must outlive the task, or of
/// a free function. Arguments are stored by value and passed by value; the result is dropped.
namespace WorkerTask
{

/// (object->*function)()
template <typename T, typename F>
class Member0 : public ITask
{
public:
    /// A call of @p function on @p object, which must outlive the task.
    Member0(T* object, F function) : m_object(object), m_function(function) {}

    void run() override { static_cast<void>((m_object->*m_function)()); }

private:
    T* m_object;
    F m_function;
};

/// (object->*function)(a1, a2)
template <typename T, typename F, typename A1, typename A2>
class Member2 : public ITask
{
public:
    /// As above, with copies of the arguments.
    Member2(T* object, F function, A1 a1, A2 a2)
        : m_object(object), m_function(function), m_a1(std::move(a1)), m_a2(std::move(a2))
    {
    }

    void run() override { static_cast<void>((m_object->*m_function)(m_a1, m_a2)); }

private:
    T* m_object;
    F m_function;
    A1 m_a1;
    A2 m_a2;
};

/// (object->*function)(a1, a2, a3)
template <typename T, typename F, typename A1, typename A2, typename A3>
class Member3 : public ITask
{
public:
    /// As above, with copies of the arguments.
    Member3(T* object, F function, A1 a1, A2 a2, A3 a3)
        : m_object(object), m_function(function), m_a1(std::move(a1)), m_a2(std::move(a2)),
          m_a3(std::move(a3))
    {
    }

    void run() override { static_cast<void>((m_object->*m_function)(m_a1, m_a2, m_a3)); }

private:
    T* m_object;
    F m_function;
    A1 m_a1;
    A2 m_a2;
    A3 m_a3;
};

/// function()
template <typename F>
class Func0 : public ITask
{
public:
    /// A call of @p function.
    explicit Func0(F function) : m_function(function) {}

    void run() override { static_cast<void>(m_function()); }

private:
    F m_function;
};

/// function(a1)
template <typename F, typename A1>
class Func1 : public ITask
{
public:
    /// As above, with a copy of the argument.
    Func1(F function, A1 a1) : m_function(function), m_a1(std::move(a1)) {}

    void run() override { static_cast<void>(m_function(m_a1)); }

private:
    F m_function;
    A1 m_a1;
};

/// function(copy of a1, copy of a2): the copies live for the call, the stored ones as long as the
/// task. What a shared pointer among them holds lives at least until the task is deleted.
template <typename F, typename A1, typename A2>
class Func2 : public ITask
{
public:
    /// As above, with copies of the arguments.
    Func2(F function, A1 a1, A2 a2) : m_function(function), m_a1(std::move(a1)), m_a2(std::move(a2))
    {
    }

    void run() override { static_cast<void>(m_function(A1(m_a1), A2(m_a2))); }

private:
    F m_function;
    A1 m_a1;
    A2 m_a2;
};

} // namespace WorkerTask

} // namespace Nib

#endif
