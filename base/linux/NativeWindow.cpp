#include <nib/export.h>

#include <android/native_window.h>

// A window of a desktop takes its pixel format from the surface that is made for it. Alone in its
// file, so that a program that brings its own replaces nothing else.

extern "C" NIB_EXPORT int32_t ANativeWindow_setBuffersGeometry(ANativeWindow*, int32_t, int32_t,
                                                               int32_t)
{
    return 0;
}
