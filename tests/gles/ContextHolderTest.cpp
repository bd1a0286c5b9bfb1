#include "gles/ContextHolder.h"
#include "gles/RendererDeviceCaps.h"

#include "gles/GlContext.h"

#include <gtest/gtest.h>

using namespace Nib;
using GLES::ContextHolder;
using GLES::RendererDeviceCaps;

namespace
{

struct VendorRow
{
    const char* text;
    int vendor;
    const char* name;
};
constexpr VendorRow kVendors[] = {
    {"ARM", 1, "ARM"},
    {"an ARM GPU", 1, "ARM"},
    {"Qualcomm", 2, "Qualcomm"},
    {"Qualcomm Technologies, Inc.", 2, "Qualcomm"},
    {"ARM and Qualcomm", 1, "ARM"},
    {"Qualcomm on ARM", 1, "ARM"},
    {"Imagination Technologies", 3, "Other"},
    {"arm", 3, "Other"},
    {"qualcomm", 3, "Other"},
    {"", 3, "Other"},
};

} // namespace

TEST(ContextHolder, KnowsTheVendorsByTheirNames)
{
    for (const VendorRow& row : kVendors)
    {
        GlContext gl;
        gl.driver.SetGlString(GL_VENDOR, row.text);
        ContextHolder holder;

        EXPECT_EQ(static_cast<int>(holder.GetGPUVendor()), row.vendor) << row.text;

        EXPECT_EQ(gl.Log(ANDROID_LOG_INFO), (Texts{std::string("GPU vendor = ") + row.name}));
        EXPECT_EQ(gl.driver.Log().size(), 1u);
    }
}

TEST(ContextHolder, AsksForTheVendorOnce)
{
    GlContext gl(SimGpu::Named("Adreno (TM) 640"));
    ContextHolder holder;

    EXPECT_EQ(static_cast<int>(holder.GetGPUVendor()), 2);
    EXPECT_EQ(static_cast<int>(holder.GetGPUVendor()), 2);

    EXPECT_EQ(gl.Issued(), Sequence({Call("glGetString", GL_VENDOR)}));
    EXPECT_EQ(gl.Log(ANDROID_LOG_INFO), (Texts{"GPU vendor = Qualcomm"}));
}

TEST(ContextHolder, WithoutAVendorAsksAgainNextTime)
{
    GlContext gl(SimGpu::Named("Mali-G72"));
    ContextHolder holder;
    gl.driver.SetGlString(GL_VENDOR, std::nullopt);

    EXPECT_EQ(static_cast<int>(holder.GetGPUVendor()), 0);
    EXPECT_TRUE(gl.driver.Log().empty());

    gl.driver.SetGlString(GL_VENDOR, "ARM");
    EXPECT_EQ(static_cast<int>(holder.GetGPUVendor()), 1);
    EXPECT_EQ(gl.driver.CallCount("glGetString"), 2u);
}

TEST(ContextHolder, NamesTheCurrentContext)
{
    GlContext gl;
    ContextHolder holder;

    EXPECT_EQ(holder.GetCurrentContextId(), gl.context.Handle());
    EXPECT_EQ(gl.driver.CallNames(), Names({"eglGetCurrentContext"}));

    gl.context.Release();
    EXPECT_EQ(holder.GetCurrentContextId(), nullptr);
    gl.context.MakeCurrent();
}

TEST(ContextHolder, WaitsForTheGpuByFinishing)
{
    GlContext gl;
    ContextHolder holder;

    holder.WaitForGpuCompletion();

    EXPECT_EQ(gl.driver.CallNames(), Names({"glFinish"}));
}

TEST(RendererDeviceCaps, AnswersTheDriversTextureLimitOnceItIsKnown)
{
    SimDriver driver(SimGpu::Default().WithMaxTextureSize(4096));
    SimContext context(driver);
    const RendererDeviceCaps caps;
    EXPECT_EQ(caps.GetMaxTextureSize(), 8192);

    OpenGLRenderer::InitParameters();
    driver.ForgetCalls();

    EXPECT_EQ(caps.GetMaxTextureSize(), 4096);
    EXPECT_EQ(driver.CallCount(), 0u);
}
