#include "SimEgl.h"
#include "SimGl.h"
#include "SimPicture.h"

#include <cstring>

// What changes and reads pixels: clears, read-backs, copies, invalidation.

namespace Sim
{

Box DrawArea(const GlState& gl, const Image& image)
{
    Box area = image.Area();
    if (gl.tiling && gl.drawFramebuffer == 0)
        area = Intersection(*gl.tiling, area);
    if (!gl.enabled.count(GL_SCISSOR_TEST))
        return area;
    return Intersection({gl.scissor[0], gl.scissor[1], gl.scissor[2], gl.scissor[3]}, area);
}

namespace
{

constexpr std::array<bool, 4> kAllChannels{true, true, true, true};

void ClearDepth(GlEntry& entry, double depth)
{
    const GlState& gl = entry.Gl();
    const Framebuffer* const framebuffer = gl.framebuffers.Find(gl.drawFramebuffer);
    if (!framebuffer || !gl.depthMask)
        return;
    const auto found = framebuffer->attachments.find(GL_DEPTH_ATTACHMENT);
    if (found == framebuffer->attachments.end())
        return;
    Image* const image = AttachedImage(entry.Group(), found->second);
    image->Fill(DrawArea(gl, *image), {depth, 0, 0, 1}, kAllChannels);
}

bool IsNormalised(const Image& image)
{
    return IsOneOf(image.layout.format, {GL_RED, GL_RG, GL_RGB, GL_RGBA, GL_LUMINANCE, GL_ALPHA,
                                         GL_LUMINANCE_ALPHA, 0x80E1 /* GL_BGRA_EXT */}) &&
           image.layout.type != GL_FLOAT && image.layout.type != GL_HALF_FLOAT;
}

bool CanRead(const Image& image, const PixelFormat& layout)
{
    if (layout == image.layout)
        return true;
    if (layout == PixelFormat{GL_RGBA, GL_UNSIGNED_BYTE})
        return IsNormalised(image);
    return layout == PixelFormat{GL_RGBA, GL_FLOAT} && !IsNormalised(image);
}

void Download(GlEntry& entry, const Image& image, const Box& area, const PixelFormat& layout,
              void* pixels)
{
    const PixelStore& pack = entry.Gl().pack;
    const std::size_t pixelSize = BytesPerPixel(layout);
    const std::size_t last = pack.OffsetOf(area.height - 1, 0, area.width, area.height, pixelSize);
    unsigned char* const target =
        PixelMemory(entry, GL_PIXEL_PACK_BUFFER, pixels,
                    last + static_cast<std::size_t>(area.width) * pixelSize);
    if (!target)
        return;
    const Box inside = Intersection(area, image.Area());
    for (int y = inside.y; y < inside.y + inside.height; ++y)
    {
        unsigned char* const row =
            target + pack.OffsetOf(y - area.y, 0, area.width, area.height, pixelSize);
        for (int x = inside.x; x < inside.x + inside.width; ++x)
            EncodePixel(layout, image.Read(x, y),
                        row + static_cast<std::size_t>(x - area.x) * pixelSize);
    }
}

bool IsInvalidatable(GLenum attachment, bool window)
{
    if (window)
        return IsOneOf(attachment, {GL_COLOR, GL_DEPTH, GL_STENCIL});
    return (attachment >= GL_COLOR_ATTACHMENT0 && attachment < GL_COLOR_ATTACHMENT0 + 4) ||
           IsOneOf(attachment,
                   {GL_DEPTH_ATTACHMENT, GL_STENCIL_ATTACHMENT, GL_DEPTH_STENCIL_ATTACHMENT});
}

/// The colour image behind an attachment that is invalidated; null for depth and stencil.
Image* ColorImage(GlEntry& entry, GLenum attachment)
{
    const GlState& gl = entry.Gl();
    const Framebuffer* const framebuffer = gl.framebuffers.Find(gl.drawFramebuffer);
    if (!framebuffer)
        return attachment == GL_COLOR && entry.DrawSurface()
                   ? &DrawImage(entry.state, *entry.DrawSurface())
                   : nullptr;
    const auto found = framebuffer->attachments.find(attachment);
    const bool isColor =
        attachment >= GL_COLOR_ATTACHMENT0 && attachment < GL_COLOR_ATTACHMENT0 + 4;
    return isColor && found != framebuffer->attachments.end()
               ? AttachedImage(entry.Group(), found->second)
               : nullptr;
}

void Invalidate(GlEntry& entry, GLenum target, GLsizei count, const GLenum* attachments,
                const std::optional<Box>& area)
{
    entry.List(attachments, count);
    if (!entry || !CheckFramebufferTarget(entry, target) || !CheckCount(entry, count))
        return;
    const Color undefined = Undefined(entry.state);
    for (GLsizei i = 0; i < count; ++i)
    {
        if (!IsInvalidatable(attachments[i], entry.Gl().drawFramebuffer == 0))
            return entry.Misuse(GL_INVALID_ENUM, "no such attachment: " + Hex(attachments[i]));
        if (Image* const image = ColorImage(entry, attachments[i]))
            image->Fill(area.value_or(image->Area()), undefined, kAllChannels);
    }
}

/// The nearest source pixel for pixel @p to of a blit along one axis.
int BlitSource(int to, int from0, int from1, int to0, int to1)
{
    const double share = (to + 0.5 - to0) / (to1 - to0);
    return static_cast<int>(from0 + share * (from1 - from0));
}

template <typename T>
void ClearOne(GlEntry& entry, GLenum buffer, GLint index, const T* value)
{
    if (!entry)
        return;
    const std::optional<std::vector<Image*>> images = DrawImages(entry);
    if (!images)
        return;
    if (buffer == GL_DEPTH)
        return ClearDepth(entry, static_cast<double>(value[0]));
    if (buffer != GL_COLOR && buffer != GL_STENCIL)
        return entry.Misuse(GL_INVALID_ENUM, "no such buffer: " + Hex(buffer));
    if (buffer == GL_STENCIL || static_cast<std::size_t>(index) >= images->size())
        return;
    Image& image = *(*images)[static_cast<std::size_t>(index)];
    Color color{};
    std::copy(value, value + 4, color.begin());
    image.Fill(DrawArea(entry.Gl(), image), color, entry.Gl().colorMask);
}

} // namespace

} // namespace Sim

