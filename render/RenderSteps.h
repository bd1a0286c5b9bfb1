#ifndef NIB_RENDER_RENDER_STEPS_H
#define NIB_RENDER_RENDER_STEPS_H

// The steps that the surface, front-buffer and offscreen render thread have in common. Each class
// keeps its own members and lists the steps in its own order; `function` is the signature under
// which the step's log lines appear.

#include <nib/egl.h>
#include <nib/managed_object.h>
#include <nib/msg_queue.h>
#include <nib/worker_thread.h>

#include <atomic>
#include <memory>

namespace Nib::GLES
{

/// Returns once the queue of @p worker was seen empty: tasks may post tasks, for as long as they
/// like. Any thread but the worker's. [blocks]
void DrainQueue(IWorkerThread& worker, const char* function);

/// Binds the calling render thread, whose @p context is current, to @p queue.
/// @param self  the render thread object, as the log is to name it
void BindToQueue(IGLMsgQueue* queue, const void* self, const EglContext& context,
                 const char* function);

/// Lets go of the window of @p surface after the GPU has. The context is then current nowhere.
void DetachFromWindow(HybridSurface& surface, const char* function);

/// Pauses a render thread from within: releases the subscribers of @p observer, last one first, has
/// the shader manager note the context that goes, stops the queue and ends @p context.
void ReleaseContext(Observer<IManagedObject>& observer, IWorkerThread& worker, EglContext& context);

/// Restores the subscribers of @p observer, first one first. One that throws stays released, with a
/// log line: the thread has nobody to catch it.
void RestoreEach(Observer<IManagedObject>& observer, const char* function);

/// RestoreEach, behind which the shader manager moves its entries to the context that is now
/// current.
void RestoreObjects(Observer<IManagedObject>& observer, const char* function);

/// How a render thread gets the context to share with: it posts a task to its parent, which alone
/// can tell its context and which then resumes the child's paused worker.
namespace ContextHandshake
{

/// The parent's context. Written by the parent before it resumes the worker, read and emptied by
/// the child in tasks that run after the resume; atomic, since a second hand-shake may follow the
/// first.
using Cell = std::shared_ptr<std::atomic<EGLContext>>;

/// The task shares the worker, since a child may be deleted while its parent still holds the task.
using Worker = std::shared_ptr<IWorkerThread>;

/// Posts @p handOver to @p parent and waits until the parent has run it. A paused parent keeps the
/// task for later, and the wait ends at once. Caller's thread. [blocks]
void Request(IGLMsgQueue* parent, void (*handOver)(Worker, Cell), const Worker& worker,
             const Cell& cell);

/// The answer, on the parent's thread: stores its current context and resumes the child, also when
/// there is no context to share.
void HandOver(IWorkerThread& worker, std::atomic<EGLContext>& cell, const char* function);

} // namespace ContextHandshake

} // namespace Nib::GLES

#endif
