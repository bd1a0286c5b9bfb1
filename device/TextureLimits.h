#ifndef NIB_DEVICE_TEXTURELIMITS_H
#define NIB_DEVICE_TEXTURELIMITS_H

namespace Nib
{

/// The largest height of a texture that can also be drawn into, in pixels: the companion of
/// OpenGLRenderer::getMaxTextureSize, which answers for the width. 8192 before InitParameters.
int GetMaxTextureHeight();

} // namespace Nib

#endif
