#include <nib/managed_object.h>
#include <nib/msg_queue.h>

#include "base/Log.h"

namespace Nib
{

namespace
{

/// The object observer of the calling thread's queue; null where there is none.
Observer<IManagedObject>* CurrentObjectObserver()
{
    auto* queue = dynamic_cast<IGLManagedMsgQueue*>(GetCurrentMsgQueue());
    return queue ? queue->GetObjectObserver() : nullptr;
}

} // namespace

ManagedObject::ManagedObject() : m_position(), m_observer(nullptr), m_released(false) {}

ManagedObject::~ManagedObject()
{
    Unregister();
}

void ManagedObject::OnRelease()
{
    if (m_released)
        return;
    ReleaseGLObject();
    m_released = true;
}

void ManagedObject::OnRestore()
{
    if (!m_released)
        return;
    RestoreGLObject();
    m_released = false;
}

void ManagedObject::Register()
{
    NIB_FUNCTION("void Nib::ManagedObject::Register()");
    if (m_observer)
    {
        NIB_LOG_INFO("%s Object Already subscribed to obtain Release/Restore calls!", function);
        return;
    }
    if (!GetCurrentMsgQueue())
    {
        NIB_LOG_ERROR("%s - GL thread NOT found. This function should be called on GL thread",
                      function);
        return;
    }
    m_observer = CurrentObjectObserver();
    if (m_observer)
        m_position = m_observer->Subscribe(this);
}

void ManagedObject::Unregister()
{
    NIB_FUNCTION("void Nib::ManagedObject::Unregister()");
    if (!m_observer)
        return;
    if (CurrentObjectObserver() == m_observer)
    {
        m_observer->Unsubscribe(m_position);
    }
    else
    {
        // The list is safe on its own thread only, so the entry stays there.
        NIB_LOG_WARN("%s Object was subscribed to other MessageQueue.  Probably object is static! "
                     "It is not safe to use static GL objects.",
                     function);
    }
    m_observer = nullptr;
}

bool ManagedObject::IsSubscribed() const
{
    return m_observer != nullptr;
}

} // namespace Nib
