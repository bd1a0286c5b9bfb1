#include "gles/DepthStencilBuffer.h"

#include <nib/device.h>

#include "base/Log.h"
#include "device/GlDebugOutput.h"

#include <GLES3/gl3.h>

namespace Nib::GLES
{

DepthStencilBuffer::DepthStencilBuffer()
{
    Register();
}

DepthStencilBuffer::~DepthStencilBuffer()
{
    Unregister();
    DestroyBuffer();
}

unsigned int DepthStencilBuffer::GetWidth() const
{
    return m_width;
}

unsigned int DepthStencilBuffer::GetHeight() const
{
    return m_height;
}

void DepthStencilBuffer::Release()
{
    delete this;
}

unsigned int DepthStencilBuffer::GetDepthStencilBuffer() const
{
    return m_renderbuffer;
}

void DepthStencilBuffer::CreateBuffer(unsigned int width, unsigned int height)
{
    NIB_FUNCTION("void Nib::GLES::DepthStencilBuffer::CreateBuffer(unsigned int, unsigned int)");
    glGenRenderbuffers(1, &m_renderbuffer);
    if (m_renderbuffer != 0)
    {
        NIB_LOG_INFO("%s - mDepthStencilBuffer (%d x %d) glID = %d", function,
                     static_cast<int>(width), static_cast<int>(height),
                     static_cast<int>(m_renderbuffer));
        glBindRenderbuffer(GL_RENDERBUFFER, m_renderbuffer);
        glRenderbufferStorage(GL_RENDERBUFFER, GL_DEPTH24_STENCIL8, static_cast<GLsizei>(width),
                              static_cast<GLsizei>(height));
        GlDebugOutput::Label(GL_RENDERBUFFER, m_renderbuffer, "depth and stencil");
        m_width = width;
        m_height = height;
    }
    else
    {
        NIB_LOG_ERROR("%s - glGenRenderbuffers failed", function);
    }
    OpenGLRenderer::reportAndResetAllGLErrors("DepthStencilBuffer::CreateBuffer");
}

void DepthStencilBuffer::DestroyBuffer()
{
    if (m_renderbuffer == 0)
        return;
    glDeleteRenderbuffers(1, &m_renderbuffer);
    m_renderbuffer = 0;
}

void DepthStencilBuffer::ReleaseGLObject()
{
    DestroyBuffer();
}

void DepthStencilBuffer::RestoreGLObject()
{
    NIB_FUNCTION("virtual void Nib::GLES::DepthStencilBuffer::RestoreGLObject()");
    if (m_renderbuffer != 0)
        NIB_LOG_ERROR("%s - Logic error! glID = %d", function, static_cast<int>(m_renderbuffer));
    else if (m_width != 0 && m_height != 0)
        CreateBuffer(m_width, m_height);
}

} // namespace Nib::GLES
