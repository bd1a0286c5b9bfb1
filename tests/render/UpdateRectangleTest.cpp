#include "render/UpdateWindow.h"

#include <gtest/gtest.h>

using Nib::UpdateRectangle;

// Construction, and what Init() does with a window. The modes have a table of their own, the
// frames a file of their own.

namespace
{

using Texts = std::vector<std::string>;

const std::string kInitExtensions = "void Nib::UpdateRectangle::InitEGLExtensions()";
const std::string kScreenLine =
    "void Nib::UpdateRectangle::SetScreenRect(int, int). ScreenRect = 1080 * 1920";
const std::string kPreserveSucceeded =
    "bool Nib::UpdateRectangle::SetPreserveBehavior() : succeeded set EGL_BUFFER_PRESERVED";
const std::string kPreserveFailed =
    "bool Nib::UpdateRectangle::SetPreserveBehavior() : failed to set EGL_BUFFER_PRESERVED";

/// The line that the constructor writes for this value of the property.
std::string RotationLine(const char* value)
{
    SimDriver driver;
    driver.SetProperty("ro.sf.hwrotation", value);
    UpdateRectangle rectangle;
    const Texts lines = driver.LogTexts(ANDROID_LOG_INFO);
    return lines.size() == 1 ? lines[0] : std::to_string(lines.size()) + " lines";
}

std::string RotationOf(int quarterTurns)
{
    return "Nib::UpdateRectangle::UpdateRectangle() hw rotation = " + std::to_string(quarterTurns);
}

/// The functions that were asked for by name.
Texts Resolved(const SimDriver& driver)
{
    Texts names;
    for (const SimCall& call : driver.Calls("eglGetProcAddress"))
        names.push_back(call.args.at(0).Text());
    return names;
}

/// The lines of InitEGLExtensions() so far.
Texts ExtensionLines(const UpdateWindow& window)
{
    Texts lines;
    for (const std::string& text : window.driver.LogTexts(ANDROID_LOG_INFO))
    {
        if (text.rfind(kInitExtensions, 0) == 0)
            lines.push_back(text.substr(kInitExtensions.size()));
    }
    return lines;
}

} // namespace

// ---- construction -------------------------------------------------------------------------------

TEST(UpdateRectangle, RotationIsTheNumberOfQuarterTurns)
{
    EXPECT_EQ(RotationLine("0"), RotationOf(0));
    EXPECT_EQ(RotationLine("90"), RotationOf(1));
    EXPECT_EQ(RotationLine("180"), RotationOf(2));
    EXPECT_EQ(RotationLine("270"), RotationOf(3));
}

TEST(UpdateRectangle, RotationIsDividedWithoutRounding)
{
    EXPECT_EQ(RotationLine("89"), RotationOf(0));
    EXPECT_EQ(RotationLine("179"), RotationOf(1));
    EXPECT_EQ(RotationLine("-179"), RotationOf(-1));
    EXPECT_EQ(RotationLine("360"), RotationOf(4));
}

TEST(UpdateRectangle, RotationThatIsNoNumberIsZero)
{
    EXPECT_EQ(RotationLine("landscape"), RotationOf(0));
    EXPECT_EQ(RotationLine("270 degrees"), RotationOf(3)); // what stands before the blank counts
}

TEST(UpdateRectangle, AbsentRotationIsZero)
{
    SimDriver driver;

    UpdateRectangle rectangle;

    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_INFO), Texts{RotationOf(0)});
    EXPECT_EQ(driver.Calls("__system_property_get"),
              Sequence({Call("__system_property_get", "ro.sf.hwrotation")}));
}

TEST(UpdateRectangle, RotationIsZeroWhereThereAreNoProperties)
{
    SimDriver driver;
    driver.SetLibc(SimLibc::Missing);

    UpdateRectangle rectangle;

    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_INFO), Texts{RotationOf(0)});
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR).size(), 2u); // of android_property_get
}

