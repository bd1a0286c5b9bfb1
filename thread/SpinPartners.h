#ifndef NIB_THREAD_SPIN_PARTNERS_H
#define NIB_THREAD_SPIN_PARTNERS_H

#include <nib/base.h>

#include <atomic>
#include <cstdint>

namespace Nib
{

/// A worker and its latest synchronous caller: whether one of them gains when it spins while the
/// other one works. Not when both may only run on one and the same processor. The system is asked
/// when the caller is another one, when a spin was in vain, and now and then.
class SpinPartners
{
public:
    /// False with NIB_SPIN=0 in the environment of the first use.
    static bool IsOn();

    /// Whether the system may run these two threads at the same time; when not, the one that spins
    /// keeps the other from what it waits for. Takes the system's numbers; 0 is the calling thread.
    static bool CanRunTogether(std::uint64_t one, std::uint64_t other);

    bool WorkerMaySpin() const; ///< worker's thread; false before the first call
    void WorkerSpunInVain();    ///< worker's thread
    void CallerSpunInVain();    ///< one caller at a time

    /// One caller at a time; takes the system's number of the worker.
    bool CallerMaySpin(const std::atomic<std::uint64_t>& worker);

private:
    static constexpr int kCallsBetweenLooks = 256;
    static constexpr int kSleepsBetweenLooks = 16;

    // Relaxed, both: nothing is published by them, and an old value costs one spin or one sleep.
    std::atomic<bool> m_maySpin{false};
    std::atomic<std::uint64_t> m_callerNumber{0}; // the system's

    Thread::Handle m_caller = 0;
    int m_callsUntilLook = 0;
};

} // namespace Nib

#endif
