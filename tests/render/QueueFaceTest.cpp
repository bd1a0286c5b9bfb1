// What the render threads have in common, as their callers see them.

#include "render/RenderTestSupport.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <cstring>

using namespace Nib;

namespace
{

constexpr const char* kName = "a name";

HwuiCallback s_noCallback{nullptr, nullptr, nullptr};

struct Kind
{
    const char* name;
    int type;
    RenderThreadGL* (*create)(const char* tag);
    bool managed;
    bool runsUnstarted;
};

void PrintTo(const Kind& kind, std::ostream* out)
{
    *out << kind.name;
}

RenderThreadGL* NewHwui(const char* tag)
{
    return GLES::CreateHWUIRenderer(&s_noCallback, tag);
}

RenderThreadGL* NewSurface(const char* tag)
{
    return GLES::CreateSurfaceRenderer(tag, RenderThreadGL::Medium);
}

RenderThreadGL* NewFrontBuffer(const char* tag)
{
    return GLES::CreateFBRSurfaceRenderer(nullptr, tag);
}

RenderThreadGL* NewOffscreen(const char* tag)
{
    return GLES::CreateOffscreenRenderer(nullptr, tag, true);
}

const Kind kKinds[] = {
    // name, type, create, managed, runs before it is started
    {"Hwui", 0, &NewHwui, true, true},
    {"Surface", 1, &NewSurface, false, true},
    {"FrontBuffer", 2, &NewFrontBuffer, true, false},
    {"Offscreen", 3, &NewOffscreen, true, false},
};

class EveryRenderThread : public testing::TestWithParam<Kind>
{
protected:
    SimDriver driver{SimGpu::Default().WithFrontBuffer()};
    std::unique_ptr<RenderThreadGL> thread{GetParam().create(kName)};
};

INSTANTIATE_TEST_SUITE_P(Kinds, EveryRenderThread, testing::ValuesIn(kKinds),
                         [](const auto& row) { return row.param.name; });

TEST_P(EveryRenderThread, TellsItsKind)
{
    EXPECT_EQ(thread->GetType(), GetParam().type);
}

TEST_P(EveryRenderThread, HasAQueueThatIsTheSameObject)
{
    IGLMsgQueue* queue = thread->GetMsgQueue();

    EXPECT_EQ(dynamic_cast<RenderThreadGL*>(queue), thread.get());
    EXPECT_EQ(dynamic_cast<IGLManagedMsgQueue*>(queue) != nullptr, GetParam().managed);
}

TEST_P(EveryRenderThread, KeepsTheNameThatItWasGiven)
{
    EXPECT_EQ(static_cast<const void*>(thread->GetMsgQueue()->getTag()),
              static_cast<const void*>(kName)); // the pointer, not only the text
}

TEST_P(EveryRenderThread, AllowsNoTearing)
{
    EXPECT_FALSE(thread->GetMsgQueue()->setTearingAllowed(true));
    EXPECT_FALSE(thread->GetMsgQueue()->setTearingAllowed(false));
}

TEST_P(EveryRenderThread, DoesNothingWithInput)
{
    driver.ForgetCalls();
    driver.ForgetLog();

    thread->OnInput(0x1234567890ll);

    EXPECT_EQ(driver.CallCount(), 0u);
    EXPECT_TRUE(driver.Log().empty());
}

TEST_P(EveryRenderThread, AnswersWhetherItRunsBeforeItIsStarted)
{
    EXPECT_EQ(thread->GetMsgQueue()->isRunning(), GetParam().runsUnstarted);
}

TEST_P(EveryRenderThread, RunsOnceItIsStarted)
{
    EXPECT_TRUE(thread->Start());

    EXPECT_TRUE(thread->GetMsgQueue()->isRunning());
}

TEST_P(EveryRenderThread, DiesWholeThroughItsQueue)
{
    static const char* const kLastWords[] = {
        "I HWUIThreadGLImpl::~HWUIThreadGLImpl Destructor : ",
        "I virtual Nib::GLES::RenderThreadGLImpl::~RenderThreadGLImpl()",
        "I virtual Nib::GLES::RenderThreadFBRImpl::~RenderThreadFBRImpl()",
        "I virtual Nib::GLES::RenderThreadOffscreenGLImpl::~RenderThreadOffscreenGLImpl()",
    };
    driver.ForgetLog();
    IGLMsgQueue* queue = thread.release()->GetMsgQueue();

    delete queue;

    ASSERT_FALSE(driver.Log().empty());
    EXPECT_EQ(LinesWith(driver, "").front().rfind(kLastWords[GetParam().type], 0), 0u)
        << LinesWith(driver, "").front();
}

// ---- the observers, by kind ---------------------------------------------------------------------

IGLManagedMsgQueue* Managed(RenderThreadGL& thread)
{
    return dynamic_cast<IGLManagedMsgQueue*>(thread.GetMsgQueue());
}

TEST(IGLManagedMsgQueue, OfAFrontBufferThreadHasOneObserver)
{
    SimDriver driver;
    std::unique_ptr<RenderThreadGL> thread(NewFrontBuffer("front"));

    EXPECT_NE(Managed(*thread)->GetObjectObserver(), nullptr);
    EXPECT_EQ(Managed(*thread)->GetDataObserver(), Managed(*thread)->GetObjectObserver());
}

TEST(IGLManagedMsgQueue, OfAManagedOffscreenThreadHasOneObserver)
{
    SimDriver driver;
    std::unique_ptr<RenderThreadGL> thread(GLES::CreateOffscreenRenderer(nullptr, "off", true));

    EXPECT_NE(Managed(*thread)->GetObjectObserver(), nullptr);
    EXPECT_EQ(Managed(*thread)->GetDataObserver(), Managed(*thread)->GetObjectObserver());
}

TEST(IGLManagedMsgQueue, OfAnUnmanagedOffscreenThreadHasNoObservers)
{
    SimDriver driver;
    std::unique_ptr<RenderThreadGL> thread(GLES::CreateOffscreenRenderer(nullptr, "off", false));

    EXPECT_EQ(Managed(*thread)->GetObjectObserver(), nullptr);
    EXPECT_EQ(Managed(*thread)->GetDataObserver(), nullptr);
}

TEST(IGLManagedMsgQueue, OfAnHwuiThreadHasAnObjectObserverOnly)
{
    SimDriver driver;
    std::unique_ptr<RenderThreadGL> thread(NewHwui("hwui"));

    EXPECT_NE(Managed(*thread)->GetObjectObserver(), nullptr);
    EXPECT_EQ(Managed(*thread)->GetDataObserver(), nullptr);
}

// ---- waiting for a thread that does not run -----------------------------------------------------

TEST(WaitForCompleting, OfAnUnstartedSurfaceThreadLeavesTheComplaintToTheWorker)
{
    SimDriver driver;
    std::unique_ptr<RenderThreadGL> thread(NewSurface("surface"));
    driver.ForgetLog();

    EXPECT_FALSE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"E virtual bool Nib::WorkerThreadImpl::WaitForExecution(int *). Worker is on "
                     "pause (Queued task: 0). No task executed."}));
}

