#include "base/HandOver.h"
#include "base/ThreadAnnotations.h"
#include "base/WaitWord.h"

#include <nib/base.h>

#include <ctime>

// Every waiter stands in the list with a word of its own, on its own stack, and sleeps until that
// word says that it was signalled. So a signal reaches exactly the thread that it was given to, and
// what else may end a sleep (a system signal, a word that lived here before) only leads back into
// it.

namespace Nib
{

namespace
{

timespec DeadlineAfter(int milliseconds)
{
    constexpr long kNanosecondsPerSecond = 1000000000;
    timespec deadline{};
    clock_gettime(CLOCK_MONOTONIC, &deadline);
    deadline.tv_sec += milliseconds / 1000;
    deadline.tv_nsec += milliseconds % 1000 * 1000000L;
    if (deadline.tv_nsec >= kNanosecondsPerSecond)
    {
        deadline.tv_nsec -= kNanosecondsPerSecond;
        ++deadline.tv_sec;
    }
    return deadline;
}

// For the look without the guard.
template <typename T>
void Publish(T*& place, T* value)
{
    __atomic_store_n(&place, value, __ATOMIC_SEQ_CST);
}

} // namespace

struct ConditionalVariable::Waiter
{
    WaitWord word;
    Waiter* next = nullptr;
    Waiter* previous = nullptr;
    bool isListed = true; // under the guard; no longer once a signal is given to it
};

bool ConditionalVariable::Wait(CriticalSection* section,
                               int milliseconds) noexcept NIB_NO_THREAD_SAFETY_ANALYSIS
{
    Waiter waiter;
    timespec deadline{};
    const bool hasDeadline = milliseconds >= 0;
    if (hasDeadline)
        deadline = DeadlineAfter(milliseconds);

    Append(&waiter);
    section->Leave();
    if (HandOver* const handOver = HandOver::OfThisThread())
    {
        handOver->AfterSectionIsLeft();
        handOver->Spin(waiter.word);
    }
    bool signalled = true;
    if (!waiter.word.Sleep(hasDeadline ? &deadline : nullptr))
    {
        signalled = !GiveUp(&waiter);
        if (signalled)
            waiter.word.Sleep(); // until whoever signals has ended it
    }
    section->Enter();
    return signalled;
}

void ConditionalVariable::Signal() noexcept
{
    // The section orders this against the waiters; a wait that begins meanwhile without one may or
    // may not be meant.
    if (__atomic_load_n(&m_first, __ATOMIC_SEQ_CST) == nullptr)
        return;
    pthread_mutex_lock(&m_guard);
    Waiter* waiter = m_first;
    if (waiter)
        Unlink(waiter);
    pthread_mutex_unlock(&m_guard);
    if (!waiter)
        return;
    if (HandOver* const handOver = HandOver::OfThisThread())
        handOver->EndLater(&waiter->word);
    else if (waiter->word.End())
        waiter->word.WakeSleeper();
}

void ConditionalVariable::SignalAll() noexcept
{
    pthread_mutex_lock(&m_guard);
    while (m_first)
    {
        Waiter* waiter = m_first;
        Unlink(waiter);
        if (waiter->word.End())
            waiter->word.WakeSleeper();
    }
    pthread_mutex_unlock(&m_guard);
}

void ConditionalVariable::Append(Waiter* waiter) noexcept
{
    pthread_mutex_lock(&m_guard);
    waiter->previous = m_last;
    if (m_last)
        m_last->next = waiter;
    else
        Publish(m_first, waiter);
    m_last = waiter;
    pthread_mutex_unlock(&m_guard);
}

// False when a signal came between the time-out and the lock: then it must not be lost.
bool ConditionalVariable::GiveUp(Waiter* waiter) noexcept
{
    pthread_mutex_lock(&m_guard);
    const bool waiting = waiter->isListed;
    if (waiting)
        Unlink(waiter);
    pthread_mutex_unlock(&m_guard);
    return waiting;
}

// The caller holds the guard.
void ConditionalVariable::Unlink(Waiter* waiter) noexcept
{
    waiter->isListed = false;
    if (waiter->previous)
        waiter->previous->next = waiter->next;
    else
        Publish(m_first, waiter->next);
    (waiter->next ? waiter->next->previous : m_last) = waiter->previous;
}

} // namespace Nib
