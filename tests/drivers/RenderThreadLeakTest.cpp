// Render threads that come and go leave nothing behind.

#include "drivers/RenderThreadSupport.h"
#include "drivers/ResidentMemory.h"
#include "drivers/XWindow.h"

#include <nib/egl.h>
#include <nib/render_thread.h>

#include <EGL/egl.h>
#include <GLES3/gl3.h>

#include <dlfcn.h>
#include <gtest/gtest.h>

#include <atomic>
#include <filesystem>
#include <fstream>
#include <memory>
#include <ostream>
#include <string>

using namespace Nib;

namespace
{

std::atomic<int> s_contexts{0};
std::atomic<int> s_surfaces{0};

template <typename Function>
Function* Real(const char* name)
{
    return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}

} // namespace

// In front of the driver's, to count what is alive.
extern "C"
{
    __attribute__((visibility("default"))) EGLContext eglCreateContext(EGLDisplay display,
                                                                       EGLConfig config,
                                                                       EGLContext share,
                                                                       const EGLint* attributes)
    {
        static auto* const real = Real<decltype(eglCreateContext)>("eglCreateContext");
        const EGLContext context = real(display, config, share, attributes);
        s_contexts += context != EGL_NO_CONTEXT ? 1 : 0;
        return context;
    }

    __attribute__((visibility("default"))) EGLBoolean eglDestroyContext(EGLDisplay display,
                                                                        EGLContext context)
    {
        static auto* const real = Real<decltype(eglDestroyContext)>("eglDestroyContext");
        const EGLBoolean destroyed = real(display, context);
        s_contexts -= destroyed == EGL_TRUE ? 1 : 0;
        return destroyed;
    }

    __attribute__((visibility("default"))) EGLSurface
    eglCreatePbufferSurface(EGLDisplay display, EGLConfig config, const EGLint* attributes)
    {
        static auto* const real =
            Real<decltype(eglCreatePbufferSurface)>("eglCreatePbufferSurface");
        const EGLSurface surface = real(display, config, attributes);
        s_surfaces += surface != EGL_NO_SURFACE ? 1 : 0;
        return surface;
    }

    __attribute__((visibility("default"))) EGLSurface
    eglCreateWindowSurface(EGLDisplay display, EGLConfig config, EGLNativeWindowType window,
                           const EGLint* attributes)
    {
        static auto* const real = Real<decltype(eglCreateWindowSurface)>("eglCreateWindowSurface");
        const EGLSurface surface = real(display, config, window, attributes);
        s_surfaces += surface != EGL_NO_SURFACE ? 1 : 0;
        return surface;
    }

    __attribute__((visibility("default"))) EGLBoolean eglDestroySurface(EGLDisplay display,
                                                                        EGLSurface surface)
    {
        static auto* const real = Real<decltype(eglDestroySurface)>("eglDestroySurface");
        const EGLBoolean destroyed = real(display, surface);
        s_surfaces -= destroyed == EGL_TRUE ? 1 : 0;
        return destroyed;
    }
}

