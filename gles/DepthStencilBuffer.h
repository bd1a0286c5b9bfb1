#ifndef NIB_GLES_DEPTH_STENCIL_BUFFER_H
#define NIB_GLES_DEPTH_STENCIL_BUFFER_H

#include <nib/managed_object.h>
#include <nib/render_target.h>

namespace Nib::GLES
{

/// A renderbuffer for depth and stencil, rebuilt at its size after a context loss.
class DepthStencilBuffer : public IDepthStencilBuffer, public ManagedObject
{
public:
    DepthStencilBuffer(); ///< subscribes; no storage yet
    ~DepthStencilBuffer() override;

    unsigned int GetWidth() const override;
    unsigned int GetHeight() const override;
    void Release() override;

    unsigned int GetDepthStencilBuffer() const; ///< the renderbuffer's name, 0 when there is none
    void CreateBuffer(unsigned int width, unsigned int height); ///< leaves it bound
    void DestroyBuffer();                                       ///< the size is kept

    void ReleaseGLObject() override;
    void RestoreGLObject() override;

private:
    unsigned int m_width = 0;
    unsigned int m_height = 0;
    unsigned int m_renderbuffer = 0;
};

} // namespace Nib::GLES

#endif
