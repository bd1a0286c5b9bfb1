#include "base/Log.h"
#include "device/TilingQcom.h"

#include <nib/device.h>

// What OpenGLRenderer does about buffers whose contents need not be kept.

namespace Nib
{

namespace
{

// Bits of the masks that callers give.
constexpr int kColorBit = 1;
constexpr int kDepthBit = 2;
constexpr int kStencilBit = 4;

// Names of colour, depth and stencil buffer for glInvalidateFramebuffer.
constexpr GLenum kApplicationFramebuffer[] = {GL_COLOR_ATTACHMENT0, GL_DEPTH_ATTACHMENT,
                                              GL_STENCIL_ATTACHMENT};
constexpr GLenum kDefaultFramebuffer[] = {GL_COLOR, GL_DEPTH, GL_STENCIL};

} // namespace

bool OpenGLRenderer::checkQCOMTilingSupport()
{
    NIB_FUNCTION("static bool Nib::OpenGLRenderer::checkQCOMTilingSupport()");
    if (glStartTilingQCOM.load(std::memory_order_relaxed) == nullptr)
        return false;
    NIB_LOG_INFO("%s tiling is supported", function);
    return true;
}

unsigned OpenGLRenderer::getTilingMaskQCOM(int mask)
{
    unsigned bits = 0;
    if ((mask & kColorBit) != 0)
        bits |= GL_COLOR_BUFFER_BIT0_QCOM;
    if ((mask & kDepthBit) != 0)
        bits |= GL_DEPTH_BUFFER_BIT0_QCOM;
    if ((mask & kStencilBit) != 0)
        bits |= GL_STENCIL_BUFFER_BIT0_QCOM;
    return bits;
}

bool OpenGLRenderer::startTilingQCOM(int x, int y, int width, int height, int preserveMask)
{
    const auto startTiling = glStartTilingQCOM.load(std::memory_order_relaxed);
    if (startTiling == nullptr)
        return false;
    startTiling(static_cast<GLuint>(x), static_cast<GLuint>(y), static_cast<GLuint>(width),
                static_cast<GLuint>(height), getTilingMaskQCOM(preserveMask));
    return true;
}

void OpenGLRenderer::stopTilingQCOM(int preserveMask)
{
    if (const auto endTiling = glEndTilingQCOM.load(std::memory_order_relaxed))
        endTiling(getTilingMaskQCOM(preserveMask));
}

void OpenGLRenderer::discardFramebuffer(int mask)
{
    GLint framebuffer = 0;
    glGetIntegerv(GL_FRAMEBUFFER_BINDING, &framebuffer);
    const GLenum(&names)[3] = framebuffer != 0 ? kApplicationFramebuffer : kDefaultFramebuffer;

    GLenum attachments[3];
    GLsizei count = 0;
    if ((mask & kColorBit) != 0)
        attachments[count++] = names[0];
    if ((mask & kDepthBit) != 0)
        attachments[count++] = names[1];
    if ((mask & kStencilBit) != 0)
        attachments[count++] = names[2];
    glInvalidateFramebuffer(GL_FRAMEBUFFER, count, attachments);
}

} // namespace Nib
