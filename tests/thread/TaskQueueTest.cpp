#include "thread/TaskQueue.h"

#include "thread/ThreadTestSupport.h"

#include <gtest/gtest.h>

#include <deque>

using namespace Nib;

namespace
{

class EmptyTask : public ITask
{
public:
    void run() override {}
};

} // namespace

TEST(TaskQueue, IsEmptyAtFirst)
{
    TaskQueue queue;
    EXPECT_EQ(queue.Pop(), nullptr);
    EXPECT_EQ(queue.Pop(), nullptr);
}

TEST(TaskQueue, GivesTasksInTheirOrder)
{
    EmptyTask a;
    EmptyTask b;
    EmptyTask c;
    TaskQueue queue;
    queue.Push(&a);
    queue.Push(&b);
    queue.Push(&c);
    EXPECT_EQ(queue.Pop(), &a);
    EXPECT_EQ(queue.Pop(), &b);
    EXPECT_EQ(queue.Pop(), &c);
    EXPECT_EQ(queue.Pop(), nullptr);
}

TEST(TaskQueue, TakesTasksAgainAfterItWasEmpty)
{
    EmptyTask tasks[3];
    TaskQueue queue;
    for (EmptyTask& task : tasks)
    {
        queue.Push(&task);
        EXPECT_EQ(queue.Pop(), &task);
        EXPECT_EQ(queue.Pop(), nullptr);
    }
}

TEST(TaskQueue, MatchesAListUnderEveryMixOfPushAndPop)
{
    // Every sequence of twelve steps: bit set pushes, bit clear pops.
    for (unsigned steps = 0; steps < 1u << 12; ++steps)
    {
        EmptyTask tasks[12];
        TaskQueue queue;
        std::deque<ITask*> expected;
        for (unsigned step = 0; step < 12; ++step)
        {
            if (steps >> step & 1)
            {
                queue.Push(&tasks[step]);
                expected.push_back(&tasks[step]);
                continue;
            }
            ITask* const first = expected.empty() ? nullptr : expected.front();
            ASSERT_EQ(queue.Pop(), first) << steps << ", step " << step;
            if (first)
                expected.pop_front();
        }
    }
}

TEST(TaskQueue, ATaskWithoutItsLinkIsFoundLater)
{
    // A producer between its two steps: the list ends before its task, although the tail is past
    // it.
    EmptyTask a;
    EmptyTask b;
    TaskQueue queue;
    queue.Push(&a);
    queue.Push(&b);
    QueueItemBase<ITask>* const link = a.next.exchange(nullptr);

    EXPECT_EQ(queue.Pop(), nullptr); // a is last in the list, but not the tail
    a.next.store(link);
    EXPECT_EQ(queue.Pop(), &a);
    EXPECT_EQ(queue.Pop(), &b);
}

TEST(TaskQueue, AppendingClearsTheLink)
{
    EmptyTask a;
    EmptyTask other;
    a.next.store(&other);
    TaskQueue queue;
    queue.Push(&a);
    EXPECT_EQ(a.next.load(), nullptr);
    EXPECT_EQ(queue.Pop(), &a);
    EXPECT_EQ(queue.Pop(), nullptr);
}
