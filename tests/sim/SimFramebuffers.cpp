#include "SimEgl.h"
#include "SimGl.h"

// Framebuffer and renderbuffer objects: names, attachments, completeness.

namespace Sim
{

bool CheckFramebufferTarget(GlEntry& entry, GLenum target)
{
    const bool es3 = IsOneOf(target, {GL_DRAW_FRAMEBUFFER, GL_READ_FRAMEBUFFER});
    if (target == GL_FRAMEBUFFER || (es3 && entry.Version() >= 30))
        return true;
    entry.Misuse(GL_INVALID_ENUM, "no such framebuffer target: " + Hex(target));
    return false;
}

namespace
{

Framebuffer* BoundFramebuffer(GlEntry& entry, GLenum target)
{
    const GlState& gl = entry.Gl();
    return gl.framebuffers.Find(target == GL_READ_FRAMEBUFFER ? gl.readFramebuffer
                                                              : gl.drawFramebuffer);
}

bool IsColorPoint(GLenum point)
{
    return point >= GL_COLOR_ATTACHMENT0 && point < GL_COLOR_ATTACHMENT0 + 4;
}

bool IsAttachmentPoint(GLenum point)
{
    return IsColorPoint(point) || IsOneOf(point, {GL_DEPTH_ATTACHMENT, GL_STENCIL_ATTACHMENT,
                                                  GL_DEPTH_STENCIL_ATTACHMENT});
}

/// The framebuffer that an attachment call changes; null, with the error set, when there is none.
Framebuffer* Attachable(GlEntry& entry, GLenum target, GLenum point)
{
    if (!CheckFramebufferTarget(entry, target))
        return nullptr;
    if (!IsAttachmentPoint(point))
    {
        entry.Misuse(GL_INVALID_ENUM, "no such attachment point: " + Hex(point));
        return nullptr;
    }
    Framebuffer* const framebuffer = BoundFramebuffer(entry, target);
    if (!framebuffer)
        entry.Misuse(GL_INVALID_OPERATION, "no framebuffer is bound");
    return framebuffer;
}

void Attach(Framebuffer& framebuffer, GLenum point, const SimAttachment& attachment)
{
    const bool both = point == GL_DEPTH_STENCIL_ATTACHMENT;
    const std::vector<GLenum> points =
        both ? std::vector<GLenum>{GL_DEPTH_ATTACHMENT, GL_STENCIL_ATTACHMENT} : std::vector{point};
    for (const GLenum one : points)
    {
        if (attachment.type == GL_NONE)
            framebuffer.attachments.erase(one);
        else
            framebuffer.attachments[one] = attachment;
    }
}

bool IsRenderable(const SimGpu& gpu, GLenum point, GLenum internalFormat)
{
    if (point == GL_DEPTH_ATTACHMENT)
        return IsDepthFormat(internalFormat);
    if (point == GL_STENCIL_ATTACHMENT)
        return IsStencilFormat(internalFormat);
    return IsColorRenderable(gpu, internalFormat);
}

bool HasSeparateDepthAndStencil(const Framebuffer& framebuffer)
{
    const auto depth = framebuffer.attachments.find(GL_DEPTH_ATTACHMENT);
    const auto stencil = framebuffer.attachments.find(GL_STENCIL_ATTACHMENT);
    return depth != framebuffer.attachments.end() && stencil != framebuffer.attachments.end() &&
           !(depth->second == stencil->second);
}

GLenum StatusOf(GlEntry& entry, const Framebuffer& framebuffer)
{
    if (framebuffer.attachments.empty())
        return GL_FRAMEBUFFER_INCOMPLETE_MISSING_ATTACHMENT;
    const Image* first = nullptr;
    for (const auto& [point, attachment] : framebuffer.attachments)
    {
        const Image* const image = AttachedImage(entry.Group(), attachment);
        if (!image || image->width == 0 || image->height == 0 ||
            !IsRenderable(entry.state.gpu, point, image->internalFormat))
            return GL_FRAMEBUFFER_INCOMPLETE_ATTACHMENT;
        if (!first)
            first = image;
        if (entry.Version() < 30 &&
            (image->width != first->width || image->height != first->height))
            return 0x8CD9; // GL_FRAMEBUFFER_INCOMPLETE_DIMENSIONS
    }
    return HasSeparateDepthAndStencil(framebuffer) ? GL_FRAMEBUFFER_UNSUPPORTED
                                                   : GL_FRAMEBUFFER_COMPLETE;
}

} // namespace

GLenum StatusOf(GlEntry& entry, bool read)
{
    const GlState& gl = entry.Gl();
    const GLuint name = read ? gl.readFramebuffer : gl.drawFramebuffer;
    if (const Framebuffer* const framebuffer = name ? gl.framebuffers.Find(name) : nullptr)
        return StatusOf(entry, *framebuffer);
    const bool hasSurface = (read ? entry.ReadSurface() : entry.DrawSurface()) != nullptr;
    return name == 0 && hasSurface ? GL_FRAMEBUFFER_COMPLETE : GL_FRAMEBUFFER_UNDEFINED;
}

namespace
{

bool CheckComplete(GlEntry& entry, bool read)
{
    const GLenum status = StatusOf(entry, read);
    if (status == GL_FRAMEBUFFER_COMPLETE)
        return true;
    entry.Misuse(GL_INVALID_FRAMEBUFFER_OPERATION, "the framebuffer's status is " + Hex(status));
    return false;
}

} // namespace

std::optional<std::vector<Image*>> DrawImages(GlEntry& entry)
{
    if (!CheckComplete(entry, false))
        return std::nullopt;
    GlState& gl = entry.Gl();
    std::vector<Image*> images;
    const Framebuffer* const framebuffer = gl.framebuffers.Find(gl.drawFramebuffer);
    if (!framebuffer)
    {
        if (gl.defaultDrawBuffers != std::vector<GLenum>{GL_NONE})
            images.push_back(&DrawImage(entry.state, *entry.DrawSurface()));
        return images;
    }
    for (const GLenum buffer : framebuffer->drawBuffers)
    {
        const auto found = framebuffer->attachments.find(buffer);
        if (found != framebuffer->attachments.end())
            images.push_back(AttachedImage(entry.Group(), found->second));
    }
    return images;
}

Image* ReadImage(GlEntry& entry)
{
    if (!CheckComplete(entry, true))
        return nullptr;
    GlState& gl = entry.Gl();
    const Framebuffer* const framebuffer = gl.framebuffers.Find(gl.readFramebuffer);
    if (!framebuffer)
    {
        if (gl.defaultReadBuffer != GL_NONE)
            return &DrawImage(entry.state, *entry.ReadSurface());
    }
    else
    {
        const auto found = framebuffer->attachments.find(framebuffer->readBuffer);
        if (found != framebuffer->attachments.end())
            return AttachedImage(entry.Group(), found->second);
    }
    entry.Misuse(GL_INVALID_OPERATION, "there is nothing to read from");
    return nullptr;
}

} // namespace Sim

