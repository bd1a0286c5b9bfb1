#include "SimGl.h"

#include <GLES2/gl2.h>
// After gl2.h, which it needs.
#include <GLES2/gl2ext.h>

// Texture objects and samplers: names, bindings, sampling parameters.

namespace Sim
{

bool IsTextureTarget(const SimGpu& gpu, GLenum target)
{
    switch (target)
    {
    case GL_TEXTURE_2D:
    case GL_TEXTURE_CUBE_MAP: return true;
    case GL_TEXTURE_3D:
    case GL_TEXTURE_2D_ARRAY: return gpu.GlVersion() >= 30;
    case GL_TEXTURE_EXTERNAL_OES: return gpu.HasGlExtension("GL_OES_EGL_image_external");
    default: return false;
    }
}

Texture* BoundTexture(GlEntry& entry, GLenum target)
{
    if (!IsTextureTarget(entry.state.gpu, target))
    {
        entry.Misuse(GL_INVALID_ENUM, "no such texture target: " + Hex(target));
        return nullptr;
    }
    GlState& gl = entry.Gl();
    const GLuint name = gl.textures[static_cast<std::size_t>(gl.activeUnit)][target];
    if (Texture* const texture = name ? entry.Group().textures.Find(name) : nullptr)
        return texture;
    Texture& own = gl.defaultTextures[target];
    own.target = target;
    return &own;
}

namespace
{

bool IsWrap(const SimGpu& gpu, GLint value)
{
    constexpr GLint kClampToBorder = 0x812D;
    if (value == kClampToBorder)
        return gpu.GlVersion() >= 32 || gpu.HasGlExtension("GL_EXT_texture_border_clamp");
    return IsOneOf(value, {GL_REPEAT, GL_CLAMP_TO_EDGE, GL_MIRRORED_REPEAT});
}

bool IsValue(const SimGpu& gpu, GLenum name, GLint value)
{
    switch (name)
    {
    case GL_TEXTURE_WRAP_S:
    case GL_TEXTURE_WRAP_T:
    case GL_TEXTURE_WRAP_R: return IsWrap(gpu, value);
    case GL_TEXTURE_MAG_FILTER: return IsOneOf(value, {GL_NEAREST, GL_LINEAR});
    case GL_TEXTURE_MIN_FILTER:
        return IsOneOf(value,
                       {GL_NEAREST, GL_LINEAR, GL_NEAREST_MIPMAP_NEAREST, GL_LINEAR_MIPMAP_NEAREST,
                        GL_NEAREST_MIPMAP_LINEAR, GL_LINEAR_MIPMAP_LINEAR});
    case GL_TEXTURE_COMPARE_MODE: return IsOneOf(value, {GL_NONE, GL_COMPARE_REF_TO_TEXTURE});
    case GL_TEXTURE_COMPARE_FUNC:
        return IsOneOf(value, {GL_LEQUAL, GL_GEQUAL, GL_LESS, GL_GREATER, GL_EQUAL, GL_NOTEQUAL,
                               GL_ALWAYS, GL_NEVER});
    default: return true; // levels of detail
    }
}

bool IsSamplingParameter(GLenum name)
{
    return IsOneOf(name, {GL_TEXTURE_WRAP_S, GL_TEXTURE_WRAP_T, GL_TEXTURE_WRAP_R,
                          GL_TEXTURE_MAG_FILTER, GL_TEXTURE_MIN_FILTER, GL_TEXTURE_COMPARE_MODE,
                          GL_TEXTURE_COMPARE_FUNC, GL_TEXTURE_MIN_LOD, GL_TEXTURE_MAX_LOD});
}

bool IsTextureParameter(GLenum name)
{
    return IsSamplingParameter(name) ||
           IsOneOf(name, {GL_TEXTURE_BASE_LEVEL, GL_TEXTURE_MAX_LEVEL, GL_TEXTURE_SWIZZLE_R,
                          GL_TEXTURE_SWIZZLE_G, GL_TEXTURE_SWIZZLE_B, GL_TEXTURE_SWIZZLE_A});
}

GLint DefaultParameter(GLenum name)
{
    switch (name)
    {
    case GL_TEXTURE_WRAP_S:
    case GL_TEXTURE_WRAP_T:
    case GL_TEXTURE_WRAP_R: return GL_REPEAT;
    case GL_TEXTURE_MAG_FILTER: return GL_LINEAR;
    case GL_TEXTURE_MIN_FILTER: return GL_NEAREST_MIPMAP_LINEAR;
    case GL_TEXTURE_COMPARE_MODE: return GL_NONE;
    case GL_TEXTURE_COMPARE_FUNC: return GL_LEQUAL;
    case GL_TEXTURE_MIN_LOD: return -1000;
    case GL_TEXTURE_MAX_LOD:
    case GL_TEXTURE_MAX_LEVEL: return 1000;
    case GL_TEXTURE_SWIZZLE_R: return GL_RED;
    case GL_TEXTURE_SWIZZLE_G: return GL_GREEN;
    case GL_TEXTURE_SWIZZLE_B: return GL_BLUE;
    case GL_TEXTURE_SWIZZLE_A: return GL_ALPHA;
    default: return 0;
    }
}

GLint ParameterOr(const std::map<GLenum, GLint>& params, GLenum name)
{
    const auto found = params.find(name);
    return found == params.end() ? DefaultParameter(name) : found->second;
}

void SetTextureParameter(GlEntry& entry, GLenum target, GLenum name, GLint value)
{
    Texture* const texture = entry ? BoundTexture(entry, target) : nullptr;
    if (!texture)
        return;
    if (!IsTextureParameter(name))
        return entry.Misuse(GL_INVALID_ENUM, "textures have no such parameter: " + Hex(name));
    if (CheckSamplingParameter(entry, name, value))
        texture->params[name] = value;
}

template <typename T>
void GetTextureParameter(GlEntry& entry, GLenum target, GLenum name, T* params)
{
    const Texture* const texture = entry ? BoundTexture(entry, target) : nullptr;
    if (!texture)
        return;
    if (name == GL_TEXTURE_IMMUTABLE_FORMAT)
        *params = static_cast<T>(texture->immutable);
    else if (name == GL_TEXTURE_IMMUTABLE_LEVELS)
        *params = static_cast<T>(texture->immutable ? texture->levels.size() : 0);
    else if (IsTextureParameter(name))
        *params = static_cast<T>(ParameterOr(texture->params, name));
    else
        entry.Misuse(GL_INVALID_ENUM, "textures have no such parameter: " + Hex(name));
}

Sampler* FindSampler(GlEntry& entry, GLuint name)
{
    Sampler* const sampler = entry.Group().samplers.Find(name);
    if (!sampler)
        entry.Misuse(GL_INVALID_OPERATION, "there is no sampler " + std::to_string(name));
    return sampler;
}

void SetSamplerParameter(GlEntry& entry, GLuint name, GLenum parameter, GLint value)
{
    Sampler* const sampler = entry ? FindSampler(entry, name) : nullptr;
    if (!sampler)
        return;
    if (!IsSamplingParameter(parameter))
        return entry.Misuse(GL_INVALID_ENUM, "samplers have no such parameter: " + Hex(parameter));
    if (!CheckSamplingParameter(entry, parameter, value))
        return;
    sampler->created = true;
    sampler->params[parameter] = value;
}

template <typename T>
void GetSamplerParameter(GlEntry& entry, GLuint name, GLenum parameter, T* params)
{
    const Sampler* const sampler = entry ? FindSampler(entry, name) : nullptr;
    if (!sampler)
        return;
    if (!IsSamplingParameter(parameter))
        return entry.Misuse(GL_INVALID_ENUM, "samplers have no such parameter: " + Hex(parameter));
    *params = static_cast<T>(ParameterOr(sampler->params, parameter));
}

/// A deleted texture is bound nowhere in this context, and attached to no bound framebuffer, any
/// more.
void ForgetTexture(GlState& gl, GLuint name)
{
    for (auto& unit : gl.textures)
    {
        for (auto& [target, bound] : unit)
            bound = bound == name ? 0 : bound;
    }
    for (const GLuint bound : {gl.drawFramebuffer, gl.readFramebuffer})
    {
        Framebuffer* const framebuffer = gl.framebuffers.Find(bound);
        if (!framebuffer)
            continue;
        std::erase_if(framebuffer->attachments, [&](const auto& item)
                      { return item.second.type == GL_TEXTURE && item.second.name == name; });
    }
}

} // namespace

bool CheckSamplingParameter(GlEntry& entry, GLenum name, GLint value)
{
    if (IsValue(entry.state.gpu, name, value))
        return true;
    entry.Misuse(GL_INVALID_ENUM,
                 "the value " + Hex(static_cast<unsigned>(value)) + " of " + Hex(name));
    return false;
}

} // namespace Sim

