#include "gles/UniformName.h"

namespace Nib::GLES
{

namespace
{

constexpr std::size_t kMaxBaseLength = 127;

bool EndsWithBracket(std::string_view name)
{
    return !name.empty() && name.back() == ']';
}

// What stands before the last '['; nothing when there is none.
std::string_view BeforeLastBracket(std::string_view name)
{
    const std::size_t bracket = name.rfind('[');
    return name.substr(0, bracket == std::string_view::npos ? 0 : bracket);
}

// Every character counts as a digit; numbers that no index has wrap around.
int32_t ToIndex(std::string_view digits)
{
    uint32_t index = 0;
    for (const char digit : digits)
        index = index * 10 + static_cast<uint32_t>(digit - '0');
    return static_cast<int32_t>(index);
}

} // namespace

UniformName::UniformName(std::string_view name)
    : m_base(EndsWithBracket(name) ? BeforeLastBracket(name) : name),
      m_isElement(EndsWithBracket(name))
{
    if (m_isElement && m_base.size() + 1 < name.size())
        m_index = ToIndex(name.substr(m_base.size() + 1, name.size() - m_base.size() - 2));
    m_base = m_base.substr(0, kMaxBaseLength);
}

bool UniformName::Matches(std::string_view active, int32_t size) const
{
    if (m_isElement && EndsWithBracket(active))
        return BeforeLastBracket(active) == m_base && m_index < size;
    return active == m_base;
}

} // namespace Nib::GLES
