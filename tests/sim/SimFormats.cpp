#include "SimGl.h"

#include <GLES2/gl2.h>
// After gl2.h, which it needs.
#include <GLES2/gl2ext.h>

// Which formats go together, and which can be drawn to.

namespace Sim
{

namespace
{

constexpr GLenum kBgra8 = 0x93A1; // GL_BGRA8_EXT

/// A combination that glTexImage2D accepts.
struct Upload
{
    GLenum internalFormat;
    GLenum format;
    GLenum type;
};

constexpr Upload kUploads[] = {
    {GL_R8, GL_RED, GL_UNSIGNED_BYTE},
    {GL_R8_SNORM, GL_RED, GL_BYTE},
    {GL_R16F, GL_RED, GL_HALF_FLOAT},
    {GL_R16F, GL_RED, GL_FLOAT},
    {GL_R32F, GL_RED, GL_FLOAT},
    {GL_R8UI, GL_RED_INTEGER, GL_UNSIGNED_BYTE},
    {GL_R8I, GL_RED_INTEGER, GL_BYTE},
    {GL_R16UI, GL_RED_INTEGER, GL_UNSIGNED_SHORT},
    {GL_R16I, GL_RED_INTEGER, GL_SHORT},
    {GL_R32UI, GL_RED_INTEGER, GL_UNSIGNED_INT},
    {GL_R32I, GL_RED_INTEGER, GL_INT},
    {GL_RG8, GL_RG, GL_UNSIGNED_BYTE},
    {GL_RG16F, GL_RG, GL_HALF_FLOAT},
    {GL_RG16F, GL_RG, GL_FLOAT},
    {GL_RG32F, GL_RG, GL_FLOAT},
    {GL_RG8UI, GL_RG_INTEGER, GL_UNSIGNED_BYTE},
    {GL_RG16UI, GL_RG_INTEGER, GL_UNSIGNED_SHORT},
    {GL_RG32UI, GL_RG_INTEGER, GL_UNSIGNED_INT},
    {GL_RGB8, GL_RGB, GL_UNSIGNED_BYTE},
    {GL_SRGB8, GL_RGB, GL_UNSIGNED_BYTE},
    {GL_RGB565, GL_RGB, GL_UNSIGNED_BYTE},
    {GL_RGB565, GL_RGB, GL_UNSIGNED_SHORT_5_6_5},
    {GL_R11F_G11F_B10F, GL_RGB, GL_FLOAT},
    {GL_RGB16F, GL_RGB, GL_HALF_FLOAT},
    {GL_RGB16F, GL_RGB, GL_FLOAT},
    {GL_RGB32F, GL_RGB, GL_FLOAT},
    {GL_RGBA8, GL_RGBA, GL_UNSIGNED_BYTE},
    {GL_SRGB8_ALPHA8, GL_RGBA, GL_UNSIGNED_BYTE},
    {GL_RGBA4, GL_RGBA, GL_UNSIGNED_BYTE},
    {GL_RGBA4, GL_RGBA, GL_UNSIGNED_SHORT_4_4_4_4},
    {GL_RGB5_A1, GL_RGBA, GL_UNSIGNED_BYTE},
    {GL_RGB5_A1, GL_RGBA, GL_UNSIGNED_SHORT_5_5_5_1},
    {GL_RGB10_A2, GL_RGBA, GL_UNSIGNED_INT_2_10_10_10_REV},
    {GL_RGBA16F, GL_RGBA, GL_HALF_FLOAT},
    {GL_RGBA16F, GL_RGBA, GL_FLOAT},
    {GL_RGBA32F, GL_RGBA, GL_FLOAT},
    {GL_RGBA8UI, GL_RGBA_INTEGER, GL_UNSIGNED_BYTE},
    {GL_RGBA8I, GL_RGBA_INTEGER, GL_BYTE},
    {GL_RGBA16UI, GL_RGBA_INTEGER, GL_UNSIGNED_SHORT},
    {GL_RGBA16I, GL_RGBA_INTEGER, GL_SHORT},
    {GL_RGBA32UI, GL_RGBA_INTEGER, GL_UNSIGNED_INT},
    {GL_RGBA32I, GL_RGBA_INTEGER, GL_INT},
    {GL_DEPTH_COMPONENT16, GL_DEPTH_COMPONENT, GL_UNSIGNED_SHORT},
    {GL_DEPTH_COMPONENT16, GL_DEPTH_COMPONENT, GL_UNSIGNED_INT},
    {GL_DEPTH_COMPONENT24, GL_DEPTH_COMPONENT, GL_UNSIGNED_INT},
    {GL_DEPTH_COMPONENT32F, GL_DEPTH_COMPONENT, GL_FLOAT},
    {GL_DEPTH24_STENCIL8, GL_DEPTH_STENCIL, GL_UNSIGNED_INT_24_8},
    {GL_RGBA, GL_RGBA, GL_UNSIGNED_BYTE},
    {GL_RGBA, GL_RGBA, GL_UNSIGNED_SHORT_4_4_4_4},
    {GL_RGBA, GL_RGBA, GL_UNSIGNED_SHORT_5_5_5_1},
    {GL_RGB, GL_RGB, GL_UNSIGNED_BYTE},
    {GL_RGB, GL_RGB, GL_UNSIGNED_SHORT_5_6_5},
    {GL_LUMINANCE_ALPHA, GL_LUMINANCE_ALPHA, GL_UNSIGNED_BYTE},
    {GL_LUMINANCE, GL_LUMINANCE, GL_UNSIGNED_BYTE},
    {GL_ALPHA, GL_ALPHA, GL_UNSIGNED_BYTE},
    {GL_DEPTH_COMPONENT, GL_DEPTH_COMPONENT, GL_UNSIGNED_SHORT},
    {GL_DEPTH_COMPONENT, GL_DEPTH_COMPONENT, GL_UNSIGNED_INT},
    {GL_BGRA_EXT, GL_BGRA_EXT, GL_UNSIGNED_BYTE},
    {kBgra8, GL_BGRA_EXT, GL_UNSIGNED_BYTE},
};

bool NeedsBgra(GLenum value)
{
    return value == GL_BGRA_EXT || value == kBgra8;
}

} // namespace

bool IsClientFormat(const SimGpu& gpu, GLenum format)
{
    if (NeedsBgra(format))
        return gpu.HasGlExtension("GL_EXT_texture_format_BGRA8888");
    return std::any_of(std::begin(kUploads), std::end(kUploads),
                       [&](const Upload& row) { return row.format == format; });
}

bool IsClientType(GLenum type)
{
    return std::any_of(std::begin(kUploads), std::end(kUploads),
                       [&](const Upload& row) { return row.type == type; });
}

bool IsInternalFormat(const SimGpu& gpu, GLenum format)
{
    if (NeedsBgra(format))
        return gpu.HasGlExtension("GL_EXT_texture_format_BGRA8888");
    return std::any_of(std::begin(kUploads), std::end(kUploads),
                       [&](const Upload& row) { return row.internalFormat == format; });
}

bool CanUpload(GLenum internalFormat, const PixelFormat& layout)
{
    return std::any_of(std::begin(kUploads), std::end(kUploads),
                       [&](const Upload& row)
                       {
                           return row.internalFormat == internalFormat &&
                                  row.format == layout.format && row.type == layout.type;
                       });
}

PixelFormat StorageLayout(GLenum internalFormat)
{
    if (internalFormat == GL_DEPTH24_STENCIL8 || internalFormat == GL_DEPTH_COMPONENT16 ||
        internalFormat == GL_DEPTH_COMPONENT24 || internalFormat == GL_DEPTH_COMPONENT32F ||
        internalFormat == GL_DEPTH32F_STENCIL8 || internalFormat == GL_STENCIL_INDEX8)
        return {GL_DEPTH_COMPONENT, GL_FLOAT};
    for (const Upload& row : kUploads)
    {
        if (row.internalFormat == internalFormat)
            return {row.format, row.type};
    }
    return {0, 0};
}

bool IsDepthFormat(GLenum internalFormat)
{
    return IsOneOf(internalFormat,
                   {GL_DEPTH_COMPONENT, GL_DEPTH_COMPONENT16, GL_DEPTH_COMPONENT24,
                    GL_DEPTH_COMPONENT32F, GL_DEPTH24_STENCIL8, GL_DEPTH32F_STENCIL8});
}

bool IsStencilFormat(GLenum internalFormat)
{
    return IsOneOf(internalFormat, {GL_STENCIL_INDEX8, GL_DEPTH24_STENCIL8, GL_DEPTH32F_STENCIL8});
}

bool IsColorRenderable(const SimGpu& gpu, GLenum internalFormat)
{
    const bool floats = gpu.HasGlExtension("GL_EXT_color_buffer_float");
    if (IsOneOf(internalFormat, {GL_R32F, GL_RG32F, GL_RGBA32F, GL_R11F_G11F_B10F}))
        return floats;
    if (IsOneOf(internalFormat, {GL_R16F, GL_RG16F, GL_RGBA16F, GL_RGB16F}))
        return (floats && internalFormat != GL_RGB16F) ||
               gpu.HasGlExtension("GL_EXT_color_buffer_half_float");
    return IsOneOf(internalFormat,
                   {GL_R8,           GL_RG8,     GL_RGB8,     GL_RGB565,
                    GL_RGBA4,        GL_RGB5_A1, GL_RGBA8,    GL_RGB10_A2,
                    GL_SRGB8_ALPHA8, GL_RGB,     GL_RGBA,     GL_R8UI,
                    GL_R8I,          GL_R16UI,   GL_R16I,     GL_R32UI,
                    GL_R32I,         GL_RG8UI,   GL_RG16UI,   GL_RG32UI,
                    GL_RGBA8UI,      GL_RGBA8I,  GL_RGBA16UI, GL_RGBA16I,
                    GL_RGBA32UI,     GL_RGBA32I, GL_BGRA_EXT, static_cast<int>(kBgra8)});
}

} // namespace Sim
