#ifndef NIB_RENDER_RENDER_THREAD_GL_IMPL_H
#define NIB_RENDER_RENDER_THREAD_GL_IMPL_H

#include "render/FrameDamage.h"

#include <nib/egl.h>
#include <nib/partial_update.h>
#include <nib/render_thread.h>
#include <nib/worker_thread.h>

#include <memory>

namespace Nib::GLES
{

/// The surface render thread.
//
//  state     Start                OnSurfaceChanged    OnSurfaceDestroyed  delete
//  created   running              (not before Start)  (not before Start)  gone; EGL is not touched
//  running   (only once)          attached            .                   drained, gone
//  attached  (only once)          attached            running             drained, gone
//
// The context is current on the window while attached, else on a surface of 1 x 1 pixel. All EGL
// and GL work runs on the worker.
class RenderThreadGLImpl : public RenderThreadGL, public IGLMsgQueue
{
public:
    RenderThreadGLImpl(const char* name, RenderThreadGL::RenderPriority priority);
    ~RenderThreadGLImpl() override;

    // ---- the renderer ----
    IGLMsgQueue* GetMsgQueue() override;
    int GetType() override;
    bool Start() override;
    void OnSurfaceChanged(void* window, int width, int height, int format) override;
    void OnSurfaceDestroyed() override;
    bool Render() override;
    void OnInput(long long event) override;
    void ApplyUpdateRect(const RectF& rect, int rotation) override;
    bool IsAttachedToWindow() override;
    void OnPause() override;
    void OnResume() override;

    // ---- the queue ----
    bool enQueueMsg(ITask* task) override;
    bool waitForCompleting() override;
    bool isRunning() override;
    const char* getTag() override;

private:
    void Terminate(); // on the destructor's thread

    // ---- on the render thread ----
    bool Init();
    void ChangeSurface(ANativeWindow* window, int width, int height);
    void DestroySurface();
    void DetachFromWindow();
    void UseRect(RectF rect, int rotation);
    void DoRender();
    void DoTerminate();

    std::unique_ptr<IWorkerThread> m_worker;
    HybridSurface m_surface;
    EglContext m_context;
    UpdateRectangle m_updateRectangle;
    FrameDamage m_frameDamage;
    const char* m_name; // the caller's
    EglContext::Priority m_contextPriority;
};

} // namespace Nib::GLES

#endif
