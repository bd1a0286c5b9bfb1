#include "Percentile.h"

#include <algorithm>
#include <cmath>
#include <cstddef>

namespace Ink
{

std::optional<float> Percentile(std::vector<float> times, double percent)
{
    if (times.empty())
        return std::nullopt;
    const double rank = std::ceil(percent / 100.0 * static_cast<double>(times.size()));
    const auto index = static_cast<std::ptrdiff_t>(std::max(rank, 1.0)) - 1;
    std::nth_element(times.begin(), times.begin() + index, times.end());
    return times[static_cast<std::size_t>(index)];
}

} // namespace Ink
