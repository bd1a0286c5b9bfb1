#include "gles/Fence.h"

#include "gles/GlContext.h"

#include <gtest/gtest.h>

using namespace Nib;
using GLES::Fence;

namespace
{

struct Released
{
    void operator()(Fence* fence) const { fence->Release(); }
};

struct FenceTest : ::testing::Test
{
    GlContext gl;
    std::unique_ptr<Fence, Released> fence{new Fence};
};

} // namespace

TEST_F(FenceTest, IsMadeWithoutASyncObject)
{
    EXPECT_EQ(gl.driver.CallCount(), 0u);
    EXPECT_EQ(gl.driver.Live().syncs, 0);
}

TEST_F(FenceTest, InsertMakesASyncObject)
{
    fence->Insert();

    EXPECT_EQ(gl.Issued(), Sequence({Call("glFenceSync", GL_SYNC_GPU_COMMANDS_COMPLETE, 0)}));
    EXPECT_EQ(gl.driver.Live().syncs, 1);
}

TEST_F(FenceTest, ASecondInsertDeletesTheFirstSyncObject)
{
    fence->Insert();
    gl.Forget();

    fence->Insert();

    EXPECT_EQ(gl.driver.CallNames(), Names({"glDeleteSync", "glFenceSync"}));
    EXPECT_EQ(gl.driver.Live().syncs, 1);
}

TEST_F(FenceTest, WaitFlushesAndTakesNanoseconds)
{
    fence->Insert();
    gl.Forget();

    fence->Wait(1234567);

    EXPECT_EQ(gl.Issued(),
              Sequence({Call("glClientWaitSync", kAddress, GL_SYNC_FLUSH_COMMANDS_BIT, 1234567)}));
}

TEST_F(FenceTest, WaitAnswersZeroWhenTheFenceWasPassedBefore)
{
    gl.driver.SetPace(SimPace::Instant);
    fence->Insert();

    EXPECT_EQ(static_cast<int>(fence->Wait(0)), 0);
    EXPECT_EQ(fence->Wait(0), IFence::Signaled);
}

TEST_F(FenceTest, WaitAnswersZeroWhenTheFenceIsPassedMeanwhile)
{
    gl.driver.SetPace(SimPace::OnWait);
    fence->Insert();

    EXPECT_EQ(static_cast<int>(fence->Wait(1000)), 0);
}

TEST_F(FenceTest, WaitAnswersOneWhenTheTimeIsOver)
{
    gl.driver.SetPace(SimPace::Held);
    fence->Insert();

    EXPECT_EQ(static_cast<int>(fence->Wait(0)), 1);
    EXPECT_EQ(fence->Wait(1000), IFence::NotSignaled);
    EXPECT_TRUE(gl.driver.Log().empty());
}

TEST_F(FenceTest, AWaitThatFailsAnswersTwoAndReportsTheErrors)
{
    fence->Insert();
    gl.driver.FailNext("glClientWaitSync", GL_OUT_OF_MEMORY);

    EXPECT_EQ(static_cast<int>(fence->Wait(0)), 2);

    EXPECT_EQ(gl.Log(ANDROID_LOG_ERROR),
              (Texts{"static bool Nib::OpenGLRenderer::reportAndResetAllGLErrors(const char *) : "
                     "Fence::Wait(unsigned long long timeout) glError = 0x0505"}));
    EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_NO_ERROR));
}

TEST_F(FenceTest, WaitWithoutTimeoutWaitsAsLongAsItTakes)
{
    gl.driver.SetPace(SimPace::OnWait);
    fence->Insert();
    gl.Forget();

    EXPECT_EQ(static_cast<int>(fence->Wait()), 0);

    const SimCall wait = gl.driver.LastCall("glClientWaitSync");
    EXPECT_EQ(wait.args[1], SimValue(GL_SYNC_FLUSH_COMMANDS_BIT));
    EXPECT_EQ(static_cast<unsigned long long>(wait.Arg(2)), 0xFFFFFFFFFFFFFFFFull);
}

TEST_F(FenceTest, WaitWithoutAnInsertedFenceReturnsAtOnce)
{
    EXPECT_EQ(static_cast<int>(fence->Wait()), 0);

    EXPECT_EQ(gl.driver.CallCount(), 0u);
}

TEST_F(FenceTest, GetStatusAsksForTheSyncStatus)
{
    fence->Insert();
    gl.Forget();

    fence->GetStatus();

    EXPECT_EQ(gl.Issued(),
              Sequence({Call("glGetSynciv", kAddress, GL_SYNC_STATUS, 4, kAddress, kAddress)}));
}

TEST_F(FenceTest, GetStatusAnswersZeroWhenSignalled)
{
    gl.driver.SetPace(SimPace::Instant);
    fence->Insert();

    EXPECT_EQ(static_cast<int>(fence->GetStatus()), 0);
}

TEST_F(FenceTest, GetStatusAnswersOneWhenNotSignalled)
{
    gl.driver.SetPace(SimPace::Held);
    fence->Insert();

    EXPECT_EQ(static_cast<int>(fence->GetStatus()), 1);
}

TEST_F(FenceTest, GetStatusAnswersTwoWhenTheQueryFails)
{
    fence->Insert();
    gl.driver.FailNext("glGetSynciv", GL_INVALID_VALUE);

    EXPECT_EQ(static_cast<int>(fence->GetStatus()), 2);
    glGetError();
}

TEST_F(FenceTest, IsPassedOnceTheGpuIsDone)
{
    gl.driver.SetPace(SimPace::Held);
    fence->Insert();
    EXPECT_EQ(fence->GetStatus(), IFence::NotSignaled);

    gl.driver.ReleaseGpu();

    EXPECT_EQ(fence->GetStatus(), IFence::Signaled);
    EXPECT_EQ(fence->Wait(0), IFence::Signaled);
}

TEST_F(FenceTest, ReleaseDeletesTheSyncObject)
{
    fence->Insert();
    gl.Forget();

    fence.reset();

    EXPECT_EQ(gl.driver.CallNames(), Names({"glDeleteSync"}));
    EXPECT_EQ(gl.driver.Live().syncs, 0);
}

TEST_F(FenceTest, ReleaseDeletesTheNullSyncObjectToo)
{
    fence.reset();

    EXPECT_EQ(gl.driver.Calls(),
              Sequence({Call("glDeleteSync", static_cast<const void*>(nullptr))}));
}
