#include "egl/EglTestSupport.h"

#include <gtest/gtest.h>

#include <array>
#include <thread>

using Nib::Egl;
using Nib::EglContext;
using Nib::EglSurface;

namespace
{

/// One configuration, and a list of extensions short enough to stand in a test.
SimGpu PlainDevice()
{
    return SimGpu::Default()
        .WithEglExtensions({"EGL_KHR_fence_sync", "EGL_IMG_context_priority"})
        .WithConfigs({Bits(8, 8, 8, 8, 0, 0)});
}

} // namespace

// ---- the first GetInstance() --------------------------------------------------------------------

TEST(Egl, FirstInstanceOpensTheDisplayThenChoosesBothConfigurations)
{
    SimDriver driver(PlainDevice().WithFrontBuffer());

    Egl::GetInstance();

    // Opened, the API looked at, the extensions for the log; the ordinary choice; the extension
    // that a front buffer needs, and that choice.
    EXPECT_EQ(driver.CallNames(),
              Names({"eglGetDisplay",      "eglInitialize",      "eglQueryAPI",
                     "eglQueryString",     "eglChooseConfig",    "eglChooseConfig",
                     "eglGetConfigAttrib", "eglGetConfigAttrib", "eglGetConfigAttrib",
                     "eglGetConfigAttrib", "eglGetConfigAttrib", "eglGetConfigAttrib",
                     "eglQueryString",     "eglChooseConfig",    "eglChooseConfig",
                     "eglGetConfigAttrib", "eglGetConfigAttrib", "eglGetConfigAttrib",
                     "eglGetConfigAttrib", "eglGetConfigAttrib", "eglGetConfigAttrib"}));
}

TEST(Egl, FirstInstanceWritesItsProgress)
{
    SimDriver driver(PlainDevice());

    Egl::GetInstance();

    EXPECT_EQ(AllLines(driver),
              Lines({"I bool Nib::Egl::Init() Initilizing EGL",
                     "I bool Nib::Egl::InitializeAPI() Version: 1.4",
                     "I bool Nib::Egl::InitializeAPI() "
                     "EGL_EXTENSIONS=EGL_KHR_fence_sync EGL_IMG_context_priority",
                     "E const EGLint *Nib::Egl::GetConfigAttributes(bool) const - "
                     "front buffer requested but NOT supported.",
                     "E bool Nib::Egl::FindConfig(bool, EGLConfig *) - "
                     "failed to fill expectedConfigAttribs"}));
}

TEST(Egl, EveryLineIsUnderTheLibrarysTag)
{
    SimDriver driver;

    Egl::GetInstance();

    ASSERT_FALSE(driver.Log().empty());
    for (const SimLogLine& line : driver.Log())
        EXPECT_EQ(line.tag, "nib_log");
}

TEST(Egl, DefaultDisplayIsTheOneThatIsOpened)
{
    SimDriver driver;

    Egl* egl = Egl::GetInstance();

    EXPECT_EQ(driver.Calls("eglGetDisplay"), Sequence({Call("eglGetDisplay", nullptr)}));
    EXPECT_EQ(egl->GetDisplay(), eglGetDisplay(EGL_DEFAULT_DISPLAY));
    EXPECT_EQ(driver.LastCall("eglInitialize").args.at(0), SimValue(egl->GetDisplay()));
}

TEST(Egl, SecondInstanceIsTheFirst)
{
    OpenDisplay display;

    EXPECT_EQ(Egl::GetInstance(), display.egl);

    EXPECT_EQ(display.driver.CallCount(), 0u);
    EXPECT_EQ(display.driver.Log().size(), 0u);
}

