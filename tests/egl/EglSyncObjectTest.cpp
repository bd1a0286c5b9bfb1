#include "egl/EglSyncObjectImpl.h"
#include "egl/EglTestSupport.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <memory>
#include <thread>

using Nib::EglSyncObject;
using Nib::EglSyncObjectImpl;
using State = EglSyncObject::ObjectState;
using Result = EglSyncObject::WaitResult;

namespace
{

constexpr const char* kConstruct = "bool Nib::EglSyncObjectImpl::Construct()";
constexpr const char* kWait = "virtual EglSyncObject::WaitResult "
                              "Nib::EglSyncObjectImpl::WaitTimeout(uint64_t) const";
constexpr const char* kGetState =
    "virtual EglSyncObject::ObjectState Nib::EglSyncObjectImpl::GetState() const";

std::unique_ptr<EglSyncObject> NewFence()
{
    return std::unique_ptr<EglSyncObject>(EglSyncObject::CreateEglSyncObject());
}

std::string Address(const char* name)
{
    char text[32];
    std::snprintf(text, sizeof(text), "%p", reinterpret_cast<void*>(eglGetProcAddress(name)));
    return text;
}

/// A device with an open display and a context current on this thread.
struct FenceDevice : OpenDisplay
{
    explicit FenceDevice(SimGpu gpu = SimGpu::Default())
        : OpenDisplay(gpu.WithEglExtension("EGL_KHR_fence_sync")), context(driver)
    {
        driver.ForgetCalls();
        driver.ForgetLog();
    }

    SimContext context;
};

struct NoFenceDevice : OpenDisplay
{
    NoFenceDevice()
        : OpenDisplay(SimGpu::Default().WithoutEglExtension("EGL_KHR_fence_sync")), context(driver)
    {
        driver.ForgetCalls();
        driver.ForgetLog();
    }

    SimContext context;
};

} // namespace

// ---- the entry points ---------------------------------------------------------------------------

TEST(EglSyncObject, EntryPointsAreResolvedInOrder)
{
    FenceDevice device;

    EglSyncObjectImpl::InitOnce();

    EXPECT_EQ(device.driver.CallTexts().size(), 5u);
    EXPECT_EQ(device.driver.CallNames().at(0), "eglQueryString");
    EXPECT_EQ(device.driver.Calls("eglGetProcAddress"),
              Sequence({Call("eglGetProcAddress", "eglCreateSyncKHR"),
                        Call("eglGetProcAddress", "eglDestroySyncKHR"),
                        Call("eglGetProcAddress", "eglClientWaitSyncKHR"),
                        Call("eglGetProcAddress", "eglGetSyncAttribKHR")}));
}

TEST(EglSyncObject, EntryPointsAreLoggedWithTheirAddresses)
{
    FenceDevice device;

    EglSyncObjectImpl::InitOnce();

    const std::vector<std::string> lines = AllLines(device.driver);
    EXPECT_EQ(lines, Lines({"I static void Nib::EglSyncObjectImpl::InitOnce() "
                            "extension KHR_fence_sync is supported",
                            "I static void Nib::EglSyncObjectImpl::InitOnce() "
                            "eglCreateSyncKHR = " +
                                Address("eglCreateSyncKHR"),
                            "I static void Nib::EglSyncObjectImpl::InitOnce() "
                            "eglDestroySyncKHR = " +
                                Address("eglDestroySyncKHR"),
                            "I static void Nib::EglSyncObjectImpl::InitOnce() "
                            "eglClientWaitSyncKHR = " +
                                Address("eglClientWaitSyncKHR"),
                            "I static void Nib::EglSyncObjectImpl::InitOnce() "
                            "eglGetSyncAttribKHR = " +
                                Address("eglGetSyncAttribKHR")}));
}

