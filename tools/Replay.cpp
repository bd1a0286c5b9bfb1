#include "Replay.h"

#include "InkStroke.h"

#include <chrono>
#include <thread>
#include <utility>

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

/// A replay while it runs.
class Replayer
{
public:
    Replayer(Ink::InkSession& session, const Pace& pace, double firstTime)
        : m_session(session), m_pace(pace), m_pacer(pace.speed, firstTime)
    {
    }

    /// False when the rest is not wanted.
    bool DrawStroke(const Ink::Stroke& stroke, const Ink::Placement& placement,
                    const Ink::BrushStyle& style);

    Figures Finish();

private:
    void ShowFrame(Ink::InkStroke& ink);
    void DrawUnseen(Ink::InkStroke& ink, bool isWhole);

    Ink::InkSession& m_session;
    const Pace& m_pace;
    Pacer m_pacer;
    Figures m_figures;
    Clock::time_point m_start = Clock::now();
};

bool Replayer::DrawStroke(const Ink::Stroke& stroke, const Ink::Placement& placement,
                          const Ink::BrushStyle& style)
{
    ++m_figures.strokes;
    Ink::InkStroke ink(style);
    for (const Ink::Sample& sample : stroke)
    {
        if (m_pace.isWanted && !m_pace.isWanted())
            return false;
        m_pacer.WaitFor(sample.time);
        ++m_figures.samples;
        const bool isWhole = &sample == &stroke.back();
        ink.Add(Ink::ToPage(sample, placement, style));
        if (isWhole)
            ink.End();
        m_pace.framePerSample ? ShowFrame(ink) : DrawUnseen(ink, isWhole);
        if (m_pace.loseContextEvery != 0 && m_figures.samples % m_pace.loseContextEvery == 0)
            m_session.LoseContext();
        if (m_pace.afterSample)
            m_pace.afterSample(m_figures.samples);
    }
    return true;
}

void Replayer::ShowFrame(Ink::InkStroke& ink)
{
    const Clock::time_point start = Clock::now();
    m_session.Draw(ink.Take());
    m_session.Present();
    const std::chrono::duration<float, std::milli> time = Clock::now() - start;
    m_figures.frameTimes.push_back(time.count());
    ++m_figures.frames;
}

/// Without frames, ink is handed over in larger pieces; now and then the render thread catches up,
/// so that what is under way never fills the memory.
void Replayer::DrawUnseen(Ink::InkStroke& ink, bool isWhole)
{
    constexpr int kSamplesAPiece = 256;
    constexpr int kSamplesUnderWay = 32 * kSamplesAPiece;
    const bool losesContext = m_pace.loseContextEvery != 0;
    if (isWhole || losesContext || m_figures.samples % kSamplesAPiece == 0)
        m_session.Draw(ink.Take());
    if (m_figures.samples % kSamplesUnderWay == 0)
        m_session.Wait();
}

Figures Replayer::Finish()
{
    m_session.Wait();
    m_figures.seconds = std::chrono::duration<double>(Clock::now() - m_start).count();
    return std::move(m_figures);
}

} // namespace

Figures Replay(Ink::InkSession& session, const Ink::Recording& recording,
               const Ink::Placement& placement, const Ink::BrushStyle& style, const Pace& pace)
{
    const bool isEmpty = recording.strokes.empty();
    Replayer replayer(session, pace, isEmpty ? 0.0 : recording.strokes.front().front().time);
    for (const Ink::Stroke& stroke : recording.strokes)
        if (!replayer.DrawStroke(stroke, placement, style))
            break;
    return replayer.Finish();
}

int SampleCount(const Ink::Recording& recording)
{
    std::size_t count = 0;
    for (const Ink::Stroke& stroke : recording.strokes)
        count += stroke.size();
    return static_cast<int>(count);
}
