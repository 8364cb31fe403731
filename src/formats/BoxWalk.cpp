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
  // A smaller size, such as 0, would lead the walk back to where it has been. The sizes 0 (to the
  // end of the file) and 1 (64 bits) of the standard are refused too: no metadata follows such a
  // box.
  if (header.boxSize < box::kHeaderSize) {
    return refuse(journal, QVReason::MalformedBox, position,
                  "the {}{} has size {}; at least its header's 8 bytes are wanted{}",
                  PlacedBox{header.boxType, position}, place, header.boxSize,
                  header.boxSize == 0
                      ? " (0 stands for \"to the end of the file\", which is not read)"
                  : header.boxSize == 1 ? " (1 stands for a 64-bit size, which is not read)"
                                        : "");
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
