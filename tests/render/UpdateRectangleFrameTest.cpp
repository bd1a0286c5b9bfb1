#include "render/UpdateWindow.h"

#include <gtest/gtest.h>

using Nib::RectF;
using Nib::UpdateRectangle;
using Nib::UpdateRectangleModes;

// What one frame does, in each mode: the dirty rectangle, the state of the back buffer, the swap.

namespace
{

using Texts = std::vector<std::string>;

const std::string kDamageFailed = "void Nib::UpdateRectangle::UseRect(Nib::RectF, int). "
                                  "eglSetDamageRegion failed(%)";
/// What the next glStartTilingQCOM gets: x, y, width, height, mask.
std::vector<std::string> Tilings(const UpdateWindow& window)
{
    std::vector<std::string> texts;
    for (const SimCall& call : window.driver.Calls("glStartTilingQCOM"))
        texts.push_back(call.ToString());
    return texts;
}

std::string DamageLine(int error)
{
    std::string line = kDamageFailed;
    return line.replace(line.find('%'), 1, std::to_string(error));
}

} // namespace

// ---- UseRect in the modes that are chosen -------------------------------------------------------

TEST(UpdateRectangleFrame, TiledRenderingStartsOnTheDirtyArea)
{
    // Given a history of three small frames, and a back buffer that is known
    UpdateWindow window(WithAge(TilingDevice(), 2));
    const auto rectangle = window.Rectangle();
    window.Swap();
    for (int frame = 0; frame < 3; ++frame)
        rectangle->UseRect(RectF(100, 250, 110, 260), 0);
    window.Forget();

    rectangle->UseRect(kDirty, 0);

    EXPECT_EQ(window.driver.CallNames(),
              Names({"glBindFramebuffer", "eglQuerySurface", "glStartTilingQCOM"}));
    EXPECT_EQ(window.driver.LastCall("glBindFramebuffer"),
              Call("glBindFramebuffer", 0x8D40, 0));                     // GL_FRAMEBUFFER
    EXPECT_EQ(window.driver.LastCall("eglQuerySurface").Arg(2), 0x313D); // EGL_BUFFER_AGE_EXT
    EXPECT_EQ(Tilings(window), Texts{"glStartTilingQCOM(100, 1660, 200, 60, 0)"});
    EXPECT_EQ(window.driver.Log().size(), 0u);
}

TEST(UpdateRectangleFrame, FirstThreeFramesOfTiledRenderingAreFull)
{
    UpdateWindow window(WithAge(TilingDevice(), 2));
    const auto rectangle = window.Rectangle();
    window.Swap();

    for (int frame = 0; frame < 4; ++frame)
        rectangle->UseRect(kDirty, 0);

    EXPECT_EQ(Tilings(window), (Texts{"glStartTilingQCOM(0, 0, 1080, 1920, 0)",
                                      "glStartTilingQCOM(0, 0, 1080, 1920, 0)",
                                      "glStartTilingQCOM(0, 0, 1080, 1920, 0)",
                                      "glStartTilingQCOM(100, 1660, 200, 60, 0)"}));
}

TEST(UpdateRectangleFrame, TiledRenderingCoversTheLastThreeFrames)
{
    UpdateWindow window(WithAge(TilingDevice(), 2));
    const auto rectangle = window.Rectangle();
    window.Swap();
    rectangle->UseRect(RectF(0, 0, 50, 1920), 0);
    rectangle->UseRect(RectF(10, 10, 20, 20), 0);
    rectangle->UseRect(RectF(30, 30, 40, 40), 0);
    rectangle->UseRect(RectF(50, 50, 60, 60), 0);
    window.Forget();

    rectangle->UseRect(RectF(70, 70, 80, 80), 0);

    // 10 to 80 both ways: the first frame has dropped out.
    EXPECT_EQ(Tilings(window), Texts{"glStartTilingQCOM(10, 1840, 70, 70, 0)"});
}

