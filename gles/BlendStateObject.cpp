#include "gles/BlendStateObject.h"

#include <GLES3/gl3.h>

#include <iterator>

namespace Nib::GLES
{

namespace
{

// BlendingFunction -> GL, indexed by the value, no range check.
constexpr GLenum kBlendFunctionToGL[] = {
    GL_FUNC_ADD,              // 0
    GL_FUNC_SUBTRACT,         // 1
    GL_FUNC_REVERSE_SUBTRACT, // 2
    GL_MIN,                   // 3
    GL_MAX,                   // 4
};
static_assert(std::size(kBlendFunctionToGL) == 5, "one row per BlendingFunction");

// BlendingFactor -> GL, indexed by the value, no range check.
constexpr GLenum kBlendFactorToGL[] = {
    GL_ZERO,                     // 0
    GL_ONE,                      // 1
    GL_SRC_COLOR,                // 2
    GL_ONE_MINUS_SRC_COLOR,      // 3
    GL_DST_COLOR,                // 4
    GL_ONE_MINUS_DST_COLOR,      // 5
    GL_SRC_ALPHA,                // 6
    GL_ONE_MINUS_SRC_ALPHA,      // 7
    GL_DST_ALPHA,                // 8
    GL_ONE_MINUS_DST_ALPHA,      // 9
    GL_CONSTANT_COLOR,           // 10
    GL_ONE_MINUS_CONSTANT_COLOR, // 11
    GL_CONSTANT_ALPHA,           // 12
    GL_ONE_MINUS_CONSTANT_ALPHA, // 13
};
static_assert(std::size(kBlendFactorToGL) == 14, "one row per BlendingFactor");

} // namespace

BlendStateObject::BlendStateObject(const BlendStateDescriptor& descriptor)
    : m_descriptor(descriptor)
{
}

void BlendStateObject::SetDescriptor(const BlendStateDescriptor& descriptor)
{
    m_descriptor = descriptor;
}

void BlendStateObject::Activate()
{
    const BlendStateDescriptor& d = m_descriptor;
    if (d.enabled)
    {
        glBlendEquationSeparate(GetGLBlendFunction(d.colorFunction),
                                GetGLBlendFunction(d.alphaFunction));
        glBlendFuncSeparate(GetGLBlendFactor(d.colorSrcFactor), GetGLBlendFactor(d.colorDstFactor),
                            GetGLBlendFactor(d.alphaSrcFactor), GetGLBlendFactor(d.alphaDstFactor));
        glEnable(GL_BLEND);
    }
    else
    {
        glDisable(GL_BLEND);
    }
    const GLboolean write = d.colorWrite ? GL_TRUE : GL_FALSE;
    glColorMask(write, write, write, write);
}

void BlendStateObject::Release()
{
    delete this;
}

unsigned int BlendStateObject::GetGLBlendFunction(BlendingFunction function)
{
    return kBlendFunctionToGL[static_cast<int>(function)];
}

unsigned int BlendStateObject::GetGLBlendFactor(BlendingFactor factor)
{
    return kBlendFactorToGL[static_cast<int>(factor)];
}

} // namespace Nib::GLES
