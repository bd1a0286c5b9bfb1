// The native side of NativeInk.kt.

#include "InkView.h"

#include <nib/nib.h>

#include <android/native_window_jni.h>
#include <jni.h>

#include <cmath>
#include <cstdint>
#include <new>
#include <vector>

namespace
{

constexpr float kDegrees = 180.0f / 3.14159265f;
constexpr float kQuarterTurn = 90.0f;
constexpr float kTurn = 360.0f;
constexpr Nib::EglTime kNanosecondsPerMillisecond = 1000000;

// The order of NativeInk.FIELDS.
enum Field
{
    kTime,
    kX,
    kY,
    kPressure,
    kTilt,
    kOrientation,
    kFieldCount
};

InkView& View(jlong handle)
{
    return *reinterpret_cast<InkView*>(static_cast<std::intptr_t>(handle));
}

// Android's orientation is clockwise from the top of the screen, ours from its right.
Ink::Sample ToSample(const float* fields)
{
    Ink::Sample sample;
    sample.time = static_cast<double>(fields[kTime]) / 1000.0;
    sample.x = fields[kX];
    sample.y = fields[kY];
    sample.pressure = fields[kPressure] < 1.0f ? fields[kPressure] : 1.0f;
    sample.altitude = kQuarterTurn - fields[kTilt] * kDegrees;
    sample.azimuth =
        std::fmod(fields[kOrientation] * kDegrees - kQuarterTurn + 2.0f * kTurn, kTurn);
    return sample;
}

void ThrowNoMemory(JNIEnv* env)
{
    env->ThrowNew(env->FindClass("java/lang/OutOfMemoryError"), "no memory for the ink view");
}

} // namespace

extern "C"
{
    JNIEXPORT jlong JNICALL Java_org_nibrenderer_ink_NativeInk_create(JNIEnv* env, jobject,
                                                                      jstring cacheDirectory)
    {
        const char* const path = env->GetStringUTFChars(cacheDirectory, nullptr);
        if (path == nullptr)
            return 0;                                // the exception is pending
        Nib::System::SetSDKCacheDirectoryPath(path); // before anything draws
        env->ReleaseStringUTFChars(cacheDirectory, path);
        InkView* const view = new (std::nothrow) InkView;
        if (view == nullptr)
            ThrowNoMemory(env);
        return static_cast<jlong>(reinterpret_cast<std::intptr_t>(view));
    }

    JNIEXPORT void JNICALL Java_org_nibrenderer_ink_NativeInk_destroy(JNIEnv*, jobject,
                                                                      jlong handle)
    {
        delete &View(handle);
    }

    JNIEXPORT void JNICALL Java_org_nibrenderer_ink_NativeInk_surfaceChanged(
        JNIEnv* env, jobject, jlong handle, jobject surface, jint width, jint height)
    {
        if (ANativeWindow* const window = ANativeWindow_fromSurface(env, surface))
            View(handle).SurfaceChanged(window, width, height);
    }

    JNIEXPORT void JNICALL Java_org_nibrenderer_ink_NativeInk_surfaceDestroyed(JNIEnv*, jobject,
                                                                               jlong handle)
    {
        View(handle).SurfaceDestroyed();
    }

    JNIEXPORT void JNICALL Java_org_nibrenderer_ink_NativeInk_stop(JNIEnv*, jobject, jlong handle)
    {
        View(handle).Stop();
    }

    JNIEXPORT void JNICALL Java_org_nibrenderer_ink_NativeInk_start(JNIEnv*, jobject, jlong handle)
    {
        View(handle).Start();
    }

    JNIEXPORT void JNICALL Java_org_nibrenderer_ink_NativeInk_pen(JNIEnv* env, jobject,
                                                                  jlong handle, jint phase,
                                                                  jfloatArray samples, jint count,
                                                                  jlong firstEventTime)
    {
        std::vector<float> fields(static_cast<std::size_t>(count) * kFieldCount);
        env->GetFloatArrayRegion(samples, 0, static_cast<jsize>(fields.size()), fields.data());
        if (env->ExceptionCheck() == JNI_TRUE)
            return; // fewer than `count` samples
        View(handle).Event(firstEventTime * kNanosecondsPerMillisecond);
        for (jint i = 0; i < count; ++i)
        {
            // A batch begins or ends a stroke with its first or its last sample.
            InkView::Phase of = InkView::Phase::Move;
            if (phase == static_cast<jint>(InkView::Phase::Down) && i == 0)
                of = InkView::Phase::Down;
            else if (phase == static_cast<jint>(InkView::Phase::Up) && i == count - 1)
                of = InkView::Phase::Up;
            View(handle).Pen(of, ToSample(&fields[static_cast<std::size_t>(i) * kFieldCount]));
        }
    }

    JNIEXPORT void JNICALL Java_org_nibrenderer_ink_NativeInk_present(JNIEnv*, jobject,
                                                                      jlong handle)
    {
        View(handle).Present();
    }

    JNIEXPORT void JNICALL Java_org_nibrenderer_ink_NativeInk_undo(JNIEnv*, jobject, jlong handle)
    {
        View(handle).Undo();
    }

    JNIEXPORT void JNICALL Java_org_nibrenderer_ink_NativeInk_clear(JNIEnv*, jobject, jlong handle)
    {
        View(handle).Clear();
    }
}
