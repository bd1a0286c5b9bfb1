#ifndef NIB_THREAD_TASK_QUEUE_H
#define NIB_THREAD_TASK_QUEUE_H

#include <nib/task.h>

#include <atomic>
#include <cstddef>

namespace Nib
{

/// Bytes that processors hand to each other as one: what different threads write lies apart.
constexpr std::size_t kCacheLine = 64;

/// A queue of tasks that chains the tasks' own links behind a stub: any thread appends, without a
/// lock and without allocating; one thread takes.
class TaskQueue
{
public:
    TaskQueue() = default;
    TaskQueue(const TaskQueue&) = delete;
    TaskQueue& operator=(const TaskQueue&) = delete;

    /// Appends @p task, which then belongs to the queue. Any thread.
    void Push(ITask* task) noexcept { Append(task); }

    /// Takes the oldest task, which then belongs to the caller. Null when the queue is empty, and
    /// also while a producer stands between its two steps: the task is found on a later call.
    /// Consumer only.
    ITask* Pop() noexcept;

private:
    using Link = QueueItemBase<ITask>;

    void Append(Link* item) noexcept;

    Link* m_head = &m_stub; // the consumer's end
    // The producers' end. The stub is beside it: it is linked when the queue runs empty, and then
    // both ends touch both.
    alignas(kCacheLine) std::atomic<Link*> m_tail{&m_stub};
    Link m_stub;
};

inline void TaskQueue::Append(Link* item) noexcept
{
    item->next.store(nullptr, std::memory_order_relaxed); // published by the store below
    // Release, so that the task is whole for whoever reaches it through the tail; acquire, so that
    // the previous item's link is initialised before it is written here.
    Link* const previous = m_tail.exchange(item, std::memory_order_acq_rel);
    previous->next.store(item, std::memory_order_release); // pairs with the loads in Pop
}

inline ITask* TaskQueue::Pop() noexcept
{
    Link* head = m_head;
    Link* next = head->next.load(std::memory_order_acquire);
    if (head == &m_stub)
    {
        if (next == nullptr)
            return nullptr; // empty
        m_head = head = next;
        next = head->next.load(std::memory_order_acquire);
    }
    if (next == nullptr)
    {
        if (m_tail.load(std::memory_order_acquire) != head)
            return nullptr; // a producer is mid-way behind head
        Append(&m_stub);    // so that head gets a successor and can leave
        next = head->next.load(std::memory_order_acquire);
        if (next == nullptr)
            return nullptr; // a producer came between
    }
    m_head = next;
    // A queue that has grown long is in no cache any more: its next task comes while this one runs.
    __builtin_prefetch(next);
    return static_cast<ITask*>(head);
}

} // namespace Nib

#endif
