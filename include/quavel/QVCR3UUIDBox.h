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

/// A `uuid` box; the one with the metadata is walked for its `CMT1` and `CMT2` children.
class QUAVEL_EXPORT QVCR3UUIDBox : public QVCR3Box {
 public:
  /// A box of another identifier is skipped, which counts as success. False: another type of box,
  /// or, in the metadata box, a child that cannot be read.
  bool read(std::shared_ptr<QVStream>& stream) override;

  std::array<std::uint32_t, 4> userType = {};  ///< The identifier, as big-endian words.
  std::shared_ptr<QVCR3CMT1Box> cmt1Box;       ///< The last one read; or null.
  std::shared_ptr<QVCR3CMT2Box> cmt2Box;       ///< The last one read; or null.

 private:
  friend class QVCR3Image;

  QUAVEL_NO_EXPORT bool readChildren(std::shared_ptr<QVStream>& stream, long end);

  std::int64_t position_ = 0;  // of the box read last, in the file
};

}  // namespace quavel

#endif  // QUAVEL_QVCR3UUIDBOX_H
