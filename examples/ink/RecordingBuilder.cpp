#include "RecordingBuilder.h"

#include <algorithm>
#include <cmath>

namespace Ink
{
namespace
{

constexpr double kDegree = 3.14159265358979323846 / 180.0;

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

void SetLean(Sample& sample, double azimuth, double altitude)
{
    if (!std::isfinite(azimuth) || !std::isfinite(altitude))
        return;
    const double rest = std::fmod(azimuth, 360.0);
    sample.azimuth = static_cast<float>(rest < 0.0 ? rest + 360.0 : rest);
    sample.altitude = static_cast<float>(std::clamp(altitude, 0.0, 90.0));
}

void SetTilt(Sample& sample, float tiltX, float tiltY)
{
    if (!(std::abs(tiltX) <= 90.0f) || !(std::abs(tiltY) <= 90.0f) || (tiltX == 0 && tiltY == 0))
        return; // upright, or not known
    // In double: there, the tangent of 90 degrees has the right sign.
    const double tanX = std::tan(tiltX * kDegree);
    const double tanY = std::tan(tiltY * kDegree);
    SetLean(sample, std::atan2(tanY, tanX) / kDegree,
            std::atan(1.0 / std::hypot(tanX, tanY)) / kDegree);
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
