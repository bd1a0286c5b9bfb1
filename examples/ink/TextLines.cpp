#include "TextLines.h"

#include <charconv>
#include <cmath>

namespace Ink
{
namespace
{

constexpr std::string_view kBlanks = " \t\r";

std::string_view Trimmed(std::string_view text)
{
    const std::size_t first = text.find_first_not_of(kBlanks);
    if (first == std::string_view::npos)
        return {};
    return text.substr(first, text.find_last_not_of(kBlanks) - first + 1);
}

} // namespace

bool TextLines::Next()
{
    if (m_rest.empty())
        return false;
    const std::size_t end = m_rest.find('\n');
    m_hasEnd = end != std::string_view::npos;
    m_line = Trimmed(m_rest.substr(0, end));
    m_rest = m_hasEnd ? m_rest.substr(end + 1) : std::string_view();
    ++m_number;
    return true;
}

bool ParseNumbers(std::string_view line, std::string_view separators, std::size_t most,
                  std::vector<double>& numbers)
{
    numbers.clear();
    while (true)
    {
        const std::size_t first = line.find_first_not_of(separators);
        if (first == std::string_view::npos)
            return true;
        line.remove_prefix(first);
        double number = 0.0;
        const auto [end, error] = std::from_chars(line.data(), line.data() + line.size(), number);
        const auto length = static_cast<std::size_t>(end - line.data());
        const bool isWhole =
            length == line.size() || separators.find(line[length]) != std::string_view::npos;
        if (error != std::errc() || !isWhole || !std::isfinite(number) || numbers.size() == most)
            return false;
        numbers.push_back(number);
        line.remove_prefix(length);
    }
}

} // namespace Ink
