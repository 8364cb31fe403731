#include "formats/BoxWalk.h"

#include "formats/BoxTypes.h"
#include "quavel/QVCR3BoxHeader.h"
#include "quavel/QVStream.h"

namespace quavel::detail {

namespace {

/// For a size smaller than a box header: what the standard means by it, if anything.
char const* meaningOf(std::uint32_t size) {
  if (size == 0) {
    return " (0 stands for \"to the end of the file\", which is not read)";
  }
  return size == 1 ? " (1 stands for a 64-bit size, which is not read)" : "";
}

}  // namespace

bool BoxWalk::stepOver(QVCR3BoxHeader& header) {
  QVStream& stream = *stream_;
  Journal* const journal = journalOf(stream);
  long const start = stream.getOffset();
  std::int64_t const position = wrappingSum(stream.baseOffset, start);
  if (!readingOf(stream).spend(Work::SegmentsAndBoxes, 1)) {
    return false;
  }
  bool const mayReadHere = start <= kLastOffset;  // always, where `long` has 64 bits
  if (!mayReadHere || !header.read(stream_)) {
    // The header should be where the previous box ends. The stream may stand before that:
    // `leaveBox` stops before the largest `long`, and a memory stream at its end.
    std::int64_t const nextBox = std::max(std::int64_t{start}, previousEnd_);
    return refuseCut(journal, wrappingSum(stream.baseOffset, nextBox), box::kHeaderSize,
                     "the header of the next box{}", place_);
  }
  // A size below the header's would lead the walk back to this box, or into its header. The
  // standard gives 0 and 1 a meaning; they are refused too, as cameras write no such box before the
  // metadata.
  if (header.boxSize < box::kHeaderSize) {
    return refuse(journal, QVReason::MalformedBox, position,
                  "the {}{} has size {}; at least its header's 8 bytes are wanted{}",
                  PlacedBox{header.boxType, position}, place_, header.boxSize,
                  meaningOf(header.boxSize));
  }
  previousEnd_ = wrappingSum(start, header.boxSize);
  leaveBox(stream, endOfBox(start, header));
  return true;
}

long endOfBox(long start, QVCR3BoxHeader const& header) {
  constexpr std::int64_t kMax = std::numeric_limits<long>::max();
  std::int64_t const end = wrappingSum(start, header.boxSize);
  return static_cast<long>(end < start ? kMax : std::min(end, kMax));  // below: it wrapped around
}

void append(std::string& out, PlacedBox box) {
  std::uint8_t const name[] = {
      static_cast<std::uint8_t>(box.type >> 24U), static_cast<std::uint8_t>(box.type >> 16U),
      static_cast<std::uint8_t>(box.type >> 8U), static_cast<std::uint8_t>(box.type)};
  append(out, QuotedBytes{name, sizeof(name)});
  out += " box at ";
  append(out, Offset{box.position});
}

void append(std::string& out, BoxPlace place) {
  out += place.words;
  if (place.parent.type != 0) {
    append(out, place.parent);
  }
}

}  // namespace quavel::detail
