#include "gles/RasterizerState.h"

#include <GLES3/gl3.h>

namespace Nib::GLES
{

void RasterizerState::SetScissorEnabled(bool enabled)
{
    if (enabled)
        glEnable(GL_SCISSOR_TEST);
    else
        glDisable(GL_SCISSOR_TEST);
}

void RasterizerState::SetScissorRect(const ScissorRect& rect)
{
    glScissor(rect.x, rect.y, rect.width, rect.height);
}

bool RasterizerState::IsScissorEnabled() const
{
    GLboolean enabled = GL_FALSE;
    glGetBooleanv(GL_SCISSOR_TEST, &enabled);
    return enabled == 1;
}

IRasterizerState::ScissorRect RasterizerState::GetScissorRect() const
{
    GLint box[4] = {};
    glGetIntegerv(GL_SCISSOR_BOX, box);
    return {box[0], box[1], box[2], box[3]};
}

} // namespace Nib::GLES
