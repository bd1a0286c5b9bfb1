#include "base/Log.h"
#include "device/GlText.h"
#include "device/TilingQcom.h"

#include <nib/device.h>

#include <EGL/egl.h>

std::atomic<PFNGLSTARTTILINGQCOMPROC> glStartTilingQCOM{nullptr};
std::atomic<PFNGLENDTILINGQCOMPROC> glEndTilingQCOM{nullptr};

bool IsGLExtensionSupported(const char* name)
{
    return name != nullptr && Nib::Contains(Nib::GetGlText(GL_EXTENSIONS), name);
}

bool InitOpenGLExtensions()
{
    NIB_LOG_INFO("GL_VERSION = %s", Nib::Printable(Nib::GetGlText(GL_VERSION)));
    NIB_LOG_INFO("GL_SHADING_LANGUAGE_VERSION = %s",
                 Nib::Printable(Nib::GetGlText(GL_SHADING_LANGUAGE_VERSION)));
    const char* extensions = Nib::GetGlText(GL_EXTENSIONS);
    NIB_LOG_INFO("GL_EXTENSIONS = %s", Nib::Printable(extensions));

    // The extension text decides: some drivers give addresses for functions that they lack.
    if (Nib::Contains(extensions, "GL_QCOM_tiled_rendering"))
    {
        glStartTilingQCOM.store(
            reinterpret_cast<PFNGLSTARTTILINGQCOMPROC>(eglGetProcAddress("glStartTilingQCOM")),
            std::memory_order_relaxed);
        glEndTilingQCOM.store(
            reinterpret_cast<PFNGLENDTILINGQCOMPROC>(eglGetProcAddress("glEndTilingQCOM")),
            std::memory_order_relaxed);
    }
    return true;
}
