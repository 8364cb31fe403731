#ifndef QUAVEL_APPS_WHYDIRECTORY_H
#define QUAVEL_APPS_WHYDIRECTORY_H

#include <quavel/QVTiffImageFileDirectory.h>
#include <quavel/QVTiffImageFileDirectoryEntryValue.h>

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "WhyWalk.h"

namespace app::why {

/// A directory that a walk has come to.
struct WalkedDirectory {
  /// Where it is, for a reader: "IFD0 at 8".
  std::string text() const;

  std::string name;
  std::int64_t position = 0;  ///< In the file.
  std::shared_ptr<quavel::QVTiffImageFileDirectory> ifd;
};

using Tags = std::vector<unsigned short>;
using Directory = std::optional<WalkedDirectory>;
using Value = std::shared_ptr<quavel::QVTiffImageFileDirectoryEntryValue>;

/// "no 0x0112 Orientation in IFD0 at 8"
std::string missingText(WalkedDirectory const& directory, unsigned short tag);

// The steps that the readers of directories share. Each failure has stopped the walk with its
// reason. `field`: the record's field that stays absent when the entry is; empty: none.

/// Reads the TIFF header at the stream's position and the directory it names. `structure`: what
/// the header opens; empty for the file itself.
Directory walkFirstDirectory(Walk& walk, std::string const& structure, Tags const& tags);

/// Reads the directory at an offset from the TIFF header.
Directory walkDirectory(Walk& walk, std::string const& name, std::uint32_t offset,
                        Tags const& tags);

/// Reads the directory that an entry leads to. Absent: true, `result` empty.
bool walkPointer(Walk& walk, WalkedDirectory const& directory, unsigned short pointer,
                 std::string const& name, Tags const& tags, Directory& result);

/// The tag's only value. Absent: true, `result` null.
bool walkValue(Walk& walk, WalkedDirectory const& directory, unsigned short tag,
               std::string const& field, Value& result);

/// The same for one that the record shows as a 32-bit number.
bool walkNumber(Walk& walk, WalkedDirectory const& directory, unsigned short tag,
                std::string const& field);

/// The same for one that must be there, because of `purpose`.
bool walkRequiredNumber(Walk& walk, WalkedDirectory const& directory, unsigned short tag,
                        std::string const& purpose, std::uint32_t& result);

/// The tag's text. Absent: true.
bool walkText(Walk& walk, WalkedDirectory const& directory, unsigned short tag,
              std::string const& field);

/// Exif's original date, and the digitized one for a reader that wants it.
bool walkDates(Walk& walk, WalkedDirectory const& exifIFD, bool wantsDigitized);

/// The directory of a raw image that must be of full size.
bool walkFullImageSize(Walk& walk, WalkedDirectory const& directory);

}  // namespace app::why

#endif  // QUAVEL_APPS_WHYDIRECTORY_H
