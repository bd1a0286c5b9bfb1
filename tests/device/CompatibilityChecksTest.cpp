#include "Device.h"

#include <nib/base.h>
#include <nib/device.h>
#include <nib/egl.h>
#include <nib/msg_queue.h>
#include <nib/render_thread.h>
#include <nib/task.h>

#include <gtest/gtest.h>

#include <cctype>
#include <string>
#include <thread>
#include <vector>

namespace
{

using Texts = std::vector<std::string>;

constexpr const char* kCompatible = "bool Nib::IsCompatibleGL() = true";
constexpr const char* kNotCompatible = "bool Nib::IsCompatibleGL() = false";
constexpr const char* kFbr = "bool Nib::IsFBRSupported() = true";
constexpr const char* kNoFbr = "bool Nib::IsFBRSupported() = false";
constexpr const char* kInBlockList = "bool Nib::IsInBlockList() = true";
constexpr const char* kNotInBlockList = "bool Nib::IsInBlockList() = false";
constexpr const char* kExtensionsMissing =
    "GPU doesn't supported! Required extensions: GL_EXT_unpack_subimage, GL_EXT_blend_minmax "
    "doens't supported";
constexpr const char* kVersionTooLow =
    "GPU doens't supported! Minimum required OpenGL ES 2.0 support!";

SimGpu Es2(std::vector<std::string> extensions)
{
    return SimGpu::Named("Mali-G72")
        .WithVersion("OpenGL ES 2.0 v1")
        .WithGlExtensions(std::move(extensions));
}

SimGpu FrontBufferPhone()
{
    return SimGpu::Named("Adreno (TM) 640").WithFrontBuffer();
}

/// The times that somebody took a reference to the shared render thread and made it.
std::size_t TimesCreated(const SimDriver& driver)
{
    return driver.CountLogContaining("Nib::RenderThreadGLST::getInstance() - Create");
}

} // namespace

// ---- IsCompatibleGL -----------------------------------------------------------------------------

TEST(IsCompatibleGL, VersionThreeNeedsNoExtension)
{
    SimDriver driver(
        SimGpu::Named("Mali-G72").WithVersion("OpenGL ES 3.2 v1.r19p0").WithGlExtensions({}));

    EXPECT_TRUE(Nib::IsCompatibleGL());

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kCompatible), 1u);
    EXPECT_EQ(driver.CountLogContaining("GPU do"), 0u);
}

TEST(IsCompatibleGL, VersionTwoWithBothExtensions)
{
    SimDriver driver(Es2({"GL_EXT_blend_minmax", "GL_EXT_unpack_subimage"}));

    EXPECT_TRUE(Nib::IsCompatibleGL());

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kCompatible), 1u);
}

TEST(IsCompatibleGL, VersionTwoWithoutUnpackSubimage)
{
    SimDriver driver(Es2({"GL_EXT_blend_minmax"}));

    EXPECT_FALSE(Nib::IsCompatibleGL());

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_ERROR, kExtensionsMissing), 1u);
    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kNotCompatible), 1u);
}

TEST(IsCompatibleGL, VersionTwoWithoutBlendMinmax)
{
    SimDriver driver(Es2({"GL_EXT_unpack_subimage"}));

    EXPECT_FALSE(Nib::IsCompatibleGL());

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_ERROR, kExtensionsMissing), 1u);
}

TEST(IsCompatibleGL, VersionTwoWithoutAnExtensionText)
{
    SimDriver driver(Es2({"GL_EXT_blend_minmax", "GL_EXT_unpack_subimage"}));
    driver.SetGlString(GL_EXTENSIONS, std::nullopt);

    EXPECT_FALSE(Nib::IsCompatibleGL());

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_ERROR, kExtensionsMissing), 1u);
}

TEST(IsCompatibleGL, VersionOneIsTooOld)
{
    SimDriver driver(Es2({"GL_EXT_blend_minmax", "GL_EXT_unpack_subimage"}));
    driver.SetGlString(GL_VERSION, "OpenGL ES 1.1 v1");

    EXPECT_FALSE(Nib::IsCompatibleGL());

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_ERROR, kVersionTooLow), 1u);
    EXPECT_EQ(driver.CountLog(ANDROID_LOG_ERROR, kExtensionsMissing), 0u);
    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kNotCompatible), 1u);
}

TEST(IsCompatibleGL, NoVersionAtAllIsNotCompatible)
{
    SimDriver driver;
    driver.SetGlString(GL_VERSION, std::nullopt);

    EXPECT_FALSE(Nib::IsCompatibleGL());

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kNotCompatible), 1u);
}

