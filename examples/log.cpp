// The library's log lines in the application's own log, and the library's version.

#include <nib/base.h>
#include <nib/egl.h>
#include <nib/log.h>
#include <nib/version.h>

#include <atomic>
#include <cstdio>

namespace
{

// On the thread that logs; several may come at once.
void TakeLine(void* context, int priority, const char* message)
{
    std::printf("[%d] %.70s\n", priority, message);
    static_cast<std::atomic<int>*>(context)->fetch_add(1, std::memory_order_relaxed);
}

} // namespace

int main()
{
    std::printf("NibRenderer %s, built for %s\n", Nib::GetVersionString(), NIB_VERSION_STRING);

    std::atomic<int> lines{0};
    if (!Nib::SetLogSink(&TakeLine, &lines))
        return 1;            // an Android older than API level 30
    Nib::Egl::GetInstance(); // tells what it finds
    Nib::SetLogSink(nullptr, nullptr);
    return lines.load(std::memory_order_relaxed) > 0 ? 0 : 1;
}
