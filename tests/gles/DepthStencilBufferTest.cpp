#include "gles/DepthStencilBuffer.h"

#include "gles/BoundQueue.h"
#include "gles/GlContext.h"

#include <gtest/gtest.h>

#include <memory>

using namespace Nib;
using GLES::DepthStencilBuffer;

namespace
{

constexpr GLuint kName = 1; // the first name of a new context

struct DepthStencilBufferTest : ::testing::Test
{
    GlContext gl;
    BoundQueue queue;
    std::unique_ptr<DepthStencilBuffer> buffer = std::make_unique<DepthStencilBuffer>();
};

} // namespace

TEST_F(DepthStencilBufferTest, ConstructionSubscribesAndMakesNothing)
{
    EXPECT_TRUE(buffer->IsSubscribed());
    EXPECT_EQ(buffer->GetWidth(), 0u);
    EXPECT_EQ(buffer->GetHeight(), 0u);
    EXPECT_EQ(buffer->GetDepthStencilBuffer(), 0u);
    EXPECT_EQ(gl.driver.CallCount(), 0u);
}

TEST_F(DepthStencilBufferTest, CreateBufferMakesStorageOfTheSize)
{
    buffer->CreateBuffer(64, 32);

    EXPECT_EQ(gl.Issued(),
              Sequence({Call("glGenRenderbuffers", 1, kAddress),
                        Call("glBindRenderbuffer", GL_RENDERBUFFER, kName),
                        Call("glRenderbufferStorage", GL_RENDERBUFFER, GL_DEPTH24_STENCIL8, 64, 32),
                        Call("glGetError")}));
    EXPECT_EQ(gl.Log(ANDROID_LOG_INFO),
              (Texts{"void Nib::GLES::DepthStencilBuffer::CreateBuffer(unsigned int, unsigned int) "
                     "- mDepthStencilBuffer (64 x 32) glID = 1"}));
    EXPECT_EQ(gl.driver.Log().size(), 1u);
    EXPECT_EQ(buffer->GetWidth(), 64u);
    EXPECT_EQ(buffer->GetHeight(), 32u);
    EXPECT_EQ(buffer->GetDepthStencilBuffer(), kName);
}

TEST_F(DepthStencilBufferTest, TheRenderbufferStaysBound)
{
    buffer->CreateBuffer(64, 32);

    GLint bound = 0;
    glGetIntegerv(GL_RENDERBUFFER_BINDING, &bound);
    EXPECT_EQ(bound, static_cast<GLint>(kName));
}

TEST_F(DepthStencilBufferTest, WithoutANameItWritesAnErrorAndKeepsNoSize)
{
    gl.driver.FailNext("glGenRenderbuffers", GL_OUT_OF_MEMORY);

    buffer->CreateBuffer(64, 32);

    EXPECT_EQ(gl.driver.CallNames(), Names({"glGenRenderbuffers", "glGetError", "glGetError"}));
    EXPECT_EQ(gl.Log(ANDROID_LOG_ERROR),
              (Texts{"void Nib::GLES::DepthStencilBuffer::CreateBuffer(unsigned int, unsigned int) "
                     "- glGenRenderbuffers failed",
                     "static bool Nib::OpenGLRenderer::reportAndResetAllGLErrors(const char *) : "
                     "DepthStencilBuffer::CreateBuffer glError = 0x0505"}));
    EXPECT_EQ(buffer->GetDepthStencilBuffer(), 0u);
    EXPECT_EQ(buffer->GetWidth(), 0u);
    EXPECT_EQ(buffer->GetHeight(), 0u);
}

TEST_F(DepthStencilBufferTest, ErrorsOfTheStorageAreReportedAndCleared)
{
    gl.driver.FailNext("glRenderbufferStorage", GL_OUT_OF_MEMORY);

    buffer->CreateBuffer(64, 32);

    EXPECT_EQ(gl.Log(ANDROID_LOG_ERROR),
              (Texts{"static bool Nib::OpenGLRenderer::reportAndResetAllGLErrors(const char *) : "
                     "DepthStencilBuffer::CreateBuffer glError = 0x0505"}));
    EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_NO_ERROR));
    EXPECT_EQ(buffer->GetWidth(), 64u);
}

TEST_F(DepthStencilBufferTest, DestroyBufferDeletesTheNameAndKeepsTheSize)
{
    buffer->CreateBuffer(64, 32);
    gl.Forget();

    buffer->DestroyBuffer();

    EXPECT_EQ(gl.driver.LastCall("glDeleteRenderbuffers").list, (std::vector<long long>{kName}));
    EXPECT_EQ(gl.driver.CallCount(), 1u);
    EXPECT_EQ(buffer->GetDepthStencilBuffer(), 0u);
    EXPECT_EQ(buffer->GetWidth(), 64u);
    EXPECT_EQ(buffer->GetHeight(), 32u);
}

