#ifndef NIB_GLES_OFFSCREEN_RENDER_TARGET_H
#define NIB_GLES_OFFSCREEN_RENDER_TARGET_H

#include "gles/RenderTargetBase.h"

#include <nib/managed_object.h>
#include <nib/texture.h>

namespace Nib::GLES
{

/// A framebuffer object that draws into a texture. Owns the framebuffer name; texture and
/// depth/stencil buffer are borrowed.
///
/// Not subscribed to its queue: after a context loss the owner makes a new one, because the order
/// in which texture and target would be rebuilt is the owner's knowledge.
class OffscreenRenderTarget : public IOffscreenRenderTarget,
                              private RenderTargetBase,
                              public ManagedObject
{
public:
    /// Takes its size from @p color. Throws std::logic_error when the texture cannot be drawn into.
    explicit OffscreenRenderTarget(ITextureObject* color);
    ~OffscreenRenderTarget() override;

    void Activate() override;
    void Deactivate(bool discardDepth, bool discardStencil) override;
    void ReadPixels(int x, int y, int width, int height,
                    const IRenderTarget::BufferDescriptor& buffer) override;
    void Release() override;
    void ClearColor(float r, float g, float b, float a) override;

    void AttachDepthStencilBuffer(IDepthStencilBuffer* buffer) override;
    void DetachDepthStencilBuffer() override;
    void ClearDepthStencil(bool clearDepth, float depth, bool clearStencil, int stencil) override;

    void ReleaseGLObject() override; ///< nothing
    void RestoreGLObject() override; ///< nothing

    using RenderTargetBase::GetFbo;

private:
    bool CreateFbo();
    void AttachColorToFbo();
    void AttachDepthStencilToFbo();
    void DetachDepthStencilFromFbo();

    bool m_depthStencilAttached = false;
    IDepthStencilBuffer* m_depthStencil = nullptr;
    bool m_colorAttached = false;
    ITextureObject* m_color;
};

} // namespace Nib::GLES

#endif
