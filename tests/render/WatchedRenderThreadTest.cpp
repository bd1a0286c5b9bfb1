// What the watchdog tells of render threads. The limit is a millisecond and the driver is held, so
// that each line comes for certain.

#include "render/HWUITestSupport.h"
#include "render/RenderTestSupport.h"

#include <nib/watchdog.h>

#include <gtest/gtest.h>

using namespace Nib;

namespace
{

constexpr int kShortest = 1;           // ms
constexpr int kDay = 24 * 3600 * 1000; // ms

void AwaitWarning(const SimDriver& driver, const std::string& part)
{
    while (LinesWith(driver, part).empty())
        std::this_thread::yield();
}

bool HasWarning(const SimDriver& driver, const std::string& begin, const std::string& end)
{
    for (const std::string& line : LinesWith(driver, end))
    {
        if (line.find(begin) == 0)
            return true;
    }
    return false;
}

TEST(WatchedRenderThread, ASwapThatDoesNotReturnIsToldWithItsThreadAndTask)
{
    SimDriver driver;
    const std::unique_ptr<RenderThreadGL> thread(
        GLES::CreateSurfaceRenderer("canvas", RenderThreadGL::Medium));
    ASSERT_TRUE(thread->Start());
    thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, 0);
    Watchdog::SetLimit(kDay);
    driver.Hold("eglSwapBuffers");
    std::thread caller([&] { EXPECT_TRUE(thread->Render()); });
    driver.WaitUntilHeld("eglSwapBuffers");
    Watchdog::SetLimit(kShortest);
    const std::string frame = "Nib::WorkerTask::Member0<Nib::GLES::RenderThreadGLImpl, void "
                              "(Nib::GLES::RenderThreadGLImpl::*)()>";

    AwaitWarning(driver, " to run " + frame + "; it has been running ");
    AwaitWarning(driver, ") has been running " + frame + " for "); // not the end of the line above
    driver.Release("eglSwapBuffers");
    caller.join();

    EXPECT_TRUE(HasWarning(driver, "W Watchdog: thread ", " to run " + frame + "; it has been"));
    EXPECT_TRUE(HasWarning(driver, "W Watchdog: 'canvas' (thread ", "has been running " + frame));
}

TEST(WatchedRenderThread, ADriverThatReturnsLeavesTheLogAsItIs)
{
    SimDriver driver;
    Watchdog::SetLimit(kDay);
    std::unique_ptr<RenderThreadGL> thread(
        GLES::CreateSurfaceRenderer("canvas", RenderThreadGL::Medium));
    ASSERT_TRUE(thread->Start());
    thread->OnSurfaceChanged(driver.Window(8, 8), 8, 8, 0);
    thread->Render();
    thread->OnPause();
    thread->OnResume();
    thread->GetMsgQueue()->waitForCompleting();
    thread.reset();
    EXPECT_EQ(driver.CountLogContaining("Watchdog"), 0u);
}

TEST_F(HwuiTest, AFrameThatDoesNotComeIsTold)
{
    thread->Render(); // so that the test's thread is known as the UI's
    Watchdog::SetLimit(kShortest);
    std::thread caller([&] { EXPECT_TRUE(Queue()->waitForCompleting()); });
    AwaitWarning(driver, "to draw its next frame");
    EXPECT_TRUE(HasWarning(driver, "W Watchdog: thread ", " to draw its next frame"));
    EXPECT_EQ(driver.CountLogContaining("for 'hwui' (thread "), 1u);
    while (requests.load() == 0)
        std::this_thread::yield();
    thread->Render();
    caller.join();
}

TEST_F(HwuiTest, ASafeLockThatIsNotLeftIsTold)
{
    Watchdog::SetLimit(kShortest);
    thread->Lock(false);
    std::thread other(
        [&]
        {
            thread->Lock(false);
            thread->Unlock();
        });
    AwaitWarning(driver, "for 'hwui' to leave its safe lock");
    thread->Unlock();
    other.join();
}

} // namespace
