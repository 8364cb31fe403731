#include "quavel/QVCR3MoovBox.h"

#include "formats/BoxTypes.h"
#include "formats/BoxWalk.h"
#include "quavel/QVCR3BoxHeader.h"
#include "quavel/QVCR3UUIDBox.h"
#include "quavel/QVStream.h"

namespace quavel {

namespace {

// Cameras write one. Each can hold many directories, and all can share the same large one.
constexpr int kMostMetadataBoxes = 8;

}  // namespace

bool QVCR3MoovBox::read(std::shared_ptr<QVStream>& stream) {
  long const start = stream->getOffset();
  if (!QVCR3Box::read(stream)) {
    return false;
  }
  stream->setOffset(start + long{box::kHeaderSize});
  if (boxHeader->type() != box::Moov) {
    return false;
  }
  long const end = start + long{boxHeader->size()};

  bool const isRead = readChildren(stream, end);
  stream->setOffset(end);
  return isRead;
}

bool QVCR3MoovBox::readChildren(std::shared_ptr<QVStream>& stream, long end) {
  QVCR3BoxHeader child;
  int siblings = 0;
  int metadataBoxes = 0;
  for (long childStart = stream->getOffset(); childStart < end; childStart = stream->getOffset()) {
    if (++siblings > box::kMostSiblings) {
      return false;
    }
    if (!detail::stepOverBox(stream, child)) {
      return false;
    }
    if (child.boxType != box::Uuid) {
      continue;
    }
    stream->setOffset(childStart);
    uuidBox = std::make_shared<QVCR3UUIDBox>();
    if (!uuidBox->read(stream)) {
      return false;
    }
    if (uuidBox->userType == metadataUUID && ++metadataBoxes > kMostMetadataBoxes) {
      return false;
    }
  }
  return true;
}

}  // namespace quavel
