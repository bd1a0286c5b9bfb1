#include "sim/SimDriver.h"

#include <nib/nib.h>

#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <stdexcept>

// What a driver that refuses once must not bring down. Each was found by the sweep.

using namespace Nib;

namespace
{

using ThreadPtr = std::unique_ptr<RenderThreadGL>;

class CallTask : public ITask
{
public:
    explicit CallTask(std::function<void()> call) : m_call(std::move(call)) {}
    void run() override { m_call(); }

private:
    std::function<void()> m_call;
};

/// An object of the application's own that cannot be restored.
class Unrestorable : public ManagedObject
{
public:
    void ReleaseGLObject() override {}
    void RestoreGLObject() override { throw std::runtime_error("no memory"); }
};

void RunOn(RenderThreadGL& thread, std::function<void()> call)
{
    thread.GetMsgQueue()->enQueueMsg(new CallTask(std::move(call)));
    ASSERT_TRUE(thread.GetMsgQueue()->waitForCompleting());
}

} // namespace

TEST(RefusedDriver, WithoutADisplayAWindowAndAFrameDoNothing)
{
    SimDriver driver;
    driver.AllowMisuse();
    driver.FailNext("eglInitialize", EGL_NOT_INITIALIZED, SimDriver::kAlways);
    const ThreadPtr thread(GLES::CreateSurfaceRenderer("surface", RenderThreadGL::Medium));
    EXPECT_TRUE(thread->Start());

    thread->OnSurfaceChanged(driver.Window(40, 60), 40, 60, 1);
    thread->ApplyUpdateRect(RectF{0, 0, 40, 60}, 0);
    EXPECT_TRUE(thread->Render());
    thread->OnSurfaceDestroyed();

    EXPECT_EQ(driver.CallCount("eglSwapBuffers"), 0u);
    EXPECT_GT(driver.CountLogContaining("Failed to create context"), 0u);
}

TEST(RefusedDriver, WithoutASurfaceAnUpdateRectangleOnlyTakesTheSize)
{
    SimDriver driver(SimGpu::Named("Mali-G72"));
    UpdateRectangle rectangle;

    rectangle.Init(nullptr, 40, 60);
    rectangle.UseRect(RectF{0, 0, 10, 10}, 0);

    EXPECT_EQ(rectangle.GetUpdateMode(), 0u); // still to be decided
    EXPECT_EQ(rectangle.GetScreenWidth(), 40);
    EXPECT_EQ(rectangle.GetScreenHeight(), 60);
}

TEST(RefusedDriver, ARenderThreadOutlivesAnObjectThatCannotBeRestored)
{
    SimDriver driver(SimGpu::Default().WithFrontBuffer());
    const ThreadPtr parent(GLES::CreateSurfaceRenderer("parent", RenderThreadGL::Medium));
    parent->Start();
    ThreadPtr child(GLES::CreateOffscreenRenderer(parent->GetMsgQueue(), "child", true));
    child->Start();
    Unrestorable broken;
    RunOn(*child, [&] { broken.Register(); });

    child->OnPause();
    child->OnResume();

    bool isAlive = false;
    RunOn(*child,
          [&]
          {
              isAlive = true;
              broken.Unregister();
          });
    EXPECT_TRUE(isAlive);
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_ERROR),
              (std::vector<std::string>{
                  "void Nib::GLES::RenderThreadOffscreenGLImpl::DoResume() An object is not "
                  "restored: no memory"}));
    child.reset();
}

TEST(RefusedDriver, AProgramThatCannotBeRestoredIsBuiltWhenItIsUsed)
{
    SimDriver driver(SimGpu::Default().WithFrontBuffer().WithoutProgramBinaries());
    const ThreadPtr parent(GLES::CreateSurfaceRenderer("parent", RenderThreadGL::Medium));
    parent->Start();
    ThreadPtr child(GLES::CreateOffscreenRenderer(parent->GetMsgQueue(), "child", true));
    child->Start();
    IShaderProgram* program = nullptr;
    RunOn(*child,
          [&]
          {
              program = RendererFactory::CreateShaderProgram(
                  "attribute vec2 a_pos;\nvoid main() { gl_Position = vec4(a_pos, 0, 1); }\n",
                  "void main() { gl_FragColor = vec4(1); }\n", nullptr);
          });
    child->OnPause();
    driver.FailNext("glCreateShader", GL_OUT_OF_MEMORY);
    driver.AllowMisuse(); // shader 0
    child->OnResume();

    unsigned used = 0;
    RunOn(*child,
          [&]
          {
              program->Activate();
              used = static_cast<unsigned>(driver.LastCall("glUseProgram").Arg(0));
              program->Deactivate();
              program->Release();
          });
    EXPECT_NE(used, 0u);
    EXPECT_NE(used, 0xFFFFFFFFu);
    EXPECT_EQ(driver.CountLogContaining("An object is not restored: OpenGLRenderer::createShader: "
                                        "failed to compile vertex shader."),
              1u);
    child.reset();
}
