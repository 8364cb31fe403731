#ifndef QUAVEL_SRC_FRONT_RECORDORIGIN_H
#define QUAVEL_SRC_FRONT_RECORDORIGIN_H

#include "quavel/QVMetadata.h"

namespace quavel::detail {

/// Tells a record that a `QVReader` has made and is reading, from one that a host reads by itself,
/// whose class the host may have written.
struct RecordOrigin {
  static void setReadersOwn(QVMetadata& record, bool isOwn) { record.isReadersOwn = isOwn; }
  static bool isReadersOwn(QVMetadata const& record) { return record.isReadersOwn; }
};

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_FRONT_RECORDORIGIN_H
