#include "egl/EglTestSupport.h"

#include <gtest/gtest.h>

using Nib::Egl;

namespace
{

using Values = std::vector<long long>;

/// Configurations that a front buffer can have too.
std::vector<SimConfig> Mutable(std::vector<SimConfig> configs)
{
    for (SimConfig& config : configs)
        config.surfaceType = 0x1005;
    return configs;
}

/// A device with front buffers and these configurations.
SimGpu FrontBufferDevice(std::vector<SimConfig> configs)
{
    return SimGpu::Default()
        .WithEglExtension("EGL_KHR_mutable_render_buffer")
        .WithConfigs(std::move(configs));
}

/// The place of the ordinary configuration that a device with @p configs gets, -1 for none.
int Chosen(std::vector<SimConfig> configs)
{
    SimDriver driver(SimGpu::Default().WithConfigs(std::move(configs)));
    return IndexOf(Egl::GetInstance()->GetConfig(false));
}

} // namespace

// ---- the lists ----------------------------------------------------------------------------------

TEST(EglConfig, OrdinaryListAsksForWindowsAndPbuffers)
{
    SimDriver driver;

    Egl::GetInstance();

    const SimCall count = driver.Calls("eglChooseConfig").at(0);
    EXPECT_EQ(count.list, (Values{
                              0x3040, 0x40, // EGL_RENDERABLE_TYPE, EGL_OPENGL_ES3_BIT_KHR
                              0x3033, 0x5,  // EGL_SURFACE_TYPE, windows and pbuffers
                              0x3024, 4,    // EGL_RED_SIZE
                              0x3023, 4,    // EGL_GREEN_SIZE
                              0x3022, 4,    // EGL_BLUE_SIZE
                              0x3026, 0     // EGL_STENCIL_SIZE
                          }));
}

TEST(EglConfig, FrontBufferListAsksForMutableOnesToo)
{
    SimDriver driver(SimGpu::Default().WithFrontBuffer());

    Egl::GetInstance();

    const SimCall count = driver.Calls("eglChooseConfig").at(2);
    EXPECT_EQ(count.list,
              (Values{0x3040, 0x40, 0x3033, 0x1005, 0x3024, 4, 0x3023, 4, 0x3022, 4, 0x3026, 0}));
}

TEST(EglConfig, AttributesAreTheListOfTheOrdinaryConfigurations)
{
    OpenDisplay display;

    const EGLint* list = display.egl->GetConfigAttributes(false);

    ASSERT_NE(list, nullptr);
    const std::vector<EGLint> expected = {
        0x3040, 0x40, 0x3033, 0x5, 0x3024, 4, 0x3023, 4, 0x3022, 4, 0x3026, 0, 0x3038}; // EGL_NONE
    EXPECT_EQ(std::vector<EGLint>(list, list + 13), expected);
    EXPECT_EQ(display.driver.CallCount(), 0u); // nothing to ask
}

TEST(EglConfig, AttributesAreTheListOfTheFrontBuffers)
{
    OpenDisplay display(SimGpu::Default().WithFrontBuffer());

    const EGLint* list = display.egl->GetConfigAttributes(true);

    ASSERT_NE(list, nullptr);
    const std::vector<EGLint> expected = {0x3040, 0x40,   0x3033, 0x1005, 0x3024, 4,     0x3023,
                                          4,      0x3022, 4,      0x3026, 0,      0x3038};
    EXPECT_EQ(std::vector<EGLint>(list, list + 13), expected);
    EXPECT_EQ(display.driver.Log().size(), 0u);
}

TEST(EglConfig, AttributesAreNullForAFrontBufferThatIsNotThere)
{
    OpenDisplay display(SimGpu::Default().WithoutFrontBuffer());

    EXPECT_EQ(display.egl->GetConfigAttributes(true), nullptr);

    EXPECT_EQ(AllLines(display.driver),
              Lines({"E const EGLint *Nib::Egl::GetConfigAttributes(bool) const - "
                     "front buffer requested but NOT supported."}));
}

// ---- counting and fetching ----------------------------------------------------------------------

