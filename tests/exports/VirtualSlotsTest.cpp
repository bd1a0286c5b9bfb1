#include <nib/nib.h>

#include <gtest/gtest.h>

#include <cstring>
#include <vector>

// The order of virtual operations is part of what the library exports: programs built against one
// version call by slot. Slots 0 and 1 are the destructor's two forms, wherever it is declared
// first.

using namespace Nib;

namespace
{

/// The slot through which a call by @p operation goes, as the C++ ABI of all our platforms encodes
/// it in the pointer: the offset into the table of virtual operations, plus one; on Arm, where odd
/// addresses are code, the one stands in the adjustment.
template <typename Operation>
std::size_t SlotOf(Operation operation)
{
    std::ptrdiff_t words[2];
    static_assert(sizeof(operation) == sizeof(words));
    std::memcpy(words, &operation, sizeof(words));
#if defined(__aarch64__) || defined(__arm__)
    EXPECT_NE(words[1] & 1, 0) << "not a virtual operation";
    return static_cast<std::size_t>(words[0]) / sizeof(void*);
#else
    EXPECT_NE(words[0] & 1, 0) << "not a virtual operation";
    return static_cast<std::size_t>(words[0] - 1) / sizeof(void*);
#endif
}

/// One of several operations of the same name.
template <typename Signature, typename Class>
Signature Class::*Overload(Signature Class::*operation)
{
    return operation;
}

/// The slots of operations that should stand one after the other.
template <typename... Operations>
std::vector<std::size_t> Slots(Operations... operations)
{
    return {SlotOf(operations)...};
}

std::vector<std::size_t> From(std::size_t first, std::size_t count)
{
    std::vector<std::size_t> slots;
    for (std::size_t i = 0; i < count; ++i)
        slots.push_back(first + i);
    return slots;
}

class ThreeOperations
{
public:
    virtual ~ThreeOperations() = default;
    virtual int First() { return 1; }
    virtual int Second() { return 2; }
};

} // namespace

TEST(VirtualSlots, AreWhereACallThroughTheTableFindsThem)
{
    ThreeOperations object;
    void** table = nullptr;
    std::memcpy(&table, static_cast<const void*>(&object), sizeof(table));

    const auto call = [&](std::size_t slot)
    { return reinterpret_cast<int (*)(ThreeOperations*)>(table[slot])(&object); };

    EXPECT_EQ(SlotOf(&ThreeOperations::First), 2u);
    EXPECT_EQ(SlotOf(&ThreeOperations::Second), 3u);
    EXPECT_EQ(call(SlotOf(&ThreeOperations::First)), 1);
    EXPECT_EQ(call(SlotOf(&ThreeOperations::Second)), 2);
}

TEST(VirtualSlots, OfITask)
{
    EXPECT_EQ(Slots(&ITask::run, &ITask::isGlobalLockAllowed), From(2, 2));
}

TEST(VirtualSlots, OfIWorkerThread)
{
    EXPECT_EQ(Slots(&IWorkerThread::Start, &IWorkerThread::Terminate, &IWorkerThread::Pause,
                    &IWorkerThread::Resume, &IWorkerThread::EnqueueAsyncTask,
                    &IWorkerThread::IsRunning, &IWorkerThread::IsStarted,
                    &IWorkerThread::WaitForExecution, &IWorkerThread::RunSyncTask),
              From(2, 9));
}

TEST(VirtualSlots, OfRenderThreadGL)
{
    EXPECT_EQ(Slots(&RenderThreadGL::GetMsgQueue, &RenderThreadGL::GetType, &RenderThreadGL::Start,
                    &RenderThreadGL::OnSurfaceChanged, &RenderThreadGL::OnSurfaceDestroyed,
                    &RenderThreadGL::Render, &RenderThreadGL::OnInput,
                    &RenderThreadGL::ApplyUpdateRect, &RenderThreadGL::IsAttachedToWindow,
                    &RenderThreadGL::OnPause, &RenderThreadGL::OnResume),
              From(2, 11));
}

TEST(VirtualSlots, OfRenderThreadHWUI)
{
    EXPECT_EQ(SlotOf(&RenderThreadHWUI::GetSafeLock), 13u);
    EXPECT_EQ(Slots(&RenderThreadHWUI::ISafeLock::Lock, &RenderThreadHWUI::ISafeLock::Unlock),
              From(2, 2));
}

TEST(VirtualSlots, OfTheMessageQueues)
{
    EXPECT_EQ(Slots(&IGLMsgQueue::enQueueMsg, &IGLMsgQueue::waitForCompleting,
                    &IGLMsgQueue::isRunning, &IGLMsgQueue::getTag, &IGLMsgQueue::setTearingAllowed,
                    &IGLManagedMsgQueue::GetObjectObserver, &IGLManagedMsgQueue::GetDataObserver),
              From(2, 7));
}

TEST(VirtualSlots, OfManagedObjects)
{
    EXPECT_EQ(Slots(&IManagedObject::OnRelease, &IManagedObject::OnRestore,
                    &IManagedObject::ReleaseGLObject, &IManagedObject::RestoreGLObject),
              From(2, 4));
    EXPECT_EQ(Slots(&ManagedObject::OnRelease, &ManagedObject::OnRestore,
                    &ManagedObject::ReleaseGLObject, &ManagedObject::RestoreGLObject),
              From(2, 4));
}