TEST(Egl, InstanceIsMadeOnceWhenThreadsComeAtTheSameTime)
{
    // Given a thread that is opening the display
    SimDriver driver;
    driver.Hold("eglInitialize");
    std::array<Egl*, 4> seen{};
    std::thread first([&] { seen[0] = Egl::GetInstance(); });
    driver.WaitUntilHeld("eglInitialize");

    // When others ask for the instance before it is ready
    std::array<std::thread, 3> others;
    for (std::size_t i = 0; i < others.size(); ++i)
    {
        others[i] = std::thread(
            [&seen, i]
            {
                seen[i + 1] = Egl::GetInstance();
                EXPECT_NE(seen[i + 1]->GetConfig(false), nullptr) << "given out before it is ready";
            });
    }
    driver.Release("eglInitialize");
    first.join();
    for (std::thread& other : others)
        other.join();

    // Then all of them have the same one
    for (Egl* egl : seen)
        EXPECT_EQ(egl, Egl::GetInstance());
    EXPECT_EQ(driver.CallCount("eglInitialize"), 1u);
    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, "bool Nib::Egl::Init() Initilizing EGL"), 1u);
}

TEST(Egl, DestructorTerminatesTheDisplay)
{
    OpenDisplay display;
    const EGLDisplay handle = display.egl->GetDisplay();

    delete display.egl;

    EXPECT_EQ(display.driver.Calls(), Sequence({Call("eglTerminate", handle)}));
}

TEST(Egl, DisplayIsNeverTerminatedByTheLibrary)
{
    EXPECT_EXIT(
        {
            SimDriver driver;
            driver.OnCall("eglTerminate", [] { std::_Exit(7); });
            Egl::GetInstance();
            std::exit(0);
        },
        testing::ExitedWithCode(0), "");
}

// ---- the status ---------------------------------------------------------------------------------

TEST(Egl, StatusIsZeroAfterAStart)
{
    SimDriver driver;

    EXPECT_EQ(Egl::GetEglStatus(), 0);

    EXPECT_EQ(driver.CallCount("eglInitialize"), 1u); // the question makes the instance
    EXPECT_EQ(Egl::GetEglStatus(), 0);
    EXPECT_EQ(driver.CallCount("eglInitialize"), 1u);
}

TEST(Egl, StatusIsOneWhenTheDisplayIsNotInitialised)
{
    SimDriver driver;
    driver.FailNext("eglInitialize", EGL_NOT_INITIALIZED, SimDriver::kAlways);

    EXPECT_EQ(Egl::GetEglStatus(), 1);
}

TEST(Egl, StatusIsTwoForEveryOtherError)
{
    SimDriver driver;
    driver.FailNext("eglInitialize", EGL_BAD_DISPLAY, SimDriver::kAlways);

    EXPECT_EQ(Egl::GetEglStatus(), 2);
}

TEST(Egl, StatusIsTwoForAnErrorWithoutAName)
{
    SimDriver driver;
    driver.FailNext("eglInitialize", EGL_SUCCESS, SimDriver::kAlways);

    EXPECT_EQ(Egl::GetEglStatus(), 2);
}

// ---- a failed initialisation --------------------------------------------------------------------

TEST(Egl, FailedInitialisationLeavesNothing)
{
    SimDriver driver;
    driver.FailNext("eglInitialize", EGL_NOT_INITIALIZED);

    Egl* egl = Egl::GetInstance();

    ASSERT_NE(egl, nullptr);
    EXPECT_EQ(egl->GetDisplay(), EGL_NO_DISPLAY);
    EXPECT_EQ(egl->GetConfig(false), nullptr);
    EXPECT_EQ(egl->GetConfig(true), nullptr);
    EXPECT_EQ(driver.CallNames(), Names({"eglGetDisplay", "eglInitialize", "eglGetError"}));
}

TEST(Egl, FailedInitialisationIsLogged)
{
    SimDriver driver;
    driver.FailNext("eglInitialize", EGL_NOT_INITIALIZED);

    Egl::GetInstance();

    // The display as %p prints it; 0x3001 is EGL_NOT_INITIALIZED.
    EXPECT_EQ(AllLines(driver), Lines({"I bool Nib::Egl::Init() Initilizing EGL",
                                       "E bool Nib::Egl::InitializeAPI(): eglInitialize failed. "
                                       "Display: 0xd15, Err: 0x3001"}));
}

TEST(Egl, ErrorCodeIsPaddedToFourPlaces)
{
    SimDriver driver;
    driver.FailNext("eglInitialize", 0x1F);

    Egl::GetInstance();

    EXPECT_TRUE(driver.HasLog(ANDROID_LOG_ERROR,
                              "bool Nib::Egl::InitializeAPI(): eglInitialize failed. "
                              "Display: 0xd15, Err: 0x  1F"));
}

