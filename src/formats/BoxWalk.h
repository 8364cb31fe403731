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

/// A walk over boxes. Notes add to a box's name where it is: " in the moov box at 0x18 (24)".
struct BoxContext {
  char const* noteSuffix = "";   ///< Such as " in the ", with a parent.
  PlacedBox parent = {};         ///< Follows the suffix, unless its type is 0.
  std::int64_t previousEnd = 0;  ///< Where the previous box ends by the size that it declares.
};
void append(std::string& out, BoxContext context);

/// Reads the box header at the stream's position. Moves past the box and sets `previousEnd`.
/// False: the header cannot be read, the size in it is below 8, or there are too many boxes.
bool stepOverBox(std::shared_ptr<QVStream>& stream, BoxContext& context, QVCR3BoxHeader& header);

/// The offset at which a box ends, or the largest `long` if the end is beyond all offsets.
long endOfBox(long start, QVCR3BoxHeader const& header);

/// Where `leaveBox` stops if a box ends beyond all offsets. It is 1 less than the end that
/// `endOfBox` then gives. If the outer box has that end too, the walk through it goes on from here
/// and fails, as there is no data; at its end, it would pass for complete.
inline constexpr long kOutOfReach = std::numeric_limits<long>::max() - 1;

/// Moves to the end of a box, but no further than `kOutOfReach`.
inline void leaveBox(QVStream& stream, long end) { stream.setOffset(std::min(end, kOutOfReach)); }

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_FORMATS_BOXWALK_H
