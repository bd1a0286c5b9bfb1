#include "base/Log.h"
#include "base/LogSinkHolder.h"

#include <cstdint>
#include <cstring>

#include <dlfcn.h>

namespace Nib
{

namespace
{

// The system's interface as of API level 30; declared here because the library is built for
// earlier levels, too.
struct SystemLogMessage
{
    std::size_t structSize;
    std::int32_t buffer;
    std::int32_t priority;
    const char* tag;
    const char* file;
    std::uint32_t line;
    const char* message;
};

using SystemLogger = void (*)(const SystemLogMessage*);
using SetSystemLogger = void (*)(SystemLogger);

struct SystemLog
{
    SystemLog()
        : setLogger(
              reinterpret_cast<SetSystemLogger>(dlsym(RTLD_DEFAULT, "__android_log_set_logger"))),
          write(reinterpret_cast<SystemLogger>(dlsym(RTLD_DEFAULT, "__android_log_logd_logger")))
    {
    }

    SetSystemLogger setLogger; // null before API level 30
    SystemLogger write;        // the system's own logger
};

const SystemLog& GetSystemLog()
{
    static const SystemLog log;
    return log;
}

// Stands in for the system's logger: gets the lines of the whole process.
void WriteAndHandOver(const SystemLogMessage* line)
{
    GetSystemLog().write(line);
    LogSinkHolder& sink = LogSinkHolder::Instance();
    if (sink.Wants(line->priority) && line->tag && std::strcmp(line->tag, kLogTag) == 0)
        sink.Take(line->priority, line->message);
}

} // namespace

bool SetLogSink(LogSink sink, void* context, int lowestPriority)
{
    const SystemLog& log = GetSystemLog();
    if (!log.setLogger || !log.write)
        return false;
    LogSinkHolder::Instance().Set(sink, context, lowestPriority);
    log.setLogger(sink ? &WriteAndHandOver : log.write);
    return true;
}

} // namespace Nib
