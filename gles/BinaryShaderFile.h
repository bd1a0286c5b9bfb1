#ifndef NIB_GLES_BINARY_SHADER_FILE_H
#define NIB_GLES_BINARY_SHADER_FILE_H

#include <nib/shader_cache.h>

#include <cstddef>
#include <cstdint>

namespace Nib
{

/// The first 40 bytes of a binary shader file, little-endian; docs/shader-cache-file.md has the
/// whole.
struct BinaryShaderHeader
{
    std::uint64_t magic;
    std::uint64_t format;
    std::uint64_t programLength;
    std::uint64_t attributeSize; ///< bytes of the names, each with its NUL
    std::uint64_t attributeCount;
};
static_assert(sizeof(BinaryShaderHeader) == 40, "read and written as it stands");
static_assert(__BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__, "the integers of the file are the host's");

inline constexpr std::uint64_t kBinaryShaderMagic = 0xACDCACDC;
inline constexpr std::uint64_t kLongestProgram = 1000000;   ///< bytes; more is not read
inline constexpr std::uint64_t kLargestAttributes = 100000; ///< bytes; more is not read

BinaryShaderHeader MakeHeader(const ShaderProgramCache::BinaryShader& shader);

/// Writes @p shader as a file of its own, in one open file.
/// @return whether the system took every byte
bool WriteBinaryShader(File& file, const ShaderProgramCache::BinaryShader& shader);

} // namespace Nib

#endif