TEST(IsCompatibleGL, ASecondCallAnswersFromMemoryAndLogs)
{
    SimDriver driver(Es2({}));
    EXPECT_FALSE(Nib::IsCompatibleGL());
    driver.ForgetCalls();
    driver.ForgetLog();
    driver.SetGlString(GL_VERSION, "OpenGL ES 3.2");

    EXPECT_FALSE(Nib::IsCompatibleGL());

    EXPECT_EQ(driver.CallCount(), 0u);
    ASSERT_EQ(driver.Log().size(), 1u);
    EXPECT_EQ(driver.Log()[0].text, kNotCompatible);
    EXPECT_EQ(driver.Log()[0].priority, ANDROID_LOG_INFO);
}

TEST(IsCompatibleGL, AsksOnTheSharedRenderThreadAndGivesItBack)
{
    SimDriver driver(Es2({}));

    EXPECT_FALSE(Nib::IsCompatibleGL());

    EXPECT_EQ(TimesCreated(driver), 1u);
    EXPECT_EQ(driver.CountLogContaining("Nib::RenderThreadGLST::release() - Destroy"), 1u);
    for (const SimCall& call : driver.Calls("glGetString"))
        EXPECT_NE(call.thread, SimDriver::ThisThread());
    EXPECT_EQ(driver.Live().contexts, 1); // that which all share with, the thread's own is gone
}

TEST(IsCompatibleGL, LogsItsAnswerOnTheCallingThread)
{
    SimDriver driver;

    Nib::IsCompatibleGL();

    const std::vector<SimLogLine> log = driver.Log();
    EXPECT_EQ(log.back().text, kCompatible);
    EXPECT_EQ(log.back().thread, SimDriver::ThisThread());
}

TEST(IsCompatibleGL, UsesTheSharedRenderThreadThatIsThere)
{
    SimDriver driver;
    Nib::RenderThreadGL* thread = Nib::RenderThreadGLST::getInstance();

    EXPECT_TRUE(Nib::IsCompatibleGL());

    EXPECT_EQ(TimesCreated(driver), 1u);
    EXPECT_TRUE(thread->GetMsgQueue()->waitForCompleting()); // still alive
    Nib::RenderThreadGLST::release();
}

TEST(IsCompatibleGL, EightThreadsAtOnceAskTheDriverOnce)
{
    SimDriver driver;
    std::vector<std::thread> threads;
    for (int i = 0; i < 8; ++i)
        threads.emplace_back([] { EXPECT_TRUE(Nib::IsCompatibleGL()); });
    for (std::thread& thread : threads)
        thread.join();

    EXPECT_EQ(TimesCreated(driver), 1u);
    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kCompatible), 8u);
}

// ---- IsFBRSupported -----------------------------------------------------------------------------

TEST(IsFBRSupported, NeedsExtensionsGpuAndConfiguration)
{
    SimDriver driver(FrontBufferPhone());

    EXPECT_TRUE(Nib::IsFBRSupported());

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kNotInBlockList), 1u);
    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kFbr), 1u);
}

TEST(IsFBRSupported, LogsTheBlockListBeforeTheAnswer)
{
    SimDriver driver(FrontBufferPhone());

    Nib::IsFBRSupported();

    const std::vector<SimLogLine> log = driver.Log();
    ASSERT_GE(log.size(), 2u);
    EXPECT_EQ(log[log.size() - 2].text, kNotInBlockList);
    EXPECT_EQ(log[log.size() - 1].text, kFbr);
}

namespace
{

/// Each test of an extension reads the display's text once, and the first that is missing is the
/// last that is tested.
void ExpectNoFbrWithout(const char* extension, std::size_t tests)
{
    SimDriver driver(FrontBufferPhone().WithoutEglExtension(extension));
    Nib::Egl::GetInstance();
    driver.ForgetCalls();

    EXPECT_FALSE(Nib::IsFBRSupported());

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kNoFbr), 1u);
    EXPECT_EQ(driver.CallNames(), std::vector<std::string>(tests, "eglQueryString"));
    // No render thread was asked.
    EXPECT_EQ(driver.CountLogContaining("RenderThreadGLST"), 0u);
    EXPECT_EQ(driver.CountLogContaining("IsInBlockList"), 0u);
}

} // namespace

TEST(IsFBRSupported, NeedsMutableRenderBufferFirst)
{
    ExpectNoFbrWithout("EGL_KHR_mutable_render_buffer", 1);
}

TEST(IsFBRSupported, NeedsFenceSyncSecond)
{
    ExpectNoFbrWithout("EGL_KHR_fence_sync", 2);
}

