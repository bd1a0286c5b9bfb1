#include "render/RenderThreadFBRImpl.h"

#include "base/Log.h"
#include "device/GlDebugOutput.h"
#include "egl/EglTokens.h"
#include "render/NewTask.h"
#include "render/TaskFlags.h"
#include "render/UpdateArithmetic.h"

#include <nib/device.h>
#include <nib/shader_manager.h>
#include <nib/trace.h>

namespace Nib::GLES
{

namespace
{

// A nice value: nothing is nearer to the pen.
constexpr Thread::ThreadPriority kWorkerPriority = -10;

// OpenGLRenderer::discardFramebuffer
constexpr int kDepthAndStencil = 6;

} // namespace

RenderThreadGL* CreateFBRSurfaceRenderer(IGLMsgQueue* parent, const char* name)
{
    NIB_FUNCTION("Nib::RenderThreadGL *Nib::GLES::CreateFBRSurfaceRenderer(Nib::IGLMsgQueue *, "
                 "const char *)");
    NIB_LOG_INFO("%s", function);
    return new RenderThreadFBRImpl(parent, name);
}

RenderThreadFBRImpl::RenderThreadFBRImpl(IGLMsgQueue* parent, const char* name)
    : m_parent(parent), m_worker(IWorkerThread::CreateInstance_NoLock(name, kWorkerPriority)),
      m_name(name), m_parentContext(std::make_shared<std::atomic<EGLContext>>(EGL_NO_CONTEXT))
{
}

RenderThreadFBRImpl::~RenderThreadFBRImpl()
{
    NIB_FUNCTION("virtual Nib::GLES::RenderThreadFBRImpl::~RenderThreadFBRImpl()");
    NIB_LOG_INFO("%s", function);
    Terminate();
}

// ---- start and end ----

bool RenderThreadFBRImpl::Start()
{
    NIB_FUNCTION("virtual bool Nib::GLES::RenderThreadFBRImpl::Start()");
    ITask* init = NewTask(this, &RenderThreadFBRImpl::Init);
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
void RenderThreadFBRImpl::GetContextAndResume(ContextHandshake::Worker worker,
                                              ContextHandshake::Cell cell)
// NOLINTEND(performance-unnecessary-value-param)
{
    NIB_FUNCTION("static void Nib::GLES::RenderThreadFBRImpl::GetContextAndResume("
                 "std::shared_ptr<IWorkerThread>, std::shared_ptr<EGLContext>)");
    ContextHandshake::HandOver(*worker, *cell, function);
}

EGLContext RenderThreadFBRImpl::TakeParentContext()
{
    // Once: by the next resume the parent may have another. Acquires what the parent released.
    return m_parentContext->exchange(EGL_NO_CONTEXT, std::memory_order_acquire);
}

bool RenderThreadFBRImpl::Init()
{
    NIB_FUNCTION("bool Nib::GLES::RenderThreadFBRImpl::Init()");
    NIB_LOG_INFO("%s", function);
    if (!m_context.Create(TakeParentContext(), kFrontBuffer, EglContext::Priority::High) ||
        !m_surface.Create())
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

void RenderThreadFBRImpl::Terminate()
{
    NIB_FUNCTION("void Nib::GLES::RenderThreadFBRImpl::Terminate()");
    if (!m_worker->IsStarted())
        return;
    if (!m_worker->IsRunning())
    {
        if (m_parent != nullptr)
            m_parent->waitForCompleting(); // an answer on its way comes first
        m_worker->Resume();
    }
    DrainQueue(*m_worker, function);
    m_worker->EnqueueAsyncTask(NewTask(this, &RenderThreadFBRImpl::DoTerminate));
    m_worker->Terminate();
}

void RenderThreadFBRImpl::DoTerminate()
{
    NIB_FUNCTION("void Nib::GLES::RenderThreadFBRImpl::DoTerminate()");
    NIB_LOG_INFO("%s RenderThread: %p, Context: %p", function, static_cast<void*>(this),
                 m_context.Get());
    GlDebugOutput::Detach();
    Egl::GetInstance()->MakeCurrent(nullptr, nullptr);
    m_surface.Destroy();
    m_context.Destroy();
    ShaderManager::GetInstance()->CheckEmpty();
}

// ---- pause and resume ----

void RenderThreadFBRImpl::OnPause()
{
    NIB_FUNCTION("virtual void Nib::GLES::RenderThreadFBRImpl::OnPause()");
    if (!isRunning())
    {
        NIB_LOG_WARN("%s : Skip DoPause to prevent ANR. Worker is on pause", function);
        return;
    }
    m_worker->RunSyncTask(NewTask(this, &RenderThreadFBRImpl::DoPause), kQueued, kDeleteAfterRun);
}

void RenderThreadFBRImpl::DoPause()
{
    NIB_FUNCTION("void Nib::GLES::RenderThreadFBRImpl::DoPause()");
    NIB_LOG_INFO("%s", function);
    ReleaseContext(m_observer, *m_worker, m_context);
}

void RenderThreadFBRImpl::OnResume()
{
    NIB_FUNCTION("virtual void Nib::GLES::RenderThreadFBRImpl::OnResume()");
    NIB_LOG_INFO("%s", function);
    if (m_parent == nullptr)
    {
        NIB_LOG_ERROR("%s m_parent is NULL", function);
        return;
    }
    ITask* resume = NewTask(this, &RenderThreadFBRImpl::DoResume);
    if (!enQueueMsg(resume))
        delete resume;
    ContextHandshake::Request(m_parent, &GetContextAndResume, m_worker, m_parentContext);
}

void RenderThreadFBRImpl::DoResume()
{
    NIB_FUNCTION("void Nib::GLES::RenderThreadFBRImpl::DoResume()");
    NIB_LOG_INFO("%s", function);
    if (!m_context.Create(TakeParentContext(), kFrontBuffer, EglContext::Priority::High))
    {
        NIB_LOG_ERROR("%s Failed to create context", function);
        return;
    }
    Egl::GetInstance()->MakeCurrent(&m_context, m_surface.GetActiveSurface());
    RestoreObjects(m_observer, function);
}

// ---- the window ----

void RenderThreadFBRImpl::OnSurfaceChanged(void* window, int width, int height, int)
{
    NIB_FUNCTION("virtual void Nib::GLES::RenderThreadFBRImpl::OnSurfaceChanged(void *, int, int, "
                 "int)");
    ITask* change = NewTask(this, &RenderThreadFBRImpl::ChangeSurface,
                            static_cast<ANativeWindow*>(window), width, height);
    if (m_worker->IsRunning())
        return m_worker->RunSyncTask(change, kQueued, kDeleteAfterRun);
    NIB_LOG_WARN("%s : Worker on pause. Not safe to call ChangeSurface as async task!", function);
    m_worker->EnqueueAsyncTask(change);
}

void RenderThreadFBRImpl::ChangeSurface(ANativeWindow* window, int width, int height)
{
    NIB_FUNCTION("void Nib::GLES::RenderThreadFBRImpl::ChangeSurface(NativeWindowType, int, int)");
    NIB_LOG_INFO("%s. ScreenRect = %d * %d", function, width, height);
    if (m_surface.IsAttachedToWindow())
        DetachFromWindow();
    OpenGLRenderer::finish(); // again, attached or not
    m_surface.AttachToWindow(window);
    Egl::GetInstance()->MakeCurrent(&m_context, m_surface.GetActiveSurface());
    m_screenWidth = width;
    m_screenHeight.store(height, std::memory_order_relaxed);
    m_frontBufferPending = true;
}

void RenderThreadFBRImpl::OnSurfaceDestroyed()
{
    NIB_FUNCTION("virtual void Nib::GLES::RenderThreadFBRImpl::OnSurfaceDestroyed()");
    ITask* destroy = NewTask(this, &RenderThreadFBRImpl::DestroySurface);
    if (m_worker->IsRunning())
        return m_worker->RunSyncTask(destroy, kQueued, kDeleteAfterRun);
    NIB_LOG_WARN("%s : Worker on pause. Not safe to call DestroySurface as async task!", function);
    m_worker->EnqueueAsyncTask(destroy);
}

void RenderThreadFBRImpl::DestroySurface()
{
    NIB_FUNCTION("void Nib::GLES::RenderThreadFBRImpl::DestroySurface()");
    NIB_LOG_INFO("%s", function);
    if (!m_surface.IsAttachedToWindow())
        return;
    DetachFromWindow();
    Egl::GetInstance()->MakeCurrent(&m_context, m_surface.GetActiveSurface());
}

void RenderThreadFBRImpl::DetachFromWindow()
{
    NIB_FUNCTION("void Nib::GLES::RenderThreadFBRImpl::DetachFromWindow()");
    GLES::DetachFromWindow(m_surface, function);
}

bool RenderThreadFBRImpl::IsAttachedToWindow()
{
    return m_surface.IsAttachedToWindow();
}

// ---- one frame, in the order it runs ----

void RenderThreadFBRImpl::ApplyUpdateRect(const RectF& rect, int rotation)
{
    m_worker->EnqueueAsyncTask(NewTask(this, &RenderThreadFBRImpl::UseRect, rect, rotation));
}

void RenderThreadFBRImpl::UseRect(RectF rect, int)
{
    OpenGLRenderer::bindFramebuffer(FramebufferTarget::ReadAndDraw, 0);
    const ScreenSize screen = {m_screenWidth, m_screenHeight.load(std::memory_order_relaxed)};
    const RectF visible = ClipToScreen(rect, screen);
    const ScissorBox box = visible.IsEmpty() ? ScissorBox{} : FlippedBox(visible, screen);
    OpenGLRenderer::enableState(RenderState::ScissorTest); // until the next frame ends
    OpenGLRenderer::setScissor(box.x, box.y, static_cast<unsigned>(box.width),
                               static_cast<unsigned>(box.height));
}

bool RenderThreadFBRImpl::GetScissorRect(const RectF& rect, int* x, int* y, int* width, int* height)
{
    const ScreenSize screen = {0, m_screenHeight.load(std::memory_order_relaxed)};
    const ScissorBox box = rect.IsEmpty() ? ScissorBox{} : FlippedBox(rect, screen);
    *x = box.x;
    *y = box.y;
    *width = box.width;
    *height = box.height;
    return rect.IsEmpty();
}

bool RenderThreadFBRImpl::Render()
{
    if (!m_worker->IsRunning())
        return false;
    m_worker->RunSyncTask(NewTask(this, &RenderThreadFBRImpl::DoRender), kQueued, kDeleteAfterRun);
    return true;
}

void RenderThreadFBRImpl::DoRender()
{
    NIB_FUNCTION("void Nib::GLES::RenderThreadFBRImpl::DoRender()");
    const TraceScope trace("frame", "frame");
    const bool attached = m_surface.IsAttachedToWindow();
    if (m_frontBufferPending)
    {
        if (attached)
            SwitchToFrontBuffer(function);
        return;
    }
    if (attached)
    {
        OpenGLRenderer::disableState(RenderState::ScissorTest);
        OpenGLRenderer::discardFramebuffer(kDepthAndStencil);
    }
    OpenGLRenderer::finish(); // what is drawn is on screen: no swap
}

void RenderThreadFBRImpl::SwitchToFrontBuffer(const char* function)
{
    const TraceScope trace("frame", "front buffer");
    EnableFrontBuffer();
    m_frontBufferPending = false;
    const EGLint buffer = QueryActiveSurface(EGL_RENDER_BUFFER);
    const EGLint autoRefresh = QueryActiveSurface(EGL_FRONT_BUFFER_AUTO_REFRESH_ANDROID);
    NIB_LOG_INFO("%s curr EGL_RENDER_BUFFER=%d, curr EGL_FRONT_BUFFER_AUTO_REFRESH_ANDROID=%d, "
                 "EGL_BACK_BUFFER=%d, EGL_SINGLE_BUFFER=%d",
                 function, buffer, autoRefresh, EGL_BACK_BUFFER, EGL_SINGLE_BUFFER);
}

void RenderThreadFBRImpl::EnableFrontBuffer()
{
    NIB_FUNCTION("void Nib::GLES::RenderThreadFBRImpl::EnableFrontBuffer()");
    if (QueryActiveSurface(EGL_RENDER_BUFFER) == EGL_SINGLE_BUFFER)
        return;
    if (!SetActiveSurface(EGL_RENDER_BUFFER, EGL_SINGLE_BUFFER))
    {
        NIB_LOG_ERROR("%s : Failed to enable EGL_SINGLE_BUFFER, err = %d", function, eglGetError());
    }
    const EGLint buffer = QueryActiveSurface(EGL_RENDER_BUFFER);
    if (buffer == EGL_SINGLE_BUFFER)
        StartFrontBuffer(function);
    else
        NIB_LOG_ERROR("%s could not enable EGL_SINGLE_BUFFER mode %d", function, buffer);
    QueryActiveSurface(EGL_RENDER_BUFFER);
}

void RenderThreadFBRImpl::StartFrontBuffer(const char* function)
{
    NIB_LOG_INFO("%s enabled EGL_SINGLE_BUFFER mode %d", function, EGL_SINGLE_BUFFER);
    m_surface.GetActiveSurface()->SwapBuffers(); // from here on the mode is in effect
    if (SetActiveSurface(EGL_FRONT_BUFFER_AUTO_REFRESH_ANDROID, EGL_TRUE))
    {
        NIB_LOG_INFO("%s Front buffer mode is [enabled] for current surface", function);
        return;
    }
    NIB_LOG_ERROR("%s : Failed to enable EGL_FRONT_BUFFER_AUTO_REFRESH_ANDROID to true, err = %d",
                  function, eglGetError());
}

EGLint RenderThreadFBRImpl::QueryActiveSurface(EGLint attribute) const
{
    EGLint value = -1; // what the display does not tell
    eglQuerySurface(Egl::GetInstance()->GetDisplay(), m_surface.GetActiveSurface()->Get(),
                    attribute, &value);
    return value;
}

bool RenderThreadFBRImpl::SetActiveSurface(EGLint attribute, EGLint value)
{
    return eglSurfaceAttrib(Egl::GetInstance()->GetDisplay(), m_surface.GetActiveSurface()->Get(),
                            attribute, value) == EGL_TRUE;
}

// ---- the queue ----

bool RenderThreadFBRImpl::enQueueMsg(ITask* task)
{
    return m_worker->EnqueueAsyncTask(task);
}

bool RenderThreadFBRImpl::waitForCompleting()
{
    NIB_FUNCTION("virtual bool Nib::GLES::RenderThreadFBRImpl::waitForCompleting()");
    if (!m_worker->IsRunning())
    {
        NIB_LOG_ERROR("%s - worker is on pause!!!", function);
        return false;
    }
    return m_worker->WaitForExecution(nullptr);
}

bool RenderThreadFBRImpl::isRunning()
{
    return m_worker->IsRunning();
}

const char* RenderThreadFBRImpl::getTag()
{
    return m_name;
}

Observer<IManagedObject>* RenderThreadFBRImpl::GetObjectObserver()
{
    return &m_observer;
}

Observer<IManagedObject>* RenderThreadFBRImpl::GetDataObserver()
{
    return &m_observer;
}

// ---- what needs no render thread ----

IGLMsgQueue* RenderThreadFBRImpl::GetMsgQueue()
{
    return this;
}

int RenderThreadFBRImpl::GetType()
{
    return 2;
}

void RenderThreadFBRImpl::OnInput(long long) {}

} // namespace Nib::GLES
