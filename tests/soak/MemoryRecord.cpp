#include "MemoryRecord.h"

#include <algorithm>

namespace Soak
{

namespace
{

constexpr std::size_t kWindow = 9;  ///< rounds of a median
constexpr std::size_t kFewest = 30; ///< rounds, below which nothing is judged

} // namespace

bool MemoryRecord::CanBeJudged() const
{
    return m_kib.size() >= kFewest && m_kib.back() != 0; // 0 under a sanitizer
}

long MemoryRecord::Begin() const
{
    return Median(m_kib.size() / 3);
}

long MemoryRecord::End() const
{
    return Median(m_kib.size() - kWindow);
}

bool MemoryRecord::IsFlat() const
{
    return End() <= Begin() + Begin() / 100;
}

std::string MemoryRecord::Text() const
{
    if (!CanBeJudged())
        return "memory not judged";
    return "memory " + std::to_string(Begin()) + " KiB behind the warm-up, " +
           std::to_string(End()) + " KiB at the end";
}

long MemoryRecord::Median(std::size_t from) const
{
    std::vector<long> some(m_kib.begin() + static_cast<std::ptrdiff_t>(from),
                           m_kib.begin() + static_cast<std::ptrdiff_t>(from + kWindow));
    std::nth_element(some.begin(), some.begin() + kWindow / 2, some.end());
    return some[kWindow / 2];
}

} // namespace Soak
