#include "sim/SimDriver.h"

#include <gtest/gtest.h>

namespace
{

/// A context that is current on a window surface.
struct WindowFixture
{
    explicit WindowFixture(SimDriver& driver, int width = 8, int height = 8)
        : window(driver.Window(width, height)), display(eglGetDisplay(EGL_DEFAULT_DISPLAY))
    {
        eglInitialize(display, nullptr, nullptr);
        const EGLint wanted[] = {EGL_RENDERABLE_TYPE, 0x40, EGL_ALPHA_SIZE, 8, EGL_NONE};
        EGLint count = 0;
        eglChooseConfig(display, wanted, &config, 1, &count);
        surface = eglCreateWindowSurface(display, config,
                                         reinterpret_cast<EGLNativeWindowType>(window), nullptr);
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

void ClearTo(float red, float green, float blue)
{
    glClearColor(red, green, blue, 1);
    glClear(GL_COLOR_BUFFER_BIT);
}

TEST(SimWindow, AFrameIsSeenAfterTheSwap)
{
    SimDriver driver;
    const WindowFixture gl(driver);
    ClearTo(1, 0, 0);
    EXPECT_EQ(driver.FrontPixel(gl.window, 0, 0), (SimPixel{0, 0, 0, 0}));

    EXPECT_EQ(eglSwapBuffers(gl.display, gl.surface), EGLBoolean{EGL_TRUE});

    EXPECT_EQ(driver.FrontPixel(gl.window, 7, 7), (SimPixel{255, 0, 0, 255}));
    EXPECT_EQ(driver.WindowState(gl.window).presented, 1);
}

TEST(SimWindow, ThreeBuffersComeBackInTurn)
{
    SimDriver driver;
    const WindowFixture gl(driver);
    std::vector<EGLint> ages{gl.Age()};
    const float colors[][3] = {{1, 0, 0}, {0, 1, 0}, {0, 0, 1}};

    for (const auto& color : colors)
    {
        ClearTo(color[0], color[1], color[2]);
        eglSwapBuffers(gl.display, gl.surface);
        ages.push_back(gl.Age());
    }

    EXPECT_EQ(ages, (std::vector<EGLint>{0, 0, 0, 3}));
    EXPECT_EQ(driver.BackPixel(gl.window, 0, 0), (SimPixel{255, 0, 0, 255}));
}

TEST(SimWindow, ScissoredClearLeavesTheRest)
{
    SimDriver driver;
    const WindowFixture gl(driver);
    ClearTo(0, 0, 0);
    glEnable(GL_SCISSOR_TEST);
    glScissor(2, 2, 3, 1);
    ClearTo(1, 1, 1);
    eglSwapBuffers(gl.display, gl.surface);

    EXPECT_EQ(driver.FrontPixel(gl.window, 1, 2), (SimPixel{0, 0, 0, 255}));
    EXPECT_EQ(driver.FrontPixel(gl.window, 2, 2), (SimPixel{255, 255, 255, 255}));
    EXPECT_EQ(driver.FrontPixel(gl.window, 4, 2), (SimPixel{255, 255, 255, 255}));
    EXPECT_EQ(driver.FrontPixel(gl.window, 5, 2), (SimPixel{0, 0, 0, 255}));
    EXPECT_EQ(driver.FrontPixel(gl.window, 2, 3), (SimPixel{0, 0, 0, 255}));
}

} // namespace
