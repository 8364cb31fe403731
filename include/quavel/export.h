#ifndef QUAVEL_EXPORT_H
#define QUAVEL_EXPORT_H

/// Marks what the shared library shows to its users. A static build defines QUAVEL_STATIC_DEFINE.
#if defined(QUAVEL_STATIC_DEFINE) || !defined(__GNUC__)
#define QUAVEL_EXPORT
#else
#define QUAVEL_EXPORT __attribute__((visibility("default")))
#endif

#endif  // QUAVEL_EXPORT_H
