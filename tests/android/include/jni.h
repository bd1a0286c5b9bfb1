#ifndef NIB_TESTS_ANDROID_JNI_H
#define NIB_TESTS_ANDROID_JNI_H

// Declarations only: what the example application uses of the Java native interface.

#include <stdint.h>

#define JNIEXPORT __attribute__((visibility("default")))
#define JNICALL
#define JNI_TRUE 1

typedef int32_t jint;
typedef int64_t jlong;
typedef float jfloat;
typedef uint8_t jboolean;
typedef jint jsize;

class _jobject
{
};
class _jclass : public _jobject
{
};
class _jstring : public _jobject
{
};
class _jfloatArray : public _jobject
{
};
typedef _jobject* jobject;
typedef _jclass* jclass;
typedef _jstring* jstring;
typedef _jfloatArray* jfloatArray;

struct JNIEnv
{
    jclass FindClass(const char* name);
    jint ThrowNew(jclass clazz, const char* message);
    jboolean ExceptionCheck();
    const char* GetStringUTFChars(jstring string, jboolean* isCopy);
    void ReleaseStringUTFChars(jstring string, const char* utf);
    void GetFloatArrayRegion(jfloatArray array, jsize start, jsize len, jfloat* buf);
};

#endif
