#include "gles/OffscreenRenderTarget.h"

#include "gles/BoundQueue.h"
#include "gles/DepthStencilBuffer.h"
#include "gles/GlContext.h"
#include "gles/TextureObject.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <memory>
#include <new>
#include <stdexcept>

using namespace Nib;
using GLES::DepthStencilBuffer;
using GLES::OffscreenRenderTarget;
using GLES::TextureObject;

namespace
{

constexpr GLuint kFbo = 1; // the first name of a new context

TextureDescriptor Rgba8(int width, int height)
{
    TextureDescriptor descriptor;
    descriptor.width = width;
    descriptor.height = height;
    return descriptor;
}

/// A context and a managed queue, with a texture of 16 x 8 pixels for the targets of the tests.
struct Offscreen : ::testing::Test
{
    Offscreen() : texture(Rgba8(16, 8), nullptr, nullptr, 0)
    {
        texture.SetTag("page");
        gl.Forget();
    }

    GLuint TextureName() const { return texture.internals().glID; }

    /// A depth and stencil buffer with storage.
    std::unique_ptr<DepthStencilBuffer> NewDepthStencil()
    {
        auto buffer = std::make_unique<DepthStencilBuffer>();
        buffer->CreateBuffer(16, 8);
        return buffer;
    }

    GlContext gl;
    BoundQueue queue;
    TextureObject texture;
};

std::vector<SimCall> Binding(GLuint fbo)
{
    return {Call("glBindFramebuffer", GL_FRAMEBUFFER, fbo)};
}

/// The text of the logic error that @p call throws.
template <typename Function>
std::string LogicErrorOf(Function call)
{
    try
    {
        call();
    }
    catch (const std::logic_error& error)
    {
        return error.what();
    }
    return "nothing was thrown";
}

} // namespace

using OffscreenRenderTargetTest = Offscreen;

TEST_F(OffscreenRenderTargetTest, ConstructionMakesAFramebufferAndAttachesTheTexture)
{
    OffscreenRenderTarget target(&texture);

    EXPECT_EQ(gl.Issued(), Sequence({Call("glGenFramebuffers", 1, kAddress),
                                     Call("glBindTexture", GL_TEXTURE_2D, 0),
                                     Call("glBindFramebuffer", GL_FRAMEBUFFER, kFbo),
                                     Call("glFramebufferTexture2D", GL_FRAMEBUFFER,
                                          GL_COLOR_ATTACHMENT0, GL_TEXTURE_2D, TextureName(), 0),
                                     Call("glCheckFramebufferStatus", GL_FRAMEBUFFER)}));
    EXPECT_EQ(gl.Log(ANDROID_LOG_DEBUG),
              (Texts{Text("bool Nib::GLES::OffscreenRenderTarget::CreateFbo() - NibFrameBuffer: "
                          "%p, FBO:1 Tex: %d, Tag: page",
                          static_cast<void*>(&target), static_cast<int>(TextureName()))}));
    EXPECT_EQ(gl.driver.Log().size(), 1u);
    EXPECT_EQ(target.GetFbo(), kFbo);
}

TEST_F(OffscreenRenderTargetTest, IsNotSubscribedToTheQueue)
{
    OffscreenRenderTarget target(&texture);

    EXPECT_FALSE(target.IsSubscribed());
}

TEST_F(OffscreenRenderTargetTest, TakesItsSizeFromTheTexture)
{
    OffscreenRenderTarget target(&texture);
    gl.Forget();

    target.Activate();

    EXPECT_EQ(gl.Issued(), Sequence({Call("glBindFramebuffer", GL_FRAMEBUFFER, kFbo),
                                     Call("glViewport", 0, 0, 16, 8)}));
}

