#include "WindowFixture.h"

#include <gtest/gtest.h>

namespace
{

template <typename Function>
Function Resolve(const char* name)
{
    return reinterpret_cast<Function>(eglGetProcAddress(name));
}

struct Timing
{
    PFNEGLGETNEXTFRAMEIDANDROIDPROC nextId =
        Resolve<PFNEGLGETNEXTFRAMEIDANDROIDPROC>("eglGetNextFrameIdANDROID");
    PFNEGLGETFRAMETIMESTAMPSANDROIDPROC frame =
        Resolve<PFNEGLGETFRAMETIMESTAMPSANDROIDPROC>("eglGetFrameTimestampsANDROID");
    PFNEGLGETFRAMETIMESTAMPSUPPORTEDANDROIDPROC supportsFrame =
        Resolve<PFNEGLGETFRAMETIMESTAMPSUPPORTEDANDROIDPROC>(
            "eglGetFrameTimestampSupportedANDROID");
    PFNEGLGETCOMPOSITORTIMINGANDROIDPROC compositor =
        Resolve<PFNEGLGETCOMPOSITORTIMINGANDROIDPROC>("eglGetCompositorTimingANDROID");
    PFNEGLPRESENTATIONTIMEANDROIDPROC present =
        Resolve<PFNEGLPRESENTATIONTIMEANDROIDPROC>("eglPresentationTimeANDROID");
};

TEST(SimTiming, NeedsTimestampsToBeOn)
{
    SimDriver driver;
    const WindowFixture gl(driver);
    const Timing timing;
    EGLuint64KHR id = 0;

    EXPECT_FALSE(timing.nextId(gl.display, gl.surface, &id));
    EXPECT_EQ(eglGetError(), EGL_BAD_SURFACE);
    EXPECT_TRUE(eglSurfaceAttrib(gl.display, gl.surface, EGL_TIMESTAMPS_ANDROID, EGL_TRUE));
    EXPECT_TRUE(timing.nextId(gl.display, gl.surface, &id));
    EXPECT_EQ(id, 1u);
}

TEST(SimTiming, TimesArePendingUntilThePresentation)
{
    SimDriver driver;
    const WindowFixture gl(driver);
    const Timing timing;
    eglSurfaceAttrib(gl.display, gl.surface, EGL_TIMESTAMPS_ANDROID, EGL_TRUE);
    driver.SetFrameTime(EGL_DISPLAY_PRESENT_TIME_ANDROID, 123456789);
    const EGLint name = EGL_DISPLAY_PRESENT_TIME_ANDROID;
    EGLnsecsANDROID time = 0;
    EXPECT_TRUE(timing.frame(gl.display, gl.surface, 1, 1, &name, &time));
    EXPECT_EQ(time, EGL_TIMESTAMP_PENDING_ANDROID);

    eglSwapBuffers(gl.display, gl.surface);

    EXPECT_TRUE(timing.frame(gl.display, gl.surface, 1, 1, &name, &time));
    EXPECT_EQ(time, 123456789);
    EXPECT_FALSE(timing.frame(gl.display, gl.surface, 3, 1, &name, &time)); // of the future
    EXPECT_EQ(eglGetError(), EGL_BAD_ACCESS);
}

TEST(SimTiming, UnknownAndRefusedNamesFail)
{
    SimDriver driver;
    const WindowFixture gl(driver);
    const Timing timing;
    eglSurfaceAttrib(gl.display, gl.surface, EGL_TIMESTAMPS_ANDROID, EGL_TRUE);
    driver.RefuseTiming(EGL_READS_DONE_TIME_ANDROID);
    const EGLint none = 0;
    EGLnsecsANDROID time = 7;

    EXPECT_FALSE(timing.frame(gl.display, gl.surface, 1, 1, &none, &time));
    EXPECT_EQ(eglGetError(), EGL_BAD_PARAMETER);
    EXPECT_EQ(time, 7);
    EXPECT_FALSE(timing.supportsFrame(gl.display, gl.surface, EGL_READS_DONE_TIME_ANDROID));
    EXPECT_TRUE(timing.supportsFrame(gl.display, gl.surface, EGL_DEQUEUE_READY_TIME_ANDROID));
}

TEST(SimTiming, CompositorAndPresentationTimes)
{
    SimDriver driver;
    const WindowFixture gl(driver);
    const Timing timing;
    eglSurfaceAttrib(gl.display, gl.surface, EGL_TIMESTAMPS_ANDROID, EGL_TRUE);
    driver.SetCompositorTime(EGL_COMPOSITE_INTERVAL_ANDROID, 16666666);
    const EGLint name = EGL_COMPOSITE_INTERVAL_ANDROID;
    EGLnsecsANDROID time = 0;

    EXPECT_TRUE(timing.compositor(gl.display, gl.surface, 1, &name, &time));
    EXPECT_EQ(time, 16666666);
    EXPECT_TRUE(timing.present(gl.display, gl.surface, 42));
    EXPECT_EQ(driver.Surface(gl.surface).presentationTimes, std::vector<long long>{42});
}

} // namespace
