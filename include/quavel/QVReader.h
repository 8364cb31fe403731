#ifndef QUAVEL_QVREADER_H
#define QUAVEL_QVREADER_H

#include <memory>
#include <string>

#include "quavel/QVMetadata.h"
#include "quavel/export.h"

namespace quavel {

/// Reads one image file into a record. All work is done in the constructor, which throws nothing
/// but std::bad_alloc; distinct readers may be built on distinct threads.
class QUAVEL_EXPORT QVReader {
 public:
  /// Reads the file at `path`; what follows the path's last ".", in any case, names the format.
  QVReader(std::string const& path);
  /// Reads `length` bytes at `buffer` as a file whose extension is `extension`, in lower case and
  /// without a ".". The bytes are neither copied nor kept.
  QVReader(unsigned char* buffer, unsigned long const& length, std::string const& extension);
  ~QVReader();

  /// What follows the path's last ".", in the case it is written in; empty without a ".".
  std::string getPathExtension(std::string const& path) const;

  /// A fresh record of the format that `extension` (lower case) names, or null for any other.
  std::shared_ptr<QVMetadata> createMetadata(std::string const& extension) const;

  /// The record; null when the extension names no format, or the data is not a whole file of it.
  std::shared_ptr<QVMetadata> metadata;
};

}  // namespace quavel

#endif  // QUAVEL_QVREADER_H
