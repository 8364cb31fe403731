#ifndef QUAVEL_SRC_TIFF_READERDIRECTORY_H
#define QUAVEL_SRC_TIFF_READERDIRECTORY_H

#include <memory>

#include "quavel/QVTiffHeader.h"
#include "quavel/QVTiffImageFileDirectory.h"
#include "tiff/EntryTable.h"
#include "tiff/EntryView.h"

namespace quavel::detail {

using DirectoryPointer = std::shared_ptr<QVTiffImageFileDirectory>;

/// A directory for the library's own readers, which find entries in its table instead of `entries`.
/// A host never sees one; it gets what `forHost` makes.
class ReaderDirectory final : public QVTiffImageFileDirectory {
 public:
  ReaderDirectory(PartName const& name, std::int64_t position) : table(name, position) {
    asReaderDirectory_ = this;  // a member of the base, null in any other directory
  }
  ReaderDirectory(ReaderDirectory const&) = delete;
  ReaderDirectory& operator=(ReaderDirectory const&) = delete;

  /// The directory itself if it is a ReaderDirectory, else null.
  static ReaderDirectory const* of(QVTiffImageFileDirectory const& directory) {
    return directory.asReaderDirectory_;
  }

  /// Moves the values into a new directory, whose `entries` a host can use.
  DirectoryPointer forHost();

  EntryTable table;
};

/// The body of `QVTiffHeader::read`. `structure` is what notes call the TIFF structure, such as
/// "the Exif segment"; null if it is the whole file.
bool readTiffHeader(QVStream& stream, unsigned short expectedMagic, QVTiffHeader& header,
                    char const* structure = nullptr);

/// The first entry with the tag; false as a bool when there is none.
EntryView findEntry(DirectoryPointer const& directory, unsigned short tag);

/// The journal of the read that filled the directory; null for a directory made by a host.
inline Journal* journalOf(DirectoryPointer const& directory) {
  auto const* const ours = ReaderDirectory::of(*directory);
  return ours == nullptr ? nullptr : ours->table.journal();
}

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_TIFF_READERDIRECTORY_H
