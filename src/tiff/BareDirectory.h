#ifndef QUAVEL_SRC_TIFF_BAREDIRECTORY_H
#define QUAVEL_SRC_TIFF_BAREDIRECTORY_H

#include <vector>

#include "quavel/QVTiffImageFileDirectory.h"
#include "tiff/DirectoryWalk.h"
#include "tiff/Entry.h"

namespace quavel::detail {

/// A directory that a reader reads for itself alone. It has no `entries`, each part of which takes
/// an allocation or a count so that hosts can keep it, but the bare values in a row.
class BareDirectory final : public QVTiffImageFileDirectory, EntrySink, ValueSink {
 public:
  BareDirectory() { bare = this; }
  BareDirectory(BareDirectory const&) = delete;
  BareDirectory& operator=(BareDirectory const&) = delete;

  /// As that of the base, once; `entries` stays null.
  bool read(QVStream& stream, Tags tags);

  /// The directory as what it is; null when it has `entries`.
  static BareDirectory const* of(QVTiffImageFileDirectory const& directory) {
    return directory.bare;
  }

  Entry find(unsigned short tag) const;

 private:
  struct Row {
    unsigned short tag;
    std::size_t first;  // of its values
    std::size_t count;
  };

  bool addEntry(unsigned short tag, RawEntry const& entry, QVStream& stream) override;
  QVTiffImageFileDirectoryEntryValue* addValues(std::size_t count) override;

  std::vector<Row> rows_;
  std::vector<QVTiffImageFileDirectoryEntryValue> values_;
};

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_TIFF_BAREDIRECTORY_H
