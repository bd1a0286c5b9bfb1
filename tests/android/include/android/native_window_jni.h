#ifndef NIB_TESTS_ANDROID_NATIVE_WINDOW_JNI_H
#define NIB_TESTS_ANDROID_NATIVE_WINDOW_JNI_H

// Declarations only.

#include <android/native_window.h>
#include <jni.h>

extern "C" ANativeWindow* ANativeWindow_fromSurface(JNIEnv* env, jobject surface);

#endif
