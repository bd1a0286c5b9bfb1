#include <nib/msg_queue.h>

#include <gtest/gtest.h>

#include <thread>

using namespace Nib;

namespace
{

class SomeQueue : public IGLMsgQueue
{
public:
    bool enQueueMsg(ITask*) override { return false; }
    bool waitForCompleting() override { return false; }
    bool isRunning() override { return false; }
    const char* getTag() override { return "some"; }
};

} // namespace

TEST(CurrentQueue, IsNullOnAThreadThatNeverAttached)
{
    EXPECT_EQ(GetCurrentMsgQueue(), nullptr);
}

TEST(CurrentQueue, IsWhatTheThreadAttachedTo)
{
    SomeQueue first;
    SomeQueue second;
    AttachToThread(&first);
    EXPECT_EQ(GetCurrentMsgQueue(), &first);
    AttachToThread(&second);
    EXPECT_EQ(GetCurrentMsgQueue(), &second);
    AttachToThread(nullptr);
    EXPECT_EQ(GetCurrentMsgQueue(), nullptr);
}

TEST(CurrentQueue, BelongsToOneThread)
{
    SomeQueue here;
    SomeQueue there;
    AttachToThread(&here);
    std::thread(
        [&]
        {
            EXPECT_EQ(GetCurrentMsgQueue(), nullptr);
            AttachToThread(&there);
            EXPECT_EQ(GetCurrentMsgQueue(), &there);
        })
        .join();
    EXPECT_EQ(GetCurrentMsgQueue(), &here);
    AttachToThread(nullptr);
}

TEST(MsgQueue, TearingIsNotAllowed)
{
    SomeQueue queue;
    EXPECT_FALSE(queue.setTearingAllowed(true));
    EXPECT_FALSE(queue.setTearingAllowed(false));
}
