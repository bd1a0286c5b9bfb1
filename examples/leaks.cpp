// The database of live GL names, in engineering builds: what was added and not removed is listed.

#include "PostTask.h"

#include <nib/nib.h>

#include <cstdio>
#include <GLES3/gl3.h>
#include <memory>

int main()
{
    using namespace Nib;
    System::SetBuildTypeEngMode(true); // before the library first asks
    const std::unique_ptr<RenderThreadGL> thread(
        RendererFactory::CreateSurfaceRenderer("example", RenderThreadGL::Medium));
    thread->Start();
    std::size_t whileAlive = 0, afterwards = 1;
    Ink::Post(*thread->GetMsgQueue(),
              [&]
              {
                  GLuint name = 0;
                  glGenTextures(1, &name);
                  ResourceChecker::addLookup(
                      name, ResourceChecker::textureDbDescriptor,
                      std::make_unique<ResourceChecker::TextureInfo>(16, 16, GL_RGBA8));
                  ResourceChecker::updateTagLookup(name, "brush",
                                                   ResourceChecker::textureDbDescriptor);
                  whileAlive = ResourceChecker::textureDb.size();
                  ResourceChecker::leakCheckLookup(false); // lists it in the log

                  glDeleteTextures(1, &name);
                  ResourceChecker::removeLookup(name, ResourceChecker::textureDbDescriptor);
                  afterwards = ResourceChecker::textureDb.size();
              });
    thread->GetMsgQueue()->waitForCompleting();
    std::printf("live textures: %zu, then %zu\n", whileAlive, afterwards);
    return whileAlive == 1 && afterwards == 0 ? 0 : 1;
}
