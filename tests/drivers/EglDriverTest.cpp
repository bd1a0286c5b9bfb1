// The display, contexts and surfaces on real drivers, which lack some of what devices have.

#include "drivers/EglOnDriver.h"

#include <nib/base.h>
#include <nib/device.h>

#include <memory>
#include <string>
#include <thread>

using namespace Nib;

namespace
{

EGLint Attribute(EGLConfig config, EGLint name)
{
    EGLint value = -1;
    eglGetConfigAttrib(Egl::GetInstance()->GetDisplay(), config, name, &value);
    return value;
}

EGLint QueryContext(const EglContext& context, EGLint name)
{
    EGLint value = -1;
    eglQueryContext(Egl::GetInstance()->GetDisplay(), context.Get(), name, &value);
    return value;
}

/// What @p function writes to standard error.
template <typename Function>
std::string Written(Function function)
{
    testing::internal::CaptureStderr();
    function();
    return testing::internal::GetCapturedStderr();
}

bool Contains(const std::string& text, const char* part)
{
    return text.find(part) != std::string::npos;
}

/// Whether one configuration serves windows and pbuffers.
bool HasConfigForBoth()
{
    return HasConfigFor(EGL_WINDOW_BIT | EGL_PBUFFER_BIT);
}

constexpr const char* kPbufferLine =
    "bool Nib::Egl::FindConfig(bool, EGLConfig *): no configuration for windows, looking for one "
    "for pbuffers\n";
constexpr const char* kFrontBufferLine =
    "bool Nib::Egl::Init(): the ordinary configuration stands for the front-buffer one\n";

TEST_F(EglOnDriver, DisplayOpens)
{
    EXPECT_EQ(Egl::GetEglStatus(), 0);
    EXPECT_NE(Egl::GetInstance()->GetDisplay(), EGL_NO_DISPLAY);
    EXPECT_TRUE(Egl::GetInstance()->IsEglExtensionSupported("EGL_KHR_fence_sync"));
    EXPECT_FALSE(Egl::GetInstance()->IsEglExtensionSupported("EGL_KHR_mutable_render_buffer"));
}

TEST(EglWithoutPbuffers, NoConfigurationIsFoundAndNothingIsMade)
{
    if (HasPbuffers())
        GTEST_SKIP() << "this display has pbuffers";
    EglContext context;
    HybridSurface surface;

    EXPECT_EQ(Egl::GetInstance()->GetConfig(false), nullptr);
    EXPECT_FALSE(context.Create(EGL_NO_CONTEXT, false, EglContext::Priority::Medium));
    EXPECT_FALSE(surface.Create());
    EXPECT_EQ(SharedContext::GetInstance()->Get(), EGL_NO_CONTEXT);
}

TEST_F(EglOnDriver, ConfigurationHasEightBitsOfEachAndNothingElse)
{
    const EGLConfig config = Egl::GetInstance()->GetConfig(false);
    ASSERT_NE(config, nullptr);

    EXPECT_EQ(Attribute(config, EGL_RED_SIZE), 8);
    EXPECT_EQ(Attribute(config, EGL_GREEN_SIZE), 8);
    EXPECT_EQ(Attribute(config, EGL_BLUE_SIZE), 8);
    EXPECT_EQ(Attribute(config, EGL_ALPHA_SIZE), 8);
    EXPECT_EQ(Attribute(config, EGL_DEPTH_SIZE), 0);
    EXPECT_EQ(Attribute(config, EGL_STENCIL_SIZE), 0);
}

TEST_F(EglOnDriver, ConfigurationIsForPbuffersAndWhereTheyAreForWindows)
{
    const EGLConfig config = Egl::GetInstance()->GetConfig(false);

    const EGLint expected = HasConfigForBoth() ? EGL_PBUFFER_BIT | EGL_WINDOW_BIT : EGL_PBUFFER_BIT;
    EXPECT_EQ(Attribute(config, EGL_SURFACE_TYPE) & (EGL_PBUFFER_BIT | EGL_WINDOW_BIT), expected);
}

TEST_F(EglOnDriver, OrdinaryConfigurationStandsForTheFrontBuffer)
{
    const Egl* egl = Egl::GetInstance();

    EXPECT_EQ(egl->GetConfig(true), egl->GetConfig(false));
    EXPECT_FALSE(egl->HasFrontBufferConfig());
    EXPECT_FALSE(IsFBRSupported());
}

TEST_F(EglOnDriver, EachFallbackIsALine)
{
    setenv("NIB_LOG", "info", 1);

    const std::string written = Written([] { Egl::GetInstance(); });

    EXPECT_EQ(Contains(written, kPbufferLine), !HasConfigForBoth());
    EXPECT_TRUE(Contains(written, kFrontBufferLine));
}

TEST_F(EglOnDriver, WithoutFallbacksNothingStandsForAnything)
{
    System::SetDesktopFallbacks(false);
    setenv("NIB_LOG", "info", 1);

    const std::string written = Written([] { Egl::GetInstance(); });

    EXPECT_EQ(Egl::GetInstance()->GetConfig(false) != nullptr, HasConfigForBoth());
    EXPECT_EQ(Egl::GetInstance()->GetConfig(true), nullptr);
    EXPECT_FALSE(Contains(written, kPbufferLine));
    EXPECT_FALSE(Contains(written, kFrontBufferLine));
    EXPECT_EQ(Contains(written, "No configArray match configSpec"), !HasConfigForBoth());
}

// ---- contexts -----------------------------------------------------------------------------------

TEST_F(EglOnDriver, ContextDrawsIntoThePbuffer)
{
    EglContext context;
    HybridSurface surface;
    ASSERT_NO_FATAL_FAILURE(MakeReady(context, surface));

    Clear(1.0f, 0.0f, 1.0f, 1.0f);

    EXPECT_EQ(PixelAt(0, 0), (Rgba{255, 0, 255, 255}));
    EXPECT_EQ(QueryContext(context, EGL_CONTEXT_CLIENT_VERSION), 3);
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
}

TEST_F(EglOnDriver, FrontBufferContextDrawsToo)
{
    EglContext context;
    HybridSurface surface;
    ASSERT_TRUE(context.Create(EGL_NO_CONTEXT, true, EglContext::Priority::High));
    ASSERT_TRUE(surface.Create());
    ASSERT_TRUE(Egl::GetInstance()->MakeCurrent(&context, surface.GetActiveSurface()));

    Clear(0.0f, 1.0f, 0.0f, 1.0f);

    EXPECT_EQ(PixelAt(0, 0), (Rgba{0, 255, 0, 255}));
}

TEST_F(EglOnDriver, ContextTakesTheVersionOfItsShareContext)
{
    const Egl* egl = Egl::GetInstance();
    const EGLint two[] = {EGL_CONTEXT_CLIENT_VERSION, 2, EGL_NONE};
    const EGLContext share =
        eglCreateContext(egl->GetDisplay(), egl->GetConfig(false), EGL_NO_CONTEXT, two);
    ASSERT_NE(share, EGL_NO_CONTEXT);
    EglContext context;

    EXPECT_TRUE(context.Create(share, false, EglContext::Priority::Low));

    EGLint version = 0;
    eglQueryContext(egl->GetDisplay(), share, EGL_CONTEXT_CLIENT_VERSION, &version);
    EXPECT_EQ(QueryContext(context, EGL_CONTEXT_CLIENT_VERSION), version);
    eglDestroyContext(egl->GetDisplay(), share);
}

TEST_F(EglOnDriver, ContextsThatShareSeeTheSameTextures)
{
    EglContext* shared = SharedContext::GetInstance();
    ASSERT_NE(shared->Get(), EGL_NO_CONTEXT);
    GLuint texture = 0;
    std::thread maker(
        [&]
        {
            EglContext context;
            HybridSurface surface;
            ASSERT_TRUE(context.Create(shared->Get(), false, EglContext::Priority::Medium));
            ASSERT_TRUE(surface.Create());
            Egl::GetInstance()->MakeCurrent(&context, surface.GetActiveSurface());
            glGenTextures(1, &texture);
            glBindTexture(GL_TEXTURE_2D, texture);
            glFinish();
            Egl::GetInstance()->MakeCurrent(nullptr, nullptr);
        });
    maker.join();
    EglContext context;
    HybridSurface surface;
    ASSERT_TRUE(context.Create(shared->Get(), false, EglContext::Priority::Medium));
    ASSERT_TRUE(surface.Create());
    ASSERT_TRUE(Egl::GetInstance()->MakeCurrent(&context, surface.GetActiveSurface()));

    EXPECT_EQ(glIsTexture(texture), GLboolean{GL_TRUE});

    glDeleteTextures(1, &texture);
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
}

TEST_F(EglOnDriver, ContextsApartSeeNothingOfEachOther)
{
    EglContext first;
    HybridSurface firstSurface;
    ASSERT_NO_FATAL_FAILURE(MakeReady(first, firstSurface));
    GLuint texture = 0;
    glGenTextures(1, &texture);
    glBindTexture(GL_TEXTURE_2D, texture);
    EglContext second;
    HybridSurface secondSurface;
    ASSERT_NO_FATAL_FAILURE(MakeReady(second, secondSurface));

    EXPECT_EQ(glIsTexture(texture), GLboolean{GL_FALSE});
}

TEST_F(EglOnDriver, DestroyedContextIsMadeAgain)
{
    EglContext context;
    HybridSurface surface;
    for (int i = 0; i < 3; ++i)
    {
        ASSERT_NO_FATAL_FAILURE(MakeReady(context, surface));
        Clear(0.0f, 0.0f, 1.0f, 1.0f);
        EXPECT_EQ(PixelAt(0, 0), (Rgba{0, 0, 255, 255}));
        EXPECT_TRUE(Egl::GetInstance()->MakeCurrent(nullptr, nullptr));
        context.Destroy();
        surface.Destroy();
        EXPECT_EQ(context.Get(), EGL_NO_CONTEXT);
    }
}

TEST_F(EglOnDriver, ReleasedThreadHasNoContext)
{
    EglContext context;
    HybridSurface surface;
    ASSERT_NO_FATAL_FAILURE(MakeReady(context, surface));

    EXPECT_TRUE(Egl::GetInstance()->MakeCurrent(nullptr, nullptr));

    EXPECT_EQ(eglGetCurrentContext(), EGL_NO_CONTEXT);
    EXPECT_EQ(eglGetCurrentSurface(EGL_DRAW), EGL_NO_SURFACE);
}

TEST_F(EglOnDriver, ContextThatIsCurrentElsewhereIsRefused)
{
    if (DriverIs({"swiftshader"}))
        GTEST_SKIP() << "this driver lets a context be current on two threads";
    EglContext context;
    HybridSurface surface;
    ASSERT_NO_FATAL_FAILURE(MakeReady(context, surface));
    HybridSurface other;
    ASSERT_TRUE(other.Create());
    bool current = true;

    std::thread thread(
        [&] { current = Egl::GetInstance()->MakeCurrent(&context, other.GetActiveSurface()); });
    thread.join();

    EXPECT_FALSE(current);
}

// ---- surfaces -----------------------------------------------------------------------------------

TEST_F(EglOnDriver, PbufferTakesItsHeightFirst)
{
    const std::unique_ptr<EglSurface> surface(Egl::GetInstance()->CreateOffscreenSurface(640, 480));
    ASSERT_NE(surface, nullptr);

    EXPECT_EQ(surface->GetWidth(), 480);
    EXPECT_EQ(surface->GetHeight(), 640);
}

TEST_F(EglOnDriver, DestroyedSurfaceHasNoSize)
{
    const std::unique_ptr<EglSurface> surface(Egl::GetInstance()->CreateOffscreenSurface(1, 1));
    ASSERT_NE(surface, nullptr);

    surface->Destroy();

    EXPECT_FALSE(surface->IsCreated());
    EXPECT_EQ(surface->GetWidth(), -1);
    EXPECT_EQ(surface->GetHeight(), -1);
}

TEST_F(EglOnDriver, SingleBufferIsRefused)
{
    // A pbuffer or a window on these drivers never shows its front buffer.
    HybridSurface surface;
    ASSERT_TRUE(surface.Create());

    EXPECT_FALSE(surface.GetActiveSurface()->SetAttribute(EGL_RENDER_BUFFER, EGL_SINGLE_BUFFER));
}

TEST_F(EglOnDriver, UnknownAttributeLeavesTheValue)
{
    HybridSurface surface;
    ASSERT_TRUE(surface.Create());
    int value = 17;

    EXPECT_FALSE(surface.GetActiveSurface()->QueryAttribute(0x7FFF, &value));

    EXPECT_EQ(value, 17);
    EXPECT_TRUE(surface.GetActiveSurface()->QueryAttribute(EGL_WIDTH, nullptr));
}

TEST_F(EglOnDriver, WithoutWindowsNoneIsAttached)
{
    if (HasXServer())
        GTEST_SKIP() << "this display has windows";
    if (DriverIs({"angle"}))
        GTEST_SKIP() << "this driver takes anything for a window, and shows none";
    EglContext context;
    HybridSurface surface;
    ASSERT_NO_FATAL_FAILURE(MakeReady(context, surface));

    EXPECT_FALSE(surface.AttachToWindow(nullptr));

    EXPECT_FALSE(surface.IsAttachedToWindow());
    EXPECT_EQ(surface.GetWidth(), 1);
    Clear(1.0f, 1.0f, 1.0f, 1.0f);
    EXPECT_EQ(PixelAt(0, 0), (Rgba{255, 255, 255, 255}));
}

// ---- windows ------------------------------------------------------------------------------------

class WindowOnDriver : public EglOnDriver
{
protected:
    void SetUp() override
    {
        if (!HasXServer())
            GTEST_SKIP() << "this display has no windows";
        ASSERT_NO_FATAL_FAILURE(MakeReady(m_context, m_surface));
    }

