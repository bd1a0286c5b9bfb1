// The wait of one thread and its end, down to the system's call, under every order of the steps.

#include "ModelAtomic.h"

#include "base/WaitWord.h"

using namespace Nib;

namespace
{

void ExpectHolds(const std::function<void()>& scenario, long least)
{
    const Model::Result result = Model::Explore(scenario);
    EXPECT_EQ(result.failure, "");
    EXPECT_GE(result.executions, least);
}

} // namespace

TEST(WaitWordModel, AnEndIsNeverMissed)
{
    ExpectHolds(
        []
        {
            WaitWord word;
            Model::Plain answer;
            const int other = Model::Spawn(
                [&]
                {
                    answer.Write();
                    if (word.End())
                        word.WakeSleeper();
                });
            EXPECT_TRUE(word.Sleep());
            answer.Read();
            Model::Join(other);
        },
        4);
}

TEST(WaitWordModel, AWakeThatComesLateDoesNotEndAWaitOfTheSamePlace)
{
    ExpectHolds(
        []
        {
            std::atomic<int> calls{0};
            std::optional<WaitWord> word(std::in_place);
            WaitWord* const place = &*word;
            const auto end = [place]
            {
                if (place->End())
                    place->WakeSleeper();
            };
            const int first = Model::Spawn(end);
            word->Sleep();
            word.emplace();
            const int second = Model::Spawn(
                [&]
                {
                    calls.store(1, std::memory_order_relaxed);
                    end();
                });
            word->Sleep();
            Model::Require(calls.load(std::memory_order_relaxed) == 1, "woken by the first");
            Model::Join(first);
            Model::Join(second);
        },
        4);
}
