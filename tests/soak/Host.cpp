#include "Host.h"

#include "Failure.h"

#include <GLES3/gl3.h>

#include <array>
#include <exception>

namespace Soak
{

namespace
{

constexpr EGLint kSide = 16; ///< of the host's window

/// What the host has set once and trusts from then on.
void SetState()
{
    glViewport(0, 0, kSide, kSide);
    glScissor(0, 0, kSide / 2, kSide);
    glEnable(GL_SCISSOR_TEST);
}

} // namespace

Host::Host()
    : m_guest(Nib::RendererFactory::CreateHWUIRenderer(&m_callback, "soak guest")),
      m_thread([this] { Run(); })
{
}

Host::~Host()
{
    {
        const std::lock_guard<std::mutex> lock(m_lock);
        m_isOver = true;
    }
    m_change.notify_all();
    if (m_thread.joinable())
        m_thread.join();
}

void Host::Finish()
{
    {
        const std::lock_guard<std::mutex> lock(m_lock);
        m_isOver = true;
    }
    m_change.notify_all();
    m_thread.join();
    Require(m_failure.empty(), m_failure);
}

/// Called with a lock of the guest held.
bool Host::AskForFrame(void*, void* host, int)
{
    Host& self = *static_cast<Host*>(host);
    {
        const std::lock_guard<std::mutex> lock(self.m_lock);
        self.m_isAsked = true;
    }
    self.m_change.notify_all();
    return true;
}

void Host::Run()
{
    try
    {
        MakeContext();
    }
    catch (const std::exception& failure)
    {
        m_failure = failure.what();
    }
    DrawFrames(); // without a context as well: somebody may wait for one
    m_guest.reset();
    DestroyContext();
}

void Host::MakeContext()
{
    const EGLint wanted[] = {EGL_SURFACE_TYPE,
                             EGL_PBUFFER_BIT,
                             EGL_RENDERABLE_TYPE,
                             EGL_OPENGL_ES3_BIT,
                             EGL_RED_SIZE,
                             8,
                             EGL_ALPHA_SIZE,
                             8,
                             EGL_NONE};
    const EGLint version[] = {EGL_CONTEXT_CLIENT_VERSION, 3, EGL_NONE};
    const EGLint size[] = {EGL_WIDTH, kSide, EGL_HEIGHT, kSide, EGL_NONE};
    EGLConfig config = nullptr;
    EGLint count = 0;
    m_display = eglGetDisplay(EGL_DEFAULT_DISPLAY); // the library has initialised it
    eglBindAPI(EGL_OPENGL_ES_API);
    eglChooseConfig(m_display, wanted, &config, 1, &count);
    m_context = eglCreateContext(m_display, config, EGL_NO_CONTEXT, version);
    m_surface = eglCreatePbufferSurface(m_display, config, size);
    Require(eglMakeCurrent(m_display, m_surface, m_surface, m_context) == EGL_TRUE,
            "the host gets no context");
    SetState();
}

void Host::DrawFrames()
{
    std::unique_lock<std::mutex> lock(m_lock);
    while (true)
    {
        m_change.wait(lock, [this] { return m_isAsked || m_isOver; });
        if (!m_isAsked)
            return;
        m_isAsked = false;
        lock.unlock();
        DrawFrame();
        lock.lock();
    }
}

void Host::DrawFrame()
{
    Nib::OpenGLRenderer::OpenGlState state;
    state.store();
    m_guest->Render();
    state.restore();

    glClearColor(0.0f, 1.0f, 0.0f, 1.0f); // which is not among what is stored
    glClear(GL_COLOR_BUFFER_BIT);
    std::array<unsigned char, 4> inside{};
    glReadPixels(1, 1, 1, 1, GL_RGBA, GL_UNSIGNED_BYTE, inside.data());
    const bool isGreen = inside == std::array<unsigned char, 4>{0, 255, 0, 255};
    if (m_failure.empty() && !(isGreen && glIsEnabled(GL_SCISSOR_TEST) == GL_TRUE))
        m_failure = "the guest has changed its host's state";
}

void Host::DestroyContext()
{
    eglMakeCurrent(m_display, EGL_NO_SURFACE, EGL_NO_SURFACE, EGL_NO_CONTEXT);
    if (m_surface != EGL_NO_SURFACE)
        eglDestroySurface(m_display, m_surface);
    if (m_context != EGL_NO_CONTEXT)
        eglDestroyContext(m_display, m_context);
    eglReleaseThread();
}

} // namespace Soak
