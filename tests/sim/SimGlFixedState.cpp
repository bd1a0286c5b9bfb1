#include "SimGl.h"

// State that calls set and queries give back: capabilities, tests, blending, clearing, pixel
// storage.

namespace Sim
{

bool CheckCount(GlEntry& entry, GLsizei count)
{
    if (count >= 0)
        return true;
    entry.Misuse(GL_INVALID_VALUE, "a negative count");
    return false;
}

bool IsCapability(GLenum name)
{
    return IsOneOf(name, {GL_BLEND, GL_CULL_FACE, GL_DEPTH_TEST, GL_DITHER, GL_POLYGON_OFFSET_FILL,
                          GL_PRIMITIVE_RESTART_FIXED_INDEX, GL_RASTERIZER_DISCARD,
                          GL_SAMPLE_ALPHA_TO_COVERAGE, GL_SAMPLE_COVERAGE, GL_SCISSOR_TEST,
                          GL_STENCIL_TEST});
}

namespace
{

bool Check(GlEntry& entry, bool valid, const char* what, GLenum value)
{
    if (!valid)
        entry.Misuse(GL_INVALID_ENUM, std::string("no such ") + what + ": " + Hex(value));
    return valid;
}

bool CheckCapability(GlEntry& entry, GLenum name)
{
    const bool isDebug = entry.state.gpu.HasGlExtension("GL_KHR_debug") &&
                         IsOneOf(name, {GL_DEBUG_OUTPUT_KHR, GL_DEBUG_OUTPUT_SYNCHRONOUS_KHR});
    return Check(entry, isDebug || IsCapability(name), "capability", name);
}

bool CheckEquation(GlEntry& entry, GLenum mode)
{
    const bool known =
        IsOneOf(mode, {GL_FUNC_ADD, GL_FUNC_SUBTRACT, GL_FUNC_REVERSE_SUBTRACT, GL_MIN, GL_MAX});
    return Check(entry, known, "blend equation", mode);
}

bool CheckFactor(GlEntry& entry, GLenum factor)
{
    const bool known =
        IsOneOf(factor, {GL_ZERO, GL_ONE, GL_SRC_COLOR, GL_ONE_MINUS_SRC_COLOR, GL_DST_COLOR,
                         GL_ONE_MINUS_DST_COLOR, GL_SRC_ALPHA, GL_ONE_MINUS_SRC_ALPHA, GL_DST_ALPHA,
                         GL_ONE_MINUS_DST_ALPHA, GL_CONSTANT_COLOR, GL_ONE_MINUS_CONSTANT_COLOR,
                         GL_CONSTANT_ALPHA, GL_ONE_MINUS_CONSTANT_ALPHA, GL_SRC_ALPHA_SATURATE});
    return Check(entry, known, "blend factor", factor);
}

bool CheckFunction(GlEntry& entry, GLenum func)
{
    const bool known = IsOneOf(func, {GL_NEVER, GL_LESS, GL_EQUAL, GL_LEQUAL, GL_GREATER,
                                      GL_NOTEQUAL, GL_GEQUAL, GL_ALWAYS});
    return Check(entry, known, "comparison", func);
}

bool CheckFace(GlEntry& entry, GLenum face)
{
    return Check(entry, IsOneOf(face, {GL_FRONT, GL_BACK, GL_FRONT_AND_BACK}), "face", face);
}

bool CheckOperation(GlEntry& entry, GLenum operation)
{
    const bool known = IsOneOf(operation, {GL_KEEP, GL_ZERO, GL_REPLACE, GL_INCR, GL_INCR_WRAP,
                                           GL_DECR, GL_DECR_WRAP, GL_INVERT});
    return Check(entry, known, "stencil operation", operation);
}

template <typename Change>
void ForFaces(GlState& gl, GLenum face, Change change)
{
    if (face != GL_BACK)
        change(gl.stencilFront);
    if (face != GL_FRONT)
        change(gl.stencilBack);
}

void SetStencilFunc(GlEntry& entry, GLenum face, GLenum func, GLint ref, GLuint mask)
{
    if (!entry || !CheckFace(entry, face) || !CheckFunction(entry, func))
        return;
    ForFaces(entry.Gl(), face,
             [&](StencilFace& side)
             {
                 side.func = func;
                 side.ref = ref;
                 side.readMask = mask;
             });
}

void SetStencilOp(GlEntry& entry, GLenum face, GLenum fail, GLenum depthFail, GLenum pass)
{
    if (!entry || !CheckFace(entry, face) || !CheckOperation(entry, fail) ||
        !CheckOperation(entry, depthFail) || !CheckOperation(entry, pass))
        return;
    ForFaces(entry.Gl(), face,
             [&](StencilFace& side)
             {
                 side.fail = fail;
                 side.depthFail = depthFail;
                 side.pass = pass;
             });
}

void SetStencilMask(GlEntry& entry, GLenum face, GLuint mask)
{
    if (entry && CheckFace(entry, face))
        ForFaces(entry.Gl(), face, [&](StencilFace& side) { side.writeMask = mask; });
}

void SetBlendFunc(GlEntry& entry, GLenum srcRgb, GLenum dstRgb, GLenum srcAlpha, GLenum dstAlpha)
{
    if (!entry || !CheckFactor(entry, srcRgb) || !CheckFactor(entry, dstRgb) ||
        !CheckFactor(entry, srcAlpha) || !CheckFactor(entry, dstAlpha))
        return;
    GlState& gl = entry.Gl();
    gl.blendSrcRgb = srcRgb;
    gl.blendDstRgb = dstRgb;
    gl.blendSrcAlpha = srcAlpha;
    gl.blendDstAlpha = dstAlpha;
}

void SetBlendEquation(GlEntry& entry, GLenum rgb, GLenum alpha)
{
    if (!entry || !CheckEquation(entry, rgb) || !CheckEquation(entry, alpha))
        return;
    entry.Gl().blendEquationRgb = rgb;
    entry.Gl().blendEquationAlpha = alpha;
}

void SetBox(GlEntry& entry, std::array<int, 4> GlState::*box, const std::array<int, 4>& value)
{
    if (!entry)
        return;
    if (value[2] < 0 || value[3] < 0)
        return entry.Misuse(GL_INVALID_VALUE, "a negative size");
    entry.Gl().*box = value;
}

/// The member that glPixelStorei sets; null when there is none.
int* PixelStoreMember(GlState& gl, GLenum name)
{
    switch (name)
    {
    case GL_UNPACK_ALIGNMENT: return &gl.unpack.alignment;
    case GL_UNPACK_ROW_LENGTH: return &gl.unpack.rowLength;
    case GL_UNPACK_SKIP_ROWS: return &gl.unpack.skipRows;
    case GL_UNPACK_SKIP_PIXELS: return &gl.unpack.skipPixels;
    case GL_UNPACK_IMAGE_HEIGHT: return &gl.unpack.imageHeight;
    case GL_UNPACK_SKIP_IMAGES: return &gl.unpack.skipImages;
    case GL_PACK_ALIGNMENT: return &gl.pack.alignment;
    case GL_PACK_ROW_LENGTH: return &gl.pack.rowLength;
    case GL_PACK_SKIP_ROWS: return &gl.pack.skipRows;
    case GL_PACK_SKIP_PIXELS: return &gl.pack.skipPixels;
    default: return nullptr;
    }
}

} // namespace

} // namespace Sim

