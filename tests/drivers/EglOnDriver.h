#ifndef NIB_TESTS_DRIVERS_EGL_ON_DRIVER_H
#define NIB_TESTS_DRIVERS_EGL_ON_DRIVER_H

#include "drivers/Driver.h"
#include "drivers/RenderThreadSupport.h"
#include "drivers/XWindow.h"

#include <nib/egl.h>

#include <GLES3/gl3.h>

#include <gtest/gtest.h>

/// Whether surfaces of the library's configuration may keep their content across swaps.
inline bool CanPreserve()
{
    const Nib::Egl* egl = Nib::Egl::GetInstance();
    EGLint types = 0;
    eglGetConfigAttrib(egl->GetDisplay(), egl->GetConfig(false), EGL_SURFACE_TYPE, &types);
    return (types & EGL_SWAP_BEHAVIOR_PRESERVED_BIT) != 0;
}

/// The library's own EGL objects, on whatever driver the process has loaded. Skipped where the
/// driver has nowhere to draw.
class EglOnDriver : public testing::Test
{
protected:
    void SetUp() override
    {
        if (!HasPbuffers())
            GTEST_SKIP() << kNoPbuffers;
    }

    void TearDown() override
    {
        if (!IsSkipped())
            Nib::Egl::GetInstance()->MakeCurrent(nullptr, nullptr);
    }

    /// Makes @p context, current on @p surface with its pbuffer.
    static void MakeReady(Nib::EglContext& context, Nib::HybridSurface& surface)
    {
        ASSERT_TRUE(context.Create(EGL_NO_CONTEXT, false, Nib::EglContext::Priority::Medium));
        ASSERT_TRUE(surface.Create());
        ASSERT_TRUE(Nib::Egl::GetInstance()->MakeCurrent(&context, surface.GetActiveSurface()));
    }

    static void Clear(float r, float g, float b, float a)
    {
        glClearColor(r, g, b, a);
        glClear(GL_COLOR_BUFFER_BIT);
    }

    static Rgba PixelAt(int x, int y)
    {
        Rgba pixel = {9, 9, 9, 9};
        glReadPixels(x, y, 1, 1, GL_RGBA, GL_UNSIGNED_BYTE, pixel.data());
        return pixel;
    }
};

#endif
