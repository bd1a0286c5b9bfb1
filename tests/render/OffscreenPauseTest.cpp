// The offscreen render thread: pause and resume.

#include "render/SurfaceThreadSupport.h"

#include <nib/base.h>
#include <nib/shader_manager.h>

using namespace Nib;

namespace
{

using ThreadPtr = std::unique_ptr<RenderThreadGL>;

SimGpu Gpu()
{
    // Two configurations: what the first one lacks is the front buffer.
    SimConfig ordinary;
    SimConfig frontBuffer;
    frontBuffer.surfaceType = 0x1005;
    return SimGpu::Default()
        .WithFrontBuffer()
        .WithConfigs({ordinary, frontBuffer})
        .WithEglExtension("EGL_IMG_context_priority");
}

EGLContext ContextOf(RenderThreadGL& thread)
{
    return AskOn(thread.GetMsgQueue(), [] { return eglGetCurrentContext(); });
}

class OffscreenPause : public testing::Test
{
protected:
    OffscreenPause()
    {
        System::SetSDKVersion(34);
        parent.reset(GLES::CreateSurfaceRenderer("parent", RenderThreadGL::Medium));
        parent->Start();
    }

    void Start(bool managed = true, IGLMsgQueue* of = nullptr)
    {
        thread.reset(
            GLES::CreateOffscreenRenderer(of ? of : parent->GetMsgQueue(), "off", managed));
        ASSERT_TRUE(thread->Start());
        ASSERT_TRUE(Queue()->waitForCompleting());
    }

    IGLMsgQueue* Queue() { return thread->GetMsgQueue(); }

    /// Subscribes three objects, first, second, third, on the render thread.
    void Subscribe()
    {
        auto* managed = dynamic_cast<IGLManagedMsgQueue*>(Queue());
        RunOn(Queue(),
              [&]
              {
                  for (NotedObject* object : {&first, &second, &third})
                      positions.push_back(managed->GetObjectObserver()->Subscribe(object));
              });
    }

    void Unsubscribe()
    {
        auto* managed = dynamic_cast<IGLManagedMsgQueue*>(Queue());
        RunOn(Queue(),
              [&]
              {
                  for (const auto& position : positions)
                      managed->GetObjectObserver()->Unsubscribe(position);
              });
    }

    SimDriver driver{Gpu()};
    ThreadPtr parent;
    ThreadPtr thread;
    std::vector<std::string> notes;
    NotedObject first{"first", &notes};
    NotedObject second{"second", &notes};
    NotedObject third{"third", &notes};
    std::vector<Observer<IManagedObject>::Position> positions;
};

TEST_F(OffscreenPause, ReleasesTheObjectsLastOneFirstWhileTheContextIsThere)
{
    Start();
    Subscribe();

    thread->OnPause();

    EXPECT_EQ(notes, Lines({"third release with context", "second release with context",
                            "first release with context"}));
    thread->OnResume();
    Unsubscribe();
}

TEST_F(OffscreenPause, EndsTheContextAndKeepsThePbuffer)
{
    Start();
    driver.ForgetCalls();

    thread->OnPause();

    EXPECT_EQ(NamesOf(ObjectCalls(driver)), Names({"eglMakeCurrent", "eglDestroyContext"}));
    EXPECT_EQ(CurrentSurfaces(driver), Names({"none"}));
    EXPECT_EQ(driver.Live().surfaces, 2); // the parent's and this
    EXPECT_FALSE(Queue()->isRunning());
}

TEST_F(OffscreenPause, DoesItsStepsInOrder)
{
    Start();
    Subscribe();
    driver.ForgetLog();

    thread->OnPause();

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"I void Nib::GLES::RenderThreadOffscreenGLImpl::DoPause()", "D third release",
                     "D second release", "D first release",
                     "I void Nib::ShaderManager::OnDestroyContext()",
                     "I void Nib::EglContext::Destroy()"}));
    thread->OnResume();
    Unsubscribe();
}

TEST_F(OffscreenPause, RunsTheQueuedTasksFirst)
{
    Start();
    std::atomic<int> ran{0};
    Gate gate(Queue());
    for (int i = 0; i < 10; ++i)
        Post(Queue(), [&] { ran += eglGetCurrentContext() != EGL_NO_CONTEXT ? 1 : 0; });
    gate.Open();

    thread->OnPause();

    EXPECT_EQ(ran, 10);
}

