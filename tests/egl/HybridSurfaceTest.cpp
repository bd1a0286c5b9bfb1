#include "egl/EglTestSupport.h"

#include <gtest/gtest.h>

using Nib::EglContext;
using Nib::EglSurface;
using Nib::HybridSurface;

namespace
{

/// The calls that make or end surfaces, in order.
std::vector<std::string> SurfaceCalls(const SimDriver& driver)
{
    std::vector<std::string> names;
    for (const SimCall& call :
         driver.Calls({"eglCreatePbufferSurface", "eglCreateWindowSurface", "eglDestroySurface"}))
        names.push_back(call.name);
    return names;
}

} // namespace

TEST(HybridSurface, IsEmptyAtFirst)
{
    SimDriver driver;
    HybridSurface surface;

    EXPECT_EQ(surface.GetActiveSurface(), nullptr);
    EXPECT_FALSE(surface.IsAttachedToWindow());
    EXPECT_EQ(surface.GetWidth(), 1);
    EXPECT_EQ(surface.GetHeight(), 1);
    EXPECT_EQ(driver.CallCount(), 0u);
}

// ---- Create -------------------------------------------------------------------------------------

TEST(HybridSurface, CreateMakesAPbufferOfOnePixel)
{
    OpenDisplay display;
    HybridSurface surface;

    EXPECT_TRUE(surface.Create());

    EXPECT_EQ(SurfaceCalls(display.driver), Names({"eglCreatePbufferSurface"}));
    EXPECT_EQ(display.driver.LastCall("eglCreatePbufferSurface").list,
              (std::vector<long long>{0x3056, 1, 0x3057, 1}));
    ASSERT_NE(surface.GetActiveSurface(), nullptr);
    EXPECT_FALSE(display.driver.Surface(surface.GetActiveSurface()->Get()).window);
    EXPECT_FALSE(surface.IsAttachedToWindow());
}

TEST(HybridSurface, FailedCreateIsLogged)
{
    OpenDisplay display;
    HybridSurface surface;
    display.driver.FailNext("eglCreatePbufferSurface", EGL_BAD_ALLOC);

    EXPECT_FALSE(surface.Create());

    EXPECT_EQ(surface.GetActiveSurface(), nullptr);
    EXPECT_EQ(AllLines(display.driver).back(),
              "E bool Nib::HybridSurface::Create(). Failed to create offscreen surface");
}

TEST(HybridSurface, SecondCreateDoesNotEndTheFirstPbuffer)
{
    OpenDisplay display;
    HybridSurface surface;
    surface.Create();
    EglSurface* first = surface.GetActiveSurface();

    EXPECT_TRUE(surface.Create());

    EXPECT_NE(surface.GetActiveSurface(), first);
    EXPECT_EQ(display.driver.CallCount("eglDestroySurface"), 0u);
    delete first;
}

// ---- attaching and detaching --------------------------------------------------------------------

TEST(HybridSurface, AttachedOneIsTheWindow)
{
    OpenDisplay display;
    HybridSurface surface;
    surface.Create();
    EglSurface* pbuffer = surface.GetActiveSurface();

    EXPECT_TRUE(surface.AttachToWindow(display.driver.Window(320, 200)));

    EXPECT_TRUE(surface.IsAttachedToWindow());
    EXPECT_NE(surface.GetActiveSurface(), pbuffer);
    EXPECT_TRUE(display.driver.Surface(surface.GetActiveSurface()->Get()).window);
    EXPECT_TRUE(pbuffer->IsCreated()); // kept for later
}

TEST(HybridSurface, SizeIsThatOfTheWindowWhileAttached)
{
    OpenDisplay display;
    HybridSurface surface;
    surface.Create();
    display.driver.ForgetCalls();
    EXPECT_EQ(surface.GetWidth(), 1);
    EXPECT_EQ(surface.GetHeight(), 1);
    EXPECT_EQ(display.driver.CallCount(), 0u); // known without asking

    surface.AttachToWindow(display.driver.Window(320, 200));

    EXPECT_EQ(surface.GetWidth(), 320);
    EXPECT_EQ(surface.GetHeight(), 200);

    surface.DetachFromWindow();

    EXPECT_EQ(surface.GetWidth(), 1);
    EXPECT_EQ(surface.GetHeight(), 1);
}

TEST(HybridSurface, SizeIsMinusOneWhenTheWindowDoesNotTell)
{
    OpenDisplay display;
    HybridSurface surface;
    surface.Create();
    surface.AttachToWindow(display.driver.Window(320, 200));
    display.driver.FailNext("eglQuerySurface", EGL_BAD_SURFACE, 2);

    EXPECT_EQ(surface.GetWidth(), -1);
    EXPECT_EQ(surface.GetHeight(), -1);
}

TEST(HybridSurface, DetachDestroysTheWindowSurface)
{
    OpenDisplay display;
    HybridSurface surface;
    surface.Create();
    EglSurface* pbuffer = surface.GetActiveSurface();
    surface.AttachToWindow(display.driver.Window(320, 200));
    const EGLSurface window = surface.GetActiveSurface()->Get();
    display.driver.ForgetCalls();

    EXPECT_TRUE(surface.DetachFromWindow());

    EXPECT_EQ(display.driver.Calls(),
              Sequence({Call("eglDestroySurface", display.egl->GetDisplay(), window)}));
    EXPECT_FALSE(surface.IsAttachedToWindow());
    EXPECT_EQ(surface.GetActiveSurface(), pbuffer);
}

TEST(HybridSurface, DetachIsTrueWithoutAWindow)
{
    OpenDisplay display;
    HybridSurface surface;

    EXPECT_TRUE(surface.DetachFromWindow());
    surface.Create();
    display.driver.ForgetCalls();
    EXPECT_TRUE(surface.DetachFromWindow());

    EXPECT_EQ(display.driver.CallCount(), 0u);
}