    void Attach(XWindow& window)
    {
        ASSERT_TRUE(m_surface.AttachToWindow(window.Native()));
        MakeCurrent();
    }

    void MakeCurrent()
    {
        ASSERT_TRUE(Egl::GetInstance()->MakeCurrent(&m_context, m_surface.GetActiveSurface()));
    }

    /// Two frames, because softpipe shows one that is only a clear with the next.
    void Present(float r, float g, float b)
    {
        for (int i = 0; i < 2; ++i)
        {
            Clear(r, g, b, 1.0f);
            EXPECT_TRUE(m_surface.GetActiveSurface()->SwapBuffers());
        }
    }

    EglContext m_context;
    HybridSurface m_surface;
};

TEST_F(WindowOnDriver, HasItsSizeWhileAttached)
{
    XWindow window(80, 60);
    EXPECT_EQ(m_surface.GetWidth(), 1);

    ASSERT_NO_FATAL_FAILURE(Attach(window));
    EXPECT_TRUE(m_surface.IsAttachedToWindow());
    EXPECT_EQ(m_surface.GetWidth(), 80);
    EXPECT_EQ(m_surface.GetHeight(), 60);

    EXPECT_TRUE(m_surface.DetachFromWindow());
    EXPECT_EQ(m_surface.GetWidth(), 1);
    EXPECT_EQ(m_surface.GetHeight(), 1);
    MakeCurrent();
}

TEST_F(WindowOnDriver, ShowsWhatWasSwapped)
{
    XWindow window(80, 60);
    ASSERT_NO_FATAL_FAILURE(Attach(window));

    Present(1.0f, 0.5f, 0.0f);

    EXPECT_TRUE(Near(window.AtOnceNear(40, 30, {255, 128, 0}), {255, 128, 0}));
}

TEST_F(WindowOnDriver, PbufferIsStillThereAfterwards)
{
    Clear(0.0f, 1.0f, 0.0f, 1.0f);
    {
        XWindow window(80, 60);
        ASSERT_NO_FATAL_FAILURE(Attach(window));
        Clear(1.0f, 0.0f, 0.0f, 1.0f);
        m_surface.GetActiveSurface()->SwapBuffers();
        Egl::GetInstance()->MakeCurrent(nullptr, nullptr);
        m_surface.DetachFromWindow();
    }
    MakeCurrent();

    EXPECT_EQ(PixelAt(0, 0), (Rgba{0, 255, 0, 255}));
}

TEST_F(WindowOnDriver, AnotherWindowTakesItsPlace)
{
    XWindow first(80, 60);
    XWindow second(40, 30);
    ASSERT_NO_FATAL_FAILURE(Attach(first));

    ASSERT_NO_FATAL_FAILURE(Attach(second));

    EXPECT_EQ(m_surface.GetWidth(), 40);
    Present(0.0f, 0.0f, 1.0f);
    EXPECT_TRUE(Near(second.AtOnceNear(20, 15, {0, 0, 255}), {0, 0, 255}));
}

TEST_F(WindowOnDriver, SameWindowIsAttachedAgain)
{
    XWindow window(80, 60);
    for (int i = 0; i < 3; ++i)
        ASSERT_NO_FATAL_FAILURE(Attach(window));

    EXPECT_EQ(m_surface.GetHeight(), 60);
}

TEST_F(WindowOnDriver, NullWindowLeavesThePbuffer)
{
    // Not the number of a window that is gone: Mesa does not survive that.
    XWindow window(80, 60);
    ASSERT_NO_FATAL_FAILURE(Attach(window));
    Egl::GetInstance()->MakeCurrent(nullptr, nullptr);

    EXPECT_FALSE(m_surface.AttachToWindow(nullptr));

    EXPECT_FALSE(m_surface.IsAttachedToWindow());
    EXPECT_EQ(m_surface.GetWidth(), 1);
    MakeCurrent();
    Clear(1.0f, 0.0f, 0.0f, 1.0f);
    EXPECT_EQ(PixelAt(0, 0), (Rgba{255, 0, 0, 255}));
}

TEST_F(WindowOnDriver, ContentIsPreservedWhereTheConfigurationSaysSo)
{
    XWindow window(80, 60);
    ASSERT_NO_FATAL_FAILURE(Attach(window));
    EglSurface* surface = m_surface.GetActiveSurface();

    EXPECT_EQ(surface->SetAttribute(EGL_SWAP_BEHAVIOR, EGL_BUFFER_PRESERVED), CanPreserve());

    int behaviour = 0;
    EXPECT_TRUE(surface->QueryAttribute(EGL_SWAP_BEHAVIOR, &behaviour));
    EXPECT_EQ(behaviour, CanPreserve() ? EGL_BUFFER_PRESERVED : EGL_BUFFER_DESTROYED);
}

} // namespace
