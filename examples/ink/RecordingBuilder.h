#ifndef INK_RECORDING_BUILDER_H
#define INK_RECORDING_BUILDER_H

#include "Recording.h"

namespace Ink
{

/// What a recording may have; beyond it, a file is refused.
inline constexpr std::size_t kMostSamples = 4000000;

/// Collects the samples that a reader finds, and refuses what no recording can hold.
class RecordingBuilder
{
public:
    explicit RecordingBuilder(const std::string& path) : m_path(path) {}

    /// Appends a sample to the current run; one begins where the pen comes down, goes up, or after
    /// Break(). @p line is where it stands in the file. Throws ReadError.
    void Add(const Sample& sample, bool isDown, std::size_t line);

    /// The next sample begins a new run.
    void Break() { m_isBroken = true; }

    /// The whole. Throws ReadError when nothing was written.
    Recording Finish(std::size_t lastLine);

    [[noreturn]] void Fail(std::size_t line, const std::string& problem) const
    {
        throw ReadError(m_path, line == 0 ? 1 : line, problem); // 0: the text has no line at all
    }

private:
    const std::string& m_path;
    Recording m_recording;
    std::size_t m_count = 0;
    bool m_isBroken = true;
    bool m_wasDown = false;
};

/// Sets where the pen leans, in degrees, brought into the ranges of a sample; nothing where one of
/// them is not finite.
void SetLean(Sample& sample, double azimuth, double altitude);

/// Sets the pen's altitude and azimuth from its tilts against the upright, in degrees (W3C Pointer
/// Events, Level 3, "Converting between tiltX/tiltY and altitudeAngle/azimuthAngle").
void SetTilt(Sample& sample, float tiltX, float tiltY);

/// Brings pressures of an unknown range to 0..1 by the greatest one found, when that is above 1.
void ScalePressures(Recording& recording);

} // namespace Ink

#endif
