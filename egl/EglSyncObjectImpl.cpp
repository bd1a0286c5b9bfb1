#include "egl/EglSyncObjectImpl.h"

#include <nib/egl.h>

#include "base/Log.h"
#include "egl/EglTokens.h"
#include "egl/EntryPoint.h"

#include <memory>

namespace Nib
{

namespace
{

EntryPoint<PFNEGLCREATESYNCKHRPROC> g_createSync("eglCreateSyncKHR");
EntryPoint<PFNEGLDESTROYSYNCKHRPROC> g_destroySync("eglDestroySyncKHR");
EntryPoint<PFNEGLCLIENTWAITSYNCKHRPROC> g_clientWaitSync("eglClientWaitSyncKHR");
EntryPoint<PFNEGLGETSYNCATTRIBKHRPROC> g_getSyncAttrib("eglGetSyncAttribKHR");
std::atomic<bool> g_initialised{false};

} // namespace

EglSyncObject::~EglSyncObject() = default;

EglSyncObject* EglSyncObject::CreateEglSyncObject()
{
    EglSyncObjectImpl::InitOnce();
    auto object = std::make_unique<EglSyncObjectImpl>();
    return object->Construct() ? object.release() : nullptr;
}

void EglSyncObjectImpl::InitOnce()
{
    NIB_FUNCTION("static void Nib::EglSyncObjectImpl::InitOnce()");
    static constexpr const char* kExtension = "KHR_fence_sync";
    // Acquire pairs with the release below: who sees the flag sees the entry points.
    if (g_initialised.load(std::memory_order_acquire))
        return;
    if (Egl::GetInstance()->IsEglExtensionSupported(kExtension))
    {
        NIB_LOG_INFO("%s extension %s is supported", function, kExtension);
        g_createSync.Resolve(function);
        g_destroySync.Resolve(function);
        g_clientWaitSync.Resolve(function);
        g_getSyncAttrib.Resolve(function);
    }
    g_initialised.store(true, std::memory_order_release);
}

bool EglSyncObjectImpl::Construct()
{
    NIB_FUNCTION("bool Nib::EglSyncObjectImpl::Construct()");
    const auto createSync = g_createSync.Get();
    if (createSync == nullptr)
    {
        NIB_LOG_ERROR("%s - EGL_KHR_fence_sync not supported", function);
        return false;
    }
    m_display = Egl::GetInstance()->GetDisplay();
    m_sync = createSync(m_display, EGL_SYNC_FENCE_KHR, nullptr);
    if (m_sync == EGL_NO_SYNC_KHR)
    {
        NIB_LOG_ERROR("%s EGL_NO_SYNC_KHR (Error:0x%x)", function,
                      static_cast<unsigned>(eglGetError()));
    }
    return m_sync != EGL_NO_SYNC_KHR;
}

EglSyncObjectImpl::~EglSyncObjectImpl()
{
    const auto destroySync = g_destroySync.Get();
    if (m_sync != EGL_NO_SYNC_KHR && destroySync != nullptr)
        destroySync(m_display, m_sync);
    m_sync = EGL_NO_SYNC_KHR;
}

EglSyncObject::WaitResult EglSyncObjectImpl::Wait() const
{
    return WaitTimeout(EGL_FOREVER_KHR);
}

EglSyncObject::WaitResult EglSyncObjectImpl::WaitTimeout(uint64_t timeoutNs) const
{
    NIB_FUNCTION("virtual EglSyncObject::WaitResult "
                 "Nib::EglSyncObjectImpl::WaitTimeout(uint64_t) const");
    if (m_sync == EGL_NO_SYNC_KHR)
    {
        NIB_LOG_ERROR("%s mSyncObject == EGL_NO_SYNC_KHR", function);
        return WaitResult::Failed;
    }
    const auto wait = g_clientWaitSync.Get();
    const EGLint result = wait != nullptr
                              ? wait(m_display, m_sync, EGL_SYNC_FLUSH_COMMANDS_BIT_KHR, timeoutNs)
                              : EGL_FALSE;
    if (result == EGL_FALSE)
    {
        NIB_LOG_ERROR("%s wait == EGL_FALSE ((error:0x%x))", function,
                      static_cast<unsigned>(eglGetError()));
        return WaitResult::Failed;
    }
    if (result == EGL_TIMEOUT_EXPIRED_KHR)
    {
        NIB_LOG_WARN("%s wait == EGL_TIMEOUT_EXPIRED_KHR (timeout = %lld)", function,
                     static_cast<long long>(timeoutNs));
        return WaitResult::TimedOut;
    }
    return WaitResult::Passed;
}

EglSyncObject::ObjectState EglSyncObjectImpl::GetState() const
{
    NIB_FUNCTION("virtual EglSyncObject::ObjectState "
                 "Nib::EglSyncObjectImpl::GetState() const");
    if (m_sync == EGL_NO_SYNC_KHR)
    {
        NIB_LOG_ERROR("%s EGL_NO_SYNC_KHR", function);
        return ObjectState::Unknown;
    }
    EGLint value = -1;
    const auto query = g_getSyncAttrib.Get();
    if (query == nullptr || query(m_display, m_sync, EGL_SYNC_STATUS_KHR, &value) != EGL_TRUE)
    {
        NIB_LOG_ERROR("%s eglGetSyncAttribKHR return false (error:0x%x)", function,
                      static_cast<unsigned>(eglGetError()));
        return ObjectState::Unknown;
    }
    return value == EGL_SIGNALED_KHR ? ObjectState::Signaled : ObjectState::NotSignaled;
}

} // namespace Nib