TEST_F(OffscreenRenderTargetTest, DestructionWritesALineAndDeletesTheFramebufferOnly)
{
    std::unique_ptr<DepthStencilBuffer> depth = NewDepthStencil();
    auto target = std::make_unique<OffscreenRenderTarget>(&texture);
    target->AttachDepthStencilBuffer(depth.get());
    const std::string line = Text("virtual Nib::GLES::OffscreenRenderTarget::"
                                  "~OffscreenRenderTarget() - NibFrameBuffer: %p, FBO:1",
                                  static_cast<void*>(target.get()));
    gl.Forget();

    target.reset();

    EXPECT_EQ(gl.Issued(), Sequence({Call("glDeleteFramebuffers", 1, kAddress)}));
    EXPECT_EQ(gl.driver.LastCall("glDeleteFramebuffers").list, (std::vector<long long>{kFbo}));
    EXPECT_EQ(gl.Log(ANDROID_LOG_DEBUG), (Texts{line}));
    EXPECT_EQ(gl.driver.Log().size(), 1u);
    EXPECT_TRUE(gl.driver.Texture(TextureName()).exists);
    EXPECT_TRUE(gl.driver.Renderbuffer(depth->GetDepthStencilBuffer()).exists);
}

TEST_F(OffscreenRenderTargetTest, ReleaseDeletesTheObject)
{
    IOffscreenRenderTarget* target = new OffscreenRenderTarget(&texture);

    target->Release();

    EXPECT_EQ(gl.driver.Live().framebuffers, 0);
}

TEST_F(OffscreenRenderTargetTest, WithoutAFramebufferNameNothingIsAttached)
{
    gl.driver.FailNext("glGenFramebuffers", GL_OUT_OF_MEMORY);

    auto target = std::make_unique<OffscreenRenderTarget>(&texture);

    EXPECT_EQ(gl.driver.CallNames(), Names({"glGenFramebuffers", "glGetError"}));
    EXPECT_EQ(gl.Log(ANDROID_LOG_DEBUG),
              (Texts{Text("bool Nib::GLES::OffscreenRenderTarget::CreateFbo() - NibFrameBuffer: "
                          "%p, FBO:0 Tex: %d, Tag: page",
                          static_cast<void*>(target.get()), static_cast<int>(TextureName()))}));
    EXPECT_EQ(gl.Log(ANDROID_LOG_ERROR),
              (Texts{"bool Nib::GLES::OffscreenRenderTarget::CreateFbo() - Framebuffer is 0. "
                     "glError = 0x505 "}));
    EXPECT_EQ(static_cast<int>(target->GetFbo()), -1);
    gl.driver.AllowMisuse("glDeleteFramebuffers");
    target.reset();
}

TEST_F(OffscreenRenderTargetTest, AnIncompleteColorAttachmentThrowsAndDeletesTheFramebuffer)
{
    // In memory of the test's own, so that the address in the message is known.
    alignas(OffscreenRenderTarget) std::byte memory[sizeof(OffscreenRenderTarget)];
    gl.driver.FailNext("glCheckFramebufferStatus", GL_FRAMEBUFFER_UNSUPPORTED);

    const std::string text = LogicErrorOf([&] { new (memory) OffscreenRenderTarget(&texture); });

    const std::string expected =
        Text("glError: createFBO failed. Status = 36061 NibFrameBuffer:%p FBO:1 Tex:%d Tag:page "
             "func:bool Nib::GLES::OffscreenRenderTarget::AttachColorToFbo()",
             static_cast<void*>(memory), static_cast<int>(TextureName()));
    EXPECT_EQ(text, expected);
    EXPECT_EQ(gl.Log(ANDROID_LOG_ERROR), (Texts{expected}));
    EXPECT_EQ(gl.driver.CallNames(), Names({"glGenFramebuffers", "glBindTexture",
                                            "glBindFramebuffer", "glFramebufferTexture2D",
                                            "glCheckFramebufferStatus", "glDeleteFramebuffers"}));
    EXPECT_EQ(gl.driver.Live().framebuffers, 0);
}

