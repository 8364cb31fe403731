#ifndef QUAVEL_QVCR3BOX_H
#define QUAVEL_QVCR3BOX_H

#include <memory>

#include "quavel/QVCR3BoxHeader.h"
#include "quavel/QVStream.h"
#include "quavel/export.h"

namespace quavel {

/// A box of an ISO base media file. This base class skips it; the derived ones read its content.
class QUAVEL_EXPORT QVCR3Box {
 public:
  virtual ~QVCR3Box();

  /// Reads the box whose header is at the stream's position. The stream's `byteOrder` must be
  /// big-endian. True: the stream stands after the box, even if the data ends before that. False:
  /// the header cannot be read, the size in it is below 8, or there are too many boxes.
  virtual bool read(std::shared_ptr<QVStream>& stream);

  /// `boxHeader`; null before a `read`.
  std::shared_ptr<QVCR3BoxHeader> header() const;

  std::shared_ptr<QVCR3BoxHeader> boxHeader;  ///< Of the last `read`.
};

}  // namespace quavel

#endif  // QUAVEL_QVCR3BOX_H
