// What one step costs with 10, 1,000 and 100,000 of its kind alive: it should not grow, except that
// a look-up in an ordered table may by its logarithm, and by what the processor's caches do not hold.

#include <nib/base.h>
#include <nib/managed_object.h>
#include <nib/resource_checker.h>
#include <nib/shader_manager.h>
#include <nib/task.h>
#include <nib/worker_thread.h>

#include <benchmark/benchmark.h>

#include <atomic>
#include <cstdlib>
#include <memory>
#include <string>
#include <thread>
#include <vector>

namespace
{

using namespace Nib;

class EmptyTask : public ITask
{
public:
    void run() override {}
};

/// Holds its worker until it is opened.
class GateTask : public ITask
{
public:
    explicit GateTask(std::atomic<bool>& isOpen) : m_isOpen(isOpen) {}
    void run() override
    {
        while (!m_isOpen.load(std::memory_order_acquire))
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }

private:
    std::atomic<bool>& m_isOpen;
};

/// A post to a worker that is held, behind as many tasks as the argument says.
void BM_Post(benchmark::State& state)
{
    const std::unique_ptr<IWorkerThread> worker(IWorkerThread::CreateInstance_NoLock("bench", 0));
    std::atomic<bool> isOpen{false};
    worker->Start(false);
    worker->EnqueueAsyncTask(new GateTask(isOpen));
    for (int number = 0; number < state.range(0); ++number)
        worker->EnqueueAsyncTask(new EmptyTask);
    for (auto _ : state)
        worker->EnqueueAsyncTask(new EmptyTask);
    isOpen.store(true, std::memory_order_release);
    worker->Terminate();
}

class Subscriber : public IManagedObject
{
public:
    void OnRelease() override { benchmark::DoNotOptimize(this); }
    void OnRestore() override { benchmark::DoNotOptimize(this); }
    void ReleaseGLObject() override {}
    void RestoreGLObject() override {}
};

/// An observer with as many subscribers as the argument says.
struct Subscribed
{
    explicit Subscribed(long count) : objects(static_cast<std::size_t>(count))
    {
        for (Subscriber& object : objects)
            positions.push_back(observer.Subscribe(&object));
    }
    ~Subscribed()
    {
        for (const auto& position : positions)
            observer.Unsubscribe(position);
    }

    std::vector<Subscriber> objects;
    Observer<IManagedObject> observer;
    std::vector<Observer<IManagedObject>::Position> positions;
};

/// What Register() and Unregister() of a managed object come to.
void BM_SubscribeUnsubscribe(benchmark::State& state)
{
    Subscribed subscribed(state.range(0));
    Subscriber one;
    for (auto _ : state)
        subscribed.observer.Unsubscribe(subscribed.observer.Subscribe(&one));
}

/// A pause and a resume, for each object: real time over items.
void BM_PauseResume(benchmark::State& state)
{
    Subscribed subscribed(state.range(0));
    for (auto _ : state)
    {
        subscribed.observer.DispatchRelease();
        subscribed.observer.DispatchRestore();
    }
    state.counters["an_object"] =
        benchmark::Counter(static_cast<double>(state.iterations() * state.range(0)),
                           benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

/// A name that the leak checker gets and loses.
void BM_CheckerAddRemove(benchmark::State& state)
{
    System::SetBuildTypeEngMode(true);
    const auto db = ResourceChecker::textureDbDescriptor;
    const auto count = static_cast<unsigned>(state.range(0));
    for (unsigned id = 1; id <= count; ++id)
        ResourceChecker::addLookup(2 * id, db, nullptr);
    unsigned id = 1;
    for (auto _ : state)
    {
        ResourceChecker::addLookup(id, db, nullptr);
        ResourceChecker::removeLookup(id, db);
        id = (id + 7919 * 2) % (2 * count); // odd, like the first
    }
    for (unsigned number = 1; number <= count; ++number)
        ResourceChecker::removeLookup(2 * number, db);
    System::SetBuildTypeEngMode(false);
}

void BM_ShaderLookUp(benchmark::State& state)
{
    ShaderManager* const manager = ShaderManager::GetInstance();
    std::vector<ShaderManager::Key> keys;
    for (int number = 0; number < state.range(0); ++number)
        keys.emplace_back(("shader " + std::to_string(number)).c_str());
    for (const ShaderManager::Key& key : keys)
        manager->Add(key, {});
    std::size_t index = 0;
    for (auto _ : state)
    {
        ShaderManager::Entry entry;
        benchmark::DoNotOptimize(manager->Find(keys[index], &entry));
        index = (index + 7919) % keys.size();
    }
    for (const ShaderManager::Key& key : keys)
        manager->Remove(key);
}

BENCHMARK(BM_Post)->Arg(10)->Arg(1000)->Arg(100000)->Iterations(100000);
BENCHMARK(BM_SubscribeUnsubscribe)->Arg(10)->Arg(1000)->Arg(100000);
BENCHMARK(BM_PauseResume)->Arg(10)->Arg(1000)->Arg(100000);
BENCHMARK(BM_CheckerAddRemove)->Arg(10)->Arg(1000)->Arg(100000);
BENCHMARK(BM_ShaderLookUp)->Arg(10)->Arg(1000)->Arg(100000);

} // namespace

int main(int argc, char** argv)
{
    setenv("NIB_LOG", "silent", 0);
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 1;
    benchmark::RunSpecifiedBenchmarks();
    return 0;
}