TEST(UpdateRectangleFrame, InitMakesTheNextFramesFullAgain)
{
    UpdateWindow window(WithAge(TilingDevice(), 2));
    const auto rectangle = window.Rectangle();
    window.Swap();
    for (int frame = 0; frame < 4; ++frame)
        rectangle->UseRect(kDirty, 0);

    rectangle->Init(window.surface.get(), 1080, 1920);
    window.Forget();
    for (int frame = 0; frame < 4; ++frame)
        rectangle->UseRect(kDirty, 0);

    EXPECT_EQ(Tilings(window), (Texts{"glStartTilingQCOM(0, 0, 1080, 1920, 0)",
                                      "glStartTilingQCOM(0, 0, 1080, 1920, 0)",
                                      "glStartTilingQCOM(0, 0, 1080, 1920, 0)",
                                      "glStartTilingQCOM(100, 1660, 200, 60, 0)"}));
}

TEST(UpdateRectangleFrame, TiledRenderingIsClippedToTheScreen)
{
    UpdateWindow window(WithAge(TilingDevice(), 2));
    const auto rectangle = window.Rectangle();
    window.Swap();
    for (int frame = 0; frame < 4; ++frame)
        rectangle->UseRect(RectF(-50, 1900, 20, 2000), 0);

    EXPECT_EQ(Tilings(window).back(), "glStartTilingQCOM(0, 0, 20, 20, 0)");
}

TEST(UpdateRectangleFrame, TiledRenderingOutsideTheScreenIsEmpty)
{
    UpdateWindow window(WithAge(TilingDevice(), 2));
    const auto rectangle = window.Rectangle();
    window.Swap();
    for (int frame = 0; frame < 4; ++frame)
        rectangle->UseRect(RectF(2000, 0, 2100, 10), 0);

    EXPECT_EQ(Tilings(window).back(), "glStartTilingQCOM(0, 0, 0, 0, 0)");
}

TEST(UpdateRectangleFrame, TiledRenderingOfAnUnknownBufferIsFull)
{
    UpdateWindow window(WithAge(TilingDevice(), 0));
    const auto rectangle = window.Rectangle();
    window.Swap();
    for (int frame = 0; frame < 4; ++frame)
        rectangle->UseRect(RectF(2000, 0, 2100, 10), 0); // even outside the screen

    EXPECT_EQ(Tilings(window).back(), "glStartTilingQCOM(0, 0, 1080, 1920, 0)");
}

TEST(UpdateRectangleFrame, TiledRenderingLeavesTheDamageRectangle)
{
    UpdateWindow window(WithAge(TilingDevice(), 2));
    const auto rectangle = window.Rectangle();

    rectangle->UseRect(kDirty, 0);

    EXPECT_EQ(DamageOf(*rectangle), Box(0, 0, 0, 0));
    EXPECT_EQ(window.driver.CallCount("eglSetDamageRegionKHR"), 0u);
}

TEST(UpdateRectangleFrame, PostSubBufferTakesTheDirtyRectangleUnturned)
{
    UpdateWindow window(PlainDevice().WithPostSubBuffer());
    const auto rectangle = window.Rectangle();

    rectangle->UseRect(RectF(100.9F, 200.9F, 300.2F, 260.1F), 1);

    EXPECT_EQ(DamageOf(*rectangle), Box(100, 200, 199, 59));
    EXPECT_EQ(window.driver.CallCount(), 0u);
}

TEST(UpdateRectangleFrame, PostSubBufferHasNoHistory)
{
    UpdateWindow window(PlainDevice().WithPostSubBuffer());
    const auto rectangle = window.Rectangle();

    rectangle->UseRect(RectF(0, 0, 1080, 1920), 0);
    rectangle->UseRect(kDirty, 0);

    EXPECT_EQ(DamageOf(*rectangle), Box(100, 200, 200, 60));
}

TEST(UpdateRectangleFrame, DamageRegionModeDoesNothingWithTheDirtyRectangle)
{
    UpdateWindow window(DamageDevice());
    const auto rectangle = window.Rectangle();

    rectangle->UseRect(kDirty, 0);

    EXPECT_EQ(window.driver.CallCount(), 0u);
    EXPECT_EQ(DamageOf(*rectangle), Box(0, 0, 0, 0));
}

TEST(UpdateRectangleFrame, TileAlignmentDoesNothingWithTheDirtyRectangle)
{
    UpdateWindow window(TiledMali());
    const auto rectangle = window.Rectangle();

    rectangle->UseRect(kDirty, 0);

    EXPECT_EQ(window.driver.CallCount(), 0u);
}

