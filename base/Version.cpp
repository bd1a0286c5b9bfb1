#include <nib/version.h>

namespace Nib
{

const char* GetVersionString() noexcept
{
    return NIB_VERSION_STRING;
}

} // namespace Nib
