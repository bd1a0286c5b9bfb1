// Render threads that share the context of a parent: start.

#include "render/ChildThreadSupport.h"

#include <nib/device.h>

using namespace Nib;

namespace
{

INSTANTIATE_TEST_SUITE_P(Kinds, ChildThread, testing::ValuesIn(kChildKinds), NameOfKind);

// ---- without a parent ---------------------------------------------------------------------------

TEST_P(ChildThread, WithoutAParentSharesWithNothing)
{
    ThreadPtr thread = New(nullptr);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(NamesOf(ObjectCalls(driver)),
              Names({"eglCreateContext", "eglCreatePbufferSurface", "eglMakeCurrent"}));
    EXPECT_EQ(driver.LastCall("eglCreateContext").args.at(2).Pointer(), nullptr);
    EXPECT_EQ(LinesWith(driver, "::Start() - Parent"),
              Texts({"I virtual bool Nib::GLES::@::Start() - Parent renderer is null. Initialize "
                     "with independent context"}));
}

TEST_P(ChildThread, WithoutAParentHasItsContextWhenStartReturns)
{
    ThreadPtr thread = New(nullptr);

    thread->Start();

    EXPECT_EQ(driver.CountLogContaining("Init() RenderThread: "), 1u);
    EXPECT_TRUE(thread->GetMsgQueue()->isRunning());
}

// ---- with a parent ------------------------------------------------------------------------------

TEST_P(ChildThread, SharesWithTheContextOfItsParent)
{
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = Started(parent->GetMsgQueue());

    EXPECT_EQ(driver.Context(ContextOf(*thread)).share, ContextOf(*parent));
}

TEST_P(ChildThread, StartWritesItsLinesInOrder)
{
    ThreadPtr parent = StartedParent();
    const std::string parentContext = Hex(ContextOf(*parent));
    ThreadPtr thread = New(parent->GetMsgQueue());
    driver.ForgetLog();

    Gate busy(parent->GetMsgQueue()); // so that the parent's line comes after the child's first
    std::thread starter([&] { thread->Start(); });
    while (driver.CountLogContaining("wait for parent context") == 0)
        std::this_thread::yield();
    busy.Open();
    starter.join();
    RunOn(thread->GetMsgQueue(), [] {});
    const std::string context = Hex(ContextOf(*thread));

    EXPECT_EQ(LinesWith(driver, "::Start() - Parent"),
              Texts({"I virtual bool Nib::GLES::@::Start() - Parent renderer is \"parent\". Start "
                     "paused and wait for parent context"}));
    EXPECT_EQ(LinesWith(driver, "GetContextAndResume"),
              Texts({"I static void Nib::GLES::@::GetContextAndResume("
                     "std::shared_ptr<IWorkerThread>, std::shared_ptr<EGLContext>), OK! Parent "
                     "context: " +
                     parentContext}));
    EXPECT_EQ(LinesWith(driver, "Impl::Init()"),
              Texts({"I bool Nib::GLES::@::Init()",
                     "I bool Nib::GLES::@::Init() RenderThread: " + Hex(thread.get()) +
                         ", Context: " + context}));
}

TEST_P(ChildThread, StartMakesAContextAndAPbufferOfOnePixel)
{
    ThreadPtr parent = StartedParent();
    driver.ForgetCalls();

    ThreadPtr thread = Started(parent->GetMsgQueue());

    EXPECT_EQ(NamesOf(ObjectCalls(driver)),
              Names({"eglCreateContext", "eglCreatePbufferSurface", "eglMakeCurrent"}));
    const SimSurfaceState surface =
        driver.Surface(AskOn(thread->GetMsgQueue(), [] { return eglGetCurrentSurface(EGL_DRAW); }));
    EXPECT_FALSE(surface.window);
    EXPECT_EQ(surface.width, 1);
    EXPECT_EQ(surface.height, 1);
}

TEST_P(ChildThread, StartWaitsForTheParentsAnswerOnly)
{
    KeepingQueue parent; // answers nothing, and does not let wait
    ThreadPtr thread = New(&parent);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(parent.Count(), 1u);
    EXPECT_EQ(parent.Waits(), 1);
    EXPECT_FALSE(thread->GetMsgQueue()->isRunning());
    EXPECT_EQ(driver.CountLogContaining("Init()"), 0u);
}

TEST_P(ChildThread, RunsNothingBeforeTheParentHasAnswered)
{
    KeepingQueue parent;
    ThreadPtr thread = New(&parent);
    thread->Start();
    std::atomic<bool> ran{false};
    Event done;
    Post(thread->GetMsgQueue(),
         [&]
         {
             ran = true;
             done.Set();
         });

    EXPECT_FALSE(thread->Render());
    EXPECT_FALSE(ran);

    SimContext context(driver);
    parent.RunAll();
    done.Wait(); // behind Init
    EXPECT_EQ(driver.CountLogContaining("Init() RenderThread: "), 1u);
}

TEST_P(ChildThread, GetsAContextOfItsOwnWhenTheParentHasNone)
{
    KeepingQueue parent;
    parent.RunWhileWaitedFor(); // on this thread, which has no context

    ThreadPtr thread = Started(&parent);

    EXPECT_EQ(LinesWith(driver, "GetContextAndResume"),
              Texts({"E static void Nib::GLES::@::GetContextAndResume("
                     "std::shared_ptr<IWorkerThread>, std::shared_ptr<EGLContext>), Failed to get "
                     "main context!"}));
    EXPECT_NE(ContextOf(*thread), EGL_NO_CONTEXT);
    EXPECT_EQ(driver.Context(ContextOf(*thread)).share, EGL_NO_CONTEXT);
}

TEST_P(ChildThread, StaysPausedWhenTheParentRefuses)
{
    KeepingQueue parent;
    parent.Refuse();
    ThreadPtr thread = New(&parent);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(parent.Waits(), 1);
    EXPECT_FALSE(thread->GetMsgQueue()->isRunning());
}

TEST_P(ChildThread, StartFailsWithoutAThreadAndDoesNotBlock)
{
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = New(parent->GetMsgQueue());
    const NoMoreThreads noMore;
    const LeaksAllowed itsStartTask;

    EXPECT_FALSE(thread->Start());

    EXPECT_FALSE(thread->GetMsgQueue()->isRunning());
}

TEST_P(ChildThread, ParentsMayHaveParents)
{
    ThreadPtr first = StartedParent();
    ThreadPtr second = Started(first->GetMsgQueue());
    ThreadPtr third = Started(second->GetMsgQueue());

    EXPECT_EQ(driver.Context(ContextOf(*third)).share, ContextOf(*second));
}

TEST_P(ChildThread, BindsTheThreadToItsQueueAndReadsTheGLParameters)
{
    ThreadPtr thread = Started();

    EXPECT_EQ(AskOn(thread->GetMsgQueue(), [] { return GetCurrentMsgQueue(); }),
              thread->GetMsgQueue());
    EXPECT_TRUE(OpenGLRenderer::IsGLParameterInited());
}

TEST_P(ChildThread, RenderOfAnUnstartedThreadReturnsFalse)
{
    ThreadPtr thread = New(nullptr);

    EXPECT_FALSE(thread->Render());
}

// ---- what EGL refuses ---------------------------------------------------------------------------

TEST_P(ChildThread, GoesOnWithoutAContext)
{
    ThreadPtr thread = New(nullptr);
    driver.FailNext("eglCreateContext", EGL_BAD_ALLOC);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(LinesWith(driver, "Impl::Init()"),
              Texts({"I bool Nib::GLES::@::Init()",
                     "E bool Nib::GLES::@::Init() Failed to create context"}));
    EXPECT_EQ(driver.CallCount("eglCreatePbufferSurface"), 0u);
    EXPECT_EQ(AskOn(thread->GetMsgQueue(), [] { return GetCurrentMsgQueue(); }), nullptr);
}

TEST_P(ChildThread, GoesOnUnboundWhenTheContextCannotBeMadeCurrent)
{
    ThreadPtr thread = New(nullptr);
    driver.FailNext("eglMakeCurrent", EGL_BAD_ACCESS);

    EXPECT_TRUE(thread->Start());

    EXPECT_EQ(LinesWith(driver, "Impl::Init()"),
              Texts({"I bool Nib::GLES::@::Init()",
                     "E bool Nib::GLES::@::Init() Failed to MakeCurrent"}));
    EXPECT_EQ(AskOn(thread->GetMsgQueue(), [] { return GetCurrentMsgQueue(); }), nullptr);
    EXPECT_FALSE(OpenGLRenderer::IsGLParameterInited());
}

} // namespace