TEST(UpdateRectangleFrame, PreservedBufferDoesNothingWithTheDirtyRectangle)
{
    UpdateWindow window(PlainDevice());
    const auto rectangle = window.Rectangle();

    rectangle->UseRect(kDirty, 0);

    EXPECT_EQ(window.driver.CallCount(), 0u);
}

TEST(UpdateRectangleFrame, FullScreenDoesNothingWithTheDirtyRectangle)
{
    UpdateWindow window(PlainDevice().WithoutPreservedSwap());
    const auto rectangle = window.Rectangle();

    rectangle->UseRect(kDirty, 0);

    EXPECT_EQ(window.driver.CallCount(), 0u);
}

TEST(UpdateRectangleFrame, BeforeInitTheDirtyRectangleIsIgnored)
{
    UpdateWindow window(PlainDevice());
    UpdateRectangle rectangle;
    window.Forget();

    rectangle.UseRect(kDirty, 0);

    EXPECT_EQ(window.driver.CallCount(), 0u);
}

// ---- UseRect with bits that no mode has together ------------------------------------------------

TEST(UpdateRectangleFrame, TilingWithADamageRegionSetsIt)
{
    UpdateWindow window(WithAge(DamageDevice(), 2));
    const auto rectangle = window.Rectangle();
    window.Swap();
    UpdateRectangleModes::Set(*rectangle, 0x61, 0);
    for (int frame = 0; frame < 3; ++frame)
        rectangle->UseRect(kDirty, 0);
    window.Swap(); // one region a frame
    window.Forget();

    rectangle->UseRect(kDirty, 0);

    EXPECT_EQ(window.driver.CallNames(),
              Names({"glBindFramebuffer", "eglQuerySurface", "eglSetDamageRegionKHR"}));
    const SimCall call = window.driver.LastCall("eglSetDamageRegionKHR");
    EXPECT_EQ(call.args.at(0), SimValue(window.egl->GetDisplay()));
    EXPECT_EQ(call.args.at(1), SimValue(window.surface->Get()));
    EXPECT_EQ(call.Arg(3), 1);
    EXPECT_EQ(call.list, (std::vector<long long>{100, 1660, 200, 60}));
    EXPECT_EQ(DamageOf(*rectangle), kDirtyBox);
    EXPECT_EQ(window.driver.Log().size(), 0u);
}

TEST(UpdateRectangleFrame, TilingWithoutAHistoryStartsOnTheDirtyRectangle)
{
    // Given a device whose mode keeps no history, and a back buffer that is known
    UpdateWindow window(
        WithAge(PlainDevice().WithPostSubBuffer().WithGlExtension("GL_QCOM_tiled_rendering"), 2));
    const auto rectangle = window.Rectangle();
    window.Swap();
    UpdateRectangleModes::Set(*rectangle, 0x21, 0);

    rectangle->UseRect(kDirty, 0);

    EXPECT_EQ(Tilings(window), Texts{"glStartTilingQCOM(100, 1660, 200, 60, 0)"});
}

TEST(UpdateRectangleFrame, RefusedDamageRegionIsLoggedAndTheFrameGoesOn)
{
    UpdateWindow window(WithAge(DamageDevice(), 2));
    const auto rectangle = window.Rectangle();
    UpdateRectangleModes::Set(*rectangle, 0x61, 0);
    window.driver.FailNext("eglSetDamageRegionKHR", EGL_BAD_ACCESS);

    rectangle->UseRect(kDirty, 0);

    EXPECT_EQ(window.driver.LogTexts(ANDROID_LOG_ERROR), Texts{DamageLine(12290)});
    EXPECT_EQ(DamageOf(*rectangle), kFullScreen); // of the history, as it is after Init
}

