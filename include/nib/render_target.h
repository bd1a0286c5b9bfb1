#ifndef NIB_RENDER_TARGET_H
#define NIB_RENDER_TARGET_H

/// @file
/// Framebuffers that drawing is directed to, and the depth and stencil storage of offscreen ones.
///
/// Made by RendererFactory, ended by Release(). Everything is called on the GL thread of the
/// context that made the object, with that context current. Sizes and positions are pixels, the
/// origin is the lower left corner.

#include <nib/export.h>

#include <cstdint>

namespace Nib
{

/// Depth and stencil storage (24 and 8 bits) for offscreen render targets. It is rebuilt at its
/// size after a context loss, with undefined contents; the targets that used it are not.
class NIB_EXPORT IDepthStencilBuffer
{
public:
    virtual ~IDepthStencilBuffer() = default;
    virtual unsigned int GetWidth() const = 0;  ///< in pixels
    virtual unsigned int GetHeight() const = 0; ///< in pixels
    virtual void Release() = 0;                 ///< deletes the object and its GL storage
};

/// A framebuffer: the window's, whatever was bound when the target was made, or an offscreen one.
class NIB_EXPORT IRenderTarget
{
public:
    /// Where ReadPixels puts what it reads.
    struct BufferDescriptor
    {
        void* pixels = nullptr; ///< the caller's memory, 4 bytes a pixel: red, green, blue, alpha
        std::int32_t rowLength = 0; ///< pixels from row to row in memory; 0: the width that is read
        std::int32_t skipRows = 0;  ///< rows of memory left untouched before the first
        std::int32_t skipPixels = 0; ///< pixels left untouched before the first of each row
    };

    virtual ~IRenderTarget() = default;

    /// Binds the framebuffer and sets the viewport to its whole size.
    virtual void Activate() = 0;

    /// Ends a pass: tells the driver which contents of the bound framebuffer need not be kept.
    /// Colour is always kept, and the framebuffer stays bound.
    virtual void Deactivate(bool discardDepth, bool discardStencil) = 0;

    /// Waits for the GPU, then reads a rectangle from the target. Binds the target and discards its
    /// depth and stencil contents.
    virtual void ReadPixels(int x, int y, int width, int height,
                            const BufferDescriptor& buffer) = 0;

    /// Deletes the object, and the framebuffer of an offscreen target.
    virtual void Release() = 0;

    /// Activates the target and fills it. Channels from 0 to 1.
    virtual void ClearColor(float r, float g, float b, float a) = 0;
};

/// A render target that draws into a texture.
///
/// The texture is borrowed and must outlive the target. A target does not survive a context loss,
/// and a texture that is described anew leaves it incomplete: in both cases make another one.
/// Release it before the thread is paused: afterwards its framebuffer name may already belong to
/// another object of the new context.
class NIB_EXPORT IOffscreenRenderTarget : public IRenderTarget
{
public:
    /// Attaches @p buffer, which is borrowed, in place of the one attached before. Throws
    /// std::logic_error when the framebuffer is not complete with it, for instance when the sizes
    /// differ on a driver that wants them equal.
    virtual void AttachDepthStencilBuffer(IDepthStencilBuffer* buffer) = 0;

    /// Nothing when none is attached. Throws std::logic_error when the framebuffer is not complete
    /// without the buffer.
    virtual void DetachDepthStencilBuffer() = 0;

    /// Activates the target and fills depth (0 to 1) and stencil where asked for.
    virtual void ClearDepthStencil(bool clearDepth, float depth, bool clearStencil,
                                   int stencil) = 0;
};

} // namespace Nib

#endif
