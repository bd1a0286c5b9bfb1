#include <nib/egl.h>

#include "base/Log.h"

namespace Nib
{

// The window pointer is written by the owning render thread alone, and followed by it alone. Other
// threads only ask whether it is set, so that nothing needs an order between them.
namespace
{
constexpr auto kOwn = std::memory_order_relaxed;
}

HybridSurface::~HybridSurface()
{
    Destroy();
}

bool HybridSurface::Create()
{
    NIB_FUNCTION("bool Nib::HybridSurface::Create()");
    m_offscreen = Egl::GetInstance()->CreateOffscreenSurface(1, 1);
    if (m_offscreen != nullptr)
        return true;
    NIB_LOG_ERROR("%s. Failed to create offscreen surface", function);
    return false;
}

bool HybridSurface::AttachToWindow(ANativeWindow* window)
{
    NIB_FUNCTION("bool Nib::HybridSurface::AttachToWindow(ANativeWindow *)");
    // The old surface goes first: a window takes only one at a time.
    DetachFromWindow();
    m_window.store(Egl::GetInstance()->CreateWindowSurface(window), kOwn);
    if (IsAttachedToWindow())
        return true;
    NIB_LOG_ERROR("%s. Failed to create window surface", function);
    return false;
}

bool HybridSurface::DetachFromWindow()
{
    delete m_window.exchange(nullptr, kOwn);
    return true;
}

bool HybridSurface::IsAttachedToWindow() const
{
    return m_window.load(kOwn) != nullptr;
}

EglSurface* HybridSurface::GetActiveSurface() const
{
    EglSurface* window = m_window.load(kOwn);
    return window != nullptr ? window : m_offscreen;
}

int HybridSurface::GetWidth() const
{
    const EglSurface* window = m_window.load(kOwn);
    return window != nullptr ? window->GetWidth() : 1;
}

int HybridSurface::GetHeight() const
{
    const EglSurface* window = m_window.load(kOwn);
    return window != nullptr ? window->GetHeight() : 1;
}

void HybridSurface::Destroy()
{
    delete m_offscreen;
    m_offscreen = nullptr;
    DetachFromWindow();
}

} // namespace Nib