TEST(UpdateRectangleFrame, TilingWithASubBufferKeepsTheUnturnedRectangle)
{
    // The box of the tiles is stored first, and overwritten.
    UpdateWindow window(WithAge(TilingDevice(), 2));
    const auto rectangle = window.Rectangle();
    window.Swap();
    UpdateRectangleModes::Set(*rectangle, 0xA1, 0);

    rectangle->UseRect(kDirty, 0);

    EXPECT_EQ(DamageOf(*rectangle), Box(100, 200, 200, 60));
    EXPECT_EQ(window.driver.CallCount("glStartTilingQCOM"), 1u);
}

TEST(UpdateRectangleFrame, ReportBitLogsTheDamageErrorEveryTime)
{
    UpdateWindow window(PlainDevice());
    const auto rectangle = window.Rectangle();
    UpdateRectangleModes::Set(*rectangle, 0x11, 0);

    rectangle->UseRect(kDirty, 0);
    rectangle->UseRect(kDirty, 0);

    // 12288 is EGL_SUCCESS.
    EXPECT_EQ(window.driver.LogTexts(ANDROID_LOG_ERROR),
              (Texts{DamageLine(12288), DamageLine(12288)}));
}

// ---- the rotation -------------------------------------------------------------------------------

namespace
{

/// Where tiling starts on 1080 x 1910, with tiles of 32, for the dirty rectangle
/// (100, 200, 300, 260), whose scissor box is (100, 1650, 200, 60).
std::string TilingOfRotation(const char* hwRotation, int rotation)
{
    UpdateWindow window(WithAge(TilingDevice(), 2));
    window.driver.SetProperty("ro.sf.hwrotation", hwRotation);
    UpdateRectangle rectangle;
    rectangle.Init(window.surface.get(), 1080, 1910);
    window.Swap();
    UpdateRectangleModes::Set(rectangle, 0x27, 32);
    for (int frame = 0; frame < 4; ++frame)
        rectangle.UseRect(kDirty, rotation);
    return Tilings(window).back();
}

const char kLeftBottom[] = "glStartTilingQCOM(96, 1632, 224, 96, 0)";
const char kRightBottom[] = "glStartTilingQCOM(88, 1632, 224, 96, 0)";
const char kRightTop[] = "glStartTilingQCOM(88, 1622, 224, 96, 0)";
const char kLeftTop[] = "glStartTilingQCOM(96, 1622, 224, 96, 0)";

} // namespace

TEST(UpdateRectangleFrame, WithoutRotationTilesCountFromLeftAndBottom)
{
    EXPECT_EQ(TilingOfRotation("0", 0), kLeftBottom);
}

TEST(UpdateRectangleFrame, QuarterTurnOfTheContentCounts)
{
    EXPECT_EQ(TilingOfRotation("0", 1), kRightBottom);
}

TEST(UpdateRectangleFrame, QuarterTurnOfThePanelCounts)
{
    EXPECT_EQ(TilingOfRotation("90", 0), kRightBottom);
}

TEST(UpdateRectangleFrame, RotationsOfPanelAndContentAddUp)
{
    EXPECT_EQ(TilingOfRotation("90", 2), kLeftTop);
}

TEST(UpdateRectangleFrame, RotationsAreTakenModuloFour)
{
    EXPECT_EQ(TilingOfRotation("270", 3), kRightTop);
}

TEST(UpdateRectangleFrame, RotationBelowZeroCountsFromRightAndTop)
{
    EXPECT_EQ(TilingOfRotation("0", -1), kRightTop);
}

TEST(UpdateRectangleFrame, RotationBelowZeroThatIsAMultipleOfFourIsNone)
{
    EXPECT_EQ(TilingOfRotation("0", -4), kLeftBottom);
}

TEST(UpdateRectangleFrame, HugeRotationDoesNotOverflow)
{
    EXPECT_EQ(TilingOfRotation("90", 2147483647), kLeftBottom); // 2147483648 is a multiple of 4
}

// ---- the damage rectangle -----------------------------------------------------------------------

TEST(UpdateRectangleFrame, DamageIsStoredAsScissorBoxesAre)
{
    SimDriver driver;
    UpdateRectangle rectangle;
    UpdateRectangle::DamageRect damage{};

    rectangle.DamageRectFromScissor(damage, 1, 2, 3, 4);

    EXPECT_EQ(damage.x, 1);
    EXPECT_EQ(damage.y, 2);
    EXPECT_EQ(damage.width, 3);
    EXPECT_EQ(damage.height, 4);
    EXPECT_EQ(sizeof(damage), 4 * sizeof(EGLint)); // EGL takes it by its address
}

