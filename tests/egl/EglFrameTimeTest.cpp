#include "egl/EglFrameTimeImpl.h"
#include "egl/EglTestSupport.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <memory>
#include <thread>

using Nib::Egl;
using Nib::EglContext;
using Nib::EglFrameTime;
using Nib::EglFrameTimeImpl;
using Nib::EglSurface;
using Nib::EglTime;
using Timestamp = EglFrameTime::FrameTimestamp;
using Timing = EglFrameTime::CompositorTiming;

namespace
{

constexpr const char* kInit = "static void Nib::EglFrameTimeImpl::InitOnce()";
constexpr const char* kConstruct = "bool Nib::EglFrameTimeImpl::Construct()";
constexpr const char* kGetForNextFrame =
    "static Nib::EglFrameTime *Nib::EglFrameTime::GetForNextFrame()";

constexpr EGLint kTimestampNames[] = {0x3434, 0x3435, 0x3436, 0x3437, 0x3438,
                                      0x3439, 0x343A, 0x343B, 0x343C};
constexpr EGLint kTimingNames[] = {0x3431, 0x3432, 0x3433};

SimGpu PlainDevice()
{
    return SimGpu::Default().WithEglExtensions({"EGL_KHR_fence_sync"});
}

SimGpu TimingDevice()
{
    return PlainDevice()
        .WithEglExtension("EGL_ANDROID_get_frame_timestamps")
        .WithEglExtension("EGL_ANDROID_presentation_time");
}

std::string Address(const char* name)
{
    char text[32];
    std::snprintf(text, sizeof(text), "%p", reinterpret_cast<void*>(eglGetProcAddress(name)));
    return text;
}

std::string Address(const void* pointer)
{
    char text[32];
    std::snprintf(text, sizeof(text), "%p", pointer);
    return text;
}

std::unique_ptr<EglFrameTime> NextFrame()
{
    return std::unique_ptr<EglFrameTime>(EglFrameTime::GetForNextFrame());
}

/// A device with a window that is current on this thread.
struct WindowDevice : OpenDisplay
{
    explicit WindowDevice(SimGpu gpu = TimingDevice())
        : OpenDisplay(std::move(gpu)), surface(egl->CreateWindowSurface(driver.Window(640, 480)))
    {
        context.Create(EGL_NO_CONTEXT, false, EglContext::Priority::Medium);
        egl->MakeCurrent(&context, surface.get());
        driver.ForgetCalls();
        driver.ForgetLog();
    }

    ~WindowDevice() { egl->MakeCurrent(nullptr, nullptr); }

    EglContext context;
    std::unique_ptr<EglSurface> surface;
};

} // namespace

// ---- the tables ---------------------------------------------------------------------------------

TEST(EglFrameTime, TimestampsHaveTheseNames)
{
    const SimDriver driver;
    for (unsigned i = 0; i < 9; ++i)
        EXPECT_EQ(EglFrameTimeImpl::FrameTimestamp2EGLint(static_cast<Timestamp>(i)),
                  kTimestampNames[i])
            << i;
}

TEST(EglFrameTime, EnumeratorsAreThoseOfTheTable)
{
    const SimDriver driver;
    EXPECT_EQ(static_cast<int>(Timestamp::RequestedPresentTime), 0);
    EXPECT_EQ(static_cast<int>(Timestamp::RenderingCompleteTime), 1);
    EXPECT_EQ(static_cast<int>(Timestamp::CompositionLatchTime), 2);
    EXPECT_EQ(static_cast<int>(Timestamp::FirstCompositionStartTime), 3);
    EXPECT_EQ(static_cast<int>(Timestamp::LastCompositionStartTime), 4);
    EXPECT_EQ(static_cast<int>(Timestamp::FirstCompositionGpuFinishedTime), 5);
    EXPECT_EQ(static_cast<int>(Timestamp::DisplayPresentTime), 6);
    EXPECT_EQ(static_cast<int>(Timestamp::DequeueReadyTime), 7);
    EXPECT_EQ(static_cast<int>(Timestamp::ReadsDoneTime), 8);
    EXPECT_EQ(static_cast<int>(Timing::CompositeDeadline), 0);
    EXPECT_EQ(static_cast<int>(Timing::CompositeInterval), 1);
    EXPECT_EQ(static_cast<int>(Timing::CompositeToPresentLatency), 2);
}

