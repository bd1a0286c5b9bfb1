#include "render/RenderThreadOffscreenGLImpl.h"

#include "base/Log.h"
#include "device/GlDebugOutput.h"
#include "render/NewTask.h"
#include "render/TaskFlags.h"

#include <nib/device.h>
#include <nib/shader_manager.h>

namespace Nib::GLES
{

namespace
{

// From this level of the system on, work in the background yields to what is on screen.
constexpr int kFirstSdkWithLowPriority = 29;

// Nice values.
constexpr Thread::ThreadPriority kNormalWorkerPriority = 0;
constexpr Thread::ThreadPriority kBackgroundWorkerPriority = 10;

} // namespace

RenderThreadGL* CreateOffscreenRenderer(IGLMsgQueue* parent, const char* name, bool managed)
{
    NIB_FUNCTION("Nib::RenderThreadGL *Nib::GLES::CreateOffscreenRenderer(Nib::IGLMsgQueue *, "
                 "const char *, bool)");
    NIB_LOG_INFO("%s", function);
    return new RenderThreadOffscreenGLImpl(parent, name, managed);
}

RenderThreadOffscreenGLImpl::RenderThreadOffscreenGLImpl(IGLMsgQueue* parent, const char* name,
                                                         bool managed)
    : m_parent(parent), m_name(name),
      m_parentContext(std::make_shared<std::atomic<EGLContext>>(EGL_NO_CONTEXT)), m_managed(managed)
{
    NIB_FUNCTION("Nib::GLES::RenderThreadOffscreenGLImpl::RenderThreadOffscreenGLImpl("
                 "Nib::IGLMsgQueue *, const char *, bool)");
    const int sdk = System::GetSDKVersion();
    const Thread::ThreadPriority priority =
        sdk < kFirstSdkWithLowPriority ? kNormalWorkerPriority : kBackgroundWorkerPriority;
    NIB_LOG_INFO("%s - WorkerThread priority for SDK:%d set to %d", function, sdk, priority);
    m_worker.reset(IWorkerThread::CreateInstance_NoLock(name, priority));
}

RenderThreadOffscreenGLImpl::~RenderThreadOffscreenGLImpl()
{
    NIB_FUNCTION("virtual Nib::GLES::RenderThreadOffscreenGLImpl::~RenderThreadOffscreenGLImpl()");
    NIB_LOG_INFO("%s", function);
    Terminate();
}

// ---- start and end ----

bool RenderThreadOffscreenGLImpl::Start()
{
    NIB_FUNCTION("virtual bool Nib::GLES::RenderThreadOffscreenGLImpl::Start()");
    ITask* init = NewTask(this, &RenderThreadOffscreenGLImpl::Init);
    if (m_parent == nullptr)
    {
        NIB_LOG_INFO("%s - Parent renderer is null. Initialize with independent context", function);
        const bool started = m_worker->Start(!kPaused);
        m_worker->RunSyncTask(init, kAheadOfQueue, kDeleteAfterRun);
        return started;
    }
    NIB_LOG_INFO("%s - Parent renderer is \"%s\". Start paused and wait for parent context",
                 function, m_parent->getTag());
    const bool started = m_worker->Start(kPaused);
    m_worker->EnqueueAsyncTask(init);
    ContextHandshake::Request(m_parent, &GetContextAndResume, m_worker, m_parentContext);
    return started;
}

// The task passes copies, which keep the worker alive while this runs.
// NOLINTBEGIN(performance-unnecessary-value-param)
void RenderThreadOffscreenGLImpl::GetContextAndResume(ContextHandshake::Worker worker,
                                                      ContextHandshake::Cell cell)
// NOLINTEND(performance-unnecessary-value-param)
{
    NIB_FUNCTION("static void Nib::GLES::RenderThreadOffscreenGLImpl::GetContextAndResume("
                 "std::shared_ptr<IWorkerThread>, std::shared_ptr<EGLContext>)");
    ContextHandshake::HandOver(*worker, *cell, function);
}

EGLContext RenderThreadOffscreenGLImpl::TakeParentContext()
{
    // Once: by the next resume the parent may have another. Acquires what the parent released.
    return m_parentContext->exchange(EGL_NO_CONTEXT, std::memory_order_acquire);
}

EglContext::Priority RenderThreadOffscreenGLImpl::GetPrefferedContextPriority()
{
    NIB_FUNCTION("static EglContext::Priority "
                 "Nib::GLES::RenderThreadOffscreenGLImpl::GetPrefferedContextPriority()");
    const int sdk = System::GetSDKVersion();
    const EglContext::Priority priority =
        sdk < kFirstSdkWithLowPriority ? EglContext::Priority::Medium : EglContext::Priority::Low;
    NIB_LOG_INFO("%s - Context priority for SDK:%d is 0x%X", function, sdk,
                 static_cast<unsigned>(priority));
    return priority;
}

bool RenderThreadOffscreenGLImpl::Init()
{
    NIB_FUNCTION("bool Nib::GLES::RenderThreadOffscreenGLImpl::Init()");
    NIB_LOG_INFO("%s", function);
    if (!m_context.Create(TakeParentContext(), !kFrontBuffer, GetPrefferedContextPriority()))
    {
        NIB_LOG_ERROR("%s Failed to create context", function);
        return false;
    }
    m_surface.reset(Egl::GetInstance()->CreateOffscreenSurface(1, 1));
    if (m_surface == nullptr)
    {
        NIB_LOG_ERROR("%s - Failed to create PBuffer surface", function);
        return false;
    }
    if (!Egl::GetInstance()->MakeCurrent(&m_context, m_surface.get()))
    {
        NIB_LOG_ERROR("%s Failed to MakeCurrent", function);
        return false;
    }
    BindToQueue(this, this, m_context, function);
    return true;
}

void RenderThreadOffscreenGLImpl::Terminate()
{
    NIB_FUNCTION("void Nib::GLES::RenderThreadOffscreenGLImpl::Terminate()");
    if (!m_worker->IsStarted())
        return;
    if (!m_worker->IsRunning())
    {
        if (m_parent != nullptr)
            m_parent->waitForCompleting(); // an answer on its way comes first
        m_worker->Resume();
    }
    DrainQueue(*m_worker, function);
    m_worker->EnqueueAsyncTask(NewTask(this, &RenderThreadOffscreenGLImpl::DoTerminate));
    m_worker->Terminate();
}

void RenderThreadOffscreenGLImpl::DoTerminate()
{
    NIB_FUNCTION("void Nib::GLES::RenderThreadOffscreenGLImpl::DoTerminate()");
    NIB_LOG_INFO("%s RenderThread: %p, Context: %p", function, static_cast<void*>(this),
                 m_context.Get());
    GlDebugOutput::Detach();
    Egl::GetInstance()->MakeCurrent(nullptr, nullptr);
    m_surface.reset();
    m_context.Destroy();
    ShaderManager::GetInstance()->CheckEmpty();
}

// ---- pause and resume ----

void RenderThreadOffscreenGLImpl::OnPause()
{
    NIB_FUNCTION("virtual void Nib::GLES::RenderThreadOffscreenGLImpl::OnPause()");
    if (!isRunning())
    {
        NIB_LOG_ERROR("%s : Skip DoPause to prevent ANR. Worker is on pause", function);
        return;
    }
    m_worker->RunSyncTask(NewTask(this, &RenderThreadOffscreenGLImpl::DoPause), kQueued,
                          kDeleteAfterRun);
}

void RenderThreadOffscreenGLImpl::DoPause()
{
    NIB_FUNCTION("void Nib::GLES::RenderThreadOffscreenGLImpl::DoPause()");
    NIB_LOG_INFO("%s", function);
    ReleaseContext(m_observer, *m_worker, m_context);
}

void RenderThreadOffscreenGLImpl::OnResume()
{
    NIB_FUNCTION("virtual void Nib::GLES::RenderThreadOffscreenGLImpl::OnResume()");
    NIB_LOG_INFO("%s", function);
    if (m_parent == nullptr)
    {
        NIB_LOG_ERROR("%s m_parent is NULL", function);
        return;
    }
    ITask* resume = NewTask(this, &RenderThreadOffscreenGLImpl::DoResume);
    if (!enQueueMsg(resume))
        delete resume;
    ContextHandshake::Request(m_parent, &GetContextAndResume, m_worker, m_parentContext);
}

void RenderThreadOffscreenGLImpl::DoResume()
{
    NIB_FUNCTION("void Nib::GLES::RenderThreadOffscreenGLImpl::DoResume()");
    NIB_LOG_INFO("%s", function);
    // On the front-buffer configuration, unlike the first context: the exported behaviour.
    if (!m_context.Create(TakeParentContext(), kFrontBuffer, GetPrefferedContextPriority()))
    {
        NIB_LOG_ERROR("%s Failed to create context", function);
        return;
    }
    Egl::GetInstance()->MakeCurrent(&m_context, m_surface.get());
    RestoreObjects(m_observer, function);
}

// ---- the queue ----

bool RenderThreadOffscreenGLImpl::enQueueMsg(ITask* task)
{
    return m_worker->EnqueueAsyncTask(task);
}

bool RenderThreadOffscreenGLImpl::waitForCompleting()
{
    NIB_FUNCTION("virtual bool Nib::GLES::RenderThreadOffscreenGLImpl::waitForCompleting()");
    NIB_LOG_INFO("%s", function);
    if (!m_worker->IsRunning())
    {
        NIB_LOG_ERROR("%s - worker is on pause!!!", function);
        return false;
    }
    return m_worker->WaitForExecution(nullptr);
}

bool RenderThreadOffscreenGLImpl::isRunning()
{
    return m_worker->IsRunning();
}

const char* RenderThreadOffscreenGLImpl::getTag()
{
    return m_name;
}

Observer<IManagedObject>* RenderThreadOffscreenGLImpl::GetObjectObserver()
{
    return m_managed ? &m_observer : nullptr;
}

Observer<IManagedObject>* RenderThreadOffscreenGLImpl::GetDataObserver()
{
    return m_managed ? &m_observer : nullptr;
}

// ---- frames: there is nothing to present ----

bool RenderThreadOffscreenGLImpl::Render()
{
    if (!m_worker->IsRunning())
        return false;
    m_worker->RunSyncTask(NewTask(this, &RenderThreadOffscreenGLImpl::DoRender), kQueued,
                          kDeleteAfterRun);
    return true;
}

void RenderThreadOffscreenGLImpl::DoRender() {} // Render() is a barrier, no more

void RenderThreadOffscreenGLImpl::OnSurfaceChanged(void*, int, int, int) {}

void RenderThreadOffscreenGLImpl::OnSurfaceDestroyed() {}

void RenderThreadOffscreenGLImpl::ApplyUpdateRect(const RectF&, int) {}

void RenderThreadOffscreenGLImpl::OnInput(long long) {}

bool RenderThreadOffscreenGLImpl::IsAttachedToWindow()
{
    return false;
}

IGLMsgQueue* RenderThreadOffscreenGLImpl::GetMsgQueue()
{
    return this;
}

int RenderThreadOffscreenGLImpl::GetType()
{
    return 3;
}

} // namespace Nib::GLES