// ---- the swap -----------------------------------------------------------------------------------

TEST(UpdateRectangleFrame, SubBufferModePostsTheDamage)
{
    UpdateWindow window(PlainDevice().WithPostSubBuffer());
    const auto rectangle = window.Rectangle();
    rectangle->UseRect(kDirty, 0);

    EXPECT_TRUE(rectangle->DoSwapBuffers());

    EXPECT_EQ(window.driver.Calls(), Sequence({Call("eglPostSubBufferNV", window.egl->GetDisplay(),
                                                    window.surface->Get(), 100, 200, 200, 60)}));
}

TEST(UpdateRectangleFrame, RefusedSubBufferIsFalse)
{
    UpdateWindow window(PlainDevice().WithPostSubBuffer());
    const auto rectangle = window.Rectangle();
    window.driver.FailNext("eglPostSubBufferNV", EGL_BAD_SURFACE);

    EXPECT_FALSE(rectangle->DoSwapBuffers());

    EXPECT_EQ(window.driver.CallCount("eglSwapBuffers"), 0u);
    EXPECT_EQ(window.driver.CallCount("eglGetError"), 0u) << "the caller may ask for it";
    EXPECT_EQ(window.driver.CountLogContaining(
                  "bool Nib::UpdateRectangle::DoSwapBuffers() The frame is not shown"),
              1u);
}

TEST(UpdateRectangleFrame, DamageModeSwapsWithTheDamage)
{
    UpdateWindow window(DamageDevice());
    const auto rectangle = window.Rectangle();
    rectangle->SetDamageRect({10, 20, 30, 40});

    EXPECT_TRUE(rectangle->DoSwapBuffers());

    const std::vector<SimCall> calls = window.driver.Calls();
    ASSERT_EQ(calls.size(), 1u);
    EXPECT_EQ(calls[0].name, "eglSwapBuffersWithDamageKHR");
    EXPECT_EQ(calls[0].args.at(0), SimValue(window.egl->GetDisplay()));
    EXPECT_EQ(calls[0].args.at(1), SimValue(window.surface->Get()));
    EXPECT_EQ(calls[0].Arg(3), 1);
    EXPECT_EQ(calls[0].list, (std::vector<long long>{10, 20, 30, 40}));
}

TEST(UpdateRectangleFrame, DamageIsEmptyUntilItIsFilled)
{
    UpdateWindow window(DamageDevice());
    const auto rectangle = window.Rectangle();

    EXPECT_TRUE(rectangle->DoSwapBuffers());

    EXPECT_EQ(window.driver.LastCall("eglSwapBuffersWithDamageKHR").list,
              (std::vector<long long>{0, 0, 0, 0}));
}

TEST(UpdateRectangleFrame, RefusedDamageSwapIsFalse)
{
    UpdateWindow window(DamageDevice());
    const auto rectangle = window.Rectangle();
    window.driver.FailNext("eglSwapBuffersWithDamageKHR", EGL_BAD_SURFACE);

    EXPECT_FALSE(rectangle->DoSwapBuffers());

    EXPECT_EQ(window.driver.CallCount("eglSwapBuffers"), 0u);
    EXPECT_EQ(window.driver.CallCount("eglGetError"), 0u) << "the caller may ask for it";
    EXPECT_EQ(window.driver.CountLogContaining(
                  "bool Nib::UpdateRectangle::DoSwapBuffers() The frame is not shown"),
              1u);
}

TEST(UpdateRectangleFrame, DamageModeWithoutTheDamageSwapSwapsAll)
{
    UpdateWindow window(DamageDevice().WithoutEglExtension("EGL_KHR_swap_buffers_with_damage"));
    const auto rectangle = window.Rectangle();

    EXPECT_TRUE(rectangle->DoSwapBuffers());

    EXPECT_EQ(window.driver.CallNames(), Names({"eglSwapBuffers"}));
}

