#ifndef QUAVEL_APPS_WHYFORMATS_H
#define QUAVEL_APPS_WHYFORMATS_H

#include "WhyWalk.h"

namespace app::why {

// Each takes the steps of its format's reader in the reader's order, on a stream at the start of
// the file, until one fails.

void walkTiff(Walk& walk);
void walkNef(Walk& walk);
void walkArw(Walk& walk);
void walkJpeg(Walk& walk);
void walkRaf(Walk& walk);
void walkCr3(Walk& walk);

}  // namespace app::why

#endif  // QUAVEL_APPS_WHYFORMATS_H