TEST(EglConfig, MatchesAreCountedThenFetchedAll)
{
    SimDriver driver(SimGpu::Default().WithConfigs(
        {Bits(8, 8, 8, 8, 24, 8), Bits(5, 6, 5, 0, 0, 0), Bits(8, 8, 8, 8, 0, 0)}));

    Egl* egl = Egl::GetInstance();

    const std::vector<SimCall> calls = driver.Calls("eglChooseConfig");
    ASSERT_EQ(calls.size(), 2u);
    EXPECT_EQ(calls[0].args.at(0), SimValue(egl->GetDisplay()));
    EXPECT_EQ(calls[0].args.at(2), SimValue(nullptr));
    EXPECT_EQ(calls[0].Arg(3), 0);
    EXPECT_FALSE(calls[1].args.at(2) == SimValue(nullptr));
    EXPECT_EQ(calls[1].Arg(3), 3);
    EXPECT_EQ(calls[1].list, calls[0].list);
}

TEST(EglConfig, NoMatchIsLogged)
{
    SimDriver driver(SimGpu::Default().WithConfigs({Bits(3, 3, 2, 0, 0, 0)}));

    EXPECT_EQ(Egl::GetInstance()->GetConfig(false), nullptr);

    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR).front(),
              "bool Nib::Egl::FindConfig(bool, EGLConfig *): No configArray match configSpec");
    EXPECT_EQ(driver.CallCount("eglGetConfigAttrib"), 0u);
}

TEST(EglConfig, FailedCountIsNoMatch)
{
    OpenDisplay display;
    display.driver.FailNext("eglChooseConfig", EGL_BAD_ATTRIBUTE);
    EGLConfig config = nullptr;

    EXPECT_FALSE(display.egl->FindConfig(false, &config));

    EXPECT_EQ(AllLines(display.driver), Lines({"E bool Nib::Egl::FindConfig(bool, EGLConfig *): "
                                               "No configArray match configSpec"}));
    EXPECT_EQ(display.driver.CallCount("eglChooseConfig"), 1u);
}

TEST(EglConfig, CountOfNoneIsNoMatch)
{
    OpenDisplay display;
    EGLConfig config = nullptr;
    display.driver.SetConfigCounts(0, 0);

    EXPECT_FALSE(display.egl->FindConfig(false, &config));

    EXPECT_EQ(display.driver.CallCount("eglChooseConfig"), 1u);
}

TEST(EglConfig, FewerThanCountedIsAFailure)
{
    OpenDisplay display(SimGpu::Default().WithConfigs({Bits(8, 8, 8, 8, 0, 0)}));
    display.driver.SetConfigCounts(4, -1);
    EGLConfig config = nullptr;

    EXPECT_FALSE(display.egl->FindConfig(false, &config));

    EXPECT_EQ(AllLines(display.driver), Lines({"E bool Nib::Egl::FindConfig(bool, EGLConfig *): "
                                               "Not all configArray readed: 1 from 4"}));
    EXPECT_EQ(display.driver.CallCount("eglGetConfigAttrib"), 0u);
}

TEST(EglConfig, FailedFetchIsAFailure)
{
    OpenDisplay display(SimGpu::Default().WithConfigs({Bits(8, 8, 8, 8, 0, 0)}));
    display.driver.FailAt(2, EGL_BAD_DISPLAY);
    EGLConfig config = nullptr;

    EXPECT_FALSE(display.egl->FindConfig(false, &config));

    EXPECT_EQ(AllLines(display.driver), Lines({"E bool Nib::Egl::FindConfig(bool, EGLConfig *): "
                                               "Not all configArray readed: 0 from 1"}));
}

// ---- the choice ---------------------------------------------------------------------------------

TEST(EglConfig, EachMatchIsAskedForItsBitsInOrder)
{
    SimDriver driver(
        SimGpu::Default().WithConfigs({Bits(5, 6, 5, 0, 0, 0), Bits(8, 8, 8, 8, 24, 8)}));

    Egl::GetInstance();

    Values asked;
    for (const SimCall& call : driver.Calls("eglGetConfigAttrib"))
    {
        asked.push_back(call.Arg(1));
        asked.push_back(call.Arg(2));
    }
    // EGL_DEPTH_SIZE, EGL_STENCIL_SIZE, EGL_RED_SIZE, EGL_GREEN_SIZE, EGL_BLUE_SIZE, EGL_ALPHA_SIZE
    EXPECT_EQ(asked, (Values{1, 0x3025, 1, 0x3026, 1, 0x3024, 1, 0x3023, 1, 0x3022, 1, 0x3021,
                             2, 0x3025, 2, 0x3026, 2, 0x3024, 2, 0x3023, 2, 0x3022, 2, 0x3021}));
}

TEST(EglConfig, WithoutDepthAndStencilWins)
{
    EXPECT_EQ(Chosen({Bits(8, 8, 8, 8, 24, 8), Bits(8, 8, 8, 8, 0, 0)}), 1);
}

