#ifndef QUAVEL_EXPORT_H
#define QUAVEL_EXPORT_H

/// QUAVEL_EXPORT exports a class from the shared library; QUAVEL_NO_EXPORT keeps a private member
/// of such a class out. A static build defines QUAVEL_STATIC_DEFINE, and so do its users.
#if defined(QUAVEL_STATIC_DEFINE)
#define QUAVEL_EXPORT
#define QUAVEL_NO_EXPORT
#elif defined(_WIN32)
#ifdef quavel_EXPORTS  // defined by the library's own build
#define QUAVEL_EXPORT __declspec(dllexport)
#else
#define QUAVEL_EXPORT __declspec(dllimport)
#endif
#define QUAVEL_NO_EXPORT  // a class is exported whole
#elif defined(__GNUC__)
#define QUAVEL_EXPORT __attribute__((visibility("default")))
#define QUAVEL_NO_EXPORT __attribute__((visibility("hidden")))
#else
#define QUAVEL_EXPORT
#define QUAVEL_NO_EXPORT
#endif

#endif  // QUAVEL_EXPORT_H