TEST(HybridSurface, SecondWindowReplacesTheFirst)
{
    OpenDisplay display;
    HybridSurface surface;
    surface.Create();
    ANativeWindow* first = display.driver.Window(320, 200);
    ANativeWindow* second = display.driver.Window(640, 480);
    surface.AttachToWindow(first);
    display.driver.ForgetCalls();

    EXPECT_TRUE(surface.AttachToWindow(second));

    EXPECT_EQ(SurfaceCalls(display.driver), Names({"eglDestroySurface", "eglCreateWindowSurface"}));
    EXPECT_FALSE(display.driver.WindowState(first).connected);
    EXPECT_TRUE(display.driver.WindowState(second).connected);
    EXPECT_EQ(surface.GetWidth(), 640);
}

TEST(HybridSurface, SameWindowCanBeAttachedAgain)
{
    // A window takes one surface at a time, so that the old one has to go first.
    OpenDisplay display;
    HybridSurface surface;
    surface.Create();
    ANativeWindow* window = display.driver.Window(320, 200);
    surface.AttachToWindow(window);

    EXPECT_TRUE(surface.AttachToWindow(window));

    EXPECT_TRUE(display.driver.WindowState(window).connected);
}

TEST(HybridSurface, FailedAttachLeavesThePbuffer)
{
    OpenDisplay display;
    HybridSurface surface;
    surface.Create();
    EglSurface* pbuffer = surface.GetActiveSurface();
    display.driver.FailNext("eglCreateWindowSurface", EGL_BAD_NATIVE_WINDOW);

    EXPECT_FALSE(surface.AttachToWindow(display.driver.Window(320, 200)));

    EXPECT_FALSE(surface.IsAttachedToWindow());
    EXPECT_EQ(surface.GetActiveSurface(), pbuffer);
    EXPECT_EQ(surface.GetWidth(), 1);
    EXPECT_EQ(AllLines(display.driver).back(),
              "E bool Nib::HybridSurface::AttachToWindow(ANativeWindow *). "
              "Failed to create window surface");
}

TEST(HybridSurface, FailedSecondAttachEndsTheFirst)
{
    OpenDisplay display;
    HybridSurface surface;
    surface.Create();
    EglSurface* pbuffer = surface.GetActiveSurface();
    ANativeWindow* first = display.driver.Window(320, 200);
    surface.AttachToWindow(first);
    display.driver.FailNext("eglCreateWindowSurface", EGL_BAD_NATIVE_WINDOW);

    EXPECT_FALSE(surface.AttachToWindow(display.driver.Window(640, 480)));

    EXPECT_FALSE(surface.IsAttachedToWindow());
    EXPECT_EQ(surface.GetActiveSurface(), pbuffer);
    EXPECT_FALSE(display.driver.WindowState(first).connected);
}

TEST(HybridSurface, ContextGoesBackAndForth)
{
    OpenDisplay display;
    HybridSurface surface;
    surface.Create();
    EglContext context;
    context.Create(EGL_NO_CONTEXT, false, EglContext::Priority::Medium);
    ANativeWindow* window = display.driver.Window(16, 16);

    for (int turn = 0; turn < 3; ++turn)
    {
        EXPECT_TRUE(surface.AttachToWindow(window));
        EXPECT_TRUE(display.egl->MakeCurrent(&context, surface.GetActiveSurface()));
        EXPECT_TRUE(surface.GetActiveSurface()->SwapBuffers());
        EXPECT_TRUE(display.egl->MakeCurrent(nullptr, nullptr));
        EXPECT_TRUE(surface.DetachFromWindow());
        EXPECT_TRUE(display.egl->MakeCurrent(&context, surface.GetActiveSurface()));
    }

    EXPECT_EQ(display.driver.WindowState(window).presented, 3);
    EXPECT_EQ(display.driver.Surfaces().size(), 1u);
    display.egl->MakeCurrent(nullptr, nullptr);
}

// ---- Destroy ------------------------------------------------------------------------------------

TEST(HybridSurface, DestroyEndsThePbufferThenTheWindowSurface)
{
    OpenDisplay display;
    HybridSurface surface;
    surface.Create();
    const EGLSurface pbuffer = surface.GetActiveSurface()->Get();
    surface.AttachToWindow(display.driver.Window(320, 200));
    const EGLSurface window = surface.GetActiveSurface()->Get();
    display.driver.ForgetCalls();

    surface.Destroy();

    EXPECT_EQ(display.driver.Calls(),
              Sequence({Call("eglDestroySurface", display.egl->GetDisplay(), pbuffer),
                        Call("eglDestroySurface", display.egl->GetDisplay(), window)}));
    EXPECT_EQ(surface.GetActiveSurface(), nullptr);
    EXPECT_FALSE(surface.IsAttachedToWindow());
}

TEST(HybridSurface, DestroyedOneCanBeCreatedAgain)
{
    OpenDisplay display;
    HybridSurface surface;
    surface.Create();
    surface.Destroy();
    surface.Destroy();

    EXPECT_TRUE(surface.Create());

    EXPECT_EQ(display.driver.Surfaces().size(), 1u);
    EXPECT_EQ(display.driver.CallCount("eglDestroySurface"), 1u);
}

TEST(HybridSurface, DestructorDestroysBoth)
{
    OpenDisplay display;
    {
        HybridSurface surface;
        surface.Create();
        surface.AttachToWindow(display.driver.Window(320, 200));
        EXPECT_EQ(display.driver.Surfaces().size(), 2u);
    }

    EXPECT_EQ(display.driver.Surfaces().size(), 0u);
    EXPECT_EQ(display.driver.CallCount("eglDestroySurface"), 2u);
}
