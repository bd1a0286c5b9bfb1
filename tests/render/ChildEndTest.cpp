// Render threads that share the context of a parent: end.

#include "render/ChildThreadSupport.h"

using namespace Nib;

namespace
{

class ChildThreadEnd : public ChildThread
{
};

INSTANTIATE_TEST_SUITE_P(Kinds, ChildThreadEnd, testing::ValuesIn(kChildKinds), NameOfKind);

TEST_P(ChildThreadEnd, OfAnUnstartedThreadTouchesNothing)
{
    KeepingQueue parent;
    ThreadPtr thread = New(&parent);
    driver.ForgetLog();

    thread.reset();

    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_EQ(parent.Waits(), 0);
    EXPECT_EQ(LinesWith(driver, GetParam().className), Texts({"I virtual Nib::GLES::@::~@()"}));
}

TEST_P(ChildThreadEnd, OfAWaitingThreadGivesTheParentTheChanceToAnswer)
{
    KeepingQueue parent;
    ThreadPtr thread = New(&parent);
    thread->Start();
    SimContext context(driver);
    parent.RunWhileWaitedFor();

    thread.reset();

    EXPECT_EQ(parent.Waits(), 2); // at the start, at the end
    EXPECT_EQ(driver.CountLogContaining("OK! Parent context: " + Hex(context.Handle())), 1u);
    EXPECT_EQ(driver.CountLogContaining("Init() RenderThread: "), 1u);
}

TEST_P(ChildThreadEnd, OfAWaitingThreadWhoseParentIsSilentRunsItsStartFirst)
{
    KeepingQueue parent;
    ThreadPtr thread = New(&parent);
    thread->Start();

    thread.reset();

    EXPECT_EQ(parent.Waits(), 2);
    EXPECT_EQ(parent.Count(), 1u); // the answer that was asked for is still to come
    EXPECT_EQ(driver.CountLogContaining("Init() RenderThread: "), 1u);
    EXPECT_EQ(driver.Live().contexts, 0);
}

TEST_P(ChildThreadEnd, OfARunningThreadDoesNotWaitForTheParent)
{
    KeepingQueue parent;
    parent.RunWhileWaitedFor();
    ThreadPtr thread = Started(&parent);

    thread.reset();

    EXPECT_EQ(parent.Waits(), 1); // at the start
}

TEST_P(ChildThreadEnd, LeavesTheWorkerToAnAnswerThatIsStillQueued)
{
    KeepingQueue parent;
    ThreadPtr thread = New(&parent);
    thread->Start();
    thread.reset();
    EXPECT_EQ(driver.CountLogContaining("WorkerThreadImpl() Cleanup"), 0u);

    parent.RunAll(); // touches the worker of a thread that is gone

    EXPECT_EQ(driver.CountLogContaining("WorkerThreadImpl() Cleanup"), 1u);
}

TEST_P(ChildThreadEnd, WithAnAnswerQueuedOnABusyParentWaitsForIt)
{
    ThreadPtr parent = StartedParent();
    ThreadPtr thread = New(parent->GetMsgQueue());
    {
        Gate busy(parent->GetMsgQueue());
        std::thread starter([&] { thread->Start(); });
        while (driver.CountLogContaining("wait for parent context") == 0)
            std::this_thread::yield();
        busy.Open();
        starter.join();
    }

    thread.reset();

    EXPECT_EQ(driver.CountLogContaining("OK! Parent context"), 1u);
    EXPECT_EQ(driver.Live().contexts, 2); // the parent's and the shared one
}

/// Posts itself again until the deletion has complained.
struct Reposter
{
    SimDriver& driver;
    IGLMsgQueue* queue;

    void operator()() const
    {
        if (driver.CountLogContaining("tasks in queue ater WaitForExecution") == 0)
            Post(queue, *this);
    }
};

TEST_P(ChildThreadEnd, WarnsAndWaitsAgainWhileTasksPostTasks)
{
    ThreadPtr thread = Started();
    Post(thread->GetMsgQueue(), Reposter{driver, thread->GetMsgQueue()});

    thread.reset();

    const std::vector<std::string> warnings =
        LinesWith(driver, "tasks in queue ater WaitForExecution");
    ASSERT_FALSE(warnings.empty());
    EXPECT_EQ(warnings.front(),
              Text("W void Nib::GLES::@::Terminate() : 1 tasks in queue ater WaitForExecution. "
                   "Note! - Some task add new task while execution. Retry waiting."));
    EXPECT_EQ(driver.Live().contexts, 0);
}

} // namespace