using namespace Sim;

SIM_API void glGenFramebuffers(GLsizei n, GLuint* framebuffers)
{
    GlEntry entry("glGenFramebuffers", {n, (const void*)framebuffers});
    Generate(entry, entry ? &entry.Gl().framebuffers : nullptr, n, framebuffers);
}

SIM_API void glDeleteFramebuffers(GLsizei n, const GLuint* framebuffers)
{
    GlEntry entry("glDeleteFramebuffers", {n, (const void*)framebuffers});
    Delete(entry, entry ? &entry.Gl().framebuffers : nullptr, n, framebuffers,
           [&](GLuint name)
           {
               GlState& gl = entry.Gl();
               gl.drawFramebuffer = gl.drawFramebuffer == name ? 0 : gl.drawFramebuffer;
               gl.readFramebuffer = gl.readFramebuffer == name ? 0 : gl.readFramebuffer;
               gl.framebuffers.Erase(name);
           });
}

SIM_API GLboolean glIsFramebuffer(GLuint name)
{
    GlEntry entry("glIsFramebuffer", {name});
    const Framebuffer* const framebuffer = entry ? entry.Gl().framebuffers.Find(name) : nullptr;
    return framebuffer && framebuffer->created ? GL_TRUE : GL_FALSE;
}

SIM_API void glBindFramebuffer(GLenum target, GLuint name)
{
    GlEntry entry("glBindFramebuffer", {target, name});
    if (!entry || !CheckFramebufferTarget(entry, target))
        return;
    if (name != 0)
        Bind(entry, entry.Gl().framebuffers, name);
    if (target != GL_READ_FRAMEBUFFER)
        entry.Gl().drawFramebuffer = name;
    if (target != GL_DRAW_FRAMEBUFFER)
        entry.Gl().readFramebuffer = name;
}

