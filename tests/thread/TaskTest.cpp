#include "thread/ThreadTestSupport.h"

#include <nib/base.h>
#include <nib/task.h>

#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <stdexcept>
#include <string>
#include <type_traits>

using namespace Nib;

namespace
{

class Target
{
public:
    virtual ~Target() = default;

    bool Refuse()
    {
        ++calls;
        return false;
    }
    virtual void Overridden() { text = "base"; }
    void TakeRect(RectF rect, int rotation)
    {
        lastRect = rect;
        sum = rotation;
    }
    void TakeThree(const char* first, int second, int third)
    {
        text = first;
        sum = second * 100 + third;
    }

    int calls = 0;
    int sum = 0;
    RectF lastRect;
    std::string text;
};

class DerivedTarget : public Target
{
public:
    void Overridden() override { text = "derived"; }
};

int g_calls = 0;
int g_sum = 0;

void CountCall()
{
    ++g_calls;
}

void AnswerYes(bool* answer)
{
    *answer = true;
}

int AddUp(int a, int b)
{
    g_sum = a * 10 + b;
    return g_sum;
}

using Shared = std::shared_ptr<int>;

/// The owners of both arguments while a task of UseShared runs.
long g_owners[2] = {};

void UseShared(Shared first, std::shared_ptr<void*>)
{
    g_owners[0] = first.use_count();
}

void ThrowWithShared(Shared first, Shared second)
{
    g_owners[0] = first.use_count();
    g_owners[1] = second.use_count();
    throw std::runtime_error("from a task");
}

/// The number of a member function's slot in the table of virtual functions.
template <typename F>
std::ptrdiff_t Slot(F function)
{
    std::ptrdiff_t parts[2] = {};
    static_assert(sizeof function == sizeof parts);
    std::memcpy(parts, &function, sizeof parts);
    return (parts[0] & ~std::ptrdiff_t(1)) / static_cast<std::ptrdiff_t>(sizeof(void*));
}

} // namespace

TEST(ITask, OperationsStandInTheExportedOrder)
{
    // Slots 0 and 1 are the destructor's, as it destroys and as it deletes.
    EXPECT_EQ(Slot(&ITask::run), 2);
    EXPECT_EQ(Slot(&ITask::isGlobalLockAllowed), 3);
}

TEST(ITask, TheLinkStandsBehindTheTablePointer)
{
    CallTask task([] {});
    const auto* link = static_cast<const QueueItemBase<ITask>*>(&task);
    EXPECT_EQ(reinterpret_cast<const char*>(link) - reinterpret_cast<const char*>(&task),
              static_cast<std::ptrdiff_t>(sizeof(void*)));
    EXPECT_EQ(sizeof(ITask), 2 * sizeof(void*));
    EXPECT_FALSE(std::is_polymorphic_v<QueueItemBase<ITask>>);
    EXPECT_EQ(task.next.load(), nullptr);
}

TEST(ITask, AllowsTheGlobalLock)
{
    Target target;
    WorkerTask::Member0<Target, bool (Target::*)()> member(&target, &Target::Refuse);
    WorkerTask::Func0<void (*)()> function(&CountCall);
    EXPECT_TRUE(member.isGlobalLockAllowed());
    EXPECT_TRUE(function.isGlobalLockAllowed());
}

TEST(WorkerTask, Member0CallsAndDropsTheResult)
{
    Target target;
    WorkerTask::Member0<Target, bool (Target::*)()> task(&target, &Target::Refuse);
    EXPECT_EQ(target.calls, 0);
    task.run();
    EXPECT_EQ(target.calls, 1);
}

TEST(WorkerTask, Member0CallsVirtualFunctionsVirtually)
{
    DerivedTarget target;
    WorkerTask::Member0<Target, void (Target::*)()> task(&target, &Target::Overridden);
    task.run();
    EXPECT_EQ(target.text, "derived");
}

TEST(WorkerTask, Member2PassesBothArguments)
{
    Target target;
    RectF rect(1, 2, 3, 4);
    WorkerTask::Member2<Target, void (Target::*)(RectF, int), RectF, int> task(
        &target, &Target::TakeRect, rect, 90);
    rect.Set(0, 0, 0, 0); // the task has its own
    task.run();
    EXPECT_EQ(target.lastRect, RectF(1, 2, 3, 4));
    EXPECT_EQ(target.sum, 90);
}

