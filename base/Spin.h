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
    using Duration = std::chrono::steady_clock::duration;

    /// What a thread that waits takes from others at most.
    static constexpr Duration kLimit = std::chrono::microseconds(20);

    /// Spins as long as @p isWaiting() says so, and no longer than the limit. False at the limit.
    template <typename Condition>
    static bool While(Condition isWaiting)
    {
        Duration left = kLimit;
        return While(isWaiting, left);
    }

    /// The same with what is @p left of a limit, which becomes less by the time that this took.
    template <typename Condition>
    static bool While(Condition isWaiting, Duration& left)
    {
        for (int turn = 0; turn < kTurnsWithoutClock; ++turn)
        {
            if (!isWaiting())
                return true;
            left -= kTurn;
            Relax();
        }
        Clock::time_point now = Clock::now();
        const Clock::time_point end = now + left;
        do
        {
            for (int turn = 0; turn < kTurnsBetweenLooks; ++turn)
            {
                if (!isWaiting())
                {
                    left = end - now; // to look again would hold up who was waited for
                    return true;
                }
                Relax();
            }
            now = Clock::now();
        } while (now < end);
        left = Duration::zero();
        return false;
    }

private:
    using Clock = std::chrono::steady_clock;

    static constexpr Duration kTurn = std::chrono::nanoseconds(100); // at most
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
