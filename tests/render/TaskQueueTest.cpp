#include "thread/TaskQueue.h"

#include <gtest/gtest.h>

#include <memory>
#include <thread>
#include <vector>

using namespace Nib;

namespace
{

class Numbered : public ITask
{
public:
    explicit Numbered(int n) : number(n) {}
    void run() override {}

    const int number;
};

int PopNumber(TaskQueue& queue)
{
    const std::unique_ptr<ITask> task(queue.Pop());
    return task ? static_cast<Numbered*>(task.get())->number : -1;
}

TEST(TaskQueue, StartsEmpty)
{
    TaskQueue queue;

    EXPECT_EQ(queue.Pop(), nullptr);
    EXPECT_EQ(queue.Pop(), nullptr);
}

TEST(TaskQueue, GivesItemsInTheirOrder)
{
    TaskQueue queue;
    for (int i = 0; i < 5; ++i)
        queue.Push(new Numbered(i));

    for (int i = 0; i < 5; ++i)
        EXPECT_EQ(PopNumber(queue), i);
    EXPECT_EQ(PopNumber(queue), -1);
}

TEST(TaskQueue, MayRunEmptyAndFillAgain)
{
    TaskQueue queue;
    for (int round = 0; round < 100; ++round)
    {
        for (int i = 0; i <= round % 3; ++i)
            queue.Push(new Numbered(i));
        for (int i = 0; i <= round % 3; ++i)
            EXPECT_EQ(PopNumber(queue), i);
        EXPECT_EQ(PopNumber(queue), -1);
    }
}

TEST(TaskQueue, TakesItemsBetweenPops)
{
    TaskQueue queue;
    queue.Push(new Numbered(0));
    queue.Push(new Numbered(1));
    EXPECT_EQ(PopNumber(queue), 0);
    queue.Push(new Numbered(2));
    EXPECT_EQ(PopNumber(queue), 1);
    EXPECT_EQ(PopNumber(queue), 2);
    queue.Push(new Numbered(3));
    EXPECT_EQ(PopNumber(queue), 3);
    EXPECT_EQ(PopNumber(queue), -1);
}

TEST(TaskQueue, AnItemMayBePushedAgainOnceItIsTaken)
{
    TaskQueue queue;
    Numbered item(7);
    for (int round = 0; round < 3; ++round)
    {
        queue.Push(&item);
        EXPECT_EQ(queue.Pop(), &item);
        EXPECT_EQ(queue.Pop(), nullptr);
    }
}

TEST(TaskQueue, LosesNothingAndKeepsEachProducersOrder)
{
    constexpr int kProducers = 4;
    constexpr int kItems = 50'000;
    TaskQueue queue;
    std::vector<std::thread> producers;
    for (int producer = 0; producer < kProducers; ++producer)
    {
        producers.emplace_back(
            [&queue, producer]
            {
                for (int i = 0; i < kItems; ++i)
                    queue.Push(new Numbered(producer * kItems + i));
            });
    }

    std::vector<int> next(kProducers, 0);
    bool inOrder = true;
    for (int taken = 0; taken < kProducers * kItems;)
    {
        const int number = PopNumber(queue);
        if (number < 0)
        {
            std::this_thread::yield();
            continue;
        }
        inOrder = inOrder && number % kItems == next[static_cast<std::size_t>(number / kItems)]++;
        ++taken;
    }
    for (std::thread& producer : producers)
        producer.join();

    EXPECT_TRUE(inOrder);
    EXPECT_EQ(next, (std::vector<int>{50'000, 50'000, 50'000, 50'000}));
    EXPECT_EQ(queue.Pop(), nullptr);
}

} // namespace