TEST(EglConfig, EarlierOneWinsAmongEquals)
{
    EXPECT_EQ(Chosen({Bits(8, 8, 8, 8, 16, 8), Bits(8, 8, 8, 8, 24, 0), Bits(8, 8, 8, 8, 16, 8)}),
              0);
}

TEST(EglConfig, DepthAndStencilCountTogether)
{
    // 24, 23, 32 and 24 bits
    EXPECT_EQ(Chosen({Bits(8, 8, 8, 8, 24, 0), Bits(8, 8, 8, 8, 15, 8), Bits(8, 8, 8, 8, 24, 8),
                      Bits(8, 8, 8, 8, 16, 8)}),
              1);
}

TEST(EglConfig, OtherBitCountsAreSkipped)
{
    EXPECT_EQ(Chosen({Bits(10, 8, 8, 8, 0, 0), Bits(8, 10, 8, 8, 0, 0), Bits(8, 8, 10, 8, 0, 0),
                      Bits(8, 8, 8, 10, 0, 0), Bits(7, 8, 8, 8, 0, 0), Bits(8, 7, 8, 8, 0, 0),
                      Bits(8, 8, 7, 8, 0, 0), Bits(8, 8, 8, 7, 0, 0), Bits(8, 8, 8, 8, 24, 8)}),
              8);
}

TEST(EglConfig, TenBitColoursAreSkipped)
{
    EXPECT_EQ(Chosen({Bits(10, 10, 10, 2, 0, 0), Bits(8, 8, 8, 8, 24, 8)}), 1);
}

TEST(EglConfig, ColoursWithoutAlphaAreSkipped)
{
    EXPECT_EQ(Chosen({Bits(8, 8, 8, 0, 0, 0), Bits(8, 8, 8, 8, 24, 8)}), 1);
}

TEST(EglConfig, SixteenBitColoursAloneAreNotEnough)
{
    SimDriver driver(
        SimGpu::Default().WithConfigs({Bits(5, 6, 5, 0, 0, 0), Bits(5, 6, 5, 0, 24, 8)}));

    EXPECT_EQ(Egl::GetInstance()->GetConfig(false), nullptr);

    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR).front(),
              "bool Nib::Egl::FindConfig(bool, EGLConfig *): Requred config not found");
    EXPECT_EQ(Egl::GetEglStatus(), 0); // the display is there
}

TEST(EglConfig, DepthThatCannotBeAskedCountsAsNone)
{
    SimDriver driver(
        SimGpu::Default().WithConfigs({Bits(8, 8, 8, 8, 16, 0), Bits(8, 8, 8, 8, 24, 0)}));
    const EGLConfig second = reinterpret_cast<EGLConfig>(std::uintptr_t{2});
    int calls = 0;
    driver.OnCall("eglGetConfigAttrib",
                  [&]
                  {
                      if (++calls == 7) // the depth of the second one
                          driver.FailNext("eglGetConfigAttrib", EGL_BAD_CONFIG);
                  });

    EXPECT_EQ(Egl::GetInstance()->GetConfig(false), second);
}

TEST(EglConfig, StencilThatCannotBeAskedCountsAsNone)
{
    SimDriver driver(
        SimGpu::Default().WithConfigs({Bits(8, 8, 8, 8, 0, 4), Bits(8, 8, 8, 8, 0, 8)}));
    int calls = 0;
    driver.OnCall("eglGetConfigAttrib",
                  [&]
                  {
                      if (++calls == 8) // the stencil of the second one
                          driver.FailNext("eglGetConfigAttrib", EGL_BAD_CONFIG);
                  });

    EXPECT_EQ(IndexOf(Egl::GetInstance()->GetConfig(false)), 1);
}

TEST(EglConfig, ColourThatCannotBeAskedIsNotEight)
{
    // EGL_RED_SIZE, EGL_GREEN_SIZE, EGL_BLUE_SIZE, EGL_ALPHA_SIZE
    for (const EGLint attribute : {0x3024, 0x3023, 0x3022, 0x3021})
    {
        SimDriver driver(SimGpu::Default().WithConfigs({Bits(8, 8, 8, 8, 0, 0)}));
        Egl* egl = Egl::GetInstance();
        egl->InitializeAPI(); // this driver's
        driver.FailWhen("eglGetConfigAttrib", 2, attribute, EGL_BAD_CONFIG);
        EGLConfig config = nullptr;

        EXPECT_FALSE(egl->FindConfig(false, &config)) << attribute;
    }
}

