#ifndef INK_GRAIN_H
#define INK_GRAIN_H

#include <cstdint>
#include <vector>

namespace Ink
{

/// The print of a stick of chalk: a disc that fades towards its rim, with uneven grain, as
/// @p side x @p side pixels of RGBA whose channels are all the coverage. The same at every call.
std::vector<std::uint8_t> GrainPixels(int side);

} // namespace Ink

#endif
