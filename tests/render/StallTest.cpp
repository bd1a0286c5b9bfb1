// A driver that does not return from a call: one render thread stands still, and nobody else does.

#include "render/HWUITestSupport.h"
#include "render/RenderTestSupport.h"

#include <nib/egl_timing.h>
#include <nib/pipeline_state.h>
#include <nib/renderer_factory.h>

#include <gtest/gtest.h>

#include <cstdlib>

using namespace Nib;

namespace
{

using ThreadPtr = std::unique_ptr<RenderThreadGL>;

/// How long a stall lasts: until the test has seen enough, or as long as NIB_STALL_SECONDS says.
std::chrono::seconds StallTime()
{
    const char* seconds = std::getenv("NIB_STALL_SECONDS");
    return std::chrono::seconds(seconds ? std::atoi(seconds) : 0);
}

/// Calls of one name that one thread makes do not return, until End().
class Stall
{
public:
    Stall(SimDriver& driver, const char* name, unsigned thread)
    {
        driver.OnCall(name,
                      [this, thread]
                      {
                          if (SimDriver::ThisThread() != thread)
                              return;
                          m_entered.Set();
                          m_open.Wait();
                      });
    }
    ~Stall() { End(); }

    void WaitUntilEntered() { m_entered.Wait(); }
    void End()
    {
        if (!m_open.IsSet())
            std::this_thread::sleep_for(StallTime());
        m_open.Set();
    }

private:
    Event m_entered;
    Event m_open;
};

/// One way to run into a stall.
struct StalledBy
{
    const char* call;
    void (*act)(RenderThreadGL& thread, ANativeWindow* window); ///< [blocks]
};

void PrintTo(const StalledBy& stalled, std::ostream* out)
{
    *out << stalled.call;
}

void PresentFrame(RenderThreadGL& thread, ANativeWindow*)
{
    thread.Render();
}

void ChangeWindow(RenderThreadGL& thread, ANativeWindow* window)
{
    thread.OnSurfaceChanged(window, 8, 8, 0);
}

void WaitForGlFence(RenderThreadGL& thread, ANativeWindow*)
{
    RunOn(thread.GetMsgQueue(),
          []
          {
              IFence* fence = RendererFactory::CreateFence();
              fence->Insert();
              EXPECT_EQ(fence->Wait(), IFence::Signaled);
              fence->Release();
          });
}

void WaitForEglSync(RenderThreadGL& thread, ANativeWindow*)
{
    RunOn(thread.GetMsgQueue(),
          []
          {
              const std::unique_ptr<EglSyncObject> sync(EglSyncObject::CreateEglSyncObject());
              ASSERT_NE(sync, nullptr);
              sync->Wait();
          });
}

class StalledThread : public testing::TestWithParam<StalledBy>
{
protected:
    StalledThread()
    {
        stuck = Started("stuck");
        stuckWindow = driver.Window(8, 8);
        stuck->OnSurfaceChanged(stuckWindow, 8, 8, 0);
        const unsigned number = AskOn(stuck->GetMsgQueue(), [] { return SimDriver::ThisThread(); });
        stall.emplace(driver, GetParam().call, number);
        caller = std::thread([this] { GetParam().act(*stuck, stuckWindow); });
        stall->WaitUntilEntered();
    }

    ~StalledThread() override
    {
        stall->End();
        caller.join();
        stuck.reset();
        driver.OnCall(GetParam().call, {});
    }

    static ThreadPtr Started(const char* name)
    {
        ThreadPtr thread(GLES::CreateSurfaceRenderer(name, RenderThreadGL::Medium));
        EXPECT_TRUE(thread->Start());
        return thread;
    }

