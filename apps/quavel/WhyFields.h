#ifndef QUAVEL_APPS_WHYFIELDS_H
#define QUAVEL_APPS_WHYFIELDS_H

#include <ostream>
#include <string>

#include "WhyWalk.h"
#include "photo/Outcome.h"

namespace app::why {

/// The readers, as bits of a set.
enum Reader : unsigned {
  kTiffReader = 1,
  kNefReader = 2,
  kArwReader = 4,
  kJpegReader = 8,
  kRafReader = 16,
  kCr3Reader = 32,
};

/// Writes a line for each reason for which fields of the record are absent. `kind`: what the
/// reader's files are called.
void explainAbsences(Walk const& walk, Outcome const& outcome, Reader reader,
                     std::string const& kind, std::ostream& out);

}  // namespace app::why

#endif  // QUAVEL_APPS_WHYFIELDS_H
