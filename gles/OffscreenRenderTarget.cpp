#include "gles/OffscreenRenderTarget.h"

#include "base/Log.h"
#include "device/GlDebugOutput.h"
#include "gles/DepthStencilBuffer.h"
#include "gles/TextureObject.h"
#include "gles/Throw.h"

#include <GLES3/gl3.h>

#include <sstream>
#include <stdexcept>

namespace Nib::GLES
{

namespace
{

unsigned int TextureNameOf(const ITextureObject* texture)
{
    return static_cast<const TextureObject*>(texture)->internals().glID;
}

unsigned int RenderbufferNameOf(const IDepthStencilBuffer* buffer)
{
    return static_cast<const DepthStencilBuffer*>(buffer)->GetDepthStencilBuffer();
}

} // namespace

OffscreenRenderTarget::OffscreenRenderTarget(ITextureObject* color)
    : RenderTargetBase(0, 0, FramebufferType::Unset), m_color(color)
{
    if (CreateFbo())
        AttachColorToFbo();
}

OffscreenRenderTarget::~OffscreenRenderTarget()
{
    NIB_FUNCTION("virtual Nib::GLES::OffscreenRenderTarget::~OffscreenRenderTarget()");
    NIB_LOG_DEBUG("%s - NibFrameBuffer: %p, FBO:%d", function, static_cast<void*>(this),
                  static_cast<int>(GetFbo()));
    const GLuint fbo = GetFbo();
    glDeleteFramebuffers(1, &fbo);
    SetFbo(0, 0, static_cast<unsigned int>(-1));
}

bool OffscreenRenderTarget::CreateFbo()
{
    NIB_FUNCTION("bool Nib::GLES::OffscreenRenderTarget::CreateFbo()");
    GLuint fbo = 0;
    glGenFramebuffers(1, &fbo);
    NIB_LOG_DEBUG("%s - NibFrameBuffer: %p, FBO:%d Tex: %d, Tag: %s", function,
                  static_cast<void*>(this), static_cast<int>(fbo),
                  static_cast<int>(TextureNameOf(m_color)), m_color->GetTag());
    if (fbo == 0)
    {
        NIB_LOG_ERROR("%s - Framebuffer is 0. glError = 0x%X ", function, glGetError());
        return false;
    }
    SetFbo(m_color->GetWidth(), m_color->GetHeight(), fbo);
    return true;
}

void OffscreenRenderTarget::AttachColorToFbo()
{
    NIB_FUNCTION("bool Nib::GLES::OffscreenRenderTarget::AttachColorToFbo()");
    const GLuint fbo = GetFbo();
    const GLuint texture = TextureNameOf(m_color);
    glBindTexture(GL_TEXTURE_2D, 0);
    glBindFramebuffer(GL_FRAMEBUFFER, fbo);
    GlDebugOutput::Label(GL_FRAMEBUFFER, fbo, m_color->GetTag());
    glFramebufferTexture2D(GL_FRAMEBUFFER, GL_COLOR_ATTACHMENT0, GL_TEXTURE_2D, texture, 0);
    const GLenum status = glCheckFramebufferStatus(GL_FRAMEBUFFER);
    if (status == GL_FRAMEBUFFER_COMPLETE)
    {
        m_colorAttached = true;
        return;
    }
    // The destructor of an object that was not built does not run.
    glDeleteFramebuffers(1, &fbo);
    std::ostringstream message;
    message << "glError: createFBO failed. Status = " << status << " NibFrameBuffer:" << this
            << " FBO:" << fbo << " Tex:" << texture << " Tag:" << m_color->GetTag()
            << " func:" << function;
    Throw<std::logic_error>(message.str());
}

void OffscreenRenderTarget::Activate()
{
    RenderTargetBase::Activate();
}

void OffscreenRenderTarget::Deactivate(bool discardDepth, bool discardStencil)
{
    RenderTargetBase::Deactivate(discardDepth, discardStencil);
}

void OffscreenRenderTarget::ReadPixels(int x, int y, int width, int height,
                                       const IRenderTarget::BufferDescriptor& buffer)
{
    RenderTargetBase::ReadPixels(x, y, width, height, buffer);
}

void OffscreenRenderTarget::Release()
{
    delete this;
}

void OffscreenRenderTarget::ClearColor(float r, float g, float b, float a)
{
    RenderTargetBase::ClearColor(r, g, b, a);
}

void OffscreenRenderTarget::AttachDepthStencilBuffer(IDepthStencilBuffer* buffer)
{
    if (m_depthStencilAttached)
        DetachDepthStencilFromFbo();
    m_depthStencil = buffer;
    AttachDepthStencilToFbo();
}

void OffscreenRenderTarget::DetachDepthStencilBuffer()
{
    m_depthStencil = nullptr;
    if (m_depthStencilAttached)
        DetachDepthStencilFromFbo();
}

void OffscreenRenderTarget::AttachDepthStencilToFbo()
{
    NIB_FUNCTION("bool Nib::GLES::OffscreenRenderTarget::AttachDepthStencilToFbo()");
    const GLuint renderbuffer = RenderbufferNameOf(m_depthStencil);
    glBindFramebuffer(GL_FRAMEBUFFER, GetFbo());
    glFramebufferRenderbuffer(GL_FRAMEBUFFER, GL_DEPTH_STENCIL_ATTACHMENT, GL_RENDERBUFFER,
                              renderbuffer);
    const GLenum status = glCheckFramebufferStatus(GL_FRAMEBUFFER);
    if (status == GL_FRAMEBUFFER_COMPLETE)
    {
        m_depthStencilAttached = true;
        return;
    }
    std::ostringstream message;
    message << "glError: FB status = " << status << " NibFrameBuffer:" << this
            << " FBO:" << GetFbo() << " Attachment:" << renderbuffer << " func:" << function;
    Throw<std::logic_error>(message.str());
}

void OffscreenRenderTarget::DetachDepthStencilFromFbo()
{
    NIB_FUNCTION("bool Nib::GLES::OffscreenRenderTarget::DetachDepthStencilFromFbo()");
    glBindFramebuffer(GL_FRAMEBUFFER, GetFbo());
    glFramebufferRenderbuffer(GL_FRAMEBUFFER, GL_DEPTH_STENCIL_ATTACHMENT, GL_RENDERBUFFER, 0);
    const GLenum status = glCheckFramebufferStatus(GL_FRAMEBUFFER);
    if (status == GL_FRAMEBUFFER_COMPLETE)
    {
        m_depthStencilAttached = false;
        return;
    }
    std::ostringstream message;
    message << "glError: FB Status = " << status << " NibFrameBuffer:" << this
            << " FBO:" << GetFbo() << " func:" << function;
    Throw<std::logic_error>(message.str());
}

void OffscreenRenderTarget::ClearDepthStencil(bool clearDepth, float depth, bool clearStencil,
                                              int stencil)
{
    Activate();
    GLbitfield mask = 0;
    if (clearDepth)
    {
        glClearDepthf(depth);
        mask |= GL_DEPTH_BUFFER_BIT;
    }
    if (clearStencil)
    {
        glClearStencil(stencil);
        mask |= GL_STENCIL_BUFFER_BIT;
    }
    glClear(mask);
    Deactivate(false, false);
}

void OffscreenRenderTarget::ReleaseGLObject() {}

void OffscreenRenderTarget::RestoreGLObject() {}

} // namespace Nib::GLES
