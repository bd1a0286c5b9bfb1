#ifndef NIB_MANAGED_OBJECT_H
#define NIB_MANAGED_OBJECT_H

/// @file
/// GL objects that survive the loss of their context, and the subscriber list of a message queue
/// through which they are told of it.

#include <nib/base.h>
#include <nib/export.h>

#include <cstddef>
#include <exception>
#include <functional>
#include <list>
#include <unordered_map>

namespace Nib
{

/// What a message queue tells the GL objects that were made on its thread.
///
/// Threads  every operation is called on the GL thread of the object's context.
class NIB_EXPORT IManagedObject
{
public:
    virtual ~IManagedObject() = default;
    virtual void OnRelease() = 0;       ///< the context is about to be destroyed; still current
    virtual void OnRestore() = 0;       ///< a new context was made and is current
    virtual void ReleaseGLObject() = 0; ///< deletes the GL names, keeps what rebuilds them
    virtual void RestoreGLObject() = 0; ///< creates the GL names again from what was kept
};

/// The subscriber list of a message queue as its subscribers see it.
template <typename T>
class NIB_EXPORT ObserverInterface
{
public:
    /// Where a subscriber stands in the list; valid until it is unsubscribed.
    using Position = typename std::list<T*>::iterator;

    virtual ~ObserverInterface() = default;
    virtual Position Subscribe(T* object) = 0;       ///< @p object is borrowed, appended last
    virtual void Unsubscribe(Position position) = 0; ///< @p position as Subscribe returned it
};

template <typename T>
class Observer;

/// The subscriber list of one message queue, and the dispatch of context loss to its subscribers.
///
/// Owner    the message queue embeds it. The subscribers are borrowed: destroying the observer
///          frees the entries and reports those that were left, never the objects.
/// Threads  the GL thread of the queue. One re-entrant lock guards everything; it is held for the
///          whole of a dispatch.
/// Dispatch a subscriber that is being called may subscribe and unsubscribe others, but not itself,
///          and must not start another dispatch of the same observer.
template <>
class NIB_EXPORT Observer<IManagedObject> : public ObserverInterface<IManagedObject>
{
public:
    Observer();
    ~Observer() override;
    Observer(const Observer&) = delete;
    Observer& operator=(const Observer&) = delete;

    /// Appends @p object, which may be null: a null entry is skipped by a dispatch.
    Position Subscribe(IManagedObject* object) override;

    /// Removes an entry. Throws std::logic_error ("Error: list iterator is invalidated") when it is
    /// the very entry that a dispatch is calling; it then stays in the list.
    void Unsubscribe(Position position) override;

    /// Calls OnRelease() of every subscriber, the last one first. To be called while the context
    /// that is about to go is current. What a subscriber throws leaves the dispatch.
    void DispatchRelease();

    /// Calls OnRestore() of every subscriber, the first one first: what was made on top of another
    /// object is rebuilt after it. To be called when the new context is current.
    void DispatchRestore();

    /// The same where nobody would catch what a subscriber throws: it goes to @p failed, and the
    /// subscribers behind it are restored all the same.
    void DispatchRestore(const std::function<void(const std::exception&)>& failed);

private:
    class Dispatch;

    bool IsDispatching() const;

    std::list<IManagedObject*> m_subscribers; ///< its size is the number of subscribers
    CriticalSection m_lock;
    Position m_dispatchPosition; ///< the subscriber being called; the list's end otherwise

    /// Type names by list entry, taken when the object subscribed: an entry whose object died
    /// elsewhere can still be named.
    std::unordered_map<IManagedObject* const*, const char*> m_typeNames;
};

/// The base of every GL object of the library: Register(), in a constructor, subscribes the object to
/// the message queue of the GL thread; each release and each restore then is one call.
///
/// Threads  the GL thread of the object's context, destruction included. An object destroyed on
///          another thread leaves its entry in the list of its queue, and the next dispatch of that
///          queue calls a dead object.
/// Failure  Register and Unregister report by log lines. Unregister throws when the object is being
///          called by a dispatch; from the destructor that exception ends the process, so an object
///          must not be destroyed from inside its own release or restore.
class NIB_EXPORT ManagedObject : public IManagedObject
{
public:
    ManagedObject();
    ~ManagedObject() override; ///< does what Unregister() does
    ManagedObject(const ManagedObject&) = delete;
    ManagedObject& operator=(const ManagedObject&) = delete;

    void OnRelease() override; ///< ReleaseGLObject(), once until the next OnRestore()
    void OnRestore() override; ///< RestoreGLObject(), if the object was released

    /// Subscribes to the object observer of the calling thread's message queue. Without such a
    /// queue, or with one that manages no objects, the object stays unmanaged.
    void Register();

    /// Ends the subscription; nothing when there is none.
    void Unregister();

    bool IsSubscribed() const; ///< whether the object holds an observer

private:
    std::list<IManagedObject*>::iterator m_position; ///< valid while subscribed
    Observer<IManagedObject>* m_observer;            ///< null while not subscribed
    bool m_released;
};

} // namespace Nib

#endif
