#include "SimGl.h"
#include "SimPicture.h"

#include <cstring>

// Contents of textures: uploads, copies from the framebuffer, storage.

namespace Sim
{

namespace
{

bool IsCubeFace(GLenum target)
{
    return target >= GL_TEXTURE_CUBE_MAP_POSITIVE_X && target <= GL_TEXTURE_CUBE_MAP_NEGATIVE_Z;
}

/// A level of a texture that a call names.
struct Place
{
    GLenum target = 0;
    GLint level = 0;
    Texture* texture = nullptr;
    Image* image = nullptr; // null as long as the level has no image
};

/// The place, for a call on 2D or 3D images; its texture is null, with the error set, when there is
/// none.
Place FindPlace(GlEntry& entry, GLenum target, GLint level, bool volume)
{
    Place place{target, level, nullptr, nullptr};
    const bool known = volume ? IsOneOf(target, {GL_TEXTURE_3D, GL_TEXTURE_2D_ARRAY})
                              : target == GL_TEXTURE_2D || IsCubeFace(target);
    if (!known)
    {
        entry.Misuse(GL_INVALID_ENUM, "no such image target: " + Hex(target));
        return place;
    }
    if (level < 0 || (1 << std::min(level, 30)) > entry.state.gpu.maxTextureSize)
    {
        entry.Misuse(GL_INVALID_VALUE, "no such level: " + std::to_string(level));
        return place;
    }
    const GLenum binding = IsCubeFace(target) ? GL_TEXTURE_CUBE_MAP : target;
    place.texture = BoundTexture(entry, binding);
    if (place.texture && !place.texture->created)
        entry.Misuse("no texture is bound");
    if (place.texture)
    {
        const auto found = place.texture->levels.find({target, level});
        if (found != place.texture->levels.end())
            place.image = &found->second;
    }
    return place;
}

bool CheckSize(GlEntry& entry, const Place& place, GLsizei width, GLsizei height, GLsizei depth)
{
    const int limit = entry.state.gpu.maxTextureSize >> place.level;
    if (width >= 0 && height >= 0 && depth >= 0 && width <= limit && height <= limit &&
        depth <= limit && (!IsCubeFace(place.target) || width == height))
        return true;
    entry.Misuse(GL_INVALID_VALUE, "the size " + std::to_string(width) + " x " +
                                       std::to_string(height) + " x " + std::to_string(depth));
    return false;
}

bool CheckFormats(GlEntry& entry, GLenum internalFormat, const PixelFormat& layout)
{
    const SimGpu& gpu = entry.state.gpu;
    if (!IsClientFormat(gpu, layout.format) || !IsClientType(layout.type))
        entry.Misuse(GL_INVALID_ENUM,
                     "no such format or type: " + Hex(layout.format) + ", " + Hex(layout.type));
    else if (!IsInternalFormat(gpu, internalFormat))
        entry.Misuse(GL_INVALID_VALUE, "no such internal format: " + Hex(internalFormat));
    else if (!CanUpload(internalFormat, layout))
        entry.Misuse(GL_INVALID_OPERATION,
                     "formats that do not go together: " + Hex(internalFormat) + ", " +
                         Hex(layout.format) + ", " + Hex(layout.type));
    else
        return true;
    return false;
}

bool CheckMutable(GlEntry& entry, const Place& place)
{
    if (!place.texture->immutable)
        return true;
    entry.Misuse(GL_INVALID_OPERATION, "the texture's storage is immutable");
    return false;
}

Image NewImage(GLsizei width, GLsizei height, GLsizei depth, GLenum internalFormat,
               const PixelFormat& layout)
{
    Image image;
    image.width = width;
    image.height = height;
    image.depth = depth;
    image.internalFormat = internalFormat;
    image.layout = layout;
    return image;
}

/// A part of an image: pixels, rows and layers.
struct Region
{
    GLint x = 0;
    GLint y = 0;
    GLint z = 0;
    GLsizei width = 0;
    GLsizei height = 0;
    GLsizei depth = 1;
};

/// Copies client memory into a region, as the unpack parameters say. Null pixels change nothing.
void Upload(GlEntry& entry, Image& image, const Region& region, const PixelFormat& layout,
            const void* pixels)
{
    const PixelStore& unpack = entry.Gl().unpack;
    const std::size_t pixelSize = BytesPerPixel(layout);
    if (region.width == 0 || region.height == 0 || region.depth == 0)
        return;
    const std::size_t last = unpack.OffsetOf(region.height - 1, region.depth - 1, region.width,
                                             region.height, pixelSize);
    const std::size_t rowBytes = static_cast<std::size_t>(region.width) * pixelSize;
    const unsigned char* const source =
        PixelMemory(entry, GL_PIXEL_UNPACK_BUFFER, pixels, last + rowBytes);
    if (!source)
        return;
    std::vector<unsigned char>& bytes = image.Bytes();
    for (GLsizei layer = 0; layer < region.depth; ++layer)
    {
        for (GLsizei row = 0; row < region.height; ++row)
        {
            const unsigned char* const from =
                source + unpack.OffsetOf(row, layer, region.width, region.height, pixelSize);
            const std::size_t line = (static_cast<std::size_t>(region.z + layer) *
                                          static_cast<std::size_t>(image.height) +
                                      static_cast<std::size_t>(region.y + row)) *
                                         static_cast<std::size_t>(image.width) +
                                     static_cast<std::size_t>(region.x);
            std::memcpy(bytes.data() + line * pixelSize, from, rowBytes);
        }
    }
}

void SpecifyImage(GlEntry& entry, const Place& place, const Region& size, GLint internalFormat,
                  GLint border, const PixelFormat& layout, const void* pixels)
{
    const GLenum internal = static_cast<GLenum>(internalFormat);
    if (!place.texture || !CheckFormats(entry, internal, layout) ||
        !CheckSize(entry, place, size.width, size.height, size.depth) ||
        !CheckMutable(entry, place))
        return;
    if (border != 0)
        return entry.Misuse(GL_INVALID_VALUE, "a border");
    Image& image = place.texture->levels[{place.target, place.level}];
    image = NewImage(size.width, size.height, size.depth, internal, layout);
    Upload(entry, image, size, layout, pixels);
}

bool CheckRegion(GlEntry& entry, const Place& place, const Region& region)
{
    if (!place.image)
        entry.Misuse(GL_INVALID_OPERATION, "the level has no image");
    else if (region.x < 0 || region.y < 0 || region.z < 0 || region.width < 0 ||
             region.height < 0 || region.depth < 0 ||
             region.x + region.width > place.image->width ||
             region.y + region.height > place.image->height ||
             region.z + region.depth > place.image->depth)
        entry.Misuse(GL_INVALID_VALUE, "the region lies outside of the image");
    else
        return true;
    return false;
}

void UpdateImage(GlEntry& entry, const Place& place, const Region& region,
                 const PixelFormat& layout, const void* pixels)
{
    if (!place.texture || !CheckRegion(entry, place, region))
        return;
    if (!CheckFormats(entry, place.image->internalFormat, layout))
        return;
    if (BytesPerPixel(layout) != place.image->PixelSize())
        return entry.Misuse(GL_INVALID_OPERATION, "the layout differs from the image's");
    if (!pixels && entry.Gl().buffers[GL_PIXEL_UNPACK_BUFFER] == 0)
        return entry.Misuse("no pixels");
    Upload(entry, *place.image, region, layout, pixels);
}

/// Copies from the framebuffer; pixels outside of it stay as they are.
void CopyPixels(const Image& source, GLint x, GLint y, Image& target, const Region& region)
{
    target.drawn = CopiedInto(target, source, {x, y, region.width, region.height});
    for (GLsizei row = 0; row < region.height; ++row)
    {
        for (GLsizei column = 0; column < region.width; ++column)
        {
            if (x + column >= 0 && x + column < source.width && y + row >= 0 &&
                y + row < source.height)
                target.Write(region.x + column, region.y + row, source.Read(x + column, y + row),
                             region.z);
        }
    }
}

void AllocateStorage(GlEntry& entry, GLenum target, GLsizei levels, GLenum internalFormat,
                     Region size, bool shrinkDepth)
{
    Texture* const texture = BoundTexture(entry, target);
    const PixelFormat layout = StorageLayout(internalFormat);
    if (!texture)
        return;
    if (layout.format == 0)
        return entry.Misuse(GL_INVALID_ENUM, "no such internal format: " + Hex(internalFormat));
    if (levels < 1 || size.width < 1 || size.height < 1 || size.depth < 1)
        return entry.Misuse(GL_INVALID_VALUE, "an empty storage");
    if (texture->immutable || !texture->created)
        return entry.Misuse(GL_INVALID_OPERATION, "the texture cannot get a storage");
    texture->immutable = true;
    texture->levels.clear();
    for (GLsizei level = 0; level < levels; ++level)
    {
        const bool cube = target == GL_TEXTURE_CUBE_MAP;
        const GLenum first = cube ? GL_TEXTURE_CUBE_MAP_POSITIVE_X : target;
        for (GLenum face = first; face < first + (cube ? 6u : 1u); ++face)
            texture->levels[{face, level}] =
                NewImage(size.width, size.height, size.depth, internalFormat, layout);
        size.width = std::max(size.width / 2, 1);
        size.height = std::max(size.height / 2, 1);
        size.depth = shrinkDepth ? std::max(size.depth / 2, 1) : size.depth;
    }
}

} // namespace

Image* AttachedImage(ShareGroup& group, const SimAttachment& attachment)
{
    if (attachment.type == GL_RENDERBUFFER)
    {
        Renderbuffer* const buffer = group.renderbuffers.Find(attachment.name);
        return buffer && buffer->image.Exists() ? &buffer->image : nullptr;
    }
    Texture* const texture = group.textures.Find(attachment.name);
    if (!texture)
        return nullptr;
    const GLenum target = attachment.textureTarget ? attachment.textureTarget : texture->target;
    const auto found = texture->levels.find({target, attachment.level});
    return found == texture->levels.end() ? nullptr : &found->second;
}

} // namespace Sim

