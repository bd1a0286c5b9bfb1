// Pause and resume: objects come back with the new context, contents are the owner's to upload.

#include "PostTask.h"

#include <nib/nib.h>

#include <cstdio>
#include <memory>

int main()
{
    using namespace Nib;
    const std::unique_ptr<RenderThreadGL> parent(
        RendererFactory::CreateSurfaceRenderer("parent", RenderThreadGL::Medium));
    parent->Start();
    // Managed: its objects take part in pause and resume. Deleted before its parent.
    const std::unique_ptr<RenderThreadGL> child(
        RendererFactory::CreateOffscreenRenderer(parent->GetMsgQueue(), "child", true));
    child->Start();

    const unsigned char blue[] = {0, 0, 255, 255};
    Ink::Owned<ITextureObject> texture;
    Ink::Post(*child->GetMsgQueue(),
              [&]
              {
                  TextureDescriptor descriptor;
                  descriptor.width = descriptor.height = 1;
                  texture.reset(
                      RendererFactory::CreateTextureObject(descriptor, blue, nullptr, 0, nullptr));
              });

    // Render targets do not come back: release them before the pause, make them again after it.
    child->OnPause();  // behind the task above; GL names are released, the context ends
    child->OnResume(); // returns before the child has its new context
    unsigned char pixel[4] = {};
    Ink::Post(*child->GetMsgQueue(),
              [&]
              {
                  texture->Update(blue, 0);
                  {
                      const Ink::Owned<IOffscreenRenderTarget> target(
                          RendererFactory::CreateOffscreenRenderTarget(texture.get()));
                      IRenderTarget::BufferDescriptor buffer;
                      buffer.pixels = pixel;
                      target->ReadPixels(0, 0, 1, 1, buffer);
                  }
                  texture.reset(); // on the thread that made it
              });
    child->GetMsgQueue()->waitForCompleting();
    std::printf("pixel %d %d %d %d\n", pixel[0], pixel[1], pixel[2], pixel[3]);
    return pixel[2] == 255 && pixel[0] == 0 ? 0 : 1;
}
