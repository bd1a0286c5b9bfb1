// What the device can do. The checks may be called from any thread; the queries belong to a task.

#include "PostTask.h"

#include <nib/nib.h>

#include <cstdio>
#include <memory>

int main()
{
    using namespace Nib;
    const bool isCompatible = IsCompatibleGL();
    const bool hasFrontBuffer = IsFBRSupported();

    const std::unique_ptr<RenderThreadGL> thread(
        RendererFactory::CreateSurfaceRenderer("example", RenderThreadGL::Medium));
    thread->Start();
    bool isMali = true;
    int vendor = 0;
    Ink::Post(*thread->GetMsgQueue(),
              [&]
              {
                  isMali = IsGPUNameEqualTo("Mali");
                  vendor = OpenGLRenderer::getGPUVendor();
              });
    thread->GetMsgQueue()->waitForCompleting();
    std::printf("compatible %d, front buffer %d, Mali %d, vendor %d, textures up to %d\n",
                isCompatible, hasFrontBuffer, isMali, vendor, OpenGLRenderer::getMaxTextureSize());
    return isCompatible && vendor != 0 && OpenGLRenderer::getMaxTextureSize() >= 2048 ? 0 : 1;
}
