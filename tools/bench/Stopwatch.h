#ifndef NIB_TOOLS_BENCH_STOPWATCH_H
#define NIB_TOOLS_BENCH_STOPWATCH_H

#include "Progress.h"

#include <chrono>

/// Shares the time of a run out among what it measures, and shows how much of it is over.
class Stopwatch
{
public:
    using Clock = std::chrono::steady_clock;
    using Microseconds = std::chrono::duration<float, std::micro>;

    explicit Stopwatch(double seconds)
        : m_seconds(seconds), m_progress(static_cast<int>(seconds * 1000.0))
    {
    }

    /// Begins a measurement that takes @p share of the time, 0 to 1.
    void Begin(double share)
    {
        m_end = Clock::now() + std::chrono::duration_cast<Clock::duration>(
                                   std::chrono::duration<double>(m_seconds * share));
    }

    /// Whether the measurement that was begun is to go on.
    bool GoesOn()
    {
        const Clock::time_point now = Clock::now();
        m_progress.Show(static_cast<int>(
            std::chrono::duration_cast<std::chrono::milliseconds>(now - m_start).count()));
        return now < m_end;
    }

    static float Since(Clock::time_point start)
    {
        return Microseconds(Clock::now() - start).count();
    }

private:
    double m_seconds;
    Progress m_progress;
    Clock::time_point m_start = Clock::now();
    Clock::time_point m_end = m_start;
};

#endif