using namespace Sim;

SIM_API void glGenTextures(GLsizei n, GLuint* textures)
{
    GlEntry entry("glGenTextures", {n, (const void*)textures});
    Generate(entry, entry ? &entry.Group().textures : nullptr, n, textures);
}

SIM_API void glDeleteTextures(GLsizei n, const GLuint* textures)
{
    GlEntry entry("glDeleteTextures", {n, (const void*)textures});
    Delete(entry, entry ? &entry.Group().textures : nullptr, n, textures,
           [&](GLuint name)
           {
               ForgetTexture(entry.Gl(), name);
               entry.Group().textures.Erase(name);
           });
}

SIM_API GLboolean glIsTexture(GLuint name)
{
    GlEntry entry("glIsTexture", {name});
    const Texture* const texture = entry ? entry.Group().textures.Find(name) : nullptr;
    return texture && texture->created ? GL_TRUE : GL_FALSE;
}

SIM_API void glActiveTexture(GLenum unit)
{
    GlEntry entry("glActiveTexture", {unit});
    if (!entry)
        return;
    const int limit = std::min(entry.state.gpu.maxCombinedTextureUnits, kTextureUnits);
    if (unit < GL_TEXTURE0 || unit >= GL_TEXTURE0 + static_cast<GLenum>(limit))
        return entry.Misuse(GL_INVALID_ENUM, "no such texture unit: " + Hex(unit));
    entry.Gl().activeUnit = static_cast<int>(unit - GL_TEXTURE0);
}

