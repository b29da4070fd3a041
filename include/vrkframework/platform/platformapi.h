// Export marker for the framework interfaces that ship inside the kubo shared library.
#ifndef VRKFRAMEWORK_PLATFORM_PLATFORMAPI_H
#define VRKFRAMEWORK_PLATFORM_PLATFORMAPI_H

#if defined(_WIN32)
#if defined(KUBO_EXPORTS)
#define KORA_PLATFORM_API __declspec(dllexport)
#else
#define KORA_PLATFORM_API __declspec(dllimport)
#endif
#else
#define KORA_PLATFORM_API __attribute__((visibility("default")))
#endif

#endif  // VRKFRAMEWORK_PLATFORM_PLATFORMAPI_H