using namespace Sim;

SIM_API void glEnable(GLenum cap)
{
    GlEntry entry("glEnable", {cap});
    if (entry && CheckCapability(entry, cap))
        entry.Gl().enabled.insert(cap);
}

SIM_API void glDisable(GLenum cap)
{
    GlEntry entry("glDisable", {cap});
    if (entry && CheckCapability(entry, cap))
        entry.Gl().enabled.erase(cap);
}

SIM_API GLboolean glIsEnabled(GLenum cap)
{
    GlEntry entry("glIsEnabled", {cap});
    return entry && CheckCapability(entry, cap) && entry.Gl().enabled.count(cap) ? GL_TRUE
                                                                                 : GL_FALSE;
}

SIM_API void glViewport(GLint x, GLint y, GLsizei width, GLsizei height)
{
    GlEntry entry("glViewport", {x, y, width, height});
    SetBox(entry, &GlState::viewport, {x, y, width, height});
}

SIM_API void glScissor(GLint x, GLint y, GLsizei width, GLsizei height)
{
    GlEntry entry("glScissor", {x, y, width, height});
    SetBox(entry, &GlState::scissor, {x, y, width, height});
}

SIM_API void glClearColor(GLfloat red, GLfloat green, GLfloat blue, GLfloat alpha)
{
    GlEntry entry("glClearColor", {red, green, blue, alpha});
    if (entry)
        entry.Gl().clearColor = {red, green, blue, alpha};
}

