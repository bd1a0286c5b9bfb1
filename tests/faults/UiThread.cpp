#include "faults/UiThread.h"

UiThread::UiThread(SimDriver& driver, Tell tell)
    : m_tell(std::move(tell)), m_window(driver.Window(kSide, kSide)), m_thread([this] { Run(); })
{
}

UiThread::~UiThread()
{
    {
        const std::lock_guard<std::mutex> lock(m_lock);
        m_isOver = true;
    }
    m_change.notify_all();
    m_thread.join();
}

void UiThread::Do(std::function<void()> work)
{
    Post(std::move(work));
    WaitUntilIdle();
}

void UiThread::WaitUntilIdle()
{
    if (std::this_thread::get_id() == m_thread.get_id())
        return;
    std::unique_lock<std::mutex> lock(m_lock);
    m_change.wait(lock, [this] { return m_work.empty() && !m_isBusy; });
}

/// Called with a lock of the guest held.
bool UiThread::AskForFrame(void*, void* ui, int)
{
    auto* const self = static_cast<UiThread*>(ui);
    self->Post([self] { self->DrawFrame(); });
    return true;
}

void UiThread::Post(std::function<void()> work)
{
    {
        const std::lock_guard<std::mutex> lock(m_lock);
        m_work.push_back(std::move(work));
    }
    m_change.notify_all();
}

void UiThread::Run()
{
    std::unique_lock<std::mutex> lock(m_lock);
    while (true)
    {
        m_change.wait(lock, [this] { return !m_work.empty() || m_isOver; });
        if (m_work.empty())
            return;
        const std::function<void()> work = std::move(m_work.front());
        m_work.pop_front();
        m_isBusy = true;
        lock.unlock();
        work();
        lock.lock();
        m_isBusy = false;
        m_change.notify_all();
    }
}

// ---- on the UI's thread -------------------------------------------------------------------------

void UiThread::MakeContext()
{
    const EGLint wanted[] = {EGL_SURFACE_TYPE,
                             EGL_WINDOW_BIT,
                             EGL_RENDERABLE_TYPE,
                             EGL_OPENGL_ES3_BIT,
                             EGL_RED_SIZE,
                             8,
                             EGL_ALPHA_SIZE,
                             8,
                             EGL_NONE};
    const EGLint version[] = {EGL_CONTEXT_CLIENT_VERSION, 3, EGL_NONE};
    EGLConfig config = nullptr;
    EGLint count = 0;
    m_display = eglGetDisplay(EGL_DEFAULT_DISPLAY);
    eglInitialize(m_display, nullptr, nullptr);
    if (eglChooseConfig(m_display, wanted, &config, 1, &count) != EGL_TRUE || count < 1)
        return m_tell("no configuration for the UI");
    m_context = eglCreateContext(m_display, config, EGL_NO_CONTEXT, version);
    if (m_context == EGL_NO_CONTEXT)
        return m_tell("no context for the UI");
    m_surface = eglCreateWindowSurface(m_display, config,
                                       reinterpret_cast<EGLNativeWindowType>(m_window), nullptr);
    if (m_surface == EGL_NO_SURFACE)
        return m_tell("no surface for the UI");
    m_isCurrent = eglMakeCurrent(m_display, m_surface, m_surface, m_context) == EGL_TRUE;
    if (!m_isCurrent)
        return m_tell("the UI's context does not become current");
    SetState();
}

void UiThread::SetState() const
{
    glViewport(0, 0, kSide, kSide);
    glScissor(0, 0, kSide / 4, kSide);
    glEnable(GL_SCISSOR_TEST);
}

void UiThread::EndContext()
{
    m_isCurrent = false;
    eglMakeCurrent(m_display, EGL_NO_SURFACE, EGL_NO_SURFACE, EGL_NO_CONTEXT);
    if (m_surface != EGL_NO_SURFACE && eglDestroySurface(m_display, m_surface) != EGL_TRUE)
        m_tell("the UI's surface stays");
    if (m_context != EGL_NO_CONTEXT && eglDestroyContext(m_display, m_context) != EGL_TRUE)
        m_tell("the UI's context stays");
    m_surface = EGL_NO_SURFACE;
    m_context = EGL_NO_CONTEXT;
}

/// The guest's picture, and a green stripe of the UI's own.
void UiThread::DrawFrame()
{
    if (!m_isCurrent)
    {
        m_guest->Render(); // somebody may wait for it
        return;
    }
    Nib::OpenGLRenderer::OpenGlState state;
    state.store();
    m_guest->Render();
    state.restore();

    glClearColor(0, 1, 0, 1); // which is not among what is stored
    glClear(GL_COLOR_BUFFER_BIT);
    if (eglSwapBuffers(m_display, m_surface) != EGL_TRUE)
        m_tell("the UI's frame is not shown");
}
