#ifndef QUAVEL_QVCR3MOOVBOX_H
#define QUAVEL_QVCR3MOOVBOX_H

#include "quavel/QVCR3Box.h"
#include "quavel/QVCR3UUIDBox.h"
#include "quavel/export.h"

namespace quavel {

/// The `moov` box, of which the `uuid` children are read.
class QUAVEL_EXPORT QVCR3MoovBox : public QVCR3Box {
 public:
  /// False: the box is of another type, or its header or a child cannot be read.
  bool read(std::shared_ptr<QVStream>& stream) override;

  /// The last `uuid` child, whatever its identifier; or null.
  std::shared_ptr<QVCR3UUIDBox> uuidBox;

 private:
  QUAVEL_NO_EXPORT bool readChildren(std::shared_ptr<QVStream>& stream, long start, long end);
};

}  // namespace quavel

#endif  // QUAVEL_QVCR3MOOVBOX_H
