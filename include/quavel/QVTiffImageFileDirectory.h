#ifndef QUAVEL_QVTIFFIMAGEFILEDIRECTORY_H
#define QUAVEL_QVTIFFIMAGEFILEDIRECTORY_H

#include <cstdint>
#include <map>
#include <memory>
#include <vector>

#include "quavel/QVStream.h"
#include "quavel/QVTiffImageFileDirectoryEntry.h"
#include "quavel/export.h"

namespace quavel {

namespace detail {
class ReaderDirectory;
}  // namespace detail

/// A TIFF image file directory (IFD): its wanted entries by tag.
class QUAVEL_EXPORT QVTiffImageFileDirectory {
 public:
  QVTiffImageFileDirectory();

  /// Reads the directory at the stream's position. Only the listed tags are wanted, and the search
  /// stops once each has been met; an empty list wants every entry. Of a repeated tag the first
  /// entry is kept. False: the entry count, a tag, a wanted entry or the next directory's offset
  /// cannot be read, or a limit is exceeded, such as 1048576 values in all. `entries` then stay as
  /// they were, unless all but the offset could be read; `nextIFDOffset` is unchanged.
  bool read(std::shared_ptr<QVStream>& stream, std::vector<unsigned short> const& tags);

  /// The entry kept for `tag`, or null.
  std::shared_ptr<QVTiffImageFileDirectoryEntry> entryForTag(unsigned short const& tag) const;

  std::uint32_t nextIFDOffset = 0;  ///< Counted from the TIFF header; 0: this is the last one.
  /// The entries kept, by tag; null before the first `read` that could read them.
  std::shared_ptr<std::map<std::uint16_t, std::shared_ptr<QVTiffImageFileDirectoryEntry>>> entries;

 private:
  friend class detail::ReaderDirectory;

  detail::ReaderDirectory const* asReaderDirectory_ = nullptr;  // `this`, if it is one
};

}  // namespace quavel

#endif  // QUAVEL_QVTIFFIMAGEFILEDIRECTORY_H