TEST_F(OffscreenPause, ASecondPauseIsSkipped)
{
    Start();
    thread->OnPause();
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->OnPause();

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"E virtual void Nib::GLES::RenderThreadOffscreenGLImpl::OnPause() : Skip "
                     "DoPause to prevent ANR. Worker is on pause"}));
    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST_F(OffscreenPause, APauseBeforeTheStartIsSkipped)
{
    thread.reset(GLES::CreateOffscreenRenderer(nullptr, "off", true));
    driver.ForgetLog();

    thread->OnPause();

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"E virtual void Nib::GLES::RenderThreadOffscreenGLImpl::OnPause() : Skip "
                     "DoPause to prevent ANR. Worker is on pause"}));
}

TEST_F(OffscreenPause, RenderReturnsFalseWithoutWaiting)
{
    Start();
    thread->OnPause();
    std::atomic<bool> ran{false};
    Post(Queue(), [&] { ran = true; });

    EXPECT_FALSE(thread->Render());

    EXPECT_FALSE(ran);
    thread.reset();
    EXPECT_TRUE(ran);
}

TEST_F(OffscreenPause, WaitForCompletingReturnsFalseWithoutWaiting)
{
    Start();
    thread->OnPause();
    driver.ForgetLog();

    EXPECT_FALSE(Queue()->waitForCompleting());

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"I virtual bool Nib::GLES::RenderThreadOffscreenGLImpl::waitForCompleting()",
                     "E virtual bool Nib::GLES::RenderThreadOffscreenGLImpl::waitForCompleting() - "
                     "worker is on pause!!!"}));
}

TEST_F(OffscreenPause, ResumeMakesANewContextThatSharesWithTheParents)
{
    Start();
    thread->OnPause();
    driver.ForgetCalls();

    thread->OnResume();
    ASSERT_TRUE(Queue()->waitForCompleting());

    EXPECT_EQ(NamesOf(ObjectCalls(driver)), Names({"eglCreateContext", "eglMakeCurrent"}));
    EXPECT_EQ(CurrentSurfaces(driver), Names({"pbuffer"}));
    EXPECT_EQ(driver.Context(ContextOf(*thread)).share, ContextOf(*parent));
    EXPECT_TRUE(Queue()->isRunning());
}

TEST_F(OffscreenPause, ResumeUsesTheFrontBufferConfigurationAndTheSamePriority)
{
    Start();
    const SimContextState before = driver.Context(ContextOf(*thread));
    thread->OnPause();

    thread->OnResume();
    ASSERT_TRUE(Queue()->waitForCompleting());

    const SimContextState after = driver.Context(ContextOf(*thread));
    const auto surfaceType = [&](const SimContextState& context)
    { return driver.Gpu().configs.at(static_cast<std::size_t>(context.config)).surfaceType; };
    EXPECT_EQ(before.priority, 0x3103);
    EXPECT_EQ(after.priority, 0x3103);
    EXPECT_EQ(surfaceType(before), 0x0005);
    EXPECT_EQ(surfaceType(after), 0x1005);
    EXPECT_EQ(driver.CountLogContaining("Context priority for SDK:34 is 0x3103"), 2u);
}

TEST_F(OffscreenPause, ResumeRestoresTheObjectsFirstOneFirst)
{
    Start();
    Subscribe();
    thread->OnPause();
    notes.clear();

    thread->OnResume();
    ASSERT_TRUE(Queue()->waitForCompleting());

    EXPECT_EQ(notes, Lines({"first restore with context", "second restore with context",
                            "third restore with context"}));
    Unsubscribe();
}

TEST_F(OffscreenPause, ResumeDoesItsStepsInOrder)
{
    Start();
    Subscribe();
    thread->OnPause();
    driver.ForgetLog();

    thread->OnResume();
    ASSERT_TRUE(Queue()->waitForCompleting());

    EXPECT_EQ(LinesWith(driver, "").front(),
              "I virtual void Nib::GLES::RenderThreadOffscreenGLImpl::OnResume()");
    EXPECT_EQ(LinesWith(driver, "DoResume"),
              Lines({"I void Nib::GLES::RenderThreadOffscreenGLImpl::DoResume()"}));
    EXPECT_EQ(LinesWith(driver, "estore"),
              Lines({"D first restore", "D second restore", "D third restore",
                     "I void Nib::ShaderManager::OnRestoreContext()"}));
    EXPECT_EQ(driver.CountLogContaining("OK! Parent context: " + Hex(ContextOf(*parent))), 1u);
    Unsubscribe();
}

