#ifndef QUAVEL_VERSION_H
#define QUAVEL_VERSION_H

// The version is set here only: the build reads it from this file.
#define QUAVEL_VERSION_MAJOR 0
#define QUAVEL_VERSION_MINOR 1
#define QUAVEL_VERSION_PATCH 0

#endif  // QUAVEL_VERSION_H
