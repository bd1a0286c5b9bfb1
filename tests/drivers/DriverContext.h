#ifndef NIB_TESTS_DRIVERS_DRIVERCONTEXT_H
#define NIB_TESTS_DRIVERS_DRIVERCONTEXT_H

#include "drivers/Driver.h"
#include "drivers/WaylandWindow.h"

#include <EGL/egl.h>
#include <GLES3/gl31.h>

#include <gtest/gtest.h>

#include <array>
#include <optional>

/// A context of the driver that the process has loaded, current on a small pbuffer, or on a window
/// where there are none: somebody else's context, made without the library. A test must leave no GL error behind.
class DriverContext : public testing::Test
{
protected:
    static constexpr int kWidth = 64;
    static constexpr int kHeight = 32;

    void SetUp() override
    {
        if (DriverIs({"wayland"}))
        {
            if (!CanMakeWaylandWindows())
                GTEST_SKIP() << "built without Wayland";
            m_window.emplace(kWidth, kHeight);
        }
        m_display = eglGetDisplay(m_window ? m_window->NativeDisplay() : EGL_DEFAULT_DISPLAY);
        ASSERT_EQ(eglInitialize(m_display, nullptr, nullptr), EGLBoolean{EGL_TRUE});
        eglBindAPI(EGL_OPENGL_ES_API);
        const EGLint wanted[] = {EGL_SURFACE_TYPE,
                                 m_window ? EGL_WINDOW_BIT : EGL_PBUFFER_BIT,
                                 EGL_RENDERABLE_TYPE,
                                 EGL_OPENGL_ES3_BIT,
                                 EGL_RED_SIZE,
                                 8,
                                 EGL_ALPHA_SIZE,
                                 8,
                                 EGL_STENCIL_SIZE,
                                 8,
                                 EGL_NONE};
        EGLConfig config = nullptr;
        EGLint count = 0;
        ASSERT_EQ(eglChooseConfig(m_display, wanted, &config, 1, &count), EGLBoolean{EGL_TRUE});
        ASSERT_EQ(count, 1);
        const EGLint version[] = {EGL_CONTEXT_CLIENT_VERSION, 3, EGL_NONE};
        m_context = eglCreateContext(m_display, config, EGL_NO_CONTEXT, version);
        ASSERT_NE(m_context, EGL_NO_CONTEXT);
        m_surface = NewSurface(config);
        ASSERT_NE(m_surface, EGL_NO_SURFACE);
        ASSERT_EQ(eglMakeCurrent(m_display, m_surface, m_surface, m_context), EGLBoolean{EGL_TRUE});
    }

    void TearDown() override
    {
        if (m_context == EGL_NO_CONTEXT)
            return;
        EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
        eglMakeCurrent(m_display, EGL_NO_SURFACE, EGL_NO_SURFACE, EGL_NO_CONTEXT);
        eglDestroySurface(m_display, m_surface);
        eglDestroyContext(m_display, m_context);
    }

    static GLint Integer(GLenum name)
    {
        GLint value = -1;
        glGetIntegerv(name, &value);
        return value;
    }

    static std::array<GLint, 4> FourIntegers(GLenum name)
    {
        std::array<GLint, 4> values = {-1, -1, -1, -1};
        glGetIntegerv(name, values.data());
        return values;
    }

private:
    EGLSurface NewSurface(EGLConfig config) const
    {
        const EGLint size[] = {EGL_WIDTH, kWidth, EGL_HEIGHT, kHeight, EGL_NONE};
        return m_window
                   ? eglCreateWindowSurface(m_display, config, m_window->NativeWindow(), nullptr)
                   : eglCreatePbufferSurface(m_display, config, size);
    }

    std::optional<WaylandWindow> m_window; // where there are no pbuffers; goes last
    EGLDisplay m_display = EGL_NO_DISPLAY;
    EGLContext m_context = EGL_NO_CONTEXT;
    EGLSurface m_surface = EGL_NO_SURFACE;
};

#endif
