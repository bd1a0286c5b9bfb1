#ifndef NIB_GLES_CRC32_H
#define NIB_GLES_CRC32_H

#include <cstddef>
#include <cstdint>

namespace Nib
{

/// Continues a CRC-32, as zlib's crc32() has it, over @p size bytes. Start with 0.
std::uint64_t ContinueCrc(std::uint64_t crc, const void* data, std::size_t size);

} // namespace Nib

#endif
