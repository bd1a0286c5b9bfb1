// What render threads tell a trace.

#include "gles/CacheFiles.h"
#include "render/ChildThreadSupport.h"
#include "render/HWUITestSupport.h"
#include "TraceCapture.h"

#include <nib/renderer_factory.h>
#include <nib/shader.h>

#include <gtest/gtest.h>

using namespace Nib;

namespace
{

using Texts = std::vector<std::string>;

// ---- frames -------------------------------------------------------------------------------------

TEST(RenderTrace, AFrameTellsItsDirtyAreaAndTheSwapWithModeAndArea)
{
    SimDriver driver(SimGpu::Default().WithPostSubBuffer());
    const ThreadPtr thread = StartedParent();
    thread->OnSurfaceChanged(driver.Window(200, 100), 200, 100, 0);
    const TraceCapture capture;
    thread->ApplyUpdateRect({10, 20, 30, 50}, 0);
    thread->Render();

    EXPECT_EQ(capture.Lane("parent", {"frame"}), Texts({"+frame", "+swap", "-", "-"}));
    const CapturedEvent frame = capture.Find("frame", "frame");
    EXPECT_EQ(frame.Argument("dirty x"), "10");
    EXPECT_EQ(frame.Argument("dirty y"), "50"); // from the bottom
    EXPECT_EQ(frame.Argument("dirty width"), "20");
    EXPECT_EQ(frame.Argument("dirty height"), "30");
    const CapturedEvent swap = capture.Find("frame", "swap");
    EXPECT_EQ(swap.Argument("mode"), "0x81");
    EXPECT_EQ(swap.Argument("x"), "10");
    EXPECT_EQ(swap.Argument("width"), "20");
    EXPECT_EQ(swap.Argument("height"), "30");
}

TEST(RenderTrace, AWholeSwapIsOfTheScreen)
{
    SimDriver driver(SimGpu::Default().WithoutPreservedSwap());
    const ThreadPtr thread = StartedParent();
    thread->OnSurfaceChanged(driver.Window(200, 100), 200, 100, 0);
    const TraceCapture capture;
    thread->Render();
    const CapturedEvent swap = capture.Find("frame", "swap");
    EXPECT_EQ(swap.Argument("mode"), "0x1");
    EXPECT_EQ(swap.Argument("width"), "200");
    EXPECT_EQ(swap.Argument("height"), "100");
}

TEST(RenderTrace, TheCallsOfAFrameAreTheSameWithATrace)
{
    SimDriver driver;
    const ThreadPtr thread = StartedParent();
    thread->OnSurfaceChanged(driver.Window(200, 100), 200, 100, 0);
    const auto frame = [&]
    {
        driver.ForgetCalls();
        driver.ForgetLog();
        thread->ApplyUpdateRect({10, 20, 30, 50}, 0);
        thread->Render();
        return driver.CallTexts();
    };
    frame(); // the first has another buffer
    const Texts without = frame();
    const TraceCapture capture;
    EXPECT_EQ(frame(), without);
}

// ---- contexts -----------------------------------------------------------------------------------

TEST(RenderTrace, TellsTheLossOfAContextAndItsReturn)
{
    SimDriver driver(ChildGpu());
    const ThreadPtr parent = StartedParent();
    const ThreadPtr child(GLES::CreateOffscreenRenderer(parent->GetMsgQueue(), "child", true));
    child->Start();
    child->GetMsgQueue()->waitForCompleting();
    const TraceCapture capture;
    child->OnPause();
    EXPECT_EQ(capture.Lane("child", {"context"}),
              Texts({"+loss", "+release objects", "-", "+destroy", "-", "-"}));
    child->OnResume();
    child->GetMsgQueue()->waitForCompleting();
    const Texts all = capture.Lane("child", {"context"});
    EXPECT_EQ(Texts(all.begin() + 6, all.end()),
              Texts({"+create", "-", "+restore", "+restore objects", "-", "-"}));
}

// ---- inside the UI ------------------------------------------------------------------------------

class HwuiTrace : public HwuiTest
{
};

TEST_F(HwuiTrace, ItsLaneHasItsNameWhileItDraws)
{
    const TraceCapture capture;
    Post(Queue(), [] { Trace::Instant("work", "drawn"); });
    thread->Render();
    Trace::Instant("work", "between");
    EXPECT_EQ(capture.Lane("hwui", {"frame", "work"}), Texts({"+frame", "!drawn", "-"}));
    EXPECT_EQ(capture.Lane("hwui", {"queue"}), Texts({"queue=2"})); // its first task, and ours
    EXPECT_EQ(capture.Lane("-"), Texts({"!between"}));
}

// ---- programs -----------------------------------------------------------------------------------

TEST(RenderTrace, TellsWhetherAProgramIsCompiledOrLoaded)
{
    const CacheFolder cache;
    SimDriver driver;
    const ThreadPtr thread = StartedParent();
    const auto make = []
    {
        RendererFactory::CreateShaderProgram(
            "attribute vec4 a; void main() { gl_Position = a; }",
            "precision mediump float; void main() { gl_FragColor = vec4(1.0); }", nullptr)
            ->Release();
    };
    {
        const TraceCapture capture;
        RunOn(thread->GetMsgQueue(), make);
        EXPECT_EQ(capture.Lane("parent", {"program"}),
                  Texts({"+compile program", "-", "+save program", "-"}));
    }
    const TraceCapture capture;
    RunOn(thread->GetMsgQueue(), make);
    EXPECT_EQ(capture.Lane("parent", {"program"}), Texts({"+load program", "-"}));
    EXPECT_GT(std::stoi(capture.Find("program", "load program").Argument("bytes")), 0);
}

} // namespace