TEST_F(OffscreenPause, TheShaderManagerMovesItsEntriesToTheNewContext)
{
    Start();
    EGLContext before = EGL_NO_CONTEXT;
    RunOn(Queue(),
          [&]
          {
              before = eglGetCurrentContext();
              ShaderManager::GetInstance()->Add(ShaderManager::Key("ink"), {nullptr, 5});
          });

    thread->OnPause();
    thread->OnResume();

    RunOn(Queue(),
          [&]
          {
              ShaderManager::Entry entry;
              EXPECT_NE(eglGetCurrentContext(), before);
              EXPECT_TRUE(ShaderManager::GetInstance()->Find(ShaderManager::Key("ink"), &entry));
              EXPECT_EQ(entry.useCount, 5u);
              ShaderManager::GetInstance()->Remove(ShaderManager::Key("ink"));
          });
}

TEST_F(OffscreenPause, TasksPostedMeanwhileRunFirstStillWithoutAContext)
{
    Start();
    thread->OnPause();
    std::atomic<int> meanwhile{-1};
    Post(Queue(), [&] { meanwhile = eglGetCurrentContext() != EGL_NO_CONTEXT ? 1 : 0; });

    thread->OnResume();
    const bool after = ContextOf(*thread) != EGL_NO_CONTEXT;

    EXPECT_EQ(meanwhile, 0);
    EXPECT_TRUE(after);
}

TEST_F(OffscreenPause, ResumeWithoutAParentLeavesItPaused)
{
    thread.reset(GLES::CreateOffscreenRenderer(nullptr, "off", true));
    thread->Start();
    thread->OnPause();
    driver.ForgetLog();

    thread->OnResume();

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"I virtual void Nib::GLES::RenderThreadOffscreenGLImpl::OnResume()",
                     "E virtual void Nib::GLES::RenderThreadOffscreenGLImpl::OnResume() m_parent "
                     "is NULL"}));
    EXPECT_FALSE(Queue()->isRunning());
}

TEST_F(OffscreenPause, ResumeWithAParentThatHasNoContextGetsItsOwn)
{
    KeepingQueue contextless;
    contextless.RunWhileWaitedFor();
    Start(true, &contextless);
    thread->OnPause();

    thread->OnResume();
    ASSERT_TRUE(Queue()->waitForCompleting());

    EXPECT_EQ(driver.Context(ContextOf(*thread)).share, EGL_NO_CONTEXT);
    EXPECT_EQ(driver.CountLogContaining("Failed to get main context!"), 2u);
    thread.reset(); // before its parent
}

TEST_F(OffscreenPause, ResumeWithAParentThatRefusesLeavesItPaused)
{
    KeepingQueue refusing;
    refusing.RunWhileWaitedFor();
    Start(true, &refusing);
    thread->OnPause();
    refusing.Refuse();

    thread->OnResume();

    EXPECT_FALSE(Queue()->isRunning());
    thread.reset(); // before its parent
}

TEST_F(OffscreenPause, ResumeWithoutAContextLeavesTheObjectsReleased)
{
    Start();
    Subscribe();
    thread->OnPause();
    notes.clear();
    driver.ForgetLog();
    driver.FailNext("eglCreateContext", EGL_BAD_ALLOC);

    thread->OnResume();
    ASSERT_TRUE(Queue()->waitForCompleting());

    EXPECT_TRUE(notes.empty());
    EXPECT_EQ(LinesWith(driver, "DoResume"),
              Lines({"I void Nib::GLES::RenderThreadOffscreenGLImpl::DoResume()",
                     "E void Nib::GLES::RenderThreadOffscreenGLImpl::DoResume() Failed to create "
                     "context"}));
    EXPECT_EQ(driver.CountLogContaining("ShaderManager::OnRestoreContext"), 0u);
    EXPECT_TRUE(Queue()->isRunning());
    Unsubscribe();
}

TEST_F(OffscreenPause, ResumeGoesOnWhenTheContextCannotBeMadeCurrent)
{
    Start();
    Subscribe();
    thread->OnPause();
    notes.clear();
    driver.FailNext("eglMakeCurrent", EGL_BAD_ACCESS);

    thread->OnResume();
    ASSERT_TRUE(Queue()->waitForCompleting());

    EXPECT_EQ(notes.size(), 3u);
    EXPECT_EQ(driver.CountLogContaining("ShaderManager::OnRestoreContext"), 1u);
    Unsubscribe();
}

