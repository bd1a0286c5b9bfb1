#include <nib/managed_object.h>
#include <nib/trace.h>

#include "base/Log.h"

#include <stdexcept>
#include <typeinfo>

namespace Nib
{

namespace
{

constexpr bool kReentrant = true;

/// The type of @p object as its type information names it; null for no object.
const char* TypeNameOf(const IManagedObject* object)
{
    return object ? typeid(*object).name() : nullptr;
}

} // namespace

/// The dispatch position, back at the list's end however the dispatch is left.
class Observer<IManagedObject>::Dispatch
{
public:
    explicit Dispatch(Observer& observer) : m_observer(observer) {}
    ~Dispatch() { m_observer.m_dispatchPosition = m_observer.m_subscribers.end(); }
    Dispatch(const Dispatch&) = delete;
    Dispatch& operator=(const Dispatch&) = delete;

    void Call(Position position, void (IManagedObject::*operation)())
    {
        m_observer.m_dispatchPosition = position;
        if (IManagedObject* object = *position)
            (object->*operation)();
    }

private:
    Observer& m_observer;
};

Observer<IManagedObject>::Observer() : m_lock(kReentrant), m_dispatchPosition(m_subscribers.end())
{
}

Observer<IManagedObject>::~Observer()
{
    if (m_subscribers.empty())
        return;
    NIB_LOG_WARN("%s Subscriber list is not empty: %d objects still subscribed.", "~Observer",
                 static_cast<int>(m_subscribers.size()));
    int index = 0;
    for (IManagedObject* const& entry : m_subscribers)
    {
        // By the kept name: the object of a stale entry is dead.
        if (const char* name = m_typeNames.at(&entry))
            NIB_LOG_DEBUG("    %d: - %s", index, name);
        else
            NIB_LOG_DEBUG("std::bad_typeid exception thrown");
        ++index;
    }
}

Observer<IManagedObject>::Position Observer<IManagedObject>::Subscribe(IManagedObject* object)
{
    AutoCriticalSection guard(m_lock);
    const char* name = TypeNameOf(object);
    if (IsDispatching())
    {
        if (name)
            NIB_LOG_DEBUG("Warning! Subscribe while dispatch, %s", name);
        else
            NIB_LOG_DEBUG("Warning! Subscribe while dispatch");
    }
    const Position position = m_subscribers.insert(m_subscribers.end(), object);
    m_typeNames.emplace(&*position, name);
    return position;
}

void Observer<IManagedObject>::Unsubscribe(Position position)
{
    AutoCriticalSection guard(m_lock);
    if (IsDispatching())
    {
        if (const char* name = m_typeNames.at(&*position))
            NIB_LOG_DEBUG("Warning! Unsubscribe while dispatch, %s", name);
        else
            NIB_LOG_DEBUG("Warning! Unsubscribe while dispatch");
        if (position == m_dispatchPosition)
            throw std::logic_error("Error: list iterator is invalidated");
    }
    m_typeNames.erase(&*position);
    m_subscribers.erase(position);
}

void Observer<IManagedObject>::DispatchRelease()
{
    const TraceScope trace("context", "release objects");
    AutoCriticalSection guard(m_lock);
    Dispatch dispatch(*this);
    for (Position position = m_subscribers.end(); position != m_subscribers.begin();)
        dispatch.Call(--position, &IManagedObject::OnRelease);
}

void Observer<IManagedObject>::DispatchRestore()
{
    const TraceScope trace("context", "restore objects");
    AutoCriticalSection guard(m_lock);
    Dispatch dispatch(*this);
    for (Position position = m_subscribers.begin(); position != m_subscribers.end(); ++position)
        dispatch.Call(position, &IManagedObject::OnRestore);
}

void Observer<IManagedObject>::DispatchRestore(
    const std::function<void(const std::exception&)>& failed)
{
    const TraceScope trace("context", "restore objects");
    AutoCriticalSection guard(m_lock);
    Dispatch dispatch(*this);
    for (Position position = m_subscribers.begin(); position != m_subscribers.end(); ++position)
    {
        try
        {
            dispatch.Call(position, &IManagedObject::OnRestore);
        }
        catch (const std::exception& failure)
        {
            failed(failure);
        }
    }
}

bool Observer<IManagedObject>::IsDispatching() const
{
    return m_dispatchPosition != m_subscribers.end();
}

} // namespace Nib