TEST(EglSyncObject, EntryPointsAreResolvedOncePerProcess)
{
    FenceDevice device;
    NewFence();
    device.driver.ForgetCalls();
    device.driver.ForgetLog();

    NewFence();

    EXPECT_EQ(device.driver.CallNames(), Names({"eglCreateSyncKHR", "eglDestroySyncKHR"}));
    EXPECT_EQ(AllLines(device.driver), Lines({}));
}

TEST(EglSyncObject, PartOfTheExtensionsNameIsEnough)
{
    // The substring rule: the name is looked for without its prefix, and may have a longer end.
    OpenDisplay display(SimGpu::Default().WithEglExtensions({"EGL_KHR_fence_sync2"}));

    EglSyncObjectImpl::InitOnce();

    EXPECT_TRUE(display.driver.HasLog(ANDROID_LOG_INFO,
                                      "static void Nib::EglSyncObjectImpl::InitOnce() "
                                      "extension KHR_fence_sync is supported"));
}

TEST(EglSyncObject, EntryPointThatTheDriverLacksIsLoggedAsNull)
{
    FenceDevice device;
    device.driver.FailWhen("eglGetProcAddress", 0, "eglClientWaitSyncKHR", EGL_SUCCESS);

    EglSyncObjectImpl::InitOnce();

    EXPECT_TRUE(device.driver.HasLog(ANDROID_LOG_INFO,
                                     "static void Nib::EglSyncObjectImpl::InitOnce() "
                                     "eglClientWaitSyncKHR = (nil)"));
}

TEST(EglSyncObject, WithoutTheExtensionThereIsNoFence)
{
    NoFenceDevice device;

    EXPECT_EQ(EglSyncObject::CreateEglSyncObject(), nullptr);

    EXPECT_EQ(AllLines(device.driver), Lines({"E bool Nib::EglSyncObjectImpl::Construct() - "
                                              "EGL_KHR_fence_sync not supported"}));
    EXPECT_EQ(device.driver.CallNames(), Names({"eglQueryString"}));
}

TEST(EglSyncObject, MissingExtensionIsLookedForOnce)
{
    NoFenceDevice device;
    EglSyncObject::CreateEglSyncObject();
    device.driver.ForgetCalls();

    EXPECT_EQ(EglSyncObject::CreateEglSyncObject(), nullptr);

    EXPECT_EQ(device.driver.CallCount(), 0u);
    EXPECT_EQ(device.driver.CountLog(ANDROID_LOG_ERROR,
                                     "bool Nib::EglSyncObjectImpl::Construct() - "
                                     "EGL_KHR_fence_sync not supported"),
              2u);
}

TEST(EglSyncObject, WithoutTheEntryPointThereIsNoFence)
{
    FenceDevice device;
    device.driver.FailWhen("eglGetProcAddress", 0, "eglCreateSyncKHR", EGL_SUCCESS);

    EXPECT_EQ(EglSyncObject::CreateEglSyncObject(), nullptr);

    EXPECT_TRUE(device.driver.HasLog(ANDROID_LOG_ERROR, std::string(kConstruct) +
                                                            " - EGL_KHR_fence_sync not supported"));
}

// ---- the fence ----------------------------------------------------------------------------------

TEST(EglSyncObject, FenceIsOneOfTheDisplayWithoutAttributes)
{
    FenceDevice device;

    const auto fence = NewFence();

    ASSERT_NE(fence, nullptr);
    EXPECT_EQ(device.driver.Calls("eglCreateSyncKHR"),
              Sequence({Call("eglCreateSyncKHR", device.egl->GetDisplay(), 0x30F9, nullptr)}));
}

TEST(EglSyncObject, FenceIsDestroyedWithItsObjectOnce)
{
    FenceDevice device;
    auto fence = NewFence();
    const EGLDisplay display = device.egl->GetDisplay();
    device.driver.ForgetCalls();

    fence.reset();

    const std::vector<SimCall> calls = device.driver.Calls();
    ASSERT_EQ(calls.size(), 1u);
    EXPECT_EQ(calls[0].name, "eglDestroySyncKHR");
    EXPECT_EQ(calls[0].args.at(0), SimValue(display));
}