TEST(EglFrameTime, TimestampBehindTheLastIsZero)
{
    const SimDriver driver;
    for (unsigned value : {9u, 10u, 0x3434u, 0xFFFFFFFFu})
        EXPECT_EQ(EglFrameTimeImpl::FrameTimestamp2EGLint(static_cast<Timestamp>(value)), 0);
}

TEST(EglFrameTime, CompositorTimingsHaveTheseNames)
{
    const SimDriver driver;
    for (unsigned i = 0; i < 3; ++i)
        EXPECT_EQ(EglFrameTimeImpl::CompositorTiming2EGLint(static_cast<Timing>(i)),
                  kTimingNames[i])
            << i;
}

TEST(EglFrameTime, CompositorTimingBehindTheLastIsZero)
{
    const SimDriver driver;
    for (unsigned value : {3u, 4u, 0x3431u, 0xFFFFFFFFu})
        EXPECT_EQ(EglFrameTimeImpl::CompositorTiming2EGLint(static_cast<Timing>(value)), 0);
}

// ---- the entry points ---------------------------------------------------------------------------

TEST(EglFrameTime, EntryPointsAreResolvedInOrder)
{
    OpenDisplay display(TimingDevice());

    EglFrameTimeImpl::InitOnce();

    EXPECT_EQ(display.driver.Calls("eglGetProcAddress"),
              Sequence({Call("eglGetProcAddress", "eglGetCompositorTimingSupportedANDROID"),
                        Call("eglGetProcAddress", "eglGetCompositorTimingANDROID"),
                        Call("eglGetProcAddress", "eglGetFrameTimestampSupportedANDROID"),
                        Call("eglGetProcAddress", "eglGetNextFrameIdANDROID"),
                        Call("eglGetProcAddress", "eglGetFrameTimestampsANDROID"),
                        Call("eglGetProcAddress", "eglPresentationTimeANDROID")}));
}

TEST(EglFrameTime, EntryPointsAreLoggedWithTheirAddresses)
{
    OpenDisplay display(TimingDevice());

    EglFrameTimeImpl::InitOnce();

    const std::vector<std::string> lines = AllLines(display.driver);
    const std::string start = std::string("I ") + kInit + " ";
    EXPECT_EQ(
        lines,
        Lines(
            {start + "extension ANDROID_get_frame_timestamps is supported",
             start + "eglGetCompositorTimingSupportedANDROID = " +
                 Address("eglGetCompositorTimingSupportedANDROID"),
             start + "eglGetCompositorTimingANDROID = " + Address("eglGetCompositorTimingANDROID"),
             start + "eglGetFrameTimestampSupportedANDROID = " +
                 Address("eglGetFrameTimestampSupportedANDROID"),
             start + "eglGetNextFrameIdANDROID = " + Address("eglGetNextFrameIdANDROID"),
             start + "eglGetFrameTimestampsANDROID = " + Address("eglGetFrameTimestampsANDROID"),
             start + "eglPresentationTimeANDROID = " + Address("eglPresentationTimeANDROID")}));
}

TEST(EglFrameTime, EntryPointsAreResolvedOncePerProcess)
{
    OpenDisplay display(TimingDevice());
    EglFrameTimeImpl::InitOnce();
    display.driver.ForgetCalls();
    display.driver.ForgetLog();

    EglFrameTimeImpl::InitOnce();
    EglFrameTime::IsFrameTimestampSupported();
    Nib::IsPresentationTimeSupported();

    EXPECT_EQ(display.driver.CallCount(), 0u);
    EXPECT_EQ(AllLines(display.driver), Lines({}));
}

