#include "gles/GraphicsObject.h"

#include <nib/device.h>
#include <nib/exceptions.h>

#include "base/Log.h"
#include "device/GlDebugOutput.h"
#include "gles/Throw.h"
#include "gles/VertexFormats.h"

#include <algorithm>
#include <memory>
#include <string>

namespace Nib::GLES
{

namespace
{

constexpr unsigned kBytesPerIndex = 4; // as given, and as allocated before there are any

constexpr bool kInstanced = true;

GLsizeiptr ByteSize(const VertexDescriptor& descriptor, unsigned vertexCount)
{
    return static_cast<GLsizeiptr>(descriptor.size() * vertexCount);
}

const void* BufferOffset(std::size_t bytes)
{
    return reinterpret_cast<const void*>(bytes);
}

GLuint MakeBuffer()
{
    GLuint name = 0;
    glGenBuffers(1, &name);
    return name;
}

void DeleteBuffer(GLuint& name)
{
    if (name == 0)
        return;
    glDeleteBuffers(1, &name);
    name = 0;
}

void UploadIndices(const void* data, unsigned count)
{
    glBufferData(GL_ELEMENT_ARRAY_BUFFER, static_cast<GLsizeiptr>(count) * kBytesPerIndex, data,
                 GL_DYNAMIC_DRAW);
}

/// An empty index buffer, which stays bound; 0 for no indices.
GLuint MakeIndexBuffer(unsigned indexCount)
{
    if (indexCount == 0)
        return 0;
    const GLuint name = MakeBuffer();
    glBindBuffer(GL_ELEMENT_ARRAY_BUFFER, name);
    UploadIndices(nullptr, indexCount);
    return name;
}

void UploadShortIndices(const void* data, unsigned count)
{
    NIB_LOG_INFO("GL_UNSIGNED_INT index buffer not supported, performing conversion!");
    const auto* indices = static_cast<const std::uint32_t*>(data);
    const std::unique_ptr<std::uint16_t[]> shorts(new std::uint16_t[count]);
    std::transform(indices, indices + count, shorts.get(),
                   [](std::uint32_t index) { return static_cast<std::uint16_t>(index); });
    glBufferData(GL_ELEMENT_ARRAY_BUFFER, static_cast<GLsizeiptr>(count) * sizeof(std::uint16_t),
                 shorts.get(), GL_DYNAMIC_DRAW);
}

} // namespace

// ---- making and filling ----

GraphicsObject::GraphicsObject()
    : m_uintIndexSupported(IsGLExtensionSupported("GL_OES_element_index_uint"))
{
}

GraphicsObject::GraphicsObject(unsigned int bufferCount, PrimitiveType mode,
                               const VertexDescriptor* descriptors, unsigned int vertexCount,
                               unsigned int indexCount)
    : GraphicsObject()
{
    CreateBuffer(mode, bufferCount, descriptors, vertexCount, indexCount);
}

GraphicsObject::~GraphicsObject()
{
    freeBuffer();
}

void GraphicsObject::Release()
{
    delete this;
}

void GraphicsObject::CreateBuffer(PrimitiveType mode, unsigned int bufferCount,
                                  const VertexDescriptor* descriptors, unsigned int vertexCount,
                                  unsigned int indexCount)
{
    if (bufferCount >= kMaxBuffers)
        Throw<InvalidArgumentException>("CreateBuffer: invalid number of buffers!");
    for (unsigned int i = 0; i < bufferCount; ++i)
    {
        m_descriptors[i] = descriptors[i];
        m_vertexCounts[i] = vertexCount;
        m_vertexBuffers[i] = MakeBuffer();
        AllocateVertices(i, nullptr);
    }
    m_indexBuffer = MakeIndexBuffer(indexCount);
    glBindBuffer(GL_ARRAY_BUFFER, 0);
    m_indexCount = indexCount;
    m_bufferCount = bufferCount;
    m_mode = mode;
    LabelBuffers();
    Register();
}

/// For a GL debugger.
void GraphicsObject::LabelBuffers() const
{
    if (!GlDebugOutput::IsOn())
        return;
    for (unsigned i = 0; i < m_bufferCount; ++i)
        GlDebugOutput::Label(GL_BUFFER_KHR, m_vertexBuffers[i],
                             ("vertices " + std::to_string(i)).c_str());
    if (m_indexBuffer != 0)
        GlDebugOutput::Label(GL_BUFFER_KHR, m_indexBuffer, "indices");
}

void GraphicsObject::setMeshType(PrimitiveType mode)
{
    m_mode = mode;
}

unsigned int GraphicsObject::numBuffers() const
{
    return m_bufferCount;
}

void GraphicsObject::UpdateBuffer(unsigned int index, const void* data, unsigned int vertexCount)
{
    if (index >= m_bufferCount)
        Throw<InvalidArgumentException>("updateBuffer: wrong buffer index!");
    m_vertexCounts[index] = vertexCount;
    AllocateVertices(index, data);
    glBindBuffer(GL_ELEMENT_ARRAY_BUFFER, 0);
    glBindBuffer(GL_ARRAY_BUFFER, 0);
}

void GraphicsObject::UpdateIndexes(const void* data, unsigned int count)
{
    if (m_indexBuffer == 0)
        m_indexBuffer = MakeBuffer();
    glBindBuffer(GL_ELEMENT_ARRAY_BUFFER, m_indexBuffer);
    if (m_uintIndexSupported)
        UploadIndices(data, count);
    else
        UploadShortIndices(data, count);
    GlDebugOutput::Label(GL_BUFFER_KHR, m_indexBuffer, "indices");
    m_indexCount = count;
}

void GraphicsObject::SetVertexDescriptors(const VertexDescriptor* descriptors)
{
    if (!descriptors)
        Throw<InvalidArgumentException>("SetVertexDescriptors: invalid descriptor!");
    for (unsigned int i = 0; i < m_bufferCount; ++i)
    {
        m_descriptors[i] = descriptors[i];
        AllocateVertices(i, nullptr);
    }
    glBindBuffer(GL_ARRAY_BUFFER, 0);
}

/// Gives a vertex buffer the size of its vertices, and contents unless @p data is null. It stays
/// bound.
void GraphicsObject::AllocateVertices(unsigned int index, const void* data) const
{
    const VertexDescriptor& descriptor = m_descriptors[index];
    glBindBuffer(GL_ARRAY_BUFFER, m_vertexBuffers[index]);
    glBufferData(GL_ARRAY_BUFFER, ByteSize(descriptor, m_vertexCounts[index]), data,
                 GetBufferUsage(descriptor.usage));
}

// ---- drawing ----

void GraphicsObject::Draw(unsigned int first, int count, bool useIndices) const
{
    SetUpAttributes(!kInstanced);
    if (useIndices && m_indexBuffer != 0)
        DrawIndices(m_mode, first, count);
    else
        DrawVertices(m_mode, first, count);
    glBindBuffer(GL_ARRAY_BUFFER, 0);
}

void GraphicsObject::Draw(PrimitiveType mode, unsigned int first, int count, bool useIndices) const
{
    SetUpAttributes(!kInstanced);
    if (useIndices && m_indexBuffer != 0)
        DrawIndices(mode, 0, count); // in a given mode, always from the first index on
    else
        DrawVertices(mode, first, count);
    glBindBuffer(GL_ARRAY_BUFFER, 0);
}

void GraphicsObject::DrawInstanced(unsigned int first, int count, int instanceCount) const
{
    const GLuint locations = SetUpAttributes(kInstanced);
    if (count < 1 || instanceCount < 1)
        NIB_ABORT("Incorrect input parameters");
    glDrawArraysInstanced(static_cast<GLenum>(m_mode), static_cast<GLint>(first), count,
                          instanceCount);
    for (GLuint location = 0; location < locations; ++location)
    {
        glVertexAttribDivisor(location, 0);
        glDisableVertexAttribArray(location);
    }
    glBindBuffer(GL_ARRAY_BUFFER, 0);
}

/// Enables an array for each attribute of each buffer; the number of locations used.
GLuint GraphicsObject::SetUpAttributes(bool instanced) const
{
    GLuint location = 0;
    for (unsigned int i = 0; i < m_bufferCount; ++i)
        location = SetUpBuffer(i, location, instanced);
    return location;
}

/// The attributes of one buffer, from @p location on; the next free location.
GLuint GraphicsObject::SetUpBuffer(unsigned int index, GLuint location, bool instanced) const
{
    const VertexDescriptor& layout = m_descriptors[index];
    glBindBuffer(GL_ARRAY_BUFFER, m_vertexBuffers[index]);
    if (layout.count > kMaxVertexAttributes)
        NIB_ABORT("Error! Please, change value of variable MAX_VERTEX_ATTRIBS by %i",
                  layout.count + 1);
    for (int i = 0; i < layout.count; ++i, ++location)
    {
        glEnableVertexAttribArray(location);
        glVertexAttribPointer(location, layout.components[i], GetAttributeType(layout.types[i]),
                              GL_FALSE, static_cast<GLsizei>(layout.stride),
                              BufferOffset(static_cast<std::size_t>(layout.offsets[i])));
        if (instanced)
            glVertexAttribDivisor(location, static_cast<GLuint>(layout.divisors[i]));
    }
    return location;
}

void GraphicsObject::DrawIndices(PrimitiveType mode, unsigned int first, int count) const
{
    const IndexFormat format = StoredIndices();
    glBindBuffer(GL_ELEMENT_ARRAY_BUFFER, m_indexBuffer);
    glDrawElements(static_cast<GLenum>(mode),
                   count == kWholeMesh ? static_cast<GLsizei>(m_indexCount) : count, format.type,
                   BufferOffset(std::size_t{first} * format.bytes));
}

void GraphicsObject::DrawVertices(PrimitiveType mode, unsigned int first, int count) const
{
    if (m_bufferCount != 1)
        NIB_ABORT("Please, provide proper count of vertex for drawing");
    glDrawArrays(static_cast<GLenum>(mode), static_cast<GLint>(first),
                 count == kWholeMesh ? static_cast<GLsizei>(m_vertexCounts[0]) : count);
}

GraphicsObject::IndexFormat GraphicsObject::StoredIndices() const
{
    return m_uintIndexSupported ? IndexFormat{GL_UNSIGNED_INT, 4}
                                : IndexFormat{GL_UNSIGNED_SHORT, 2};
}

// ---- the end, and the loss of the context ----

void GraphicsObject::freeBuffer()
{
    Unregister();
    DeleteNames();
}

void GraphicsObject::DeleteNames()
{
    for (GLuint& name : m_vertexBuffers)
        DeleteBuffer(name);
    DeleteBuffer(m_indexBuffer);
}

void GraphicsObject::ReleaseGLObject()
{
    NIB_FUNCTION("virtual void Nib::GLES::GraphicsObject::ReleaseGLObject()");
    NIB_LOG_INFO("%s - Release Was called. Graphics - %d", function,
                 static_cast<int>(m_vertexBuffers[0]));
    DeleteNames();
}

void GraphicsObject::RestoreGLObject()
{
    NIB_FUNCTION("virtual void Nib::GLES::GraphicsObject::RestoreGLObject()");
    for (unsigned int i = 0; i < m_bufferCount; ++i)
    {
        if (m_vertexBuffers[i] != 0)
            continue;
        m_vertexBuffers[i] = MakeBuffer();
        AllocateVertices(i, nullptr);
    }
    if (m_indexBuffer == 0)
        m_indexBuffer = MakeIndexBuffer(m_indexCount);
    glBindBuffer(GL_ARRAY_BUFFER, 0);
    LabelBuffers();
    NIB_LOG_INFO("%s - Restore Was called. Graphics After - %d(err:%d)", function,
                 static_cast<int>(m_vertexBuffers[0]), static_cast<int>(glGetError()));
}

} // namespace Nib::GLES