using namespace Sim;

SIM_API void glTexImage2D(GLenum target, GLint level, GLint internalFormat, GLsizei width,
                          GLsizei height, GLint border, GLenum format, GLenum type,
                          const void* pixels)
{
    GlEntry entry("glTexImage2D",
                  {target, level, internalFormat, width, height, border, format, type, pixels});
    if (entry)
        SpecifyImage(entry, FindPlace(entry, target, level, false), {0, 0, 0, width, height, 1},
                     internalFormat, border, {format, type}, pixels);
}

SIM_API void glTexImage3D(GLenum target, GLint level, GLint internalFormat, GLsizei width,
                          GLsizei height, GLsizei depth, GLint border, GLenum format, GLenum type,
                          const void* pixels)
{
    GlEntry entry(
        "glTexImage3D",
        {target, level, internalFormat, width, height, depth, border, format, type, pixels}, 30);
    if (entry)
        SpecifyImage(entry, FindPlace(entry, target, level, true), {0, 0, 0, width, height, depth},
                     internalFormat, border, {format, type}, pixels);
}

SIM_API void glTexSubImage2D(GLenum target, GLint level, GLint x, GLint y, GLsizei width,
                             GLsizei height, GLenum format, GLenum type, const void* pixels)
{
    GlEntry entry("glTexSubImage2D", {target, level, x, y, width, height, format, type, pixels});
    if (entry)
        UpdateImage(entry, FindPlace(entry, target, level, false), {x, y, 0, width, height, 1},
                    {format, type}, pixels);
}