namespace
{

constexpr int kRounds = 200;
constexpr int kWarmUpRounds = 20;
constexpr long kFlatKiB = 2048;

int CountIn(const char* folder)
{
    int count = 0;
    for ([[maybe_unused]] const auto& entry : std::filesystem::directory_iterator(folder))
        ++count;
    return count;
}

/// What a process holds that a leak would add to.
struct Holdings
{
    int contexts = s_contexts;
    int surfaces = s_surfaces;
    int threads = CountIn("/proc/self/task");
    int files = CountIn("/proc/self/fd");
};

std::ostream& operator<<(std::ostream& out, const Holdings& held)
{
    return out << held.contexts << " contexts, " << held.surfaces << " surfaces, " << held.threads
               << " threads, " << held.files << " files";
}

bool operator==(const Holdings& a, const Holdings& b)
{
    return a.contexts == b.contexts && a.surfaces == b.surfaces && a.threads == b.threads &&
           a.files == b.files;
}

/// The GL names in use in the share group of the calling thread.
int CountNames()
{
    constexpr GLuint kHighest = 4 * kRounds; // every round makes fewer than four of a kind
    int count = 0;
    for (GLuint name = 1; name <= kHighest; ++name)
    {
        count += glIsTexture(name) + glIsBuffer(name) + glIsRenderbuffer(name) + glIsSampler(name) +
                 glIsProgram(name) + glIsShader(name);
    }
    return count;
}

/// The GL names that earlier surface render threads and their children have left to later ones.
int NamesLeft()
{
    std::unique_ptr<RenderThreadGL> thread(
        GLES::CreateSurfaceRenderer("names", RenderThreadGL::Medium));
    thread->Start();
    int names = -1;
    RunOn(thread->GetMsgQueue(), [&] { names = CountNames(); });
    return names;
}

/// Draws into a texture and onto the surface, and deletes what it made.
void Draw()
{
    GLuint texture = 0;
    GLuint framebuffer = 0;
    glGenTextures(1, &texture);
    glBindTexture(GL_TEXTURE_2D, texture);
    glTexImage2D(GL_TEXTURE_2D, 0, GL_RGBA, 64, 64, 0, GL_RGBA, GL_UNSIGNED_BYTE, nullptr);
    glGenFramebuffers(1, &framebuffer);
    glBindFramebuffer(GL_FRAMEBUFFER, framebuffer);
    glFramebufferTexture2D(GL_FRAMEBUFFER, GL_COLOR_ATTACHMENT0, GL_TEXTURE_2D, texture, 0);
    glClear(GL_COLOR_BUFFER_BIT);
    glBindFramebuffer(GL_FRAMEBUFFER, 0);
    glClear(GL_COLOR_BUFFER_BIT);
    glDeleteFramebuffers(1, &framebuffer);
    glDeleteTextures(1, &texture);
}

void RunSurfaceThread(XWindow* window)
{
    std::unique_ptr<RenderThreadGL> thread(
        GLES::CreateSurfaceRenderer("round", RenderThreadGL::Medium));
    thread->Start();
    if (window != nullptr)
        thread->OnSurfaceChanged(window->Native(), 64, 64, 0);
    RunOn(thread->GetMsgQueue(), &Draw);
    thread->Render();
    thread->OnSurfaceDestroyed();
}

void RunFamily(XWindow* window)
{
    std::unique_ptr<RenderThreadGL> parent(
        GLES::CreateSurfaceRenderer("parent", RenderThreadGL::Medium));
    parent->Start();
    if (window != nullptr)
        parent->OnSurfaceChanged(window->Native(), 64, 64, 0);
    std::unique_ptr<RenderThreadGL> child(
        GLES::CreateOffscreenRenderer(parent->GetMsgQueue(), "child", true));
    child->Start();
    RunOn(child->GetMsgQueue(), &Draw);
    child->OnPause();
    child->OnResume();
    RunOn(child->GetMsgQueue(), &Draw);
    parent->Render();
    child.reset();
}

void ExpectNothingLeft(void (*round)(XWindow*), XWindow* window)
{
    ASSERT_EQ(Egl::GetEglStatus(), 0) << "the driver does not start";
    for (int i = 0; i < kWarmUpRounds; ++i)
        round(window);
    const Holdings before;
    const long residentBefore = ResidentKiB();

    for (int i = kWarmUpRounds; i < kRounds; ++i)
        round(window);

    EXPECT_LE(ResidentKiB() - residentBefore, kFlatKiB);
    EXPECT_EQ(Holdings(), before);
    EXPECT_EQ(NamesLeft(), 0);
    EXPECT_EQ(s_contexts, 1); // the one that all surface render threads share with
    EXPECT_EQ(s_surfaces, 0);
}

/// The test would find a name that is left.
TEST(RenderThreadLeaks, ANameThatIsLeftIsSeen)
{
    ASSERT_EQ(Egl::GetEglStatus(), 0) << "the driver does not start";
    std::unique_ptr<RenderThreadGL> thread(
        GLES::CreateSurfaceRenderer("leaks", RenderThreadGL::Medium));
    thread->Start();
    RunOn(thread->GetMsgQueue(),
          []
          {
              GLuint texture = 0;
              glGenTextures(1, &texture);
              glBindTexture(GL_TEXTURE_2D, texture);
              glCreateProgram();
          });
    thread.reset();

    EXPECT_EQ(NamesLeft(), 2);
}

TEST(RenderThreadLeaks, SurfaceThreadsWithoutAWindowLeaveNothing)
{
    ExpectNothingLeft(&RunSurfaceThread, nullptr);
}

TEST(RenderThreadLeaks, SurfaceThreadsWithAWindowLeaveNothing)
{
    if (!HasXServer())
        GTEST_SKIP() << "there is no X server";
    XWindow window(64, 64);

    ExpectNothingLeft(&RunSurfaceThread, &window);
}

TEST(RenderThreadLeaks, ChildrenThatPauseLeaveNothing)
{
    ExpectNothingLeft(&RunFamily, nullptr);
}

TEST(RenderThreadLeaks, ChildrenThatPauseBesideAWindowLeaveNothing)
{
    if (!HasXServer())
        GTEST_SKIP() << "there is no X server";
    XWindow window(64, 64);

    ExpectNothingLeft(&RunFamily, &window);
}

} // namespace
