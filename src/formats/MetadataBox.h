#ifndef QUAVEL_SRC_FORMATS_METADATABOX_H
#define QUAVEL_SRC_FORMATS_METADATABOX_H

#include <cstdint>
#include <memory>

#include "formats/BoxTypes.h"
#include "formats/BoxWalk.h"
#include "quavel/QVCR3Box.h"

namespace quavel::detail {

/// Reads a box whose type must be `type`, CMT1 or CMT2. Calls `readExif` with `baseOffset` at the
/// payload's start and the stream at offset 0. After a failure, the stream's state is unspecified.
template <class MetadataBox>
bool readMetadataBox(MetadataBox& metadataBox, std::uint32_t type,
                     std::shared_ptr<QVStream>& stream) {
  auto const scope = ReadScope::beginOrJoin(*stream);
  long const start = stream->getOffset();
  if (!metadataBox.QVCR3Box::read(stream)) {  // reads the header, skips the payload
    return false;
  }
  QVCR3BoxHeader const& header = *metadataBox.boxHeader;
  std::int64_t const outerBase = stream->baseOffset;
  PlacedBox const found = {header.boxType, outerBase + start};
  if (found.type != type) {
    return refuse(journalOf(*stream), QVReason::OtherKind, found.position, "the {} is not a {} box",
                  found, type == box::CMT1 ? "CMT1" : "CMT2");
  }

  ByteOrder const outerOrder = stream->byteOrder;
  stream->baseOffset = found.position + box::kHeaderSize;
  stream->setOffset(0);
  if (!metadataBox.readExif(stream)) {
    return false;
  }

  stream->baseOffset = outerBase;
  leaveBox(*stream, endOfBox(start, header));
  stream->byteOrder = outerOrder;
  return true;
}

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_FORMATS_METADATABOX_H
