// Export marker of the kubo shared library.
#ifndef VRKFRAMEWORK_BASIC_KUBO_KUBOAPI_H
#define VRKFRAMEWORK_BASIC_KUBO_KUBOAPI_H

#if defined(_WIN32)
#if defined(KUBO_EXPORTS)
#define KUBO_API __declspec(dllexport)
#else
#define KUBO_API __declspec(dllimport)
#endif
#else
#define KUBO_API __attribute__((visibility("default")))
#endif

#endif  // VRKFRAMEWORK_BASIC_KUBO_KUBOAPI_H
