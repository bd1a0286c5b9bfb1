#ifndef NIB_RENDER_THREAD_H
#define NIB_RENDER_THREAD_H

/// @file
/// Render threads: GL contexts with a task queue, in four kinds.
///
/// | kind         | type | made with                      | shares its context with | presents            |
/// |--------------|------|--------------------------------|-------------------------|---------------------|
/// | HWUI         | 0    | GLES::CreateHWUIRenderer       | it is the UI's own      | the UI does         |
/// | surface      | 1    | GLES::CreateSurfaceRenderer    | the process-wide one    | swaps, by damage    |
/// | front buffer | 2    | GLES::CreateFBRSurfaceRenderer | its parent's            | draws on the screen |
/// | offscreen    | 3    | GLES::CreateOffscreenRenderer  | its parent's            | nothing             |

#include <nib/base.h>
#include <nib/export.h>
#include <nib/msg_queue.h>

namespace Nib
{

/// Root of all renderers.
class NIB_EXPORT IGLRenderer
{
public:
    virtual ~IGLRenderer();

protected:
    IGLRenderer() = default;
    IGLRenderer(const IGLRenderer&) = delete;
    IGLRenderer& operator=(const IGLRenderer&) = delete;
};

/// A thread with a GL context, as the application sees it.
///
/// Owner    the caller, from a factory, not started. Deleting it drains the queue, ends the context
///          and joins the thread. Children are deleted before the parent whose context they share.
/// Threads  [blocks] waits without time-out for the render thread, and deadlocks on it.
///          [posts] returns at once; the work runs later, in order. No mark: answers directly.
///          No blocking operation may overlap the deletion.
/// Order    Start, then surface events and frames, then delete. Virtual operations: order is
///          exported.
/// Failure  false or null, and a log line. Nothing throws.
///
/// What differs between the kinds is told at their factories below.
class NIB_EXPORT RenderThreadGL : public IGLRenderer
{
public:
    /// Scheduling of the context by the GPU, where EGL_IMG_context_priority is offered. A value
    /// outside 0 to 2 means Medium.
    enum RenderPriority : int
    {
        High = 0,
        Medium = 1,
        Low = 2,
    };

    ~RenderThreadGL() override; ///< [blocks]

    /// The same object's queue face; not a second owner.
    virtual IGLMsgQueue* GetMsgQueue() = 0;

    /// 0 HWUI, 1 surface, 2 front buffer, 3 offscreen.
    virtual int GetType() = 0;

    /// [blocks] True: the thread runs. Not: it has a context; a failed start-up is only logged.
    /// When the thread cannot be started it blocks for ever, except with a parent. Tasks that were
    /// posted before it may run without a context.
    virtual bool Start() = 0;

    /// [blocks] A window has come or changed its size. @p window is an ANativeWindow, borrowed
    /// until OnSurfaceDestroyed or the next OnSurfaceChanged returns. Sizes in pixels; the last
    /// argument is ignored.
    virtual void OnSurfaceChanged(void* window, int width, int height, int format) = 0;

    /// [blocks] The window goes. Work that is posted later still has a context.
    virtual void OnSurfaceDestroyed() = 0;

    /// [blocks] Ends a frame: presents what the tasks posted before have drawn. False when the
    /// render thread is paused.
    virtual bool Render() = 0;

    /// Input events need no render thread: does nothing.
    virtual void OnInput(long long event) = 0;

    /// [posts] The part of the window that the tasks posted until Render() draw: pixels, y downward;
    /// @p rotation of the content in quarter turns, 0 to 3. Its rules: docs/partial-update.md.
    virtual void ApplyUpdateRect(const RectF& rect, int rotation) = 0;

    /// Whether there is a window now; read without waiting for surface events under way.
    virtual bool IsAttachedToWindow() = 0;

    /// [blocks] Releases the managed objects, ends the context and stops running tasks; they wait
    /// in the queue. Not supported by the surface render thread.
    virtual void OnPause() = 0;

    /// Undoes OnPause, and comes only after it, with a new context. [blocks] until the parent has
    /// handed over its context, not until the objects are restored: before the parent is paused or
    /// deleted, call waitForCompleting() of this thread's queue. Tasks that were posted during the
    /// pause run first, still without a context.
    virtual void OnResume() = 0;
};

/// The render thread that runs inside the UI's own render thread and context.
class NIB_EXPORT RenderThreadHWUI : public RenderThreadGL
{
public:
    /// Keeps other threads out while the UI draws. Its owner may take it again; it is freed when
    /// each Lock has had its Unlock.
    class NIB_EXPORT ISafeLock
    {
    public:
        virtual ~ISafeLock();

        /// [blocks] until the lock is free. With @p invokeIfNeeded, which is for the UI's render
        /// thread alone, the caller meanwhile renders for an owner that waits for its tasks.
        virtual void Lock(bool invokeIfNeeded) = 0;

