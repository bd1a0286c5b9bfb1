#include "base/linux/LogThreshold.h"
#include "base/LogSinkHolder.h"

namespace Nib
{

bool SetLogSink(LogSink sink, void* context, int lowestPriority)
{
    LogSinkHolder::Instance().Set(sink, context, lowestPriority);
    FindLowestWanted();
    return true;
}

} // namespace Nib
