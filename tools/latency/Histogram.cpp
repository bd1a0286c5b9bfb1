#include "latency/Histogram.h"

#include "Percentile.h"

#include <algorithm>
#include <cmath>

namespace
{

constexpr float kMostBins = 60.0f;

/// The least of 1, 2, 5 times a power of ten that is not below @p width.
float RoundWidth(float width)
{
    const float power = std::pow(10.0f, std::floor(std::log10(width)));
    for (const float factor : {1.0f, 2.0f, 5.0f})
        if (factor * power >= width * 0.9999f)
            return factor * power;
    return 10.0f * power;
}

} // namespace

Histogram::Histogram(const std::vector<LatencySeries>& series)
{
    float reach = 0.001f;
    for (const LatencySeries& one : series)
        reach = std::max(reach, Ink::Percentile(one.times, 99).value_or(0.0f));
    m_binWidth = RoundWidth(reach / kMostBins);
    m_binCount = static_cast<int>(reach / m_binWidth) + 1;
    for (const LatencySeries& one : series)
    {
        std::vector<int>& counts = m_counts.emplace_back(m_binCount);
        for (const float time : one.times)
            ++counts[static_cast<std::size_t>(
                std::clamp(static_cast<int>(time / m_binWidth), 0, m_binCount - 1))];
        m_largest = std::max(m_largest, *std::max_element(counts.begin(), counts.end()));
    }
}