TEST(Egl, FailedInitialisationIsNotRepeated)
{
    SimDriver driver;
    driver.FailNext("eglInitialize", EGL_NOT_INITIALIZED); // once

    Egl* egl = Egl::GetInstance();

    EXPECT_EQ(Egl::GetInstance(), egl);
    EXPECT_EQ(Egl::GetEglStatus(), 1);
    EXPECT_EQ(driver.CallCount("eglInitialize"), 1u);
}

TEST(Egl, OperationsFailAfterAFailedInitialisation)
{
    SimDriver driver;
    ANativeWindow* window = driver.Window(64, 64);
    driver.FailNext("eglInitialize", EGL_NOT_INITIALIZED);
    Egl* egl = Egl::GetInstance();

    EXPECT_EQ(egl->CreateOffscreenSurface(1, 1), nullptr);
    EXPECT_EQ(egl->CreateWindowSurface(window), nullptr);
    EXPECT_FALSE(egl->MakeCurrent(nullptr, nullptr));
    EXPECT_FALSE(egl->IsEglExtensionSupported("EGL_KHR_fence_sync"));
    EXPECT_EQ(driver.CallCount("eglInitialize"), 1u);
}

// ---- the bound API ------------------------------------------------------------------------------

TEST(Egl, ApiIsNotBoundWhereItIsAlready)
{
    SimDriver driver;

    Egl::GetInstance();

    EXPECT_EQ(driver.CallCount("eglBindAPI"), 0u);
    EXPECT_EQ(driver.CallCount("eglQueryAPI"), 1u);
}

TEST(Egl, OpenGlEsIsBoundWhereAnotherApiIs)
{
    SimDriver driver;
    driver.SetInitialApi(EGL_OPENGL_API);

    Egl* egl = Egl::GetInstance();

    EXPECT_EQ(driver.Calls({"eglQueryAPI", "eglBindAPI"}),
              Sequence({Call("eglQueryAPI"), Call("eglBindAPI", EGL_OPENGL_ES_API),
                        Call("eglQueryAPI")}));
    EXPECT_NE(egl->GetConfig(false), nullptr);
    EXPECT_EQ(driver.CountLogContaining("eglBindAPI"), 0u);
}

TEST(Egl, WithoutOpenGlEsTheDisplayStaysButNothingIsChosen)
{
    SimDriver driver;
    driver.SetInitialApi(EGL_OPENGL_API);
    driver.FailNext("eglBindAPI", EGL_BAD_PARAMETER);

    Egl* egl = Egl::GetInstance();

    EXPECT_EQ(Egl::GetEglStatus(), 0);
    EXPECT_NE(egl->GetDisplay(), EGL_NO_DISPLAY);
    EXPECT_EQ(egl->GetConfig(false), nullptr);
    EXPECT_EQ(driver.CallCount("eglChooseConfig"), 0u);
    EXPECT_EQ(AllLines(driver), Lines({"I bool Nib::Egl::Init() Initilizing EGL",
                                       "I bool Nib::Egl::InitializeAPI() Version: 1.4",
                                       "E bool Nib::Egl::InitializeAPI(): eglBindAPI failed"}));
}

TEST(Egl, InitializeApiAlone)
{
    OpenDisplay display(PlainDevice());

    EXPECT_TRUE(display.egl->InitializeAPI());

    EXPECT_EQ(display.driver.CallNames(),
              Names({"eglGetDisplay", "eglInitialize", "eglQueryAPI", "eglQueryString"}));
    EXPECT_EQ(AllLines(display.driver),
              Lines({"I bool Nib::Egl::InitializeAPI() Version: 1.4",
                     "I bool Nib::Egl::InitializeAPI() "
                     "EGL_EXTENSIONS=EGL_KHR_fence_sync EGL_IMG_context_priority"}));
}

TEST(Egl, InitializeApiSaysThatItFailed)
{
    OpenDisplay display;
    display.driver.FailNext("eglInitialize", EGL_BAD_ALLOC);

    EXPECT_FALSE(display.egl->InitializeAPI());

    EXPECT_EQ(Egl::GetEglStatus(), 2);
    EXPECT_EQ(display.egl->GetDisplay(), EGL_NO_DISPLAY);
}

