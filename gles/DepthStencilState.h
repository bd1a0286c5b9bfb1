#ifndef NIB_GLES_DEPTH_STENCIL_STATE_H
#define NIB_GLES_DEPTH_STENCIL_STATE_H

#include <nib/pipeline_state.h>

namespace Nib::GLES
{

class DepthStencilState : public IDepthStencilState
{
public:
    explicit DepthStencilState(const DepthStencilStateDescriptor& descriptor);

    void SetDescriptor(const DepthStencilStateDescriptor& descriptor) override;
    void Activate() override;
    void Release() override;

    /// @name The GL values; an argument outside its enumeration is not checked for
    /// @{
    static unsigned int GetGLDepthStencilFunc(DepthStencilFunction function);
    static unsigned int GetGLStencilOp(StencilOperation operation);
    /// @}

private:
    void ActivateDepth() const;
    void ActivateStencil() const;

    DepthStencilStateDescriptor m_descriptor;
};

} // namespace Nib::GLES

#endif
