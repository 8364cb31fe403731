#ifndef QUAVEL_APPS_WHYWALK_H
#define QUAVEL_APPS_WHYWALK_H

#include <quavel/QVStream.h>

#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "Trace.h"

namespace app::why {

/// An offset in a file, as text: "0x1f2 (498)".
std::string offsetText(std::int64_t offset);

/// Bytes as text: "ff d8 ff e0".
std::string hexText(std::vector<std::uint8_t> const& bytes);

/// A walk over one file by the steps of its format's reader, and what it has found.
class Walk {
 public:
  Walk(std::string const& path, std::int64_t fileByteCount);

  /// Ends the walk; the first reason given stays. False, for the step to return on the spot.
  bool stop(std::string const& why);
  /// Gives the walk up at a limit of the library's.
  bool exceed(std::string const& what);
  /// Tells of a step that went well. Beyond a screenful they are only counted.
  void passed(std::string const& step);
  /// Tells why a field of the record stays absent, if it does; the last reason given stays.
  void absent(std::string const& field, std::string const& why);

  /// The stream's position in the file.
  std::int64_t position() const;
  /// Where an offset that counts from the stream's `baseOffset` is in the file.
  std::int64_t inFile(std::int64_t offset) const;
  /// The bytes at a position in the file, as many as there are. The stream stays where it is.
  std::vector<std::uint8_t> peek(std::int64_t at, std::size_t count) const;
  /// Tells what the stream's last short read wanted of the thing named.
  std::string cut(std::string const& what) const;
  /// "the file ends at 0x80 (128)"
  std::string fileEnd() const;

  bool isOpen() const { return trace->isOpen(); }
  /// The limit on the work for one file for which the walk was given up, which then has proved
  /// nothing: "it has more than 64 Exif segments"; else empty.
  std::string limit() const;

  std::int64_t fileSize;
  std::string exceeded;  ///< See `limit`.
  std::string reason;    ///< Why the walk stopped; empty: it went through.
  std::vector<std::string> steps;
  std::uint64_t furtherSteps = 0;  ///< Those that `steps` leaves out.
  std::vector<std::string> notes;  ///< What else may help.
  std::map<std::string, std::string> absences;
  std::shared_ptr<Trace> trace;
  std::shared_ptr<quavel::QVStream> stream;  ///< The trace, in the form that the library takes.
};

}  // namespace app::why

#endif  // QUAVEL_APPS_WHYWALK_H