TEST(IsFBRSupported, NeedsFrameTimestampsThird)
{
    ExpectNoFbrWithout("EGL_ANDROID_get_frame_timestamps", 3);
}

TEST(IsFBRSupported, NeedsPresentationTimeFourth)
{
    ExpectNoFbrWithout("EGL_ANDROID_presentation_time", 4);
}

TEST(IsFBRSupported, NeedsAFrontBufferConfiguration)
{
    SimGpu gpu = FrontBufferPhone();
    for (SimConfig& config : gpu.configs)
        config.surfaceType &= ~0x1000;
    SimDriver driver(gpu);

    EXPECT_FALSE(Nib::IsFBRSupported());

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kNotInBlockList), 1u);
    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kNoFbr), 1u);
}

TEST(IsFBRSupported, ADesktopStandInForTheConfigurationDoesNotCount)
{
    SimGpu gpu = FrontBufferPhone();
    for (SimConfig& config : gpu.configs)
        config.surfaceType &= ~0x1000;
    SimDriver driver(gpu);
    Nib::System::SetDesktopFallbacks(true);

    EXPECT_FALSE(Nib::IsFBRSupported());

    EXPECT_NE(Nib::Egl::GetInstance()->GetConfig(true), nullptr);
}

TEST(IsFBRSupported, Adreno530IsBlocked)
{
    SimDriver driver(SimGpu::Named("Adreno (TM) 530").WithFrontBuffer());

    EXPECT_FALSE(Nib::IsFBRSupported());

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kInBlockList), 1u);
    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kNoFbr), 1u);
}

TEST(IsFBRSupported, MaliT830IsBlocked)
{
    SimDriver driver(SimGpu::Named("Mali-T830").WithFrontBuffer());

    EXPECT_FALSE(Nib::IsFBRSupported());

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kInBlockList), 1u);
}

TEST(IsFBRSupported, ASecondCallTestsEglAgainAndTheBlockListNot)
{
    SimDriver driver(FrontBufferPhone());
    EXPECT_TRUE(Nib::IsFBRSupported());
    driver.ForgetCalls();
    driver.ForgetLog();

    EXPECT_TRUE(Nib::IsFBRSupported());

    EXPECT_EQ(driver.CallNames(),
              Names({"eglQueryString", "eglQueryString", "eglQueryString", "eglQueryString"}));
    EXPECT_EQ(driver.LogTexts(ANDROID_LOG_INFO), (Texts{kNotInBlockList, kFbr}));
}

TEST(IsFBRSupported, KeepsItsOwnAnswerBesideThatOfIsCompatibleGL)
{
    SimDriver driver(SimGpu::Named("Adreno (TM) 530").WithFrontBuffer());

    EXPECT_TRUE(Nib::IsCompatibleGL());
    EXPECT_FALSE(Nib::IsFBRSupported());
    EXPECT_TRUE(Nib::IsCompatibleGL());

    EXPECT_EQ(TimesCreated(driver), 2u); // a reference for the first call of each
}

TEST(IsFBRSupported, EightThreadsAtOnceShareTheLockWithIsCompatibleGL)
{
    SimDriver driver(FrontBufferPhone());
    std::vector<std::thread> threads;
    for (int i = 0; i < 4; ++i)
    {
        threads.emplace_back([] { EXPECT_TRUE(Nib::IsFBRSupported()); });
        threads.emplace_back([] { EXPECT_TRUE(Nib::IsCompatibleGL()); });
    }
    for (std::thread& thread : threads)
        thread.join();

    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kFbr), 4u);
    EXPECT_EQ(driver.CountLog(ANDROID_LOG_INFO, kCompatible), 4u);
    EXPECT_EQ(TimesCreated(driver), 2u);
}

// ---- IsGPUNameEqualTo ---------------------------------------------------------------------------

TEST(IsGPUNameEqualTo, ComparesTheBeginning)
{
    Device device(SimGpu::Named("Mali-G72"));

    EXPECT_TRUE(Nib::IsGPUNameEqualTo("Mali"));
    EXPECT_TRUE(Nib::IsGPUNameEqualTo("Mali-G72"));
    EXPECT_FALSE(Nib::IsGPUNameEqualTo("Mali-G72 MP12"));
    EXPECT_FALSE(Nib::IsGPUNameEqualTo("G72"));
    EXPECT_FALSE(Nib::IsGPUNameEqualTo("Adreno"));
}

