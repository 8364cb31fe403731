#ifndef QUAVEL_SRC_TIFF_READERDIRECTORY_H
#define QUAVEL_SRC_TIFF_READERDIRECTORY_H

#include <memory>

#include "quavel/QVTiffHeader.h"
#include "quavel/QVTiffImageFileDirectory.h"
#include "tiff/Entry.h"
#include "tiff/EntryTable.h"

namespace quavel::detail {

using Directory = std::shared_ptr<QVTiffImageFileDirectory>;

/// A directory on its way through a reader's own steps, which look entries up in the table. Hosts
/// never get to see one: `forHost` makes theirs.
class ReaderDirectory final : public QVTiffImageFileDirectory {
 public:
  ReaderDirectory(DirectoryName const& name, std::int64_t position) : table(name, position) {
    ofReader = this;
  }
  ReaderDirectory(ReaderDirectory const&) = delete;
  ReaderDirectory& operator=(ReaderDirectory const&) = delete;

  /// The directory as what it is; null when it is a host's.
  static ReaderDirectory const* of(QVTiffImageFileDirectory const& directory) {
    return directory.ofReader;
  }

  /// The same directory with `entries`; this one loses its values.
  Directory forHost();

  EntryTable table;
};

/// `QVTiffHeader::read` for the header of a structure that notes call "the Exif segment", say; null
/// for that of a whole file.
bool readTiffHeader(QVStream& stream, unsigned short expectedMagic, char const* structure,
                    QVTiffHeader& header);

/// The entry kept for the tag, or none.
Entry findEntry(Directory const& directory, unsigned short tag);

/// The journal of the read that a reader's directory belongs to; null for a host's.
inline Journal* journalOf(Directory const& directory) {
  auto const* const own = ReaderDirectory::of(*directory);
  return own == nullptr ? nullptr : own->table.journal();
}

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_TIFF_READERDIRECTORY_H
