#ifndef QUAVEL_SRC_TIFF_READERDIRECTORY_H
#define QUAVEL_SRC_TIFF_READERDIRECTORY_H

#include <memory>

#include "quavel/QVTiffHeader.h"
#include "quavel/QVTiffImageFileDirectory.h"
#include "tiff/Entry.h"
#include "tiff/EntryTable.h"

namespace quavel::detail {

using DirectoryPointer = std::shared_ptr<QVTiffImageFileDirectory>;

/// A directory that a reader reads for itself: its steps look entries up in the table. Hosts never
/// see one; they get what `forHost` makes.
class ReaderDirectory final : public QVTiffImageFileDirectory {
 public:
  ReaderDirectory(DirectoryName const& name, std::int64_t position) : table(name, position) {
    ofReader = this;
  }
  ReaderDirectory(ReaderDirectory const&) = delete;
  ReaderDirectory& operator=(ReaderDirectory const&) = delete;

  /// The directory as a reader's own; null when it is a host's.
  static ReaderDirectory const* of(QVTiffImageFileDirectory const& directory) {
    return directory.ofReader;
  }

  /// The same directory with `entries`; this one loses its values.
  DirectoryPointer forHost();

  EntryTable table;
};

/// `QVTiffHeader::read`, with the name that notes use for the structure, such as "the Exif
/// segment"; null when it is the whole file.
bool readTiffHeader(QVStream& stream, unsigned short expectedMagic, char const* structure,
                    QVTiffHeader& header);

/// The entry kept for the tag, or none.
Entry findEntry(DirectoryPointer const& directory, unsigned short tag);

/// The journal of the read that a reader's directory belongs to; null for a host's.
inline Journal* journalOf(DirectoryPointer const& directory) {
  auto const* const own = ReaderDirectory::of(*directory);
  return own == nullptr ? nullptr : own->table.journal();
}

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_TIFF_READERDIRECTORY_H
