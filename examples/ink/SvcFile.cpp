#include "SvcFile.h"

#include "RecordingBuilder.h"
#include "TextLines.h"

#include <cmath>

namespace Ink
{
namespace
{

constexpr std::size_t kFields = 7;

bool NextLineWithContent(TextLines& lines)
{
    while (lines.Next())
        if (!lines.Line().empty())
            return true;
    return false;
}

Sample ToSample(const std::vector<double>& numbers)
{
    Sample sample;
    sample.x = static_cast<float>(numbers[0]);
    sample.y = static_cast<float>(-numbers[1]);
    sample.time = numbers[2];
    SetLean(sample, numbers[4] / 10.0, numbers[5] / 10.0);
    sample.pressure = static_cast<float>(numbers[6]);
    return sample;
}

void MillisecondsToSeconds(std::vector<Stroke>& runs)
{
    for (Stroke& run : runs)
        for (Sample& sample : run)
            sample.time /= 1000.0;
}

} // namespace

Recording ReadSvcFile(const std::string& path, const std::string& text)
{
    RecordingBuilder builder(path);
    std::vector<double> numbers;
    TextLines lines(text);
    NextLineWithContent(lines);
    if (!ParseNumbers(lines.Line(), " \t", 1, numbers) || numbers.empty())
        builder.Fail(lines.Number(), "the number of samples was expected");
    const double stated = numbers[0];

    double count = 0.0;
    double lastTime = 0.0;
    bool areWholeTimes = true;
    while (NextLineWithContent(lines))
    {
        if (!ParseNumbers(lines.Line(), " \t", kFields, numbers) || numbers.size() < kFields)
            builder.Fail(lines.Number(),
                         "seven numbers were expected: x, y, time, pen down, azimuth, altitude, "
                         "pressure");
        if (numbers[3] != 0.0 && numbers[3] != 1.0)
            builder.Fail(lines.Number(), "pen down is neither 0 nor 1");
        if (numbers[6] < 0.0)
            builder.Fail(lines.Number(), "the pressure is negative");
        if (count > 0.0 && numbers[2] < lastTime)
            builder.Fail(lines.Number(), "the time runs backwards");
        lastTime = numbers[2];
        areWholeTimes = areWholeTimes && lastTime == std::floor(lastTime);
        builder.Add(ToSample(numbers), numbers[3] == 1.0, lines.Number());
        count += 1.0;
    }
    if (count < stated)
        builder.Fail(lines.Number(), "cut short: fewer samples than the first line says");
    Recording recording = builder.Finish(lines.Number());
    if (areWholeTimes)
    {
        MillisecondsToSeconds(recording.strokes);
        MillisecondsToSeconds(recording.hovers);
    }
    ScalePressures(recording);
    return recording;
}

} // namespace Ink
