#ifndef NIB_GLES_TEXTUREPARAMS_H
#define NIB_GLES_TEXTUREPARAMS_H

#include <nib/texture.h>

#include <GLES3/gl3.h>

#include <iterator>
#include <map>

/// @file
/// Sampling parameters: how the library's indices are said in GL. The value of a parameter is an
/// index too and is not checked.

namespace Nib::GLES
{

inline constexpr GLint kClampToBorder = 0x812D; // GL_CLAMP_TO_BORDER, missing in OpenGL ES 3.0

// parameter index -> GL parameter
inline constexpr GLenum kTextureParamName[] = {
    GL_TEXTURE_WRAP_S,     // 0
    GL_TEXTURE_WRAP_T,     // 1
    GL_TEXTURE_WRAP_R,     // 2
    0,                     // 3
    GL_TEXTURE_MAG_FILTER, // 4
    GL_TEXTURE_MIN_FILTER, // 5
};

// wrap value -> GL value
inline constexpr GLint kTextureWrap[] = {
    GL_MIRRORED_REPEAT, // 0
    GL_CLAMP_TO_EDGE,   // 1
    kClampToBorder,     // 2
    GL_REPEAT,          // 3
};

// filter value -> GL value
inline constexpr GLint kTextureFilter[] = {
    GL_NEAREST, // 0
    GL_LINEAR,  // 1
};

/// The GL parameter of an index, 0 above the last one.
constexpr GLenum getGlPname(int index)
{
    const auto row = static_cast<unsigned>(index);
    return row < std::size(kTextureParamName) ? kTextureParamName[row] : 0;
}

constexpr GLint GetTextureParamValue(int index, int value)
{
    return index <= kTextureParamWrapR ? kTextureWrap[value] : kTextureFilter[value];
}

/// What a parameter is on a texture of target index @p target when it was never set.
constexpr int GetTextureParamDefault(int target, int index)
{
    if (index > kTextureParamWrapR)
        return kTextureFilterLinear;
    const bool border = target == kTextureTarget1D && index == kTextureParamWrapS;
    return border ? kTextureWrapClampToBorder : kTextureWrapClampToEdge;
}

} // namespace Nib::GLES

#endif
