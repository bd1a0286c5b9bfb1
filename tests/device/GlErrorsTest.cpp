#include "Device.h"

#include <nib/device.h>

#include <gtest/gtest.h>

#include <vector>

using Nib::OpenGLRenderer;

// ---- errors -------------------------------------------------------------------------------------

TEST(GlErrors, ReportGLErrorIsTrueWithoutAnError)
{
    Device device;

    EXPECT_TRUE(OpenGLRenderer::reportGLError("here"));

    EXPECT_EQ(device.driver.CallNames(), Names({"glGetError"}));
    EXPECT_EQ(device.driver.Log().size(), 0u);
}

TEST(GlErrors, ReportGLErrorTakesOneError)
{
    Device device;
    device.driver.QueueGlErrors({GL_INVALID_ENUM, GL_INVALID_VALUE});

    EXPECT_FALSE(OpenGLRenderer::reportGLError("here"));

    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_ERROR),
              std::vector<std::string>{
                  "static bool Nib::OpenGLRenderer::reportGLError(const char *) : here Err: "
                  "0x0500"});
    EXPECT_EQ(device.driver.CallCount("glGetError"), 1u);
    EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_INVALID_VALUE));
}

TEST(GlErrors, ReportGLErrorTakesANullLabelAsEmpty)
{
    Device device;
    device.driver.QueueGlErrors({GL_OUT_OF_MEMORY});

    EXPECT_FALSE(OpenGLRenderer::reportGLError(nullptr));

    EXPECT_TRUE(device.driver.HasLog(
        ANDROID_LOG_ERROR,
        "static bool Nib::OpenGLRenderer::reportGLError(const char *) :  Err: 0x0505"));
}

TEST(GlErrors, ReportAndResetTakesAllErrors)
{
    Device device;
    device.driver.QueueGlErrors({GL_INVALID_ENUM, GL_INVALID_OPERATION, GL_OUT_OF_MEMORY});

    EXPECT_FALSE(OpenGLRenderer::reportAndResetAllGLErrors("draw"));

    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_ERROR),
              (std::vector<std::string>{
                  "static bool Nib::OpenGLRenderer::reportAndResetAllGLErrors(const char *) : draw "
                  "glError = 0x0500",
                  "static bool Nib::OpenGLRenderer::reportAndResetAllGLErrors(const char *) : draw "
                  "glError = 0x0502",
                  "static bool Nib::OpenGLRenderer::reportAndResetAllGLErrors(const char *) : draw "
                  "glError = 0x0505"}));
    EXPECT_EQ(device.driver.CallCount("glGetError"), 4u);
    EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_NO_ERROR));
}

TEST(GlErrors, ReportAndResetTakesANullLabelAsEmpty)
{
    Device device;
    device.driver.QueueGlErrors({GL_INVALID_VALUE});

    EXPECT_FALSE(OpenGLRenderer::reportAndResetAllGLErrors(nullptr));

    EXPECT_TRUE(device.driver.HasLog(
        ANDROID_LOG_ERROR, "static bool "
                           "Nib::OpenGLRenderer::reportAndResetAllGLErrors(const char *) :  "
                           "glError = 0x0501"));
}

TEST(GlErrors, ReportAndResetIsTrueWithoutAnError)
{
    Device device;

    EXPECT_TRUE(OpenGLRenderer::reportAndResetAllGLErrors("draw"));

    EXPECT_EQ(device.driver.CallCount("glGetError"), 1u);
    EXPECT_EQ(device.driver.Log().size(), 0u);
}
