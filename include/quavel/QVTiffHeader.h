#ifndef QUAVEL_QVTIFFHEADER_H
#define QUAVEL_QVTIFFHEADER_H

#include <cstdint>
#include <memory>

#include "quavel/QVStream.h"
#include "quavel/export.h"

namespace quavel {

/// The first 8 bytes of a TIFF structure (TIFF 6.0), which state the byte order of all of it.
class QUAVEL_EXPORT QVTiffHeader {
 public:
  QVTiffHeader();

  /// Reads the header at the stream's position. True: the stream stands right after the header, and
  /// its `byteOrder` is set. False: the data ends too early, the header has no byte-order mark, or
  /// its magic is not `expectedMagic` (TIFF: 42); `byteOrder` may already have changed.
  bool read(std::shared_ptr<QVStream>& stream, unsigned short expectedMagic);

  std::uint32_t firstIFDOffset = 0;  ///< Counted from the header's first byte.
};

}  // namespace quavel

#endif  // QUAVEL_QVTIFFHEADER_H