TEST(EglFrameTime, PresentationTimeAloneIsResolvedWithoutASupportLine)
{
    OpenDisplay display(PlainDevice().WithEglExtension("EGL_ANDROID_presentation_time"));

    EglFrameTimeImpl::InitOnce();

    const std::vector<std::string> lines = AllLines(display.driver);
    EXPECT_EQ(lines, Lines({std::string("I ") + kInit + " eglPresentationTimeANDROID = " +
                            Address("eglPresentationTimeANDROID")}));
    EXPECT_TRUE(Nib::IsPresentationTimeSupported());
    EXPECT_FALSE(EglFrameTime::IsFrameTimestampSupported());
}

TEST(EglFrameTime, FrameTimestampsAloneResolveFive)
{
    OpenDisplay display(PlainDevice().WithEglExtension("EGL_ANDROID_get_frame_timestamps"));

    EXPECT_TRUE(EglFrameTime::IsFrameTimestampSupported());

    EXPECT_EQ(display.driver.CallCount("eglGetProcAddress"), 5u);
    EXPECT_FALSE(Nib::IsPresentationTimeSupported());
}

TEST(EglFrameTime, NothingIsResolvedWithoutTheExtensions)
{
    OpenDisplay display(PlainDevice());

    EXPECT_FALSE(EglFrameTime::IsFrameTimestampSupported());
    EXPECT_FALSE(Nib::IsPresentationTimeSupported());

    EXPECT_EQ(display.driver.CallCount("eglGetProcAddress"), 0u);
    EXPECT_EQ(AllLines(display.driver), Lines({}));
}

TEST(EglFrameTime, MissingExtensionsAreLookedForOnce)
{
    OpenDisplay display(PlainDevice());
    EglFrameTime::IsFrameTimestampSupported();
    display.driver.ForgetCalls();

    EglFrameTime::IsFrameTimestampSupported();
    EXPECT_EQ(EglFrameTime::GetForNextFrame(), nullptr);

    EXPECT_EQ(display.driver.CallCount(), 0u);
}

TEST(EglFrameTime, SupportGoesByTheFunctionThatNumbersFrames)
{
    OpenDisplay display(TimingDevice());
    display.driver.FailWhen("eglGetProcAddress", 0, "eglGetNextFrameIdANDROID", EGL_SUCCESS);

    EXPECT_FALSE(EglFrameTime::IsFrameTimestampSupported());
    EXPECT_EQ(EglFrameTime::GetForNextFrame(), nullptr);
    EXPECT_TRUE(Nib::IsPresentationTimeSupported());
}

// ---- the object of one frame --------------------------------------------------------------------

TEST(EglFrameTime, WithoutTheExtensionThereIsNone)
{
    WindowDevice device(PlainDevice());

    EXPECT_EQ(EglFrameTime::GetForNextFrame(), nullptr);

    EXPECT_EQ(AllLines(device.driver), Lines({}));
}

TEST(EglFrameTime, ObjectIsBoundToTheDrawSurfaceAndItsNextFrame)
{
    WindowDevice device;
    EglFrameTimeImpl::InitOnce();
    delete EglFrameTime::GetForNextFrame(); // the one that dumps what is supported
    device.driver.ForgetCalls();

    const auto frame = NextFrame();

    ASSERT_NE(frame, nullptr);
    EXPECT_EQ(device.driver.CallNames(),
              Names({"eglGetCurrentSurface", "eglSurfaceAttrib", "eglGetNextFrameIdANDROID"}));
    EXPECT_EQ(device.driver.LastCall("eglGetCurrentSurface").Arg(0), 0x3059); // EGL_DRAW
    EXPECT_EQ(device.driver.LastCall("eglSurfaceAttrib"),
              Call("eglSurfaceAttrib", device.egl->GetDisplay(), device.surface->Get(), 0x3430, 1));
}

