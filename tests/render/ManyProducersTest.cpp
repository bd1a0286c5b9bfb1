// Eight threads post a million tasks to one render thread.

#include "render/RenderTestSupport.h"

#include <gtest/gtest.h>

#include <array>

using namespace Nib;

namespace
{

constexpr int kProducers = 8;
constexpr int kTasksEach = 125'000;

/// What one producer's tasks have done; touched by the render thread alone.
struct Tally
{
    int ran = 0;
    bool inOrder = true;
};

class NumberedTask : public ITask
{
public:
    NumberedTask(Tally& tally, int number) : m_tally(tally), m_number(number) {}
    void run() override
    {
        m_tally.inOrder = m_tally.inOrder && m_number == m_tally.ran;
        ++m_tally.ran;
    }

private:
    Tally& m_tally;
    int m_number;
};

using Tallies = std::array<Tally, kProducers>;

std::vector<std::thread> StartProducers(IGLMsgQueue* queue, Tallies& tallies)
{
    std::vector<std::thread> producers;
    for (Tally& tally : tallies)
    {
        producers.emplace_back(
            [queue, &tally]
            {
                for (int number = 0; number < kTasksEach; ++number)
                    queue->enQueueMsg(new NumberedTask(tally, number));
            });
    }
    return producers;
}

void ExpectAllRanInOrder(const Tallies& tallies)
{
    for (const Tally& tally : tallies)
    {
        EXPECT_EQ(tally.ran, 125'000);
        EXPECT_TRUE(tally.inOrder);
    }
}

TEST(ManyProducers, OnASurfaceThreadLoseNoTaskAndKeepTheirOrder)
{
    SimDriver driver;
    std::unique_ptr<RenderThreadGL> thread(
        GLES::CreateSurfaceRenderer("surface", RenderThreadGL::High));
    thread->Start();
    Tallies tallies;

    std::vector<std::thread> producers = StartProducers(thread->GetMsgQueue(), tallies);
    for (std::thread& producer : producers)
        producer.join();
    EXPECT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    ExpectAllRanInOrder(tallies);
}

TEST(ManyProducers, OnADyingSurfaceThreadLoseNoTask)
{
    SimDriver driver;
    std::unique_ptr<RenderThreadGL> thread(
        GLES::CreateSurfaceRenderer("surface", RenderThreadGL::High));
    thread->Start();
    Tallies tallies;

    std::vector<std::thread> producers = StartProducers(thread->GetMsgQueue(), tallies);
    for (std::thread& producer : producers)
        producer.join();
    thread.reset();

    ExpectAllRanInOrder(tallies);
}

TEST(ManyProducers, OnAnHwuiThreadLoseNoTaskAndKeepTheirOrder)
{
    SimDriver driver;
    HwuiCallback callback{nullptr, nullptr, nullptr};
    std::unique_ptr<RenderThreadHWUI> thread(GLES::CreateHWUIRenderer(&callback, "hwui"));
    driver.RecordCalls(false);
    SimContext context(driver);
    Tallies tallies;
    std::atomic<int> busy{kProducers};

    std::vector<std::thread> producers = StartProducers(thread->GetMsgQueue(), tallies);
    std::thread joiner(
        [&]
        {
            for (std::thread& producer : producers)
            {
                producer.join();
                --busy;
            }
        });
    while (busy > 0)
    {
        thread->Render();
        driver.ForgetLog();
    }
    joiner.join();
    thread->Render(); // what came last
    thread->Render();

    ExpectAllRanInOrder(tallies);
}

} // namespace
