// Fences of real drivers, waited for and polled; frame times, which none of them has.

#include "drivers/EglOnDriver.h"

#include <nib/egl_timing.h>

#include <memory>
#include <thread>
#include <vector>

using namespace Nib;

namespace
{

using Result = EglSyncObject::WaitResult;
using State = EglSyncObject::ObjectState;

class FenceOnDriver : public EglOnDriver
{
protected:
    void SetUp() override
    {
        EglOnDriver::SetUp();
        if (IsSkipped())
            return;
        ASSERT_NO_FATAL_FAILURE(MakeReady(m_context, m_surface));
        glGenTextures(1, &m_texture);
        glBindTexture(GL_TEXTURE_2D, m_texture);
        glTexImage2D(GL_TEXTURE_2D, 0, GL_RGBA, kSize, kSize, 0, GL_RGBA, GL_UNSIGNED_BYTE,
                     nullptr);
        glGenFramebuffers(1, &m_framebuffer);
        glBindFramebuffer(GL_FRAMEBUFFER, m_framebuffer);
        glFramebufferTexture2D(GL_FRAMEBUFFER, GL_COLOR_ATTACHMENT0, GL_TEXTURE_2D, m_texture, 0);
        ASSERT_EQ(glCheckFramebufferStatus(GL_FRAMEBUFFER), GLenum{GL_FRAMEBUFFER_COMPLETE});
    }

    void TearDown() override
    {
        if (m_framebuffer != 0)
            glDeleteFramebuffers(1, &m_framebuffer);
        if (m_texture != 0)
            glDeleteTextures(1, &m_texture);
        EglOnDriver::TearDown();
    }

    static std::unique_ptr<EglSyncObject> NewFence()
    {
        return std::unique_ptr<EglSyncObject>(EglSyncObject::CreateEglSyncObject());
    }

    /// Work that takes the driver some milliseconds, and is not begun before a flush.
    static void DrawMuch()
    {
        glEnable(GL_SCISSOR_TEST);
        for (int i = 0; i < 16; ++i)
        {
            glScissor(i, 0, kSize - i, kSize);
            Clear(static_cast<float>(i) / 15.0f, 0.0f, 0.0f, 1.0f);
        }
        glDisable(GL_SCISSOR_TEST);
    }

    static constexpr int kSize = 1024; // pixels, in both directions

    EglContext m_context;
    HybridSurface m_surface;
    GLuint m_texture = 0;
    GLuint m_framebuffer = 0;
};

TEST_F(FenceOnDriver, WaitEndsWhenTheWorkIsDone)
{
    DrawMuch();
    const auto fence = NewFence();
    ASSERT_NE(fence, nullptr);

    EXPECT_EQ(fence->Wait(), Result::Passed);

    EXPECT_EQ(fence->GetState(), State::Signaled);
    EXPECT_EQ(PixelAt(kSize - 1, 0), (Rgba{255, 0, 0, 255}));
}

TEST_F(FenceOnDriver, PollingSeesTheEnd)
{
    DrawMuch();
    const auto fence = NewFence();
    ASSERT_NE(fence, nullptr);
    ASSERT_NE(fence->GetState(), State::Unknown);

    // A wait flushes; polling alone need not.
    while (fence->WaitTimeout(0) == Result::TimedOut)
        std::this_thread::yield();

    EXPECT_EQ(fence->GetState(), State::Signaled);
    EXPECT_EQ(fence->WaitTimeout(0), Result::Passed);
}

TEST_F(FenceOnDriver, LongTimeOutIsNotUsedUp)
{
    DrawMuch();
    const auto fence = NewFence();
    ASSERT_NE(fence, nullptr);

    EXPECT_EQ(fence->WaitTimeout(60'000'000'000u), Result::Passed);
}

TEST_F(FenceOnDriver, AnotherThreadWaitsWithoutAContext)
{
    DrawMuch();
    const auto fence = NewFence();
    ASSERT_NE(fence, nullptr);
    glFlush();
    Result result = Result::Failed;
    State state = State::Unknown;

    std::thread waiter(
        [&]
        {
            result = fence->Wait();
            state = fence->GetState();
        });
    waiter.join();

    EXPECT_EQ(result, Result::Passed);
    EXPECT_EQ(state, State::Signaled);
}

TEST_F(FenceOnDriver, LaterFenceComesAfterTheEarlierOne)
{
    std::vector<std::unique_ptr<EglSyncObject>> fences;
    for (int i = 0; i < 4; ++i)
    {
        DrawMuch();
        fences.push_back(NewFence());
        ASSERT_NE(fences.back(), nullptr);
    }

    EXPECT_EQ(fences.back()->Wait(), Result::Passed);

    for (const auto& fence : fences)
        EXPECT_EQ(fence->GetState(), State::Signaled);
}

TEST_F(FenceOnDriver, WithoutAContextThereIsNone)
{
    glDeleteFramebuffers(1, &m_framebuffer);
    glDeleteTextures(1, &m_texture);
    m_framebuffer = m_texture = 0;
    Egl::GetInstance()->MakeCurrent(nullptr, nullptr);

    EXPECT_EQ(NewFence(), nullptr);
}

TEST_F(FenceOnDriver, FrameTimesAreNotThere)
{
    EXPECT_FALSE(EglFrameTime::IsFrameTimestampSupported());
    EXPECT_FALSE(IsPresentationTimeSupported());
    EXPECT_EQ(EglFrameTime::GetForNextFrame(), nullptr);
}

} // namespace
