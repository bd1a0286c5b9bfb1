#ifndef NIB_GLES_RENDER_TARGET_BASE_H
#define NIB_GLES_RENDER_TARGET_BASE_H

#include <nib/render_target.h>

#include <cstdint>

namespace Nib::GLES
{

/// A framebuffer by its name: binding, clearing, reading. Owns no GL name itself.
class RenderTargetBase : public IRenderTarget
{
public:
    enum class FramebufferType : int
    {
        Default = 0, ///< framebuffer 0
        Current = 1, ///< the framebuffer that is bound at construction
        Unset = 2    ///< none until SetFbo, as for every other value
    };

    RenderTargetBase(int width, int height, FramebufferType type);
    RenderTargetBase(const RenderTargetBase&) = delete;
    RenderTargetBase& operator=(const RenderTargetBase&) = delete;

    void Activate() override;
    void Deactivate(bool discardDepth, bool discardStencil) override;
    void ReadPixels(int x, int y, int width, int height, const BufferDescriptor& buffer) override;
    void Release() override;
    void ClearColor(float r, float g, float b, float a) override;

    void SetFbo(int width, int height, unsigned int fbo);
    unsigned int GetFbo() const;

private:
    std::int32_t m_fbo; ///< -1 while unknown
    std::int32_t m_width;
    std::int32_t m_height;
};

} // namespace Nib::GLES

#endif
