#ifndef QUAVEL_APPS_WHYCONTENT_H
#define QUAVEL_APPS_WHYCONTENT_H

#include <string>

#include "WhyWalk.h"

namespace app::why {

/// What the file's first bytes look like, if that is not what its extension (lower case) promises:
/// "an ISO base media file of brand \"heic\""; else empty.
std::string foreignContent(Walk const& walk, std::string const& extension);

}  // namespace app::why

#endif  // QUAVEL_APPS_WHYCONTENT_H