SIM_API void glTexSubImage3D(GLenum target, GLint level, GLint x, GLint y, GLint z, GLsizei width,
                             GLsizei height, GLsizei depth, GLenum format, GLenum type,
                             const void* pixels)
{
    GlEntry entry("glTexSubImage3D",
                  {target, level, x, y, z, width, height, depth, format, type, pixels}, 30);
    if (entry)
        UpdateImage(entry, FindPlace(entry, target, level, true), {x, y, z, width, height, depth},
                    {format, type}, pixels);
}

SIM_API void glCopyTexImage2D(GLenum target, GLint level, GLenum internalFormat, GLint x, GLint y,
                              GLsizei width, GLsizei height, GLint border)
{
    GlEntry entry("glCopyTexImage2D", {target, level, internalFormat, x, y, width, height, border});
    if (!entry)
        return;
    const Place place = FindPlace(entry, target, level, false);
    if (!place.texture || !CheckSize(entry, place, width, height, 1) || !CheckMutable(entry, place))
        return;
    if (!IsInternalFormat(entry.state.gpu, internalFormat))
        return entry.Misuse(GL_INVALID_ENUM, "no such internal format: " + Hex(internalFormat));
    const Image* const source = ReadImage(entry);
    if (!source)
        return;
    if (IsDepthFormat(internalFormat))
        return entry.Misuse(GL_INVALID_OPERATION, "colours cannot become depths");
    Image copy = NewImage(width, height, 1, internalFormat, StorageLayout(internalFormat));
    CopyPixels(*source, x, y, copy, {0, 0, 0, width, height, 1});
    place.texture->levels[{target, level}] = copy;
}