TEST(EglFrameTime, WithoutACurrentSurfaceThereIsNone)
{
    WindowDevice device;
    device.driver.AllowMisuse();
    device.egl->MakeCurrent(nullptr, nullptr);
    EglFrameTimeImpl::InitOnce();
    device.driver.ForgetLog();

    EXPECT_EQ(EglFrameTime::GetForNextFrame(), nullptr);

    EXPECT_EQ(
        device.driver.LogTexts(ANDROID_LOG_ERROR),
        Lines({std::string(kConstruct) + ": eglSurfaceAttrib(" + Address(device.egl->GetDisplay()) +
                   ", (nil), EGL_TIMESTAMPS_ANDROID, "
                   "true). Error:12301",
               std::string(kGetForNextFrame) + " Failed to initialize EglFrameTime"}));
}

TEST(EglFrameTime, RefusedTimestampsAreLogged)
{
    WindowDevice device;
    device.driver.FailNext("eglSurfaceAttrib", EGL_BAD_ATTRIBUTE);

    EXPECT_EQ(EglFrameTime::GetForNextFrame(), nullptr);

    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_ERROR),
              Lines({std::string(kConstruct) + ": eglSurfaceAttrib(" +
                         Address(device.egl->GetDisplay()) + ", " + Address(device.surface->Get()) +
                         ", EGL_TIMESTAMPS_ANDROID, true). Error:12292",
                     std::string(kGetForNextFrame) + " Failed to initialize EglFrameTime"}));
    EXPECT_EQ(device.driver.CallCount("eglGetNextFrameIdANDROID"), 0u);
}

TEST(EglFrameTime, RefusedFrameNumberIsLogged)
{
    WindowDevice device;
    device.driver.FailNext("eglGetNextFrameIdANDROID", EGL_BAD_SURFACE);

    EXPECT_EQ(EglFrameTime::GetForNextFrame(), nullptr);

    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_ERROR),
              Lines({std::string(kConstruct) + ": eglGetNextFrameIdANDROID. Error:12301",
                     std::string(kGetForNextFrame) + " Failed to initialize EglFrameTime"}));
}

// ---- what is supported --------------------------------------------------------------------------

TEST(EglFrameTime, FirstObjectDumpsWhatIsSupported)
{
    WindowDevice device;
    EglFrameTimeImpl::InitOnce();
    device.driver.ForgetLog();
    device.driver.RefuseTiming(0x3432);
    device.driver.RefuseTiming(0x343A);

    NextFrame();

    EXPECT_EQ(
        AllLines(device.driver),
        Lines({"I EGL_COMPOSITE_DEADLINE_ANDROID - true",
               "I EGL_COMPOSITE_INTERVAL_ANDROID - false",
               "I EGL_COMPOSITE_TO_PRESENT_LATENCY_ANDROID - true",
               "I EGL_REQUESTED_PRESENT_TIME_ANDROID - true",
               "I EGL_RENDERING_COMPLETE_TIME_ANDROID - true",
               "I EGL_COMPOSITION_LATCH_TIME_ANDROID - true",
               "I EGL_FIRST_COMPOSITION_START_TIME_ANDROID - true",
               "I EGL_LAST_COMPOSITION_START_TIME_ANDROID - true",
               "I EGL_FIRST_COMPOSITION_GPU_FINISHED_TIME_ANDROID - true",
               "I EGL_DISPLAY_PRESENT_TIME_ANDROID - false",
               "I EGL_DEQUEUE_READY_TIME_ANDROID - true", "I EGL_READS_DONE_TIME_ANDROID - true"}));
}

