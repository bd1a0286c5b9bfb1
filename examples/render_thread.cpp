// A render thread: work is posted to it as tasks, and Render() is the barrier behind them. Without
// a window it draws into render targets; with one, OnSurfaceChanged() and frames follow.

#include "PostTask.h"

#include <nib/nib.h>

#include <cstdio>
#include <memory>

int main()
{
    using namespace Nib;
    const std::unique_ptr<RenderThreadGL> thread(
        RendererFactory::CreateSurfaceRenderer("example", RenderThreadGL::Medium));
    if (!thread->Start())
        return 1;

    unsigned char pixel[4] = {};
    Ink::Post(*thread->GetMsgQueue(),
              [&pixel]
              {
                  // GL work: only ever here, on the render thread.
                  TextureDescriptor descriptor;
                  descriptor.width = descriptor.height = 1;
                  const Ink::Owned<ITextureObject> texture(RendererFactory::CreateTextureObject(
                      descriptor, nullptr, nullptr, 0, nullptr));
                  const Ink::Owned<IOffscreenRenderTarget> target(
                      RendererFactory::CreateOffscreenRenderTarget(texture.get()));
                  target->ClearColor(1.0f, 0.0f, 0.0f, 1.0f);
                  IRenderTarget::BufferDescriptor buffer;
                  buffer.pixels = pixel;
                  target->ReadPixels(0, 0, 1, 1, buffer);
              });
    thread->Render(); // returns when the task above has run

    // Whoever needs GL for a moment shares the process-wide thread.
    RenderThreadGL* const shared = RenderThreadGLST::getInstance();
    const bool isDrained = shared->GetMsgQueue()->waitForCompleting();
    RenderThreadGLST::release();

    std::printf("type %d, pixel %d %d %d %d\n", thread->GetType(), pixel[0], pixel[1], pixel[2],
                pixel[3]);
    return isDrained && pixel[0] == 255 && pixel[1] == 0 && pixel[3] == 255 ? 0 : 1;
}
