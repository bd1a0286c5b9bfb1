// Render threads that come and go leave nothing behind.

#include "drivers/Driver.h"
#include "drivers/Holdings.h"
#include "drivers/RenderThreadSupport.h"
#include "drivers/ResidentMemory.h"
#include "drivers/XWindow.h"

#include <nib/egl.h>
#include <nib/render_thread.h>

#include <GLES3/gl3.h>

#include <gtest/gtest.h>

#include <memory>

using namespace Nib;

namespace
{

constexpr int kRounds = 200;
constexpr int kRoundsOnSlowDriver = 50;
constexpr int kWarmUpRounds = 20;
constexpr long kFlatKiB = 2048;
constexpr unsigned kHighestName = 4 * kRounds; // every round makes fewer than four of a kind

/// The GL names that earlier surface render threads and their children have left to later ones.
int NamesLeft()
{
    std::unique_ptr<RenderThreadGL> thread(
        GLES::CreateSurfaceRenderer("names", RenderThreadGL::Medium));
    thread->Start();
    int names = -1;
    RunOn(thread->GetMsgQueue(), [&] { names = GlNamesInUse(kHighestName); });
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
    if (!HasPbuffers())
        GTEST_SKIP() << kNoPbuffers;
    ASSERT_EQ(Egl::GetEglStatus(), 0) << "the driver does not start";
    for (int i = 0; i < kWarmUpRounds; ++i)
        round(window);
    const Holdings before;
    const long residentBefore = ResidentKiB();

    const int rounds = DriverIs({"softpipe"}) ? kRoundsOnSlowDriver : kRounds;
    for (int i = kWarmUpRounds; i < rounds; ++i)
        round(window);

    EXPECT_LE(ResidentKiB() - residentBefore, kFlatKiB);
    EXPECT_EQ(Holdings(), before);
    EXPECT_EQ(NamesLeft(), 0);
    EXPECT_EQ(Holdings().contexts, 1); // the one that all surface render threads share with
    EXPECT_EQ(Holdings().surfaces, 0);
}

/// The test would find a name that is left.
TEST(RenderThreadLeaks, ANameThatIsLeftIsSeen)
{
    if (!HasPbuffers())
        GTEST_SKIP() << kNoPbuffers;
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
