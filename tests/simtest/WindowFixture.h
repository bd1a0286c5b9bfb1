#ifndef NIB_SIMTEST_WINDOW_FIXTURE_H
#define NIB_SIMTEST_WINDOW_FIXTURE_H

#include "sim/SimDriver.h"

/// A context that is current on a window surface.
struct WindowFixture
{
    explicit WindowFixture(SimDriver& driver, int width = 8, int height = 8,
                           const EGLint* attributes = nullptr)
        : window(driver.Window(width, height)), display(eglGetDisplay(EGL_DEFAULT_DISPLAY))
    {
        eglInitialize(display, nullptr, nullptr);
        const EGLint wanted[] = {EGL_RENDERABLE_TYPE, 0x40, EGL_ALPHA_SIZE, 8, EGL_NONE};
        EGLint count = 0;
        eglChooseConfig(display, wanted, &config, 1, &count);
        surface = eglCreateWindowSurface(display, config,
                                         reinterpret_cast<EGLNativeWindowType>(window), attributes);
        const EGLint version[] = {EGL_CONTEXT_CLIENT_VERSION, 3, EGL_NONE};
        context = eglCreateContext(display, config, EGL_NO_CONTEXT, version);
        eglMakeCurrent(display, surface, surface, context);
    }
    ~WindowFixture()
    {
        eglMakeCurrent(display, EGL_NO_SURFACE, EGL_NO_SURFACE, EGL_NO_CONTEXT);
        eglDestroySurface(display, surface);
        eglDestroyContext(display, context);
    }

    EGLint Age() const
    {
        EGLint age = -1;
        eglQuerySurface(display, surface, EGL_BUFFER_AGE_EXT, &age);
        return age;
    }

    ANativeWindow* window;
    EGLDisplay display;
    EGLConfig config = nullptr;
    EGLSurface surface = EGL_NO_SURFACE;
    EGLContext context = EGL_NO_CONTEXT;
};

inline void ClearTo(float red, float green, float blue)
{
    glClearColor(red, green, blue, 1);
    glClear(GL_COLOR_BUFFER_BIT);
}

#endif
