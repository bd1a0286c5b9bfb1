#ifndef INK_RECORDING_H
#define INK_RECORDING_H

#include <cstddef>
#include <stdexcept>
#include <string>
#include <vector>

namespace Ink
{

/// One report of the pen.
struct Sample
{
    double time = 0.0;      ///< seconds since some moment; never decreases within a recording
    float x = 0.0f;         ///< the recording's own unit, growing to the right
    float y = 0.0f;         ///< the recording's own unit, growing downward
    float pressure = 0.5f;  ///< 0 (barely touching) to 1; 0.5 where the recording has none
    float altitude = 90.0f; ///< degrees between pen and page: 90 upright, 0 flat
    float azimuth =
        0.0f; ///< degrees, 0 to 360, from the page's right, clockwise: where the pen leans
};

/// A run of samples without a gap.
using Stroke = std::vector<Sample>;

/// What one file holds.
struct Recording
{
    std::vector<Stroke> strokes; ///< what the pen wrote, in order; each has at least one sample
    std::vector<Stroke> hovers;  ///< how it moved above the page, where the recording tells
};

/// A file that is not a recording, or not a whole one. what() is "FILE:LINE: what is wrong".
class ReadError : public std::runtime_error
{
public:
    ReadError(const std::string& file, std::size_t line, const std::string& problem)
        : std::runtime_error(file + ":" + std::to_string(line) + ": " + problem)
    {
    }
};

/// Reads @p path, whose format is recognised by its content. Throws ReadError. The formats:
/// - W3C InkML (InkMl.h), the one that may hold no stroke;
/// - a pen log, one sample a line (PenLog.h);
/// - tablet samples behind their count (SvcFile.h);
/// - JSON, of pointer events or of named lists of points (InkJson.h);
/// - strokes between the words START and BREAK (StrokeList.h).
/// A file may have 128 MiB and 4,000,000 samples; InkML 64 MiB, 500,000 tags and as many attributes.
/// Reading takes less than 512 MiB of memory, and time in proportion to the size of the file.
Recording ReadRecording(const std::string& path);

} // namespace Ink

#endif