TEST(EglFrameTime, DumpAsksForEachNameOfTheFirstSurface)
{
    WindowDevice device;
    const EGLDisplay display = device.egl->GetDisplay();
    const EGLSurface surface = device.surface->Get();

    NextFrame();

    std::vector<SimCall> expected;
    for (EGLint name : kTimingNames)
        expected.push_back(Call("eglGetCompositorTimingSupportedANDROID", display, surface, name));
    for (EGLint name : kTimestampNames)
        expected.push_back(Call("eglGetFrameTimestampSupportedANDROID", display, surface, name));
    EXPECT_EQ(device.driver.Calls({"eglGetCompositorTimingSupportedANDROID",
                                   "eglGetFrameTimestampSupportedANDROID"}),
              expected);
}

TEST(EglFrameTime, DumpIsWrittenOncePerProcess)
{
    WindowDevice device;

    for (int i = 0; i < 3; ++i)
        NextFrame();

    EXPECT_EQ(device.driver.CountLogContaining("EGL_DISPLAY_PRESENT_TIME_ANDROID - true"), 1u);
    EXPECT_EQ(device.driver.CountLogContaining("EGL_COMPOSITE_DEADLINE_ANDROID - true"), 1u);
}

TEST(EglFrameTime, DumpIsWrittenOnceAlsoWhenTheFirstObjectFails)
{
    WindowDevice device;
    device.driver.FailNext("eglSurfaceAttrib", EGL_BAD_ATTRIBUTE);

    NextFrame();
    NextFrame();

    EXPECT_EQ(device.driver.CountLogContaining("EGL_READS_DONE_TIME_ANDROID - true"), 1u);
}

TEST(EglFrameTime, DumpLeavesOutWhatCannotBeAsked)
{
    WindowDevice device;
    device.driver.FailWhen("eglGetProcAddress", 0, "eglGetCompositorTimingSupportedANDROID",
                           EGL_SUCCESS);
    device.driver.FailWhen("eglGetProcAddress", 0, "eglGetFrameTimestampSupportedANDROID",
                           EGL_SUCCESS);

    const auto frame = NextFrame();

    ASSERT_NE(frame, nullptr);
    EXPECT_EQ(device.driver.CountLogContaining("_ANDROID - "), 0u);
}

TEST(EglFrameTime, TimestampSupportIsTheSurfacesAnswer)
{
    WindowDevice device;
    const auto frame = NextFrame();
    device.driver.RefuseTiming(0x3436);
    device.driver.ForgetCalls();

    EXPECT_TRUE(frame->IsTimestampSupported(Timestamp::DisplayPresentTime));
    EXPECT_FALSE(frame->IsTimestampSupported(Timestamp::CompositionLatchTime));

    const EGLDisplay display = device.egl->GetDisplay();
    const EGLSurface surface = device.surface->Get();
    EXPECT_EQ(device.driver.Calls(),
              Sequence({Call("eglGetFrameTimestampSupportedANDROID", display, surface, 0x343A),
                        Call("eglGetFrameTimestampSupportedANDROID", display, surface, 0x3436)}));
}

TEST(EglFrameTime, TimestampBehindTheLastIsNotSupported)
{
    WindowDevice device;
    const auto frame = NextFrame();

    EXPECT_FALSE(frame->IsTimestampSupported(static_cast<Timestamp>(9)));

    EXPECT_EQ(device.driver.LastCall("eglGetFrameTimestampSupportedANDROID").Arg(2), 0);
}

TEST(EglFrameTime, CompositorTimingSupportIsTheSurfacesAnswer)
{
    WindowDevice device;
    const auto frame = NextFrame();
    device.driver.RefuseTiming(0x3433);
    device.driver.ForgetCalls();

    EXPECT_TRUE(frame->IsCompositorTimingSupported(Timing::CompositeInterval));
    EXPECT_FALSE(frame->IsCompositorTimingSupported(Timing::CompositeToPresentLatency));

    const EGLDisplay display = device.egl->GetDisplay();
    const EGLSurface surface = device.surface->Get();
    EXPECT_EQ(device.driver.Calls(),
              Sequence({Call("eglGetCompositorTimingSupportedANDROID", display, surface, 0x3432),
                        Call("eglGetCompositorTimingSupportedANDROID", display, surface, 0x3433)}));
}