TEST(WaitForCompleting, OfAnUnstartedFrontBufferThreadIsAnError)
{
    SimDriver driver;
    std::unique_ptr<RenderThreadGL> thread(NewFrontBuffer("front"));
    driver.ForgetLog();

    EXPECT_FALSE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"E virtual bool Nib::GLES::RenderThreadFBRImpl::waitForCompleting() - worker "
                     "is on pause!!!"}));
}

TEST(WaitForCompleting, OfAnUnstartedOffscreenThreadIsALineAndAnError)
{
    SimDriver driver;
    std::unique_ptr<RenderThreadGL> thread(NewOffscreen("off"));
    driver.ForgetLog();

    EXPECT_FALSE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(LinesWith(driver, ""),
              Lines({"I virtual bool Nib::GLES::RenderThreadOffscreenGLImpl::waitForCompleting()",
                     "E virtual bool Nib::GLES::RenderThreadOffscreenGLImpl::waitForCompleting() - "
                     "worker is on pause!!!"}));
}

// ---- the interfaces -----------------------------------------------------------------------------

/// The slot of a virtual operation, as the Itanium C++ ABI writes it into a member pointer. Slots 0
/// and 1 are the destructor's.
template <typename Function>
std::size_t SlotOf(Function function)
{
    static_assert(sizeof(Function) == 2 * sizeof(std::size_t));
    std::size_t words[2];
    std::memcpy(words, &function, sizeof(words));
    return (words[0] - 1) / sizeof(void*);
}

TEST(RenderThreadGLInterface, KeepsTheOrderOfItsVirtualOperations)
{
    EXPECT_EQ(SlotOf(&RenderThreadGL::GetMsgQueue), 2u);
    EXPECT_EQ(SlotOf(&RenderThreadGL::GetType), 3u);
    EXPECT_EQ(SlotOf(&RenderThreadGL::Start), 4u);
    EXPECT_EQ(SlotOf(&RenderThreadGL::OnSurfaceChanged), 5u);
    EXPECT_EQ(SlotOf(&RenderThreadGL::OnSurfaceDestroyed), 6u);
    EXPECT_EQ(SlotOf(&RenderThreadGL::Render), 7u);
    EXPECT_EQ(SlotOf(&RenderThreadGL::OnInput), 8u);
    EXPECT_EQ(SlotOf(&RenderThreadGL::ApplyUpdateRect), 9u);
    EXPECT_EQ(SlotOf(&RenderThreadGL::IsAttachedToWindow), 10u);
    EXPECT_EQ(SlotOf(&RenderThreadGL::OnPause), 11u);
    EXPECT_EQ(SlotOf(&RenderThreadGL::OnResume), 12u);
    EXPECT_EQ(SlotOf(&RenderThreadHWUI::GetSafeLock), 13u);
    EXPECT_EQ(SlotOf(&RenderThreadHWUI::ISafeLock::Lock), 2u);
    EXPECT_EQ(SlotOf(&RenderThreadHWUI::ISafeLock::Unlock), 3u);
}