TEST(EglSyncObject, RefusedFenceIsNullAndLogged)
{
    FenceDevice device;
    device.driver.FailNext("eglCreateSyncKHR", EGL_BAD_ALLOC);

    EXPECT_EQ(EglSyncObject::CreateEglSyncObject(), nullptr);

    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_ERROR),
              Lines({"bool Nib::EglSyncObjectImpl::Construct() EGL_NO_SYNC_KHR (Error:0x3003)"}));
    EXPECT_EQ(device.driver.CallCount("eglDestroySyncKHR"), 0u);
}

TEST(EglSyncObject, FenceNeedsACurrentContext)
{
    FenceDevice device;
    device.driver.ExpectMisuse("eglCreateSyncKHR");
    device.context.Release();

    EXPECT_EQ(EglSyncObject::CreateEglSyncObject(), nullptr);

    EXPECT_EQ(device.driver.LogTexts(ANDROID_LOG_ERROR),
              Lines({"bool Nib::EglSyncObjectImpl::Construct() EGL_NO_SYNC_KHR (Error:0x3009)"}));
}

// ---- waiting ------------------------------------------------------------------------------------

TEST(EglSyncObject, WaitFlushesAndHasNoTimeOut)
{
    FenceDevice device;
    const auto fence = NewFence();
    device.driver.ForgetCalls();

    EXPECT_EQ(fence->Wait(), Result::Passed);

    const SimCall call = device.driver.LastCall("eglClientWaitSyncKHR");
    EXPECT_EQ(device.driver.CallCount(), 1u);
    EXPECT_EQ(call.args.at(0), SimValue(device.egl->GetDisplay()));
    EXPECT_EQ(call.Arg(2), 1);  // EGL_SYNC_FLUSH_COMMANDS_BIT_KHR
    EXPECT_EQ(call.Arg(3), -1); // all 64 bits set
}