TEST(Egl, ExtensionLineEndsAtTheEqualsSignWithoutExtensions)
{
    SimDriver driver;
    driver.FailNext("eglQueryString", EGL_BAD_DISPLAY);

    Egl::GetInstance();

    EXPECT_TRUE(driver.HasLog(ANDROID_LOG_INFO, "bool Nib::Egl::InitializeAPI() EGL_EXTENSIONS="));
}

// ---- Init() on an instance ----------------------------------------------------------------------

TEST(Egl, InitRunsTheSameStepsAgain)
{
    OpenDisplay display(PlainDevice());

    EXPECT_TRUE(display.egl->Init());

    EXPECT_EQ(display.driver.CallCount("eglInitialize"), 1u);
    EXPECT_EQ(display.driver.CallCount("eglChooseConfig"), 2u);
    EXPECT_EQ(AllLines(display.driver).front(), "I bool Nib::Egl::Init() Initilizing EGL");
}

TEST(Egl, InitAnswersWhetherThereIsAnOrdinaryConfiguration)
{
    OpenDisplay display;
    display.driver.SetConfigCounts(0, 0);

    EXPECT_FALSE(display.egl->Init());

    EXPECT_EQ(display.egl->GetConfig(false), nullptr); // the earlier one is not kept
}

TEST(Egl, InitEndsWithTheInitialisation)
{
    OpenDisplay display;
    display.driver.FailNext("eglInitialize", EGL_NOT_INITIALIZED);

    EXPECT_FALSE(display.egl->Init());

    EXPECT_EQ(display.driver.CallCount("eglChooseConfig"), 0u);
}

// ---- extensions ---------------------------------------------------------------------------------

TEST(Egl, ExtensionsAreThoseOfTheDisplay)
{
    OpenDisplay display(PlainDevice());

    EXPECT_STREQ(display.egl->GetEglExtensions(), "EGL_KHR_fence_sync EGL_IMG_context_priority");

    EXPECT_EQ(display.driver.Calls(),
              Sequence({Call("eglQueryString", display.egl->GetDisplay(), EGL_EXTENSIONS)}));
}

TEST(Egl, ExtensionsAreAskedForAfresh)
{
    OpenDisplay display;

    display.egl->IsEglExtensionSupported("EGL_KHR_fence_sync");
    display.egl->IsEglExtensionSupported("EGL_KHR_fence_sync");
    display.egl->GetEglExtensions();

    EXPECT_EQ(display.driver.CallNames(),
              Names({"eglQueryString", "eglQueryString", "eglQueryString"}));
}

TEST(Egl, ExtensionsAreEmptyWhereThereIsNoAnswer)
{
    OpenDisplay display;
    display.driver.FailNext("eglQueryString", EGL_BAD_DISPLAY, 2);

    EXPECT_STREQ(display.egl->GetEglExtensions(), "");
    EXPECT_FALSE(display.egl->IsEglExtensionSupported("EGL_KHR_fence_sync"));
}

TEST(Egl, ExtensionIsFoundByItsName)
{
    OpenDisplay display(PlainDevice());

    EXPECT_TRUE(display.egl->IsEglExtensionSupported("EGL_KHR_fence_sync"));
    EXPECT_TRUE(display.egl->IsEglExtensionSupported("EGL_IMG_context_priority"));
    EXPECT_FALSE(display.egl->IsEglExtensionSupported("EGL_KHR_partial_update"));
}

TEST(Egl, BeginningOfALongerNameCounts)
{
    OpenDisplay display(PlainDevice().WithEglExtension("EGL_KHR_partial_update_of_another_kind"));

    EXPECT_TRUE(display.egl->IsEglExtensionSupported("EGL_KHR_partial_update"));
}

TEST(Egl, NameWithoutItsPrefixCounts)
{
    OpenDisplay display(PlainDevice());

    EXPECT_TRUE(display.egl->IsEglExtensionSupported("KHR_fence_sync"));
    EXPECT_FALSE(display.egl->IsEglExtensionSupported("KHR_FENCE_SYNC"));
}

