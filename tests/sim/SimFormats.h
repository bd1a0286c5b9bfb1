#ifndef NIB_SIM_FORMATS_H
#define NIB_SIM_FORMATS_H

#include "SimGpu.h"
#include "SimImage.h"

namespace Sim
{

/// Whether the device knows the format or type of pixels in client memory.
bool IsClientFormat(const SimGpu& gpu, GLenum format);
bool IsClientType(GLenum type);
bool IsInternalFormat(const SimGpu& gpu, GLenum format);
/// Whether pixels of this layout may fill a texture of this internal format.
bool CanUpload(GLenum internalFormat, const PixelFormat& layout);
/// How a renderbuffer or texture storage of a sized format keeps its pixels; format 0 for an
/// unknown one.
PixelFormat StorageLayout(GLenum internalFormat);
bool IsDepthFormat(GLenum internalFormat);
bool IsStencilFormat(GLenum internalFormat);
bool IsColorRenderable(const SimGpu& gpu, GLenum internalFormat);

} // namespace Sim

#endif
