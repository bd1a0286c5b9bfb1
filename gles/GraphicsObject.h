#ifndef NIB_GLES_GRAPHICSOBJECT_H
#define NIB_GLES_GRAPHICSOBJECT_H

#include <nib/geometry.h>
#include <nib/managed_object.h>

#include <GLES3/gl3.h>

#include <cstdint>

namespace Nib::GLES
{

/// A mesh made of GL buffer objects. There is no vertex array object: each draw sets the attribute
/// arrays up, location by location, and leaves GL_ARRAY_BUFFER unbound.
///
/// Indices are given as 32-bit values and stored as such where the GPU can draw them, else as the
/// low 16 bits of each.
class GraphicsObject final : public IGraphicsObject, public ManagedObject
{
public:
    static constexpr unsigned kMaxBuffers = 16;    ///< the first number of buffers that is too many
    static constexpr int kMaxVertexAttributes = 4; ///< of one buffer that is drawn
    static constexpr int kWholeMesh = -1;          ///< as a count: all that there is

    /// Without buffers.
    GraphicsObject();

    /// As CreateBuffer leaves it, and throws.
    GraphicsObject(unsigned int bufferCount, PrimitiveType mode,
                   const VertexDescriptor* descriptors, unsigned int vertexCount,
                   unsigned int indexCount);
    ~GraphicsObject() override;

    /// Makes @p bufferCount vertex buffers of @p vertexCount vertices each, and an index buffer
    /// when
    /// @p indexCount is not 0; all without contents. Then subscribes to the thread's queue.
    /// @param descriptors  one for each buffer, copied
    /// @throws InvalidArgumentException for 16 buffers and more
    void CreateBuffer(PrimitiveType mode, unsigned int bufferCount,
                      const VertexDescriptor* descriptors, unsigned int vertexCount,
                      unsigned int indexCount);

    void setMeshType(PrimitiveType mode);
    unsigned int numBuffers() const;

    void UpdateBuffer(unsigned int index, const void* data, unsigned int vertexCount) override;
    void UpdateIndexes(const void* data, unsigned int count) override;
    void SetVertexDescriptors(const VertexDescriptor* descriptors) override;
    void Draw(PrimitiveType mode, unsigned int first, int count, bool useIndices) const override;
    void Draw(unsigned int first, int count, bool useIndices) const override;
    void DrawInstanced(unsigned int first, int count, int instanceCount) const override;
    void Release() override;

    void ReleaseGLObject() override;
    void RestoreGLObject() override;

private:
    void LabelBuffers() const;
    /// What the index buffer holds; how it is told to GL.
    struct IndexFormat
    {
        GLenum type;
        unsigned bytes;
    };

    IndexFormat StoredIndices() const;
    void AllocateVertices(unsigned int index, const void* data) const;
    GLuint SetUpAttributes(bool instanced) const;
    GLuint SetUpBuffer(unsigned int index, GLuint location, bool instanced) const;
    void DrawIndices(PrimitiveType mode, unsigned int first, int count) const;
    void DrawVertices(PrimitiveType mode, unsigned int first, int count) const;
    void DeleteNames();
    void freeBuffer();

    GLuint m_vertexBuffers[kMaxBuffers] = {};
    VertexDescriptor m_descriptors[kMaxBuffers];
    GLuint m_indexBuffer = 0; ///< 0: none
    std::uint32_t m_bufferCount = 0;
    std::uint32_t m_vertexCounts[kMaxBuffers] = {};
    std::uint32_t m_indexCount = 0;
    PrimitiveType m_mode = PrimitiveType::Triangles;
    bool m_uintIndexSupported;
};

} // namespace Nib::GLES

#endif
