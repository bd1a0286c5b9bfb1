#include "render/HWUIThreadGLImpl.h"

#include "base/Log.h"
#include "device/GlDebugOutput.h"
#include "render/NewTask.h"
#include "render/RenderSteps.h"
#include "thread/TaskScope.h"

#include <nib/device.h>
#include <nib/shader_manager.h>
#include <nib/trace.h>

#include <EGL/egl.h>

#include <memory>
#include <stdexcept>

namespace Nib::GLES
{

namespace
{

constexpr int kNoTimeOut = -1;
constexpr const ITask* kNoTask = nullptr;

/// Has the shared render thread read the GL parameters, which need a context of their own kind.
void ReadGLParameters()
{
    RenderThreadGLST::getInstance()->GetMsgQueue()->waitForCompleting();
    RenderThreadGLST::release();
}

} // namespace

RenderThreadHWUI* CreateHWUIRenderer(HwuiCallback* callback, const char* tag)
{
    NIB_FUNCTION("Nib::RenderThreadHWUI *Nib::GLES::CreateHWUIRenderer(Nib::HwuiCallback *, "
                 "const char *)");
    NIB_LOG_INFO("%s ", function);
    if (!OpenGLRenderer::IsGLParameterInited())
        ReadGLParameters();
    return new HWUIThreadGLImpl(callback, tag);
}

HWUIThreadGLImpl::HWUIThreadGLImpl(HwuiCallback* callback, const char* tag)
    : m_callback(callback), m_observer(nullptr), m_tag(tag)
{
    NIB_LOG_INFO("HWUIThreadGLImpl::HWUIThreadGLImpl Constructor : %p", static_cast<void*>(this));
    m_observer = HWUIObjectObserver::GetInstance();
    ReadWatchdogEnvironment();
    Trace::StartFromEnvironment();
    Post(NewTask(this, &HWUIThreadGLImpl::Init));
}

void HWUIThreadGLImpl::Init()
{
    NIB_FUNCTION("void Nib::GLES::HWUIThreadGLImpl::Init()");
    GlDebugOutput::Attach(GlDebugOutput::Owner::Borrowed);
    OpenGLRenderer::InitParameters();
    NIB_LOG_INFO("%s RenderThread: %p, Context: %p", function, static_cast<void*>(this),
                 eglGetCurrentContext());
}

HWUIThreadGLImpl::~HWUIThreadGLImpl()
{
    NIB_FUNCTION("virtual Nib::GLES::HWUIThreadGLImpl::~HWUIThreadGLImpl()");
    NIB_LOG_INFO("HWUIThreadGLImpl::~HWUIThreadGLImpl Destructor : %p", static_cast<void*>(this));
    AttachToThread(this); // the last tasks may make and destroy objects
    NIB_LOG_INFO("%s RenderThread: %p, Context: %p", function, static_cast<void*>(this),
                 eglGetCurrentContext());
    RunLastTasks(function);
    if (m_paused.load(std::memory_order_relaxed))
        NIB_LOG_INFO("OnTrim was detected, printing resources left in database");
    else
        NIB_LOG_INFO("OnTrim not detected, checking for leaks");
    GlDebugOutput::Detach();
    if (m_observer->Release())
        ShaderManager::GetInstance()->CheckEmpty();
    if (GetCurrentMsgQueue() == this)
        AttachToThread(nullptr);
}

void HWUIThreadGLImpl::RunLastTasks(const char* function)
{
    if (eglGetCurrentContext() == EGL_NO_CONTEXT)
    {
        NIB_LOG_INFO("%s. EGL_NO_CONTEXT. Clean up the queue", function);
        RemoveTasks(m_queues[0]);
        RemoveTasks(m_queues[1]);
        return;
    }
    OpenGLRenderer::OpenGlState state;
    state.store();
    RunTasks(&m_queues[m_pushQueueIndex]);
    for (int index = 0; index < 2; ++index)
    {
        const int count = RemoveTasks(m_queues[index]);
        NIB_LOG_DEBUG("%s. queue[%d].count=%d m_pushQueueIndex=%d", function, index, count,
                      m_pushQueueIndex);
    }
    state.restore();
}

int HWUIThreadGLImpl::RemoveTasks(TaskQueue& queue)
{
    int count = 0;
    while (const std::unique_ptr<ITask> task{queue.Pop()})
        ++count;
    return count;
}

// ---- one frame, in the order it runs ----

bool HWUIThreadGLImpl::enQueueMsg(ITask* task)
{
    AutoCriticalSection lock(m_queueLock);
    m_queues[m_pushQueueIndex].Push(task);
    return true;
}

void HWUIThreadGLImpl::Post(ITask* task)
{
    if (!enQueueMsg(task))
        delete task;
}

bool HWUIThreadGLImpl::Render()
{
    NIB_FUNCTION("virtual bool Nib::GLES::HWUIThreadGLImpl::Render()");
    NIB_LOG_INFO("%s", function);
    m_hwuiThreadId.store(GetNibCurrentThreadId(), std::memory_order_relaxed);
    AttachToThread(this);
    const TraceLane lane(m_tag);
    const TraceScope trace("frame", "frame");
    AutoCriticalSection lock(m_waitLock);
    if (eglGetCurrentContext() != EGL_NO_CONTEXT)
    {
        TaskQueue* queue = &m_queues[SwapQueues()];
        OpenGLRenderer::disableState(RenderState::ScissorTest);
        RunTasks(queue);
    }
    if (m_waiting)
    {
        m_waiting = false;
        WatchedCall::Answer(m_watched, kNoTask);
        NIB_LOG_DEBUG("%s - Signal m_waitForCompletingCV", function);
        m_waitForCompletingCV.SignalAll();
    }
    return true;
}

/// Producers move to the other queue. Returns the index of the one that they leave.
int HWUIThreadGLImpl::SwapQueues()
{
    AutoCriticalSection lock(m_queueLock);
    const int index = m_pushQueueIndex;
    m_pushQueueIndex = 1 - index;
    return index;
}

void HWUIThreadGLImpl::RunTasks(TaskQueue* queue)
{
    int count = 0;
    while (const std::unique_ptr<ITask> task{queue->Pop()})
    {
        const WatchedCall call(WatchedCall::Kind::Run, m_watched, task.get());
        const TaskScope trace(*task);
        task->run();
        ++count;
    }
    NIB_LOG_DEBUG("HWUIThreadGLImpl::RunTasks count=%d", count);
    Trace::Counter("queue", "queue", count); // until this frame
}

// ---- waiting for a frame ----

bool HWUIThreadGLImpl::IsRenderThread()
{
    NIB_FUNCTION("bool Nib::GLES::HWUIThreadGLImpl::IsRenderThread()");
    const std::uint64_t hwui = m_hwuiThreadId.load(std::memory_order_relaxed);
    const std::uint64_t current = GetNibCurrentThreadId();
    NIB_LOG_INFO("%s m_hwuiThreadId:%d currentTheadId:%d", function, static_cast<int>(hwui),
                 static_cast<int>(current));
    return hwui == current;
}

bool HWUIThreadGLImpl::waitForCompleting()
{
    NIB_FUNCTION("virtual bool Nib::GLES::HWUIThreadGLImpl::waitForCompleting()");
    NIB_LOG_INFO("%s", function);
    if (!IsRenderThread())
        return WaitForNextFrame(function);

    // Inside the draw callback: the frame is drawn at once, and the UI sees its GL state unchanged.
    OpenGLRenderer::OpenGlState state;
    state.store();
    Render();
    state.restore();
    return true;
}

bool HWUIThreadGLImpl::WaitForNextFrame(const char* function)
{
    const WatchedCall wait(m_watched, "draw its next frame");
    const TraceScope trace("wait", "wait", {{"for", m_tag}, {"until", "its next frame"}});
    AutoCriticalSection lock(m_waitLock);
    if (m_lockRequested)
    {
        m_lockCondition.SignalAll(); // the UI's thread waits for the safe lock: it draws meanwhile
    }
    else if (m_callback->invoke != nullptr && !m_callback->invoke(nullptr, m_callback->context, 0))
    {
        NIB_LOG_WARN("%s - Invoke was not requested. Probably HWUI is not initialized yet.",
                     function);
        return false;
    }
    m_waiting = true;
    // Once: a wait ends by a signal alone, and a frame signals only those who came before it.
    m_waitForCompletingCV.Wait(&m_waitLock, kNoTimeOut);
    return true;
}

// ---- the safe lock ----

void HWUIThreadGLImpl::Lock(bool invokeIfNeeded)
{
    const Thread::Handle self = Thread::self();
    if (m_lockOwner.load(std::memory_order_relaxed) == self)
    {
        ++m_lockCount;
        return;
    }
    const WatchedCall wait(m_watchedLock, "leave its safe lock");
    const TraceScope trace("wait", "wait", {{"for", m_tag}, {"until", "its safe lock is free"}});
    AutoCriticalSection lock(m_waitLock);
    if (m_lockOwner.load(std::memory_order_relaxed) == 0)
        return TakeSafeLock();

    if (invokeIfNeeded)
        m_lockRequested = true;
    while (m_lockOwner.load(std::memory_order_relaxed) != 0)
    {
        if (invokeIfNeeded && m_waiting)
            Render(); // for the owner, who cannot unlock before its tasks have run
        m_lockCondition.Wait(&m_waitLock, kNoTimeOut);
    }
    if (invokeIfNeeded)
        m_lockRequested = false;
    TakeSafeLock();
}

void HWUIThreadGLImpl::TakeSafeLock()
{
    m_lockOwner.store(Thread::self(), std::memory_order_relaxed);
    m_lockCount = 1;
}

void HWUIThreadGLImpl::Unlock()
{
    NIB_FUNCTION("virtual void Nib::GLES::HWUIThreadGLImpl::Unlock()");
    AutoCriticalSection lock(m_waitLock);
    const Thread::Handle owner = m_lockOwner.load(std::memory_order_relaxed);
    const Thread::Handle self = Thread::self();
    if (owner != self)
    {
        NIB_LOG_ERROR("%s HWUI Safelock: Must be unlocked on owner thread(%ld) but called on %ld",
                      function, static_cast<long>(owner), static_cast<long>(self));
        throw std::logic_error("HWUI Safelock: Unlock should be called on owner thread");
    }
    if (--m_lockCount > 0)
        return;
    m_lockOwner.store(0, std::memory_order_relaxed);
    m_lockCondition.SignalAll();
}

RenderThreadHWUI::ISafeLock* HWUIThreadGLImpl::GetSafeLock()
{
    return this;
}

// ---- pause and resume ----

void HWUIThreadGLImpl::OnPause()
{
    m_paused.store(true, std::memory_order_relaxed);
    Post(NewTask(m_observer, &HWUIObjectObserver::DispatchRelease));
    Post(NewTask(ShaderManager::GetInstance(), &ShaderManager::OnDestroyContext));
    waitForCompleting(); // objects lose their names while the context is still there
}

void HWUIThreadGLImpl::OnResume()
{
    Post(NewTask(this, &HWUIThreadGLImpl::RestoreObjects));
    Post(NewTask(ShaderManager::GetInstance(), &ShaderManager::OnRestoreContext));
}

void HWUIThreadGLImpl::RestoreObjects()
{
    NIB_FUNCTION("void Nib::GLES::HWUIThreadGLImpl::RestoreObjects()");
    RestoreEach(*m_observer, function); // the UI's frame, too, has nobody to catch
}

// ---- what the UI does itself ----

void HWUIThreadGLImpl::OnSurfaceChanged(void*, int, int, int)
{
    NIB_FUNCTION("virtual void Nib::GLES::HWUIThreadGLImpl::OnSurfaceChanged(void *, int, int, "
                 "int)");
    NIB_LOG_ERROR("%s. NOT SUPPRORTED by this implementation", function);
}

void HWUIThreadGLImpl::OnSurfaceDestroyed()
{
    NIB_FUNCTION("virtual void Nib::GLES::HWUIThreadGLImpl::OnSurfaceDestroyed()");
    NIB_LOG_ERROR("%s. NOT SUPPRORTED by this implementation", function);
}

void HWUIThreadGLImpl::ApplyUpdateRect(const RectF&, int)
{
    NIB_FUNCTION("virtual void Nib::GLES::HWUIThreadGLImpl::ApplyUpdateRect(const Nib::RectF &, "
                 "int)");
    NIB_LOG_INFO("%s ", function);
}

void HWUIThreadGLImpl::DoApplyUpdateRect(const RectF& rect)
{
    NIB_FUNCTION("void Nib::GLES::HWUIThreadGLImpl::DoApplyUpdateRect(const Nib::RectF &)");
    NIB_LOG_INFO("%s ", function);
    OpenGLRenderer::enableState(RenderState::ScissorTest);
    Rect box;
    box = rect; // truncates each field
    OpenGLRenderer::setScissor(box.left, box.top, static_cast<unsigned>(box.right),
                               static_cast<unsigned>(box.bottom));
}

bool HWUIThreadGLImpl::Start()
{
    return true;
}

void HWUIThreadGLImpl::OnInput(long long) {}

bool HWUIThreadGLImpl::IsAttachedToWindow()
{
    return true;
}

IGLMsgQueue* HWUIThreadGLImpl::GetMsgQueue()
{
    return static_cast<IGLManagedMsgQueue*>(this);
}

int HWUIThreadGLImpl::GetType()
{
    return 0;
}

bool HWUIThreadGLImpl::isRunning()
{
    return true;
}

const char* HWUIThreadGLImpl::getTag()
{
    return m_tag;
}

Observer<IManagedObject>* HWUIThreadGLImpl::GetObjectObserver()
{
    return m_observer;
}

Observer<IManagedObject>* HWUIThreadGLImpl::GetDataObserver()
{
    return nullptr;
}

} // namespace Nib::GLES
