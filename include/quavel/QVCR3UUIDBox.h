#ifndef QUAVEL_QVCR3UUIDBOX_H
#define QUAVEL_QVCR3UUIDBOX_H

#include <array>
#include <cstdint>

#include "quavel/QVCR3Box.h"
#include "quavel/QVCR3CMT1Box.h"
#include "quavel/QVCR3CMT2Box.h"
#include "quavel/export.h"

namespace quavel {

/// Identifier of the `uuid` box that holds the metadata: 85c0b687-820f-11e0-8111-f4ce462b6a48.
inline constexpr std::array<std::uint32_t, 4> metadataUUID = {0x85c0b687, 0x820f11e0, 0x8111f4ce,
                                                              0x462b6a48};

/// A `uuid` box. Of the one with the metadata, the `CMT1` and `CMT2` children are read.
class QUAVEL_EXPORT QVCR3UUIDBox : public QVCR3Box {
 public:
  /// Skips a box with another identifier and returns true. False: the box is of another type, its
  /// header or identifier cannot be read, or a child of the metadata box cannot be read.
  bool read(std::shared_ptr<QVStream>& stream) override;

  std::array<std::uint32_t, 4> userType = {};  ///< The identifier, as big-endian numbers.
  std::shared_ptr<QVCR3CMT1Box> cmt1Box;       ///< The last `CMT1` child read, or null.
  std::shared_ptr<QVCR3CMT2Box> cmt2Box;       ///< The last `CMT2` child read, or null.

 private:
  friend class QVCR3Image;

  QUAVEL_NO_EXPORT bool readChildren(std::shared_ptr<QVStream>& stream, long end);

  std::int64_t position_ = 0;  // where the box begins in the file
};

}  // namespace quavel

#endif  // QUAVEL_QVCR3UUIDBOX_H
