#ifndef NIB_GLES_RENDERER_DEVICE_CAPS_H
#define NIB_GLES_RENDERER_DEVICE_CAPS_H

#include <nib/pipeline_state.h>

namespace Nib::GLES
{

class RendererDeviceCaps : public IRendererDeviceCaps
{
public:
    int GetMaxTextureSize() const override;
};

} // namespace Nib::GLES

#endif