TEST(WorkerTask, Member3PassesAllArguments)
{
    Target target;
    WorkerTask::Member3<Target, void (Target::*)(const char*, int, int), const char*, int, int>
        task(&target, &Target::TakeThree, "window", 12, 7);
    task.run();
    EXPECT_EQ(target.text, "window");
    EXPECT_EQ(target.sum, 1207);
}

TEST(WorkerTask, Func0Calls)
{
    WorkerTask::Func0<void (*)()> task(&CountCall);
    g_calls = 0;
    task.run();
    EXPECT_EQ(g_calls, 1);
}

TEST(WorkerTask, Func1WritesThroughItsArgument)
{
    bool answer = false;
    WorkerTask::Func1<void (*)(bool*), bool*> task(&AnswerYes, &answer);
    task.run();
    EXPECT_TRUE(answer);
}

TEST(WorkerTask, Func2PassesBothArgumentsAndDropsTheResult)
{
    WorkerTask::Func2<int (*)(int, int), int, int> task(&AddUp, 4, 2);
    task.run();
    EXPECT_EQ(g_sum, 42);
}

TEST(WorkerTask, Func2KeepsItsArgumentsUntilItIsDeleted)
{
    const std::weak_ptr<int> observer = [&]
    {
        auto owned = std::make_shared<int>(1);
        return std::weak_ptr<int>(owned);
    }();
    EXPECT_TRUE(observer.expired()); // nobody else keeps it

    auto value = std::make_shared<int>(1);
    const std::weak_ptr<int> alive = value;
    using Task =
        WorkerTask::Func2<void (*)(Shared, std::shared_ptr<void*>), Shared, std::shared_ptr<void*>>;
    auto task = std::make_unique<Task>(&UseShared, std::move(value), nullptr);
    EXPECT_EQ(alive.use_count(), 1);

    task->run();

    EXPECT_EQ(alive.use_count(), 1); // after the run, still the task's
    task.reset();
    EXPECT_TRUE(alive.expired());
}

TEST(WorkerTask, Func2CopiesItsArgumentsOnceForTheCall)
{
    auto value = std::make_shared<int>(1);
    WorkerTask::Func2<void (*)(Shared, std::shared_ptr<void*>), Shared, std::shared_ptr<void*>>
        task(&UseShared, value, nullptr);
    task.run();
    EXPECT_EQ(g_owners[0], 3); // the test's, the task's, the call's
    EXPECT_EQ(value.use_count(), 2);
}

TEST(WorkerTask, Func2ReleasesTheCopiesWhenTheCallThrows)
{
    auto first = std::make_shared<int>(1);
    auto second = std::make_shared<int>(2);
    WorkerTask::Func2<void (*)(Shared, Shared), Shared, Shared> task(&ThrowWithShared, first,
                                                                     second);
    EXPECT_THROW(task.run(), std::runtime_error);
    EXPECT_EQ(g_owners[0], 3);
    EXPECT_EQ(g_owners[1], 3);
    EXPECT_EQ(first.use_count(), 2);
    EXPECT_EQ(second.use_count(), 2);
}

TEST(WorkerTask, Func2ReleasesItsSecondArgumentFirst)
{
    std::string order;
    {
        WorkerTask::Func2<void (*)(Shared, Shared), Shared, Shared> task(&ThrowWithShared,
                                                                         Shared(new int,
                                                                                [&](int* p)
                                                                                {
                                                                                    order +=
                                                                                        "first ";
                                                                                    delete p;
                                                                                }),
                                                                         Shared(new int,
                                                                                [&](int* p)
                                                                                {
                                                                                    order +=
                                                                                        "second ";
                                                                                    delete p;
                                                                                }));
        EXPECT_EQ(order, "");
    }
    EXPECT_EQ(order, "second first ");
}

TEST(WorkerTask, WrappersHoldNoMoreThanTheCall)
{
    struct ThreePointers // table, link, function
    {
        void* a;
        void* b;
        void* c;
    };
    EXPECT_EQ(sizeof(WorkerTask::Func0<void (*)()>), sizeof(ThreePointers));
    EXPECT_EQ((sizeof(WorkerTask::Member0<Target, bool (Target::*)()>)),
              sizeof(ThreePointers) + 2 * sizeof(void*));
    EXPECT_EQ((sizeof(WorkerTask::Member2<Target, void (Target::*)(RectF, int), RectF, int>)),
              sizeof(ThreePointers) + 2 * sizeof(void*) + 24u);
}
