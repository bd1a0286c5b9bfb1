#include "FrameLatency.h"

#include "Percentile.h"

#include <array>
#include <cstdio>
#include <utility>

namespace Ink
{

namespace
{

constexpr Nib::EglTime kPending = -2; // EGL's markers; -1: never to be known
constexpr float kNanosecondsPerMillisecond = 1e6f;
constexpr auto kShown = Nib::EglFrameTime::FrameTimestamp::DisplayPresentTime;

} // namespace

void FrameLatency::BeginFrame(Nib::EglTime event)
{
    if (Nib::EglFrameTime::IsFrameTimestampSupported())
        Add(std::unique_ptr<Nib::EglFrameTime>(Nib::EglFrameTime::GetForNextFrame()), event);
}

void FrameLatency::Add(std::unique_ptr<Nib::EglFrameTime> frame, Nib::EglTime event)
{
    Collect();
    if (frame && frame->IsTimestampSupported(kShown))
        m_pending.push_back({std::move(frame), event});
    if (m_pending.size() > kRemembered)
        m_pending.pop_front();
}

const std::deque<float>& FrameLatency::Times()
{
    Collect();
    return m_times;
}

/// Takes the times of the frames that have been shown. They are shown in their order, so the first
/// one that is not ends it.
void FrameLatency::Collect()
{
    while (!m_pending.empty())
    {
        const Frame& frame = m_pending.front();
        const Nib::EglTime shown = frame.times->GetFrameTimestamp(kShown);
        if (shown == kPending)
            return;
        if (shown > frame.event) // else it is no time, or not of the same clock
            Keep(static_cast<float>(shown - frame.event) / kNanosecondsPerMillisecond);
        m_pending.pop_front();
    }
}

void FrameLatency::Keep(float time)
{
    m_times.push_back(time);
    if (m_times.size() > kKept)
        m_times.pop_front();
}

std::string FrameLatency::Summary()
{
    Collect();
    if (m_times.empty())
        return "event to display: the system tells no times of frames";
    const std::vector<float> times(m_times.begin(), m_times.end());
    std::array<char, 96> line{};
    std::snprintf(line.data(), line.size(),
                  "event to display: p50 %.1f ms, p99 %.1f ms of %zu frames",
                  static_cast<double>(*Percentile(times, 50)),
                  static_cast<double>(*Percentile(times, 99)), times.size());
    return line.data();
}

} // namespace Ink
