#include "Device.h"
#include "GlCalls.h"

#include "device/TextureLimits.h"

#include <nib/device.h>

#include <gtest/gtest.h>

#include <thread>
#include <vector>

using Nib::OpenGLRenderer;

namespace
{

SimGpu Phone()
{
    return SimGpu::Named("Mali-G72");
}

} // namespace

// ---- before anything was asked ------------------------------------------------------------------

TEST(OpenGLRenderer, StartsWithDefaultsThatNeedNoContext)
{
    SimDriver driver;

    EXPECT_FALSE(OpenGLRenderer::IsGLParameterInited());
    EXPECT_EQ(OpenGLRenderer::getMaxTextureSize(), 8192);
    EXPECT_EQ(Nib::GetMaxTextureHeight(), 8192);
    EXPECT_TRUE(OpenGLRenderer::isMinMaxBlendingSupported());
    EXPECT_TRUE(OpenGLRenderer::isSupportSampler());
    EXPECT_EQ(driver.CallCount(), 0u);
}

// ---- InitParameters -----------------------------------------------------------------------------

TEST(OpenGLRenderer, InitParametersAsksTheDriverInOrder)
{
    Device device(SimGpu::Named("Adreno (TM) 330"));

    OpenGLRenderer::InitParameters();

    EXPECT_EQ(Queries(device.driver), (std::vector<std::string>{
                                          "glGetString 0x1F01",   // GL_RENDERER
                                          "glGetString 0x1F00",   // GL_VENDOR
                                          "glGetString 0x1F02",   // GL_VERSION
                                          "glGetIntegerv 0x0D33", // GL_MAX_TEXTURE_SIZE
                                          "glGetIntegerv 0x0D3A", // GL_MAX_VIEWPORT_DIMS
                                          "glGetIntegerv 0x8A2F", // uniform buffer bindings
                                          "glGetIntegerv 0x8A30", // uniform block size
                                          "glGetIntegerv 0x8A2B", // vertex uniform blocks
                                          "glGetIntegerv 0x8A2B", // again, for fragments
                                          "glGetString 0x1F02",   // GL_VERSION
                                          "glGetString 0x8B8C",   // shading language version
                                          "glGetString 0x1F03",   // GL_EXTENSIONS
                                          "eglGetProcAddress glStartTilingQCOM",
                                          "eglGetProcAddress glEndTilingQCOM",
                                      }));
}

TEST(OpenGLRenderer, InitParametersWritesItsLinesInOrder)
{
    SimGpu gpu = Phone().WithVersion("OpenGL ES 3.2 v1.r19p0").WithGlExtensions({"GL_A", "GL_B"});
    gpu.shadingLanguage = "OpenGL ES GLSL ES 3.20";
    gpu.maxUniformBufferBindings = 36;
    gpu.maxUniformBlockSize = 65536;
    gpu.maxVertexUniformBlocks = 12;
    gpu.maxFragmentUniformBlocks = 14;
    Device device(gpu);

    OpenGLRenderer::InitParameters();

    EXPECT_EQ(
        device.driver.LogTexts(ANDROID_LOG_INFO),
        (std::vector<std::string>{
            "static void Nib::OpenGLRenderer::InitParameters()",
            "static bool Nib::OpenGLRenderer::isGpuOneOf(const char **) renderer - Mali-G72 : "
            "NOT IN LIST",
            "GPU vendor = ARM",
            "static bool Nib::OpenGLRenderer::getSupportSampler() GPU getGLVersion = 3.2 v1.r19p0",
            "static bool Nib::OpenGLRenderer::getSupportSampler() OpenGL version = 3.2",
            "static bool Nib::OpenGLRenderer::getSupportSampler() OpenGL version "
            "m_isSupportSampler = 1",
            "static void Nib::OpenGLRenderer::InitParameters() GL_MAX_UNIFORM_BUFFER_BINDINGS = 36",
            "static void Nib::OpenGLRenderer::InitParameters() GL_MAX_UNIFORM_BLOCK_SIZE = 65536",
            "static void Nib::OpenGLRenderer::InitParameters() GL_MAX_VERTEX_UNIFORM_BLOCKS = 12",
            "static void Nib::OpenGLRenderer::InitParameters() GL_MAX_FRAGMENT_UNIFORM_BLOCKS = 12",
            "GL_VERSION = OpenGL ES 3.2 v1.r19p0",
            "GL_SHADING_LANGUAGE_VERSION = OpenGL ES GLSL ES 3.20",
            "GL_EXTENSIONS = GL_A GL_B",
        }));
    EXPECT_EQ(device.driver.Log().size(), 13u);
    EXPECT_EQ(device.driver.Log().front().tag, "nib_log");
}

