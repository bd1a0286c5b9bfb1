#include "base/Log.h"

#include <nib/base.h>
#include <nib/render_thread.h>
#include <nib/renderer_factory.h>

#include <atomic>

namespace Nib
{

namespace
{

/// A surface render thread that the whole process shares, and the count of those who use it.
class SharedRenderThread
{
public:
    RenderThreadGL* Acquire(const char* name, RenderThreadGL::RenderPriority priority,
                            const char* function);
    void Release(const char* function);

private:
    std::atomic<RenderThreadGL*> m_instance{nullptr}; // logged without the lock
    unsigned m_count = 0;
    CriticalSection m_lock{true}; // held while the thread starts and ends
};

RenderThreadGL* SharedRenderThread::Acquire(const char* name,
                                            RenderThreadGL::RenderPriority priority,
                                            const char* function)
{
    NIB_LOG_INFO("%s - %p", function,
                 static_cast<void*>(m_instance.load(std::memory_order_relaxed)));
    AutoCriticalSection lock(m_lock);
    RenderThreadGL* instance = m_instance.load(std::memory_order_relaxed);
    ++m_count;
    if (instance == nullptr)
    {
        NIB_LOG_INFO("%s - Create", function);
        instance = RendererFactory::CreateSurfaceRenderer(name, priority);
        m_instance.store(instance, std::memory_order_relaxed);
        instance->Start();
    }
    return instance;
}

void SharedRenderThread::Release(const char* function)
{
    AutoCriticalSection lock(m_lock);
    RenderThreadGL* instance = m_instance.load(std::memory_order_relaxed);
    if (instance == nullptr || --m_count > 0)
        return;
    NIB_LOG_INFO("%s - Destroy", function);
    delete instance;
    m_instance.store(nullptr, std::memory_order_relaxed);
}

SharedRenderThread s_thread;
SharedRenderThread s_lowPriorityThread;

// The first level of the system that schedules by context priority.
constexpr int kFirstSdkWithLowPriority = 29;

} // namespace

RenderThreadGL* RenderThreadGLST::getInstance()
{
    NIB_FUNCTION("static Nib::RenderThreadGL *Nib::RenderThreadGLST::getInstance()");
    return s_thread.Acquire("RenderThreadGLST", RenderThreadGL::Medium, function);
}

void RenderThreadGLST::release()
{
    NIB_FUNCTION("static void Nib::RenderThreadGLST::release()");
    s_thread.Release(function);
}

RenderThreadGL* RenderThreadLowRenderPriorityGLST::getInstance()
{
    NIB_FUNCTION(
        "static Nib::RenderThreadGL *Nib::RenderThreadLowRenderPriorityGLST::getInstance()");
    const RenderThreadGL::RenderPriority priority =
        System::GetSDKVersion() < kFirstSdkWithLowPriority ? RenderThreadGL::Medium
                                                           : RenderThreadGL::Low;
    return s_lowPriorityThread.Acquire("RenderThreadLowRenderPriorityGLST", priority, function);
}

void RenderThreadLowRenderPriorityGLST::release()
{
    NIB_FUNCTION("static void Nib::RenderThreadLowRenderPriorityGLST::release()");
    s_lowPriorityThread.Release(function);
}

} // namespace Nib
