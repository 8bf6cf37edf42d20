#pragma once

/// Clang's thread-safety analysis, `-Wthread-safety`; nothing to other compilers.
#if defined(__clang__)
#define ZORVA_THREAD_ATTRIBUTE(x) __attribute__((x))
#else
#define ZORVA_THREAD_ATTRIBUTE(x)
#endif

#define ZORVA_CAPABILITY(name) ZORVA_THREAD_ATTRIBUTE(capability(name))
#define ZORVA_SCOPED_CAPABILITY ZORVA_THREAD_ATTRIBUTE(scoped_lockable)
#define ZORVA_GUARDED_BY(lock) ZORVA_THREAD_ATTRIBUTE(guarded_by(lock))
#define ZORVA_REQUIRES(...) ZORVA_THREAD_ATTRIBUTE(requires_capability(__VA_ARGS__))
#define ZORVA_EXCLUDES(...) ZORVA_THREAD_ATTRIBUTE(locks_excluded(__VA_ARGS__))
#define ZORVA_ACQUIRE(...) ZORVA_THREAD_ATTRIBUTE(acquire_capability(__VA_ARGS__))
#define ZORVA_RELEASE(...) ZORVA_THREAD_ATTRIBUTE(release_capability(__VA_ARGS__))
#define ZORVA_ASSERT_HELD(...) ZORVA_THREAD_ATTRIBUTE(assert_capability(__VA_ARGS__))
