#include "sim/SimDriver.h"

#include <gtest/gtest.h>

namespace
{

/// A texture of 4 x 4 pixels, attached to a framebuffer that is bound.
struct Target
{
    explicit Target(GLenum internalFormat = GL_RGBA8, GLenum format = GL_RGBA,
                    GLenum type = GL_UNSIGNED_BYTE)
    {
        glGenTextures(1, &texture);
        glBindTexture(GL_TEXTURE_2D, texture);
        glTexImage2D(GL_TEXTURE_2D, 0, static_cast<GLint>(internalFormat), 4, 4, 0, format, type,
                     nullptr);
        glGenFramebuffers(1, &framebuffer);
        glBindFramebuffer(GL_FRAMEBUFFER, framebuffer);
        glFramebufferTexture2D(GL_FRAMEBUFFER, GL_COLOR_ATTACHMENT0, GL_TEXTURE_2D, texture, 0);
    }

    GLuint texture = 0;
    GLuint framebuffer = 0;
};

TEST(SimFramebuffer, IsCompleteWithARenderableTexture)
{
    SimDriver driver;
    const SimContext context(driver);
    EXPECT_EQ(glCheckFramebufferStatus(GL_FRAMEBUFFER), GLenum{GL_FRAMEBUFFER_COMPLETE});
    const Target target;
    EXPECT_EQ(glCheckFramebufferStatus(GL_FRAMEBUFFER), GLenum{GL_FRAMEBUFFER_COMPLETE});
    const Target luminance(GL_LUMINANCE, GL_LUMINANCE);
    EXPECT_EQ(glCheckFramebufferStatus(GL_FRAMEBUFFER),
              GLenum{GL_FRAMEBUFFER_INCOMPLETE_ATTACHMENT});
    glFramebufferTexture2D(GL_FRAMEBUFFER, GL_COLOR_ATTACHMENT0, GL_TEXTURE_2D, 0, 0);
    EXPECT_EQ(glCheckFramebufferStatus(GL_FRAMEBUFFER),
              GLenum{GL_FRAMEBUFFER_INCOMPLETE_MISSING_ATTACHMENT});
}

TEST(SimFramebuffer, TheStatusMayBeInjected)
{
    SimDriver driver;
    const SimContext context(driver);
    driver.FailNext("glCheckFramebufferStatus", GL_FRAMEBUFFER_UNSUPPORTED);
    EXPECT_EQ(glCheckFramebufferStatus(GL_FRAMEBUFFER), GLenum{GL_FRAMEBUFFER_UNSUPPORTED});
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
    EXPECT_EQ(glCheckFramebufferStatus(GL_FRAMEBUFFER), GLenum{GL_FRAMEBUFFER_COMPLETE});
}

TEST(SimFramebuffer, DepthAndStencilShareARenderbuffer)
{
    SimDriver driver;
    const SimContext context(driver);
    const Target target;
    GLuint buffer = 0;
    glGenRenderbuffers(1, &buffer);
    glBindRenderbuffer(GL_RENDERBUFFER, buffer);
    glRenderbufferStorage(GL_RENDERBUFFER, GL_DEPTH24_STENCIL8, 4, 4);
    glFramebufferRenderbuffer(GL_FRAMEBUFFER, GL_DEPTH_STENCIL_ATTACHMENT, GL_RENDERBUFFER, buffer);

    EXPECT_EQ(glCheckFramebufferStatus(GL_FRAMEBUFFER), GLenum{GL_FRAMEBUFFER_COMPLETE});
    const SimFramebufferState state = driver.Framebuffer(target.framebuffer);
    EXPECT_EQ(state.attachments.size(), 3u);
    EXPECT_EQ(state.attachments.at(GL_DEPTH_ATTACHMENT).name, buffer);
    EXPECT_EQ(state.attachments.at(GL_STENCIL_ATTACHMENT).type, GLenum{GL_RENDERBUFFER});
    EXPECT_EQ(state.attachments.at(GL_COLOR_ATTACHMENT0).name, target.texture);
    glFramebufferRenderbuffer(GL_FRAMEBUFFER, GL_DEPTH_STENCIL_ATTACHMENT, GL_RENDERBUFFER, 0);
    EXPECT_EQ(driver.Framebuffer(target.framebuffer).attachments.size(), 1u);
}

TEST(SimFramebuffer, ClearsFollowMaskAndScissor)
{
    SimDriver driver;
    const SimContext context(driver);
    const Target target;
    glClearColor(1, 1, 1, 1);
    glClear(GL_COLOR_BUFFER_BIT);
    glColorMask(GL_TRUE, GL_FALSE, GL_TRUE, GL_TRUE);
    glEnable(GL_SCISSOR_TEST);
    glScissor(1, 1, 1, 1);
    glClearColor(0, 0, 0, 0.5f);
    glClear(GL_COLOR_BUFFER_BIT);

    EXPECT_EQ(driver.Texture(target.texture).At(0, 0), (SimPixel{255, 255, 255, 255}));
    EXPECT_EQ(driver.Texture(target.texture).At(1, 1), (SimPixel{0, 255, 0, 128}));
}

TEST(SimFramebuffer, ReadBackFollowsThePackState)
{
    SimDriver driver;
    const SimContext context(driver);
    const Target target;
    unsigned char pixels[4 * 4 * 4];
    for (std::size_t i = 0; i < sizeof pixels; ++i)
        pixels[i] = static_cast<unsigned char>(i);
    glTexSubImage2D(GL_TEXTURE_2D, 0, 0, 0, 4, 4, GL_RGBA, GL_UNSIGNED_BYTE, pixels);
    unsigned char read[3 * 3 * 4] = {};

    glPixelStorei(GL_PACK_ROW_LENGTH, 3);
    glPixelStorei(GL_PACK_SKIP_PIXELS, 1);
    glPixelStorei(GL_PACK_SKIP_ROWS, 1);
    glReadPixels(2, 1, 2, 2, GL_RGBA, GL_UNSIGNED_BYTE, read);

    EXPECT_EQ(read[0], 0);                     // skipped
    EXPECT_EQ(read[(3 + 1) * 4], (4 + 2) * 4); // (2, 1)
    EXPECT_EQ(read[(3 + 2) * 4 + 3], (4 + 3) * 4 + 3);
    EXPECT_EQ(read[(6 + 1) * 4], (8 + 2) * 4); // (2, 2)
    EXPECT_EQ(read[6 * 4], 0);
}

TEST(SimFramebuffer, RedTexturesReadAsRed)
{
    SimDriver driver;
    const SimContext context(driver);
    const Target target(GL_R8, GL_RED);
    glClearColor(0.2f, 0.9f, 0.9f, 0.9f);
    glClear(GL_COLOR_BUFFER_BIT);
    unsigned char rgba[4] = {};
    unsigned char red = 0;
    glReadPixels(0, 0, 1, 1, GL_RGBA, GL_UNSIGNED_BYTE, rgba);
    glReadPixels(0, 0, 1, 1, GL_RED, GL_UNSIGNED_BYTE, &red);

    EXPECT_EQ(rgba[0], 51);
    EXPECT_EQ(rgba[1], 0);
    EXPECT_EQ(rgba[3], 255);
    EXPECT_EQ(red, 51);
}

TEST(SimFramebuffer, FloatTexturesKeepFloats)
{
    SimDriver driver;
    const SimContext context(driver);
    const Target target(GL_RGBA16F, GL_RGBA, GL_HALF_FLOAT);
    glClearColor(2.5f, -1, 0.25f, 1);
    glClear(GL_COLOR_BUFFER_BIT);
    float pixel[4] = {};
    glReadPixels(0, 0, 1, 1, GL_RGBA, GL_FLOAT, pixel);

    EXPECT_EQ(pixel[0], 2.5f);
    EXPECT_EQ(pixel[1], -1.0f);
    EXPECT_EQ(pixel[2], 0.25f);
}

TEST(SimFramebuffer, CopiesIntoTextures)
{
    SimDriver driver;
    const SimContext context(driver);
    const Target target;
    glClearColor(0, 0, 1, 1);
    glClear(GL_COLOR_BUFFER_BIT);
    GLuint copy = 0;
    glGenTextures(1, &copy);
    glBindTexture(GL_TEXTURE_2D, copy);
    glCopyTexImage2D(GL_TEXTURE_2D, 0, GL_RGBA8, 2, 2, 4, 4, 0);

    EXPECT_EQ(driver.Texture(copy).width, 4);
    EXPECT_EQ(driver.Texture(copy).At(1, 1), (SimPixel{0, 0, 255, 255}));
    EXPECT_EQ(driver.Texture(copy).At(2, 2), (SimPixel{0, 0, 0, 0})); // outside of the source
}

TEST(SimFramebuffer, InvalidationPoisonsColours)
{
    SimDriver driver;
    const SimContext context(driver);
    const Target target;
    glClear(GL_COLOR_BUFFER_BIT);
    const GLenum list[] = {GL_DEPTH_ATTACHMENT, GL_STENCIL_ATTACHMENT, GL_COLOR_ATTACHMENT0};
    glInvalidateFramebuffer(GL_FRAMEBUFFER, 2, list);
    EXPECT_EQ(driver.Texture(target.texture).At(0, 0), (SimPixel{0, 0, 0, 0}));
    EXPECT_EQ(driver.LastCall("glInvalidateFramebuffer").list,
              (std::vector<long long>{GL_DEPTH_ATTACHMENT, GL_STENCIL_ATTACHMENT}));
    glInvalidateFramebuffer(GL_FRAMEBUFFER, 3, list);
    EXPECT_EQ(driver.Texture(target.texture).At(0, 0), (SimPixel{0xDE, 0xAD, 0xBE, 0xEF}));
}

TEST(SimFramebuffer, TheWindowHasOtherAttachmentNames)
{
    SimDriver driver;
    driver.ExpectMisuse("glInvalidateFramebuffer");
    const SimContext context(driver);
    const GLenum right[] = {GL_DEPTH, GL_STENCIL};
    glInvalidateFramebuffer(GL_FRAMEBUFFER, 2, right);
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
    const GLenum wrong[] = {GL_DEPTH_ATTACHMENT};
    glInvalidateFramebuffer(GL_FRAMEBUFFER, 1, wrong);
    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_ENUM});
}

TEST(SimFramebuffer, DrawingToAnIncompleteOneIsMisuse)
{
    SimDriver driver;
    driver.ExpectMisuse("glClear");
    const SimContext context(driver);
    GLuint name = 0;
    glGenFramebuffers(1, &name);
    glBindFramebuffer(GL_FRAMEBUFFER, name);
    glClear(GL_COLOR_BUFFER_BIT);
    EXPECT_EQ(glGetError(), GLenum{GL_INVALID_FRAMEBUFFER_OPERATION});
}

TEST(SimFramebuffer, ADeletedTextureIsDetached)
{
    SimDriver driver;
    const SimContext context(driver);
    const Target target;
    glDeleteTextures(1, &target.texture);
    EXPECT_TRUE(driver.Framebuffer(target.framebuffer).attachments.empty());
}

} // namespace