using namespace Sim;

SIM_API void glClear(GLbitfield mask)
{
    GlEntry entry("glClear", {mask});
    if (!entry)
        return;
    if ((mask & ~(GL_COLOR_BUFFER_BIT | GL_DEPTH_BUFFER_BIT | GL_STENCIL_BUFFER_BIT)) != 0)
        return entry.Misuse(GL_INVALID_VALUE, "no such buffer: " + Hex(mask));
    const std::optional<std::vector<Image*>> images = DrawImages(entry);
    if (!images)
        return;
    const GlState& gl = entry.Gl();
    for (Image* image : *images)
    {
        if ((mask & GL_COLOR_BUFFER_BIT) == 0)
            continue;
        const Box area = DrawArea(gl, *image);
        if (gl.drawFramebuffer == 0)
            LoseTiles(entry.state, *entry.DrawSurface(), area);
        image->Fill(area, gl.clearColor, gl.colorMask);
    }
    if ((mask & GL_DEPTH_BUFFER_BIT) != 0)
        ClearDepth(entry, gl.clearDepth);
}

SIM_API void glClearBufferfv(GLenum buffer, GLint index, const GLfloat* value)
{
    GlEntry entry("glClearBufferfv", {buffer, index, (const void*)value}, 30);
    ClearOne(entry, buffer, index, value);
}

SIM_API void glClearBufferiv(GLenum buffer, GLint index, const GLint* value)
{
    GlEntry entry("glClearBufferiv", {buffer, index, (const void*)value}, 30);
    ClearOne(entry, buffer, index, value);
}

SIM_API void glClearBufferuiv(GLenum buffer, GLint index, const GLuint* value)
{
    GlEntry entry("glClearBufferuiv", {buffer, index, (const void*)value}, 30);
    ClearOne(entry, buffer, index, value);
}