TEST(UpdateRectangle, EverythingIsZeroBeforeInit)
{
    SimDriver driver;

    UpdateRectangle rectangle;

    EXPECT_EQ(rectangle.GetUpdateMode(), 0u);
    EXPECT_EQ(rectangle.GetTileSize(), 0);
    EXPECT_EQ(DamageOf(rectangle), Box(0, 0, 0, 0));
    EXPECT_FALSE(rectangle.NeedsDamageRect());
}

TEST(UpdateRectangle, ConstructionAsksNothingOfTheDriver)
{
    SimDriver driver;

    UpdateRectangle rectangle;

    for (const SimCall& call : driver.Calls())
        EXPECT_TRUE(call.name == "dlopen" || call.name == "__system_property_get") << call;
}

// ---- the size -----------------------------------------------------------------------------------

TEST(UpdateRectangle, InitTakesTheSizeOfTheSurface)
{
    UpdateWindow window(PlainDevice());
    UpdateRectangle rectangle;

    rectangle.Init(window.surface.get());

    EXPECT_EQ(rectangle.GetScreenWidth(), 1080);
    EXPECT_EQ(rectangle.GetScreenHeight(), 1920);
    EXPECT_EQ(window.driver.CountLog(ANDROID_LOG_INFO, kScreenLine), 1u);
}

TEST(UpdateRectangle, InitTakesTheSizeThatItIsGiven)
{
    UpdateWindow window(PlainDevice());
    UpdateRectangle rectangle;

    rectangle.Init(window.surface.get(), 640, 480);

    EXPECT_EQ(rectangle.GetScreenWidth(), 640);
    EXPECT_EQ(rectangle.GetScreenHeight(), 480);
    EXPECT_EQ(window.driver.CountLog(
                  ANDROID_LOG_INFO,
                  "void Nib::UpdateRectangle::SetScreenRect(int, int). ScreenRect = 640 * 480"),
              1u);
    EXPECT_EQ(window.driver.CallCount("eglQuerySurface"), 0u);
}

TEST(UpdateRectangle, SizeOfASurfaceThatDoesNotTellIsMinusOne)
{
    UpdateWindow window(PlainDevice());
    UpdateRectangle rectangle;
    window.driver.FailNext("eglQuerySurface", EGL_BAD_SURFACE, 2);

    rectangle.Init(window.surface.get());

    EXPECT_EQ(rectangle.GetScreenWidth(), -1);
    EXPECT_EQ(rectangle.GetScreenHeight(), -1);
}

TEST(UpdateRectangle, SetScreenRectBeforeInitOnlyStores)
{
    SimDriver driver;
    UpdateRectangle rectangle;
    driver.ForgetLog();

    rectangle.SetScreenRect(1080, 1920);

    EXPECT_EQ(rectangle.GetScreenWidth(), 1080);
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_INFO), Texts{kScreenLine});
}

// ---- the entry points ---------------------------------------------------------------------------

TEST(UpdateRectangle, PartialUpdateEntryPointsAreResolvedAndLogged)
{
    UpdateWindow window(DamageDevice());
    UpdateRectangle rectangle;

    rectangle.Init(window.surface.get(), 1080, 1920);

    EXPECT_EQ(Resolved(window.driver),
              (Texts{"eglSetDamageRegionKHR", "eglSwapBuffersWithDamageKHR"}));
    EXPECT_EQ(ExtensionLines(window), (Texts{" EGL_KHR_partial_update supported",
                                             " EGL_KHR_swap_buffers_with_damage supported"}));
}

TEST(UpdateRectangle, SubBufferEntryPointIsResolvedWhereTheWindowSupportsIt)
{
    UpdateWindow window(PlainDevice().WithPostSubBuffer());
    UpdateRectangle rectangle;

    rectangle.Init(window.surface.get(), 1080, 1920);

    EXPECT_EQ(Resolved(window.driver), Texts{"eglPostSubBufferNV"});
    EXPECT_EQ(ExtensionLines(window), Texts{" EGL_NV_post_sub_buffer supported"});
    const SimCall query = window.driver.LastCall("eglQuerySurface");
    EXPECT_EQ(query.args.at(1), SimValue(window.surface->Get()));
    EXPECT_EQ(query.Arg(2), 0x30BE); // EGL_POST_SUB_BUFFER_SUPPORTED_NV
}

