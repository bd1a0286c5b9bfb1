#include "gles/Fence.h"

#include <nib/device.h>

#include <limits>

namespace Nib::GLES
{

void Fence::Release()
{
    glDeleteSync(m_sync);
    delete this;
}

void Fence::Insert()
{
    if (m_sync)
        glDeleteSync(m_sync);
    m_sync = glFenceSync(GL_SYNC_GPU_COMMANDS_COMPLETE, 0);
}

IFence::Result Fence::Wait()
{
    if (!m_sync)
        return Signaled;
    return Wait(std::numeric_limits<unsigned long long>::max());
}

IFence::Result Fence::Wait(unsigned long long timeout)
{
    switch (glClientWaitSync(m_sync, GL_SYNC_FLUSH_COMMANDS_BIT, timeout))
    {
    case GL_ALREADY_SIGNALED:
    case GL_CONDITION_SATISFIED: return Signaled;
    case GL_TIMEOUT_EXPIRED: return NotSignaled;
    default:
        OpenGLRenderer::reportAndResetAllGLErrors("Fence::Wait(unsigned long long timeout)");
        return Failed;
    }
}

IFence::Result Fence::GetStatus()
{
    GLsizei length = 0;
    GLint value = 0;
    glGetSynciv(m_sync, GL_SYNC_STATUS, sizeof(value), &length, &value);
    switch (value)
    {
    case GL_SIGNALED: return Signaled;
    case GL_UNSIGNALED: return NotSignaled;
    default: return Failed;
    }
}

} // namespace Nib::GLES
