#ifndef NIB_LINUX_ANDROID_NATIVE_WINDOW_H
#define NIB_LINUX_ANDROID_NATIVE_WINDOW_H

#include <stdint.h>

// On Linux an ANativeWindow* carries the native window of the EGL platform in use: an X11 Window
// cast to the pointer type, a wl_egl_window*, a gbm_surface*. It is never dereferenced.

#ifdef __cplusplus
extern "C"
{
#endif

    typedef struct ANativeWindow ANativeWindow;

    int32_t ANativeWindow_setBuffersGeometry(ANativeWindow* window, int32_t width, int32_t height,
                                             int32_t format);

#ifdef __cplusplus
}
#endif

#endif
