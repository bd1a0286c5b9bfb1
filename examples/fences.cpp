// Waiting for the GPU: a GL fence of the factory, and an EGL fence, which any thread may wait for.

#include "PostTask.h"

#include <nib/nib.h>

#include <cstdio>
#include <memory>

int main()
{
    using namespace Nib;
    const std::unique_ptr<RenderThreadGL> thread(
        RendererFactory::CreateSurfaceRenderer("example", RenderThreadGL::Medium));
    thread->Start();

    int glResult = -1;
    std::unique_ptr<EglSyncObject> sync;
    Ink::Post(*thread->GetMsgQueue(),
              [&]
              {
                  const Ink::Owned<IFence> fence(RendererFactory::CreateFence());
                  fence->Insert(); // behind everything issued so far
                  glResult = fence->Wait();
                  sync.reset(EglSyncObject::CreateEglSyncObject()); // null without the extension
              });
    thread->GetMsgQueue()->waitForCompleting();

    if (!sync)
    {
        std::printf("GL fence %d, no EGL fences here\n", glResult);
        return glResult == 0 ? 0 : 1;
    }
    constexpr std::uint64_t kSecond = 1000000000;
    const EglSyncObject::WaitResult waited = sync->WaitTimeout(10 * kSecond);
    const EglSyncObject::ObjectState state = sync->GetState();
    std::printf("GL fence %d, EGL fence %d, state %d\n", glResult, static_cast<int>(waited),
                static_cast<int>(state));
    return glResult == 0 && waited == EglSyncObject::WaitResult::Passed &&
                   state == EglSyncObject::ObjectState::Signaled
               ? 0
               : 1;
}
