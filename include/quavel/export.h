#ifndef QUAVEL_EXPORT_H
#define QUAVEL_EXPORT_H

/// Marks what the shared library shows to its users. A static build defines
/// QUAVEL_STATIC_DEFINE. A shown class hides its private members with QUAVEL_NO_EXPORT.
#if defined(QUAVEL_STATIC_DEFINE) || !defined(__GNUC__)
#define QUAVEL_EXPORT
#define QUAVEL_NO_EXPORT
#else
#define QUAVEL_EXPORT __attribute__((visibility("default")))
#define QUAVEL_NO_EXPORT __attribute__((visibility("hidden")))
#endif

#endif  // QUAVEL_EXPORT_H
