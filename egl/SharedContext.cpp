#include <nib/base.h>
#include <nib/egl.h>

#include "base/Log.h"

namespace Nib
{

namespace
{

// Owns the context, and destroys it when the library is unloaded.
struct Owner
{
    std::atomic<EglContext*> context{nullptr};

    ~Owner() { delete context.exchange(nullptr, std::memory_order_acq_rel); }
};

CriticalSection g_lock(false);
Owner g_owner;

} // namespace

EglContext* SharedContext::GetInstance()
{
    NIB_FUNCTION("static Nib::EglContext *Nib::SharedContext::GetInstance()");
    // Acquire pairs with the release below: who sees the pointer sees the handle.
    if (EglContext* context = g_owner.context.load(std::memory_order_acquire))
        return context;

    AutoCriticalSection guard(g_lock);
    if (EglContext* context = g_owner.context.load(std::memory_order_relaxed))
        return context;
    NIB_LOG_INFO("%s Creating shared context", function);
    EglContext* context = new EglContext;
    // A failure stays: the handle is null then, and nobody tries again.
    context->Create(EGL_NO_CONTEXT, false, EglContext::Priority::Medium);
    g_owner.context.store(context, std::memory_order_release);
    return context;
}

} // namespace Nib
