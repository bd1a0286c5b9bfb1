#ifndef INK_PERCENTILE_H
#define INK_PERCENTILE_H

#include <optional>
#include <vector>

namespace Ink
{

/// The time that @p percent of the frames kept within: the least one for which that holds. Nothing
/// without frames.
std::optional<float> Percentile(std::vector<float> times, double percent);

} // namespace Ink

#endif
