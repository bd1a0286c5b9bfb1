#include "gles/RenderTargetBase.h"

#include <GLES3/gl3.h>

namespace Nib::GLES
{

namespace
{

constexpr std::int32_t kNoFramebuffer = -1;

GLint GetInteger(GLenum name)
{
    GLint value = 0;
    glGetIntegerv(name, &value);
    return value;
}

std::int32_t FramebufferOf(RenderTargetBase::FramebufferType type)
{
    switch (type)
    {
    case RenderTargetBase::FramebufferType::Default: return 0;
    case RenderTargetBase::FramebufferType::Current: return GetInteger(GL_FRAMEBUFFER_BINDING);
    default: return kNoFramebuffer;
    }
}

/// How client memory is filled by a read, as the caller wants it; the former values afterwards.
class PackLayout
{
public:
    explicit PackLayout(const IRenderTarget::BufferDescriptor& buffer)
        : m_rowLength(GetInteger(GL_PACK_ROW_LENGTH)), m_skipRows(GetInteger(GL_PACK_SKIP_ROWS)),
          m_skipPixels(GetInteger(GL_PACK_SKIP_PIXELS))
    {
        Set(buffer.rowLength, buffer.skipRows, buffer.skipPixels);
    }
    ~PackLayout() { Set(m_rowLength, m_skipRows, m_skipPixels); }
    PackLayout(const PackLayout&) = delete;
    PackLayout& operator=(const PackLayout&) = delete;

private:
    static void Set(GLint rowLength, GLint skipRows, GLint skipPixels)
    {
        glPixelStorei(GL_PACK_ROW_LENGTH, rowLength);
        glPixelStorei(GL_PACK_SKIP_ROWS, skipRows);
        glPixelStorei(GL_PACK_SKIP_PIXELS, skipPixels);
    }

    const GLint m_rowLength;
    const GLint m_skipRows;
    const GLint m_skipPixels;
};

} // namespace

RenderTargetBase::RenderTargetBase(int width, int height, FramebufferType type)
    : m_fbo(FramebufferOf(type)), m_width(width), m_height(height)
{
}

void RenderTargetBase::Activate()
{
    glBindFramebuffer(GL_FRAMEBUFFER, static_cast<GLuint>(m_fbo));
    glViewport(0, 0, m_width, m_height);
}

void RenderTargetBase::Deactivate(bool discardDepth, bool discardStencil)
{
    // The default framebuffer names its buffers differently; what counts is the one bound now.
    const bool isDefault = GetInteger(GL_FRAMEBUFFER_BINDING) == 0;
    GLenum attachments[2];
    GLsizei count = 0;
    if (discardDepth)
        attachments[count++] = isDefault ? GL_DEPTH : GL_DEPTH_ATTACHMENT;
    if (discardStencil)
        attachments[count++] = isDefault ? GL_STENCIL : GL_STENCIL_ATTACHMENT;
    glInvalidateFramebuffer(GL_FRAMEBUFFER, count, attachments);
}

void RenderTargetBase::ReadPixels(int x, int y, int width, int height,
                                  const BufferDescriptor& buffer)
{
    glFinish();
    Activate();
    {
        PackLayout layout(buffer);
        glReadPixels(x, y, width, height, GL_RGBA, GL_UNSIGNED_BYTE, buffer.pixels);
    }
    Deactivate(true, true);
}

void RenderTargetBase::Release()
{
    delete this;
}

void RenderTargetBase::ClearColor(float r, float g, float b, float a)
{
    Activate();
    glClearColor(r, g, b, a);
    glClear(GL_COLOR_BUFFER_BIT);
    Deactivate(false, false);
}

void RenderTargetBase::SetFbo(int width, int height, unsigned int fbo)
{
    m_width = width;
    m_height = height;
    m_fbo = static_cast<std::int32_t>(fbo);
}

unsigned int RenderTargetBase::GetFbo() const
{
    return static_cast<unsigned int>(m_fbo);
}

} // namespace Nib::GLES
