#include "RecordingBuilder.h"

#include <algorithm>
#include <cmath>

namespace Ink
{
namespace
{

constexpr float kDegree = 3.14159265f / 180.0f;

template <typename Visit>
void ForEachSample(Recording& recording, Visit visit)
{
    for (std::vector<Stroke>* runs : {&recording.strokes, &recording.hovers})
        for (Stroke& run : *runs)
            std::for_each(run.begin(), run.end(), visit);
}

} // namespace

void RecordingBuilder::Add(const Sample& sample, bool isDown, std::size_t line)
{
    if (!std::isfinite(sample.x) || !std::isfinite(sample.y) || !std::isfinite(sample.time) ||
        !std::isfinite(sample.pressure))
        Fail(line, "a value of the sample is out of range");
    if (++m_count > kMostSamples)
        Fail(line, "more than 4000000 samples");
    std::vector<Stroke>& runs = isDown ? m_recording.strokes : m_recording.hovers;
    if (m_isBroken || isDown != m_wasDown)
        runs.emplace_back();
    runs.back().push_back(sample);
    m_isBroken = false;
    m_wasDown = isDown;
}

Recording RecordingBuilder::Finish(std::size_t lastLine)
{
    if (m_recording.strokes.empty())
        Fail(lastLine, "the pen never touches the page");
    return std::move(m_recording);
}

void SetTilt(Sample& sample, float tiltX, float tiltY)
{
    if (!(std::abs(tiltX) <= 90.0f) || !(std::abs(tiltY) <= 90.0f) || (tiltX == 0 && tiltY == 0))
        return; // upright, or not known
    const float tanX = std::tan(tiltX * kDegree);
    const float tanY = std::tan(tiltY * kDegree);
    const float azimuth = std::atan2(tanY, tanX) / kDegree;
    sample.azimuth = azimuth < 0.0f ? azimuth + 360.0f : azimuth;
    sample.altitude = std::atan(1.0f / std::hypot(tanX, tanY)) / kDegree;
}

void ScalePressures(Recording& recording)
{
    float greatest = 1.0f;
    ForEachSample(recording,
                  [&](const Sample& sample) { greatest = std::max(greatest, sample.pressure); });
    ForEachSample(recording, [&](Sample& sample)
                  { sample.pressure = std::clamp(sample.pressure / greatest, 0.0f, 1.0f); });
}

} // namespace Ink
