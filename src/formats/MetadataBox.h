#ifndef QUAVEL_SRC_FORMATS_METADATABOX_H
#define QUAVEL_SRC_FORMATS_METADATABOX_H

#include <cstdint>
#include <memory>

#include "formats/BoxTypes.h"
#include "formats/BoxWalk.h"
#include "quavel/QVCR3Box.h"
#include "quavel/QVCR3BoxHeader.h"
#include "quavel/QVStream.h"

namespace quavel::detail {

/// Reads a metadata box of the given type. Its `readExif` is called with the stream's position and
/// `baseOffset` at the payload's start. `baseOffset` and `byteOrder` are restored only on success.
template <class MetadataBox>
bool readMetadataBox(MetadataBox& metadataBox, std::uint32_t type,
                     std::shared_ptr<QVStream>& stream) {
  ReadScope const scope(*stream);
  long const start = stream->getOffset();
  if (!metadataBox.QVCR3Box::read(stream)) {
    return false;
  }
  QVCR3BoxHeader const& header = *metadataBox.boxHeader;
  std::int64_t const outerBase = stream->baseOffset;
  if (header.type() != type) {
    return refuse(journalOf(*stream), QVReason::OtherKind, outerBase + start,
                  "the {} is not a {} box", PlacedBox{header.type(), outerBase + start},
                  type == box::CMT1 ? "CMT1" : "CMT2");
  }

  ByteOrder const outerOrder = stream->byteOrder;
  stream->baseOffset = outerBase + start + box::kHeaderSize;
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
