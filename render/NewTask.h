#ifndef NIB_RENDER_NEW_TASK_H
#define NIB_RENDER_NEW_TASK_H

#include <nib/task.h>

#include <type_traits>

namespace Nib::GLES
{

// NewTask(object, &Class::Function, arguments...) and NewTask(function, arguments...) make the task
// that calls just that. Whoever the task is handed to owns it.

template <typename T, typename Base, typename R>
ITask* NewTask(T* object, R (Base::*function)())
{
    static_assert(std::is_base_of_v<Base, T>);
    return new WorkerTask::Member0<T, R (T::*)()>(object, function);
}

template <typename T, typename R, typename A1, typename A2>
ITask* NewTask(T* object, R (T::*function)(A1, A2), const std::type_identity_t<A1>& a1,
               const std::type_identity_t<A2>& a2)
{
    return new WorkerTask::Member2<T, R (T::*)(A1, A2), A1, A2>(object, function, a1, a2);
}

template <typename T, typename R, typename A1, typename A2, typename A3>
ITask* NewTask(T* object, R (T::*function)(A1, A2, A3), const std::type_identity_t<A1>& a1,
               const std::type_identity_t<A2>& a2, const std::type_identity_t<A3>& a3)
{
    return new WorkerTask::Member3<T, R (T::*)(A1, A2, A3), A1, A2, A3>(object, function, a1, a2,
                                                                        a3);
}

template <typename R, typename A1, typename A2>
ITask* NewTask(R (*function)(A1, A2), const std::type_identity_t<A1>& a1,
               const std::type_identity_t<A2>& a2)
{
    return new WorkerTask::Func2<R (*)(A1, A2), A1, A2>(function, a1, a2);
}

} // namespace Nib::GLES

#endif
