#ifndef QUAVEL_SRC_FORMATS_STEPS_H
#define QUAVEL_SRC_FORMATS_STEPS_H

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>

#include "journal/Journal.h"
#include "journal/Reading.h"
#include "quavel/QVMetadata.h"
#include "tiff/ReaderDirectory.h"
#include "tiff/WantedTags.h"

// The steps that the readers of several formats share. Each that can fail states why. What an
// absent entry means is decided in the readers, where the formats differ.
namespace quavel::detail {

/// Finds the tag's only value. Absent: true and null. None or several: false.
bool findNumber(Directory const& directory, unsigned short tag, ValuePointer& value);

/// Stores the tag's number. Absent: true, the field untouched. Not a single value: false.
bool storeNumber(Directory const& directory, unsigned short tag, std::int32_t& field);

/// The same for a number that must be there, which `rule` says. Absent: false.
bool storeRequiredNumber(Directory const& directory, unsigned short tag, char const* rule,
                         std::int32_t& field);

/// Stores the tag's text. Absent: true, the field untouched. Not all ASCII: false.
bool storeText(Directory const& directory, unsigned short tag, std::string& field);

/// Reads the directory at an offset from the TIFF header; null on failure.
Directory readDirectoryAt(std::shared_ptr<QVStream>& stream, DirectoryName const& name,
                          std::uint32_t offset, Tags tags);

/// Reads the TIFF header at the stream's position and the directory it names; null on failure.
/// `structure` is what notes call it all; null for a whole file.
Directory readFirstDirectory(std::shared_ptr<QVStream>& stream, char const* structure, Tags tags);

/// Reads the directory that the entry under `pointer` leads to. Absent: true, `result` is null.
/// Not a single value, or the directory cannot be read: false.
bool followPointer(std::shared_ptr<QVStream>& stream, Directory const& directory,
                   unsigned short pointer, char const* name, Tags tags, Directory& result);

/// Follows ExifIFDPointer and gives the Exif directory to the record's `storeInfoFromExifIFD`.
/// Absent: true, `exifIFD` is null. The directory cannot be read or stored: false.
bool readExifIFD(QVMetadata& record, std::shared_ptr<QVStream>& stream, Directory const& mainIFD,
                 Tags tags, Directory& exifIFD);

/// Reads the raw image's directory, the SubIFD of this index. `mainIFD` does not name as many:
/// true, `rawIFD` is null. The directory cannot be read: false.
bool readSubIFD(std::shared_ptr<QVStream>& stream, Directory const& mainIFD, std::uint32_t index,
                Tags tags, Directory& rawIFD);

/// Notes that the field under the tag stays absent, because its entry does.
void noteNoEntry(Directory const& directory, unsigned short tag);

/// The same because its entry, which the pattern names, amounts to no value.
void noteNoValue(Directory const& directory, unsigned short tag, char const* pattern);

/// Refuses a directory's entry, which must be there, for what it holds. False.
bool refuseContent(Directory const& directory, unsigned short tag, char const* wanted);

/// Whether NewSubfileType's bit 0 marks a reduced-resolution version of another image.
bool isReducedImage(ValuePointer newSubfileType);

/// Stores the size of a directory that must describe a full-size image. False: a side or
/// NewSubfileType is absent or not a single value, or the image is a reduced one.
bool storeFullImageSize(Directory const& directory, std::int32_t& width, std::int32_t& height);

/// A reader's own directory, for notes; a host's, of which there are none, has no name.
inline PlacedDirectory placed(Directory const& directory) {
  auto const* const own = ReaderDirectory::of(*directory);
  return {own == nullptr ? nullptr : &own->table};
}

/// Where a directory begins in the file; -1 for a host's.
inline std::int64_t positionOf(Directory const& directory) {
  auto const* const own = ReaderDirectory::of(*directory);
  return own == nullptr ? -1 : own->table.position();
}

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_FORMATS_STEPS_H
