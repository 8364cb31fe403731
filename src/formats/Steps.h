#ifndef QUAVEL_SRC_FORMATS_STEPS_H
#define QUAVEL_SRC_FORMATS_STEPS_H

#include <cstdint>
#include <memory>
#include <string>

#include "journal/Journal.h"
#include "journal/Reading.h"
#include "quavel/QVMetadata.h"
#include "tiff/ReaderDirectory.h"
#include "tiff/WantedTags.h"

// Steps that the readers of several formats share. A step that fails has told the journal why. What
// an absent entry means differs between formats, so each reader decides that.
namespace quavel::detail {

/// Finds the only value of a tag's entry. Absent: true and null. Not exactly one value: false.
bool findNumber(DirectoryPointer const& directory, unsigned short tag, ValuePointer& value);

/// Stores the tag's number. Absent: true, the field untouched. Not exactly one value: false.
bool storeNumber(DirectoryPointer const& directory, unsigned short tag, std::int32_t& field);

/// The same for a number that must be present. Absent: false, and the note ends with `rule`.
bool storeRequiredNumber(DirectoryPointer const& directory, unsigned short tag, char const* rule,
                         std::int32_t& field);

/// Stores the tag's text. Absent: true, the field untouched. Not all ASCII: false.
bool storeText(DirectoryPointer const& directory, unsigned short tag, std::string& field);

/// Reads the directory at an offset from the TIFF header; null on failure.
DirectoryPointer readDirectoryAt(std::shared_ptr<QVStream>& stream, PartName const& name,
                                 std::uint32_t offset, TagList tags);

/// Reads the TIFF header at the stream's position and the directory it refers to; null on failure.
/// `structure` is what notes call the TIFF structure, or `kWholeFile`.
DirectoryPointer readFirstDirectory(std::shared_ptr<QVStream>& stream, char const* structure,
                                    TagList tags);

/// Reads the directory whose offset is in the entry with the tag `pointer`. Absent: true, `result`
/// is null. Not exactly one value, or the directory cannot be read: false.
bool followPointer(std::shared_ptr<QVStream>& stream, DirectoryPointer const& directory,
                   unsigned short pointer, char const* name, TagList tags,
                   DirectoryPointer& result);

/// Follows ExifIFDPointer and gives the Exif directory to the record's `storeInfoFromExifIFD`.
/// Absent: true, `exifIFD` is null. The directory cannot be read or stored: false.
bool readExifIFD(QVMetadata& record, std::shared_ptr<QVStream>& stream,
                 DirectoryPointer const& mainIFD, TagList tags, DirectoryPointer& exifIFD);

/// Reads the raw image's directory, the SubIFD with this index. Too few SubIFDs: true, `rawIFD` is
/// unchanged. The directory cannot be read: false.
bool readSubIFD(std::shared_ptr<QVStream>& stream, DirectoryPointer const& mainIFD,
                std::uint32_t index, TagList tags, DirectoryPointer& rawIFD);

/// Notes that the tag's field stays absent because there is no entry for it.
void noteNoEntry(DirectoryPointer const& directory, unsigned short tag);

/// Notes that the tag's field stays absent because the entry's value is no use, as `pattern` says.
void noteNoValue(DirectoryPointer const& directory, unsigned short tag, char const* pattern);

/// Refuses the tag's entry, which must exist: it does not hold what is `wanted`. Returns false.
bool refuseContent(DirectoryPointer const& directory, unsigned short tag, char const* wanted);

/// Whether NewSubfileType's bit 0 marks a reduced-resolution version of another image.
inline bool isReducedImage(std::uint32_t newSubfileType) { return (newSubfileType & 1U) != 0; }

/// Stores the image size from a directory that must describe a full-size image. False: a side or
/// NewSubfileType is absent or not exactly one value, or the image is a reduced one.
bool storeFullImageSize(DirectoryPointer const& directory, std::int32_t& width,
                        std::int32_t& height);

/// A directory as notes name it. For a host's there is no table, but no note either.
inline PlacedDirectory placed(DirectoryPointer const& directory) {
  auto const* const own = ReaderDirectory::of(*directory);
  return {own == nullptr ? nullptr : &own->table};
}

/// Where a directory begins in the file; -1 for a host's.
inline std::int64_t positionOf(DirectoryPointer const& directory) {
  auto const* const own = ReaderDirectory::of(*directory);
  return own == nullptr ? -1 : own->table.position();
}

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_FORMATS_STEPS_H
