#include <android/log.h>

// In front of the base library's: nearly every input is refused with a line.
extern "C" int __android_log_print(int, const char*, const char*, ...)
{
    return 0;
}
