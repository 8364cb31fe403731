#include "quavel/QVCR3BoxHeader.h"

#include <array>

#include "formats/BoxTypes.h"
#include "stream/Bytes.h"

namespace quavel {

bool QVCR3BoxHeader::read(std::shared_ptr<QVStream>& stream) {
  // One read for both numbers is faster than two, and walks do little but read headers.
  std::array<std::uint8_t, box::kHeaderSize> bytes;
  std::size_t const received = detail::readUpTo(*stream, bytes.data(), bytes.size());
  bool const isReversed = detail::needsReversal(*stream);
  if (received >= sizeof(boxSize)) {  // set even if the type is cut off, as QVCR3BoxHeader.h says
    boxSize = detail::numberAt<std::uint32_t>(bytes.data(), isReversed);
  }
  if (received < bytes.size()) {
    return false;
  }
  boxType = detail::numberAt<std::uint32_t>(bytes.data() + sizeof(boxSize), isReversed);
  return true;
}

unsigned int QVCR3BoxHeader::size() const { return boxSize; }

unsigned int QVCR3BoxHeader::type() const { return boxType; }

}  // namespace quavel
