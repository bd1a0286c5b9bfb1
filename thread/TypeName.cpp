#include "thread/TypeName.h"

#include <nib/task.h>

#include <atomic>
#include <cstdlib>
#include <memory>

#include <cxxabi.h>

namespace Nib
{

const std::type_info* TypeOf(const ITask& task)
{
    // Atomic, so that the compiler does not take for granted what is not there.
    const std::atomic<const std::type_info*> type(&typeid(task));
    return type.load(std::memory_order_relaxed);
}

std::string TypeName(const std::type_info* type)
{
    if (type == nullptr)
        return "a task without type information";
    int status = 0;
    const std::unique_ptr<char, void (*)(void*)> name(
        abi::__cxa_demangle(type->name(), nullptr, nullptr, &status), &std::free);
    return name ? name.get() : type->name();
}

} // namespace Nib