SIM_API void glBindTexture(GLenum target, GLuint name)
{
    GlEntry entry("glBindTexture", {target, name});
    if (!entry)
        return;
    if (!IsTextureTarget(entry.state.gpu, target))
        return entry.Misuse(GL_INVALID_ENUM, "no such texture target: " + Hex(target));
    if (name != 0)
    {
        Texture& texture = Bind(entry, entry.Group().textures, name);
        if (texture.target != 0 && texture.target != target)
            return entry.Misuse(GL_INVALID_OPERATION,
                                "the texture has the target " + Hex(texture.target));
        texture.target = target;
    }
    GlState& gl = entry.Gl();
    gl.textures[static_cast<std::size_t>(gl.activeUnit)][target] = name;
}

SIM_API void glTexParameteri(GLenum target, GLenum name, GLint value)
{
    GlEntry entry("glTexParameteri", {target, name, value});
    SetTextureParameter(entry, target, name, value);
}

SIM_API void glTexParameterf(GLenum target, GLenum name, GLfloat value)
{
    GlEntry entry("glTexParameterf", {target, name, value});
    SetTextureParameter(entry, target, name, static_cast<GLint>(value));
}

SIM_API void glTexParameteriv(GLenum target, GLenum name, const GLint* params)
{
    GlEntry entry("glTexParameteriv", {target, name, (const void*)params});
    SetTextureParameter(entry, target, name, *params);
}

