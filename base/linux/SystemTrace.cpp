#include "base/SystemTrace.h"

namespace Nib
{

std::unique_ptr<OwnedTraceSink> NewSystemTrace()
{
    return nullptr;
}

} // namespace Nib
