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

// Steps that the readers of several formats share. A step that fails has told the journal why.
// Steps take the stream by the same reference to a pointer as the public `read`; none replaces it.
namespace quavel::detail {

/// Finds the only value of a tag's entry. No entry: true, null `value`. Not exactly one: false.
bool findNumber(DirectoryPointer const& directory, unsigned short tag, ValuePointer& value);

/// Stores the entry's number. No entry: true, the field untouched. Not exactly one value: false.
bool storeOptionalNumber(DirectoryPointer const& directory, unsigned short tag,
                         std::int32_t& field);

/// The same for a number that must be present. No entry: false, and the refusal states the `rule`.
bool storeRequiredNumber(DirectoryPointer const& directory, unsigned short tag, char const* rule,
                         std::int32_t& field);

/// Stores the entry's text. No entry: true, the field untouched. An UNDEFINED entry, which has no
/// values: true, the text is empty. Before a NUL, a value not of type ASCII: false.
bool storeOptionalText(DirectoryPointer const& directory, unsigned short tag, std::string& field);

/// Reads the directory at `offset`, counted from the TIFF header's start; null on failure.
DirectoryPointer readDirectoryAt(std::shared_ptr<QVStream>& stream, PartName const& name,
                                 std::uint32_t offset, TagList tags);

/// Reads the TIFF header at the stream's position and the directory it refers to; null on failure.
/// `structure` is what notes call the TIFF structure; null if it is the whole file.
DirectoryPointer readFirstDirectory(std::shared_ptr<QVStream>& stream, TagList tags,
                                    char const* structure = nullptr);

/// Reads the directory whose offset is in the entry with the tag `pointer`. No entry: true,
/// `result` is null. Not exactly one value, or the directory cannot be read: false.
bool followPointer(std::shared_ptr<QVStream>& stream, DirectoryPointer const& directory,
                   unsigned short pointer, char const* name, TagList tags,
                   DirectoryPointer& result);

/// Follows ExifIFDPointer and gives the Exif directory to the record's `storeInfoFromExifIFD`.
/// No entry: true, `exifIFD` is null. The directory cannot be read or stored: false.
bool readAndStoreExifIFD(QVMetadata& record, std::shared_ptr<QVStream>& stream,
                         DirectoryPointer const& mainIFD, TagList tags, DirectoryPointer& exifIFD);

/// Reads the raw image's directory, the SubIFD with this index. Too few SubIFDs: true, `rawIFD` is
/// unchanged. The directory cannot be read: false.
bool readSubIFD(std::shared_ptr<QVStream>& stream, DirectoryPointer const& mainIFD,
                std::uint32_t index, TagList tags, DirectoryPointer& rawIFD);

/// Notes that the record's field for this tag stays absent: the tag has no entry.
void noteNoEntry(DirectoryPointer const& directory, unsigned short tag);

/// The same when the entry's value is useless. In `pattern`, the first "{}" becomes the entry's
/// name; a second, if any, its count and type.
void noteNoValue(DirectoryPointer const& directory, unsigned short tag, char const* pattern);

/// Refuses the tag's entry, which must exist: it does not hold what is `wanted`. Returns false.
bool refuseContent(DirectoryPointer const& directory, unsigned short tag, char const* wanted);

/// Whether NewSubfileType's bit 0 marks a reduced-resolution version of another image.
inline bool isReducedImage(std::uint32_t newSubfileType) { return (newSubfileType & 1U) != 0; }

/// Stores the image size from a directory that must describe a full-size image. False: width,
/// height or NewSubfileType is absent or not exactly one value, or the image is a reduced one.
bool storeFullImageSize(DirectoryPointer const& directory, std::int32_t& width,
                        std::int32_t& height);

/// A directory, for notes to name. A host's directory has no name; it has no journal either, so
/// notes never come to speak of it.
inline PlacedDirectory placed(DirectoryPointer const& directory) {
  static constexpr PartName kNoName = {};
  auto const* const ours = ReaderDirectory::of(*directory);
  return ours == nullptr ? PlacedDirectory{kNoName, -1} : ours->table.placed();
}

/// Where a directory begins in the file; -1 for one made by a host.
inline std::int64_t positionOf(DirectoryPointer const& directory) {
  auto const* const ours = ReaderDirectory::of(*directory);
  return ours == nullptr ? -1 : ours->table.position();
}

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_FORMATS_STEPS_H
