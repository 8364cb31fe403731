#ifndef QUAVEL_APPS_WHYCMT_H
#define QUAVEL_APPS_WHYCMT_H

#include <string>

#include "WhyWalk.h"

namespace app::why {

// The metadata boxes of a CR3 file. The stream must stand at the payload's TIFF header and its
// `baseOffset` be there; it is left anywhere.

bool walkCmt1(Walk& walk);
bool walkCmt2(Walk& walk);

/// Tells why all fields stay absent that the box would give.
void absentCmt1(Walk& walk, std::string const& why);
void absentCmt2(Walk& walk, std::string const& why);

}  // namespace app::why

#endif  // QUAVEL_APPS_WHYCMT_H
