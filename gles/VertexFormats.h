#ifndef NIB_GLES_VERTEXFORMATS_H
#define NIB_GLES_VERTEXFORMATS_H

#include <nib/geometry.h>

#include <GLES3/gl3.h>

#include <iterator>

/// @file
/// How the layouts of vertex buffers are said in GL. Indexed by the values, without a range check.

namespace Nib::GLES
{

// VertexDescriptor::AttributeType -> bytes of one component
inline constexpr int aAttributeByteSizes[] = {
    1, // 0
    2, // 1
    4, // 2
    4, // 3
    4, // 4
    8, // 5
};

// VertexDescriptor::AttributeType -> GL type
inline constexpr GLenum kAttributeType[] = {
    GL_BYTE,         // 0
    GL_SHORT,        // 1
    GL_INT,          // 2
    GL_FLOAT,        // 3
    GL_UNSIGNED_INT, // 4
    0,               // 5: has a size only
};
static_assert(std::size(aAttributeByteSizes) == std::size(kAttributeType),
              "both have one row per AttributeType");

// BufferUsage -> GL usage
inline constexpr GLenum kBufferUsage[] = {
    GL_STREAM_DRAW,  // 0
    GL_STATIC_DRAW,  // 1
    GL_DYNAMIC_DRAW, // 2
};

constexpr GLenum GetAttributeType(VertexDescriptor::AttributeType type)
{
    return kAttributeType[static_cast<int>(type)];
}

constexpr GLenum GetBufferUsage(BufferUsage usage)
{
    return kBufferUsage[static_cast<int>(usage)];
}

} // namespace Nib::GLES

#endif
