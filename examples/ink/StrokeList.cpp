#include "StrokeList.h"

#include "RecordingBuilder.h"
#include "TextLines.h"

#include <algorithm>

namespace Ink
{

Recording ReadStrokeList(const std::string& path, const std::string& text)
{
    RecordingBuilder builder(path);
    std::vector<double> numbers;
    double time = 0.0;
    bool isOpen = false;
    TextLines lines(text);
    while (lines.Next())
    {
        const std::string_view line = lines.Line();
        if (line.empty() || line == "START")
            continue;
        if (line == "BREAK")
        {
            builder.Break();
            isOpen = false;
            continue;
        }
        if (!ParseNumbers(line, ", \t", 3, numbers) || numbers.size() < 3)
            builder.Fail(lines.Number(), "three numbers were expected: x, y and time");
        Sample sample;
        sample.x = static_cast<float>(numbers[0]);
        sample.y = static_cast<float>(-numbers[1]);
        sample.time = time = std::max(time, numbers[2] / 1000.0);
        builder.Add(sample, true, lines.Number());
        isOpen = true;
    }
    if (isOpen)
        builder.Fail(lines.Number(), "cut short: the last stroke has no BREAK");
    return builder.Finish(lines.Number());
}

} // namespace Ink
