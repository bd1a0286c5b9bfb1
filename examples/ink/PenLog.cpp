#include "PenLog.h"

#include <charconv>
#include <cmath>
#include <string_view>

namespace Ink
{
namespace
{

constexpr std::size_t kFields = 4;

std::string_view SkipBlanks(std::string_view text)
{
    const std::size_t first = text.find_first_not_of(" \t\r");
    return first == std::string_view::npos ? std::string_view() : text.substr(first);
}

/// The numbers of one line; as many as there are, up to one more than a sample has.
std::vector<double> ParseNumbers(const std::string& path, std::size_t line, std::string_view text)
{
    std::vector<double> numbers;
    for (text = SkipBlanks(text); !text.empty(); text = SkipBlanks(text))
    {
        double number = 0.0;
        const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
        const auto length = static_cast<std::size_t>(end - text.data());
        const bool separated = length == text.size() || text.find_first_of(" \t\r") == length;
        if (error != std::errc() || !separated || !std::isfinite(number))
            throw ReadError(path, line, "a number was expected: this is no recording of a pen");
        numbers.push_back(number);
        if (numbers.size() > kFields)
            break;
        text.remove_prefix(length);
    }
    return numbers;
}

Sample ToSample(const std::string& path, std::size_t line, const std::vector<double>& numbers)
{
    if (numbers.size() < kFields)
        throw ReadError(path, line, "the sample is cut short: time, x, y and pressure are needed");
    if (numbers.size() > kFields)
        throw ReadError(path, line, "too many numbers: time, x, y and pressure are needed");
    if (numbers[3] < 0.0 || numbers[3] > 1.0)
        throw ReadError(path, line, "the pressure is not between 0 and 1");
    Sample sample;
    sample.time = numbers[0];
    sample.x = static_cast<float>(numbers[1]);
    sample.y = static_cast<float>(numbers[2]);
    sample.pressure = static_cast<float>(numbers[3]);
    if (!std::isfinite(sample.x) || !std::isfinite(sample.y))
        throw ReadError(path, line, "the position is out of range");
    return sample;
}

} // namespace

Recording ReadPenLog(const std::string& path, const std::string& text)
{
    Recording recording;
    bool penIsDown = false;
    double lastTime = 0.0;
    std::size_t line = 0;
    for (std::string_view rest = text; !rest.empty();)
    {
        ++line;
        const std::size_t end = rest.find('\n');
        if (end == std::string_view::npos)
            throw ReadError(path, line, "the last line is cut short: its end of line is missing");
        const std::vector<double> numbers = ParseNumbers(path, line, rest.substr(0, end));
        rest.remove_prefix(end + 1);
        if (numbers.empty())
            continue;

        const Sample sample = ToSample(path, line, numbers);
        if (line > 1 && sample.time < lastTime)
            throw ReadError(path, line, "the time runs backwards");
        lastTime = sample.time;
        if (sample.pressure > 0.0f)
        {
            if (!penIsDown)
                recording.strokes.emplace_back();
            recording.strokes.back().push_back(sample);
        }
        penIsDown = sample.pressure > 0.0f;
    }
    if (recording.strokes.empty())
        throw ReadError(path, line, "the pen never touches the page");
    return recording;
}

} // namespace Ink
