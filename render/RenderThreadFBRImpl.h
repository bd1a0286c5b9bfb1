#ifndef NIB_RENDER_RENDER_THREAD_FBR_IMPL_H
#define NIB_RENDER_RENDER_THREAD_FBR_IMPL_H

#include "render/RenderSteps.h"

#include <nib/egl.h>
#include <nib/managed_object.h>
#include <nib/render_thread.h>
#include <nib/worker_thread.h>

#include <atomic>

namespace Nib::GLES
{

/// The front-buffer render thread. Its life is that of an offscreen one
/// (RenderThreadOffscreenGLImpl); its window goes its own way:
//
//  window     OnSurfaceChanged  Render                         OnSurfaceDestroyed
//  none       back buffer       .                              .
//  back       back buffer       front buffer, after one swap   none
//  front      back buffer       ends the frame, without swap   none
//
// The context is current on the window while there is one, else on a surface of 1 x 1 pixel.
// Surface events that come during a pause wait in the queue.
class RenderThreadFBRImpl : public RenderThreadGL, public IGLManagedMsgQueue
{
public:
    RenderThreadFBRImpl(IGLMsgQueue* parent, const char* name);
    ~RenderThreadFBRImpl() override;

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

    /// The scissor box of @p rect, which is not clipped, on the current screen. Any thread.
    /// @return whether @p rect is empty; all four results are then 0
    bool GetScissorRect(const RectF& rect, int* x, int* y, int* width, int* height);

private:
    void Terminate(); // on the destructor's thread

    // ---- on the parent's thread ----
    static void GetContextAndResume(ContextHandshake::Worker worker, ContextHandshake::Cell cell);

    // ---- on the render thread ----
    bool Init();
    void ChangeSurface(ANativeWindow* window, int width, int height);
    void DestroySurface();
    void DetachFromWindow();
    void UseRect(RectF rect, int rotation);
    void DoRender();
    void SwitchToFrontBuffer(const char* function);
    void EnableFrontBuffer();
    void StartFrontBuffer(const char* function);
    EGLint QueryActiveSurface(EGLint attribute) const;
    bool SetActiveSurface(EGLint attribute, EGLint value);
    void DoPause();
    void DoResume();
    void DoTerminate();
    EGLContext TakeParentContext();

    IGLMsgQueue* m_parent; // the caller's, may be null
    Observer<IManagedObject> m_observer;
    ContextHandshake::Worker m_worker;
    HybridSurface m_surface;
    EglContext m_context;
    const char* m_name; // the caller's
    int m_screenWidth = 0;
    std::atomic<int> m_screenHeight{0}; // GetScissorRect reads it on any thread
    ContextHandshake::Cell m_parentContext;
    bool m_frontBufferPending = true;
};

} // namespace Nib::GLES

#endif
