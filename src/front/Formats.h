#ifndef QUAVEL_SRC_FRONT_FORMATS_H
#define QUAVEL_SRC_FRONT_FORMATS_H

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

namespace quavel {

class QVMetadata;
class QVStream;

namespace detail {

class Journal;

/// Families of formats that are read alike. Each is one bit, so that a number can hold a set.
enum Family : unsigned { kTiff = 1, kNef = 2, kArw = 4, kJpeg = 8, kRaf = 16, kCr3 = 32 };

struct Format {
  std::string_view extension;
  char const* name;  ///< Such as "JPEG".
  Family family;
  std::shared_ptr<QVMetadata> (*makeRecord)();
};

/// The text after the path's last ".", its case unchanged; empty when the path has no ".".
std::string extensionOf(std::string const& path);

/// The format of an extension in lower case, or null.
Format const* formatOf(std::string_view extension);

/// Adds a note for each field that the record lacks: why it is absent.
void noteAbsences(Format const& format, QVMetadata const& record, Journal& journal);

/// If the refused file, which begins at `start`, looks like another format: notes which one, and
/// replaces the refusal's reason by `OtherKind`. The reason `ReadError` stays, and so does
/// that of a limit.
void noteOtherContent(Format const& format, QVStream& stream, std::int64_t start, Journal& journal);

/// The record of the file at a path, or null. The journal may be null, here and below.
std::shared_ptr<QVMetadata> readPath(std::string const& path, Journal* journal = nullptr);

/// The record of the file that the stream holds, or null. The extension must be in lower case.
std::shared_ptr<QVMetadata> readStream(std::shared_ptr<QVStream> stream,
                                       std::string const& extension, Journal* journal = nullptr);

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_FRONT_FORMATS_H
