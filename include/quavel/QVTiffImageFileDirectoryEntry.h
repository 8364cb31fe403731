#ifndef QUAVEL_QVTIFFIMAGEFILEDIRECTORYENTRY_H
#define QUAVEL_QVTIFFIMAGEFILEDIRECTORYENTRY_H

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "quavel/QVStream.h"
#include "quavel/QVTiffImageFileDirectoryEntryValue.h"
#include "quavel/export.h"

namespace quavel {

/// One entry of a TIFF image file directory, without its tag, which the directory keeps.
class QUAVEL_EXPORT QVTiffImageFileDirectoryEntry {
 public:
  QVTiffImageFileDirectoryEntry();

  /// Reads the entry whose tag ends at the stream's position, and its values, in the entry or
  /// elsewhere. The stream is left where the last value ends. False: the data ends too early, the
  /// field type is unknown, or more than 65536 values are declared; `values` is then unchanged.
  bool read(std::shared_ptr<QVStream>& stream);

  /// Stores the ASCII values up to the first NUL, untrimmed; without values, the empty string.
  /// False: a value before that NUL is of another type; `out` holds the text before it.
  bool convertToString(std::string& out) const;

  /// All values in file order; null for an UNDEFINED entry and before a `read`.
  std::shared_ptr<std::vector<std::shared_ptr<QVTiffImageFileDirectoryEntryValue>>> values;
  /// The bytes of an UNDEFINED entry that has at most 4; else null.
  std::shared_ptr<std::vector<std::uint8_t>> bytes;
  /// Where the bytes of a longer UNDEFINED entry lie, counted from the TIFF header; else 0.
  std::uint32_t dataOffset = 0;
  std::uint32_t dataCount = 0;  ///< How many bytes a longer UNDEFINED entry has; else 0.
};

}  // namespace quavel

#endif  // QUAVEL_QVTIFFIMAGEFILEDIRECTORYENTRY_H
