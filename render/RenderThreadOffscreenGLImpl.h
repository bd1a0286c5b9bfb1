#ifndef NIB_RENDER_RENDER_THREAD_OFFSCREEN_GL_IMPL_H
#define NIB_RENDER_RENDER_THREAD_OFFSCREEN_GL_IMPL_H

#include "render/RenderSteps.h"

#include <nib/egl.h>
#include <nib/managed_object.h>
#include <nib/render_thread.h>
#include <nib/worker_thread.h>

#include <memory>

namespace Nib::GLES
{

/// The offscreen render thread.
//
//  state     Start                      the parent answers  OnPause  OnResume
//  created   running, without a parent  (not asked)         .        (not before OnPause)
//            waiting, with one
//  waiting   (only once)                running             .        (not before OnPause)
//  running   (only once)                (not asked)         paused   (not before OnPause)
//  paused    (only once)                running             .        asks the parent; . without one
//
// Deleting works in every state: a thread that waits or is paused first gives its parent the chance
// to answer, then runs what is queued. While running, the context is current on a surface of 1 x 1
// pixel.
class RenderThreadOffscreenGLImpl : public RenderThreadGL, public IGLManagedMsgQueue
{
public:
    RenderThreadOffscreenGLImpl(IGLMsgQueue* parent, const char* name, bool managed);
    ~RenderThreadOffscreenGLImpl() override;

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
    Observer<IManagedObject>* GetObjectObserver() override;
    Observer<IManagedObject>* GetDataObserver() override;

    /// Background work yields to what is on screen where the system schedules contexts.
    static EglContext::Priority GetPrefferedContextPriority();

private:
    void Terminate(); // on the destructor's thread

    // ---- on the parent's thread ----
    static void GetContextAndResume(ContextHandshake::Worker worker, ContextHandshake::Cell cell);

    // ---- on the render thread ----
    bool Init();
    void DoPause();
    void DoResume();
    void DoRender();
    void DoTerminate();
    EGLContext TakeParentContext();

    IGLMsgQueue* m_parent; // the caller's, may be null
    Observer<IManagedObject> m_observer;
    ContextHandshake::Worker m_worker;
    EglContext m_context;
    std::unique_ptr<EglSurface> m_surface; // kept through pauses
    const char* m_name;                    // the caller's
    ContextHandshake::Cell m_parentContext;
    bool m_managed;
};

} // namespace Nib::GLES

#endif
