#include "egl/EglTestSupport.h"

#include <nib/base.h>
#include <nib/device.h>

#include <gtest/gtest.h>

#include <cstdlib>

using Nib::Egl;
using Nib::EglContext;
using Nib::System;

namespace
{

using Values = std::vector<long long>;

const char kPbufferLine[] = "bool Nib::Egl::FindConfig(bool, EGLConfig *): "
                            "no configuration for windows, looking for one for pbuffers";
const char kFrontBufferLine[] =
    "bool Nib::Egl::Init(): the ordinary configuration stands for the front-buffer one";

/// A driver that has no windows, and no front buffers.
SimGpu WithoutWindows()
{
    SimConfig config = Bits(8, 8, 8, 8, 0, 0);
    config.surfaceType = EGL_PBUFFER_BIT;
    return SimGpu::Default().WithoutFrontBuffer().WithConfigs({config});
}

SimGpu WithWindows()
{
    return SimGpu::Default().WithoutFrontBuffer().WithConfigs({Bits(8, 8, 8, 8, 0, 0)});
}

/// A driver on which the fallbacks are on.
struct Desktop : SimDriver
{
    explicit Desktop(SimGpu gpu) : SimDriver(std::move(gpu)) { System::SetDesktopFallbacks(true); }
};

} // namespace

// ---- windows ------------------------------------------------------------------------------------

TEST(DesktopFallback, WithoutWindowsPbuffersAreLookedForOnceMore)
{
    Desktop driver(WithoutWindows());

    Egl* egl = Egl::GetInstance();

    EXPECT_EQ(IndexOf(egl->GetConfig(false)), 0);
    const std::vector<SimCall> calls = driver.Calls("eglChooseConfig");
    ASSERT_EQ(calls.size(), 3u); // none, counted again, fetched
    EXPECT_EQ(calls[0].list,
              (Values{0x3040, 0x40, 0x3033, 0x5, 0x3024, 4, 0x3023, 4, 0x3022, 4, 0x3026, 0}));
    EXPECT_EQ(calls[1].list,
              (Values{0x3040, 0x40, 0x3033, 0x1, 0x3024, 4, 0x3023, 4, 0x3022, 4, 0x3026, 0}));
    EXPECT_EQ(calls[2].list, calls[1].list);
}

TEST(DesktopFallback, SearchForPbuffersIsOneLine)
{
    Desktop driver(WithoutWindows());

    Egl::GetInstance();

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kPbufferLine), 1u);
}

TEST(DesktopFallback, ContextsAndPbuffersWorkWithoutWindows)
{
    Desktop driver(WithoutWindows());
    EglContext context;

    EXPECT_TRUE(context.Create(EGL_NO_CONTEXT, false, EglContext::Priority::Medium));
    Nib::EglSurface* surface = Egl::GetInstance()->CreateOffscreenSurface(1, 1);
    ASSERT_NE(surface, nullptr);
    EXPECT_TRUE(Egl::GetInstance()->MakeCurrent(&context, surface));

    Egl::GetInstance()->MakeCurrent(nullptr, nullptr);
    delete surface;
}

TEST(DesktopFallback, PbuffersAreChosenByTheSameRule)
{
    SimConfig deep = Bits(8, 8, 8, 8, 24, 8);
    SimConfig flat = Bits(8, 8, 8, 8, 0, 0);
    SimConfig ten = Bits(10, 10, 10, 2, 0, 0);
    deep.surfaceType = flat.surfaceType = ten.surfaceType = EGL_PBUFFER_BIT;
    Desktop driver(WithoutWindows().WithConfigs({ten, deep, flat}));

    EXPECT_EQ(IndexOf(Egl::GetInstance()->GetConfig(false)), 2);
}

TEST(DesktopFallback, WithoutPbuffersEitherThereIsNoConfiguration)
{
    SimConfig windowOnly = Bits(8, 8, 8, 8, 0, 0);
    windowOnly.surfaceType = EGL_WINDOW_BIT;
    Desktop driver(WithoutWindows().WithConfigs({windowOnly}));

    Egl* egl = Egl::GetInstance();

    EXPECT_EQ(egl->GetConfig(false), nullptr);
    EXPECT_EQ(egl->GetConfig(true), nullptr);
    EXPECT_EQ(driver.CallCount("eglChooseConfig"), 2u);
    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kFrontBufferLine), 0u); // nothing stands for it
}

TEST(DesktopFallback, MatchesOfTheWrongColoursAreNoReasonToLookAgain)
{
    Desktop driver(WithWindows().WithConfigs({Bits(5, 6, 5, 0, 0, 0)}));

    EXPECT_EQ(Egl::GetInstance()->GetConfig(false), nullptr);

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kPbufferLine), 0u);
    EXPECT_EQ(driver.CallCount("eglChooseConfig"), 2u);
}

TEST(DesktopFallback, WithWindowsThereIsNoSecondSearch)
{
    Desktop driver(WithWindows());

    Egl::GetInstance();

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kPbufferLine), 0u);
    EXPECT_EQ(driver.CallCount("eglChooseConfig"), 2u);
}

