#ifndef NIB_EGL_EGL_SYNC_OBJECT_IMPL_H
#define NIB_EGL_EGL_SYNC_OBJECT_IMPL_H

#include <nib/egl_timing.h>

#include <EGL/egl.h>
#include <EGL/eglext.h>

namespace Nib
{

/// A fence of EGL_KHR_fence_sync. Made in two steps, because the second one may fail.
class EglSyncObjectImpl : public EglSyncObject
{
public:
    EglSyncObjectImpl() = default;
    EglSyncObjectImpl(const EglSyncObjectImpl&) = delete;
    EglSyncObjectImpl& operator=(const EglSyncObjectImpl&) = delete;
    ~EglSyncObjectImpl() override;

    /// Resolves the entry points when the display has fences: once per process, also when it has
    /// none. Two threads that come first at once resolve the same pointers twice.
    static void InitOnce();

    /// Inserts the fence behind the commands of the calling thread's context.
    bool Construct();

    WaitResult Wait() const override;
    WaitResult WaitTimeout(uint64_t timeoutNs) const override;
    ObjectState GetState() const override;

private:
    EGLSyncKHR m_sync = EGL_NO_SYNC_KHR;
    EGLDisplay m_display = EGL_NO_DISPLAY;
};

} // namespace Nib

#endif
