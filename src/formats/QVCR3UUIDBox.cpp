#include "quavel/QVCR3UUIDBox.h"

#include "formats/BoxTypes.h"
#include "formats/BoxWalk.h"

namespace quavel {

using namespace detail;

namespace {

/// Reads the child that begins at `start` and keeps it instead of an earlier one.
template <class MetadataBox>
bool readAndKeepChild(std::shared_ptr<QVStream>& stream, long start,
                      std::shared_ptr<MetadataBox>& kept) {
  stream->setOffset(start);
  kept = std::make_shared<MetadataBox>();
  return kept->read(stream);  // moves to the child's end
}

}  // namespace

bool QVCR3UUIDBox::read(std::shared_ptr<QVStream>& stream) {
  auto const scope = ReadScope::beginOrJoin(*stream);
  Journal* const journal = scope.reading().journal;
  long const start = stream->getOffset();
  if (!QVCR3Box::read(stream)) {  // reads the header, skips the payload
    return false;
  }
  PlacedBox const thisBox = {boxHeader->boxType, stream->baseOffset + start};
  position_ = thisBox.position;
  if (thisBox.type != box::Uuid) {
    return refuse(journal, QVReason::OtherKind, thisBox.position, "the {} is not a uuid box",
                  thisBox);
  }
  long const end = endOfBox(start, *boxHeader);

  enterBox(*stream, start);
  for (auto& word : userType) {
    if (!stream->readLong(&word)) {
      return refuseCut(journal, thisBox.position + box::kHeaderSize, sizeof(userType),
                       "the 16-byte identifier of the {}", thisBox);
    }
  }
  bool const isMetadata = userType == metadataUUID;
  noteStep(journal, thisBox.position, "{}: {}", thisBox,
           isMetadata ? "the metadata" : "another identifier");
  bool const isRead = !isMetadata || readChildren(stream, end);  // any other box is skipped
  leaveBox(*stream, end);
  return isRead;
}

bool QVCR3UUIDBox::readChildren(std::shared_ptr<QVStream>& stream, long end) {
  BoxPlace const place = {/*words=*/" in the metadata ", /*parent=*/{box::Uuid, position_}};
  BoxWalk walk(stream, place);
  QVCR3BoxHeader child;
  for (long childStart = stream->getOffset(); childStart < end; childStart = stream->getOffset()) {
    if (!walk.stepOver(child)) {
      return false;
    }
    std::uint32_t const type = child.boxType;
    if (type != box::CMT1 && type != box::CMT2) {
      continue;
    }
    bool const isRead = type == box::CMT1 ? readAndKeepChild(stream, childStart, cmt1Box)
                                          : readAndKeepChild(stream, childStart, cmt2Box);
    if (!isRead) {
      return false;
    }
    if (cmt1Box && cmt2Box) {
      return true;  // both are there: a later duplicate is not looked for
    }
  }
  return true;
}

}  // namespace quavel
