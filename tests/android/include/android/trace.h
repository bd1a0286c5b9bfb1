#ifndef NIB_TESTS_ANDROID_TRACE_H
#define NIB_TESTS_ANDROID_TRACE_H

// The platform's interface as far as the library uses it, from API level 23 on; declarations only.

extern "C"
{
    bool ATrace_isEnabled(void);
    void ATrace_beginSection(const char* sectionName);
    void ATrace_endSection(void);
}

#endif
