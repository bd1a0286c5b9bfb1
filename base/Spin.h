#ifndef NIB_BASE_SPIN_H
#define NIB_BASE_SPIN_H

#include <chrono>

namespace Nib
{

/// Waiting in a loop for a moment, before a sleep. A wake by the system takes longer than most of
/// what threads wait for here.
class Spin
{
public:
    /// Spins as long as @p isWaiting() says so, and no longer than the limit. False at the limit.
    template <typename Condition>
    static bool While(Condition isWaiting)
    {
        for (int turn = 0; turn < kTurnsWithoutClock; ++turn)
        {
            if (!isWaiting())
                return true;
            Relax();
        }
        const Clock::time_point end = Clock::now() + kLimit - kWithoutClock;
        do
        {
            for (int turn = 0; turn < kTurnsBetweenLooks; ++turn)
            {
                if (!isWaiting())
                    return true;
                Relax();
            }
        } while (Clock::now() < end);
        return false;
    }

private:
    using Clock = std::chrono::steady_clock;

    static constexpr std::chrono::microseconds kLimit{20};
    // What the turns before the first look at the clock take at most, at 100 ns each.
    static constexpr std::chrono::microseconds kWithoutClock{3};
    static constexpr int kTurnsWithoutClock = 30;
    static constexpr int kTurnsBetweenLooks = 8;

    /// Tells the processor that this is a loop that waits.
    static void Relax()
    {
#if defined(__x86_64__) || defined(__i386__)
        __builtin_ia32_pause();
#elif defined(__aarch64__) || defined(__arm__)
        __asm__ __volatile__("yield");
#endif
    }
};

} // namespace Nib

#endif
