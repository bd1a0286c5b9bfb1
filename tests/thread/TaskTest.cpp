#include "thread/Tasks.h"

#include <nib/task.h>

#include <gtest/gtest.h>

#include <memory>
#include <stdexcept>
#include <string>

namespace
{

class Base
{
public:
    virtual ~Base() = default;
    virtual bool Answer() { return false; }
    virtual void Two(int a, std::string b) { text = b + std::to_string(a); }
    void Three(int a, int b, int c) { sum = a + b + c; }

    std::string text;
    int sum = 0;
};

class Derived : public Base
{
public:
    bool Answer() override
    {
        ++calls;
        return false;
    }
    int calls = 0;
};

int g_calls = 0;
int CountCall()
{
    return ++g_calls;
}
void WriteTrue(bool* result)
{
    *result = true;
}

long g_usesDuringCall = 0;
void Look(std::shared_ptr<int> first, std::shared_ptr<int>)
{
    g_usesDuringCall = first.use_count();
}
void Throw(std::shared_ptr<int>, std::shared_ptr<int>)
{
    throw std::runtime_error("from the task");
}

using Pointer = std::shared_ptr<int>;
using Func2 = Nib::WorkerTask::Func2<void (*)(Pointer, Pointer), Pointer, Pointer>;

} // namespace

TEST(Task, IsAllowedUnderTheGlobalGuard)
{
    LambdaTask task([] {});
    EXPECT_TRUE(task.isGlobalLockAllowed());
}

TEST(Task, LinkStartsEmpty)
{
    LambdaTask task([] {});
    EXPECT_EQ(static_cast<Nib::QueueItemBase<Nib::ITask>&>(task).next.load(), nullptr);
}

TEST(Member0, CallsVirtuallyAndDropsTheResult)
{
    Derived object;
    Nib::WorkerTask::Member0<Base, bool (Base::*)()> task(&object, &Base::Answer);
    task.run();
    task.run();
    EXPECT_EQ(object.calls, 2);
    EXPECT_TRUE(task.isGlobalLockAllowed());
}

TEST(Member2, PassesStoredCopies)
{
    Base object;
    std::string text = "number ";
    Nib::WorkerTask::Member2<Base, void (Base::*)(int, std::string), int, std::string> task(
        &object, &Base::Two, 7, text);
    text = "changed";
    task.run();
    EXPECT_EQ(object.text, "number 7");
}

TEST(Member3, PassesThreeArguments)
{
    Base object;
    Nib::WorkerTask::Member3<Base, void (Base::*)(int, int, int), int, int, int> task(
        &object, &Base::Three, 1, 20, 300);
    task.run();
    EXPECT_EQ(object.sum, 321);
}

TEST(Func0, CallsTheFunction)
{
    g_calls = 0;
    Nib::WorkerTask::Func0<int (*)()> task(&CountCall);
    task.run();
    EXPECT_EQ(g_calls, 1);
}

TEST(Func1, PassesAPointerForTheResult)
{
    bool result = false;
    Nib::WorkerTask::Func1<void (*)(bool*), bool*> task(&WriteTrue, &result);
    task.run();
    EXPECT_TRUE(result);
}

TEST(Func2, CopiesBothArgumentsForTheCall)
{
    auto first = std::make_shared<int>(1);
    Func2 task(&Look, first, std::make_shared<int>(2));
    EXPECT_EQ(first.use_count(), 2);
    task.run();
    EXPECT_EQ(g_usesDuringCall, 3);
    EXPECT_EQ(first.use_count(), 2);
}

TEST(Func2, ReleasesItsCopiesWhenTheCallThrows)
{
    auto first = std::make_shared<int>(1);
    Func2 task(&Throw, first, first);
    EXPECT_THROW(task.run(), std::runtime_error);
    EXPECT_EQ(first.use_count(), 3);
}

TEST(Func2, LastOwnersEndWithTheTaskSecondArgumentFirst)
{
    std::string order;
    const auto noted = [&order](const char* name)
    {
        return Pointer(new int(0),
                       [&order, name](int* value)
                       {
                           order += name;
                           delete value;
                       });
    };
    {
        Func2 task(&Look, noted("first "), noted("second "));
        task.run();
        EXPECT_EQ(order, "");
    }
    EXPECT_EQ(order, "second first ");
}
