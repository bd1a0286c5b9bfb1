#ifndef NIB_RENDER_HWUI_OBJECT_OBSERVER_H
#define NIB_RENDER_HWUI_OBJECT_OBSERVER_H

#include <nib/base.h>
#include <nib/managed_object.h>

#include "base/ThreadAnnotations.h"

#include <cstdint>

namespace Nib::GLES
{

/// The one subscriber list of all HWUI render threads: they draw with the same context, the UI's.
/// It lives while there is one of them. GetInstance and Release from any thread.
class HWUIObjectObserver : public Observer<IManagedObject>
{
public:
    /// The list, made at need; each call is to be matched by a Release().
    static HWUIObjectObserver* GetInstance();

    /// Whether this was the last reference, and the list is gone.
    bool Release();

private:
    HWUIObjectObserver() = default;
    ~HWUIObjectObserver() override = default;

    static CriticalSection m_instanceGuard;
    static HWUIObjectObserver* m_instance NIB_GUARDED_BY(m_instanceGuard);

    std::uint32_t m_references NIB_GUARDED_BY(m_instanceGuard) = 0;
};

} // namespace Nib::GLES

#endif
