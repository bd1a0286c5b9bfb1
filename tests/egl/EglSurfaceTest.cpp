#include "egl/EglTestSupport.h"

#include <gtest/gtest.h>

#include <memory>

using Nib::EglSurface;

namespace
{

/// A pbuffer 480 wide and 640 high, and nothing recorded since it was made.
struct OpenSurface : OpenDisplay
{
    explicit OpenSurface(SimGpu gpu = SimGpu::Default())
        : OpenDisplay(std::move(gpu)), surface(egl->CreateOffscreenSurface(640, 480))
    {
        driver.ForgetCalls();
        driver.ForgetLog();
    }

    std::unique_ptr<EglSurface> surface;
};

} // namespace

// ---- the handle ---------------------------------------------------------------------------------

TEST(EglSurface, TakesItsHandleOver)
{
    OpenSurface open;

    EXPECT_TRUE(open.surface->IsCreated());
    EXPECT_EQ(open.driver.Surfaces(), std::vector<EGLSurface>{open.surface->Get()});
}

TEST(EglSurface, WithoutAHandleIsNotCreated)
{
    SimDriver driver;
    EglSurface surface(EGL_NO_SURFACE);

    EXPECT_FALSE(surface.IsCreated());
    EXPECT_EQ(surface.Get(), EGL_NO_SURFACE);
    surface.Destroy();

    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST(EglSurface, DestroyEndsTheSurface)
{
    OpenSurface open;
    const EGLSurface handle = open.surface->Get();

    open.surface->Destroy();

    EXPECT_FALSE(open.surface->IsCreated());
    EXPECT_EQ(open.surface->Get(), EGL_NO_SURFACE);
    EXPECT_EQ(open.driver.Calls(),
              Sequence({Call("eglDestroySurface", open.egl->GetDisplay(), handle)}));
    EXPECT_EQ(open.driver.Log().size(), 0u);
}

TEST(EglSurface, IsDestroyedOnce)
{
    OpenSurface open;

    open.surface->Destroy();
    open.surface->Destroy();
    open.surface.reset();

    EXPECT_EQ(open.driver.CallCount("eglDestroySurface"), 1u);
}

TEST(EglSurface, DestructorDestroys)
{
    OpenSurface open;
    const EGLSurface handle = open.surface->Get();

    open.surface.reset();

    EXPECT_EQ(open.driver.Calls(),
              Sequence({Call("eglDestroySurface", open.egl->GetDisplay(), handle)}));
    EXPECT_EQ(open.driver.Surfaces().size(), 0u);
}

// ---- attributes ---------------------------------------------------------------------------------

TEST(EglSurface, SetAttributeReachesEgl)
{
    OpenSurface open;

    EXPECT_TRUE(open.surface->SetAttribute(EGL_SWAP_BEHAVIOR, EGL_BUFFER_PRESERVED));

    EXPECT_EQ(open.driver.Calls(),
              Sequence({Call("eglSurfaceAttrib", open.egl->GetDisplay(), open.surface->Get(),
                             EGL_SWAP_BEHAVIOR, EGL_BUFFER_PRESERVED)}));
    EXPECT_EQ(open.driver.Surface(open.surface->Get()).swapBehavior, EGL_BUFFER_PRESERVED);
    EXPECT_EQ(open.driver.Log().size(), 0u);
}

TEST(EglSurface, FailedSetAttributeIsLogged)
{
    OpenSurface open;
    open.driver.FailNext("eglSurfaceAttrib", EGL_BAD_MATCH);

    EXPECT_FALSE(open.surface->SetAttribute(EGL_SWAP_BEHAVIOR, EGL_BUFFER_PRESERVED));

    // EGL_SWAP_BEHAVIOR is 12435, EGL_BUFFER_PRESERVED 12436, EGL_BAD_MATCH 12297.
    EXPECT_EQ(AllLines(open.driver), Lines({"E bool Nib::EglSurface::SetAttribute(int, int) : "
                                            "Failed. attr = 12435, val = 12436, err = 12297"}));
}

TEST(EglSurface, QueryAttributeGivesTheValue)
{
    OpenSurface open;
    int value = -7;

    EXPECT_TRUE(open.surface->QueryAttribute(EGL_HEIGHT, &value));

    EXPECT_EQ(value, 640);
    const SimCall query = open.driver.LastCall("eglQuerySurface");
    EXPECT_EQ(query.args.at(0), SimValue(open.egl->GetDisplay()));
    EXPECT_EQ(query.args.at(1), SimValue(open.surface->Get()));
    EXPECT_EQ(query.args.at(2), SimValue(EGL_HEIGHT));
    EXPECT_EQ(open.driver.CallCount(), 1u);
}

TEST(EglSurface, QueryAttributeNeedsNoPlaceForTheValue)
{
    OpenSurface open;

    EXPECT_TRUE(open.surface->QueryAttribute(EGL_HEIGHT, nullptr));

    open.driver.FailNext("eglQuerySurface", EGL_BAD_SURFACE);
    EXPECT_FALSE(open.surface->QueryAttribute(EGL_HEIGHT, nullptr));
}

TEST(EglSurface, FailedQueryAttributeLeavesTheValue)
{
    OpenSurface open;
    open.driver.FailNext("eglQuerySurface", EGL_BAD_ATTRIBUTE);
    int value = -7;

    EXPECT_FALSE(open.surface->QueryAttribute(EGL_HEIGHT, &value));

    EXPECT_EQ(value, -7);
}

TEST(EglSurface, FailedQueryAttributeIsLogged)
{
    OpenSurface open;
    open.driver.FailNext("eglQuerySurface", EGL_BAD_ATTRIBUTE);

    open.surface->QueryAttribute(EGL_HEIGHT, nullptr);

    // EGL_HEIGHT is 12374, EGL_BAD_ATTRIBUTE 12292.
    EXPECT_EQ(AllLines(open.driver),
              Lines({"E bool Nib::EglSurface::QueryAttribute(int, int *) const : "
                     "Failed. attr = 12374, err = 12292"}));
}

TEST(EglSurface, DestroyedOneRefusesAttributes)
{
    OpenSurface open;
    open.surface->Destroy();

    EXPECT_FALSE(open.surface->SetAttribute(EGL_SWAP_BEHAVIOR, EGL_BUFFER_PRESERVED));
    EXPECT_FALSE(open.surface->QueryAttribute(EGL_WIDTH, nullptr));

    // EGL_WIDTH is 12375, EGL_BAD_SURFACE 12301.
    EXPECT_EQ(AllLines(open.driver),
              Lines({"E bool Nib::EglSurface::SetAttribute(int, int) : "
                     "Failed. attr = 12435, val = 12436, err = 12301",
                     "E bool Nib::EglSurface::QueryAttribute(int, int *) const : "
                     "Failed. attr = 12375, err = 12301"}));
}

// ---- swapping -----------------------------------------------------------------------------------

TEST(EglSurface, SwapBuffersPresents)
{
    OpenDisplay display;
    ANativeWindow* window = display.driver.Window(32, 32);
    Nib::EglContext context;
    context.Create(EGL_NO_CONTEXT, false, Nib::EglContext::Priority::Medium);
    const std::unique_ptr<EglSurface> surface(display.egl->CreateWindowSurface(window));
    ASSERT_TRUE(display.egl->MakeCurrent(&context, surface.get()));
    display.driver.ForgetCalls();
    display.driver.ForgetLog();

    EXPECT_TRUE(surface->SwapBuffers());

    EXPECT_EQ(display.driver.Calls(),
              Sequence({Call("eglSwapBuffers", display.egl->GetDisplay(), surface->Get())}));
    EXPECT_EQ(display.driver.WindowState(window).presented, 1);
    EXPECT_EQ(display.driver.Log().size(), 0u);
    display.egl->MakeCurrent(nullptr, nullptr);
}

TEST(EglSurface, FailedSwapBuffersIsLogged)
{
    OpenSurface open;
    open.driver.FailNext("eglSwapBuffers", EGL_CONTEXT_LOST);

    EXPECT_FALSE(open.surface->SwapBuffers());

    // EGL_CONTEXT_LOST is 12302.
    EXPECT_EQ(AllLines(open.driver),
              Lines({"E bool Nib::EglSurface::SwapBuffers() const Failed. Err = 12302"}));
}

// ---- the size -----------------------------------------------------------------------------------

TEST(EglSurface, WidthAndHeightAreAskedOfEgl)
{
    OpenSurface open;

    EXPECT_EQ(open.surface->GetWidth(), 480);
    EXPECT_EQ(open.surface->GetHeight(), 640);

    const std::vector<SimCall> calls = open.driver.Calls();
    ASSERT_EQ(calls.size(), 2u);
    EXPECT_EQ(calls[0].Arg(2), 0x3057); // EGL_WIDTH
    EXPECT_EQ(calls[1].Arg(2), 0x3056); // EGL_HEIGHT
    EXPECT_EQ(open.driver.Log().size(), 0u);
}

TEST(EglSurface, WidthIsMinusOneWhenEglDoesNotTell)
{
    OpenSurface open;
    open.driver.FailNext("eglQuerySurface", EGL_BAD_SURFACE);

    EXPECT_EQ(open.surface->GetWidth(), -1);

    EXPECT_EQ(AllLines(open.driver),
              Lines({"E bool Nib::EglSurface::QueryAttribute(int, int *) const : "
                     "Failed. attr = 12375, err = 12301",
                     "E int Nib::EglSurface::GetWidth() const : Failed."}));
}

TEST(EglSurface, HeightIsMinusOneWhenEglDoesNotTell)
{
    OpenSurface open;
    open.driver.FailNext("eglQuerySurface", EGL_BAD_SURFACE);

    EXPECT_EQ(open.surface->GetHeight(), -1);

    EXPECT_EQ(AllLines(open.driver),
              Lines({"E bool Nib::EglSurface::QueryAttribute(int, int *) const : "
                     "Failed. attr = 12374, err = 12301",
                     "E int Nib::EglSurface::GetHeight() const : Failed."}));
}