TEST(EglConfig, OutIsLeftAloneWhereNothingIsFound)
{
    OpenDisplay display;
    int somewhere = 0;
    EGLConfig config = &somewhere;
    display.driver.SetConfigCounts(0, 0);

    EXPECT_FALSE(display.egl->FindConfig(false, &config));
    EXPECT_EQ(config, &somewhere);
    EXPECT_FALSE(display.egl->FindConfig(true, &config));
    EXPECT_EQ(config, &somewhere);
}

TEST(EglConfig, FindConfigGivesTheChoiceWithoutKeepingIt)
{
    OpenDisplay display(FrontBufferDevice(Mutable({Bits(8, 8, 8, 8, 24, 8)})));
    const EGLConfig kept = display.egl->GetConfig(false);
    EGLConfig config = nullptr;

    EXPECT_TRUE(display.egl->FindConfig(false, &config));

    EXPECT_EQ(config, kept);
    EXPECT_EQ(display.driver.Log().size(), 0u);
}

TEST(EglConfig, GetConfigNeverSearchesAgain)
{
    OpenDisplay display;

    display.egl->GetConfig(false);
    display.egl->GetConfig(true);

    EXPECT_EQ(display.driver.CallCount(), 0u);
}

TEST(EglConfig, NoDepthIsChosenOnThePhonesThatAreKnown)
{
    for (const SimGpu& gpu : SimGpu::All())
    {
        SimDriver driver(gpu);
        EGLConfig config = nullptr;
        Egl::GetInstance();
        EXPECT_TRUE(Egl::GetInstance()->Init()) << gpu.renderer;
        EXPECT_TRUE(Egl::GetInstance()->FindConfig(false, &config)) << gpu.renderer;
        EXPECT_EQ(IndexOf(config), 3) << gpu.renderer; // RGB565, RGBX8888, with depth, RGBA8888
    }
}

// ---- front buffers ------------------------------------------------------------------------------

TEST(EglConfig, WithoutTheExtensionThereIsNoFrontBuffer)
{
    SimDriver driver(SimGpu::Default().WithoutFrontBuffer());

    Egl* egl = Egl::GetInstance();

    EXPECT_EQ(egl->GetConfig(true), nullptr);
    EXPECT_FALSE(egl->HasFrontBufferConfig());
    EXPECT_NE(egl->GetConfig(false), nullptr);
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR),
              Lines({"const EGLint *Nib::Egl::GetConfigAttributes(bool) const - "
                     "front buffer requested but NOT supported.",
                     "bool Nib::Egl::FindConfig(bool, EGLConfig *) - "
                     "failed to fill expectedConfigAttribs"}));
    EXPECT_EQ(driver.CallCount("eglChooseConfig"), 2u); // both for the ordinary one
}

TEST(EglConfig, FrontBufferNeedsAMutableConfiguration)
{
    SimDriver driver(FrontBufferDevice({Bits(8, 8, 8, 8, 0, 0)}));

    Egl* egl = Egl::GetInstance();

    EXPECT_EQ(egl->GetConfig(true), nullptr);
    EXPECT_FALSE(egl->HasFrontBufferConfig());
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR),
              Lines({"bool Nib::Egl::FindConfig(bool, EGLConfig *): "
                     "No configArray match configSpec"}));
}

TEST(EglConfig, FrontBufferIsChosenByTheSameRule)
{
    SimConfig plain = Bits(8, 8, 8, 8, 0, 0);
    std::vector<SimConfig> configs =
        Mutable({Bits(8, 8, 8, 8, 24, 8), Bits(8, 8, 8, 8, 16, 0), Bits(8, 8, 8, 8, 0, 16)});
    configs.push_back(plain);
    SimDriver driver(FrontBufferDevice(configs));

    Egl* egl = Egl::GetInstance();

    EXPECT_EQ(IndexOf(egl->GetConfig(true)), 1);
    EXPECT_EQ(IndexOf(egl->GetConfig(false)), 3);
    EXPECT_TRUE(egl->HasFrontBufferConfig());
}

TEST(EglConfig, OrdinaryAndFrontBufferMayBeTheSame)
{
    SimDriver driver(FrontBufferDevice(Mutable({Bits(8, 8, 8, 8, 0, 0)})));

    Egl* egl = Egl::GetInstance();

    EXPECT_EQ(IndexOf(egl->GetConfig(true)), 0);
    EXPECT_EQ(egl->GetConfig(false), egl->GetConfig(true));
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR).size(), 0u);
}
