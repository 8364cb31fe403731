#include "quavel/QVCR3UUIDBox.h"

#include "formats/BoxTypes.h"
#include "formats/BoxWalk.h"
#include "quavel/QVCR3BoxHeader.h"
#include "quavel/QVCR3CMT1Box.h"
#include "quavel/QVCR3CMT2Box.h"
#include "quavel/QVStream.h"

namespace quavel {

namespace {

// Cameras write one of each kind. Of a kind whose other never comes all are read, and all can lead
// to the same large directory.
constexpr int kMostDirectoryBoxes = 8;

template <class MetadataBox>
bool readKeptChild(std::shared_ptr<QVStream>& stream, long start,
                   std::shared_ptr<MetadataBox>& kept) {
  stream->setOffset(start);
  kept = std::make_shared<MetadataBox>();
  return kept->read(stream);
}

}  // namespace

bool QVCR3UUIDBox::read(std::shared_ptr<QVStream>& stream) {
  long const start = stream->getOffset();
  if (!QVCR3Box::read(stream)) {
    return false;
  }
  if (boxHeader->type() != box::Uuid) {
    return false;
  }
  long const end = start + long{boxHeader->size()};

  stream->setOffset(start + long{box::kHeaderSize});
  for (auto& word : userType) {
    if (!stream->readLong(&word)) {
      return false;
    }
  }
  bool const isRead = userType != metadataUUID || readChildren(stream, end);
  stream->setOffset(end);
  return isRead;
}

bool QVCR3UUIDBox::readChildren(std::shared_ptr<QVStream>& stream, long end) {
  QVCR3BoxHeader child;
  int siblings = 0;
  int directoryBoxes = 0;
  for (long childStart = stream->getOffset(); childStart < end; childStart = stream->getOffset()) {
    if (++siblings > box::kMostSiblings) {
      return false;
    }
    if (!detail::stepOverBox(stream, child)) {
      return false;
    }
    std::uint32_t const type = child.boxType;
    if (type != box::CMT1 && type != box::CMT2) {
      continue;
    }
    if (++directoryBoxes > kMostDirectoryBoxes) {
      return false;
    }
    bool const isRead = type == box::CMT1 ? readKeptChild(stream, childStart, cmt1Box)
                                          : readKeptChild(stream, childStart, cmt2Box);
    if (!isRead) {
      return false;
    }
    if (cmt1Box && cmt2Box) {
      return true;
    }
  }
  return true;
}

}  // namespace quavel
