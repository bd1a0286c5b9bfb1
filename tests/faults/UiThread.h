#ifndef NIB_TESTS_FAULTS_UI_THREAD_H
#define NIB_TESTS_FAULTS_UI_THREAD_H

#include "sim/SimDriver.h"

#include <nib/nib.h>

#include <condition_variable>
#include <deque>
#include <functional>
#include <mutex>
#include <string>
#include <thread>

/// A UI that draws its window with a context of its own on a thread of its own, and has a guest that
/// draws into each of its frames. It has set its state once and trusts that it stays.
class UiThread
{
public:
    using Tell = std::function<void(const std::string&)>;

    static constexpr int kSide = 32; ///< of the window

    /// @p tell hears what the driver refuses to the UI.
    UiThread(SimDriver& driver, Tell tell);
    ~UiThread();
    UiThread(const UiThread&) = delete;
    UiThread& operator=(const UiThread&) = delete;

    /// What the guest asks for frames with.
    Nib::HwuiCallback* Callback() { return &m_callback; }
    void SetGuest(Nib::RenderThreadGL* guest) { m_guest = guest; }

    /// Runs @p work on the UI's thread, and waits until that has nothing more to do.
    void Do(std::function<void()> work);
    /// Nothing on the UI's thread itself.
    void WaitUntilIdle();

    // on the UI's thread
    void MakeContext();
    void EndContext();
    void DrawFrame();
    bool HasContext() const { return m_isCurrent; }

private:
    static bool AskForFrame(void*, void* ui, int);
    void Post(std::function<void()> work);
    void Run();
    void SetState() const;

    Tell m_tell;
    ANativeWindow* m_window;
    Nib::HwuiCallback m_callback{nullptr, &UiThread::AskForFrame, this};
    Nib::RenderThreadGL* m_guest = nullptr;
    EGLDisplay m_display = EGL_NO_DISPLAY;
    EGLContext m_context = EGL_NO_CONTEXT;
    EGLSurface m_surface = EGL_NO_SURFACE;
    bool m_isCurrent = false;

    std::mutex m_lock;
    std::condition_variable m_change;
    std::deque<std::function<void()>> m_work;
    bool m_isBusy = false;
    bool m_isOver = false;
    std::thread m_thread; // the last member: all others are there before it runs
};

#endif