TEST(EglSyncObject, TimeOutGoesToEglUnchanged)
{
    FenceDevice device;
    const auto fence = NewFence();

    EXPECT_EQ(fence->WaitTimeout(5'000'000'000u), Result::Passed);

    EXPECT_EQ(device.driver.LastCall("eglClientWaitSyncKHR").Arg(3), 5'000'000'000);
}

TEST(EglSyncObject, PassedFenceIsLoggedByNobody)
{
    FenceDevice device;
    const auto fence = NewFence();
    device.driver.ForgetLog();

    fence->Wait();
    fence->WaitTimeout(0);
    fence->GetState();

    EXPECT_EQ(AllLines(device.driver), Lines({}));
}

TEST(EglSyncObject, TimeOutOfZeroExpiresWhileTheGpuIsBusy)
{
    FenceDevice device;
    device.driver.SetPace(SimPace::Held);
    const auto fence = NewFence();
    device.driver.ForgetLog();

    EXPECT_EQ(static_cast<int>(fence->WaitTimeout(0)), 1);

    EXPECT_EQ(AllLines(device.driver), Lines({std::string("W ") + kWait +
                                              " wait == EGL_TIMEOUT_EXPIRED_KHR (timeout = 0)"}));
    device.driver.ReleaseGpu();
}

TEST(EglSyncObject, ExpiredTimeOutIsInItsLine)
{
    FenceDevice device;
    device.driver.SetPace(SimPace::Held);
    const auto fence = NewFence();

    EXPECT_EQ(fence->WaitTimeout(16'000'000'000u), Result::TimedOut);

    EXPECT_TRUE(device.driver.HasLog(
        ANDROID_LOG_WARN,
        std::string(kWait) + " wait == EGL_TIMEOUT_EXPIRED_KHR (timeout = 16000000000)"));
    device.driver.ReleaseGpu();
}

TEST(EglSyncObject, RefusedWaitIsAFailure)
{
    FenceDevice device;
    const auto fence = NewFence();
    device.driver.ForgetLog();
    device.driver.FailNext("eglClientWaitSyncKHR", EGL_BAD_PARAMETER);

    EXPECT_EQ(static_cast<int>(fence->Wait()), 2);

    EXPECT_EQ(AllLines(device.driver),
              Lines({std::string("E ") + kWait + " wait == EGL_FALSE ((error:0x300c))"}));
}

TEST(EglSyncObject, WaitWithoutAFenceIsAFailure)
{
    FenceDevice device;
    const EglSyncObjectImpl empty;

    EXPECT_EQ(static_cast<int>(empty.Wait()), 2);
    EXPECT_EQ(static_cast<int>(empty.WaitTimeout(1)), 2);

    const std::string line = std::string("E ") + kWait + " mSyncObject == EGL_NO_SYNC_KHR";
    EXPECT_EQ(AllLines(device.driver), Lines({line, line}));
    EXPECT_EQ(device.driver.CallCount(), 0u);
}

TEST(EglSyncObject, ObjectWithoutAFenceDestroysNothing)
{
    FenceDevice device;
    EglSyncObjectImpl::InitOnce();
    device.driver.ForgetCalls();

    {
        const EglSyncObjectImpl empty;
    }

    EXPECT_EQ(device.driver.CallCount(), 0u);
}

TEST(EglSyncObject, WaitBlocksUntilTheGpuHasPassed)
{
    // Given a fence that the GPU has not passed
    FenceDevice device;
    device.driver.SetPace(SimPace::Held);
    const auto fence = NewFence();

    // When another thread waits for it, and the GPU goes on
    Result result = Result::Failed;
    std::thread waiter([&] { result = fence->Wait(); });
    device.driver.WaitUntilHeld("eglClientWaitSyncKHR");
    device.driver.ReleaseGpu();
    waiter.join();

    // Then the wait ended with it
    EXPECT_EQ(result, Result::Passed);
}

// ---- the state ----------------------------------------------------------------------------------

TEST(EglSyncObject, StateIsAskedOfTheFence)
{
    FenceDevice device;
    const auto fence = NewFence();
    device.driver.ForgetCalls();

    fence->GetState();

    EXPECT_EQ(device.driver.CallCount(), 1u);
    EXPECT_EQ(device.driver.LastCall("eglGetSyncAttribKHR").Arg(2), 0x30F1); // EGL_SYNC_STATUS_KHR
}

TEST(EglSyncObject, StateIsOneAfterAWait)
{
    FenceDevice device;
    device.driver.SetPace(SimPace::OnWait);
    const auto fence = NewFence();
    ASSERT_EQ(fence->GetState(), State::NotSignaled);

    ASSERT_EQ(static_cast<int>(fence->Wait()), 0);

    EXPECT_EQ(static_cast<int>(fence->GetState()), 1);
}

TEST(EglSyncObject, StateIsZeroWhileTheGpuIsBusy)
{
    FenceDevice device;
    device.driver.SetPace(SimPace::Held);
    const auto fence = NewFence();

    EXPECT_EQ(static_cast<int>(fence->GetState()), 0);

    device.driver.ReleaseGpu();
    EXPECT_EQ(static_cast<int>(fence->GetState()), 1);
}

TEST(EglSyncObject, FenceMayBeAskedAndWaitedForAnyNumberOfTimes)
{
    FenceDevice device;
    const auto fence = NewFence();

    for (int i = 0; i < 3; ++i)
    {
        EXPECT_EQ(fence->Wait(), Result::Passed);
        EXPECT_EQ(fence->GetState(), State::Signaled);
    }
    EXPECT_EQ(device.driver.CallCount("eglDestroySyncKHR"), 0u);
}

TEST(EglSyncObject, StateIsUnknownWhereEglRefuses)
{
    FenceDevice device;
    const auto fence = NewFence();
    device.driver.ForgetLog();
    device.driver.FailNext("eglGetSyncAttribKHR", EGL_BAD_PARAMETER);

    EXPECT_EQ(static_cast<int>(fence->GetState()), -1);

    EXPECT_EQ(AllLines(device.driver), Lines({std::string("E ") + kGetState +
                                              " eglGetSyncAttribKHR return false (error:0x300c)"}));
}

TEST(EglSyncObject, StateIsUnknownWithoutAFence)
{
    FenceDevice device;
    const EglSyncObjectImpl empty;

    EXPECT_EQ(static_cast<int>(empty.GetState()), -1);

    EXPECT_EQ(AllLines(device.driver), Lines({std::string("E ") + kGetState + " EGL_NO_SYNC_KHR"}));
}

TEST(EglSyncObject, FencesOfTwoThreadsAreTwo)
{
    FenceDevice device;
    device.driver.SetPace(SimPace::Held);
    const auto mine = NewFence();
    std::unique_ptr<EglSyncObject> theirs;
    std::thread other(
        [&]
        {
            SimContext context(device.driver);
            theirs = NewFence();
        });
    other.join();
    device.driver.ForgetCalls();

    mine->GetState();
    theirs->GetState();

    const std::vector<SimCall> calls = device.driver.Calls("eglGetSyncAttribKHR");
    ASSERT_EQ(calls.size(), 2u);
    EXPECT_FALSE(calls[0].args.at(1) == calls[1].args.at(1));
    device.driver.ReleaseGpu();
}

// ---- threads and slots --------------------------------------------------------------------------

TEST(EglSyncObject, FirstCallsOfTwoThreadsAreHarmless)
{
    FenceDevice device;
    device.driver.Hold("eglGetProcAddress");
    std::thread first([] { EglSyncObjectImpl::InitOnce(); });
    device.driver.WaitUntilHeld("eglGetProcAddress");
    std::thread second([] { EglSyncObjectImpl::InitOnce(); });

    device.driver.Release("eglGetProcAddress");
    first.join();
    second.join();

    const std::unique_ptr<EglSyncObject> fence = NewFence();
    ASSERT_NE(fence, nullptr);
    EXPECT_EQ(fence->Wait(), Result::Passed);
}

TEST(EglSyncObject, FenceIsWaitedForAndEndedOnAnyThread)
{
    FenceDevice device;
    std::unique_ptr<EglSyncObject> fence = NewFence();

    std::thread other(
        [&]
        {
            EXPECT_EQ(fence->Wait(), Result::Passed);
            EXPECT_EQ(fence->GetState(), State::Signaled);
            fence.reset();
        });
    other.join();

    EXPECT_EQ(device.driver.Live().eglSyncs, 0);
}

TEST(EglSyncObject, VirtualOperationsStandInTheirOrder)
{
    // Both destructors of the ABI, then Wait, WaitTimeout and GetState.
    using WaitSlot = Result (*)(const EglSyncObject*);
    using TimeoutSlot = Result (*)(const EglSyncObject*, std::uint64_t);
    using StateSlot = State (*)(const EglSyncObject*);
    FenceDevice device;
    const std::unique_ptr<EglSyncObject> fence = NewFence();
    void* const* table = *reinterpret_cast<void* const* const*>(fence.get());

    EXPECT_EQ(reinterpret_cast<WaitSlot>(table[2])(fence.get()), Result::Passed);
    EXPECT_EQ(device.driver.LastCall("eglClientWaitSyncKHR").args.at(3),
              SimValue(0xFFFFFFFFFFFFFFFFull));
    EXPECT_EQ(reinterpret_cast<TimeoutSlot>(table[3])(fence.get(), 99), Result::Passed);
    EXPECT_EQ(device.driver.LastCall("eglClientWaitSyncKHR").Arg(3), 99);
    EXPECT_EQ(reinterpret_cast<StateSlot>(table[4])(fence.get()), State::Signaled);
}
