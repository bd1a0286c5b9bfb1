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

// ---- vendor -------------------------------------------------------------------------------------

namespace
{

void ExpectVendor(const char* text, int code, const char* line)
{
    Device device(Phone().WithVendor(text));

    EXPECT_EQ(OpenGLRenderer::getGPUVendor(), code);

    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_INFO), std::vector<std::string>{line});
}

} // namespace

TEST(OpenGLRenderer, VendorArm)
{
    ExpectVendor("ARM", 1, "GPU vendor = ARM");
}

TEST(OpenGLRenderer, VendorQualcomm)
{
    ExpectVendor("Qualcomm", 2, "GPU vendor = Qualcomm");
}

TEST(OpenGLRenderer, VendorOther)
{
    ExpectVendor("Imagination Technologies", 3, "GPU vendor = Other");
}

TEST(OpenGLRenderer, VendorOfAnEmptyTextIsOther)
{
    ExpectVendor("", 3, "GPU vendor = Other");
}

TEST(OpenGLRenderer, VendorIsAskedForArmFirst)
{
    ExpectVendor("Qualcomm on ARM", 1, "GPU vendor = ARM");
}

TEST(OpenGLRenderer, VendorIsASubstring)
{
    ExpectVendor("the Qualcomm company", 2, "GPU vendor = Qualcomm");
}

TEST(OpenGLRenderer, VendorNamesAreCaseSensitive)
{
    ExpectVendor("arm qualcomm", 3, "GPU vendor = Other");
}

TEST(OpenGLRenderer, VendorIsReadOnce)
{
    Device device(Phone());
    OpenGLRenderer::getGPUVendor();

    EXPECT_EQ(OpenGLRenderer::getGPUVendor(), 1);

    EXPECT_EQ(device.driver.CallCount("glGetString"), 1u);
    EXPECT_EQ(device.driver.CountLog(ANDROID_LOG_INFO, "GPU vendor = ARM"), 1u);
}

TEST(OpenGLRenderer, VendorIsReadAgainWhileTheDriverGivesNone)
{
    Device device(Phone());
    device.driver.SetGlString(GL_VENDOR, std::nullopt);
    EXPECT_EQ(OpenGLRenderer::getGPUVendor(), 0);
    EXPECT_EQ(device.driver.Log().size(), 0u);

    device.driver.SetGlString(GL_VENDOR, "Qualcomm");

    EXPECT_EQ(OpenGLRenderer::getGPUVendor(), 2);
}

// ---- renderer lists -----------------------------------------------------------------------------

TEST(OpenGLRenderer, GpuIsOneOfAListByPrefix)
{
    Device device(SimGpu::Named("Mali-G72"));
    struct Row
    {
        const char* names[3];
        bool found;
    };
    Row rows[] = {
        {{"Mali-G72", nullptr, nullptr}, true},
        {{"Mali", nullptr, nullptr}, true},
        {{"Adreno", "Mali-G", nullptr}, true},
        {{"", nullptr, nullptr}, true},
        {{"Mali-G72 MP12", nullptr, nullptr}, false}, // longer than the renderer's name
        {{"ali-G72", nullptr, nullptr}, false},       // not at its beginning
        {{"mali-g72", nullptr, nullptr}, false},
        {{"Adreno", "PowerVR", nullptr}, false},
        {{nullptr, nullptr, nullptr}, false},
        {{"Adreno", nullptr, "Mali"}, false}, // behind the end of the list
    };
    for (Row& row : rows)
    {
        SCOPED_TRACE(row.names[0] ? row.names[0] : "empty list");
        device.driver.ForgetLog();

        EXPECT_EQ(OpenGLRenderer::isGpuOneOf(row.names), row.found);

        EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_INFO),
                  std::vector<std::string>{
                      row.found
                          ? "static bool Nib::OpenGLRenderer::isGpuOneOf(const char **) renderer - "
                            "Mali-G72 : IN LIST"
                          : "static bool Nib::OpenGLRenderer::isGpuOneOf(const char **) renderer - "
                            "Mali-G72 : NOT IN LIST"});
    }
}

TEST(OpenGLRenderer, GpuWithoutANameIsInNoListAndLogsNothing)
{
    Device device(Phone());
    device.driver.SetGlString(GL_RENDERER, std::nullopt);
    const char* names[] = {"", nullptr};

    EXPECT_FALSE(OpenGLRenderer::isGpuOneOf(names));

    EXPECT_EQ(device.driver.Log().size(), 0u);
}

// ---- Mali driver --------------------------------------------------------------------------------

