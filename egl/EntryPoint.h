#ifndef NIB_EGL_ENTRY_POINT_H
#define NIB_EGL_ENTRY_POINT_H

#include "base/Log.h"

#include <EGL/egl.h>

#include <atomic>

namespace Nib
{

/// An extension function, null until it is resolved and where the display lacks it. Threads may
/// resolve it at the same time: all of them store the same address.
template <typename Function>
class EntryPoint
{
public:
    constexpr explicit EntryPoint(const char* name) : m_name(name) {}

    // Nothing else is reached through the address, so that it needs no order.
    Function Get() const { return m_function.load(std::memory_order_relaxed); }

    /// Resolves it, unless that has been done, and logs the address for the caller @p function.
    void Resolve(const char* function)
    {
        if (Get() != nullptr)
            return;
        const auto address = eglGetProcAddress(m_name);
        m_function.store(reinterpret_cast<Function>(address), std::memory_order_relaxed);
        NIB_LOG_INFO("%s %s = %p", function, m_name, reinterpret_cast<void*>(address));
    }

private:
    const char* m_name;
    std::atomic<Function> m_function{nullptr};
};

} // namespace Nib

#endif
