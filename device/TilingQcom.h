#ifndef NIB_DEVICE_TILINGQCOM_H
#define NIB_DEVICE_TILINGQCOM_H

#include <GLES3/gl3.h>
// The extension header builds on the one before.
#include <GLES2/gl2ext.h>

#include <atomic>

// The entry points of GL_QCOM_tiled_rendering; null until InitOpenGLExtensions has found them.
// Every render thread may read them while another resolves them to the same addresses.
extern std::atomic<PFNGLSTARTTILINGQCOMPROC> glStartTilingQCOM;
extern std::atomic<PFNGLENDTILINGQCOMPROC> glEndTilingQCOM;

#endif
