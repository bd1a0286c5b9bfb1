#include <nib/base.h>
#include <nib/egl.h>

#include "base/Log.h"

namespace Nib
{

namespace
{

CriticalSection g_lock(false);
std::atomic<EglContext*> g_context{nullptr};

// Destroys the context when the library is unloaded. A process that ends destroys its static objects
// in reverse, the driver's among them: this one is made after the display is open, so that it goes
// while the driver is still whole.
struct DestroyAtUnload
{
    ~DestroyAtUnload() { delete g_context.exchange(nullptr, std::memory_order_acq_rel); }
};

} // namespace

EglContext* SharedContext::GetInstance()
{
    NIB_FUNCTION("static Nib::EglContext *Nib::SharedContext::GetInstance()");
    // Acquire pairs with the release below: who sees the pointer sees the handle.
    if (EglContext* context = g_context.load(std::memory_order_acquire))
        return context;

    AutoCriticalSection guard(g_lock);
    if (EglContext* context = g_context.load(std::memory_order_relaxed))
        return context;
    NIB_LOG_INFO("%s Creating shared context", function);
    EglContext* context = new EglContext;
    // A failure stays: the handle is null then, and nobody tries again.
    context->Create(EGL_NO_CONTEXT, false, EglContext::Priority::Medium);
    static const DestroyAtUnload atUnload;
    g_context.store(context, std::memory_order_release);
    return context;
}

} // namespace Nib
