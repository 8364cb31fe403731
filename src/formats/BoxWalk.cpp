#include "formats/BoxWalk.h"

#include "formats/BoxTypes.h"
#include "quavel/QVCR3BoxHeader.h"
#include "quavel/QVStream.h"

namespace quavel::detail {

bool stepOverBox(std::shared_ptr<QVStream>& stream, QVCR3BoxHeader& header) {
  long const start = stream->getOffset();
  if (!header.read(stream)) {
    return false;
  }
  // A smaller one, 0 above all, would lead a walk back to where it has been. That leaves out the
  // standard's sizes 0 (to the end of the file) and 1 (64 bits), which precede no metadata.
  if (header.boxSize < box::kHeaderSize) {
    return false;
  }
  stream->setOffset(start + long{header.boxSize});
  return true;
}

}  // namespace quavel::detail