SIM_API GLenum glCheckFramebufferStatus(GLenum target)
{
    GlEntry entry("glCheckFramebufferStatus", {target});
    if (!entry)
        return entry.InjectedError();
    return CheckFramebufferTarget(entry, target) ? StatusOf(entry, target == GL_READ_FRAMEBUFFER)
                                                 : 0;
}

SIM_API void glFramebufferTexture2D(GLenum target, GLenum point, GLenum textureTarget, GLuint name,
                                    GLint level)
{
    GlEntry entry("glFramebufferTexture2D", {target, point, textureTarget, name, level});
    Framebuffer* const framebuffer = entry ? Attachable(entry, target, point) : nullptr;
    if (!framebuffer)
        return;
    if (name == 0)
        return Attach(*framebuffer, point, {});
    const Texture* const texture = entry.Group().textures.Find(name);
    if (!texture || texture->target == 0)
        return entry.Misuse(GL_INVALID_OPERATION, "there is no texture " + std::to_string(name));
    const bool is2D = textureTarget == GL_TEXTURE_2D && texture->target == GL_TEXTURE_2D;
    const bool isFace = textureTarget >= GL_TEXTURE_CUBE_MAP_POSITIVE_X &&
                        textureTarget <= GL_TEXTURE_CUBE_MAP_NEGATIVE_Z &&
                        texture->target == GL_TEXTURE_CUBE_MAP;
    if (!is2D && !isFace)
        return entry.Misuse(GL_INVALID_OPERATION,
                            "the texture has the target " + Hex(texture->target));
    if (level < 0 || (level != 0 && entry.Version() < 30))
        return entry.Misuse(GL_INVALID_VALUE, "no such level: " + std::to_string(level));
    Attach(*framebuffer, point, {GL_TEXTURE, name, level, 0, textureTarget});
}

SIM_API void glFramebufferTextureLayer(GLenum target, GLenum point, GLuint name, GLint level,
                                       GLint layer)
{
    GlEntry entry("glFramebufferTextureLayer", {target, point, name, level, layer}, 30);
    Framebuffer* const framebuffer = entry ? Attachable(entry, target, point) : nullptr;
    if (!framebuffer)
        return;
    if (name == 0)
        return Attach(*framebuffer, point, {});
    const Texture* const texture = entry.Group().textures.Find(name);
    if (!texture || !IsOneOf(texture->target, {GL_TEXTURE_3D, GL_TEXTURE_2D_ARRAY}))
        return entry.Misuse(GL_INVALID_OPERATION,
                            "there is no layered texture " + std::to_string(name));
    if (level < 0 || layer < 0)
        return entry.Misuse(GL_INVALID_VALUE, "a negative level or layer");
    Attach(*framebuffer, point, {GL_TEXTURE, name, level, layer, 0});
}

