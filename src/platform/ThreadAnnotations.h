#pragma once

// Lock annotations that clang checks with -Wthread-safety; other compilers see nothing.

#if defined(__clang__)
#define VEXA_THREAD_ATTRIBUTE(x) __attribute__((x))
#else
#define VEXA_THREAD_ATTRIBUTE(x)
#endif

#define CAPABILITY(name) VEXA_THREAD_ATTRIBUTE(capability(name))
#define SCOPED_CAPABILITY VEXA_THREAD_ATTRIBUTE(scoped_lockable)
#define GUARDED_BY(lock) VEXA_THREAD_ATTRIBUTE(guarded_by(lock))
#define REQUIRES(...) VEXA_THREAD_ATTRIBUTE(requires_capability(__VA_ARGS__))
#define EXCLUDES(...) VEXA_THREAD_ATTRIBUTE(locks_excluded(__VA_ARGS__))
#define ACQUIRE(...) VEXA_THREAD_ATTRIBUTE(acquire_capability(__VA_ARGS__))
#define RELEASE(...) VEXA_THREAD_ATTRIBUTE(release_capability(__VA_ARGS__))
#define RETURN_CAPABILITY(lock) VEXA_THREAD_ATTRIBUTE(lock_returned(lock))
#define NO_THREAD_SAFETY_ANALYSIS VEXA_THREAD_ATTRIBUTE(no_thread_safety_analysis)
