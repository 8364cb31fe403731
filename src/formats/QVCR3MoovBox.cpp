#include "quavel/QVCR3MoovBox.h"

#include "formats/BoxTypes.h"
#include "formats/BoxWalk.h"

namespace quavel {

using namespace detail;

bool QVCR3MoovBox::read(std::shared_ptr<QVStream>& stream) {
  auto const scope = ReadScope::beginOrJoin(*stream);
  long const start = stream->getOffset();
  if (!QVCR3Box::read(stream)) {
    return false;
  }
  enterBox(*stream, start);  // the base class has stepped over it
  PlacedBox const thisBox = {boxHeader->boxType, stream->baseOffset + start};
  if (thisBox.type != box::Moov) {
    return refuse(journalOf(*stream), QVReason::OtherKind, thisBox.position,
                  "the {} is not a moov box", thisBox);
  }
  long const end = endOfBox(start, *boxHeader);

  bool const isRead = readChildren(stream, start, end);
  leaveBox(*stream, end);  // even after a failure
  return isRead;
}

bool QVCR3MoovBox::readChildren(std::shared_ptr<QVStream>& stream, long start, long end) {
  BoxPlace const place = {/*words=*/" in the ", /*parent=*/{box::Moov, stream->baseOffset + start}};
  BoxWalk walk(stream, place);
  QVCR3BoxHeader child;
  for (long childStart = stream->getOffset(); childStart < end; childStart = stream->getOffset()) {
    if (!walk.stepOver(child)) {
      return false;
    }
    if (child.boxType != box::Uuid) {
      continue;
    }
    // Cameras write one uuid box. Of several, the last counts, whatever its identifier.
    stream->setOffset(childStart);
    uuidBox = std::make_shared<QVCR3UUIDBox>();
    if (!uuidBox->read(stream)) {
      return false;
    }
  }
  return true;
}

}  // namespace quavel
