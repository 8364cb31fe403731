#include "quavel/QVCR3BoxHeader.h"

#include "quavel/QVStream.h"

namespace quavel {

bool QVCR3BoxHeader::read(std::shared_ptr<QVStream>& stream) {
  return stream->readLong(&boxSize) && stream->readLong(&boxType);
}

unsigned int QVCR3BoxHeader::size() const { return boxSize; }

unsigned int QVCR3BoxHeader::type() const { return boxType; }

}  // namespace quavel
