#include "PlantedLeak.h"

#include <EGL/egl.h>
#include <GLES3/gl3.h>

#include <chrono>
#include <cstdlib>
#include <cstring>
#include <thread>
#include <utility>

#include <fcntl.h>

namespace Soak
{

namespace
{

void* volatile s_lastMemory = nullptr; ///< looked at by nobody, so that it is really allocated

/// Leaves as much as a small page has.
void LeaveMemory()
{
    constexpr std::size_t kBytes = 200 * 1024;
    s_lastMemory = std::memset(std::malloc(kBytes), 1, kBytes);
}

void LeaveName()
{
    GLuint name = 0;
    glGenTextures(1, &name);
    glBindTexture(GL_TEXTURE_2D, name); // it exists from then on
}

void LeaveFile()
{
    static_cast<void>(open("/dev/null", O_RDONLY | O_CLOEXEC));
}

void LeaveThread()
{
    std::thread([] { std::this_thread::sleep_for(std::chrono::hours(24)); }).detach();
}

void LeaveContext()
{
    const EGLDisplay display = eglGetCurrentDisplay();
    EGLConfig config = nullptr;
    EGLint count = 0;
    const EGLint any[] = {EGL_RENDERABLE_TYPE, EGL_OPENGL_ES2_BIT, EGL_NONE};
    const EGLint version[] = {EGL_CONTEXT_CLIENT_VERSION, 2, EGL_NONE};
    eglChooseConfig(display, any, &config, 1, &count);
    eglCreateContext(display, config, EGL_NO_CONTEXT, version);
}

constexpr std::pair<std::string_view, void (*)()> kLeaks[] = {{"memory", &LeaveMemory},
                                                              {"name", &LeaveName},
                                                              {"file", &LeaveFile},
                                                              {"thread", &LeaveThread},
                                                              {"context", &LeaveContext}};

} // namespace

bool PlantedLeak::Choose(std::string_view what)
{
    for (const auto& [name, leave] : kLeaks)
    {
        if (name == what)
            m_leave = leave;
    }
    return m_leave != nullptr;
}

void PlantedLeak::LeaveSomething() const
{
    if (m_leave)
        m_leave();
}

} // namespace Soak
