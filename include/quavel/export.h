#ifndef QUAVEL_EXPORT_H
#define QUAVEL_EXPORT_H

/// Marks what the shared library shows to its users. A static build, and whoever uses it, defines
/// QUAVEL_STATIC_DEFINE. A shown class hides its private members with QUAVEL_NO_EXPORT.
#if defined(QUAVEL_STATIC_DEFINE)
#define QUAVEL_EXPORT
#define QUAVEL_NO_EXPORT
#elif defined(_WIN32)
#ifdef quavel_EXPORTS  // by the build of the library itself
#define QUAVEL_EXPORT __declspec(dllexport)
#else
#define QUAVEL_EXPORT __declspec(dllimport)
#endif
#define QUAVEL_NO_EXPORT  // a class is shown whole
#elif defined(__GNUC__)
#define QUAVEL_EXPORT __attribute__((visibility("default")))
#define QUAVEL_NO_EXPORT __attribute__((visibility("hidden")))
#else
#define QUAVEL_EXPORT
#define QUAVEL_NO_EXPORT
#endif

#endif  // QUAVEL_EXPORT_H