TEST_F(DepthStencilBufferTest, DestroyBufferWithoutANameDoesNothing)
{
    buffer->DestroyBuffer();

    EXPECT_EQ(gl.driver.CallCount(), 0u);
}

TEST_F(DepthStencilBufferTest, IsRebuiltAtItsSizeAfterAContextLoss)
{
    buffer->CreateBuffer(64, 32);

    queue.observer.DispatchRelease();
    EXPECT_EQ(buffer->GetDepthStencilBuffer(), 0u);
    EXPECT_EQ(gl.driver.Live().renderbuffers, 0);

    queue.observer.DispatchRestore();
    const SimRenderbufferState state = gl.driver.Renderbuffer(buffer->GetDepthStencilBuffer());
    EXPECT_TRUE(state.exists);
    EXPECT_EQ(state.width, 64);
    EXPECT_EQ(state.height, 32);
    EXPECT_EQ(state.internalFormat, static_cast<GLenum>(GL_DEPTH24_STENCIL8));
}

TEST_F(DepthStencilBufferTest, WithoutStorageItIsReleasedAndRestoredWithoutACall)
{
    queue.observer.DispatchRelease();
    queue.observer.DispatchRestore();

    EXPECT_EQ(gl.driver.CallCount(), 0u);
}

TEST_F(DepthStencilBufferTest, WithOneSideZeroItIsNotRebuilt)
{
    buffer->CreateBuffer(64, 0);
    buffer->ReleaseGLObject();
    gl.Forget();
    buffer->RestoreGLObject();
    EXPECT_EQ(gl.driver.CallCount(), 0u);

    buffer->CreateBuffer(0, 32);
    buffer->ReleaseGLObject();
    gl.Forget();
    buffer->RestoreGLObject();
    EXPECT_EQ(gl.driver.CallCount(), 0u);
}

TEST_F(DepthStencilBufferTest, RestoredWithoutAReleaseItWritesTheLogicErrorAndKeepsItsName)
{
    buffer->CreateBuffer(64, 32);
    buffer->ReleaseGLObject();
    buffer->RestoreGLObject();
    const GLuint name = buffer->GetDepthStencilBuffer();
    gl.Forget();

    buffer->RestoreGLObject();

    EXPECT_EQ(gl.Log(ANDROID_LOG_ERROR),
              (Texts{Text("virtual void Nib::GLES::DepthStencilBuffer::RestoreGLObject() - Logic "
                          "error! glID = %d",
                          static_cast<int>(name))}));
    EXPECT_EQ(gl.driver.CallCount(), 0u);
    EXPECT_EQ(buffer->GetDepthStencilBuffer(), name);
    EXPECT_TRUE(gl.driver.Renderbuffer(name).exists);
}

TEST_F(DepthStencilBufferTest, DestructionUnsubscribesAndDeletesTheName)
{
    buffer->CreateBuffer(64, 32);
    gl.Forget();

    buffer.reset();

    EXPECT_EQ(gl.driver.CallNames(), Names({"glDeleteRenderbuffers"}));
    EXPECT_EQ(gl.driver.Live().renderbuffers, 0);
    queue.observer.DispatchRelease();
    EXPECT_TRUE(gl.driver.Log().empty());
}

TEST_F(DepthStencilBufferTest, DestructionWhileDispatchingIsNamedByTheWholeType)
{
    // The line is written while the derived part still stands.
    auto other = std::make_unique<DepthStencilBuffer>();
    class First : public ManagedObject
    {
    public:
        explicit First(std::unique_ptr<DepthStencilBuffer>& victim) : m_victim(victim) {}
        void ReleaseGLObject() override {}
        void RestoreGLObject() override { m_victim.reset(); }

    private:
        std::unique_ptr<DepthStencilBuffer>& m_victim;
    } first(buffer);
    buffer.reset(new DepthStencilBuffer); // behind `other`
    first.Register();
    queue.observer.DispatchRelease();
    gl.Forget();

    queue.observer.DispatchRestore();

    EXPECT_EQ(gl.Log(ANDROID_LOG_DEBUG),
              (Texts{"Warning! Unsubscribe while dispatch, N3Nib4GLES18DepthStencilBufferE"}));
}

TEST_F(DepthStencilBufferTest, ReleaseDeletesTheObject)
{
    buffer->CreateBuffer(64, 32);
    IDepthStencilBuffer* const interface = buffer.release();

    interface->Release();

    EXPECT_EQ(gl.driver.Live().renderbuffers, 0);
}
