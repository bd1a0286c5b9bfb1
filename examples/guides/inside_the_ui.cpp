// Drawing inside somebody else's frame: the UI's renderer owns the thread and the context; its draw
// callback calls Render(), which runs what other threads have posted and leaves the GL state alone
// as long as the tasks are bracketed, as here.

#include "PostTask.h"

#include <nib/nib.h>

#include <atomic>
#include <condition_variable>
#include <cstdio>
#include <EGL/egl.h>
#include <functional>
#include <GLES3/gl3.h>
#include <memory>
#include <mutex>
#include <thread>

namespace
{

/// The host: a thread with a context of its own that draws a frame whenever it is asked to.
class Host
{
public:
    bool RequestFrame() // from any thread; only posts
    {
        const std::lock_guard lock(m_mutex);
        m_isWanted = true;
        m_changed.notify_one();
        return true;
    }
    void Stop()
    {
        const std::lock_guard lock(m_mutex);
        m_isEnding = true;
        m_changed.notify_one();
    }
    void Run(const std::function<void()>& drawCallback)
    {
        Nib::EglContext context;
        context.Create(EGL_NO_CONTEXT, false, Nib::EglContext::Priority::Medium);
        const std::unique_ptr<Nib::EglSurface> surface(
            Nib::Egl::GetInstance()->CreateOffscreenSurface(16, 16));
        Nib::Egl::GetInstance()->MakeCurrent(&context, surface.get());
        while (WaitForFrame())
            drawCallback();
        Nib::Egl::GetInstance()->MakeCurrent(nullptr, nullptr);
    }

private:
    bool WaitForFrame()
    {
        std::unique_lock lock(m_mutex);
        m_changed.wait(lock, [this] { return m_isWanted || m_isEnding; });
        m_isWanted = false;
        return !m_isEnding;
    }
    std::mutex m_mutex;
    std::condition_variable m_changed;
    bool m_isWanted = false;
    bool m_isEnding = false;
};

} // namespace

int main()
{
    Host host;
    // [guest]
    Nib::HwuiCallback callback{nullptr,
                               [](void*, void* context, int)
                               { return static_cast<Host*>(context)->RequestFrame(); },
                               &host};
    std::unique_ptr<Nib::RenderThreadHWUI> guest(
        Nib::RendererFactory::CreateHWUIRenderer(&callback, "guest"));
    // [guest]

    std::thread hostThread(
        [&]
        {
            host.Run(
                [&]
                {
                    // [callback]
                    glEnable(GL_BLEND); // the host's own state
                    Nib::OpenGLRenderer::OpenGlState state;
                    state.store();
                    guest->Render();
                    state.restore();
                    // [callback]
                });
        });

    std::atomic<int> drawn{0};
    // [post]
    for (int i = 0; i < 3; ++i)
    {
        Ink::Post(*guest->GetMsgQueue(),
                  [&drawn]
                  {
                      glDisable(GL_BLEND);
                      glClear(GL_COLOR_BUFFER_BIT);
                      ++drawn;
                  });
        guest->GetMsgQueue()->waitForCompleting(); // asks the host for a frame and waits for it
    }
    // [post]
    host.Stop();
    hostThread.join();
    guest.reset();
    std::printf("drawn %d\n", drawn.load());
    return drawn == 3 ? 0 : 1;
}
