#ifndef QUAVEL_SRC_FORMATS_BOXWALK_H
#define QUAVEL_SRC_FORMATS_BOXWALK_H

#include <algorithm>
#include <cstdint>
#include <limits>
#include <memory>
#include <string>

#include "formats/BoxTypes.h"
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

/// Where a box is, as a note says it after the box's name: " in the moov box at 0x18 (24)".
struct BoxPlace {
  char const* words = "";  ///< Such as " in the " or " before a moov box was met".
  PlacedBox parent = {};   ///< Follows the words, unless its type is 0.
};
void append(std::string& out, BoxPlace place);

/// A walk over consecutive boxes, of which the first begins at the stream's position.
class BoxWalk {
 public:
  /// `place` is where notes say that the boxes are.
  BoxWalk(std::shared_ptr<QVStream>& stream, BoxPlace place) : stream_(stream), place_(place) {}

  /// Reads the header of the box at the stream's position, and moves past the whole box; `enterBox`
  /// goes back to its content. False: the header cannot be read, the size in it is below 8, or
  /// there are too many boxes.
  bool stepOver(QVCR3BoxHeader& header);

 private:
  std::shared_ptr<QVStream>& stream_;
  BoxPlace place_;
  std::int64_t previousEnd_ = 0;  // the offset at which the previous box should end
};

/// The offset at which a box ends, or the largest `long` if the end is beyond all offsets.
long endOfBox(long start, QVCR3BoxHeader const& header);

/// Moves to the content of a box that begins at `start`. Its header has 8 bytes: one for a 64-bit
/// size, of 16, was refused.
inline void enterBox(QVStream& stream, long start) {
  stream.setOffset(static_cast<long>(wrappingSum(start, box::kHeaderSize)));
}

/// Moves to the end of a box. If that is the largest `long`, stops 1 before it: an outer box may
/// have the same end, and a walk through that must not take it for reached. It goes on, and fails
/// as there is no data.
inline void leaveBox(QVStream& stream, long end) {
  stream.setOffset(std::min(end, std::numeric_limits<long>::max() - 1));
}

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_FORMATS_BOXWALK_H
