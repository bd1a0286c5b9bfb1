// The queue of tasks under every order of its steps and every value that a load may see.

#include "ModelAtomic.h"

#include "thread/TaskQueue.h"

using namespace Nib;

namespace
{

/// A task that tells whether its contents are visible, and what runs it.
class ContentTask : public ITask
{
public:
    explicit ContentTask(int number) : m_number(number) { m_content.Write(); }
    ~ContentTask() override { m_content.Write(); }
    void run() override { m_content.Read(); }
    int Number() const { return m_number; }

private:
    Model::Plain m_content;
    int m_number;
};

/// What the scenarios share; its tasks stay where they are, so that a late access is seen for what
/// it is.
struct Scene
{
    TaskQueue queue;
    std::optional<ContentTask> tasks[4];
    std::vector<int> taken;

    void Push(int number)
    {
        tasks[number].emplace(number);
        queue.Push(&*tasks[number]);
    }

    /// As the worker does: runs the task and ends it.
    bool Take()
    {
        auto* task = static_cast<ContentTask*>(queue.Pop());
        if (task == nullptr)
            return false;
        task->run();
        taken.push_back(task->Number());
        tasks[task->Number()].reset();
        return true;
    }

    void TakeUntilEmpty()
    {
        while (Take())
        {
        }
    }

    bool WasTakenInOrder(int first, int second) const
    {
        const auto a = std::find(taken.begin(), taken.end(), first);
        const auto b = std::find(taken.begin(), taken.end(), second);
        return a < b && b != taken.end();
    }
};

/// Two producers, one task each, and a consumer that takes @p early times before they are done.
void TwoProducers(int early)
{
    Scene scene;
    const int a = Model::Spawn([&] { scene.Push(0); });
    const int b = Model::Spawn([&] { scene.Push(1); });
    for (int time = 0; time < early; ++time)
        scene.Take();
    Model::Join(a);
    Model::Join(b);
    scene.TakeUntilEmpty();
    Model::Require(scene.taken.size() == 2, "a task was lost");
}

/// One producer of two tasks and one of one.
void TwoAndOne(int early)
{
    Scene scene;
    const int a = Model::Spawn(
        [&]
        {
            scene.Push(0);
            scene.Push(1);
        });
    const int b = Model::Spawn([&] { scene.Push(2); });
    for (int time = 0; time < early; ++time)
        scene.Take();
    Model::Join(a);
    Model::Join(b);
    scene.TakeUntilEmpty();
    Model::Require(scene.taken.size() == 3, "a task was lost");
    Model::Require(scene.WasTakenInOrder(0, 1), "a producer's tasks changed places");
}

void ThreeProducers(int early)
{
    Scene scene;
    std::vector<int> producers;
    for (int number = 0; number < 3; ++number)
        producers.push_back(Model::Spawn([&scene, number] { scene.Push(number); }));
    for (int time = 0; time < early; ++time)
        scene.Take();
    for (const int producer : producers)
        Model::Join(producer);
    scene.TakeUntilEmpty();
    Model::Require(scene.taken.size() == 3, "a task was lost");
}

/// Passes in every execution; that there are many says that something was tried.
void ExpectHolds(const std::function<void()>& scenario, long least)
{
    const Model::Result result = Model::Explore(scenario);
    EXPECT_EQ(result.failure, "");
    EXPECT_GE(result.executions, least);
}

/// Fails when one memory order is taken for a weaker one.
void ExpectNeeded(bool Model::Weakening::*order, const std::function<void()>& scenario,
                  const char* failure)
{
    Model::g_weakening = {};
    Model::g_weakening.*order = true;
    EXPECT_EQ(Model::Explore(scenario).failure, failure);
    Model::g_weakening = {};
}

} // namespace

TEST(TaskQueueModel, TwoProducersLoseNothing)
{
    ExpectHolds([] { TwoProducers(3); }, 200);
}

TEST(TaskQueueModel, AProducersTasksKeepTheirOrder)
{
    ExpectHolds([] { TwoAndOne(3); }, 1500);
}

TEST(TaskQueueModel, ThreeProducersLoseNothing)
{
    ExpectHolds([] { ThreeProducers(2); }, 1000);
}

TEST(TaskQueueModel, NeedsTheReleaseOfTheExchange)
{
    // Else the next producer writes into a task that it has not seen made.
    ExpectNeeded(
        &Model::Weakening::exchangeRelease, [] { TwoProducers(0); },
        "an atomic is used by a thread that has not seen it made");
}

TEST(TaskQueueModel, NeedsTheAcquireOfTheExchange)
{
    ExpectNeeded(
        &Model::Weakening::exchangeAcquire, [] { TwoProducers(0); },
        "an atomic is used by a thread that has not seen it made");
}

TEST(TaskQueueModel, NeedsTheReleaseOfTheLink)
{
    ExpectNeeded(
        &Model::Weakening::storeRelease, [] { TwoProducers(2); },
        "an atomic is used by a thread that has not seen it made");
}

TEST(TaskQueueModel, NeedsTheAcquireOfTheLink)
{
    ExpectNeeded(
        &Model::Weakening::loadAcquire, [] { TwoProducers(2); },
        "an atomic is used by a thread that has not seen it made");
}
