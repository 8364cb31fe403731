#ifndef QUAVEL_VERSION_H
#define QUAVEL_VERSION_H

// The one home of the version: the build reads it from here.
#define QUAVEL_VERSION_MAJOR 0
#define QUAVEL_VERSION_MINOR 1
#define QUAVEL_VERSION_PATCH 0

#endif  // QUAVEL_VERSION_H
