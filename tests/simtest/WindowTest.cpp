#include "WindowFixture.h"

#include <gtest/gtest.h>

namespace
{

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

TEST(SimWindow, AgesMayBeGiven)
{
    SimDriver driver(SimGpu::Default().WithBufferAges({0, 1, 2}));
    const WindowFixture gl(driver);
    std::vector<EGLint> ages{gl.Age()};
    for (const float red : {0.2f, 0.4f, 0.6f})
    {
        ClearTo(red, 0, 0);
        eglSwapBuffers(gl.display, gl.surface);
        ages.push_back(gl.Age());
    }

    EXPECT_EQ(ages, (std::vector<EGLint>{0, 1, 2, 2}));
    EXPECT_EQ(driver.BackPixel(gl.window, 3, 3), (SimPixel{102, 0, 0, 255})); // of two frames ago
}

TEST(SimWindow, ABackBufferWithoutContentIsPoisoned)
{
    SimDriver driver;
    const WindowFixture gl(driver);

    EXPECT_EQ(driver.BackPixel(gl.window, 0, 0), (SimPixel{0xDE, 0xAD, 0xBE, 0xEF}));
    ClearTo(1, 1, 1);
    eglSwapBuffers(gl.display, gl.surface);
    EXPECT_EQ(driver.BackPixel(gl.window, 0, 0), (SimPixel{0xDE, 0xAD, 0xBE, 0xEF}));
}

TEST(SimWindow, APreservedBufferKeepsItsContent)
{
    SimDriver driver;
    const WindowFixture gl(driver);
    EXPECT_TRUE(eglSurfaceAttrib(gl.display, gl.surface, EGL_SWAP_BEHAVIOR, EGL_BUFFER_PRESERVED));
    ClearTo(0, 1, 0);
    eglSwapBuffers(gl.display, gl.surface);

    EXPECT_EQ(driver.BackPixel(gl.window, 0, 0), (SimPixel{0, 255, 0, 255}));
    EXPECT_EQ(gl.Age(), 1);
}

TEST(SimWindow, PreservingMayBeRefused)
{
    SimDriver driver(SimGpu::Default().WithoutPreservedSwap());
    const WindowFixture gl(driver);
    EXPECT_FALSE(eglSurfaceAttrib(gl.display, gl.surface, EGL_SWAP_BEHAVIOR, EGL_BUFFER_PRESERVED));
    EXPECT_EQ(eglGetError(), EGL_BAD_MATCH);
}

TEST(SimWindow, ADamagedSwapShowsTheDamageOnly)
{
    SimDriver driver(SimGpu::Named("Mali-G72"));
    const WindowFixture gl(driver);
    const auto swap = reinterpret_cast<PFNEGLSWAPBUFFERSWITHDAMAGEKHRPROC>(
        eglGetProcAddress("eglSwapBuffersWithDamageKHR"));
    ClearTo(1, 0, 0);
    EGLint damage[] = {0, 0, 4, 4};

    EXPECT_TRUE(swap(gl.display, gl.surface, damage, 1));

    EXPECT_EQ(driver.FrontPixel(gl.window, 3, 3), (SimPixel{255, 0, 0, 255}));
    EXPECT_EQ(driver.FrontPixel(gl.window, 4, 3), (SimPixel{0, 0, 0, 0}));
    EXPECT_EQ(driver.WindowState(gl.window).lastDamage, (std::vector<long long>{0, 0, 4, 4}));
    EXPECT_EQ(driver.LastCall("eglSwapBuffersWithDamageKHR").list,
              (std::vector<long long>{0, 0, 4, 4}));
}

TEST(SimWindow, TheDamageRegionNeedsTheAge)
{
    SimDriver driver(SimGpu::Named("Mali-G72"));
    const WindowFixture gl(driver);
    const auto set =
        reinterpret_cast<PFNEGLSETDAMAGEREGIONKHRPROC>(eglGetProcAddress("eglSetDamageRegionKHR"));
    EGLint damage[] = {0, 0, 4, 4};
    EXPECT_FALSE(set(gl.display, gl.surface, damage, 1));
    EXPECT_EQ(eglGetError(), EGL_BAD_ACCESS);
    gl.Age();
    EXPECT_TRUE(set(gl.display, gl.surface, damage, 1));
    EXPECT_FALSE(set(gl.display, gl.surface, damage, 1)); // once a frame
    EXPECT_EQ(eglGetError(), EGL_BAD_ACCESS);
    eglSwapBuffers(gl.display, gl.surface);
    gl.Age();
    EXPECT_TRUE(set(gl.display, gl.surface, damage, 1));
}

TEST(SimWindow, ASubBufferShowsItsRectangle)
{
    SimDriver driver(SimGpu::Default().WithPostSubBuffer());
    const EGLint attributes[] = {EGL_POST_SUB_BUFFER_SUPPORTED_NV, EGL_TRUE, EGL_NONE};
    const WindowFixture gl(driver, 8, 8, attributes);
    const auto post =
        reinterpret_cast<PFNEGLPOSTSUBBUFFERNVPROC>(eglGetProcAddress("eglPostSubBufferNV"));
    EGLint supported = 0;
    eglQuerySurface(gl.display, gl.surface, EGL_POST_SUB_BUFFER_SUPPORTED_NV, &supported);
    EXPECT_EQ(supported, EGL_TRUE);
    ClearTo(0, 0, 1);

    EXPECT_TRUE(post(gl.display, gl.surface, 2, 3, 4, 1));

    EXPECT_EQ(driver.FrontPixel(gl.window, 2, 3), (SimPixel{0, 0, 255, 255}));
    EXPECT_EQ(driver.FrontPixel(gl.window, 6, 3), (SimPixel{0, 0, 0, 0}));
    EXPECT_EQ(driver.BackPixel(gl.window, 0, 0), (SimPixel{0, 0, 255, 255}));
}

TEST(SimWindow, ANewSizeArrivesWithTheNextFrame)
{
    SimDriver driver;
    const WindowFixture gl(driver);
    driver.ResizeWindow(gl.window, 16, 4);
    EXPECT_EQ(driver.Surface(gl.surface).width, 8);
    eglSwapBuffers(gl.display, gl.surface);

    EXPECT_EQ(driver.Surface(gl.surface).width, 16);
    EXPECT_EQ(driver.Surface(gl.surface).height, 4);
    EXPECT_EQ(gl.Age(), 0);
}

TEST(SimWindow, AnAbandonedWindowRefusesFramesAndSurfaces)
{
    SimDriver driver;
    const WindowFixture gl(driver);
    driver.AbandonWindow(gl.window);

    EXPECT_FALSE(eglSwapBuffers(gl.display, gl.surface));
    EXPECT_EQ(eglGetError(), EGL_BAD_NATIVE_WINDOW);
    ANativeWindow* const other = driver.Window(4, 4);
    driver.AbandonWindow(other);
    EXPECT_EQ(eglCreateWindowSurface(gl.display, gl.config,
                                     reinterpret_cast<EGLNativeWindowType>(other), nullptr),
              EGL_NO_SURFACE);
    EXPECT_EQ(eglGetError(), EGL_BAD_NATIVE_WINDOW);
}

TEST(SimWindow, OneSurfaceAWindow)
{
    SimDriver driver;
    driver.ExpectMisuse("eglCreateWindowSurface");
    const WindowFixture gl(driver);
    EXPECT_EQ(eglCreateWindowSurface(gl.display, gl.config,
                                     reinterpret_cast<EGLNativeWindowType>(gl.window), nullptr),
              EGL_NO_SURFACE);
    EXPECT_EQ(eglGetError(), EGL_BAD_ALLOC);
}

constexpr EGLint kAutoRefresh = 0x314C; // EGL_FRONT_BUFFER_AUTO_REFRESH_ANDROID

TEST(SimFrontBuffer, TakesEffectAtTheSwap)
{
    SimDriver driver(SimGpu::Default().WithFrontBuffer());
    const WindowFixture gl(driver);
    EXPECT_TRUE(eglSurfaceAttrib(gl.display, gl.surface, EGL_RENDER_BUFFER, EGL_SINGLE_BUFFER));
    EGLint asked = 0;
    EGLint active = 0;
    eglQuerySurface(gl.display, gl.surface, EGL_RENDER_BUFFER, &asked);
    eglQueryContext(gl.display, gl.context, EGL_RENDER_BUFFER, &active);
    EXPECT_EQ(asked, EGL_SINGLE_BUFFER);
    EXPECT_EQ(active, EGL_BACK_BUFFER);

    ClearTo(0, 0, 0);
    eglSwapBuffers(gl.display, gl.surface);
    eglQueryContext(gl.display, gl.context, EGL_RENDER_BUFFER, &active);
    EXPECT_EQ(active, EGL_SINGLE_BUFFER);
    EXPECT_TRUE(eglSurfaceAttrib(gl.display, gl.surface, kAutoRefresh, EGL_TRUE));
    ClearTo(1, 0, 1);
    EXPECT_EQ(driver.FrontPixel(gl.window, 5, 5), (SimPixel{255, 0, 255, 255})); // without a swap
    glFinish();
    EXPECT_EQ(driver.WindowState(gl.window).presented, 2);
    EXPECT_TRUE(driver.Surface(gl.surface).autoRefresh);
}

TEST(SimFrontBuffer, IsRefusedByOtherConfigurations)
{
    SimDriver driver(SimGpu::Default().WithEglExtension("EGL_KHR_mutable_render_buffer"));
    const WindowFixture gl(driver);
    EXPECT_FALSE(eglSurfaceAttrib(gl.display, gl.surface, EGL_RENDER_BUFFER, EGL_SINGLE_BUFFER));
    EXPECT_EQ(eglGetError(), EGL_BAD_MATCH);
    EXPECT_FALSE(eglSurfaceAttrib(gl.display, gl.surface, kAutoRefresh, EGL_TRUE));
    EXPECT_EQ(eglGetError(), EGL_BAD_ATTRIBUTE);
}

TEST(SimFrontBuffer, IsUnknownWithoutTheExtension)
{
    SimDriver driver;
    const WindowFixture gl(driver);
    EXPECT_FALSE(eglSurfaceAttrib(gl.display, gl.surface, EGL_RENDER_BUFFER, EGL_SINGLE_BUFFER));
    EXPECT_EQ(eglGetError(), EGL_BAD_ATTRIBUTE);
}

} // namespace
