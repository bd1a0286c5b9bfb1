#ifndef NIB_RENDER_LOCK_FREE_QUEUE_H
#define NIB_RENDER_LOCK_FREE_QUEUE_H

#include <nib/base.h>
#include <nib/task.h>

#include <atomic>

namespace Nib::GLES
{

/// A queue that many threads push to and one thread pops from. The items are chained by their own
/// links, behind a stub that stands in while there is none.
///
/// Owner    nothing: what is left in the queue is its user's.
/// Threads  Push from any thread; Pop by one at a time.
template <typename T>
class LockFreeQueue
{
public:
    LockFreeQueue() : m_head(&m_stub), m_tail(&m_stub) {}
    LockFreeQueue(const LockFreeQueue&) = delete;
    LockFreeQueue& operator=(const LockFreeQueue&) = delete;

    /// Appends @p item; it can be popped when this has returned.
    void Push(T* item) { Append(item); }

    /// Takes the oldest item. Null when there is none, also when the one behind it is being pushed
    /// right now: the oldest then stays for the next time.
    T* Pop();

private:
    using Link = QueueItemBase<T>;

    void Append(Link* link);
    T* TakeHead(Link* next);

    Link m_stub;
    Link* m_head; // the popping thread's
    std::atomic<Link*> m_tail;
};

template <typename T>
void LockFreeQueue<T>::Append(Link* link)
{
    link->next.store(nullptr, std::memory_order_relaxed);
    Link* previous = InterlockedExchangePointer(&m_tail, link);
    previous->next.store(link, std::memory_order_release); // for Pop's acquire
}

template <typename T>
T* LockFreeQueue<T>::TakeHead(Link* next)
{
    T* item = static_cast<T*>(m_head);
    m_head = next;
    return item;
}

template <typename T>
T* LockFreeQueue<T>::Pop()
{
    Link* next = m_head->next.load(std::memory_order_acquire);
    if (m_head == &m_stub)
    {
        if (next == nullptr)
            return nullptr;
        m_head = next;
        next = next->next.load(std::memory_order_acquire);
    }
    if (next != nullptr)
        return TakeHead(next);
    if (m_tail.load(std::memory_order_acquire) != m_head)
        return nullptr;
    Append(&m_stub); // the last item gets a successor, so that it can be taken
    next = m_head->next.load(std::memory_order_acquire);
    return next == nullptr ? nullptr : TakeHead(next);
}

} // namespace Nib::GLES

#endif
