#include "render/RenderSteps.h"

#include "render/RenderTestSupport.h"

#include <gtest/gtest.h>

using namespace Nib;

namespace
{

/// A worker whose waits find, one after the other, so many tasks behind them.
class ScriptedWorker : public IWorkerThread
{
public:
    struct Round
    {
        bool waited;
        int left;
    };

    explicit ScriptedWorker(std::vector<Round> rounds) : m_rounds(std::move(rounds)) {}

    bool Start(bool) override { return true; }
    void Terminate() override {}
    bool Pause() override { return true; }
    bool Resume() override
    {
        ++resumes;
        return true;
    }
    bool EnqueueAsyncTask(ITask*) override { return false; }
    bool IsRunning() override { return true; }
    bool IsStarted() override { return true; }
    bool WaitForExecution(int* queuedAfter) override
    {
        const Round round = m_rounds.at(static_cast<std::size_t>(waits++));
        if (round.waited)
            *queuedAfter = round.left;
        return round.waited;
    }
    void RunSyncTask(ITask*, bool, bool) override {}

    int waits = 0;
    int resumes = 0;

private:
    std::vector<Round> m_rounds;
};

// ---- DrainQueue ---------------------------------------------------------------------------------

TEST(DrainQueue, WaitsOnceForAQueueThatIsEmptyThen)
{
    SimDriver driver;
    ScriptedWorker worker({{true, 0}});

    GLES::DrainQueue(worker, "void F()");

    EXPECT_EQ(worker.waits, 1);
    EXPECT_TRUE(driver.Log().empty());
}

TEST(DrainQueue, WarnsOncePerRoundAndHasNoLimit)
{
    SimDriver driver;
    ScriptedWorker worker({{true, 3}, {true, 1}, {true, 12}, {true, 0}});

    GLES::DrainQueue(worker, "void F()");

    EXPECT_EQ(worker.waits, 4);
    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"W void F() : 3 tasks in queue ater WaitForExecution. Note! - Some task add "
                     "new task while execution. Retry waiting.",
                     "W void F() : 1 tasks in queue ater WaitForExecution. Note! - Some task add "
                     "new task while execution. Retry waiting.",
                     "W void F() : 12 tasks in queue ater WaitForExecution. Note! - Some task add "
                     "new task while execution. Retry waiting."}));
}

TEST(DrainQueue, EndsWhenThereIsNoWaiting)
{
    SimDriver driver;
    ScriptedWorker worker({{true, 2}, {false, 0}});

    GLES::DrainQueue(worker, "void F()");

    EXPECT_EQ(worker.waits, 2);
    EXPECT_EQ(driver.Log().size(), 1u);
}

// ---- ContextHandshake ---------------------------------------------------------------------------

struct Handshake
{
    std::shared_ptr<ScriptedWorker> worker =
        std::make_shared<ScriptedWorker>(std::vector<ScriptedWorker::Round>{});
    GLES::ContextHandshake::Cell cell = std::make_shared<std::atomic<EGLContext>>(nullptr);
};

void HandOverNamed(GLES::ContextHandshake::Worker worker, GLES::ContextHandshake::Cell cell)
{
    GLES::ContextHandshake::HandOver(*worker, *cell, "void F()");
}

TEST(ContextHandshake, PostsToTheParentAndWaitsForIt)
{
    SimDriver driver;
    Handshake child;
    KeepingQueue parent;

    GLES::ContextHandshake::Request(&parent, &HandOverNamed, child.worker, child.cell);

    EXPECT_EQ(parent.Count(), 1u);
    EXPECT_EQ(parent.Waits(), 1);
    EXPECT_EQ(child.worker->resumes, 0);
}

TEST(ContextHandshake, KeepsTheWorkerAndTheCellAliveUntilTheParentHasAnswered)
{
    SimDriver driver;
    KeepingQueue parent;
    std::weak_ptr<IWorkerThread> worker;
    std::weak_ptr<std::atomic<EGLContext>> cell;
    {
        Handshake child;
        worker = child.worker;
        cell = child.cell;
        GLES::ContextHandshake::Request(&parent, &HandOverNamed, child.worker, child.cell);
    }

    EXPECT_FALSE(worker.expired());
    EXPECT_FALSE(cell.expired());
    parent.RunAll();
    EXPECT_TRUE(worker.expired());
    EXPECT_TRUE(cell.expired());
}

TEST(ContextHandshake, DeletesTheTaskThatTheParentRefusesAndStillWaits)
{
    SimDriver driver;
    Handshake child;
    KeepingQueue parent;
    parent.Refuse();

    GLES::ContextHandshake::Request(&parent, &HandOverNamed, child.worker, child.cell);

    EXPECT_EQ(child.worker.use_count(), 1);
    EXPECT_EQ(parent.Waits(), 1);
}

TEST(ContextHandshake, HandsOverTheContextOfTheParentsThread)
{
    SimDriver driver;
    SimContext context(driver);
    Handshake child;

    HandOverNamed(child.worker, child.cell);

    EXPECT_EQ(child.cell->load(), context.Handle());
    EXPECT_EQ(child.worker->resumes, 1);
    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"I void F(), OK! Parent context: " + Hex(context.Handle())}));
}

TEST(ContextHandshake, ResumesTheChildWithoutAContextToo)
{
    SimDriver driver;
    Handshake child;

    HandOverNamed(child.worker, child.cell);

    EXPECT_EQ(child.cell->load(), EGL_NO_CONTEXT);
    EXPECT_EQ(child.worker->resumes, 1);
    EXPECT_EQ(LinesWith(driver, ""), Lines({"E void F(), Failed to get main context!"}));
}

} // namespace
