#include "drivers/Holdings.h"

#include <EGL/egl.h>
#include <GLES3/gl3.h>

#include <atomic>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <ostream>
#include <string>

#include <dlfcn.h>

namespace
{

std::atomic<int> s_contexts{0};
std::atomic<int> s_surfaces{0};

template <typename Function>
Function* Real(const char* name)
{
    return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}

int CountIn(const char* folder)
{
    using Entries = std::filesystem::directory_iterator;
    return static_cast<int>(std::distance(Entries(folder), Entries()));
}

/// Without those that Mesa writes its own cache with: it starts more of them when there is more to
/// write, and keeps them.
int CountThreads()
{
    int count = 0;
    for (const auto& thread : std::filesystem::directory_iterator("/proc/self/task"))
    {
        std::string name;
        std::getline(std::ifstream(thread.path() / "comm"), name);
        count += name.find(":disk$") == std::string::npos ? 1 : 0;
    }
    return count;
}

} // namespace

// In front of the driver's, to count what is alive.
extern "C"
{
    __attribute__((visibility("default"))) EGLContext eglCreateContext(EGLDisplay display,
                                                                       EGLConfig config,
                                                                       EGLContext share,
                                                                       const EGLint* attributes)
    {
        static auto* const real = Real<decltype(eglCreateContext)>("eglCreateContext");
        const EGLContext context = real(display, config, share, attributes);
        s_contexts += context != EGL_NO_CONTEXT ? 1 : 0;
        return context;
    }

    __attribute__((visibility("default"))) EGLBoolean eglDestroyContext(EGLDisplay display,
                                                                        EGLContext context)
    {
        static auto* const real = Real<decltype(eglDestroyContext)>("eglDestroyContext");
        const EGLBoolean destroyed = real(display, context);
        s_contexts -= destroyed == EGL_TRUE ? 1 : 0;
        return destroyed;
    }

    __attribute__((visibility("default"))) EGLSurface
    eglCreatePbufferSurface(EGLDisplay display, EGLConfig config, const EGLint* attributes)
    {
        static auto* const real =
            Real<decltype(eglCreatePbufferSurface)>("eglCreatePbufferSurface");
        const EGLSurface surface = real(display, config, attributes);
        s_surfaces += surface != EGL_NO_SURFACE ? 1 : 0;
        return surface;
    }

    __attribute__((visibility("default"))) EGLSurface
    eglCreateWindowSurface(EGLDisplay display, EGLConfig config, EGLNativeWindowType window,
                           const EGLint* attributes)
    {
        static auto* const real = Real<decltype(eglCreateWindowSurface)>("eglCreateWindowSurface");
        const EGLSurface surface = real(display, config, window, attributes);
        s_surfaces += surface != EGL_NO_SURFACE ? 1 : 0;
        return surface;
    }

    __attribute__((visibility("default"))) EGLBoolean eglDestroySurface(EGLDisplay display,
                                                                        EGLSurface surface)
    {
        static auto* const real = Real<decltype(eglDestroySurface)>("eglDestroySurface");
        const EGLBoolean destroyed = real(display, surface);
        s_surfaces -= destroyed == EGL_TRUE ? 1 : 0;
        return destroyed;
    }
}

Holdings::Holdings()
    : contexts(s_contexts), surfaces(s_surfaces), threads(CountThreads()),
      files(CountIn("/proc/self/fd"))
{
}

bool operator==(const Holdings& a, const Holdings& b)
{
    return a.contexts == b.contexts && a.surfaces == b.surfaces && a.threads == b.threads &&
           a.files == b.files;
}

std::ostream& operator<<(std::ostream& out, const Holdings& held)
{
    return out << held.contexts << " contexts, " << held.surfaces << " surfaces, " << held.threads
               << " threads, " << held.files << " files";
}

int GlNamesInUse(unsigned highest)
{
    int count = 0;
    for (GLuint name = 1; name <= highest; ++name)
    {
        count += glIsTexture(name) + glIsBuffer(name) + glIsRenderbuffer(name) + glIsSampler(name) +
                 glIsProgram(name) + glIsShader(name);
    }
    return count;
}