TEST(UpdateRectangle, SubBufferEntryPointIsNotResolvedWhereTheWindowDoesNot)
{
    UpdateWindow window(PlainDevice().WithPostSubBuffer(false));
    UpdateRectangle rectangle;

    rectangle.Init(window.surface.get(), 1080, 1920);

    EXPECT_EQ(Resolved(window.driver), Texts{});
    EXPECT_EQ(ExtensionLines(window), Texts{});
}

TEST(UpdateRectangle, SubBufferEntryPointIsNotResolvedWhereTheWindowDoesNotTell)
{
    UpdateWindow window(PlainDevice().WithPostSubBuffer());
    UpdateRectangle rectangle;
    window.driver.FailWhen("eglQuerySurface", 2, 0x30BE, EGL_BAD_ATTRIBUTE);

    rectangle.Init(window.surface.get(), 1080, 1920);

    EXPECT_EQ(Resolved(window.driver), Texts{});
    EXPECT_EQ(rectangle.GetUpdateMode(), 0x09u);
}

TEST(UpdateRectangle, NothingIsResolvedWithoutTheExtensions)
{
    UpdateWindow window(PlainDevice());
    UpdateRectangle rectangle;

    rectangle.Init(window.surface.get(), 1080, 1920);

    EXPECT_EQ(Resolved(window.driver), Texts{});
    EXPECT_EQ(ExtensionLines(window), Texts{});
    EXPECT_EQ(window.driver.CallCount("eglQuerySurface"), 0u);
}

TEST(UpdateRectangle, EachExtensionIsLookedForInOrder)
{
    UpdateWindow window(DamageDevice().WithPostSubBuffer());
    UpdateRectangle rectangle;

    rectangle.Init(window.surface.get(), 1080, 1920);

    EXPECT_EQ(
        Resolved(window.driver),
        (Texts{"eglSetDamageRegionKHR", "eglSwapBuffersWithDamageKHR", "eglPostSubBufferNV"}));
    EXPECT_EQ(ExtensionLines(window), (Texts{" EGL_KHR_partial_update supported",
                                             " EGL_KHR_swap_buffers_with_damage supported",
                                             " EGL_NV_post_sub_buffer supported"}));
}

TEST(UpdateRectangle, DamageRegionWithoutItsEntryPointIsNoTechnique)
{
    UpdateWindow window(DamageDevice());
    UpdateRectangle rectangle;
    window.driver.FailWhen("eglGetProcAddress", 0, "eglSetDamageRegionKHR", EGL_SUCCESS);

    rectangle.Init(window.surface.get(), 1080, 1920);

    EXPECT_EQ(rectangle.GetUpdateMode(), 0x09u);
}

TEST(UpdateRectangle, SubBufferWithoutItsEntryPointIsNoTechnique)
{
    UpdateWindow window(PlainDevice().WithPostSubBuffer());
    UpdateRectangle rectangle;
    window.driver.FailWhen("eglGetProcAddress", 0, "eglPostSubBufferNV", EGL_SUCCESS);

    rectangle.Init(window.surface.get(), 1080, 1920);

    EXPECT_EQ(rectangle.GetUpdateMode(), 0x09u);
    EXPECT_TRUE(rectangle.DoSwapBuffers());
    EXPECT_EQ(window.driver.CallCount("eglSwapBuffers"), 1u);
}

TEST(UpdateRectangle, EntryPointsThatAreThereAreNotResolvedAgain)
{
    UpdateWindow window(DamageDevice().WithPostSubBuffer());
    const auto rectangle = window.Rectangle();

    rectangle->InitEGLExtensions();

    EXPECT_EQ(Resolved(window.driver), Texts{});
    EXPECT_EQ(window.driver.Log().size(), 0u);
}

