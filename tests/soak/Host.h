#ifndef NIB_TESTS_SOAK_HOST_H
#define NIB_TESTS_SOAK_HOST_H

#include <nib/nib.h>

#include <EGL/egl.h>

#include <condition_variable>
#include <memory>
#include <mutex>
#include <string>
#include <thread>

namespace Soak
{

/// A UI's renderer: a thread with a context that nobody shares, and with GL state of its own. In each
/// frame that is asked for it lets its guest render, and draws what it always draws. A process has one
/// at a time, since the guests of a process lose their context together.
class Host
{
public:
    Host(); ///< [blocks] throws Failure
    ~Host();
    Host(const Host&) = delete;
    Host& operator=(const Host&) = delete;

    /// Its tasks run on the host's thread.
    Nib::RenderThreadHWUI& Guest() { return *m_guest; }

    /// [blocks] Ends the guest and the thread. Throws Failure when the guest has disturbed its host.
    void Finish();

private:
    static bool AskForFrame(void*, void* host, int);
    void Run();
    void MakeContext();
    void DrawFrames();
    void DrawFrame();
    void DestroyContext();

    Nib::HwuiCallback m_callback{nullptr, &AskForFrame, this};
    std::unique_ptr<Nib::RenderThreadHWUI> m_guest; ///< ended on the thread
    EGLDisplay m_display = EGL_NO_DISPLAY;
    EGLSurface m_surface = EGL_NO_SURFACE;
    EGLContext m_context = EGL_NO_CONTEXT;
    std::string m_failure; ///< of the thread, read when it has ended

    std::mutex m_lock;
    std::condition_variable m_change;
    bool m_isAsked = false; // guarded by m_lock
    bool m_isOver = false;  // guarded by m_lock
    std::thread m_thread;
};

} // namespace Soak

#endif
