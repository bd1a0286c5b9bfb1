#ifndef INK_TEXT_LINES_H
#define INK_TEXT_LINES_H

#include <cstddef>
#include <string_view>
#include <vector>

namespace Ink
{

/// Walks through the lines of a text.
class TextLines
{
public:
    explicit TextLines(std::string_view text) : m_rest(text) {}

    /// Goes to the next line; false at the end of the text.
    bool Next();

    std::string_view Line() const { return m_line; } ///< without its end, and blanks around it
    std::size_t Number() const { return m_number; }  ///< from 1; 0 before the first
    bool HasEnd() const { return m_hasEnd; }         ///< false for a last line without line end

private:
    std::string_view m_rest;
    std::string_view m_line;
    std::size_t m_number = 0;
    bool m_hasEnd = true;
};

/// Reads the numbers of @p line between @p separators into @p numbers. False when something else
/// stands there, when a number is not finite, or when there are more than @p most.
bool ParseNumbers(std::string_view line, std::string_view separators, std::size_t most,
                  std::vector<double>& numbers);

} // namespace Ink

#endif