TEST(OpenGLRenderer, MaliDriverVersionIsTheNumberBehindV1R)
{
    Device device(Phone().WithVersion("OpenGL ES 3.2 v1.r19p0"));

    EXPECT_EQ(OpenGLRenderer::getMaliDriverVersion(), 19);

    EXPECT_EQ(
        device.driver.LogTexts(ANDROID_LOG_INFO),
        (std::vector<std::string>{"GPU vendor = ARM", "GL_VERSION info = OpenGL ES 3.2 v1.r19p0",
                                  "Mali driver Info: ARM, version 19"}));
}

TEST(OpenGLRenderer, MaliDriverVersionIsKeptOnceKnown)
{
    Device device(Phone().WithVersion("OpenGL ES 3.2 v1.r19p0"));
    OpenGLRenderer::getMaliDriverVersion();
    device.driver.ForgetCalls();
    device.driver.ForgetLog();

    EXPECT_EQ(OpenGLRenderer::getMaliDriverVersion(), 19);

    EXPECT_EQ(device.driver.CallCount(), 0u);
    EXPECT_EQ(device.driver.Log().size(), 0u);
}

TEST(OpenGLRenderer, MaliDriverVersionZeroIsAskedForAgain)
{
    Device device(Phone().WithVersion("OpenGL ES 3.2 build 7"));
    EXPECT_EQ(OpenGLRenderer::getMaliDriverVersion(), 0);
    EXPECT_TRUE(device.driver.HasLog(ANDROID_LOG_INFO, "Mali driver Info: ARM, version 0"));

    device.driver.SetGlString(GL_VERSION, "OpenGL ES 3.2 v1.r22p0");

    EXPECT_EQ(OpenGLRenderer::getMaliDriverVersion(), 22);
}

TEST(OpenGLRenderer, MaliDriverVersionWithoutDigitsIsZero)
{
    Device device(Phone().WithVersion("OpenGL ES 3.2 v1.rX"));

    EXPECT_EQ(OpenGLRenderer::getMaliDriverVersion(), 0);

    EXPECT_TRUE(device.driver.HasLog(ANDROID_LOG_INFO, "Mali driver Info: ARM, version 0"));
}

TEST(OpenGLRenderer, MaliDriverVersionOfOtherVendorsIsZeroWithoutReadingTheVersion)
{
    Device device(SimGpu::Named("Adreno (TM) 640").WithVersion("OpenGL ES 3.2 v1.r19p0"));

    EXPECT_EQ(OpenGLRenderer::getMaliDriverVersion(), 0);

    EXPECT_EQ(Queries(device.driver), std::vector<std::string>{"glGetString 0x1F00"});
    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_INFO),
              std::vector<std::string>{"GPU vendor = Qualcomm"});
}

TEST(OpenGLRenderer, MaliDriverVersionWithoutAVersionTextIsZeroWithoutLines)
{
    Device device(Phone());
    device.driver.SetGlString(GL_VERSION, std::nullopt);

    EXPECT_EQ(OpenGLRenderer::getMaliDriverVersion(), 0);

    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_INFO),
              std::vector<std::string>{"GPU vendor = ARM"});
}

// ---- texts and extensions -----------------------------------------------------------------------

TEST(OpenGLRenderer, VersionAndExtensionsAreTheDriversTexts)
{
    Device device(Phone()
                      .WithVersion("OpenGL ES 3.1 something")
                      .WithGlExtensions({"GL_EXT_one", "GL_EXT_two"}));

    EXPECT_STREQ(OpenGLRenderer::getGLVersion(), "OpenGL ES 3.1 something");
    EXPECT_STREQ(OpenGLRenderer::getGLExtensions(), "GL_EXT_one GL_EXT_two");
}

TEST(OpenGLRenderer, VersionAndExtensionsMayBeNull)
{
    Device device(Phone());
    device.driver.SetGlString(GL_VERSION, std::nullopt);
    device.driver.SetGlString(GL_EXTENSIONS, std::nullopt);

    EXPECT_EQ(OpenGLRenderer::getGLVersion(), nullptr);
    EXPECT_EQ(OpenGLRenderer::getGLExtensions(), nullptr);
}