TEST(VirtualSlots, OfObservers)
{
    using Interface = ObserverInterface<IManagedObject>;
    using TheObserver = Observer<IManagedObject>;

    EXPECT_EQ(Slots(&Interface::Subscribe, &Interface::Unsubscribe), From(2, 2));
    EXPECT_EQ(Slots(&TheObserver::Subscribe, &TheObserver::Unsubscribe), From(2, 2));
}

TEST(VirtualSlots, OfEglSyncObject)
{
    EXPECT_EQ(Slots(&EglSyncObject::Wait, &EglSyncObject::WaitTimeout, &EglSyncObject::GetState),
              From(2, 3));
}

TEST(VirtualSlots, OfEglFrameTime)
{
    EXPECT_EQ(Slots(&EglFrameTime::IsTimestampSupported, &EglFrameTime::IsCompositorTimingSupported,
                    &EglFrameTime::GetFrameTimestamp, &EglFrameTime::GetCompositorTiming,
                    &EglFrameTime::SetPresentationTime),
              From(2, 5));
}

TEST(VirtualSlots, OfITextureObject)
{
    EXPECT_EQ(Slots(&ITextureObject::SetTag, &ITextureObject::GetTag, &ITextureObject::GetWidth,
                    &ITextureObject::GetHeight, &ITextureObject::Activate,
                    Overload<void(const void*, int)>(&ITextureObject::Update),
                    Overload<void(const Rect&, const void*, int)>(&ITextureObject::Update),
                    &ITextureObject::CopyFromFramebuffer, &ITextureObject::SetData,
                    &ITextureObject::GetDescriptor, &ITextureObject::SetParam,
                    &ITextureObject::SetDescriptor, &ITextureObject::Release),
              From(2, 13));
}

TEST(VirtualSlots, OfIGraphicsObject)
{
    EXPECT_EQ(
        Slots(&IGraphicsObject::UpdateBuffer, &IGraphicsObject::UpdateIndexes,
              &IGraphicsObject::SetVertexDescriptors,
              Overload<void(PrimitiveType, unsigned int, int, bool) const>(&IGraphicsObject::Draw),
              Overload<void(unsigned int, int, bool) const>(&IGraphicsObject::Draw),
              &IGraphicsObject::DrawInstanced, &IGraphicsObject::Release),
        From(2, 7));
}

TEST(VirtualSlots, OfRenderTargets)
{
    EXPECT_EQ(Slots(&IRenderTarget::Activate, &IRenderTarget::Deactivate,
                    &IRenderTarget::ReadPixels, &IRenderTarget::Release, &IRenderTarget::ClearColor,
                    &IOffscreenRenderTarget::AttachDepthStencilBuffer,
                    &IOffscreenRenderTarget::DetachDepthStencilBuffer,
                    &IOffscreenRenderTarget::ClearDepthStencil),
              From(2, 8));
}

TEST(VirtualSlots, OfIDepthStencilBuffer)
{
    EXPECT_EQ(Slots(&IDepthStencilBuffer::GetWidth, &IDepthStencilBuffer::GetHeight,
                    &IDepthStencilBuffer::Release),
              From(2, 3));
}

TEST(VirtualSlots, OfIBlendStateObject)
{
    EXPECT_EQ(Slots(&IBlendStateObject::SetDescriptor, &IBlendStateObject::Activate,
                    &IBlendStateObject::Release),
              From(2, 3));
}

TEST(VirtualSlots, OfIDepthStencilState)
{
    EXPECT_EQ(Slots(&IDepthStencilState::SetDescriptor, &IDepthStencilState::Activate,
                    &IDepthStencilState::Release),
              From(2, 3));
}

TEST(VirtualSlots, OfIRasterizerState)
{
    EXPECT_EQ(Slots(&IRasterizerState::SetScissorEnabled, &IRasterizerState::SetScissorRect,
                    &IRasterizerState::IsScissorEnabled, &IRasterizerState::GetScissorRect),
              From(2, 4));
}

TEST(VirtualSlots, OfIUniformBuffer)
{
    EXPECT_EQ(Slots(&IUniformBuffer::Release, &IUniformBuffer::Update, &IUniformBuffer::Activate),
              From(2, 3));
}

TEST(VirtualSlots, OfIFence)
{
    EXPECT_EQ(Slots(&IFence::Release, &IFence::Insert, Overload<IFence::Result()>(&IFence::Wait),
                    Overload<IFence::Result(unsigned long long)>(&IFence::Wait),
                    &IFence::GetStatus),
              From(2, 5));
}

TEST(VirtualSlots, OfIRendererDeviceCaps)
{
    EXPECT_EQ(SlotOf(&IRendererDeviceCaps::GetMaxTextureSize), 2u);
}

TEST(VirtualSlots, OfIContextHolder)
{
    EXPECT_EQ(Slots(&IContextHolder::GetCurrentContextId, &IContextHolder::GetGPUVendor,
                    &IContextHolder::WaitForGpuCompletion),
              From(2, 3));
}

TEST(VirtualSlots, OfIParameterBindingBeginBeforeTheDestructor)
{
    EXPECT_EQ(Slots(&IParameterBinding::SetValue, &IParameterBinding::Release), From(0, 2));
}

TEST(VirtualSlots, OfIShaderProgram)
{
    EXPECT_EQ(Slots(&IShaderProgram::Activate, &IShaderProgram::Deactivate,
                    &IShaderProgram::PreDraw, &IShaderProgram::Release,
                    &IShaderProgram::GetBindingIntf),
              From(2, 5));
}
