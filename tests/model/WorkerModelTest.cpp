// The worker, its sleep and its synchronous calls, under every order of the steps of its threads.

#include "ModelAtomic.h"

#include "thread/WorkerThreadImpl.h"

#include <cstdlib>

using namespace Nib;

namespace
{

class CountingTask : public ITask
{
public:
    CountingTask(int* ran, Model::Plain* content) : m_ran(ran), m_content(content)
    {
        m_content->Write();
    }
    void run() override
    {
        m_content->Read();
        ++*m_ran;
    }

private:
    int* m_ran;
    Model::Plain* m_content;
};

constexpr bool kPaused = true;
constexpr bool kAheadOfQueue = true;
constexpr bool kDeleteAfterRun = true;

/// A worker that is started and, at the end, ended. Whatever sleeps through its signal shows as
/// threads that wait for ever.
struct Scene
{
    explicit Scene(bool paused) { worker.Start(paused); }

    void Post() { worker.EnqueueAsyncTask(new CountingTask(&ran, &contents[posted++])); }

    void End(int tasks)
    {
        worker.Terminate();
        Model::Require(ran == tasks, "a task did not run");
    }

    WorkerThreadImpl worker{"worker", 0, false};
    Model::Plain contents[3];
    int posted = 0;
    int ran = 0;
};

/// Passes in every execution; that there are many says that something was tried.
void ExpectHolds(const std::function<void()>& scenario, long least)
{
    const Model::Result result = Model::Explore(scenario);
    EXPECT_EQ(result.failure, "");
    EXPECT_GE(result.executions, least);
}

} // namespace

TEST(WorkerModel, APostWakesTheWorker)
{
    ExpectHolds(
        []
        {
            Scene scene(!kPaused);
            scene.Post();
            scene.End(1);
        },
        2000);
}

TEST(WorkerModel, AResumeWakesTheWorkerForWhatWasPostedBefore)
{
    ExpectHolds(
        []
        {
            Scene scene(kPaused);
            scene.Post();
            scene.worker.Resume();
            scene.End(1);
        },
        1500);
}

TEST(WorkerModel, ACallAheadOfTheQueueIsAnsweredWhilePaused)
{
    ExpectHolds(
        []
        {
            Scene scene(kPaused);
            CountingTask task(&scene.ran, &scene.contents[0]);
            scene.worker.RunSyncTask(&task, kAheadOfQueue, !kDeleteAfterRun);
            Model::Require(scene.ran == 1, "the call returned too early");
            scene.worker.Resume();
            scene.End(1);
        },
        500);
}

TEST(WorkerModel, ACallBehindTheQueueIsAnsweredAfterIt)
{
    if (!std::getenv("NIB_MODEL_LONG"))
        GTEST_SKIP() << "sixteen thousand orders take a while: set NIB_MODEL_LONG";
    ExpectHolds(
        []
        {
            Scene scene(!kPaused);
            scene.Post();
            CountingTask task(&scene.ran, &scene.contents[1]);
            scene.worker.RunSyncTask(&task, !kAheadOfQueue, !kDeleteAfterRun);
            Model::Require(scene.ran == 2, "the call went ahead of the queue");
            scene.End(2);
        },
        10000);
}

// ---- a post that meets a resume -----------------------------------------------------------------
// The worker's sleep rests on two variables: the count of what is queued and the paused flag. Here
// they are without the rest of the worker, which would make the orders too many.

namespace
{

constexpr auto kSequential = std::memory_order_seq_cst;

/// Whether the worker is woken, by the one who posts or by the one who resumes.
bool IsWoken(std::memory_order change, std::memory_order look)
{
    std::atomic<int> pending{0};
    std::atomic<bool> paused{true};
    bool byPost = false;
    bool byResume = false;
    const int post =
        Model::Spawn([&] { byPost = pending.fetch_add(1, change) + 1 < 2 && !paused.load(look); });
    paused.exchange(false, change);
    byResume = pending.load(look) > 0; // the look before the sleep
    Model::Join(post);
    return byPost || byResume;
}

} // namespace

TEST(WorkerModel, APostOrAResumeSeesTheOther)
{
    ExpectHolds([] { Model::Require(IsWoken(kSequential, kSequential), "the worker sleeps on"); },
                3);
}

TEST(WorkerModel, AReleaseAndAnAcquireDoNotSufficeForThat)
{
    const Model::Result result = Model::Explore(
        []
        {
            Model::Require(IsWoken(std::memory_order_acq_rel, std::memory_order_acquire),
                           "the worker sleeps on");
        });
    EXPECT_EQ(result.failure, "the worker sleeps on");
}