TEST(OpenGLExtensions, AreFoundAsSubstrings)
{
    Device device(Phone().WithGlExtensions({"GL_EXT_texture_rg", "GL_OES_standard"}));

    EXPECT_TRUE(IsGLExtensionSupported("GL_EXT_texture_rg"));
    EXPECT_TRUE(IsGLExtensionSupported("GL_OES_standard"));
    EXPECT_TRUE(IsGLExtensionSupported("GL_EXT_texture"));
    EXPECT_TRUE(IsGLExtensionSupported("OES_standard"));
    EXPECT_TRUE(IsGLExtensionSupported(""));
    EXPECT_FALSE(IsGLExtensionSupported("GL_EXT_texture_rgb"));
    EXPECT_FALSE(IsGLExtensionSupported("gl_ext_texture_rg"));
}

TEST(OpenGLExtensions, AreNotThereWithoutANameOrAText)
{
    Device device(Phone());
    EXPECT_FALSE(IsGLExtensionSupported(nullptr));

    device.driver.SetGlString(GL_EXTENSIONS, std::nullopt);
    EXPECT_FALSE(IsGLExtensionSupported("GL_EXT_unpack_subimage"));
}

TEST(OpenGLExtensions, InitLogsTheTextsAndIsAlwaysTrue)
{
    SimGpu gpu = Phone().WithVersion("OpenGL ES 3.2").WithGlExtensions({"GL_A"});
    gpu.shadingLanguage = "GLSL";
    Device device(gpu);

    EXPECT_TRUE(InitOpenGLExtensions());

    EXPECT_EQ(
        device.driver.LogTexts(ANDROID_LOG_INFO),
        (std::vector<std::string>{"GL_VERSION = OpenGL ES 3.2",
                                  "GL_SHADING_LANGUAGE_VERSION = GLSL", "GL_EXTENSIONS = GL_A"}));
    EXPECT_EQ(device.driver.CallCount("eglGetProcAddress"), 0u);
}

TEST(OpenGLExtensions, InitIsTrueWithoutTexts)
{
    Device device(Phone());
    for (const GLenum name : {GL_VERSION, GL_EXTENSIONS, GL_SHADING_LANGUAGE_VERSION})
        device.driver.SetGlString(name, std::nullopt);

    EXPECT_TRUE(InitOpenGLExtensions());
}

// ---- errors -------------------------------------------------------------------------------------

TEST(OpenGLRenderer, ReportGLErrorIsTrueWithoutAnError)
{
    Device device(Phone());

    EXPECT_TRUE(OpenGLRenderer::reportGLError("here"));

    EXPECT_EQ(device.driver.CallNames(), Names({"glGetError"}));
    EXPECT_EQ(device.driver.Log().size(), 0u);
}

TEST(OpenGLRenderer, ReportGLErrorTakesOneError)
{
    Device device(Phone());
    device.driver.QueueGlErrors({GL_INVALID_ENUM, GL_INVALID_VALUE});

    EXPECT_FALSE(OpenGLRenderer::reportGLError("here"));

    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_ERROR),
              std::vector<std::string>{
                  "static bool Nib::OpenGLRenderer::reportGLError(const char *) : here Err: "
                  "0x0500"});
    EXPECT_EQ(device.driver.CallCount("glGetError"), 1u);
    EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_INVALID_VALUE));
}

TEST(OpenGLRenderer, ReportGLErrorTakesANullLabelAsEmpty)
{
    Device device(Phone());
    device.driver.QueueGlErrors({GL_OUT_OF_MEMORY});

    EXPECT_FALSE(OpenGLRenderer::reportGLError(nullptr));

    EXPECT_TRUE(device.driver.HasLog(
        ANDROID_LOG_ERROR,
        "static bool Nib::OpenGLRenderer::reportGLError(const char *) :  Err: 0x0505"));
}

TEST(OpenGLRenderer, ReportAndResetTakesAllErrors)
{
    Device device(Phone());
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

TEST(OpenGLRenderer, ReportAndResetTakesANullLabelAsEmpty)
{
    Device device(Phone());
    device.driver.QueueGlErrors({GL_INVALID_VALUE});

    EXPECT_FALSE(OpenGLRenderer::reportAndResetAllGLErrors(nullptr));

    EXPECT_TRUE(device.driver.HasLog(
        ANDROID_LOG_ERROR, "static bool "
                           "Nib::OpenGLRenderer::reportAndResetAllGLErrors(const char *) :  "
                           "glError = 0x0501"));
}

TEST(OpenGLRenderer, ReportAndResetIsTrueWithoutAnError)
{
    Device device(Phone());

    EXPECT_TRUE(OpenGLRenderer::reportAndResetAllGLErrors("draw"));

    EXPECT_EQ(device.driver.CallCount("glGetError"), 1u);
    EXPECT_EQ(device.driver.Log().size(), 0u);
}
