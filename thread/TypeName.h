#ifndef NIB_THREAD_TYPE_NAME_H
#define NIB_THREAD_TYPE_NAME_H

#include <string>
#include <typeinfo>

namespace Nib
{

class ITask;

/// The type of @p task; null for one of a program without type information.
const std::type_info* TypeOf(const ITask& task);

/// The type's name as the source has it; of null, that there is none.
std::string TypeName(const std::type_info* type);

} // namespace Nib

#endif