SIM_API void glFramebufferRenderbuffer(GLenum target, GLenum point, GLenum renderbufferTarget,
                                       GLuint name)
{
    GlEntry entry("glFramebufferRenderbuffer", {target, point, renderbufferTarget, name});
    Framebuffer* const framebuffer = entry ? Attachable(entry, target, point) : nullptr;
    if (!framebuffer)
        return;
    if (renderbufferTarget != GL_RENDERBUFFER)
        return entry.Misuse(GL_INVALID_ENUM, "no such target: " + Hex(renderbufferTarget));
    if (name == 0)
        return Attach(*framebuffer, point, {});
    const Renderbuffer* const buffer = entry.Group().renderbuffers.Find(name);
    if (!buffer || !buffer->created)
        return entry.Misuse(GL_INVALID_OPERATION,
                            "there is no renderbuffer " + std::to_string(name));
    Attach(*framebuffer, point, {GL_RENDERBUFFER, name, 0, 0, 0});
}

SIM_API void glGetFramebufferAttachmentParameteriv(GLenum target, GLenum point, GLenum name,
                                                   GLint* params)
{
    GlEntry entry("glGetFramebufferAttachmentParameteriv",
                  {target, point, name, (const void*)params});
    const Framebuffer* const framebuffer = entry ? Attachable(entry, target, point) : nullptr;
    if (!framebuffer)
        return;
    const GLenum one = point == GL_DEPTH_STENCIL_ATTACHMENT ? GLenum{GL_DEPTH_ATTACHMENT} : point;
    const auto found = framebuffer->attachments.find(one);
    const SimAttachment none;
    const SimAttachment& attachment =
        found == framebuffer->attachments.end() ? none : found->second;
    switch (name)
    {
    case GL_FRAMEBUFFER_ATTACHMENT_OBJECT_TYPE:
        *params = static_cast<GLint>(attachment.type);
        break;
    case GL_FRAMEBUFFER_ATTACHMENT_OBJECT_NAME:
        *params = static_cast<GLint>(attachment.name);
        break;
    case GL_FRAMEBUFFER_ATTACHMENT_TEXTURE_LEVEL: *params = attachment.level; break;
    case GL_FRAMEBUFFER_ATTACHMENT_TEXTURE_LAYER: *params = attachment.layer; break;
    case GL_FRAMEBUFFER_ATTACHMENT_TEXTURE_CUBE_MAP_FACE:
        *params = attachment.textureTarget == GL_TEXTURE_2D
                      ? 0
                      : static_cast<GLint>(attachment.textureTarget);
        break;
    default: entry.Misuse(GL_INVALID_ENUM, "attachments have no such parameter: " + Hex(name));
    }
}

SIM_API void glDrawBuffers(GLsizei n, const GLenum* buffers)
{
    GlEntry entry("glDrawBuffers", {n, (const void*)buffers}, 30);
    entry.List(buffers, n);
    if (!entry || !CheckCount(entry, n))
        return;
    const std::vector<GLenum> list(buffers, buffers + n);
    Framebuffer* const framebuffer = BoundFramebuffer(entry, GL_DRAW_FRAMEBUFFER);
    if (framebuffer)
        framebuffer->drawBuffers = list;
    else if (n == 1 && IsOneOf(list[0], {GL_BACK, GL_NONE}))
        entry.Gl().defaultDrawBuffers = list;
    else
        entry.Misuse(GL_INVALID_OPERATION, "the window has one back buffer");
}

SIM_API void glReadBuffer(GLenum buffer)
{
    GlEntry entry("glReadBuffer", {buffer}, 30);
    if (!entry)
        return;
    Framebuffer* const framebuffer = BoundFramebuffer(entry, GL_READ_FRAMEBUFFER);
    if (framebuffer && (buffer == GL_NONE || IsColorPoint(buffer)))
        framebuffer->readBuffer = buffer;
    else if (!framebuffer && IsOneOf(buffer, {GL_BACK, GL_NONE}))
        entry.Gl().defaultReadBuffer = buffer;
    else
        entry.Misuse(GL_INVALID_OPERATION, "no such buffer: " + Hex(buffer));
}
