#ifndef QUAVEL_APPS_WHYENTRY_H
#define QUAVEL_APPS_WHYENTRY_H

#include <string>

#include "WhyDirectory.h"
#include "WhyWalk.h"

namespace app::why {

// A closer look at the bytes of a directory, once the library's classes have refused it. The
// stream must still have the structure's base and byte order; it is left anywhere.

/// Why a directory with these wanted tags cannot be read.
std::string whyUnread(Walk& walk, WalkedDirectory const& directory, Tags const& tags);

/// "0x0112 Orientation at 0x3a (58) in IFD0", for an entry that the directory has.
std::string entryText(Walk& walk, WalkedDirectory const& directory, unsigned short tag);

/// "2 SHORT values", for an entry that the directory has.
std::string contentText(Walk& walk, WalkedDirectory const& directory, unsigned short tag);

}  // namespace app::why

#endif  // QUAVEL_APPS_WHYENTRY_H