// ---- MakeCurrent --------------------------------------------------------------------------------

TEST(Egl, MakeCurrentDrawsToAndReadsFromTheSurface)
{
    OpenDisplay display;
    EglContext context;
    ASSERT_TRUE(context.Create(EGL_NO_CONTEXT, false, EglContext::Priority::Medium));
    EglSurface* surface = display.egl->CreateOffscreenSurface(1, 1);
    display.driver.ForgetCalls();

    EXPECT_TRUE(display.egl->MakeCurrent(&context, surface));

    EXPECT_EQ(display.driver.Calls(),
              Sequence({Call("eglMakeCurrent", display.egl->GetDisplay(), surface->Get(),
                             surface->Get(), context.Get())}));
    EXPECT_EQ(eglGetCurrentContext(), context.Get());
    display.egl->MakeCurrent(nullptr, nullptr);
    delete surface;
}

TEST(Egl, MakeCurrentOfNullReleasesContextAndSurface)
{
    OpenDisplay display;
    EglContext context;
    ASSERT_TRUE(context.Create(EGL_NO_CONTEXT, false, EglContext::Priority::Medium));
    EglSurface* surface = display.egl->CreateOffscreenSurface(1, 1);
    ASSERT_TRUE(display.egl->MakeCurrent(&context, surface));
    display.driver.ForgetCalls();

    EXPECT_TRUE(display.egl->MakeCurrent(nullptr, nullptr));

    EXPECT_EQ(display.driver.Calls(), Sequence({Call("eglMakeCurrent", display.egl->GetDisplay(),
                                                     nullptr, nullptr, nullptr)}));
    EXPECT_EQ(eglGetCurrentContext(), EGL_NO_CONTEXT);
    EXPECT_EQ(eglGetCurrentSurface(EGL_DRAW), EGL_NO_SURFACE);
    delete surface;
}

TEST(Egl, MakeCurrentWithoutASurfacePassesNoSurface)
{
    OpenDisplay display;
    EglContext context;
    ASSERT_TRUE(context.Create(EGL_NO_CONTEXT, false, EglContext::Priority::Medium));
    display.driver.ForgetCalls();

    EXPECT_TRUE(display.egl->MakeCurrent(&context, nullptr));

    EXPECT_EQ(display.driver.Calls(), Sequence({Call("eglMakeCurrent", display.egl->GetDisplay(),
                                                     nullptr, nullptr, context.Get())}));
    display.egl->MakeCurrent(nullptr, nullptr);
}

TEST(Egl, FailedMakeCurrentIsLogged)
{
    OpenDisplay display;
    display.driver.FailNext("eglMakeCurrent", EGL_BAD_MATCH);

    EXPECT_FALSE(display.egl->MakeCurrent(nullptr, nullptr));

    // 12297 is EGL_BAD_MATCH.
    EXPECT_EQ(AllLines(display.driver),
              Lines({"E bool Nib::Egl::MakeCurrent(const Nib::EglContext *, "
                     "const Nib::EglSurface *) const Failed. Error(12297)"}));
}

// ---- CreateOffscreenSurface ---------------------------------------------------------------------

TEST(Egl, OffscreenSurfaceTakesHeightBeforeWidth)
{
    OpenDisplay display;

    EglSurface* surface = display.egl->CreateOffscreenSurface(640, 480);

    ASSERT_NE(surface, nullptr);
    EXPECT_EQ(display.driver.LastCall("eglCreatePbufferSurface").list,
              (std::vector<long long>{0x3056, 640, 0x3057, 480})); // EGL_HEIGHT, EGL_WIDTH
    EXPECT_EQ(surface->GetWidth(), 480);
    EXPECT_EQ(surface->GetHeight(), 640);
    delete surface;
}

TEST(Egl, OffscreenSurfaceOfOnePixel)
{
    OpenDisplay display;

    EglSurface* surface = display.egl->CreateOffscreenSurface(1, 1);

    ASSERT_NE(surface, nullptr);
    const SimSurfaceState state = display.driver.Surface(surface->Get());
    EXPECT_FALSE(state.window);
    EXPECT_EQ(state.width, 1);
    EXPECT_EQ(state.height, 1);
    delete surface;
}