TEST_F(OffscreenRenderTargetTest, AttachBindsTheFramebufferAndAttachesTheRenderbuffer)
{
    std::unique_ptr<DepthStencilBuffer> depth = NewDepthStencil();
    OffscreenRenderTarget target(&texture);
    gl.Forget();

    target.AttachDepthStencilBuffer(depth.get());

    EXPECT_EQ(gl.Issued(), Sequence({Call("glBindFramebuffer", GL_FRAMEBUFFER, kFbo),
                                     Call("glFramebufferRenderbuffer", GL_FRAMEBUFFER,
                                          GL_DEPTH_STENCIL_ATTACHMENT, GL_RENDERBUFFER,
                                          depth->GetDepthStencilBuffer()),
                                     Call("glCheckFramebufferStatus", GL_FRAMEBUFFER)}));
    EXPECT_TRUE(gl.driver.Log().empty());
}

TEST_F(OffscreenRenderTargetTest, ASecondAttachDetachesTheFirstBufferBefore)
{
    std::unique_ptr<DepthStencilBuffer> first = NewDepthStencil();
    std::unique_ptr<DepthStencilBuffer> second = NewDepthStencil();
    OffscreenRenderTarget target(&texture);
    target.AttachDepthStencilBuffer(first.get());
    gl.Forget();

    target.AttachDepthStencilBuffer(second.get());

    EXPECT_EQ(gl.Issued(), Sequence({Call("glBindFramebuffer", GL_FRAMEBUFFER, kFbo),
                                     Call("glFramebufferRenderbuffer", GL_FRAMEBUFFER,
                                          GL_DEPTH_STENCIL_ATTACHMENT, GL_RENDERBUFFER, 0),
                                     Call("glCheckFramebufferStatus", GL_FRAMEBUFFER),
                                     Call("glBindFramebuffer", GL_FRAMEBUFFER, kFbo),
                                     Call("glFramebufferRenderbuffer", GL_FRAMEBUFFER,
                                          GL_DEPTH_STENCIL_ATTACHMENT, GL_RENDERBUFFER,
                                          second->GetDepthStencilBuffer()),
                                     Call("glCheckFramebufferStatus", GL_FRAMEBUFFER)}));
    EXPECT_EQ(gl.driver.Framebuffer(kFbo).attachments.at(GL_DEPTH_ATTACHMENT).name,
              second->GetDepthStencilBuffer());
    EXPECT_EQ(gl.driver.Framebuffer(kFbo).attachments.at(GL_STENCIL_ATTACHMENT).name,
              second->GetDepthStencilBuffer());
}

TEST_F(OffscreenRenderTargetTest, AnIncompleteAttachThrows)
{
    std::unique_ptr<DepthStencilBuffer> depth = NewDepthStencil();
    OffscreenRenderTarget target(&texture);
    gl.Forget();
    gl.driver.FailNext("glCheckFramebufferStatus", GL_FRAMEBUFFER_INCOMPLETE_ATTACHMENT);

    const std::string text = LogicErrorOf([&] { target.AttachDepthStencilBuffer(depth.get()); });

    const std::string expected =
        Text("glError: FB status = 36054 NibFrameBuffer:%p FBO:1 Attachment:%d func:bool "
             "Nib::GLES::OffscreenRenderTarget::AttachDepthStencilToFbo()",
             static_cast<void*>(&target), static_cast<int>(depth->GetDepthStencilBuffer()));
    EXPECT_EQ(text, expected);
    EXPECT_EQ(gl.Log(ANDROID_LOG_ERROR), (Texts{expected}));
    EXPECT_TRUE(gl.driver.Framebuffer(kFbo).exists);
}

TEST_F(OffscreenRenderTargetTest, AfterAFailedAttachNothingIsThereToDetach)
{
    std::unique_ptr<DepthStencilBuffer> depth = NewDepthStencil();
    OffscreenRenderTarget target(&texture);
    gl.driver.FailNext("glCheckFramebufferStatus", GL_FRAMEBUFFER_INCOMPLETE_ATTACHMENT);
    EXPECT_THROW(target.AttachDepthStencilBuffer(depth.get()), std::logic_error);
    gl.Forget();

    target.DetachDepthStencilBuffer();
    EXPECT_EQ(gl.driver.CallCount(), 0u);
    target.AttachDepthStencilBuffer(depth.get());

    EXPECT_EQ(gl.driver.CallCount("glFramebufferRenderbuffer"), 1u);
}