SIM_API void glClearDepthf(GLfloat depth)
{
    GlEntry entry("glClearDepthf", {depth});
    if (entry)
        entry.Gl().clearDepth = std::clamp<double>(depth, 0, 1);
}

SIM_API void glClearStencil(GLint stencil)
{
    GlEntry entry("glClearStencil", {stencil});
    if (entry)
        entry.Gl().clearStencil = stencil;
}

SIM_API void glColorMask(GLboolean red, GLboolean green, GLboolean blue, GLboolean alpha)
{
    GlEntry entry("glColorMask", {red, green, blue, alpha});
    if (entry)
        entry.Gl().colorMask = {red != 0, green != 0, blue != 0, alpha != 0};
}

SIM_API void glDepthMask(GLboolean flag)
{
    GlEntry entry("glDepthMask", {flag});
    if (entry)
        entry.Gl().depthMask = flag != 0;
}

SIM_API void glDepthFunc(GLenum func)
{
    GlEntry entry("glDepthFunc", {func});
    if (entry && CheckFunction(entry, func))
        entry.Gl().depthFunc = func;
}

SIM_API void glDepthRangef(GLfloat n, GLfloat f)
{
    GlEntry entry("glDepthRangef", {n, f});
    if (entry)
        entry.Gl().depthRange = {n, f};
}

SIM_API void glStencilFunc(GLenum func, GLint ref, GLuint mask)
{
    GlEntry entry("glStencilFunc", {func, ref, mask});
    SetStencilFunc(entry, GL_FRONT_AND_BACK, func, ref, mask);
}

SIM_API void glStencilFuncSeparate(GLenum face, GLenum func, GLint ref, GLuint mask)
{
    GlEntry entry("glStencilFuncSeparate", {face, func, ref, mask});
    SetStencilFunc(entry, face, func, ref, mask);
}

SIM_API void glStencilMask(GLuint mask)
{
    GlEntry entry("glStencilMask", {mask});
    SetStencilMask(entry, GL_FRONT_AND_BACK, mask);
}

SIM_API void glStencilMaskSeparate(GLenum face, GLuint mask)
{
    GlEntry entry("glStencilMaskSeparate", {face, mask});
    SetStencilMask(entry, face, mask);
}

SIM_API void glStencilOp(GLenum fail, GLenum depthFail, GLenum pass)
{
    GlEntry entry("glStencilOp", {fail, depthFail, pass});
    SetStencilOp(entry, GL_FRONT_AND_BACK, fail, depthFail, pass);
}

SIM_API void glStencilOpSeparate(GLenum face, GLenum fail, GLenum depthFail, GLenum pass)
{
    GlEntry entry("glStencilOpSeparate", {face, fail, depthFail, pass});
    SetStencilOp(entry, face, fail, depthFail, pass);
}

