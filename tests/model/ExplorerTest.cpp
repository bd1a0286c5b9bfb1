// The checker finds what the memory model allows, and nothing else: known litmus tests.

#include "ModelAtomic.h"

#include <algorithm>
#include <array>
#include <set>

namespace
{

using Model::Atomic;
using Outcome = std::array<int, 2>;
using Outcomes = std::set<Outcome>;

/// All results of two threads that share two atomics, which begin as 0.
template <typename First, typename Second>
Outcomes OutcomesOf(First first, Second second)
{
    Outcomes outcomes;
    const Model::Result result = Model::Explore(
        [&]
        {
            Atomic<int> x{0};
            Atomic<int> y{0};
            int a = 0;
            int b = 0;
            const int one = Model::Spawn([&] { a = first(x, y); });
            const int two = Model::Spawn([&] { b = second(x, y); });
            Model::Join(one);
            Model::Join(two);
            outcomes.insert({a, b});
        });
    EXPECT_EQ(result.failure, "");
    return outcomes;
}

using AtomicInt = Atomic<int>;

Outcomes StoreBuffering(std::memory_order store, std::memory_order load)
{
    return OutcomesOf(
        [=](AtomicInt& x, AtomicInt& y)
        {
            x.store(1, store);
            return y.load(load);
        },
        [=](AtomicInt& x, AtomicInt& y)
        {
            y.store(1, store);
            return x.load(load);
        });
}

/// The second thread gives what it read from both, as 10 * y + x.
Outcomes MessagePassing(std::memory_order store, std::memory_order load)
{
    return OutcomesOf(
        [=](AtomicInt& x, AtomicInt& y)
        {
            x.store(1, std::memory_order_relaxed);
            y.store(1, store);
            return 0;
        },
        [=](AtomicInt& x, AtomicInt& y)
        {
            const int message = y.load(load);
            return 10 * message + x.load(std::memory_order_relaxed);
        });
}

constexpr auto kRelaxed = std::memory_order_relaxed;
constexpr auto kAcquire = std::memory_order_acquire;
constexpr auto kRelease = std::memory_order_release;
constexpr auto kSequential = std::memory_order_seq_cst;

} // namespace

TEST(Explorer, FindsThatBothMayMissTheOthersStore)
{
    const Outcomes all{{0, 0}, {0, 1}, {1, 0}, {1, 1}};
    EXPECT_EQ(StoreBuffering(kRelaxed, kRelaxed), all);
    EXPECT_EQ(StoreBuffering(kRelease, kAcquire), all);
}

TEST(Explorer, KnowsThatSequentialStoresAreNotMissedByBoth)
{
    EXPECT_EQ(StoreBuffering(kSequential, kSequential), (Outcomes{{0, 1}, {1, 0}, {1, 1}}));
}

TEST(Explorer, FindsThatARelaxedMessageMayComeWithoutItsData)
{
    const Outcomes all{{0, 0}, {0, 1}, {0, 10}, {0, 11}};
    EXPECT_EQ(MessagePassing(kRelaxed, kRelaxed), all);
    EXPECT_EQ(MessagePassing(kRelease, kRelaxed), all);
    EXPECT_EQ(MessagePassing(kRelaxed, kAcquire), all);
}

TEST(Explorer, KnowsThatAReleasedMessageBringsItsData)
{
    EXPECT_EQ(MessagePassing(kRelease, kAcquire), (Outcomes{{0, 0}, {0, 1}, {0, 11}}));
}

TEST(Explorer, KnowsThatAddingPassesOnWhatWasReleased)
{
    const Outcomes outcomes = OutcomesOf(
        [](AtomicInt& x, AtomicInt& y)
        {
            x.store(1, kRelaxed);
            y.store(1, kRelease);
            return y.fetch_add(1, kRelaxed);
        },
        [](AtomicInt& x, AtomicInt& y)
        {
            const int message = y.load(kAcquire);
            return 10 * message + x.load(kRelaxed);
        });
    EXPECT_EQ(outcomes, (Outcomes{{1, 0}, {1, 1}, {1, 11}, {1, 21}}));
}

TEST(Explorer, LosesNoAddition)
{
    const auto add = [](AtomicInt& x, AtomicInt&) { return x.fetch_add(1, kRelaxed); };
    EXPECT_EQ(OutcomesOf(add, add), (Outcomes{{0, 1}, {1, 0}}));
}

TEST(Explorer, FindsPlainVariablesWithoutOrder)
{
    const Model::Result result = Model::Explore(
        []
        {
            Model::Plain data;
            Atomic<int> ready{0};
            const int writer = Model::Spawn(
                [&]
                {
                    data.Write();
                    ready.store(1, kRelaxed);
                });
            if (ready.load(kAcquire) == 1)
                data.Read();
            Model::Join(writer);
        });
    EXPECT_EQ(result.failure, "a plain variable is read without order");
}

TEST(Explorer, FindsThreadsThatWaitForEver)
{
    const Model::Result result = Model::Explore(
        []
        {
            Atomic<int> never{0};
            while (never.load(kAcquire) == 0)
            {
            }
        });
    EXPECT_EQ(result.failure, "threads wait for ever");
}

TEST(Explorer, SeesEveryOrderOnce)
{
    // Three threads, two additions each to one atomic: 6! / (2! 2! 2!) orders, none of which is like
    // another.
    std::set<std::vector<int>> orders;
    const Model::Result result = Model::Explore(
        [&]
        {
            std::vector<int> order;
            Atomic<int> counter{0};
            std::vector<int> threads;
            for (int number = 0; number < 3; ++number)
            {
                threads.push_back(Model::Spawn(
                    [&, number]
                    {
                        for (int time = 0; time < 2; ++time)
                        {
                            counter.fetch_add(1, kRelaxed);
                            order.push_back(number);
                        }
                    }));
            }
            for (const int thread : threads)
                Model::Join(thread);
            orders.insert(order);
        });
    EXPECT_EQ(result.failure, "");
    EXPECT_EQ(orders.size(), 90u);
    EXPECT_EQ(result.executions, 90);
}
