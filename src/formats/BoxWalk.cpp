#include "formats/BoxWalk.h"

#include "formats/BoxTypes.h"
#include "quavel/QVCR3BoxHeader.h"
#include "quavel/QVStream.h"
#include "stream/Bytes.h"

namespace quavel::detail {

bool stepOverBox(std::shared_ptr<QVStream>& stream, BoxPlace place, QVCR3BoxHeader& header) {
  Journal* const journal = journalOf(*stream);
  std::int64_t const start = stream->getOffset();
  std::int64_t const position = stream->baseOffset + start;
  static constexpr char kHeaderPattern[] = "the header of the next box{}";
  if (!readingOf(*stream).spend(Work::Steps, 1)) {
    return false;
  }
  if (!header.read(stream)) {
    return refuseCut(journal, position, box::kHeaderSize, kHeaderPattern, place);
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
  return seek(*stream, start + header.boxSize) ||
         refuseCut(journal, position + header.boxSize, box::kHeaderSize, kHeaderPattern, place);
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
