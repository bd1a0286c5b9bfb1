#ifndef NIB_BASE_THREAD_ANNOTATIONS_H
#define NIB_BASE_THREAD_ANNOTATIONS_H

// Clang's thread-safety attributes; nothing under other compilers.

#if defined(__clang__)
#define NIB_THREAD_ATTRIBUTE(x) __attribute__((x))
#else
#define NIB_THREAD_ATTRIBUTE(x)
#endif

#define NIB_GUARDED_BY(lock) NIB_THREAD_ATTRIBUTE(guarded_by(lock))
#define NIB_REQUIRES(...) NIB_THREAD_ATTRIBUTE(requires_capability(__VA_ARGS__))
#define NIB_EXCLUDES(...) NIB_THREAD_ATTRIBUTE(locks_excluded(__VA_ARGS__))
#define NIB_ACQUIRED_AFTER(...) NIB_THREAD_ATTRIBUTE(acquired_after(__VA_ARGS__))
#define NIB_NO_THREAD_SAFETY_ANALYSIS NIB_THREAD_ATTRIBUTE(no_thread_safety_analysis)

#endif
