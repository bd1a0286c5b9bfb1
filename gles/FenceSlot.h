#ifndef NIB_GLES_FENCESLOT_H
#define NIB_GLES_FENCESLOT_H

#include <GLES3/gl3.h>

#include <atomic>

namespace Nib::GLES
{

/// A GL sync object that is to be waited for once, by whichever handle comes first.
///
/// A texture and its aliases hold the same sync object, perhaps on several threads: the one that
/// takes it out of the owner's slot waits for it and deletes it. Copying copies the handle, not the
/// right to it.
class FenceSlot
{
public:
    FenceSlot() = default;
    explicit FenceSlot(GLsync sync) : m_sync(sync) {}
    FenceSlot(const FenceSlot& other) : m_sync(other.Get()) {}
    FenceSlot& operator=(const FenceSlot& other)
    {
        Set(other.Get());
        return *this;
    }

    // acquire and release pair with each other: who sees a sync object sees it complete.
    GLsync Get() const { return m_sync.load(std::memory_order_acquire); }
    void Set(GLsync sync) { m_sync.store(sync, std::memory_order_release); }

    /// Empties the slot if it holds @p sync; false when another handle was first.
    bool Take(GLsync sync)
    {
        return m_sync.compare_exchange_strong(sync, nullptr, std::memory_order_acq_rel,
                                              std::memory_order_acquire);
    }

private:
    std::atomic<GLsync> m_sync{nullptr};
};

} // namespace Nib::GLES

#endif