TEST(OpenGLRenderer, InitParametersRunsOnceForAllContexts)
{
    Device device(Phone());
    OpenGLRenderer::InitParameters();
    EXPECT_TRUE(OpenGLRenderer::IsGLParameterInited());
    device.driver.ForgetCalls();
    device.driver.ForgetLog();

    SimContext second(device.driver);
    OpenGLRenderer::InitParameters();

    EXPECT_EQ(device.driver.CallCount(), 0u);
    EXPECT_EQ(device.driver.Log().size(), 0u);
}

TEST(OpenGLRenderer, TextureLimitsAreThoseOfTextureAndViewport)
{
    Device device(Phone().WithMaxTextureSize(4096).WithMaxViewport(3000, 2000));

    OpenGLRenderer::InitParameters();

    EXPECT_EQ(OpenGLRenderer::getMaxTextureSize(), 3000);
    EXPECT_EQ(Nib::GetMaxTextureHeight(), 2000);
}

TEST(OpenGLRenderer, TextureLimitIsTheTextureSizeWhereTheViewportIsLarger)
{
    Device device(Phone().WithMaxTextureSize(4096).WithMaxViewport(16384, 8192));

    OpenGLRenderer::InitParameters();

    EXPECT_EQ(OpenGLRenderer::getMaxTextureSize(), 4096);
    EXPECT_EQ(Nib::GetMaxTextureHeight(), 4096);
}

TEST(OpenGLRenderer, LimitsThatTheDriverDoesNotTellAreZero)
{
    Device device(Phone());
    device.driver.FailNext("glGetIntegerv", GL_INVALID_ENUM, 6);

    OpenGLRenderer::InitParameters();

    EXPECT_EQ(OpenGLRenderer::getMaxTextureSize(), 0);
    EXPECT_EQ(Nib::GetMaxTextureHeight(), 0);
    EXPECT_TRUE(device.driver.HasLog(
        ANDROID_LOG_INFO,
        "static void Nib::OpenGLRenderer::InitParameters() GL_MAX_UNIFORM_BLOCK_SIZE = 0"));
}

TEST(OpenGLRenderer, InitParametersWithoutAnyTextKeepsWhatIsUnknown)
{
    Device device(Phone());
    for (const GLenum name :
         {GL_RENDERER, GL_VENDOR, GL_VERSION, GL_EXTENSIONS, GL_SHADING_LANGUAGE_VERSION})
        device.driver.SetGlString(name, std::nullopt);

    OpenGLRenderer::InitParameters();

    EXPECT_TRUE(OpenGLRenderer::IsGLParameterInited());
    EXPECT_TRUE(OpenGLRenderer::isMinMaxBlendingSupported());
    EXPECT_TRUE(OpenGLRenderer::isSupportSampler());
    EXPECT_EQ(OpenGLRenderer::getGPUVendor(), 0);
    EXPECT_TRUE(device.driver.HasLog(ANDROID_LOG_INFO, "GL_EXTENSIONS = (null)"));
}

TEST(OpenGLRenderer, InitParametersOfTwoThreadsAtOnceAgree)
{
    SimDriver driver(Phone().WithMaxTextureSize(4096));
    std::vector<std::thread> threads;
    for (int i = 0; i < 2; ++i)
    {
        threads.emplace_back(
            [&driver]
            {
                SimContext context(driver);
                OpenGLRenderer::InitParameters();
                EXPECT_TRUE(OpenGLRenderer::IsGLParameterInited());
                EXPECT_EQ(OpenGLRenderer::getMaxTextureSize(), 4096);
                EXPECT_EQ(OpenGLRenderer::getGPUVendor(), 1);
                EXPECT_EQ(OpenGLRenderer::getMaliDriverVersion(), 19);
                EXPECT_TRUE(OpenGLRenderer::isSupportSampler());
            });
    }
    for (std::thread& thread : threads)
        thread.join();
}

// ---- blending -----------------------------------------------------------------------------------

TEST(OpenGLRenderer, Mali400HasNoMinMaxBlending)
{
    Device device(SimGpu::Named("Mali-400 MP"));

    OpenGLRenderer::InitParameters();

    EXPECT_FALSE(OpenGLRenderer::isMinMaxBlendingSupported());
    EXPECT_TRUE(device.driver.HasLog(
        ANDROID_LOG_INFO, "static bool Nib::OpenGLRenderer::isGpuOneOf(const char **) renderer - "
                          "Mali-400 MP : IN LIST"));
}

