#include "gles/RendererDeviceCaps.h"

#include <nib/device.h>

namespace Nib::GLES
{

int RendererDeviceCaps::GetMaxTextureSize() const
{
    return OpenGLRenderer::getMaxTextureSize();
}

} // namespace Nib::GLES
