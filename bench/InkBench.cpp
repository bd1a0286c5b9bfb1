// What one sample of the pen costs from its arrival until its frame is on the screen, with each
// brush, on a page of 1280 x 800 pixels: a blank one, and one that holds much ink already. Read the
// rows of one brush as ratios: they should be equal. "items_per_second" is samples a second.
//
// The time is that of a clock, the CPU column that of all threads together, the driver's included.
// A machine that is busy otherwise lengthens the first and leaves the second nearly alone.

#include "BenchThread.h"

#include "InkSession.h"
#include "InkStroke.h"
#include "Recording.h"

#include <string>

namespace
{

constexpr int kWidth = 1280;
constexpr int kHeight = 800;

/// Thirty seconds of painting where they are at hand, else the demo's sample.
const Ink::Recording& Strokes()
{
    static const Ink::Recording recording = []
    {
        const char* const folder = std::getenv("NIB_STROKES");
        return Ink::ReadRecording(folder ? std::string(folder) + "/libmypaint/painting30sec.dat"
                                         : NIB_SAMPLE);
    }();
    return recording;
}

/// Feeds a recording to a session, sample by sample, over and over.
class Writer
{
public:
    Writer(Ink::InkSession& session, Ink::BrushKind kind)
        : m_session(session), m_style(Ink::DefaultStyle(kind)), m_ink(m_style)
    {
    }

    void DrawSample()
    {
        const Ink::Stroke& stroke = Strokes().strokes[m_stroke];
        m_ink.Add(Ink::ToPage(stroke[m_sample], m_placement, m_style));
        const bool isLast = ++m_sample == stroke.size();
        if (isLast)
            m_ink.End();
        m_session.Draw(m_ink.Take());
        if (!isLast)
            return;
        m_ink = Ink::InkStroke(m_style);
        m_sample = 0;
        m_stroke = (m_stroke + 1) % Strokes().strokes.size();
    }

private:
    Ink::InkSession& m_session;
    Ink::BrushStyle m_style;
    Ink::InkStroke m_ink;
    Ink::Placement m_placement = Ink::FitToPage(Strokes(), kWidth, kHeight);
    std::size_t m_stroke = 0;
    std::size_t m_sample = 0;
};

void FrameOfOneSample(benchmark::State& state, Nib::RenderThreadGL& thread, Ink::BrushKind kind)
{
    Ink::InkSession session(thread, kWidth, kHeight, {1.0f, 1.0f, 1.0f, 1.0f});
    session.AttachScreen();
    Writer writer(session, kind);
    for (int i = 0; i < state.range(0); ++i)
    {
        writer.DrawSample();
        session.Present();
    }
    for (auto _ : state)
    {
        writer.DrawSample();
        session.Present();
    }
    state.SetItemsProcessed(state.iterations());
    if (!session.Error().empty())
        state.SkipWithError(session.Error().c_str());
}

} // namespace

int main(int argc, char** argv)
{
    const BenchEnvironment environment(argc, argv);
    const std::unique_ptr<Nib::RenderThreadGL> thread = StartedBenchThread();
    if (!thread)
        return 1;
    const std::pair<const char*, Ink::BrushKind> brushes[] = {
        {"FrameOfOneSample/pen", Ink::BrushKind::Pen},
        {"FrameOfOneSample/marker", Ink::BrushKind::Marker},
        {"FrameOfOneSample/stamp", Ink::BrushKind::Stamp},
    };
    for (const auto& [name, kind] : brushes)
        benchmark::RegisterBenchmark(name, [&thread, brush = kind](benchmark::State& state)
                                     { FrameOfOneSample(state, *thread, brush); })
            ->ArgName("samples on the page")
            ->Arg(0)
            ->Arg(2000)
            ->Arg(20000)
            ->Arg(100000)
            ->Iterations(2000)
            ->UseRealTime()
            ->MeasureProcessCPUTime()
            ->Unit(benchmark::kMicrosecond);
    benchmark::RunSpecifiedBenchmarks();
    return 0;
}
