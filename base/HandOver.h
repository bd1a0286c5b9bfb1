#ifndef NIB_BASE_HAND_OVER_H
#define NIB_BASE_HAND_OVER_H

#include "base/WaitWord.h"

#include <nib/base.h>

#include <atomic>

namespace Nib
{

/// As long as it lives, the wait that the calling thread's signal ends goes on until that thread
/// has left its locks: at the end of this object, or when the thread itself begins a wait. So whom
/// it wakes, on another processor or in its own place, runs into no lock that it holds.
///
/// Objects within an object of the same thread do nothing; only the outermost counts.
class NIB_EXPORT HandOver
{
public:
    HandOver() noexcept;
    ~HandOver();
    HandOver(const HandOver&) = delete;
    HandOver& operator=(const HandOver&) = delete;

    /// The wait of this thread shall set @p left when it has left its section.
    void TellWhenLeft(std::atomic<bool>* left) noexcept { m_left = left; }

    /// The wait of this thread shall spin for a moment before it sleeps.
    void SpinInWait() noexcept;

    /// Whether it did so for nothing.
    bool HasSpunInVain() const noexcept { return m_hasSpunInVain; }

private:
    friend class ConditionalVariable;

    static HandOver* OfThisThread() noexcept;

    void EndLater(WaitWord* word) noexcept;
    void EndNow() noexcept;
    void AfterSectionIsLeft() noexcept;
    void Spin(const WaitWord& word) noexcept;

    WaitWord* m_owed = nullptr;
    std::atomic<bool>* m_left = nullptr;
    bool m_spins = false;
    bool m_hasSpunInVain = false;
};

} // namespace Nib

#endif
