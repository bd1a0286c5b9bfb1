#ifndef NIB_DEVICE_TEXTUREFORMATS_H
#define NIB_DEVICE_TEXTUREFORMATS_H

#include <nib/device.h>

#include <GLES3/gl3.h>
// The extension header builds on the one before.
#include <GLES2/gl2ext.h>

#include <cstddef>
#include <iterator>

/// @file
/// How the library's texture layouts are said in GL. Indexed by the values, without a range check.

namespace Nib::GLES
{

inline constexpr std::size_t kTargetLayouts = 8;
inline constexpr std::size_t kMemoryLayouts = 17;

// TextureTargetLayout -> GL format
inline constexpr GLenum kTextureFormat[] = {
    GL_RED,             // 0
    GL_RED_INTEGER,     // 1
    GL_RGBA,            // 2
    GL_RED,             // 3
    GL_DEPTH_COMPONENT, // 4
    GL_RGB,             // 5
    GL_LUMINANCE,       // 6
    GL_BGRA_EXT,        // 7
};
static_assert(std::size(kTextureFormat) == kTargetLayouts, "one row per TextureTargetLayout");

// TextureMemoryLayout -> GL internal format
inline constexpr GLenum kTextureInternalFormat[] = {
    GL_R8,                 // 0
    GL_R16UI,              // 1
    GL_R16I,               // 2
    GL_R32UI,              // 3
    GL_R32I,               // 4
    GL_RGB8,               // 5
    GL_RGBA8,              // 6
    GL_R32F,               // 7
    GL_DEPTH_COMPONENT32F, // 8
    GL_RGB32F,             // 9
    GL_RGBA32F,            // 10
    GL_RGB16F,             // 11
    GL_DEPTH_COMPONENT,    // 12
    GL_LUMINANCE,          // 13
    GL_RGBA16F,            // 14
    GL_R16UI,              // 15
    GL_BGRA8_EXT,          // 16
};
static_assert(std::size(kTextureInternalFormat) == kMemoryLayouts,
              "one row per TextureMemoryLayout");

namespace TextureTypeNames
{
inline constexpr GLenum UB = GL_UNSIGNED_BYTE;
inline constexpr GLenum US = GL_UNSIGNED_SHORT;
inline constexpr GLenum S = GL_SHORT;
inline constexpr GLenum UI = GL_UNSIGNED_INT;
inline constexpr GLenum I = GL_INT;
inline constexpr GLenum F = GL_FLOAT;
inline constexpr GLenum HF = GL_HALF_FLOAT;
} // namespace TextureTypeNames

/// The GL type of one pair of layouts, in a struct so that the short names stay inside it.
struct TextureTypeTable
{
    GLenum rows[kTargetLayouts][kMemoryLayouts];
};

constexpr TextureTypeTable MakeTextureTypeTable()
{
    using namespace TextureTypeNames;
    // clang-format off
    return {{
        // 0   1   2  3   4   5   6   7  8  9 10  11  12  13 14  15  16   memory layout
        {UB, US,  S, UI,  I, UB, UB,  F, F, F, F, HF, UI, UB, 0,  F,  0}, // 0
        {UB, US,  S, UI,  I, UB, UB,  F, F, F, F, HF, UI, UB, 0,  0,  0}, // 1
        { 0,  0,  0,  0,  0,  0, UB, UB, F, F, F, HF, UI,  0, F, UB, UB}, // 2
        {UB, US,  S, UI,  I, UB, UB,  F, F, F, F, HF, UI, UB, 0,  0,  0}, // 3
        { 0,  0,  0,  0,  0,  0,  0,  0, F, F, F, HF, UI, UB, 0,  0,  0}, // 4
        { 0,  0,  0,  0,  0,  0, UB, UB, F, F, F, HF, UI, UB, 0,  0,  0}, // 5
        { 0,  0,  0,  0,  0,  0,  0,  0, 0, 0, 0,  0,  0, UB, 0,  0,  0}, // 6
        { 0,  0,  0,  0,  0,  0,  0,  0, 0, 0, 0,  0,  0, UB, 0, UB, UB}, // 7
    }};
    // clang-format on
}

// TextureTargetLayout, TextureMemoryLayout -> GL type; 0 where the pair has none
inline constexpr TextureTypeTable kTextureType = MakeTextureTypeTable();

constexpr GLenum GetTextureFormat(TextureTargetLayout layout)
{
    return kTextureFormat[static_cast<int>(layout)];
}

constexpr GLenum GetTextureInternalFormat(TextureMemoryLayout memoryLayout)
{
    return kTextureInternalFormat[static_cast<int>(memoryLayout)];
}

constexpr GLenum GetTextureType(TextureTargetLayout layout, TextureMemoryLayout memoryLayout)
{
    return kTextureType.rows[static_cast<int>(layout)][static_cast<int>(memoryLayout)];
}

} // namespace Nib::GLES

#endif