TEST(UpdateRectangle, EntryPointsThatAreMissingAreResolvedAgain)
{
    UpdateWindow window(DamageDevice());
    UpdateRectangle rectangle;
    window.driver.FailWhen("eglGetProcAddress", 0, "eglSwapBuffersWithDamageKHR", EGL_SUCCESS);
    rectangle.Init(window.surface.get(), 1080, 1920);
    EXPECT_FALSE(rectangle.NeedsDamageRect());
    window.Forget();

    rectangle.InitEGLExtensions();

    EXPECT_EQ(Resolved(window.driver), Texts{"eglSwapBuffersWithDamageKHR"});
    EXPECT_TRUE(rectangle.NeedsDamageRect());
}

// ---- preserving the back buffer -----------------------------------------------------------------

TEST(UpdateRectangle, PreserveBehaviorIsSetOnTheSurface)
{
    UpdateWindow window(PlainDevice());
    const auto rectangle = window.Rectangle();

    EXPECT_TRUE(rectangle->SetPreserveBehavior());

    EXPECT_EQ(window.driver.Calls(),
              Sequence({Call("eglSurfaceAttrib", window.egl->GetDisplay(), window.surface->Get(),
                             0x3093, 0x3094)})); // EGL_SWAP_BEHAVIOR, EGL_BUFFER_PRESERVED
    EXPECT_EQ(window.driver.LogTexts(ANDROID_LOG_INFO), Texts{kPreserveSucceeded});
}

TEST(UpdateRectangle, RefusedPreserveBehaviorIsLogged)
{
    UpdateWindow window(PlainDevice().WithoutPreservedSwap());
    const auto rectangle = window.Rectangle();

    EXPECT_FALSE(rectangle->SetPreserveBehavior());

    EXPECT_EQ(window.driver.LogTexts(ANDROID_LOG_INFO), Texts{kPreserveFailed});
    EXPECT_EQ(window.driver.LogTexts(ANDROID_LOG_ERROR).size(), 1u); // the surface's own line
}

TEST(UpdateRectangle, FirstInitPreservesTwice)
{
    UpdateWindow window(PlainDevice());
    UpdateRectangle rectangle;
    window.Forget();

    rectangle.Init(window.surface.get(), 1080, 1920);

    // The decision, the size, and once more for the surface.
    const Texts lines = window.driver.LogTexts(ANDROID_LOG_INFO);
    ASSERT_GE(lines.size(), 4u);
    EXPECT_EQ(Texts(lines.end() - 4, lines.end()),
              (Texts{kPreserveSucceeded,
                     "void Nib::UpdateRectangle::SetUpdateMode(): Preserve Behavior. Mode = 0x9",
                     kScreenLine, kPreserveSucceeded}));
    EXPECT_EQ(window.driver.CallCount("eglSurfaceAttrib"), 2u);
}

TEST(UpdateRectangle, LaterInitPreservesTheNewSurface)
{
    UpdateWindow window(PlainDevice());
    const auto rectangle = window.Rectangle();
    const std::unique_ptr<Nib::EglSurface> other(
        window.egl->CreateWindowSurface(window.driver.Window(1080, 1920)));
    window.Forget();

    rectangle->Init(other.get(), 1080, 1920);

    EXPECT_EQ(window.driver.Surface(other->Get()).swapBehavior, EGL_BUFFER_PRESERVED);
    EXPECT_EQ(window.driver.LogTexts(ANDROID_LOG_INFO), (Texts{kScreenLine, kPreserveSucceeded}));
}

TEST(UpdateRectangle, ModeStaysWhereALaterSurfaceCannotBePreserved)
{
    UpdateWindow window(PlainDevice());
    const auto rectangle = window.Rectangle();
    window.driver.FailNext("eglSurfaceAttrib", EGL_BAD_MATCH);

    rectangle->Init(window.surface.get(), 1080, 1920);

    EXPECT_EQ(rectangle->GetUpdateMode(), 0x09u);
    EXPECT_EQ(window.driver.LogTexts(ANDROID_LOG_INFO), (Texts{kScreenLine, kPreserveFailed}));
}

TEST(UpdateRectangle, DamageRegionLeavesTheSwapBehavior)
{
    UpdateWindow window(SimGpu::Named("Mali-G72"));
    UpdateRectangle rectangle;

    rectangle.Init(window.surface.get(), 1080, 1920);

    EXPECT_EQ(window.driver.CallCount("eglSurfaceAttrib"), 0u);
}

