// Render threads that share the context of a parent: pause and resume.

#include "render/ChildThreadSupport.h"

#include <nib/shader_manager.h>

using namespace Nib;

namespace
{

class ChildPause : public ChildThread
{
protected:
    ChildPause() : parent(StartedParent()) {}

    void Start(IGLMsgQueue* of = nullptr) { thread = Started(of ? of : parent->GetMsgQueue()); }

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

    static std::vector<std::string> Skipped()
    {
        return Texts({std::string(GetParam().skipLevel) +
                      " virtual void Nib::GLES::@::OnPause() : Skip DoPause to prevent ANR. Worker "
                      "is on pause"});
    }

    ThreadPtr parent;
    ThreadPtr thread;
    std::vector<std::string> notes;
    NotedObject first{"first", &notes};
    NotedObject second{"second", &notes};
    NotedObject third{"third", &notes};
    std::vector<Observer<IManagedObject>::Position> positions;
};

INSTANTIATE_TEST_SUITE_P(Kinds, ChildPause, testing::ValuesIn(kChildKinds), NameOfKind);

TEST_P(ChildPause, ReleasesTheObjectsLastOneFirstWhileTheContextIsThere)
{
    Start();
    Subscribe();

    thread->OnPause();

    EXPECT_EQ(notes, Lines({"third release with context", "second release with context",
                            "first release with context"}));
    thread->OnResume();
    Unsubscribe();
}

TEST_P(ChildPause, EndsTheContextAndKeepsThePbuffer)
{
    Start();
    driver.ForgetCalls();

    thread->OnPause();

    EXPECT_EQ(NamesOf(ObjectCalls(driver)), Names({"eglMakeCurrent", "eglDestroyContext"}));
    EXPECT_EQ(CurrentSurfaces(driver), Names({"none"}));
    EXPECT_EQ(driver.Live().surfaces, 2); // the parent's and this
    EXPECT_FALSE(Queue()->isRunning());
}

TEST_P(ChildPause, DoesItsStepsInOrder)
{
    Start();
    Subscribe();
    driver.ForgetLog();

    thread->OnPause();

    EXPECT_EQ(LinesWith(driver, ""),
              Texts({"I void Nib::GLES::@::DoPause()", "D third release", "D second release",
                     "D first release", "I void Nib::ShaderManager::OnDestroyContext()",
                     "I void Nib::EglContext::Destroy()"}));
    thread->OnResume();
    Unsubscribe();
}

TEST_P(ChildPause, RunsTheQueuedTasksFirst)
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

TEST_P(ChildPause, ASecondPauseIsSkipped)
{
    Start();
    thread->OnPause();
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->OnPause();

    EXPECT_EQ(LinesWith(driver, ""), Skipped());
    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST_P(ChildPause, APauseBeforeTheStartIsSkipped)
{
    thread = New(nullptr);
    driver.ForgetLog();

    thread->OnPause();

    EXPECT_EQ(LinesWith(driver, ""), Skipped());
}

TEST_P(ChildPause, RenderReturnsFalseWithoutWaiting)
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

TEST_P(ChildPause, ResumeMakesANewContextThatSharesWithTheParents)
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

TEST_P(ChildPause, ResumeRestoresTheObjectsFirstOneFirst)
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

TEST_P(ChildPause, ResumeDoesItsStepsInOrder)
{
    Start();
    Subscribe();
    thread->OnPause();
    driver.ForgetLog();

    thread->OnResume();
    ASSERT_TRUE(Queue()->waitForCompleting());

    EXPECT_EQ(LinesWith(driver, "").front(), Text("I virtual void Nib::GLES::@::OnResume()"));
    EXPECT_EQ(LinesWith(driver, "DoResume"), Texts({"I void Nib::GLES::@::DoResume()"}));
    EXPECT_EQ(LinesWith(driver, "estore"),
              Lines({"D first restore", "D second restore", "D third restore",
                     "I void Nib::ShaderManager::OnRestoreContext()"}));
    EXPECT_EQ(driver.CountLogContaining("OK! Parent context: " + Hex(ContextOf(*parent))), 1u);
    Unsubscribe();
}

TEST_P(ChildPause, TheShaderManagerMovesItsEntriesToTheNewContext)
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

TEST_P(ChildPause, TasksPostedMeanwhileRunFirstStillWithoutAContext)
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

TEST_P(ChildPause, ResumeWithoutAParentLeavesItPaused)
{
    thread = New(nullptr);
    thread->Start();
    thread->OnPause();
    driver.ForgetLog();

    thread->OnResume();

    EXPECT_EQ(LinesWith(driver, ""), Texts({"I virtual void Nib::GLES::@::OnResume()",
                                            "E virtual void Nib::GLES::@::OnResume() m_parent "
                                            "is NULL"}));
    EXPECT_FALSE(Queue()->isRunning());
}

TEST_P(ChildPause, ResumeWithAParentThatHasNoContextGetsItsOwn)
{
    KeepingQueue contextless;
    contextless.RunWhileWaitedFor();
    Start(&contextless);
    thread->OnPause();

    thread->OnResume();
    ASSERT_TRUE(Queue()->waitForCompleting());

    EXPECT_EQ(driver.Context(ContextOf(*thread)).share, EGL_NO_CONTEXT);
    EXPECT_EQ(driver.CountLogContaining("Failed to get main context!"), 2u);
    thread.reset(); // before its parent
}

TEST_P(ChildPause, ResumeWithAParentThatRefusesLeavesItPaused)
{
    KeepingQueue refusing;
    refusing.RunWhileWaitedFor();
    Start(&refusing);
    thread->OnPause();
    refusing.Refuse();

    thread->OnResume();

    EXPECT_FALSE(Queue()->isRunning());
    thread.reset(); // before its parent
}

TEST_P(ChildPause, ResumeWithoutAContextLeavesTheObjectsReleased)
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
              Texts({"I void Nib::GLES::@::DoResume()",
                     "E void Nib::GLES::@::DoResume() Failed to create "
                     "context"}));
    EXPECT_EQ(driver.CountLogContaining("ShaderManager::OnRestoreContext"), 0u);
    EXPECT_TRUE(Queue()->isRunning());
    Unsubscribe();
}

