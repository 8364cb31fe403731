#ifndef QUAVEL_SRC_FORMATS_BOXWALK_H
#define QUAVEL_SRC_FORMATS_BOXWALK_H

#include <algorithm>
#include <cstdint>
#include <limits>
#include <memory>
#include <string>

#include "journal/Journal.h"
#include "journal/Reading.h"
#include "stream/Bytes.h"

namespace quavel {

class QVCR3BoxHeader;
class QVStream;

namespace detail {

/// A box in a note: "moov box at 0x18 (24)".
struct PlacedBox {
  std::uint32_t type = 0;
  std::int64_t position = 0;  ///< In the file.
};
void append(std::string& out, PlacedBox box);

/// What notes say of a walk's boxes after the box's name: " in the moov box at 0x18 (24)".
struct BoxContext {
  char const* noteSuffix = "";   ///< Such as " in the " or " before a moov box was met".
  PlacedBox parent = {};         ///< Follows the suffix, unless its type is 0.
  std::int64_t previousEnd = 0;  ///< The offset at which the previous box ends by its own size.
};
void append(std::string& out, BoxContext context);

/// Reads the box header at the stream's position. Moves past the box and sets `previousEnd`.
/// False: the header cannot be read, the size in it is below 8, or there are too many boxes.
bool stepOverBox(std::shared_ptr<QVStream>& stream, BoxContext& context, QVCR3BoxHeader& header);

/// The offset at which a box ends, or the largest `long` if the end is beyond all offsets.
long endOfBox(long start, QVCR3BoxHeader const& header);

/// The highest offset to which `leaveBox` moves. For a box that ends beyond all offsets, `endOfBox`
/// gives 1 more. A walk goes on while its offset is below the end of the box around it: in such a
/// box, it goes on from here and fails for lack of data, instead of stopping as if all had been
/// read.
inline constexpr long kLastBoxEnd = std::numeric_limits<long>::max() - 1;

/// Moves to the end of a box, but no further than `kLastBoxEnd`.
inline void leaveBox(QVStream& stream, long end) { stream.setOffset(std::min(end, kLastBoxEnd)); }

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_FORMATS_BOXWALK_H
