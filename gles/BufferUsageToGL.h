#ifndef NIB_GLES_BUFFER_USAGE_TO_GL_H
#define NIB_GLES_BUFFER_USAGE_TO_GL_H

#include <nib/geometry.h>

#include <GLES3/gl3.h>

#include <iterator>

namespace Nib::GLES
{

// BufferUsage -> GL, indexed by the value, no range check.
inline constexpr GLenum kBufferUsageToGL[] = {
    GL_STREAM_DRAW,  // 0
    GL_STATIC_DRAW,  // 1
    GL_DYNAMIC_DRAW, // 2
};
static_assert(std::size(kBufferUsageToGL) == 3, "one row per BufferUsage");

constexpr GLenum ToGL(BufferUsage usage)
{
    return kBufferUsageToGL[static_cast<int>(usage)];
}

} // namespace Nib::GLES

#endif
