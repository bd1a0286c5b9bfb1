#include "gles/DepthStencilState.h"

#include <GLES3/gl3.h>

#include <iterator>

namespace Nib::GLES
{

namespace
{

// DepthStencilFunction -> GL, indexed by the value, no range check.
constexpr GLenum kDepthStencilFunctionToGL[] = {
    GL_NEVER,    // 0
    GL_LESS,     // 1
    GL_EQUAL,    // 2
    GL_LEQUAL,   // 3
    GL_GREATER,  // 4
    GL_NOTEQUAL, // 5
    GL_GEQUAL,   // 6
    GL_ALWAYS,   // 7
};
static_assert(std::size(kDepthStencilFunctionToGL) == 8, "one row per DepthStencilFunction");

// StencilOperation -> GL, indexed by the value, no range check.
constexpr GLenum kStencilOperationToGL[] = {
    GL_KEEP,      // 0
    GL_ZERO,      // 1
    GL_REPLACE,   // 2
    GL_INCR,      // 3
    GL_DECR,      // 4
    GL_INVERT,    // 5
    GL_INCR_WRAP, // 6
    GL_DECR_WRAP, // 7
};
static_assert(std::size(kStencilOperationToGL) == 8, "one row per StencilOperation");

} // namespace

DepthStencilState::DepthStencilState(const DepthStencilStateDescriptor& descriptor)
    : m_descriptor(descriptor)
{
}

void DepthStencilState::SetDescriptor(const DepthStencilStateDescriptor& descriptor)
{
    m_descriptor = descriptor;
}

void DepthStencilState::Activate()
{
    ActivateDepth();
    ActivateStencil();
}

void DepthStencilState::ActivateDepth() const
{
    if (!m_descriptor.depthEnabled)
    {
        glDisable(GL_DEPTH_TEST);
        return;
    }
    glEnable(GL_DEPTH_TEST);
    glDepthMask(m_descriptor.depthWrite ? GL_TRUE : GL_FALSE);
    glDepthFunc(GetGLDepthStencilFunc(m_descriptor.depthFunction));
}

void DepthStencilState::ActivateStencil() const
{
    const DepthStencilStateDescriptor& d = m_descriptor;
    if (!d.stencilEnabled)
    {
        glDisable(GL_STENCIL_TEST);
        return;
    }
    glEnable(GL_STENCIL_TEST);
    glStencilMask(d.stencilWriteMask);
    glStencilFunc(GetGLDepthStencilFunc(d.stencilFunction), d.stencilRef, d.stencilReadMask);
    glStencilOpSeparate(GL_FRONT, GetGLStencilOp(d.frontStencilFail),
                        GetGLStencilOp(d.frontDepthFail), GetGLStencilOp(d.frontPass));
    glStencilOpSeparate(GL_BACK, GetGLStencilOp(d.backStencilFail), GetGLStencilOp(d.backDepthFail),
                        GetGLStencilOp(d.backPass));
}

void DepthStencilState::Release()
{
    delete this;
}

unsigned int DepthStencilState::GetGLDepthStencilFunc(DepthStencilFunction function)
{
    return kDepthStencilFunctionToGL[static_cast<int>(function)];
}

unsigned int DepthStencilState::GetGLStencilOp(StencilOperation operation)
{
    return kStencilOperationToGL[static_cast<int>(operation)];
}

} // namespace Nib::GLES
