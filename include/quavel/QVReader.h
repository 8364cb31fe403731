#ifndef QUAVEL_QVREADER_H
#define QUAVEL_QVREADER_H

#include <memory>
#include <string>

#include "quavel/QVMetadata.h"
#include "quavel/export.h"

namespace quavel {

/// Reads one image file into a record. The constructor does all the work and throws nothing but
/// std::bad_alloc. Several threads may construct readers at the same time.
class QUAVEL_EXPORT QVReader {
 public:
  /// Reads the file at `path`. The extension after its last "." may be in upper or lower case.
  QVReader(std::string const& path);
  /// Reads `length` bytes at `buffer` as a file whose extension is `extension`, in lower case and
  /// without a ".". The bytes are neither copied nor kept.
  QVReader(unsigned char* buffer, unsigned long const& length, std::string const& extension);
  ~QVReader();

  /// The text after the path's last ".", its case unchanged; empty when the path has no ".".
  std::string getPathExtension(std::string const& path) const;

  /// A new record, without content yet, for an extension in lower case; null for an unknown one.
  std::shared_ptr<QVMetadata> createMetadata(std::string const& extension) const;

  /// The record; null: the extension names no format, or the data cannot be read as that format.
  std::shared_ptr<QVMetadata> metadata;
};

}  // namespace quavel

#endif  // QUAVEL_QVREADER_H