TEST(EglFrameTime, NothingIsSupportedWithoutTheFunctionForTimestamps)
{
    // It guards the compositor's times too, although these have a function of their own.
    WindowDevice device;
    device.driver.FailWhen("eglGetProcAddress", 0, "eglGetFrameTimestampSupportedANDROID",
                           EGL_SUCCESS);
    const auto frame = NextFrame();
    device.driver.ForgetCalls();

    EXPECT_FALSE(frame->IsTimestampSupported(Timestamp::DisplayPresentTime));
    EXPECT_FALSE(frame->IsCompositorTimingSupported(Timing::CompositeInterval));

    EXPECT_EQ(device.driver.CallCount(), 0u);
}

// ---- the times ----------------------------------------------------------------------------------

TEST(EglFrameTime, TimesAreThoseOfTheFrameForWhichTheObjectWasMade)
{
    WindowDevice device;
    device.surface->SwapBuffers(); // the frame before
    const auto frame = NextFrame();
    device.surface->SwapBuffers();
    device.driver.SetFrameTime(0x343A, 123'456'789'012);
    device.driver.ForgetCalls();

    EXPECT_EQ(frame->GetFrameTimestamp(Timestamp::DisplayPresentTime), 123'456'789'012);

    const SimCall call = device.driver.LastCall("eglGetFrameTimestampsANDROID");
    EXPECT_EQ(device.driver.CallCount(), 1u);
    EXPECT_EQ(call.args.at(0), SimValue(device.egl->GetDisplay()));
    EXPECT_EQ(call.args.at(1), SimValue(device.surface->Get()));
    EXPECT_EQ(call.Arg(2), 2); // this driver counts frames from 1
    EXPECT_EQ(call.Arg(3), 1); // one name
    EXPECT_EQ(call.list, (std::vector<long long>{0x343A}));
}

TEST(EglFrameTime, EveryTimestampIsAskedByItsName)
{
    WindowDevice device;
    const auto frame = NextFrame();
    device.surface->SwapBuffers();
    for (int i = 0; i < 9; ++i)
        device.driver.SetFrameTime(kTimestampNames[i], 1000 + i);

    for (int i = 0; i < 9; ++i)
        EXPECT_EQ(frame->GetFrameTimestamp(static_cast<Timestamp>(i)), 1000 + i);
}

TEST(EglFrameTime, PendingTimesPassThrough)
{
    WindowDevice device;
    const auto frame = NextFrame();
    device.driver.ForgetLog();

    EXPECT_EQ(frame->GetFrameTimestamp(Timestamp::DisplayPresentTime), -2);

    EXPECT_EQ(AllLines(device.driver), Lines({}));
}

TEST(EglFrameTime, InvalidTimesPassThrough)
{
    WindowDevice device;
    const auto frame = NextFrame();
    device.surface->SwapBuffers();
    device.driver.SetFrameTime(0x343A, -1);

    EXPECT_EQ(frame->GetFrameTimestamp(Timestamp::DisplayPresentTime), -1);
}

TEST(EglFrameTime, TimestampBehindTheLastIsAskedAsZeroAndRefused)
{
    WindowDevice device;
    const auto frame = NextFrame();
    device.driver.ForgetLog();

    EXPECT_EQ(frame->GetFrameTimestamp(static_cast<Timestamp>(9)), 0);

    EXPECT_EQ(device.driver.LastCall("eglGetFrameTimestampsANDROID").list,
              (std::vector<long long>{0}));
    EXPECT_EQ(AllLines(device.driver),
              Lines({"E virtual Nib::EglTime Nib::EglFrameTimeImpl::GetFrameTimestamp("
                     "Nib::EglFrameTime::FrameTimestamp) const: eglGetFrameTimestampsANDROID. "
                     "Error:300c"}));
}

TEST(EglFrameTime, RefusedTimestampIsZero)
{
    WindowDevice device;
    const auto frame = NextFrame();
    device.surface->SwapBuffers();
    device.driver.SetFrameTime(0x343A, 77);
    device.driver.FailNext("eglGetFrameTimestampsANDROID", EGL_BAD_ACCESS);

    EXPECT_EQ(frame->GetFrameTimestamp(Timestamp::DisplayPresentTime), 0);

    EXPECT_EQ(device.driver.CountLogContaining("eglGetFrameTimestampsANDROID. Error:3002"), 1u);
}

TEST(EglFrameTime, CompositorTimesAreThoseOfTheSurface)
{
    WindowDevice device;
    const auto frame = NextFrame();
    for (int i = 0; i < 3; ++i)
        device.driver.SetCompositorTime(kTimingNames[i], 16'666'666 + i);
    device.driver.ForgetCalls();

    EXPECT_EQ(frame->GetCompositorTiming(Timing::CompositeDeadline), 16'666'666);
    EXPECT_EQ(frame->GetCompositorTiming(Timing::CompositeInterval), 16'666'667);
    EXPECT_EQ(frame->GetCompositorTiming(Timing::CompositeToPresentLatency), 16'666'668);

    const std::vector<SimCall> calls = device.driver.Calls();
    ASSERT_EQ(calls.size(), 3u);
    EXPECT_EQ(calls[0].name, "eglGetCompositorTimingANDROID");
    EXPECT_EQ(calls[0].args.at(0), SimValue(device.egl->GetDisplay()));
    EXPECT_EQ(calls[0].args.at(1), SimValue(device.surface->Get()));
    EXPECT_EQ(calls[0].Arg(2), 1);
    EXPECT_EQ(calls[0].list, (std::vector<long long>{0x3431}));
}

TEST(EglFrameTime, RefusedCompositorTimeIsZero)
{
    WindowDevice device;
    const auto frame = NextFrame();
    device.driver.ForgetLog();

    EXPECT_EQ(frame->GetCompositorTiming(static_cast<Timing>(3)), 0);

    EXPECT_EQ(AllLines(device.driver),
              Lines({"E virtual Nib::EglTime Nib::EglFrameTimeImpl::GetCompositorTiming("
                     "Nib::EglFrameTime::CompositorTiming) const: eglGetCompositorTimingANDROID. "
                     "Error:300c"}));
}

TEST(EglFrameTime, PresentationTimeGoesToTheSurface)
{
    WindowDevice device;
    const auto frame = NextFrame();
    device.driver.ForgetCalls();

    EXPECT_TRUE(frame->SetPresentationTime(9'876'543'210));

    EXPECT_EQ(device.driver.Calls(),
              Sequence({Call("eglPresentationTimeANDROID", device.egl->GetDisplay(),
                             device.surface->Get(), 9'876'543'210)}));
}

TEST(EglFrameTime, RefusedPresentationTimeIsFalse)
{
    WindowDevice device;
    const auto frame = NextFrame();
    device.driver.ForgetLog();
    device.driver.FailNext("eglPresentationTimeANDROID", EGL_BAD_SURFACE);

    EXPECT_FALSE(frame->SetPresentationTime(1));

    EXPECT_EQ(
        AllLines(device.driver),
        Lines({"E virtual bool Nib::EglFrameTimeImpl::SetPresentationTime(Nib::EglTime) const: "
               "eglPresentationTimeANDROID. Error:300d"}));
}

TEST(EglFrameTime, PresentationTimeIsFalseWithoutTheExtension)
{
    WindowDevice device(PlainDevice().WithEglExtension("EGL_ANDROID_get_frame_timestamps"));
    const auto frame = NextFrame();
    device.driver.ForgetCalls();
    device.driver.ForgetLog();

    EXPECT_FALSE(frame->SetPresentationTime(1));

    EXPECT_EQ(device.driver.CallCount(), 0u);
    EXPECT_EQ(AllLines(device.driver), Lines({}));
}

TEST(EglFrameTime, DeletingAnObjectCallsNothing)
{
    WindowDevice device;
    auto frame = NextFrame();
    device.driver.ForgetCalls();

    frame.reset();

    EXPECT_EQ(device.driver.CallCount(), 0u);
}

// ---- threads and slots --------------------------------------------------------------------------

TEST(EglFrameTime, FirstCallsOfTwoThreadsAreHarmless)
{
    OpenDisplay display(TimingDevice());
    display.driver.Hold("eglGetProcAddress");
    std::thread first([] { EglFrameTimeImpl::InitOnce(); });
    display.driver.WaitUntilHeld("eglGetProcAddress");
    std::thread second([] { EglFrameTimeImpl::InitOnce(); });

    display.driver.Release("eglGetProcAddress");
    first.join();
    second.join();

    EXPECT_TRUE(EglFrameTime::IsFrameTimestampSupported());
    EXPECT_TRUE(Nib::IsPresentationTimeSupported());
}

TEST(EglFrameTime, NoTimesWithoutTheEntryPointOfTheFrameNumber)
{
    WindowDevice device;
    device.driver.FailWhen("eglGetProcAddress", 0, "eglGetNextFrameIdANDROID", EGL_SUCCESS);

    EXPECT_FALSE(EglFrameTime::IsFrameTimestampSupported());
    EXPECT_EQ(NextFrame(), nullptr);

    EXPECT_EQ(device.driver.CallCount("eglSurfaceAttrib"), 0u);
    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_ERROR).size(), 0u);
}

TEST(EglFrameTime, MissingEntryPointsOfTheTimesAreFailures)
{
    WindowDevice device;
    device.driver.FailWhen("eglGetProcAddress", 0, "eglGetFrameTimestampsANDROID", EGL_SUCCESS);
    device.driver.FailWhen("eglGetProcAddress", 0, "eglGetCompositorTimingANDROID", EGL_SUCCESS);
    const std::unique_ptr<EglFrameTime> time = NextFrame();
    ASSERT_NE(time, nullptr);

    EXPECT_EQ(time->GetFrameTimestamp(Timestamp::ReadsDoneTime), 0);
    EXPECT_EQ(time->GetCompositorTiming(Timing::CompositeInterval), 0);

    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_ERROR).size(), 2u);
}

TEST(EglFrameTime, VirtualOperationsStandInTheirOrder)
{
    // Both destructors of the ABI, then the five operations.
    using AskTimestamp = bool (*)(const EglFrameTime*, Timestamp);
    using AskTiming = bool (*)(const EglFrameTime*, Timing);
    using GetTimestamp = EglTime (*)(const EglFrameTime*, Timestamp);
    using GetTiming = EglTime (*)(const EglFrameTime*, Timing);
    using SetTime = bool (*)(const EglFrameTime*, EglTime);
    WindowDevice device;
    const std::unique_ptr<EglFrameTime> time = NextFrame();
    void* const* table = *reinterpret_cast<void* const* const*>(time.get());
    device.driver.ForgetCalls();

    reinterpret_cast<AskTimestamp>(table[2])(time.get(), Timestamp::ReadsDoneTime);
    reinterpret_cast<AskTiming>(table[3])(time.get(), Timing::CompositeDeadline);
    reinterpret_cast<GetTimestamp>(table[4])(time.get(), Timestamp::ReadsDoneTime);
    reinterpret_cast<GetTiming>(table[5])(time.get(), Timing::CompositeDeadline);
    reinterpret_cast<SetTime>(table[6])(time.get(), 1);

    EXPECT_EQ(device.driver.CallNames(),
              Names({"eglGetFrameTimestampSupportedANDROID",
                     "eglGetCompositorTimingSupportedANDROID", "eglGetFrameTimestampsANDROID",
                     "eglGetCompositorTimingANDROID", "eglPresentationTimeANDROID"}));
}
