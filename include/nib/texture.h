#ifndef NIB_TEXTURE_H
#define NIB_TEXTURE_H

/// @file
/// Textures: their descriptors, sampling parameters and operations.

#include <nib/base.h>
#include <nib/export.h>

#include <cstdint>

namespace Nib
{

class ITextureObject;

/// How the client's pixels are laid out; chooses the GL format.
enum class TextureTargetLayout : int
{
    Red = 0,           ///< GL_RED
    RedInteger = 1,    ///< GL_RED_INTEGER
    Rgba = 2,          ///< GL_RGBA
    SingleChannel = 3, ///< GL_RED, the same as Red but for a few types
    Depth = 4,         ///< GL_DEPTH_COMPONENT; sampled with comparison
    Rgb = 5,           ///< GL_RGB
    Luminance = 6,     ///< GL_LUMINANCE
    Bgra = 7,          ///< GL_BGRA_EXT
};

/// How the texture stores its pixels; chooses the GL internal format and, together with the
/// client's layout, the GL type. Pairs that work on every driver tried: Rgba with RGBA8; Red and
/// SingleChannel with R8 and R32F; RedInteger with R16UI, R16I, R32UI and R32I (nearest filters
/// only); Rgb with RGB32F and RGB16F; Rgba with RGBA32F and RGBA16F (pixels are 32-bit floats;
/// those of RGB16F are half floats); Depth with Depth32F and DepthComponent; Luminance with
/// Luminance.
enum class TextureMemoryLayout : int
{
    R8 = 0,
    R16UI = 1,
    R16I = 2,
    R32UI = 3,
    R32I = 4,
    RGB8 = 5,
    RGBA8 = 6,
    R32F = 7,
    Depth32F = 8,
    RGB32F = 9,
    RGBA32F = 10,
    RGB16F = 11,
    DepthComponent = 12,
    Luminance = 13,
    RGBA16F = 14,
    R16UIAlternate = 15, ///< stored as R16UI
    BGRA8 = 16,
};

/// Values of TextureDescriptor::target.
enum TextureTarget : int
{
    kTextureTarget1D = 0, ///< not part of OpenGL ES: every use leaves a GL error behind
    kTextureTarget2D = 1,
    kTextureTarget2DArray = 2,
    kTextureTarget3D = 3,
    kTextureTargetCubeMap = 4,
    kTextureTargetExternal = 5, ///< the contents come from elsewhere
};

/// Sampling parameters, the first of a pair at creation and of ITextureObject::SetParam.
enum TextureParam : int
{
    kTextureParamWrapS = 0,
    kTextureParamWrapT = 1,
    kTextureParamWrapR = 2,
    kTextureParamMagFilter = 4,
    kTextureParamMinFilter = 5,
};

/// Values of the three wrap parameters. Unset: kTextureWrapClampToEdge.
enum TextureWrap : int
{
    kTextureWrapMirroredRepeat = 0,
    kTextureWrapClampToEdge = 1,
    kTextureWrapClampToBorder = 2,
    kTextureWrapRepeat = 3,
};

/// Values of the two filter parameters. Unset: kTextureFilterLinear.
enum TextureFilter : int
{
    kTextureFilterNearest = 0,
    kTextureFilterLinear = 1,
};

/// What a texture is. A plain value, copied by value.
struct NIB_EXPORT TextureDescriptor
{
    /// An RGBA8 2D texture of no size.
    TextureDescriptor() = default;

    /// An alias of @p texture, which is borrowed and must outlive what is made of this descriptor.
    explicit TextureDescriptor(const ITextureObject* texture);

    std::int32_t width = 0;  ///< pixels
    std::int32_t height = 0; ///< pixels
    std::int32_t depth = 0;  ///< layers of an array, depth of a 3D texture
    TextureTargetLayout layout = TextureTargetLayout::Rgba;        ///< what a texel is made of
    TextureMemoryLayout memoryLayout = TextureMemoryLayout::RGBA8; ///< how it is stored
    std::int32_t target = kTextureTarget2D;                        ///< a TextureTarget
    /// Fences the upload, so that the first Activate, on whatever context, waits for it.
    bool syncOnCreate = false;
    /// When set, the texture is a second handle onto the GL names of this one. Not owned.
    const ITextureObject* source = nullptr;
};

/// Where in the client's memory the pixels of the first upload lie; 2D textures only. In pixels and
/// rows; a rowLength of 0 is the texture's width.
struct TextureBufferInfo
{
    std::int32_t skipPixels = 0; ///< texels left out at the start of each row
    std::int32_t skipRows = 0;   ///< rows left out at the start
    std::int32_t rowLength = 0;  ///< texels a row of the source; 0: the width
};

/// A GL texture with its sampling parameters, or an alias of one.
///
/// Owner    the caller, from the renderer factory; ended by Release(), never by delete.
/// Threads  the GL thread that made it, with its context current. With syncOnCreate also a thread
///          whose context shares, which makes its own alias.
/// Loss     after a context was lost and made anew, size and parameters are as before, the contents
///          and the tag are gone. An alias keeps dead names: make it again.
/// Alias    never owns the names it shares, and must not outlive its source.
/// State    operations change bindings; only SetData puts the former one back.
/// Pixels   laid out as the descriptor says. Row lengths are in pixels; 0 is the texture's width.
class NIB_EXPORT ITextureObject
{
public:
    virtual ~ITextureObject() = default;

    virtual void
    SetTag(const char* tag) = 0;            ///< a name for the log, copied, at most 126 characters
    virtual const char* GetTag() const = 0; ///< valid as long as the texture
    virtual int GetWidth() const = 0;       ///< pixels, as described
    virtual int GetHeight() const = 0;      ///< pixels, as described

    /// Binds the texture and its sampling parameters to texture unit @p unit, 0 to 3; any other
    /// ends the process. Waits on the GPU, not on the CPU, for an upload that was fenced.
    /// @throws TextureNotValidException when width and height are both 0
    virtual void Activate(int unit) const = 0;

    /// Replaces the contents of a 2D texture.
    virtual void Update(const void* pixels, int rowLength) = 0;

    /// Replaces a part of a 2D texture's contents. @p pixels is the whole picture: the rectangle's
    /// left and top are skipped in it. The part lands at x = left and y = right, so right + height
    /// has to lie inside the texture.
    virtual void Update(const Rect& rect, const void* pixels, int rowLength) = 0;

    /// Replaces a 2D texture's contents by those of the framebuffer that is bound for reading.
    virtual void CopyFromFramebuffer() = 0;

    /// Specifies a 1D, 2D or 3D texture anew with its size; any other is silently left as it is.
    /// @throws TextureNotValidException when width and height are both 0
    virtual void SetData(const void* pixels, int rowLength) = 0;

    /// What the texture was made from.
    virtual const TextureDescriptor& GetDescriptor() const = 0;

    /// Sets a sampling parameter; kept over a context loss. @p index is a TextureParam, @p value a
    /// TextureWrap for the wraps and a TextureFilter for the filters, unchecked.
    virtual void SetParam(int index, int value) = 0;

    /// Makes the texture what @p descriptor says, empty, with the parameters it has. Nothing
    /// happens when only memoryLayout or syncOnCreate differ.
    /// @throws std::logic_error when it is larger than the device allows
    virtual void SetDescriptor(const TextureDescriptor& descriptor) = 0;

    /// Destroys the texture.
    virtual void Release() = 0;
};

} // namespace Nib

#endif
