#include "gles/AttributeScanner.h"

namespace Nib::GLES
{

namespace
{

constexpr std::string_view kWord = "attribute";
constexpr std::string_view kWordAndBlank = "attribute ";

// Not <cctype>: shading language text means the same in every locale.
constexpr bool IsLetter(char c)
{
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
}

constexpr bool IsWordCharacter(char c)
{
    return c == '_' || IsLetter(c) || (c >= '0' && c <= '9');
}

} // namespace

std::string_view AttributeScanner::Next()
{
    for (;;)
    {
        const std::size_t found = m_source.find(kWordAndBlank, m_position);
        if (found == std::string_view::npos)
            break;
        m_position = found + kWordAndBlank.size();
        if (!BeginsStatement(found))
            continue;

        const std::size_t type = SkipBlanks(found + kWord.size());
        const std::size_t name = SkipBlanks(SkipWord(type));
        const std::size_t end = SkipWord(name);
        if (end == m_source.size())
            break;
        if (end == name)
            continue;
        m_position = end;
        return m_source.substr(name, end - name);
    }
    m_position = m_source.size();
    return {};
}

// Whether no letter stands between @p position and the end of the statement or line before it.
bool AttributeScanner::BeginsStatement(std::size_t position) const
{
    while (position > 0)
    {
        const char c = m_source[--position];
        if (c == ';' || c == '\n')
            return true;
        if (IsLetter(c))
            return false;
    }
    return true;
}

std::size_t AttributeScanner::SkipBlanks(std::size_t position) const
{
    while (position < m_source.size() && m_source[position] == ' ')
        ++position;
    return position;
}

std::size_t AttributeScanner::SkipWord(std::size_t position) const
{
    while (position < m_source.size() && IsWordCharacter(m_source[position]))
        ++position;
    return position;
}

} // namespace Nib::GLES