TEST(DesktopFallback, FrontBuffersAreNeverLookedForAmongPbuffers)
{
    Desktop driver(WithWindows().WithEglExtension("EGL_KHR_mutable_render_buffer"));

    Egl::GetInstance();

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kPbufferLine), 0u);
    EXPECT_EQ(driver.CallCount("eglChooseConfig"), 3u); // the last one finds no mutable one
}

// ---- front buffers ------------------------------------------------------------------------------

TEST(DesktopFallback, OrdinaryConfigurationStandsForTheFrontBuffer)
{
    Desktop driver(WithWindows());

    Egl* egl = Egl::GetInstance();

    EXPECT_NE(egl->GetConfig(true), nullptr);
    EXPECT_EQ(egl->GetConfig(true), egl->GetConfig(false));
    EXPECT_FALSE(egl->HasFrontBufferConfig());
    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kFrontBufferLine), 1u);
}

TEST(DesktopFallback, RequiredLinesAreStillWritten)
{
    Desktop driver(WithWindows());

    Egl::GetInstance();

    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR),
              Lines({"const EGLint *Nib::Egl::GetConfigAttributes(bool) const - "
                     "front buffer requested but NOT supported.",
                     "bool Nib::Egl::FindConfig(bool, EGLConfig *) - "
                     "failed to fill expectedConfigAttribs"}));
}

TEST(DesktopFallback, ContextForAFrontBufferCanBeMade)
{
    Desktop driver(WithWindows());
    EglContext context;

    EXPECT_TRUE(context.Create(EGL_NO_CONTEXT, true, EglContext::Priority::High));
}

TEST(DesktopFallback, FrontBufferRenderingIsStillNotSupported)
{
    SimConfig config = Bits(8, 8, 8, 8, 0, 0); // all extensions, but nothing mutable
    Desktop driver(SimGpu::Named("Mali-G76").WithFrontBuffer().WithConfigs({config}));

    EXPECT_FALSE(Nib::IsFBRSupported());

    EXPECT_NE(Egl::GetInstance()->GetConfig(true), nullptr);
}

TEST(DesktopFallback, FrontBufferOfTheDeviceIsItsOwn)
{
    SimConfig flexible = Bits(8, 8, 8, 8, 16, 0);
    flexible.surfaceType = 0x1005;
    Desktop driver(SimGpu::Default()
                       .WithEglExtension("EGL_KHR_mutable_render_buffer")
                       .WithConfigs({Bits(8, 8, 8, 8, 0, 0), flexible}));

    Egl* egl = Egl::GetInstance();

    EXPECT_EQ(IndexOf(egl->GetConfig(true)), 1);
    EXPECT_TRUE(egl->HasFrontBufferConfig());
    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kFrontBufferLine), 0u);
}

TEST(DesktopFallback, BothCanBeNeeded)
{
    Desktop driver(WithoutWindows());

    Egl* egl = Egl::GetInstance();

    EXPECT_NE(egl->GetConfig(true), nullptr);
    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kPbufferLine), 1u);
    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kFrontBufferLine), 1u);
}

TEST(DesktopFallback, NothingStandsInAfterAFailedInitialisation)
{
    Desktop driver(WithoutWindows());
    driver.FailNext("eglInitialize", EGL_NOT_INITIALIZED);

    EXPECT_EQ(Egl::GetInstance()->GetConfig(true), nullptr);

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kFrontBufferLine), 0u);
}

// ---- off ----------------------------------------------------------------------------------------

TEST(DesktopFallback, OffThereIsNothingWithoutWindows)
{
    Desktop driver(WithoutWindows());
    System::SetDesktopFallbacks(false);

    Egl* egl = Egl::GetInstance();

    EXPECT_EQ(egl->GetConfig(false), nullptr);
    EXPECT_EQ(egl->GetConfig(true), nullptr);
    EXPECT_EQ(driver.CallCount("eglChooseConfig"), 1u);
    EXPECT_EQ(driver.CountLogContaining("looking for one"), 0u);
    EXPECT_EQ(driver.CountLogContaining("stands for"), 0u);
}

TEST(DesktopFallback, OffThereIsNoFrontBuffer)
{
    Desktop driver(WithWindows());
    System::SetDesktopFallbacks(false);
    EglContext context;

    EXPECT_EQ(Egl::GetInstance()->GetConfig(true), nullptr);
    EXPECT_FALSE(context.Create(EGL_NO_CONTEXT, true, EglContext::Priority::High));
    EXPECT_EQ(driver.CountLogContaining("stands for"), 0u);
}

// ---- the switch ---------------------------------------------------------------------------------

TEST(DesktopFallback, TheyAreOnUnlessSaidOtherwise)
{
    unsetenv("NIB_DESKTOP"); // before the first question

    EXPECT_TRUE(System::GetDesktopFallbacks());
}

TEST(DesktopFallback, EnvironmentSwitchesThemOff)
{
    setenv("NIB_DESKTOP", "0", 1);

    EXPECT_FALSE(System::GetDesktopFallbacks());
}

TEST(DesktopFallback, EnvironmentSwitchesThemOn)
{
    setenv("NIB_DESKTOP", "1", 1);

    EXPECT_TRUE(System::GetDesktopFallbacks());
}