TEST(Egl, OffscreenSurfaceUsesTheOrdinaryConfiguration)
{
    // Given a device whose front-buffer configuration is another one
    SimConfig plain = Bits(8, 8, 8, 8, 0, 0);
    SimConfig flexible = Bits(8, 8, 8, 8, 16, 0);
    flexible.surfaceType = 0x1005;
    OpenDisplay display(SimGpu::Default()
                            .WithEglExtension("EGL_KHR_mutable_render_buffer")
                            .WithConfigs({flexible, plain}));
    ASSERT_NE(display.egl->GetConfig(false), display.egl->GetConfig(true));

    EglSurface* surface = display.egl->CreateOffscreenSurface(1, 1);

    ASSERT_NE(surface, nullptr);
    EXPECT_EQ(display.driver.LastCall("eglCreatePbufferSurface").args.at(1),
              SimValue(display.egl->GetConfig(false)));
    delete surface;
}

TEST(Egl, OffscreenSurfaceIsAnnounced)
{
    OpenDisplay display;

    delete display.egl->CreateOffscreenSurface(1, 1);

    EXPECT_EQ(AllLines(display.driver),
              Lines({"I Nib::EglSurface *Nib::Egl::CreateOffscreenSurface(int, int) const"}));
}

TEST(Egl, FailedOffscreenSurfaceIsNullAndLogged)
{
    OpenDisplay display;
    display.driver.FailNext("eglCreatePbufferSurface", EGL_BAD_ALLOC);

    EXPECT_EQ(display.egl->CreateOffscreenSurface(1, 1), nullptr);

    // 12291 is EGL_BAD_ALLOC.
    EXPECT_EQ(AllLines(display.driver),
              Lines({"I Nib::EglSurface *Nib::Egl::CreateOffscreenSurface(int, int) const",
                     "E Nib::EglSurface *Nib::Egl::CreateOffscreenSurface(int, int) const: "
                     "eglCreatePbufferSurface. Error:12291"}));
}

TEST(Egl, DeletingAnOffscreenSurfaceDestroysIt)
{
    OpenDisplay display;
    EglSurface* surface = display.egl->CreateOffscreenSurface(1, 1);
    const EGLSurface handle = surface->Get();
    display.driver.ForgetCalls();

    delete surface;

    EXPECT_EQ(display.driver.Calls(),
              Sequence({Call("eglDestroySurface", display.egl->GetDisplay(), handle)}));
}

// ---- CreateWindowSurface ------------------------------------------------------------------------

TEST(Egl, WindowTakesThePixelFormatOfTheConfigurationFirst)
{
    SimConfig config = Bits(8, 8, 8, 8, 0, 0);
    config.nativeVisualId = 5;
    OpenDisplay display(PlainDevice().WithConfigs({config}));
    ANativeWindow* window = display.driver.Window(320, 200);

    EglSurface* surface = display.egl->CreateWindowSurface(window);

    ASSERT_NE(surface, nullptr);
    EXPECT_EQ(display.driver.CallNames(),
              Names({"eglGetConfigAttrib", "ANativeWindow_setBuffersGeometry", "eglQueryString",
                     "eglCreateWindowSurface", "eglGetError"}));
    EXPECT_EQ(display.driver.Calls("ANativeWindow_setBuffersGeometry"),
              Sequence({Call("ANativeWindow_setBuffersGeometry", window, 0, 0, 5)}));
    const SimCall query = display.driver.LastCall("eglGetConfigAttrib");
    EXPECT_EQ(query.args.at(1), SimValue(display.egl->GetConfig(false)));
    EXPECT_EQ(query.args.at(2), SimValue(EGL_NATIVE_VISUAL_ID));
    delete surface;
}

TEST(Egl, PixelFormatIsZeroWhenItCannotBeAsked)
{
    OpenDisplay display;
    ANativeWindow* window = display.driver.Window(320, 200);
    display.driver.FailNext("eglGetConfigAttrib", EGL_BAD_CONFIG);

    delete display.egl->CreateWindowSurface(window);

    EXPECT_EQ(display.driver.Calls("ANativeWindow_setBuffersGeometry"),
              Sequence({Call("ANativeWindow_setBuffersGeometry", window, 0, 0, 0)}));
}

