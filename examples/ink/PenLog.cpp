#include "PenLog.h"

#include "RecordingBuilder.h"
#include "TextLines.h"

namespace Ink
{
namespace
{

constexpr std::size_t kFields = 4;

Sample ToSample(const RecordingBuilder& builder, std::size_t line,
                const std::vector<double>& numbers)
{
    if (numbers.size() < kFields)
        builder.Fail(line, "the sample is cut short: time, x, y and pressure are needed");
    if (numbers[3] < 0.0 || numbers[3] > 1.0)
        builder.Fail(line, "the pressure is not between 0 and 1");
    Sample sample;
    sample.time = numbers[0];
    sample.x = static_cast<float>(numbers[1]);
    sample.y = static_cast<float>(numbers[2]);
    sample.pressure = static_cast<float>(numbers[3]);
    return sample;
}

} // namespace

Recording ReadPenLog(const std::string& path, const std::string& text)
{
    RecordingBuilder builder(path);
    std::vector<double> numbers;
    bool isFirst = true;
    double lastTime = 0.0;
    TextLines lines(text);
    while (lines.Next())
    {
        if (!lines.HasEnd())
            builder.Fail(lines.Number(), "the last line is cut short: its end of line is missing");
        if (!ParseNumbers(lines.Line(), " \t", kFields, numbers))
            builder.Fail(lines.Number(),
                         "four numbers were expected: this is no recording of a pen");
        if (numbers.empty())
            continue;
        const Sample sample = ToSample(builder, lines.Number(), numbers);
        if (!isFirst && sample.time < lastTime)
            builder.Fail(lines.Number(), "the time runs backwards");
        isFirst = false;
        lastTime = sample.time;
        builder.Add(sample, sample.pressure > 0.0f, lines.Number());
    }
    return builder.Finish(lines.Number());
}

} // namespace Ink
