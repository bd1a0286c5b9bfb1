#ifndef NIB_RENDER_TASK_FLAGS_H
#define NIB_RENDER_TASK_FLAGS_H

// Names for the flags of workers and contexts; the other meaning is written with "!".

namespace Nib::GLES
{

inline constexpr bool kPaused = true;         // IWorkerThread::Start
inline constexpr bool kAheadOfQueue = true;   // IWorkerThread::RunSyncTask, second argument
inline constexpr bool kQueued = false;        // the same, the other way
inline constexpr bool kDeleteAfterRun = true; // IWorkerThread::RunSyncTask, third argument
inline constexpr bool kFrontBuffer = true;    // EglContext::Create

} // namespace Nib::GLES

#endif
