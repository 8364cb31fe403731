#include "formats/BoxWalk.h"

#include "formats/BoxTypes.h"
#include "quavel/QVCR3BoxHeader.h"
#include "quavel/QVStream.h"

namespace quavel::detail {

bool stepOverBox(std::shared_ptr<QVStream>& stream, BoxPlace place, QVCR3BoxHeader& header) {
  Journal* const journal = journalOf(*stream);
  long const start = stream->getOffset();
  std::int64_t const position = stream->baseOffset + start;
  if (!readingOf(*stream).spend(Work::Steps, 1)) {
    return false;
  }
  if (start > kLastOffset || !header.read(stream)) {
    return refuseCut(journal, position, box::kHeaderSize, "the header of the next box{}", place);
  }
  // With a smaller size, the walk would stay where it is or read the header again as a box. The
  // standard gives 0 and 1 a meaning, but no metadata follows such a box.
  if (header.boxSize < box::kHeaderSize) {
    char const* const meaningOf1 =
        header.boxSize == 1 ? " (1 stands for a 64-bit size, which is not read)" : "";
    return refuse(journal, QVReason::MalformedBox, position,
                  "the {}{} has size {}; at least its header's 8 bytes are wanted{}",
                  PlacedBox{header.boxType, position}, place, header.boxSize,
                  header.boxSize == 0
                      ? " (0 stands for \"to the end of the file\", which is not read)"
                      : meaningOf1);
  }
  leaveBox(*stream, endOfBox(start, header));
  return true;
}

long endOfBox(long start, QVCR3BoxHeader const& header) {
  constexpr std::int64_t kMost = std::numeric_limits<long>::max();
  return static_cast<long>(std::min(std::int64_t{start} + header.boxSize, kMost));
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
  out += place.text;
  if (place.parent.type != 0) {
    append(out, place.parent);
  }
}

}  // namespace quavel::detail