SIM_API void glClearBufferfi(GLenum buffer, GLint index, GLfloat depth, GLint stencil)
{
    GlEntry entry("glClearBufferfi", {buffer, index, depth, stencil}, 30);
    if (!entry)
        return;
    if (buffer != GL_DEPTH_STENCIL)
        return entry.Misuse(GL_INVALID_ENUM, "no such buffer: " + Hex(buffer));
    if (DrawImages(entry))
        ClearDepth(entry, depth);
}

SIM_API void glReadPixels(GLint x, GLint y, GLsizei width, GLsizei height, GLenum format,
                          GLenum type, void* pixels)
{
    GlEntry entry("glReadPixels", {x, y, width, height, format, type, (const void*)pixels});
    if (!entry)
        return;
    if (!IsClientFormat(entry.state.gpu, format) || !IsClientType(type))
        return entry.Misuse(GL_INVALID_ENUM,
                            "no such format or type: " + Hex(format) + ", " + Hex(type));
    if (width < 0 || height < 0)
        return entry.Misuse(GL_INVALID_VALUE, "a negative size");
    const Image* const image = ReadImage(entry);
    if (!image || width == 0 || height == 0)
        return;
    if (!CanRead(*image, {format, type}))
        return entry.Misuse(GL_INVALID_OPERATION,
                            "the image cannot be read as " + Hex(format) + ", " + Hex(type));
    Download(entry, *image, {x, y, width, height}, {format, type}, pixels);
    NotePicture(entry.state, "read", *image, {x, y, width, height});
}

SIM_API void glBlitFramebuffer(GLint srcX0, GLint srcY0, GLint srcX1, GLint srcY1, GLint dstX0,
                               GLint dstY0, GLint dstX1, GLint dstY1, GLbitfield mask,
                               GLenum filter)
{
    GlEntry entry("glBlitFramebuffer",
                  {srcX0, srcY0, srcX1, srcY1, dstX0, dstY0, dstX1, dstY1, mask, filter}, 30);
    if (!entry || (mask & GL_COLOR_BUFFER_BIT) == 0)
        return;
    const std::optional<std::vector<Image*>> images = DrawImages(entry);
    const Image* const source = images ? ReadImage(entry) : nullptr;
    if (!source)
        return;
    const Image from = *source;
    for (Image* image : *images)
    {
        const Box wanted{std::min(dstX0, dstX1), std::min(dstY0, dstY1), std::abs(dstX1 - dstX0),
                         std::abs(dstY1 - dstY0)};
        const Box area = Intersection(wanted, DrawArea(entry.Gl(), *image));
        image->drawn = CopiedInto(*image, from, area);
        for (int y = area.y; y < area.y + area.height; ++y)
        {
            for (int x = area.x; x < area.x + area.width; ++x)
                image->Write(x, y,
                             from.Read(BlitSource(x, srcX0, srcX1, dstX0, dstX1),
                                       BlitSource(y, srcY0, srcY1, dstY0, dstY1)));
        }
    }
}

SIM_API void glInvalidateFramebuffer(GLenum target, GLsizei count, const GLenum* attachments)
{
    GlEntry entry("glInvalidateFramebuffer", {target, count, (const void*)attachments}, 30);
    Invalidate(entry, target, count, attachments, std::nullopt);
}

SIM_API void glInvalidateSubFramebuffer(GLenum target, GLsizei count, const GLenum* attachments,
                                        GLint x, GLint y, GLsizei width, GLsizei height)
{
    GlEntry entry("glInvalidateSubFramebuffer",
                  {target, count, (const void*)attachments, x, y, width, height}, 30);
    Invalidate(entry, target, count, attachments, Box{x, y, width, height});
}

SIM_API void glFlush()
{
    GlEntry entry("glFlush", {});
    if (!entry)
        return;
    FlushContext(entry.CurrentContext());
    if (entry.DrawSurface())
        ShowFrontBuffer(entry.state, *entry.DrawSurface());
}

SIM_API void glFinish()
{
    GlEntry entry("glFinish", {});
    if (!entry)
        return;
    FlushContext(entry.CurrentContext());
    State& state = entry.state;
    entry.Wait([&] { return state.pace != SimPace::Held; });
    SignalAll(state);
    if (entry.DrawSurface())
        ShowFrontBuffer(state, *entry.DrawSurface());
}
