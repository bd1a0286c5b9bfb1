#include "FrontBuffer.h"

#include <cstdio>

std::string FrontBufferObstacle()
{
    if (Nib::IsFBRSupported())
        return {};
    // In the order in which the library asks.
    const Nib::Egl& egl = *Nib::Egl::GetInstance();
    for (const char* extension :
         {"EGL_KHR_mutable_render_buffer", "EGL_KHR_fence_sync", "EGL_ANDROID_get_frame_timestamps",
          "EGL_ANDROID_presentation_time"})
        if (!egl.IsEglExtensionSupported(extension))
            return std::string("the display has no ") + extension;
    if (!egl.HasFrontBufferConfig())
        return "no configuration has a mutable render buffer";
    return "it is known not to work on this GPU";
}

std::unique_ptr<Nib::RenderThreadGL> FrontBufferThread(Nib::RenderThreadGL& parent)
{
    const std::string obstacle = FrontBufferObstacle();
    if (obstacle.empty())
        return std::unique_ptr<Nib::RenderThreadGL>(
            Nib::RendererFactory::CreateFBRSurfaceRenderer(parent.GetMsgQueue(), "nib front"));
    std::fprintf(stderr, "nib: --front-buffer: %s; drawing frames instead\n", obstacle.c_str());
    return nullptr;
}