SIM_API void glCopyTexSubImage2D(GLenum target, GLint level, GLint xoffset, GLint yoffset, GLint x,
                                 GLint y, GLsizei width, GLsizei height)
{
    GlEntry entry("glCopyTexSubImage2D", {target, level, xoffset, yoffset, x, y, width, height});
    if (!entry)
        return;
    const Place place = FindPlace(entry, target, level, false);
    const Region region{xoffset, yoffset, 0, width, height, 1};
    const Image* const source =
        place.texture && CheckRegion(entry, place, region) ? ReadImage(entry) : nullptr;
    if (source)
        CopyPixels(*source, x, y, *place.image, region);
}

SIM_API void glCopyTexSubImage3D(GLenum target, GLint level, GLint xoffset, GLint yoffset,
                                 GLint zoffset, GLint x, GLint y, GLsizei width, GLsizei height)
{
    GlEntry entry("glCopyTexSubImage3D",
                  {target, level, xoffset, yoffset, zoffset, x, y, width, height}, 30);
    if (!entry)
        return;
    const Place place = FindPlace(entry, target, level, true);
    const Region region{xoffset, yoffset, zoffset, width, height, 1};
    const Image* const source =
        place.texture && CheckRegion(entry, place, region) ? ReadImage(entry) : nullptr;
    if (source)
        CopyPixels(*source, x, y, *place.image, region);
}

SIM_API void glTexStorage2D(GLenum target, GLsizei levels, GLenum internalFormat, GLsizei width,
                            GLsizei height)
{
    GlEntry entry("glTexStorage2D", {target, levels, internalFormat, width, height}, 30);
    if (entry)
        AllocateStorage(entry, target, levels, internalFormat, {0, 0, 0, width, height, 1}, false);
}

SIM_API void glTexStorage3D(GLenum target, GLsizei levels, GLenum internalFormat, GLsizei width,
                            GLsizei height, GLsizei depth)
{
    GlEntry entry("glTexStorage3D", {target, levels, internalFormat, width, height, depth}, 30);
    if (entry)
        AllocateStorage(entry, target, levels, internalFormat, {0, 0, 0, width, height, depth},
                        target == GL_TEXTURE_3D);
}

SIM_API void glGenerateMipmap(GLenum target)
{
    GlEntry entry("glGenerateMipmap", {target});
    Texture* const texture = entry ? BoundTexture(entry, target) : nullptr;
    if (texture && texture->levels.empty())
        entry.Misuse(GL_INVALID_OPERATION, "the texture has no base level");
}

// The devices list no compressed formats.

SIM_API void glCompressedTexImage2D(GLenum target, GLint level, GLenum internalFormat,
                                    GLsizei width, GLsizei height, GLint border, GLsizei size,
                                    const void* data)
{
    GlEntry entry("glCompressedTexImage2D",
                  {target, level, internalFormat, width, height, border, size, data});
    if (entry)
        entry.Misuse(GL_INVALID_ENUM, "no such compressed format: " + Hex(internalFormat));
}

SIM_API void glCompressedTexSubImage2D(GLenum target, GLint level, GLint x, GLint y, GLsizei width,
                                       GLsizei height, GLenum format, GLsizei size,
                                       const void* data)
{
    GlEntry entry("glCompressedTexSubImage2D",
                  {target, level, x, y, width, height, format, size, data});
    if (entry)
        entry.Misuse(GL_INVALID_ENUM, "no such compressed format: " + Hex(format));
}

SIM_API void glCompressedTexImage3D(GLenum target, GLint level, GLenum internalFormat,
                                    GLsizei width, GLsizei height, GLsizei depth, GLint border,
                                    GLsizei size, const void* data)
{
    GlEntry entry("glCompressedTexImage3D",
                  {target, level, internalFormat, width, height, depth, border, size, data}, 30);
    if (entry)
        entry.Misuse(GL_INVALID_ENUM, "no such compressed format: " + Hex(internalFormat));
}

SIM_API void glCompressedTexSubImage3D(GLenum target, GLint level, GLint x, GLint y, GLint z,
                                       GLsizei width, GLsizei height, GLsizei depth, GLenum format,
                                       GLsizei size, const void* data)
{
    GlEntry entry("glCompressedTexSubImage3D",
                  {target, level, x, y, z, width, height, depth, format, size, data}, 30);
    if (entry)
        entry.Misuse(GL_INVALID_ENUM, "no such compressed format: " + Hex(format));
}
