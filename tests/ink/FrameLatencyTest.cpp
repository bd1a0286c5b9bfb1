#include "FrameLatency.h"

#include <gtest/gtest.h>

#include <memory>
#include <vector>

namespace Ink
{
namespace
{

constexpr Nib::EglTime kMillisecond = 1000000;
constexpr Nib::EglTime kNotKnownYet = -2;
constexpr Nib::EglTime kNeverKnown = -1;

/// What a system would tell of a frame; the test changes it.
struct Told
{
    Nib::EglTime shown = kNotKnownYet;
    bool isTold = true;
    int questions = 0;
};

class ToldTime : public Nib::EglFrameTime
{
public:
    explicit ToldTime(Told& told) : m_told(told) {}
    bool IsTimestampSupported(FrameTimestamp timestamp) const override
    {
        return m_told.isTold && timestamp == FrameTimestamp::DisplayPresentTime;
    }
    bool IsCompositorTimingSupported(CompositorTiming) const override { return false; }
    Nib::EglTime GetFrameTimestamp(FrameTimestamp timestamp) const override
    {
        EXPECT_EQ(timestamp, FrameTimestamp::DisplayPresentTime);
        ++m_told.questions;
        return m_told.shown;
    }
    Nib::EglTime GetCompositorTiming(CompositorTiming) const override { return 0; }
    bool SetPresentationTime(Nib::EglTime) const override { return false; }

private:
    Told& m_told;
};

void Add(FrameLatency& latency, Told& told, Nib::EglTime event)
{
    latency.Add(std::make_unique<ToldTime>(told), event);
}

using Milliseconds = std::deque<float>;

TEST(FrameLatency, IsFromTheEventToTheDisplay)
{
    FrameLatency latency;
    Told frame;
    frame.shown = 1024 * kMillisecond + kMillisecond / 2;
    Add(latency, frame, 1000 * kMillisecond);
    EXPECT_EQ(latency.Times(), Milliseconds({24.5f}));
}

TEST(FrameLatency, KeepsItsAccuracyAfterYearsWithoutARestart)
{
    FrameLatency latency;
    Told frame;
    const Nib::EglTime years = 100000000000000000; // 100 million seconds
    frame.shown = years + 8 * kMillisecond;
    Add(latency, frame, years);
    EXPECT_EQ(latency.Times(), Milliseconds({8.0f}));
}

TEST(FrameLatency, WaitsForWhatIsNotKnownYet)
{
    FrameLatency latency;
    Told first, second;
    second.shown = 50 * kMillisecond;
    Add(latency, first, 10 * kMillisecond);
    Add(latency, second, 20 * kMillisecond);
    EXPECT_EQ(latency.Times(), Milliseconds());
    first.shown = 40 * kMillisecond;
    EXPECT_EQ(latency.Times(), Milliseconds({30.0f, 30.0f}));
}

TEST(FrameLatency, AFrameIsCountedOnce)
{
    FrameLatency latency;
    Told frame;
    frame.shown = 40 * kMillisecond;
    Add(latency, frame, 10 * kMillisecond);
    EXPECT_EQ(latency.Times(), Milliseconds({30.0f}));
    EXPECT_EQ(latency.Times(), Milliseconds({30.0f}));
    EXPECT_EQ(frame.questions, 1);
}

TEST(FrameLatency, LeavesOutFramesThatWereNeverShown)
{
    FrameLatency latency;
    Told dropped, refused, shown;
    dropped.shown = kNeverKnown;
    refused.shown = 0;
    shown.shown = 26 * kMillisecond;
    Add(latency, dropped, 10 * kMillisecond);
    Add(latency, refused, 10 * kMillisecond);
    Add(latency, shown, 10 * kMillisecond);
    EXPECT_EQ(latency.Times(), Milliseconds({16.0f}));
}

TEST(FrameLatency, LeavesOutAnEventOfAnotherClock)
{
    FrameLatency latency;
    Told frame;
    frame.shown = 26 * kMillisecond;
    Add(latency, frame, 9000 * kMillisecond);
    EXPECT_EQ(latency.Times(), Milliseconds());
}

TEST(FrameLatency, DoesNotAskAWindowThatTellsNoTimes)
{
    FrameLatency latency;
    Told frame;
    frame.isTold = false;
    frame.shown = 26 * kMillisecond;
    Add(latency, frame, 10 * kMillisecond);
    latency.Add(nullptr, 10 * kMillisecond); // EGL refused
    EXPECT_EQ(latency.Times(), Milliseconds());
    EXPECT_EQ(frame.questions, 0);
}

TEST(FrameLatency, ForgetsAFrameWhenTheSystemDoes)
{
    FrameLatency latency;
    std::vector<Told> frames(9);
    for (Told& frame : frames)
        Add(latency, frame, 10 * kMillisecond);
    for (Told& frame : frames)
        frame.shown = 11 * kMillisecond;
    frames[0].shown = 99 * kMillisecond;
    EXPECT_EQ(latency.Times(), Milliseconds(8, 1.0f));
}

TEST(FrameLatency, ForgetsWhatIsUnknownWhenTheWindowGoes)
{
    FrameLatency latency;
    Told shown, unknown;
    shown.shown = 26 * kMillisecond;
    Add(latency, shown, 10 * kMillisecond);
    Add(latency, unknown, 10 * kMillisecond); // takes up the time of the first
    latency.Forget();
    unknown.shown = 26 * kMillisecond;
    EXPECT_EQ(latency.Times(), Milliseconds({16.0f}));
}

TEST(FrameLatency, KeepsTheLastThousand)
{
    FrameLatency latency;
    Told frame;
    for (int i = 1; i <= 1001; ++i)
    {
        frame.shown = i * kMillisecond;
        Add(latency, frame, 0);
        static_cast<void>(latency.Times());
    }
    EXPECT_EQ(latency.Times().size(), 1000u);
    EXPECT_EQ(latency.Times().front(), 2.0f);
}

TEST(FrameLatency, TellsTheMedianAndTheSlowestHundredth)
{
    FrameLatency latency;
    Told frame;
    for (int i = 1; i <= 200; ++i)
    {
        frame.shown = i * kMillisecond;
        Add(latency, frame, 0);
        static_cast<void>(latency.Times());
    }
    EXPECT_EQ(latency.Summary(), "event to display: p50 100.0 ms, p99 198.0 ms of 200 frames");
}

TEST(FrameLatency, SaysThatNothingIsKnown)
{
    EXPECT_EQ(FrameLatency().Summary(), "event to display: the system tells no times of frames");
}

} // namespace
} // namespace Ink