        /// Throws std::logic_error ("HWUI Safelock: Unlock should be called on owner thread") when
        /// the caller does not own the lock, also when nobody does.
        virtual void Unlock() = 0;

    protected:
        ISafeLock() = default;
        ISafeLock(const ISafeLock&) = delete;
        ISafeLock& operator=(const ISafeLock&) = delete;
    };

    ~RenderThreadHWUI() override;

    /// The same object's lock face; not a second owner.
    virtual ISafeLock* GetSafeLock() = 0;
};

/// How the HWUI render thread asks the UI for a draw callback. Filled and owned by the application;
/// it must outlive the render thread.
struct HwuiCallback
{
    /// Never read by the library.
    void* reserved;
    /// Called with null, @ref context and 0, from any thread: have the draw callback called soon.
    /// False: the UI is not ready, nothing was asked for. It runs under a lock of the render
    /// thread, so it may post the request but not wait for the callback. Null: no request is ever
    /// made.
    bool (*invoke)(void*, void*, int);
    /// The application's own.
    void* context;
};

/// The surface render thread "RenderThreadGLST" that the whole process shares, with medium
/// priority. Any thread; the first caller blocks until the thread is started.
class NIB_EXPORT RenderThreadGLST
{
public:
    RenderThreadGLST() = delete;

    /// Made and started at need; each call is to be matched by a release().
    static RenderThreadGL* getInstance();
    /// [blocks] when it is the last: the thread is then deleted. Without an instance: nothing.
    static void release();
};

/// As RenderThreadGLST, a second thread with low priority (medium below Android 10, SDK level 29).
class NIB_EXPORT RenderThreadLowRenderPriorityGLST
{
public:
    RenderThreadLowRenderPriorityGLST() = delete;

    /// Made and started at need; each call is to be matched by a release().
    static RenderThreadGL* getInstance();
    /// [blocks] when it is the last: the thread is then deleted. Without an instance: nothing.
    static void release();
};

namespace GLES
{

/// A render thread that draws into a window and presents it; without a window it has a surface of
/// 1 x 1 pixel, so that work may be posted at any time. Its objects are shared with all other
/// surface render threads. It cannot be paused.
/// @param name  kept as a pointer; outlives the render thread
NIB_EXPORT RenderThreadGL* CreateSurfaceRenderer(const char* name,
                                                 RenderThreadGL::RenderPriority priority);

/// A render thread without a window, for work into textures, sharing objects with its parent.
///
/// Start() [blocks] until the parent has handed over its context; a parent that is paused does so
/// when it is resumed, and this thread waits for it. The surface operations do nothing; Render() is
/// a barrier. A thread without a parent cannot be resumed. One started or resumed while its parent
/// has no context gets a context of its own that shares nothing.
/// @param parent   borrowed, outlives the render thread; null: a context that shares nothing
/// @param name     kept as a pointer; outlives the render thread
/// @param managed  whether objects made on it are released and restored with its context
NIB_EXPORT RenderThreadGL* CreateOffscreenRenderer(IGLMsgQueue* parent, const char* name,
                                                   bool managed);

/// A render thread that draws into the visible buffer of a window, without swaps, for the lowest
/// delay between pen and ink. It shares objects with its parent, starts, pauses and resumes as an
/// offscreen one.
///
/// The first Render() after a window has come switches it to the front buffer; each later one ends
/// the frame. ApplyUpdateRect limits drawing to its rectangle until the next Render(). While the
/// thread is paused, surface events are [posts]: they run after the resume, and the window must
/// live until then. Ask IsFBRSupported() before using one for what is to be seen.
/// @param parent  borrowed, outlives the render thread; null: a context that shares nothing
/// @param name    kept as a pointer; outlives the render thread
NIB_EXPORT RenderThreadGL* CreateFBRSurfaceRenderer(IGLMsgQueue* parent, const char* name);

/// The render thread without a thread: the application calls Render() from the UI's draw callback,
/// with the UI's context current, and the tasks posted since the last call run there.
///
/// Start() does nothing. Surface operations are not supported; partial update is the UI's business.
/// OnPause [blocks] until the next draw callback, in which objects are released; tasks run on after
/// it, with the objects released, until OnResume [posts] their restoration. waitForCompleting()
/// asks for a draw callback and [blocks] until one has run; in the callback itself it runs the
/// tasks at once, and it returns false when the UI refuses. Delete it on the UI's render thread
/// with the context current, so that the waiting tasks can run; anywhere else they are deleted
/// without having run.
/// @param callback  borrowed, outlives the render thread
/// @param name      kept as a pointer; outlives the render thread
NIB_EXPORT RenderThreadHWUI* CreateHWUIRenderer(HwuiCallback* callback, const char* name);

} // namespace GLES

} // namespace Nib

#endif
