#include "device/CheckTask.h"

#include <nib/msg_queue.h>
#include <nib/task.h>

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

namespace
{

/// A queue that runs what it has taken when somebody waits for it.
class TestQueue : public Nib::IGLMsgQueue
{
public:
    explicit TestQueue(bool takes) : m_takes(takes) {}

    bool enQueueMsg(Nib::ITask* task) override
    {
        steps.emplace_back("enQueueMsg");
        if (m_takes)
            m_task.reset(task);
        return m_takes;
    }

    bool waitForCompleting() override
    {
        steps.emplace_back("waitForCompleting");
        if (m_task)
            m_task->run();
        m_task.reset();
        return true;
    }

    bool isRunning() override { return true; }
    const char* getTag() override { return "test"; }

    std::vector<std::string> steps;

private:
    bool m_takes;
    std::unique_ptr<Nib::ITask> m_task;
};

void SayTrue(bool* result)
{
    *result = true;
}

} // namespace

TEST(CheckTask, WaitsForTheAnswer)
{
    TestQueue queue(true);
    bool result = false;

    Nib::RunCheck(queue, &SayTrue, &result);

    EXPECT_TRUE(result);
    EXPECT_EQ(queue.steps, (std::vector<std::string>{"enQueueMsg", "waitForCompleting"}));
}

// Under the address sanitizer this also says that the task is deleted.
TEST(CheckTask, LeavesTheResultWhenTheQueueRefuses)
{
    TestQueue queue(false);
    bool result = false;

    Nib::RunCheck(queue, &SayTrue, &result);

    EXPECT_FALSE(result);
    EXPECT_EQ(queue.steps, (std::vector<std::string>{"enQueueMsg", "waitForCompleting"}));
}