TEST_F(OffscreenRenderTargetTest, DetachAttachesRenderbufferZero)
{
    std::unique_ptr<DepthStencilBuffer> depth = NewDepthStencil();
    OffscreenRenderTarget target(&texture);
    target.AttachDepthStencilBuffer(depth.get());
    gl.Forget();

    target.DetachDepthStencilBuffer();

    EXPECT_EQ(gl.Issued(), Sequence({Call("glBindFramebuffer", GL_FRAMEBUFFER, kFbo),
                                     Call("glFramebufferRenderbuffer", GL_FRAMEBUFFER,
                                          GL_DEPTH_STENCIL_ATTACHMENT, GL_RENDERBUFFER, 0),
                                     Call("glCheckFramebufferStatus", GL_FRAMEBUFFER)}));
    EXPECT_EQ(gl.driver.Framebuffer(kFbo).attachments.count(GL_DEPTH_ATTACHMENT), 0u);
    EXPECT_EQ(gl.driver.Framebuffer(kFbo).attachments.count(GL_COLOR_ATTACHMENT0), 1u);
}

TEST_F(OffscreenRenderTargetTest, DetachWithNothingAttachedDoesNothing)
{
    std::unique_ptr<DepthStencilBuffer> depth = NewDepthStencil();
    OffscreenRenderTarget target(&texture);
    gl.Forget();

    target.DetachDepthStencilBuffer();
    EXPECT_EQ(gl.driver.CallCount(), 0u);

    target.AttachDepthStencilBuffer(depth.get());
    target.DetachDepthStencilBuffer();
    gl.Forget();
    target.DetachDepthStencilBuffer();
    EXPECT_EQ(gl.driver.CallCount(), 0u);
}

TEST_F(OffscreenRenderTargetTest, AnIncompleteDetachThrowsWithACapitalS)
{
    std::unique_ptr<DepthStencilBuffer> depth = NewDepthStencil();
    OffscreenRenderTarget target(&texture);
    target.AttachDepthStencilBuffer(depth.get());
    gl.Forget();
    gl.driver.FailNext("glCheckFramebufferStatus", GL_FRAMEBUFFER_UNSUPPORTED);

    const std::string text = LogicErrorOf([&] { target.DetachDepthStencilBuffer(); });

    const std::string expected = Text("glError: FB Status = 36061 NibFrameBuffer:%p FBO:1 "
                                      "func:bool Nib::GLES::OffscreenRenderTarget::"
                                      "DetachDepthStencilFromFbo()",
                                      static_cast<void*>(&target));
    EXPECT_EQ(text, expected);
    EXPECT_EQ(gl.Log(ANDROID_LOG_ERROR), (Texts{expected}));

    // It still counts as attached, so that the next detach tries again.
    gl.Forget();
    target.DetachDepthStencilBuffer();
    EXPECT_EQ(gl.driver.CallCount("glFramebufferRenderbuffer"), 1u);
}

struct ClearRow
{
    bool depth;
    bool stencil;
    std::vector<SimCall> calls;
};

