#include "render/RenderThreadGLImpl.h"

#include "base/Log.h"
#include "device/GlDebugOutput.h"
#include "render/NewTask.h"
#include "render/RenderSteps.h"
#include "render/TaskFlags.h"

#include <nib/device.h>
#include <nib/shader_manager.h>
#include <nib/trace.h>

namespace Nib::GLES
{

namespace
{

// A nice value: the thread that the eye waits for.
constexpr Thread::ThreadPriority kWorkerPriority = -9;

EglContext::Priority ContextPriority(RenderThreadGL::RenderPriority priority)
{
    switch (priority)
    {
    case RenderThreadGL::High: return EglContext::Priority::High;
    case RenderThreadGL::Low: return EglContext::Priority::Low;
    case RenderThreadGL::Medium: break;
    }
    return EglContext::Priority::Medium;
}

} // namespace

RenderThreadGL* CreateSurfaceRenderer(const char* name, RenderThreadGL::RenderPriority priority)
{
    NIB_FUNCTION("Nib::RenderThreadGL *Nib::GLES::CreateSurfaceRenderer(const char *, "
                 "RenderThreadGL::RenderPriority)");
    NIB_LOG_INFO("%s", function);
    return new RenderThreadGLImpl(name, priority);
}

RenderThreadGLImpl::RenderThreadGLImpl(const char* name, RenderThreadGL::RenderPriority priority)
    : m_worker(IWorkerThread::CreateInstance_NoLock(name, kWorkerPriority)), m_name(name),
      m_contextPriority(ContextPriority(priority))
{
}

RenderThreadGLImpl::~RenderThreadGLImpl()
{
    NIB_FUNCTION("virtual Nib::GLES::RenderThreadGLImpl::~RenderThreadGLImpl()");
    NIB_LOG_INFO("%s", function);
    Terminate();
    m_worker.reset(); // before the members that its tasks use
}

// ---- start and end ----

bool RenderThreadGLImpl::Start()
{
    const bool started = m_worker->Start(!kPaused);
    m_worker->RunSyncTask(NewTask(this, &RenderThreadGLImpl::Init), kAheadOfQueue, kDeleteAfterRun);
    return started;
}

bool RenderThreadGLImpl::Init()
{
    NIB_FUNCTION("bool Nib::GLES::RenderThreadGLImpl::Init()");
    NIB_LOG_INFO("%s", function);
    const EGLContext shared = SharedContext::GetInstance()->Get();
    if (!m_context.Create(shared, !kFrontBuffer, m_contextPriority) || !m_surface.Create())
    {
        NIB_LOG_ERROR("%s Failed to create context", function);
        return false;
    }
    if (!Egl::GetInstance()->MakeCurrent(&m_context, m_surface.GetActiveSurface()))
    {
        NIB_LOG_ERROR("%s Failed to MakeCurrent", function);
        return false;
    }
    BindToQueue(this, this, m_context, function);
    return true;
}

void RenderThreadGLImpl::Terminate()
{
    NIB_FUNCTION("void Nib::GLES::RenderThreadGLImpl::Terminate()");
    if (!m_worker->IsStarted())
        return;
    DrainQueue(*m_worker, function);
    m_worker->EnqueueAsyncTask(NewTask(this, &RenderThreadGLImpl::DoTerminate));
    m_worker->Terminate();
}

void RenderThreadGLImpl::DoTerminate()
{
    NIB_FUNCTION("void Nib::GLES::RenderThreadGLImpl::DoTerminate()");
    NIB_LOG_INFO("%s RenderThread: %p, Context: %p", function, static_cast<void*>(this),
                 m_context.Get());
    GlDebugOutput::Detach();
    Egl::GetInstance()->MakeCurrent(nullptr, nullptr);
    m_surface.Destroy();
    m_context.Destroy();
    ShaderManager::GetInstance()->CheckEmpty();
}

// ---- the window ----

void RenderThreadGLImpl::OnSurfaceChanged(void* window, int width, int height, int)
{
    m_worker->RunSyncTask(NewTask(this, &RenderThreadGLImpl::ChangeSurface,
                                  static_cast<ANativeWindow*>(window), width, height),
                          kQueued, kDeleteAfterRun);
}

void RenderThreadGLImpl::ChangeSurface(ANativeWindow* window, int width, int height)
{
    NIB_FUNCTION("void Nib::GLES::RenderThreadGLImpl::ChangeSurface(NativeWindowType, int, int)");
    NIB_LOG_INFO("%s", function);
    if (m_surface.IsAttachedToWindow())
        DetachFromWindow();
    m_surface.AttachToWindow(window);
    Egl::GetInstance()->MakeCurrent(&m_context, m_surface.GetActiveSurface());
    m_updateRectangle.Init(m_surface.GetActiveSurface(), width, height);
}

void RenderThreadGLImpl::OnSurfaceDestroyed()
{
    m_worker->RunSyncTask(NewTask(this, &RenderThreadGLImpl::DestroySurface), kQueued,
                          kDeleteAfterRun);
}

void RenderThreadGLImpl::DestroySurface()
{
    NIB_FUNCTION("void Nib::GLES::RenderThreadGLImpl::DestroySurface()");
    NIB_LOG_INFO("%s", function);
    if (!m_surface.IsAttachedToWindow())
        return;
    DetachFromWindow();
    Egl::GetInstance()->MakeCurrent(&m_context, m_surface.GetActiveSurface());
}

void RenderThreadGLImpl::DetachFromWindow()
{
    NIB_FUNCTION("void Nib::GLES::RenderThreadGLImpl::DetachFromWindow()");
    GLES::DetachFromWindow(m_surface, function);
}

bool RenderThreadGLImpl::IsAttachedToWindow()
{
    return m_surface.IsAttachedToWindow();
}

// ---- one frame, in the order it runs ----

void RenderThreadGLImpl::ApplyUpdateRect(const RectF& rect, int rotation)
{
    m_worker->EnqueueAsyncTask(NewTask(this, &RenderThreadGLImpl::UseRect, rect, rotation));
}

void RenderThreadGLImpl::UseRect(RectF rect, int rotation)
{
    m_frameDamage.Add(rect);
    m_updateRectangle.UseRect(rect, rotation);
}

bool RenderThreadGLImpl::Render()
{
    m_worker->RunSyncTask(NewTask(this, &RenderThreadGLImpl::DoRender), kQueued, kDeleteAfterRun);
    return true;
}

void RenderThreadGLImpl::DoRender()
{
    const UpdateRectangle::DamageRect damage = m_frameDamage.Take(
        {m_updateRectangle.GetScreenWidth(), m_updateRectangle.GetScreenHeight()});
    const TraceScope trace("frame", "frame",
                           {{"dirty x", damage.x},
                            {"dirty y", damage.y},
                            {"dirty width", damage.width},
                            {"dirty height", damage.height}});
    if (!m_surface.IsAttachedToWindow())
        return OpenGLRenderer::finish();
    if (m_updateRectangle.NeedsDamageRect())
        m_updateRectangle.SetDamageRect(damage);
    m_updateRectangle.Reset();         // ends tiling, drops depth and stencil
    m_updateRectangle.DoSwapBuffers(); // damage, sub-buffer or plain: decided once, at Init
}

// ---- the queue ----

bool RenderThreadGLImpl::enQueueMsg(ITask* task)
{
    return m_worker->EnqueueAsyncTask(task);
}

bool RenderThreadGLImpl::waitForCompleting()
{
    return m_worker->WaitForExecution(nullptr);
}

bool RenderThreadGLImpl::isRunning()
{
    return true;
}

const char* RenderThreadGLImpl::getTag()
{
    return m_name;
}

// ---- what needs no render thread ----

IGLMsgQueue* RenderThreadGLImpl::GetMsgQueue()
{
    return this;
}

int RenderThreadGLImpl::GetType()
{
    return 1;
}

void RenderThreadGLImpl::OnInput(long long) {}

void RenderThreadGLImpl::OnPause()
{
    NIB_FUNCTION("virtual void Nib::GLES::RenderThreadGLImpl::OnPause()");
    NIB_LOG_ERROR("%s. NOT SUPPRORTED by this implementation", function);
}

void RenderThreadGLImpl::OnResume()
{
    NIB_FUNCTION("virtual void Nib::GLES::RenderThreadGLImpl::OnResume()");
    NIB_LOG_ERROR("%s. NOT SUPPRORTED by this implementation", function);
}

} // namespace Nib::GLES