TEST(IGLMsgQueueInterface, KeepsTheOrderOfItsVirtualOperations)
{
    EXPECT_EQ(SlotOf(&IGLMsgQueue::enQueueMsg), 2u);
    EXPECT_EQ(SlotOf(&IGLMsgQueue::waitForCompleting), 3u);
    EXPECT_EQ(SlotOf(&IGLMsgQueue::isRunning), 4u);
    EXPECT_EQ(SlotOf(&IGLMsgQueue::getTag), 5u);
    EXPECT_EQ(SlotOf(&IGLMsgQueue::setTearingAllowed), 6u);
    EXPECT_EQ(SlotOf(&IGLManagedMsgQueue::GetObjectObserver), 7u);
    EXPECT_EQ(SlotOf(&IGLManagedMsgQueue::GetDataObserver), 8u);
}

TEST(RenderPriority, HasItsValues)
{
    EXPECT_EQ(static_cast<int>(RenderThreadGL::High), 0);
    EXPECT_EQ(static_cast<int>(RenderThreadGL::Medium), 1);
    EXPECT_EQ(static_cast<int>(RenderThreadGL::Low), 2);
}

TEST(HwuiCallbackStructure, KeepsTheOrderOfItsFields)
{
    EXPECT_EQ(offsetof(HwuiCallback, reserved), 0u);
    EXPECT_EQ(offsetof(HwuiCallback, invoke), sizeof(void*));
    EXPECT_EQ(offsetof(HwuiCallback, context), 2 * sizeof(void*));
}

// ---- the factories ------------------------------------------------------------------------------

TEST(CreateSurfaceRenderer, WritesItsLineAndStartsNothing)
{
    SimDriver driver;

    std::unique_ptr<RenderThreadGL> thread(NewSurface("x"));

    EXPECT_EQ(LinesWith(driver, "::Create"),
              Lines({"I Nib::RenderThreadGL *Nib::GLES::CreateSurfaceRenderer(const char *, "
                     "RenderThreadGL::RenderPriority)"}));
    EXPECT_EQ(driver.CountLogContaining("WorkerThreadImpl::Start"), 0u);
    EXPECT_EQ(driver.CallCount("eglGetDisplay"), 0u);
}

TEST(CreateFBRSurfaceRenderer, WritesItsLineAndStartsNothing)
{
    SimDriver driver;

    std::unique_ptr<RenderThreadGL> thread(NewFrontBuffer("x"));

    EXPECT_EQ(LinesWith(driver, "::Create"),
              Lines({"I Nib::RenderThreadGL *Nib::GLES::CreateFBRSurfaceRenderer(Nib::IGLMsgQueue "
                     "*, const char *)"}));
    EXPECT_EQ(driver.CountLogContaining("WorkerThreadImpl::Start"), 0u);
    EXPECT_EQ(driver.CallCount(), 0u);
}

TEST(CreateOffscreenRenderer, WritesItsLineAndStartsNothing)
{
    SimDriver driver;

    std::unique_ptr<RenderThreadGL> thread(NewOffscreen("x"));

    EXPECT_EQ(
        LinesWith(driver, "::Create"),
        Lines({"I Nib::RenderThreadGL *Nib::GLES::CreateOffscreenRenderer(Nib::IGLMsgQueue *, "
               "const char *, bool)"}));
    EXPECT_EQ(driver.CountLogContaining("WorkerThreadImpl::Start"), 0u);
    EXPECT_EQ(driver.CallCount(), 0u);
}

// ---- posting and waiting ------------------------------------------------------------------------

TEST(QueueFace, ATaskMayPostTasksToItsOwnQueue)
{
    SimDriver driver;
    std::unique_ptr<RenderThreadGL> thread(NewSurface("surface"));
    thread->Start();
    IGLMsgQueue* queue = thread->GetMsgQueue();
    std::vector<int> order;

    RunOn(queue,
          [&]
          {
              Post(queue, [&] { order.push_back(2); });
              order.push_back(1);
          });
    ASSERT_TRUE(queue->waitForCompleting());

    EXPECT_EQ(order, (std::vector<int>{1, 2}));
}

TEST(QueueFace, WaitForCompletingReturnsAfterEveryTaskPostedBeforeIt)
{
    SimDriver driver;
    std::unique_ptr<RenderThreadGL> thread(NewSurface("surface"));
    thread->Start();
    std::atomic<int> ran{0};

    for (int i = 0; i < 100; ++i)
        Post(thread->GetMsgQueue(), [&] { ++ran; });
    EXPECT_TRUE(thread->GetMsgQueue()->waitForCompleting());

    EXPECT_EQ(ran, 100);
}

} // namespace