namespace
{

/// The calls of a swap on this device.
std::vector<std::string> SwapCalls(const SimGpu& gpu)
{
    UpdateWindow window(gpu);
    const auto rectangle = window.Rectangle();
    EXPECT_TRUE(rectangle->DoSwapBuffers());
    EXPECT_EQ(window.driver.WindowState(window.window).presented, 1);
    return window.driver.CallNames();
}

} // namespace

TEST(UpdateRectangleFrame, TileAlignmentSwapsAll)
{
    // The damaged swap is there, too, but is no part of this mode.
    EXPECT_EQ(SwapCalls(TiledMali()), Names({"eglSwapBuffers"}));
}

TEST(UpdateRectangleFrame, TiledRenderingSwapsAll)
{
    EXPECT_EQ(SwapCalls(TilingDevice()), Names({"eglSwapBuffers"}));
}

TEST(UpdateRectangleFrame, PreservedBufferSwapsAll)
{
    EXPECT_EQ(SwapCalls(PlainDevice()), Names({"eglSwapBuffers"}));
}

TEST(UpdateRectangleFrame, FullScreenSwapsAll)
{
    EXPECT_EQ(SwapCalls(PlainDevice().WithoutPreservedSwap()), Names({"eglSwapBuffers"}));
}

TEST(UpdateRectangleFrame, RefusedSwapIsFalse)
{
    UpdateWindow window(PlainDevice());
    const auto rectangle = window.Rectangle();
    window.driver.FailNext("eglSwapBuffers", EGL_CONTEXT_LOST);

    EXPECT_FALSE(rectangle->DoSwapBuffers());
}

// ---- Reset --------------------------------------------------------------------------------------

TEST(UpdateRectangleFrame, ResetEndsTilingThenDropsDepthAndStencil)
{
    UpdateWindow window(WithAge(TilingDevice(), 2));
    const auto rectangle = window.Rectangle();
    rectangle->UseRect(kDirty, 0);
    window.Forget();

    rectangle->Reset();

    EXPECT_EQ(window.driver.CallNames(),
              Names({"glEndTilingQCOM", "glGetIntegerv", "glInvalidateFramebuffer"}));
    EXPECT_EQ(window.driver.LastCall("glEndTilingQCOM"),
              Call("glEndTilingQCOM", 0x1)); // GL_COLOR_BUFFER_BIT0_QCOM
    EXPECT_EQ(window.driver.LastCall("glInvalidateFramebuffer").Arg(0), 0x8D40);
    EXPECT_EQ(window.driver.LastCall("glInvalidateFramebuffer").list,
              (std::vector<long long>{0x1801, 0x1802})); // GL_DEPTH, GL_STENCIL
}

TEST(UpdateRectangleFrame, ResetDropsDepthAndStencilInEveryMode)
{
    UpdateWindow window(PlainDevice());
    const auto rectangle = window.Rectangle();

    rectangle->Reset();

    EXPECT_EQ(window.driver.CallNames(), Names({"glGetIntegerv", "glInvalidateFramebuffer"}));
}

// ---- what the user sees -------------------------------------------------------------------------

TEST(UpdateRectangleFrame, SubBufferShowsOnlyTheDirtyPart)
{
    UpdateWindow window(PlainDevice().WithPostSubBuffer());
    const auto rectangle = window.Rectangle();
    FillBackBuffer(1, 0, 0, 1);
    rectangle->UseRect(RectF(0, 0, 100, 100), 0);

    EXPECT_TRUE(rectangle->DoSwapBuffers());

    EXPECT_EQ(window.driver.FrontPixel(window.window, 50, 50), (SimPixel{255, 0, 0, 255}));
    EXPECT_EQ(window.driver.FrontPixel(window.window, 150, 50), (SimPixel{0, 0, 0, 0}));
}

TEST(UpdateRectangleFrame, PreservedBufferKeepsTheLastFrame)
{
    UpdateWindow window(PlainDevice());
    const auto rectangle = window.Rectangle();
    FillBackBuffer(0, 1, 0, 1);

    EXPECT_TRUE(rectangle->DoSwapBuffers());

    EXPECT_EQ(window.driver.BackPixel(window.window, 50, 50), (SimPixel{0, 255, 0, 255}));
    EXPECT_FALSE(rectangle->IsFramebufferDirty());
}
