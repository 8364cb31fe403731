#ifndef QUAVEL_SRC_FRONT_FORMATS_H
#define QUAVEL_SRC_FRONT_FORMATS_H

#include <memory>
#include <string>
#include <string_view>

namespace quavel {

class QVMetadata;
class QVStream;

namespace detail {

class Journal;

/// A reader, by the fields of the record that it fills.
enum Family : unsigned { kTiff = 1, kNef = 2, kArw = 4, kJpeg = 8, kRaf = 16, kCr3 = 32 };

/// What an extension stands for.
struct Format {
  std::string_view extension;
  char const* kind;  ///< "JPEG"
  Family family;
  std::shared_ptr<QVMetadata> (*makeRecord)();
};

/// What follows the path's last ".", its case kept; empty when there is no ".".
std::string extensionOf(std::string const& path);

/// The format of an extension in lower case, or null.
Format const* formatOf(std::string_view extension);

/// Completes the notes of a read that has ended: what the content looks like when that does not fit
/// the format, and, of a record, why each absent field is absent. `record` is null after a failure.
void explain(Format const& format, QVStream& stream, QVMetadata const* record, Journal& journal);

/// The record of the file at a path, or null.
std::shared_ptr<QVMetadata> readPath(std::string const& path, Journal* journal);

/// The record of a file that is the whole of a stream, or null.
std::shared_ptr<QVMetadata> readStream(std::shared_ptr<QVStream> stream,
                                       std::string const& extension, Journal* journal);

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_FRONT_FORMATS_H
