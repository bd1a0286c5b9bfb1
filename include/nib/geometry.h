#ifndef NIB_GEOMETRY_H
#define NIB_GEOMETRY_H

/// @file
/// Meshes: vertex layouts, vertex and index buffers, drawing.

#include <nib/export.h>

#include <cstdint>

namespace Nib
{

/// How the contents of a GL buffer will be used. A value outside the list is not checked for.
enum class BufferUsage : int
{
    Stream = 0,  ///< GL_STREAM_DRAW: written once, drawn a few times
    Static = 1,  ///< GL_STATIC_DRAW: written once, drawn often
    Dynamic = 2, ///< GL_DYNAMIC_DRAW: written and drawn often
};

/// What a mesh's vertices make up; the values are GL's own and reach it unchanged.
enum class PrimitiveType : int
{
    Points = 0,
    Lines = 1,
    LineLoop = 2,
    LineStrip = 3,
    Triangles = 4,
    TriangleStrip = 5,
    TriangleFan = 6,
};

/// The layout of one vertex buffer: its interleaved attributes and its GL usage. A plain value.
///
/// The attributes of a mesh get the locations 0, 1, 2 ... in buffer order and, within a buffer, in
/// the order in which they were added; shader programs declare theirs at those locations. A buffer
/// that is drawn has at most 4 attributes, although a descriptor holds 8.
class NIB_EXPORT VertexDescriptor
{
public:
    /// The type of one component of an attribute.
    enum class AttributeType : int
    {
        Byte = 0,        ///< GL_BYTE, 1 byte
        Short = 1,       ///< GL_SHORT, 2 bytes
        Int = 2,         ///< GL_INT, 4 bytes
        Float = 3,       ///< GL_FLOAT, 4 bytes
        UnsignedInt = 4, ///< GL_UNSIGNED_INT, 4 bytes
        EightByte = 5,   ///< 8 bytes; counts in offsets and strides, but GL has no type for it
    };

    static constexpr int kMaxAttributes = 8; ///< what a descriptor holds
    static constexpr int kPacked = -1;       ///< the offset right behind the attributes present

    /// Appends one attribute, and makes its end the stride: attributes that are added with explicit
    /// offsets are therefore added in the order of their offsets.
    /// @param components  1 to 4
    /// @param offset      bytes from the start of the vertex, or kPacked
    /// @param divisor     0: one value a vertex; n: one value for n instances (DrawInstanced only)
    /// @throws InvalidArgumentException when there are 8 attributes already
    void addAttribute(AttributeType type, int components, int offset = kPacked, int divisor = 0);

    /// Where the attribute that was added last ends, in bytes; 0 without attributes.
    std::uint64_t calculateAttributeSize();

    std::uint64_t size() const; ///< the stored stride, bytes a vertex
    int numAtributes() const;   ///< 0 to 8

    /// @name One attribute, by its index within the buffer
    /// @throws InvalidArgumentException when @p i is not below the number of attributes
    /// @{
    AttributeType attributeType(int i) const; ///< what its components are
    int attributeSize(int i) const;           ///< number of components
    int attributeOffset(int i) const;         ///< bytes from the start of the vertex
    /// @}

    std::int32_t count = 0;                       ///< attributes in use
    std::int32_t components[kMaxAttributes] = {}; ///< components of each
    std::int32_t offsets[kMaxAttributes] = {};    ///< bytes from the start of the vertex
    AttributeType types[kMaxAttributes] = {};     ///< component type of each
    std::uint64_t stride = 0;                     ///< bytes a vertex
    BufferUsage usage = BufferUsage::Dynamic;     ///< set by the caller; there is no setter
    std::int32_t divisors[kMaxAttributes] = {};   ///< instances a value lasts; 0: per vertex
};

/// A drawable mesh: up to 15 vertex buffers, each with its layout, and an optional index buffer.
///
/// Owner    the caller, from the renderer factory; ended by Release(), never by delete.
/// Threads  the GL thread that made it, with its context current.
/// Loss     after a context was lost and made anew, the buffers have their old sizes and no
///          contents: fill them again with UpdateBuffer and UpdateIndexes.
/// State    draws bind buffers and enable attribute arrays; which of them stay enabled is said
///          below.
class NIB_EXPORT IGraphicsObject
{
public:
    virtual ~IGraphicsObject() = default;

    /// Replaces the contents of vertex buffer @p index.
    /// @param data         @p vertexCount vertices in the buffer's layout, copied; may be null
    /// @throws InvalidArgumentException when there is no such buffer
    virtual void UpdateBuffer(unsigned int index, const void* data, unsigned int vertexCount) = 0;

    /// Replaces the indices, and makes the index buffer when there is none yet.
    /// @param data   @p count 32-bit indices, copied. A device that draws 16-bit indices only keeps
    ///               the low 16 bits of each, unchecked.
    virtual void UpdateIndexes(const void* data, unsigned int count) = 0;

    /// Gives the buffers new layouts, one for each; their contents are lost.
    /// @throws InvalidArgumentException when @p descriptors is null
    virtual void SetVertexDescriptors(const VertexDescriptor* descriptors) = 0;

    /// Draws as @p mode, whatever mode the mesh was made with. Attribute arrays stay enabled.
    ///
    /// With @p useIndices and an index buffer, @p count indices from the first one on (@p first is
    /// not looked at), or all of them for -1. Otherwise @p count vertices from @p first on, or for
    /// -1 the first buffer's vertex count; such a draw ends the process unless the mesh has exactly
    /// one vertex buffer. A layout of more than 4 attributes ends the process.
    virtual void Draw(PrimitiveType mode, unsigned int first, int count, bool useIndices) const = 0;

    /// Draws in the mesh's own mode; an indexed draw starts at index @p first. Otherwise as above.
    virtual void Draw(unsigned int first, int count, bool useIndices) const = 0;

    /// Draws @p instanceCount copies of @p count vertices from @p first on, without indices, with
    /// the divisors of the layouts. Disables the attribute arrays again. A count below 1 ends the
    /// process.
    virtual void DrawInstanced(unsigned int first, int count, int instanceCount) const = 0;

    /// Destroys the mesh.
    virtual void Release() = 0;
};

} // namespace Nib

#endif
