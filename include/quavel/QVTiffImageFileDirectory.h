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

  /// Reads the directory at the stream's position, parsing only the listed tags, and only until
  /// each has been met once; an empty list wants every entry. Of a repeated tag the first entry
  /// counts. False: the entry count, a tag, a wanted entry or the next directory's offset cannot be
  /// read; only in the last case are the new `entries` kept. False too: the entries parsed hold
  /// more than 1048576 values, which the tags of no reader can.
  bool read(std::shared_ptr<QVStream>& stream, std::vector<unsigned short> const& tags);

  /// The entry kept for `tag`, or null.
  std::shared_ptr<QVTiffImageFileDirectoryEntry> entryForTag(unsigned short const& tag) const;

  std::uint32_t nextIFDOffset = 0;  ///< From the TIFF header; 0: this is the last directory.
  /// Null until a `read` has walked the entries; replaced by each that does.
  std::shared_ptr<std::map<std::uint16_t, std::shared_ptr<QVTiffImageFileDirectoryEntry>>> entries;

 private:
  friend class detail::ReaderDirectory;

  detail::ReaderDirectory const* ofReader = nullptr;  // this object, when it is one
};

}  // namespace quavel

#endif  // QUAVEL_QVTIFFIMAGEFILEDIRECTORY_H
