#include "RenderThreads.h"

#include "UserError.h"

void CheckEgl()
{
    if (Nib::Egl::GetEglStatus() != 0 || !Nib::Egl::GetInstance()->GetConfig(false))
        throw UserError("EGL does not start here: no driver, or none with an RGBA8888 "
                        "configuration (NIB_LOG=info tells more)");
}

std::unique_ptr<Nib::RenderThreadGL> StartSurfaceThread()
{
    std::unique_ptr<Nib::RenderThreadGL> thread(
        Nib::RendererFactory::CreateSurfaceRenderer("nib draw", Nib::RenderThreadGL::High));
    if (!thread->Start())
        throw UserError("the render thread does not start");
    return thread;
}

void CheckDrawn(const std::string& failure)
{
    if (!failure.empty())
        throw UserError("drawing failed: " + failure);
}
