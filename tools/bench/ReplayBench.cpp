#include "bench/ReplayBench.h"

#include "InkSession.h"
#include "Placement.h"
#include "RenderThreads.h"
#include "Replay.h"

#include <cmath>

namespace
{

constexpr int kWidth = 1280;
constexpr int kHeight = 800;
constexpr int kStrokes = 30;
constexpr int kStrokesOfARow = 5;
constexpr int kSamplesOfAStroke = 75; // as many as a tablet reports in half a second

/// Loops in rows, as handwriting has them.
Ink::Recording MadeUpStrokes()
{
    Ink::Recording recording;
    for (int stroke = 0; stroke < kStrokes; ++stroke)
    {
        const int row = stroke / kStrokesOfARow, column = stroke % kStrokesOfARow;
        const float left = 40.0f + 240.0f * static_cast<float>(column);
        const float middle = 90.0f + 125.0f * static_cast<float>(row);
        Ink::Stroke samples;
        for (int i = 0; i < kSamplesOfAStroke; ++i)
        {
            const float share = static_cast<float>(i) / kSamplesOfAStroke;
            const float turn = 25.0f * share;
            Ink::Sample sample;
            sample.time = stroke + 0.5 * static_cast<double>(share);
            sample.x = left + 180.0f * share + 25.0f * std::cos(turn);
            sample.y = middle + 40.0f * std::sin(turn);
            sample.pressure = 0.5f + 0.4f * std::sin(0.5f * turn);
            samples.push_back(sample);
        }
        recording.strokes.push_back(samples);
    }
    return recording;
}

} // namespace

Figures MeasureReplay(Nib::RenderThreadGL& thread, Stopwatch& stopwatch)
{
    const Ink::Recording recording = MadeUpStrokes();
    Ink::InkSession session(thread, kWidth, kHeight, Ink::Colour{1.0f, 1.0f, 1.0f, 1.0f});
    session.AttachScreen();
    session.Present(); // builds the programs
    CheckDrawn(session.Error());

    Pace pace;
    pace.framePerSample = true;
    pace.isWanted = [&stopwatch] { return stopwatch.GoesOn(); };
    Figures all;
    for (stopwatch.Begin(0.35); all.frameTimes.empty() || stopwatch.GoesOn();)
    {
        session.Clear();
        const Figures once = Replay(session, recording, Ink::Placement(), Ink::BrushStyle(), pace);
        all.samples += once.samples;
        all.seconds += once.seconds;
        all.frameTimes.insert(all.frameTimes.end(), once.frameTimes.begin(), once.frameTimes.end());
    }
    CheckDrawn(session.Error());
    return all;
}
