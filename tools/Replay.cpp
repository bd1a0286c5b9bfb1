#include "Replay.h"

#include "InkStroke.h"

#include <chrono>
#include <thread>

namespace
{

using Clock = std::chrono::steady_clock;

/// Holds the replay back to the recorded times.
class Pacer
{
public:
    Pacer(double speed, double firstTime) : m_speed(speed), m_firstTime(firstTime) {}

    void WaitFor(double time) const
    {
        if (m_speed <= 0.0)
            return;
        const std::chrono::duration<double> offset((time - m_firstTime) / m_speed);
        std::this_thread::sleep_until(m_start +
                                      std::chrono::duration_cast<Clock::duration>(offset));
    }

private:
    double m_speed;
    double m_firstTime;
    Clock::time_point m_start = Clock::now();
};

} // namespace

Figures Replay(Ink::InkSession& session, const Ink::Recording& recording,
               const Ink::Placement& placement, const Ink::BrushStyle& style, const Pace& pace)
{
    const double firstTime = recording.strokes.front().front().time;
    const Pacer pacer(pace.speed, firstTime);
    Figures figures;
    const auto draw = [&](Ink::InkStroke& ink)
    {
        session.Draw(ink.Take());
        if (!pace.framePerSample)
            return;
        session.Present();
        ++figures.frames;
    };
    for (const Ink::Stroke& stroke : recording.strokes)
    {
        ++figures.strokes;
        Ink::InkStroke ink(style);
        for (const Ink::Sample& sample : stroke)
        {
            if (pace.isWanted && !pace.isWanted())
                return figures;
            pacer.WaitFor(sample.time);
            ++figures.samples;
            ink.Add(Ink::ToPage(sample, placement, style));
            if (&sample == &stroke.back())
                ink.End();
            if (pace.framePerSample || pace.afterSample || &sample == &stroke.back())
                draw(ink);
            if (pace.afterSample)
                pace.afterSample(figures.samples);
        }
    }
    return figures;
}