TEST(UpdateRectangle, TileAlignmentLeavesTheSwapBehavior)
{
    UpdateWindow window(SimGpu::Named("Mali-T860"));
    UpdateRectangle rectangle;

    rectangle.Init(window.surface.get(), 1080, 1920);

    EXPECT_EQ(window.driver.CallCount("eglSurfaceAttrib"), 0u);
}

// ---- the decision -------------------------------------------------------------------------------

TEST(UpdateRectangle, DecisionIsMadeOnce)
{
    UpdateWindow window(DamageDevice());
    const auto rectangle = window.Rectangle();

    rectangle->Init(window.surface.get(), 1080, 1920);

    EXPECT_EQ(rectangle->GetUpdateMode(), 0x45u);
    EXPECT_EQ(window.driver.CallCount(), 0u);
    EXPECT_EQ(window.driver.LogTexts(ANDROID_LOG_INFO), Texts{kScreenLine});
}

TEST(UpdateRectangle, DecisionSurvivesAnotherSurface)
{
    UpdateWindow window(DamageDevice());
    const auto rectangle = window.Rectangle();
    const std::unique_ptr<Nib::EglSurface> other(
        window.egl->CreateWindowSurface(window.driver.Window(100, 200)));
    window.egl->MakeCurrent(&window.context, other.get());
    window.Forget();

    rectangle->Init(other.get());

    EXPECT_EQ(rectangle->GetUpdateMode(), 0x45u);
    EXPECT_EQ(rectangle->GetScreenWidth(), 100);
    EXPECT_TRUE(rectangle->DoSwapBuffers());
    EXPECT_EQ(window.driver.LastCall("eglSwapBuffersWithDamageKHR").args.at(1),
              SimValue(other->Get())); // the new one is presented
}

TEST(UpdateRectangle, DecisionAsksForTheListsInOrder)
{
    UpdateWindow window(PlainDevice().WithoutPreservedSwap());
    UpdateRectangle rectangle;
    window.Forget();

    rectangle.Init(window.surface.get(), 1080, 1920);

    const std::string notInList = "static bool Nib::OpenGLRenderer::isGpuOneOf(const char **) "
                                  "renderer - PowerVR Rogue GE8320 : NOT IN LIST";
    EXPECT_EQ(window.driver.LogTexts(ANDROID_LOG_INFO),
              (Texts{notInList, notInList, notInList, kPreserveFailed,
                     "void Nib::UpdateRectangle::SetUpdateMode(): Update full screen. Mode = 0x1",
                     kScreenLine}));
}

TEST(UpdateRectangle, SubBuffersMakeTheOtherListsUnnecessary)
{
    UpdateWindow window(SimGpu::Named("Mali-G72").WithPostSubBuffer());
    UpdateRectangle rectangle;
    window.Forget();

    rectangle.Init(window.surface.get(), 1080, 1920);

    EXPECT_EQ(window.driver.CountLogContaining("isGpuOneOf"), 1u); // only that of buffer ages
}

TEST(UpdateRectangle, OldAdrenoNeverUsesTheDamageRegion)
{
    UpdateWindow window(
        SimGpu::Named("Adreno (TM) 330").WithEglExtension("EGL_KHR_partial_update"));
    UpdateRectangle rectangle;

    rectangle.Init(window.surface.get(), 1080, 1920);

    EXPECT_EQ(Resolved(window.driver), Texts{"eglSetDamageRegionKHR"});
    EXPECT_EQ(rectangle.GetUpdateMode(), 0x25u);
    EXPECT_EQ(window.Decision().front(), ". Do not use BUFFER_AGE_KHR extension!");
}

TEST(UpdateRectangle, DamageSwapIsNeededOnlyWithItsEntryPoint)
{
    UpdateWindow window(DamageDevice().WithoutEglExtension("EGL_KHR_swap_buffers_with_damage"));
    const auto rectangle = window.Rectangle();

    EXPECT_EQ(rectangle->GetUpdateMode(), 0x45u);
    EXPECT_FALSE(rectangle->NeedsDamageRect());
}