TEST_F(OffscreenRenderTargetTest, ClearDepthStencilClearsWhatIsAskedFor)
{
    std::unique_ptr<DepthStencilBuffer> depth = NewDepthStencil();
    OffscreenRenderTarget target(&texture);
    target.AttachDepthStencilBuffer(depth.get());
    const ClearRow rows[] = {
        {false, false, {Call("glClear", 0)}},
        {true, false, {Call("glClearDepthf", 0.5), Call("glClear", GL_DEPTH_BUFFER_BIT)}},
        {false, true, {Call("glClearStencil", 7), Call("glClear", GL_STENCIL_BUFFER_BIT)}},
        {true,
         true,
         {Call("glClearDepthf", 0.5), Call("glClearStencil", 7),
          Call("glClear", GL_DEPTH_BUFFER_BIT | GL_STENCIL_BUFFER_BIT)}},
    };
    for (const ClearRow& row : rows)
    {
        gl.Forget();

        target.ClearDepthStencil(row.depth, 0.5f, row.stencil, 7);

        std::vector<SimCall> expected = Binding(kFbo);
        expected.push_back(Call("glViewport", 0, 0, 16, 8));
        expected.insert(expected.end(), row.calls.begin(), row.calls.end());
        expected.push_back(Call("glGetIntegerv", GL_FRAMEBUFFER_BINDING, kAddress));
        expected.push_back(Call("glInvalidateFramebuffer", GL_FRAMEBUFFER, 0, kAddress));
        EXPECT_EQ(gl.Issued(), expected);
    }
}

TEST_F(OffscreenRenderTargetTest, IsActivatedClearedReadAndDeactivatedThroughItsInterface)
{
    OffscreenRenderTarget offscreen(&texture);
    IOffscreenRenderTarget& interface = offscreen;
    IRenderTarget& target = interface;
    std::vector<unsigned char> pixels(16 * 8 * 4);

    target.ClearColor(0.0f, 1.0f, 0.0f, 1.0f);
    glBindFramebuffer(GL_FRAMEBUFFER, 0);
    target.ReadPixels(0, 0, 16, 8, {pixels.data(), 0, 0, 0});

    EXPECT_EQ((std::vector<int>{pixels[0], pixels[1], pixels[2], pixels[3]}),
              (std::vector<int>{0, 255, 0, 255}));
    EXPECT_EQ((std::vector<int>{pixels[508], pixels[509], pixels[510], pixels[511]}),
              (std::vector<int>{0, 255, 0, 255}));
    EXPECT_EQ(gl.driver.Texture(TextureName()).At(15, 7), (SimPixel{0, 255, 0, 255}));

    gl.Forget();
    target.Deactivate(true, true);
    EXPECT_EQ(gl.driver.LastCall("glInvalidateFramebuffer").list,
              (std::vector<long long>{GL_DEPTH_ATTACHMENT, GL_STENCIL_ATTACHMENT}));
    target.Activate();
    EXPECT_EQ(gl.driver.LastCall("glBindFramebuffer"),
              Call("glBindFramebuffer", GL_FRAMEBUFFER, kFbo));
}

TEST_F(OffscreenRenderTargetTest, ReleaseAndRestoreOfTheContextDoNothing)
{
    OffscreenRenderTarget target(&texture);
    gl.Forget();

    target.ReleaseGLObject();
    target.RestoreGLObject();
    target.OnRelease();
    target.OnRestore();

    EXPECT_EQ(gl.driver.CallCount(), 0u);
    EXPECT_EQ(target.GetFbo(), kFbo);
}

TEST_F(OffscreenRenderTargetTest, IsMadeAnewWithItsDepthStencilBufferAfterAContextLoss)
{
    std::unique_ptr<DepthStencilBuffer> depth = NewDepthStencil();
    auto target = std::make_unique<OffscreenRenderTarget>(&texture);
    target->AttachDepthStencilBuffer(depth.get());
    target.reset();
    queue.observer.DispatchRelease();
    queue.observer.DispatchRestore();

    target = std::make_unique<OffscreenRenderTarget>(&texture);
    target->AttachDepthStencilBuffer(depth.get());

    EXPECT_EQ(glCheckFramebufferStatus(GL_FRAMEBUFFER),
              static_cast<GLenum>(GL_FRAMEBUFFER_COMPLETE));
    EXPECT_EQ(gl.driver.Framebuffer(target->GetFbo()).attachments.at(GL_DEPTH_ATTACHMENT).name,
              depth->GetDepthStencilBuffer());
}