TEST_P(ChildPause, ResumeGoesOnWhenTheContextCannotBeMadeCurrent)
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

TEST_P(ChildPause, MayBeRepeated)
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

TEST_P(ChildPause, DeletionWaitsForTheParentThenRunsWhatWaits)
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

TEST_P(ChildPause, DeletionWithoutAParentResumesToo)
{
    thread = New(nullptr);
    thread->Start();
    thread->OnPause();
    std::atomic<bool> ran{false};
    Post(Queue(), [&] { ran = true; });

    thread.reset();

    EXPECT_TRUE(ran);
    EXPECT_EQ(driver.Live().contexts, 2);
}

TEST_P(ChildPause, DeletionRunsAResumeThatThePausedParentHasNotAnswered)
{
    ThreadPtr middle = Started(parent->GetMsgQueue());
    Start(middle->GetMsgQueue());
    thread->OnPause();
    middle->OnPause();
    thread->OnResume(); // asks the paused parent, which cannot answer
    EXPECT_FALSE(Queue()->isRunning());

    thread.reset();

    EXPECT_EQ(driver.CountLogContaining(Text("@::DoResume()")), 1u);
    EXPECT_EQ(driver.Live().contexts, 2); // the shared one, the first parent's
    middle->OnResume();                   // now the parent answers a child that is gone
    EXPECT_TRUE(middle->GetMsgQueue()->waitForCompleting());
}

TEST_P(ChildPause, AChildResumedWhileItsParentIsPausedWaitsForIt)
{
    ThreadPtr middle = Started(parent->GetMsgQueue());
    Start(middle->GetMsgQueue());
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
