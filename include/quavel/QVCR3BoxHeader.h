#ifndef QUAVEL_QVCR3BOXHEADER_H
#define QUAVEL_QVCR3BOXHEADER_H

#include <cstdint>
#include <memory>

#include "quavel/QVStream.h"
#include "quavel/export.h"

namespace quavel {

/// The compact header of an ISO base media file's box (ISO/IEC 14496-12).
class QUAVEL_EXPORT QVCR3BoxHeader {
 public:
  /// Reads the 8 bytes at the stream's position in its `byteOrder`, which must be big-endian.
  /// False: the data ends within them; `boxSize` may already have changed.
  bool read(std::shared_ptr<QVStream>& stream);

  unsigned int size() const;  ///< `boxSize`
  unsigned int type() const;  ///< `boxType`

  std::uint32_t boxSize = 0;  ///< Bytes, including this header.
  std::uint32_t boxType = 0;  ///< The four characters as one big-endian number.
};

}  // namespace quavel

#endif  // QUAVEL_QVCR3BOXHEADER_H
