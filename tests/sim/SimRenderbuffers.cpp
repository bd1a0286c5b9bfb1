#include "SimGl.h"

// Renderbuffer objects.

namespace Sim
{

namespace
{

/// A deleted renderbuffer is attached to no bound framebuffer any more.
void ForgetRenderbuffer(GlState& gl, GLuint name)
{
    gl.renderbuffer = gl.renderbuffer == name ? 0 : gl.renderbuffer;
    for (const GLuint bound : {gl.drawFramebuffer, gl.readFramebuffer})
    {
        Framebuffer* const framebuffer = gl.framebuffers.Find(bound);
        if (!framebuffer)
            continue;
        std::erase_if(framebuffer->attachments, [&](const auto& item)
                      { return item.second.type == GL_RENDERBUFFER && item.second.name == name; });
    }
}

Renderbuffer* BoundRenderbuffer(GlEntry& entry, GLenum target)
{
    if (target != GL_RENDERBUFFER)
    {
        entry.Misuse(GL_INVALID_ENUM, "no such target: " + Hex(target));
        return nullptr;
    }
    Renderbuffer* const buffer = entry.Group().renderbuffers.Find(entry.Gl().renderbuffer);
    if (!buffer)
        entry.Misuse(GL_INVALID_OPERATION, "no renderbuffer is bound");
    return buffer;
}

void Allocate(GlEntry& entry, GLenum target, GLsizei samples, GLenum internalFormat, GLsizei width,
              GLsizei height)
{
    Renderbuffer* const buffer = entry ? BoundRenderbuffer(entry, target) : nullptr;
    if (!buffer)
        return;
    const PixelFormat layout = StorageLayout(internalFormat);
    if (layout.format == 0)
        return entry.Misuse(GL_INVALID_ENUM, "no such internal format: " + Hex(internalFormat));
    const int limit = entry.state.gpu.maxRenderbufferSize;
    if (width < 0 || height < 0 || width > limit || height > limit)
        return entry.Misuse(GL_INVALID_VALUE, "the size");
    if (samples > entry.state.gpu.maxSamples)
        return entry.Misuse(GL_INVALID_OPERATION, "the number of samples");
    buffer->samples = samples;
    buffer->image = Image{};
    buffer->image.width = width;
    buffer->image.height = height;
    buffer->image.internalFormat = internalFormat;
    buffer->image.layout = layout;
}

} // namespace

} // namespace Sim

using namespace Sim;

SIM_API void glGenRenderbuffers(GLsizei n, GLuint* renderbuffers)
{
    GlEntry entry("glGenRenderbuffers", {n, (const void*)renderbuffers});
    Generate(entry, entry ? &entry.Group().renderbuffers : nullptr, n, renderbuffers);
}

SIM_API void glDeleteRenderbuffers(GLsizei n, const GLuint* renderbuffers)
{
    GlEntry entry("glDeleteRenderbuffers", {n, (const void*)renderbuffers});
    Delete(entry, entry ? &entry.Group().renderbuffers : nullptr, n, renderbuffers,
           [&](GLuint name)
           {
               ForgetRenderbuffer(entry.Gl(), name);
               entry.Group().renderbuffers.Erase(name);
           });
}

SIM_API GLboolean glIsRenderbuffer(GLuint name)
{
    GlEntry entry("glIsRenderbuffer", {name});
    const Renderbuffer* const buffer = entry ? entry.Group().renderbuffers.Find(name) : nullptr;
    return buffer && buffer->created ? GL_TRUE : GL_FALSE;
}

SIM_API void glBindRenderbuffer(GLenum target, GLuint name)
{
    GlEntry entry("glBindRenderbuffer", {target, name});
    if (!entry)
        return;
    if (target != GL_RENDERBUFFER)
        return entry.Misuse(GL_INVALID_ENUM, "no such target: " + Hex(target));
    if (name != 0)
        Bind(entry, entry.Group().renderbuffers, name);
    entry.Gl().renderbuffer = name;
}

SIM_API void glRenderbufferStorage(GLenum target, GLenum internalFormat, GLsizei width,
                                   GLsizei height)
{
    GlEntry entry("glRenderbufferStorage", {target, internalFormat, width, height});
    Allocate(entry, target, 0, internalFormat, width, height);
}

SIM_API void glRenderbufferStorageMultisample(GLenum target, GLsizei samples, GLenum internalFormat,
                                              GLsizei width, GLsizei height)
{
    GlEntry entry("glRenderbufferStorageMultisample",
                  {target, samples, internalFormat, width, height}, 30);
    Allocate(entry, target, samples, internalFormat, width, height);
}

SIM_API void glGetRenderbufferParameteriv(GLenum target, GLenum name, GLint* params)
{
    GlEntry entry("glGetRenderbufferParameteriv", {target, name, (const void*)params});
    const Renderbuffer* const buffer = entry ? BoundRenderbuffer(entry, target) : nullptr;
    if (!buffer)
        return;
    const GLenum format = buffer->image.internalFormat;
    switch (name)
    {
    case GL_RENDERBUFFER_WIDTH: *params = buffer->image.width; break;
    case GL_RENDERBUFFER_HEIGHT: *params = buffer->image.height; break;
    case GL_RENDERBUFFER_INTERNAL_FORMAT: *params = static_cast<GLint>(format); break;
    case GL_RENDERBUFFER_SAMPLES: *params = buffer->samples; break;
    case GL_RENDERBUFFER_DEPTH_SIZE: *params = IsDepthFormat(format) ? 24 : 0; break;
    case GL_RENDERBUFFER_STENCIL_SIZE: *params = IsStencilFormat(format) ? 8 : 0; break;
    case GL_RENDERBUFFER_RED_SIZE:
    case GL_RENDERBUFFER_GREEN_SIZE:
    case GL_RENDERBUFFER_BLUE_SIZE:
    case GL_RENDERBUFFER_ALPHA_SIZE:
        *params = IsColorRenderable(entry.state.gpu, format) ? 8 : 0;
        break;
    default: entry.Misuse(GL_INVALID_ENUM, "renderbuffers have no such parameter: " + Hex(name));
    }
}

SIM_API void glGetInternalformativ(GLenum target, GLenum internalFormat, GLenum name, GLsizei count,
                                   GLint* params)
{
    GlEntry entry("glGetInternalformativ",
                  {target, internalFormat, name, count, (const void*)params}, 30);
    if (!entry || count < 1)
        return;
    if (name == GL_NUM_SAMPLE_COUNTS)
        *params = 1;
    else if (name == GL_SAMPLES)
        *params = entry.state.gpu.maxSamples;
    else
        entry.Misuse(GL_INVALID_ENUM, "no such parameter: " + Hex(name));
}
