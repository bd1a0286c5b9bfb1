#include "Device.h"
#include "GlCalls.h"

#include <nib/device.h>

#include <gtest/gtest.h>

#include <vector>

using Nib::OpenGLRenderer;

namespace
{

SimGpu Phone()
{
    return SimGpu::Named("Mali-G72");
}

} // namespace

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

TEST(GpuIdentity, VendorArm)
{
    ExpectVendor("ARM", 1, "GPU vendor = ARM");
}

TEST(GpuIdentity, VendorQualcomm)
{
    ExpectVendor("Qualcomm", 2, "GPU vendor = Qualcomm");
}

TEST(GpuIdentity, VendorOther)
{
    ExpectVendor("Imagination Technologies", 3, "GPU vendor = Other");
}

TEST(GpuIdentity, VendorOfAnEmptyTextIsOther)
{
    ExpectVendor("", 3, "GPU vendor = Other");
}

TEST(GpuIdentity, VendorIsAskedForArmFirst)
{
    ExpectVendor("Qualcomm on ARM", 1, "GPU vendor = ARM");
}

TEST(GpuIdentity, VendorIsASubstring)
{
    ExpectVendor("the Qualcomm company", 2, "GPU vendor = Qualcomm");
}

TEST(GpuIdentity, VendorNamesAreCaseSensitive)
{
    ExpectVendor("arm qualcomm", 3, "GPU vendor = Other");
}

TEST(GpuIdentity, VendorIsReadOnce)
{
    Device device(Phone());
    OpenGLRenderer::getGPUVendor();

    EXPECT_EQ(OpenGLRenderer::getGPUVendor(), 1);

    EXPECT_EQ(device.driver.CallCount("glGetString"), 1u);
    EXPECT_EQ(device.driver.CountLog(ANDROID_LOG_INFO, "GPU vendor = ARM"), 1u);
}

TEST(GpuIdentity, VendorIsReadAgainWhileTheDriverGivesNone)
{
    Device device(Phone());
    device.driver.SetGlString(GL_VENDOR, std::nullopt);
    EXPECT_EQ(OpenGLRenderer::getGPUVendor(), 0);
    EXPECT_EQ(device.driver.Log().size(), 0u);

    device.driver.SetGlString(GL_VENDOR, "Qualcomm");

    EXPECT_EQ(OpenGLRenderer::getGPUVendor(), 2);
}

// ---- renderer lists -----------------------------------------------------------------------------

TEST(GpuIdentity, GpuIsOneOfAListByPrefix)
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

TEST(GpuIdentity, GpuWithoutANameIsInNoListAndLogsNothing)
{
    Device device(Phone());
    device.driver.SetGlString(GL_RENDERER, std::nullopt);
    const char* names[] = {"", nullptr};

    EXPECT_FALSE(OpenGLRenderer::isGpuOneOf(names));

    EXPECT_EQ(device.driver.Log().size(), 0u);
}

// ---- Mali driver --------------------------------------------------------------------------------

TEST(GpuIdentity, MaliDriverVersionIsTheNumberBehindV1R)
{
    Device device(Phone().WithVersion("OpenGL ES 3.2 v1.r19p0"));

    EXPECT_EQ(OpenGLRenderer::getMaliDriverVersion(), 19);

    EXPECT_EQ(
        device.driver.LogTexts(ANDROID_LOG_INFO),
        (std::vector<std::string>{"GPU vendor = ARM", "GL_VERSION info = OpenGL ES 3.2 v1.r19p0",
                                  "Mali driver Info: ARM, version 19"}));
}

TEST(GpuIdentity, MaliDriverVersionIsKeptOnceKnown)
{
    Device device(Phone().WithVersion("OpenGL ES 3.2 v1.r19p0"));
    OpenGLRenderer::getMaliDriverVersion();
    device.driver.ForgetCalls();
    device.driver.ForgetLog();

    EXPECT_EQ(OpenGLRenderer::getMaliDriverVersion(), 19);

    EXPECT_EQ(device.driver.CallCount(), 0u);
    EXPECT_EQ(device.driver.Log().size(), 0u);
}

TEST(GpuIdentity, MaliDriverVersionZeroIsAskedForAgain)
{
    Device device(Phone().WithVersion("OpenGL ES 3.2 build 7"));
    EXPECT_EQ(OpenGLRenderer::getMaliDriverVersion(), 0);
    EXPECT_TRUE(device.driver.HasLog(ANDROID_LOG_INFO, "Mali driver Info: ARM, version 0"));

    device.driver.SetGlString(GL_VERSION, "OpenGL ES 3.2 v1.r22p0");

    EXPECT_EQ(OpenGLRenderer::getMaliDriverVersion(), 22);
}

TEST(GpuIdentity, MaliDriverVersionWithoutDigitsIsZero)
{
    Device device(Phone().WithVersion("OpenGL ES 3.2 v1.rX"));

    EXPECT_EQ(OpenGLRenderer::getMaliDriverVersion(), 0);

    EXPECT_TRUE(device.driver.HasLog(ANDROID_LOG_INFO, "Mali driver Info: ARM, version 0"));
}

TEST(GpuIdentity, MaliDriverVersionOfOtherVendorsIsZeroWithoutReadingTheVersion)
{
    Device device(SimGpu::Named("Adreno (TM) 640").WithVersion("OpenGL ES 3.2 v1.r19p0"));

    EXPECT_EQ(OpenGLRenderer::getMaliDriverVersion(), 0);

    EXPECT_EQ(Queries(device.driver), std::vector<std::string>{"glGetString 0x1F00"});
    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_INFO),
              std::vector<std::string>{"GPU vendor = Qualcomm"});
}

TEST(GpuIdentity, MaliDriverVersionWithoutAVersionTextIsZeroWithoutLines)
{
    Device device(Phone());
    device.driver.SetGlString(GL_VERSION, std::nullopt);

    EXPECT_EQ(OpenGLRenderer::getMaliDriverVersion(), 0);

    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_INFO),
              std::vector<std::string>{"GPU vendor = ARM"});
}

// ---- texts and extensions -----------------------------------------------------------------------

TEST(GpuIdentity, VersionAndExtensionsAreTheDriversTexts)
{
    Device device(Phone()
                      .WithVersion("OpenGL ES 3.1 something")
                      .WithGlExtensions({"GL_EXT_one", "GL_EXT_two"}));

    EXPECT_STREQ(OpenGLRenderer::getGLVersion(), "OpenGL ES 3.1 something");
    EXPECT_STREQ(OpenGLRenderer::getGLExtensions(), "GL_EXT_one GL_EXT_two");
}

TEST(GpuIdentity, VersionAndExtensionsMayBeNull)
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
