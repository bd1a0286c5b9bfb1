#include "device/TextureFormats.h"

#include <nib/device.h>

// The state calls of OpenGLRenderer. Their enumerations hold GL tokens.

namespace Nib
{

namespace
{

template <typename Token>
constexpr GLenum ToGL(Token token)
{
    return static_cast<GLenum>(token);
}

constexpr GLboolean ToGL(bool value)
{
    return value ? GL_TRUE : GL_FALSE;
}

} // namespace

void OpenGLRenderer::setClearColor(float r, float g, float b, float a)
{
    glClearColor(r, g, b, a);
}

void OpenGLRenderer::setClearDepth(float value)
{
    glClearDepthf(value);
}

void OpenGLRenderer::setClearStencil(float value)
{
    glClearStencil(static_cast<GLint>(value));
}

void OpenGLRenderer::clear(bool color, bool depth, bool stencil)
{
    GLbitfield mask = 0;
    if (color)
        mask |= GL_COLOR_BUFFER_BIT;
    if (depth)
        mask |= GL_DEPTH_BUFFER_BIT;
    if (stencil)
        mask |= GL_STENCIL_BUFFER_BIT;
    glClear(mask);
}

void OpenGLRenderer::enableState(RenderState state)
{
    glEnable(ToGL(state));
}

void OpenGLRenderer::disableState(RenderState state)
{
    glDisable(ToGL(state));
}

void OpenGLRenderer::storeState(unsigned) {}

void OpenGLRenderer::loadState(unsigned) {}

void OpenGLRenderer::setBlendEquation(BlendingFuncOld rgb, BlendingFuncOld alpha)
{
    glBlendEquationSeparate(ToGL(rgb), ToGL(alpha));
}

void OpenGLRenderer::setBlendFuncFactors(BlendingFactorOld srcRgb, BlendingFactorOld dstRgb,
                                         BlendingFactorOld srcAlpha, BlendingFactorOld dstAlpha)
{
    glBlendFuncSeparate(ToGL(srcRgb), ToGL(dstRgb), ToGL(srcAlpha), ToGL(dstAlpha));
}

void OpenGLRenderer::setStencilFunc(FaceMode face, DSFunc function, int ref, unsigned mask)
{
    glStencilFuncSeparate(ToGL(face), ToGL(function), ref, mask);
}

void OpenGLRenderer::setStencilAction(FaceMode face, StencilAction sfail, StencilAction dpfail,
                                      StencilAction dppass)
{
    glStencilOpSeparate(ToGL(face), ToGL(sfail), ToGL(dpfail), ToGL(dppass));
}

void OpenGLRenderer::setStencilMask(FaceMode face, unsigned mask)
{
    glStencilMaskSeparate(ToGL(face), mask);
}

void OpenGLRenderer::setCullingSide(FaceMode face)
{
    glCullFace(ToGL(face));
}

void OpenGLRenderer::setDepthFunc(DSFunc function)
{
    glDepthFunc(ToGL(function));
}

void OpenGLRenderer::setWriteMask(bool color, bool depth)
{
    const GLboolean channel = ToGL(color);
    glColorMask(channel, channel, channel, channel);
    glDepthMask(ToGL(depth));
}

void OpenGLRenderer::setViewport(int x, int y, unsigned width, unsigned height)
{
    glViewport(x, y, static_cast<GLsizei>(width), static_cast<GLsizei>(height));
}

void OpenGLRenderer::setScissor(int x, int y, unsigned width, unsigned height)
{
    glScissor(x, y, static_cast<GLsizei>(width), static_cast<GLsizei>(height));
}

OpenGLRenderer::Viewport OpenGLRenderer::getViewport()
{
    GLint box[4] = {};
    glGetIntegerv(GL_VIEWPORT, box);
    return {box[0], box[1], box[2], box[3]};
}

void OpenGLRenderer::readPixels(int x, int y, int width, int height, void* pixels,
                                TextureTargetLayout layout, TextureMemoryLayout memoryLayout)
{
    glReadPixels(x, y, width, height, GLES::GetTextureFormat(layout),
                 GLES::GetTextureType(layout, memoryLayout), pixels);
}

void OpenGLRenderer::activateTextureUnit2D(int unit, int texture)
{
    glActiveTexture(GL_TEXTURE0 + static_cast<GLenum>(unit));
    glBindTexture(GL_TEXTURE_2D, static_cast<GLuint>(texture));
}

void OpenGLRenderer::bindFramebuffer(FramebufferTarget target, unsigned name)
{
    glBindFramebuffer(ToGL(target), name);
}

void OpenGLRenderer::setReadbackBufferLayout(ReadbackBufferLayout pname, int value, int* previous)
{
    if (previous != nullptr)
        glGetIntegerv(ToGL(pname), previous);
    glPixelStorei(ToGL(pname), value);
}

void OpenGLRenderer::finish()
{
    glFinish();
}

} // namespace Nib
