#include "quavel/QVCR3Box.h"

#include "formats/BoxTypes.h"
#include "quavel/QVCR3BoxHeader.h"
#include "quavel/QVStream.h"

namespace quavel {

QVCR3Box::~QVCR3Box() = default;

bool QVCR3Box::read(std::shared_ptr<QVStream>& stream) {
  // A walk reads all its boxes with one object: the header is taken anew unless somebody kept it.
  if (boxHeader.use_count() == 1) {
    *boxHeader = QVCR3BoxHeader();
  } else {
    boxHeader = std::make_shared<QVCR3BoxHeader>();
  }
  long const start = stream->getOffset();
  if (!boxHeader->read(stream)) {
    return false;
  }
  // A smaller one, 0 above all, would lead a walk back to where it has been. That leaves out the
  // standard's sizes 0 (to the end of the file) and 1 (64 bits), which precede no metadata.
  if (boxHeader->size() < box::kHeaderSize) {
    return false;
  }
  stream->setOffset(start + long{boxHeader->size()});
  return true;
}

std::shared_ptr<QVCR3BoxHeader> QVCR3Box::header() const { return boxHeader; }

}  // namespace quavel