    SimDriver driver{SimGpu::Default().WithEglExtension("EGL_KHR_fence_sync")};
    ThreadPtr stuck;
    ANativeWindow* stuckWindow = nullptr;
    std::optional<Stall> stall;
    std::thread caller; ///< inside the call that does not return
};

std::string NameOf(const testing::TestParamInfo<StalledBy>& info)
{
    return info.param.call;
}

TEST_P(StalledThread, HoldsUpNoOtherRenderThread)
{
    // From start to end, with a window, a child, a loss of context: every family of calls.
    ThreadPtr other = Started("other");
    ANativeWindow* window = driver.Window(8, 8);
    other->OnSurfaceChanged(window, 8, 8, 0);
    ThreadPtr child(GLES::CreateOffscreenRenderer(other->GetMsgQueue(), "child", true));
    EXPECT_TRUE(child->Start());
    EXPECT_TRUE(child->GetMsgQueue()->waitForCompleting());
    WaitForGlFence(*other, window);
    child->OnPause();
    child->OnResume();
    EXPECT_TRUE(child->GetMsgQueue()->waitForCompleting());
    child.reset();
    other->OnPause();
    other->OnResume();
    const int presented = driver.WindowState(window).presented;
    EXPECT_TRUE(other->Render());
    EXPECT_EQ(driver.WindowState(window).presented, presented + 1);
    other->OnSurfaceDestroyed();
    other.reset();
}

TEST_P(StalledThread, TakesTasksWithoutBlockingAndRunsThemAfterwards)
{
    std::vector<int> ran;
    for (int number = 0; number < 1000; ++number)
        Post(stuck->GetMsgQueue(), [&ran, number] { ran.push_back(number); });
    EXPECT_TRUE(ran.empty()); // the render thread is inside the driver

    stall->End();
    EXPECT_TRUE(stuck->GetMsgQueue()->waitForCompleting());

    ASSERT_EQ(ran.size(), 1000u);
    for (int number = 0; number < 1000; ++number)
        EXPECT_EQ(ran[static_cast<std::size_t>(number)], number);
}

TEST_P(StalledThread, LetsEveryWaitingCallerGoWhenItEnds)
{
    std::atomic<int> entered{0};
    std::atomic<int> returned{0};
    std::vector<std::thread> callers;
    for (int number = 0; number < 6; ++number)
    {
        callers.emplace_back(
            [&, number]
            {
                entered.fetch_add(1);
                if (number % 2 == 0)
                    EXPECT_TRUE(stuck->Render());
                else
                    EXPECT_TRUE(stuck->GetMsgQueue()->waitForCompleting());
                returned.fetch_add(1);
            });
    }
    while (entered.load() < 6)
        std::this_thread::yield();
    EXPECT_EQ(returned.load(), 0);

    stall->End();
    for (std::thread& one : callers)
        one.join();

    EXPECT_EQ(returned.load(), 6);
}

INSTANTIATE_TEST_SUITE_P(Driver, StalledThread,
                         testing::Values(StalledBy{"eglSwapBuffers", &PresentFrame},
                                         StalledBy{"eglMakeCurrent", &ChangeWindow},
                                         StalledBy{"glClientWaitSync", &WaitForGlFence},
                                         StalledBy{"eglClientWaitSyncKHR", &WaitForEglSync}),
                         NameOf);

// ---- inside the draw callback of a UI -----------------------------------------------------------

TEST_F(HwuiTest, AStalledFrameBlocksNoPostAndNoRenderThread)
{
    Post(Queue(),
         []
         {
             IFence* fence = RendererFactory::CreateFence();
             fence->Insert();
             EXPECT_EQ(fence->Wait(), IFence::Signaled);
             fence->Release();
         });
    Stall stall(driver, "glClientWaitSync", SimDriver::ThisThread());
    std::atomic<bool> ranInFrame{false};
    std::thread elsewhere(
        [&]
        {
            stall.WaitUntilEntered();
            for (int number = 0; number < 1000; ++number)
                Post(Queue(), [&ranInFrame] { ranInFrame = true; });
            ThreadPtr other(GLES::CreateSurfaceRenderer("other", RenderThreadGL::Medium));
            EXPECT_TRUE(other->Start());
            EXPECT_TRUE(other->Render());
            other.reset();
            EXPECT_FALSE(ranInFrame.load());
            stall.End();
        });
    thread->Render(); // the test's thread is the UI's
    elsewhere.join();
    EXPECT_FALSE(ranInFrame.load()); // posted during the frame: in the next one
    thread->Render();
    EXPECT_TRUE(ranInFrame.load());
    driver.OnCall("glClientWaitSync", {});
}

} // namespace
