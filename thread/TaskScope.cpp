#include "thread/TaskScope.h"

#include "thread/TypeName.h"

#include <map>
#include <mutex>
#include <string_view>

namespace Nib
{

namespace
{

thread_local ITaskGroups* t_groups = nullptr;

/// The names that were looked up, by what the compiler calls the types.
class TypeNames
{
public:
    static TypeNames& Get()
    {
        static TypeNames& names = *new TypeNames; // for ever: threads may go on at the end
        return names;
    }

    const char* Of(const std::type_info* type)
    {
        const std::lock_guard lock(m_lock);
        const std::string_view key = type ? type->name() : "";
        auto place = m_names.find(key);
        if (place == m_names.end())
            place = m_names.emplace(key, TypeName(type)).first;
        return place->second.c_str();
    }

private:
    std::mutex m_lock;
    std::map<std::string, std::string, std::less<>> m_names;
};

} // namespace

const char* TaskScope::NameOf(const ITask& task)
{
    return TypeNames::Get().Of(TypeOf(task));
}

void TaskScope::BeginRun(const ITask& task, const std::type_info* carrier)
{
    const std::type_info* const type = TypeOf(task);
    if (type && type == carrier)
        return;
    const char* const name = TypeNames::Get().Of(type);
    m_isBegun = true;
    m_groups = t_groups;
    if (m_groups)
        m_groups->BeginTask(name);
    m_isTraced = Trace::IsOn();
    if (m_isTraced)
        Trace::Begin("task", name);
}

void TaskScope::BeginWait(const char* target, const ITask& task)
{
    m_isBegun = true;
    m_isTraced = true;
    m_groups = nullptr;
    Trace::Begin("wait", "wait", {{"for", target}, {"task", NameOf(task)}});
}

void TaskScope::End()
{
    if (m_isTraced)
        Trace::End();
    if (m_groups)
        m_groups->EndTask();
}

void TaskScope::SetGroups(ITaskGroups* groups)
{
    t_groups = groups;
}

void TaskScope::ListenToTasks(bool isListening)
{
    Trace::SetListening(Trace::kTaskGroups, isListening);
}

} // namespace Nib
