#include "gles/UniformBuffer.h"

#include "base/Log.h"
#include "device/GlDebugOutput.h"
#include "gles/VertexFormats.h"

namespace Nib::GLES
{

namespace
{

constexpr int kMaxUniformBufferBindings = 4;

} // namespace

UniformBuffer::UniformBuffer()
{
    glGenBuffers(1, &m_buffer);
    glBindBuffer(GL_UNIFORM_BUFFER, m_buffer);
    // The array buffer, not the uniform buffer, which gets its storage from the first Update.
    glBufferData(GL_ARRAY_BUFFER, 0, nullptr, GetBufferUsage(m_usage));
    glBindBuffer(GL_UNIFORM_BUFFER, 0);
    GlDebugOutput::Label(GL_BUFFER_KHR, m_buffer, "uniforms");
}

void UniformBuffer::Release()
{
    glDeleteBuffers(1, &m_buffer);
    delete this;
}

void UniformBuffer::Update(const void* data, unsigned int size, BufferUsage usage)
{
    glBindBuffer(GL_UNIFORM_BUFFER, m_buffer);
    glBufferData(GL_UNIFORM_BUFFER, static_cast<GLsizeiptr>(size), data, GetBufferUsage(usage));
    glBindBuffer(GL_UNIFORM_BUFFER, 0);
    m_usage = usage;
    m_size = size;
}

void UniformBuffer::Activate(int binding)
{
    if (binding >= kMaxUniformBufferBindings)
        NIB_ABORT("Error! Please, change value of variable MAX_UNIFORM_BUFFER_BINDINGS");
    glBindBufferBase(GL_UNIFORM_BUFFER, static_cast<GLuint>(binding), m_buffer);
}

} // namespace Nib::GLES
