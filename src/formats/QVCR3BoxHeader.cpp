#include "quavel/QVCR3BoxHeader.h"

#include <array>

#include "formats/BoxTypes.h"
#include "quavel/QVStream.h"
#include "stream/Bytes.h"

namespace quavel {

bool QVCR3BoxHeader::read(std::shared_ptr<QVStream>& stream) {
  // Both at once: a walk reads many headers and little else.
  std::array<std::uint8_t, box::kHeaderSize> bytes;
  std::size_t const there = detail::readUpTo(*stream, bytes.data(), bytes.size());
  bool const isReversed = detail::isReversed(*stream);
  if (there >= sizeof(boxSize)) {
    boxSize = detail::numberAt<std::uint32_t>(bytes.data(), isReversed);
  }
  if (there < bytes.size()) {
    return false;
  }
  boxType = detail::numberAt<std::uint32_t>(bytes.data() + sizeof(boxSize), isReversed);
  return true;
}

unsigned int QVCR3BoxHeader::size() const { return boxSize; }

unsigned int QVCR3BoxHeader::type() const { return boxType; }

}  // namespace quavel