TEST(OffscreenPauseOnADeviceWithoutFrontBuffer, ResumeFailsAndTheThreadGoesOn)
{
    System::SetDesktopFallbacks(false);
    SimDriver driver(SimGpu::Default().WithoutFrontBuffer());
    ThreadPtr parent(GLES::CreateSurfaceRenderer("parent", RenderThreadGL::Medium));
    parent->Start();
    ThreadPtr thread(GLES::CreateOffscreenRenderer(parent->GetMsgQueue(), "off", true));
    thread->Start();
    EXPECT_NE(ContextOf(*thread), EGL_NO_CONTEXT);
    thread->OnPause();

    thread->OnResume();
    ASSERT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(LinesWith(driver, "DoResume() "),
              Lines({"E void Nib::GLES::RenderThreadOffscreenGLImpl::DoResume() Failed to create "
                     "context"}));
    EXPECT_EQ(driver.CountLogContaining("required config is NULL (enableFrontBuffer = true)"), 1u);
    EXPECT_EQ(ContextOf(*thread), EGL_NO_CONTEXT);
}

TEST_F(OffscreenPause, UnmanagedObserversAreEmptyAndTheRestHappens)
{
    Start(false);
    driver.ForgetLog();

    thread->OnPause();
    thread->OnResume();
    ASSERT_TRUE(Queue()->waitForCompleting());

    EXPECT_EQ(driver.CountLogContaining("ShaderManager::OnDestroyContext"), 1u);
    EXPECT_EQ(driver.CountLogContaining("ShaderManager::OnRestoreContext"), 1u);
    EXPECT_NE(ContextOf(*thread), EGL_NO_CONTEXT);
}

TEST_F(OffscreenPause, MayBeRepeated)
{
    Start();
    Subscribe();
    for (int round = 0; round < 20; ++round)
    {
        thread->OnPause();
        thread->OnResume();
        ASSERT_TRUE(Queue()->waitForCompleting());
    }

    EXPECT_EQ(notes.size(), 120u);
    EXPECT_EQ(driver.Live().contexts, 3); // the shared one, the parent's, this
    EXPECT_EQ(driver.Live().surfaces, 2);
    Unsubscribe();
}

// ---- deletion while paused ----------------------------------------------------------------------

TEST_F(OffscreenPause, DeletionWaitsForTheParentThenRunsWhatWaits)
{
    Start();
    thread->OnPause();
    std::atomic<bool> ran{false};
    Post(Queue(), [&] { ran = true; });
    std::atomic<bool> parentRan{false};
    Post(parent->GetMsgQueue(), [&] { parentRan = true; });

    thread.reset();

    EXPECT_TRUE(parentRan);
    EXPECT_TRUE(ran);
    EXPECT_EQ(driver.Live().contexts, 2); // the shared one, the parent's
    EXPECT_EQ(driver.Live().surfaces, 1);
}

TEST_F(OffscreenPause, DeletionWithoutAParentResumesToo)
{
    thread.reset(GLES::CreateOffscreenRenderer(nullptr, "off", true));
    thread->Start();
    thread->OnPause();
    std::atomic<bool> ran{false};
    Post(Queue(), [&] { ran = true; });

    thread.reset();

    EXPECT_TRUE(ran);
    EXPECT_EQ(driver.Live().contexts, 2);
}

TEST_F(OffscreenPause, DeletionRunsAResumeThatThePausedParentHasNotAnswered)
{
    ThreadPtr middle(GLES::CreateOffscreenRenderer(parent->GetMsgQueue(), "middle", true));
    middle->Start();
    ASSERT_TRUE(middle->GetMsgQueue()->waitForCompleting());
    Start(true, middle->GetMsgQueue());
    thread->OnPause();
    middle->OnPause();
    thread->OnResume(); // asks the paused parent, which cannot answer
    EXPECT_FALSE(Queue()->isRunning());

    thread.reset();

    EXPECT_EQ(driver.CountLogContaining("OffscreenGLImpl::DoResume()"), 1u);
    EXPECT_EQ(driver.Live().contexts, 2); // the shared one, the first parent's
    middle->OnResume();                   // now the parent answers a child that is gone
    EXPECT_TRUE(middle->GetMsgQueue()->waitForCompleting());
}

TEST_F(OffscreenPause, AChildResumedWhileItsParentIsPausedWaitsForIt)
{
    ThreadPtr middle(GLES::CreateOffscreenRenderer(parent->GetMsgQueue(), "middle", true));
    middle->Start();
    ASSERT_TRUE(middle->GetMsgQueue()->waitForCompleting());
    Start(true, middle->GetMsgQueue());
    thread->OnPause();
    middle->OnPause();
    thread->OnResume();
    EXPECT_FALSE(Queue()->isRunning());

    middle->OnResume();
    ASSERT_TRUE(middle->GetMsgQueue()->waitForCompleting());
    ASSERT_TRUE(Queue()->waitForCompleting());

    // The question was in the parent's queue before its own restoration: it had no context to
    // share.
    EXPECT_EQ(driver.Context(ContextOf(*thread)).share, EGL_NO_CONTEXT);
    thread.reset();
}

} // namespace