SIM_API void glBlendColor(GLfloat red, GLfloat green, GLfloat blue, GLfloat alpha)
{
    GlEntry entry("glBlendColor", {red, green, blue, alpha});
    if (entry)
        entry.Gl().blendColor = {red, green, blue, alpha};
}

SIM_API void glBlendEquation(GLenum mode)
{
    GlEntry entry("glBlendEquation", {mode});
    SetBlendEquation(entry, mode, mode);
}

SIM_API void glBlendEquationSeparate(GLenum rgb, GLenum alpha)
{
    GlEntry entry("glBlendEquationSeparate", {rgb, alpha});
    SetBlendEquation(entry, rgb, alpha);
}

SIM_API void glBlendFunc(GLenum source, GLenum destination)
{
    GlEntry entry("glBlendFunc", {source, destination});
    SetBlendFunc(entry, source, destination, source, destination);
}

SIM_API void glBlendFuncSeparate(GLenum srcRgb, GLenum dstRgb, GLenum srcAlpha, GLenum dstAlpha)
{
    GlEntry entry("glBlendFuncSeparate", {srcRgb, dstRgb, srcAlpha, dstAlpha});
    SetBlendFunc(entry, srcRgb, dstRgb, srcAlpha, dstAlpha);
}

SIM_API void glCullFace(GLenum mode)
{
    GlEntry entry("glCullFace", {mode});
    if (entry && CheckFace(entry, mode))
        entry.Gl().cullFace = mode;
}

SIM_API void glFrontFace(GLenum mode)
{
    GlEntry entry("glFrontFace", {mode});
    if (entry && Check(entry, IsOneOf(mode, {GL_CW, GL_CCW}), "direction", mode))
        entry.Gl().frontFace = mode;
}

SIM_API void glLineWidth(GLfloat width)
{
    GlEntry entry("glLineWidth", {width});
    if (!entry)
        return;
    if (width <= 0)
        return entry.Misuse(GL_INVALID_VALUE, "a width of nothing");
    entry.Gl().lineWidth = width;
}

SIM_API void glPolygonOffset(GLfloat factor, GLfloat units)
{
    GlEntry entry("glPolygonOffset", {factor, units});
    if (!entry)
        return;
    entry.Gl().polygonOffsetFactor = factor;
    entry.Gl().polygonOffsetUnits = units;
}

SIM_API void glSampleCoverage(GLfloat value, GLboolean invert)
{
    GlEntry entry("glSampleCoverage", {value, invert});
    if (!entry)
        return;
    entry.Gl().sampleCoverage = std::clamp<double>(value, 0, 1);
    entry.Gl().sampleCoverageInvert = invert != 0;
}

SIM_API void glHint(GLenum target, GLenum mode)
{
    GlEntry entry("glHint", {target, mode});
    if (!entry || !Check(entry, IsOneOf(mode, {GL_FASTEST, GL_NICEST, GL_DONT_CARE}), "hint", mode))
        return;
    if (target == GL_GENERATE_MIPMAP_HINT)
        entry.Gl().mipmapHint = mode;
    else if (Check(entry, target == GL_FRAGMENT_SHADER_DERIVATIVE_HINT, "hint target", target))
        entry.Gl().derivativeHint = mode;
}

SIM_API void glPixelStorei(GLenum name, GLint value)
{
    GlEntry entry("glPixelStorei", {name, value});
    if (!entry)
        return;
    int* const member = PixelStoreMember(entry.Gl(), name);
    if (!Check(entry, member != nullptr, "pixel storage parameter", name))
        return;
    const bool isAlignment = name == GL_UNPACK_ALIGNMENT || name == GL_PACK_ALIGNMENT;
    if (value < 0 || (isAlignment && !IsOneOf(value, {1, 2, 4, 8})))
        return entry.Misuse(GL_INVALID_VALUE, "the value " + std::to_string(value));
    *member = value;
}
