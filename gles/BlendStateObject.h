#ifndef NIB_GLES_BLEND_STATE_OBJECT_H
#define NIB_GLES_BLEND_STATE_OBJECT_H

#include <nib/pipeline_state.h>

namespace Nib::GLES
{

class BlendStateObject : public IBlendStateObject
{
public:
    explicit BlendStateObject(const BlendStateDescriptor& descriptor);

    void SetDescriptor(const BlendStateDescriptor& descriptor) override;
    void Activate() override;
    void Release() override;

    /// @name The GL values; an argument outside its enumeration is not checked for
    /// @{
    static unsigned int GetGLBlendFunction(BlendingFunction function);
    static unsigned int GetGLBlendFactor(BlendingFactor factor);
    /// @}

private:
    BlendStateDescriptor m_descriptor;
};

} // namespace Nib::GLES

#endif