TEST(IsGPUNameEqualTo, LogsTheTest)
{
    Device device(SimGpu::Named("Mali-G72"));

    Nib::IsGPUNameEqualTo("Mali");
    Nib::IsGPUNameEqualTo("Adreno");

    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_INFO),
              (Texts{"static bool Nib::OpenGLRenderer::isGpuOneOf(const char **) renderer - "
                     "Mali-G72 : IN LIST",
                     "static bool Nib::OpenGLRenderer::isGpuOneOf(const char **) renderer - "
                     "Mali-G72 : NOT IN LIST"}));
}

TEST(IsGPUNameEqualTo, AsksForEachNameOnce)
{
    Device device(SimGpu::Named("Mali-G72"));
    Nib::IsGPUNameEqualTo("Mali");
    Nib::IsGPUNameEqualTo("Adreno");
    device.driver.ForgetCalls();
    device.driver.ForgetLog();

    const std::string copy = "Mali"; // another address
    EXPECT_TRUE(Nib::IsGPUNameEqualTo(copy.c_str()));
    EXPECT_FALSE(Nib::IsGPUNameEqualTo("Adreno"));

    EXPECT_EQ(device.driver.CallCount(), 0u);
    EXPECT_EQ(device.driver.Log().size(), 0u);
}

TEST(IsGPUNameEqualTo, KeepsTheAnswerOfADriverWithoutAName)
{
    Device device(SimGpu::Named("Mali-G72"));
    device.driver.SetGlString(GL_RENDERER, std::nullopt);
    EXPECT_FALSE(Nib::IsGPUNameEqualTo("Mali"));
    device.driver.SetGlString(GL_RENDERER, "Mali-G72");

    EXPECT_FALSE(Nib::IsGPUNameEqualTo("Mali"));
    EXPECT_TRUE(Nib::IsGPUNameEqualTo("Mali-"));
}

TEST(IsGPUNameEqualTo, NullIsNoName)
{
    Device device(SimGpu::Named("Mali-G72"));

    EXPECT_FALSE(Nib::IsGPUNameEqualTo(nullptr));

    EXPECT_EQ(device.driver.CallCount(), 0u);
    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_INFO),
              Texts{"bool Nib::IsGPUNameEqualTo(const char *) input name is nullptr"});
}

// ---- every device -------------------------------------------------------------------------------

namespace
{

struct Verdict
{
    const char* renderer;
    bool compatible;
    bool frontBuffer; // with all that EGL has to give
};

void PrintTo(const Verdict& verdict, std::ostream* out)
{
    *out << verdict.renderer;
}

const Verdict kVerdicts[] = {
    {"Adreno (TM) 305", true, true},  {"Adreno (TM) 306", true, true},
    {"Adreno (TM) 308", true, true},  {"Adreno (TM) 330", true, true},
    {"Adreno (TM) 530", true, false}, {"Adreno (TM) 640", true, true},
    {"Mali-400 MP", false, true},     {"Mali-450 MP", false, true},
    {"Mali-T720", true, true},        {"Mali-T760", true, true},
    {"Mali-T820", true, true},        {"Mali-T830", true, false},
    {"Mali-T860", true, true},        {"Mali-T880", true, true},
    {"Mali-G71", true, true},         {"Mali-G72", true, true},
    {"Mali-G76", true, true},         {"PowerVR Rogue GE8320", true, true},
};

class EveryDevice : public testing::TestWithParam<Verdict>
{
};

std::string NameOf(const testing::TestParamInfo<Verdict>& info)
{
    std::string name = info.param.renderer;
    for (char& c : name)
    {
        if (std::isalnum(static_cast<unsigned char>(c)) == 0)
            c = '_';
    }
    return name;
}

} // namespace

TEST_P(EveryDevice, HasItsVerdicts)
{
    SimDriver driver(SimGpu::Named(GetParam().renderer).WithFrontBuffer());

    EXPECT_EQ(Nib::IsCompatibleGL(), GetParam().compatible);
    EXPECT_EQ(driver.CountLog(ANDROID_LOG_ERROR, kExtensionsMissing),
              GetParam().compatible ? 0u : 1u);
    EXPECT_EQ(Nib::IsFBRSupported(), GetParam().frontBuffer);
}

INSTANTIATE_TEST_SUITE_P(CompatibilityChecks, EveryDevice, testing::ValuesIn(kVerdicts), NameOf);

TEST(CompatibilityChecks, EveryDeviceOfTheSimulatorHasARow)
{
    std::vector<std::string> rows;
    for (const Verdict& verdict : kVerdicts)
        rows.emplace_back(verdict.renderer);
    std::vector<std::string> devices;
    for (const SimGpu& gpu : SimGpu::All())
        devices.push_back(gpu.renderer);
    EXPECT_EQ(rows, devices);
}