TEST(Egl, WindowSurfaceHasNoAttributesWithoutSubBuffers)
{
    OpenDisplay display;
    ANativeWindow* window = display.driver.Window(320, 200);

    EglSurface* surface = display.egl->CreateWindowSurface(window);

    ASSERT_NE(surface, nullptr);
    EXPECT_EQ(display.driver.Calls("eglCreateWindowSurface"),
              Sequence({Call("eglCreateWindowSurface", display.egl->GetDisplay(),
                             display.egl->GetConfig(false), window, nullptr)}));
    delete surface;
}

TEST(Egl, WindowSurfaceAsksForSubBuffersWhereTheyAre)
{
    OpenDisplay display(SimGpu::Default().WithPostSubBuffer());

    EglSurface* surface = display.egl->CreateWindowSurface(display.driver.Window(320, 200));

    ASSERT_NE(surface, nullptr);
    EXPECT_EQ(display.driver.LastCall("eglCreateWindowSurface").list,
              (std::vector<long long>{0x30BE, 1})); // EGL_POST_SUB_BUFFER_SUPPORTED_NV, EGL_TRUE
    delete surface;
}

TEST(Egl, WindowSurfaceUsesTheOrdinaryConfiguration)
{
    SimConfig flexible = Bits(8, 8, 8, 8, 16, 0);
    flexible.surfaceType = 0x1005;
    OpenDisplay display(SimGpu::Default()
                            .WithEglExtension("EGL_KHR_mutable_render_buffer")
                            .WithConfigs({flexible, Bits(8, 8, 8, 8, 0, 0)}));
    ASSERT_EQ(IndexOf(display.egl->GetConfig(true)), 0);

    EglSurface* surface = display.egl->CreateWindowSurface(display.driver.Window(320, 200));

    ASSERT_NE(surface, nullptr);
    EXPECT_EQ(display.driver.Surface(surface->Get()).config, 1);
    delete surface;
}

TEST(Egl, WindowSurfaceIsLogged)
{
    OpenDisplay display;
    ANativeWindow* window = display.driver.Window(320, 200);

    delete display.egl->CreateWindowSurface(window);

    // 12288 is EGL_SUCCESS.
    EXPECT_EQ(AllLines(display.driver),
              Lines({"D Nib::EglSurface *Nib::Egl::CreateWindowSurface(NativeWindowType) const",
                     "I Nib::EglSurface *Nib::Egl::CreateWindowSurface(NativeWindowType) const: "
                     "eglCreateWindowSurface. (12288)-SUCCEEDED!!!"}));
}

TEST(Egl, WindowSurfaceLineCarriesWhateverErrorIsPending)
{
    OpenDisplay display;
    ANativeWindow* window = display.driver.Window(320, 200);
    display.driver.FailNext("eglGetError", EGL_BAD_ATTRIBUTE);

    EglSurface* surface = display.egl->CreateWindowSurface(window);

    ASSERT_NE(surface, nullptr); // the handle decides
    EXPECT_TRUE(display.driver.HasLog(
        ANDROID_LOG_INFO, "Nib::EglSurface *Nib::Egl::CreateWindowSurface(NativeWindowType) const: "
                          "eglCreateWindowSurface. (12292)-SUCCEEDED!!!"));
    delete surface;
}

TEST(Egl, FailedWindowSurfaceIsNullAndLogged)
{
    OpenDisplay display;
    ANativeWindow* window = display.driver.Window(320, 200);
    display.driver.AbandonWindow(window);

    EXPECT_EQ(display.egl->CreateWindowSurface(window), nullptr);

    // 12299 is EGL_BAD_NATIVE_WINDOW.
    EXPECT_EQ(AllLines(display.driver),
              Lines({"D Nib::EglSurface *Nib::Egl::CreateWindowSurface(NativeWindowType) const",
                     "E Nib::EglSurface *Nib::Egl::CreateWindowSurface(NativeWindowType) const: "
                     "eglCreateWindowSurface. Error:12299"}));
}
