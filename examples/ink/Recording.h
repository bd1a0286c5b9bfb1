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
    double time = 0.0;     ///< seconds since the recording began; never decreases within a stroke
    float x = 0.0f;        ///< the recording's own unit, growing to the right
    float y = 0.0f;        ///< the recording's own unit, growing downward
    float pressure = 0.5f; ///< 0 (barely touching) to 1; 0.5 where the recording has none
};

/// What the pen wrote between touching the page and leaving it.
using Stroke = std::vector<Sample>;

/// The strokes of one file, in the order in which they were written.
struct Recording
{
    std::vector<Stroke> strokes;
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

/// Reads @p path, whose format is recognised by its content: W3C InkML, or a pen log of one sample
/// a line (see PenLog.h). Throws ReadError.
Recording ReadRecording(const std::string& path);

} // namespace Ink

#endif