TEST(OpenGLRenderer, Mali450HasMinMaxBlending)
{
    Device device(SimGpu::Named("Mali-450 MP"));

    OpenGLRenderer::InitParameters();

    EXPECT_TRUE(OpenGLRenderer::isMinMaxBlendingSupported());
}

TEST(OpenGLRenderer, MinMaxBlendingIsMissingOnlyOnOneDeviceOfAll)
{
    // The answer of isGpuOneOf decides; InitParameters runs once a process.
    const char* list[] = {"Mali-400", nullptr};
    std::vector<std::string> without;
    for (const SimGpu& gpu : SimGpu::All())
    {
        Device device(gpu);
        if (OpenGLRenderer::isGpuOneOf(list))
            without.push_back(gpu.renderer);
    }
    EXPECT_EQ(without, std::vector<std::string>{"Mali-400 MP"});
}

// ---- samplers -----------------------------------------------------------------------------------

TEST(OpenGLRenderer, SamplersComeWithVersion31)
{
    struct Row
    {
        const char* version;
        bool supported;
        const char* number; // as logged
    };
    const Row rows[] = {
        {"OpenGL ES 2.0", false, "2.0"},
        {"OpenGL ES 3.0", false, "3.0"},
        {"OpenGL ES 3.0 V@127.0 AU@ (GIT@I96aee987eb)", false, "3.0"},
        {"OpenGL ES 3.05", false, "3.0"},
        {"OpenGL ES 3.06", true, "3.1"},
        {"OpenGL ES 3.1 v1.r12p1", true, "3.1"},
        {"OpenGL ES 3.2 v1.r19p0", true, "3.2"},
        {"OpenGL ES 10.0", true, "10.0"},
        {"OpenGL ES-CM 1.1", false, "0.0"}, // another prefix: ten characters go all the same
        {"OpenGL ES ", false, "0.0"},
        {"3.2", false, "0.0"}, // shorter than the prefix
        {"", false, "0.0"},
    };
    Device device(Phone());
    for (const Row& row : rows)
    {
        SCOPED_TRACE(row.version);
        device.driver.SetGlString(GL_VERSION, row.version);
        device.driver.ForgetLog();

        EXPECT_EQ(OpenGLRenderer::getSupportSampler(), row.supported);

        EXPECT_EQ(OpenGLRenderer::isSupportSampler(), row.supported);
        EXPECT_TRUE(device.driver.HasLog(
            ANDROID_LOG_INFO,
            std::string("static bool Nib::OpenGLRenderer::getSupportSampler() OpenGL version = ") +
                row.number));
        EXPECT_TRUE(device.driver.HasLog(
            ANDROID_LOG_INFO, row.supported
                                  ? "static bool Nib::OpenGLRenderer::getSupportSampler() OpenGL "
                                    "version m_isSupportSampler = 1"
                                  : "static bool Nib::OpenGLRenderer::getSupportSampler() OpenGL "
                                    "version m_isSupportSampler = 0"));
    }
}

TEST(OpenGLRenderer, VersionLineCarriesWhatFollowsThePrefix)
{
    Device device(Phone().WithVersion("OpenGL ES 3.2 v1.r19p0-01rel0"));

    OpenGLRenderer::getSupportSampler();

    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_INFO).at(0),
              "static bool Nib::OpenGLRenderer::getSupportSampler() GPU getGLVersion = "
              "3.2 v1.r19p0-01rel0");
}

TEST(OpenGLRenderer, SamplerAnswerStaysWithoutAVersion)
{
    Device device(Phone());
    device.driver.SetGlString(GL_VERSION, std::nullopt);

    EXPECT_FALSE(OpenGLRenderer::getSupportSampler());
    EXPECT_TRUE(OpenGLRenderer::isSupportSampler());
    EXPECT_EQ(device.driver.Log().size(), 0u);

    device.driver.SetGlString(GL_VERSION, "OpenGL ES 3.0");
    EXPECT_FALSE(OpenGLRenderer::getSupportSampler());
    device.driver.SetGlString(GL_VERSION, std::nullopt);
    EXPECT_FALSE(OpenGLRenderer::getSupportSampler());
    EXPECT_FALSE(OpenGLRenderer::isSupportSampler());
}
