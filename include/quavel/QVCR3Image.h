#ifndef QUAVEL_QVCR3IMAGE_H
#define QUAVEL_QVCR3IMAGE_H

#include "quavel/QVCR3MoovBox.h"
#include "quavel/QVMetadata.h"
#include "quavel/export.h"

namespace quavel {

/// Reads a CR3 file, an ISO base media file. Gives the size, the orientation, the file's date, the
/// camera, the lens and the exposure.
class QUAVEL_EXPORT QVCR3Image : public QVMetadata {
 public:
  /// Always sets `isRaw`; sets the other fields only when the whole read succeeds.
  bool read(std::shared_ptr<QVStream>& stream) override;

 private:
  QUAVEL_NO_EXPORT bool storeInfoFromMoov(QVStream const& stream, QVCR3MoovBox const& moovBox,
                                          std::int64_t position);
  QUAVEL_NO_EXPORT void storeInfoFromCMT1(QVCR3CMT1Box& cmt1);
  QUAVEL_NO_EXPORT void storeInfoFromCMT2(QVCR3CMT2Box& cmt2);
};

}  // namespace quavel

#endif  // QUAVEL_QVCR3IMAGE_H
