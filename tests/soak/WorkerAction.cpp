#include "Action.h"
#include "Failure.h"
#include "Family.h"

#include "PostTask.h"

#include <nib/nib.h>

#include <atomic>
#include <memory>

namespace Soak
{

namespace
{

constexpr int kNormalPriority = 0;
constexpr bool kRunning = false;
constexpr bool kQueued = false;
constexpr bool kDeleteAfterRun = true;

class WorkerAction : public Action
{
public:
    const char* Name() const override { return "workers"; }

    void Run(Family&, Random& random) const override
    {
        const int tasks = random.Between(1, 200);
        std::atomic<int> done{0};
        const auto count = [&done] { done.fetch_add(1, std::memory_order_relaxed); };
        const std::unique_ptr<Nib::IWorkerThread> pool(Nib::IWorkerThread::CreatePoolInstance(
            "soak pool", kNormalPriority, random.Between(1, 4)));
        Require(pool->Start(kRunning), "a pool does not start");
        for (int i = 0; i < tasks; ++i)
        {
            auto task = std::make_unique<Ink::CallableTask<decltype(count)>>(count);
            if (random.OneIn(10))
                pool->RunSyncTask(task.release(), kQueued, kDeleteAfterRun);
            else if (pool->EnqueueAsyncTask(task.get()))
                static_cast<void>(task.release()); // the pool's now
        }
        pool->Terminate();
        Require(done == tasks, "a task of a pool was lost");
    }
};

} // namespace

std::unique_ptr<Action> MakeWorkerAction()
{
    return std::make_unique<WorkerAction>();
}

} // namespace Soak
