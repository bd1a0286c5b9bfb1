#ifndef NIB_BASE_WAIT_WORD_H
#define NIB_BASE_WAIT_WORD_H

#include "base/Futex.h"
#include "base/Spin.h"

#include <atomic>

namespace Nib
{

/// One wait of one thread, which another one ends once. The steps are apart, so that the system is
/// only called for a thread that sleeps, and when the other one holds no lock any more.
//
//  state    Sleep                       End
//  waiting  asleep, after spinning      ended, nobody to wake
//  asleep   .                           ended, and WakeSleeper is due
//  ended    returns                     .
class WaitWord
{
public:
    WaitWord() = default;
    WaitWord(const WaitWord&) = delete;
    WaitWord& operator=(const WaitWord&) = delete;

    /// Returns true when the spin was long enough for the end of the wait.
    bool SpinUntilEnded() const
    {
        return Spin::While([this] { return m_state.load(std::memory_order_acquire) == kWaiting; });
    }

    /// Returns when the wait was ended, or at @p deadline, a point of the monotonic clock (null for
    /// none): then false. What was done before the end is visible.
    bool Sleep(const timespec* deadline = nullptr)
    {
        // An exchange, so that End knows of the sleep or this knows of the end. After the end
        // nobody looks at the state any more.
        if (m_state.exchange(kAsleep, std::memory_order_acq_rel) == kEnded)
            return true;
        while (m_state.load(std::memory_order_acquire) != kEnded)
        {
            if (!FutexWait(m_state, kAsleep, deadline))
                return false;
        }
        return true;
    }

    /// Ends the wait. True when the thread sleeps: then WakeSleeper is due.
    bool End() { return m_state.exchange(kEnded, std::memory_order_acq_rel) == kAsleep; }

    /// Uses the address only: the thread may have gone on, and the word may be gone with it.
    void WakeSleeper() { FutexWake(m_state); }

private:
    static constexpr int kWaiting = 0;
    static constexpr int kAsleep = 1;
    static constexpr int kEnded = 2;

    std::atomic<int> m_state{kWaiting};
};

} // namespace Nib

#endif
