#ifndef QUAVEL_QVCR3BOX_H
#define QUAVEL_QVCR3BOX_H

#include <memory>

#include "quavel/QVCR3BoxHeader.h"
#include "quavel/QVStream.h"
#include "quavel/export.h"

namespace quavel {

/// A box of an ISO base media file, skipped whole; the base of the boxes that are read.
class QUAVEL_EXPORT QVCR3Box {
 public:
  virtual ~QVCR3Box();

  /// Reads the box whose header is at the stream's position, which must have big-endian
  /// `byteOrder`. True: the stream stands after the box, even where that is past the end. False:
  /// the header cannot be read, or its size is smaller than the header.
  virtual bool read(std::shared_ptr<QVStream>& stream);

  /// The header read last; null before a `read`.
  std::shared_ptr<QVCR3BoxHeader> header() const;

  std::shared_ptr<QVCR3BoxHeader> boxHeader;  ///< Of the last `read`.
};

}  // namespace quavel

#endif  // QUAVEL_QVCR3BOX_H
