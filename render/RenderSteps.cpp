#include "render/RenderSteps.h"

#include "base/Log.h"
#include "device/GlDebugOutput.h"
#include "render/NewTask.h"

#include <nib/device.h>
#include <nib/shader_manager.h>
#include <nib/trace.h>

namespace Nib::GLES
{

void DrainQueue(IWorkerThread& worker, const char* function)
{
    int left = 0;
    while (worker.WaitForExecution(&left) && left != 0)
    {
        NIB_LOG_WARN("%s : %d tasks in queue ater WaitForExecution. Note! - Some task add new task "
                     "while execution. Retry waiting.",
                     function, left);
    }
}

void BindToQueue(IGLMsgQueue* queue, const void* self, const EglContext& context,
                 const char* function)
{
    AttachToThread(queue);
    GlDebugOutput::Attach(GlDebugOutput::Owner::RenderThread);
    OpenGLRenderer::InitParameters();
    NIB_LOG_INFO("%s RenderThread: %p, Context: %p", function, self, context.Get());
}

void DetachFromWindow(HybridSurface& surface, const char* function)
{
    NIB_LOG_INFO("%s", function);
    OpenGLRenderer::finish();
    Egl::GetInstance()->MakeCurrent(nullptr, nullptr);
    surface.DetachFromWindow();
}

void ReleaseContext(Observer<IManagedObject>& observer, IWorkerThread& worker, EglContext& context)
{
    const TraceScope trace("context", "loss");
    observer.DispatchRelease();
    ShaderManager::GetInstance()->OnDestroyContext();
    worker.Pause(); // from the end of the running task on
    GlDebugOutput::Detach();
    Egl::GetInstance()->MakeCurrent(nullptr, nullptr);
    context.Destroy();
}

void RestoreEach(Observer<IManagedObject>& observer, const char* function)
{
    observer.DispatchRestore(
        [function](const std::exception& failure)
        { NIB_LOG_ERROR("%s An object is not restored: %s", function, failure.what()); });
}

void RestoreObjects(Observer<IManagedObject>& observer, const char* function)
{
    const TraceScope trace("context", "restore");
    GlDebugOutput::Attach(GlDebugOutput::Owner::RenderThread);
    RestoreEach(observer, function);
    ShaderManager::GetInstance()->OnRestoreContext();
}

void ContextHandshake::Request(IGLMsgQueue* parent, void (*handOver)(Worker, Cell),
                               const Worker& worker, const Cell& cell)
{
    ITask* task = NewTask(handOver, worker, cell);
    if (!parent->enQueueMsg(task))
        delete task;
    parent->waitForCompleting();
}

void ContextHandshake::HandOver(IWorkerThread& worker, std::atomic<EGLContext>& cell,
                                const char* function)
{
    const EGLContext context = eglGetCurrentContext();
    cell.store(context, std::memory_order_release); // for the child's acquire
    worker.Resume();
    if (context == EGL_NO_CONTEXT)
        NIB_LOG_ERROR("%s, Failed to get main context!", function);
    else
        NIB_LOG_INFO("%s, OK! Parent context: %p", function, context);
}

} // namespace Nib::GLES