SIM_API void glTexParameterfv(GLenum target, GLenum name, const GLfloat* params)
{
    GlEntry entry("glTexParameterfv", {target, name, (const void*)params});
    SetTextureParameter(entry, target, name, static_cast<GLint>(*params));
}

SIM_API void glGetTexParameteriv(GLenum target, GLenum name, GLint* params)
{
    GlEntry entry("glGetTexParameteriv", {target, name, (const void*)params});
    GetTextureParameter(entry, target, name, params);
}

SIM_API void glGetTexParameterfv(GLenum target, GLenum name, GLfloat* params)
{
    GlEntry entry("glGetTexParameterfv", {target, name, (const void*)params});
    GetTextureParameter(entry, target, name, params);
}

SIM_API void glGenSamplers(GLsizei n, GLuint* samplers)
{
    GlEntry entry("glGenSamplers", {n, (const void*)samplers}, 30);
    Generate(entry, entry ? &entry.Group().samplers : nullptr, n, samplers);
}

SIM_API void glDeleteSamplers(GLsizei n, const GLuint* samplers)
{
    GlEntry entry("glDeleteSamplers", {n, (const void*)samplers}, 30);
    Delete(entry, entry ? &entry.Group().samplers : nullptr, n, samplers,
           [&](GLuint name)
           {
               for (GLuint& bound : entry.Gl().samplers)
                   bound = bound == name ? 0 : bound;
               entry.Group().samplers.Erase(name);
           });
}

SIM_API GLboolean glIsSampler(GLuint name)
{
    GlEntry entry("glIsSampler", {name}, 30);
    return entry && entry.Group().samplers.Find(name) ? GL_TRUE : GL_FALSE;
}

SIM_API void glBindSampler(GLuint unit, GLuint name)
{
    GlEntry entry("glBindSampler", {unit, name}, 30);
    if (!entry)
        return;
    const int limit = std::min(entry.state.gpu.maxCombinedTextureUnits, kTextureUnits);
    if (unit >= static_cast<GLuint>(limit))
        return entry.Misuse(GL_INVALID_VALUE, "no such texture unit: " + std::to_string(unit));
    if (name != 0)
    {
        Sampler* const sampler = FindSampler(entry, name);
        if (!sampler)
            return;
        sampler->created = true;
    }
    entry.Gl().samplers[unit] = name;
}

SIM_API void glSamplerParameteri(GLuint sampler, GLenum name, GLint value)
{
    GlEntry entry("glSamplerParameteri", {sampler, name, value}, 30);
    SetSamplerParameter(entry, sampler, name, value);
}

SIM_API void glSamplerParameterf(GLuint sampler, GLenum name, GLfloat value)
{
    GlEntry entry("glSamplerParameterf", {sampler, name, value}, 30);
    SetSamplerParameter(entry, sampler, name, static_cast<GLint>(value));
}

SIM_API void glSamplerParameteriv(GLuint sampler, GLenum name, const GLint* params)
{
    GlEntry entry("glSamplerParameteriv", {sampler, name, (const void*)params}, 30);
    SetSamplerParameter(entry, sampler, name, *params);
}

SIM_API void glSamplerParameterfv(GLuint sampler, GLenum name, const GLfloat* params)
{
    GlEntry entry("glSamplerParameterfv", {sampler, name, (const void*)params}, 30);
    SetSamplerParameter(entry, sampler, name, static_cast<GLint>(*params));
}

SIM_API void glGetSamplerParameteriv(GLuint sampler, GLenum name, GLint* params)
{
    GlEntry entry("glGetSamplerParameteriv", {sampler, name, (const void*)params}, 30);
    GetSamplerParameter(entry, sampler, name, params);
}

SIM_API void glGetSamplerParameterfv(GLuint sampler, GLenum name, GLfloat* params)
{
    GlEntry entry("glGetSamplerParameterfv", {sampler, name, (const void*)params}, 30);
    GetSamplerParameter(entry, sampler, name, params);
}
