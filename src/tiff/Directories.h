#ifndef QUAVEL_SRC_TIFF_DIRECTORIES_H
#define QUAVEL_SRC_TIFF_DIRECTORIES_H

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>

#include "tiff/Entry.h"
#include "tiff/WantedTags.h"

namespace quavel {

class QVMetadata;
class QVStream;
class QVTiffImageFileDirectory;

namespace detail {

// The steps that all readers of directories share. What an absent entry means is the reader's.

using Directory = std::shared_ptr<QVTiffImageFileDirectory>;

/// The entry kept for the tag, or none.
Entry findEntry(Directory const& directory, unsigned short tag);

/// The entry's only value; null when it holds none or several.
ValuePointer singleValue(Entry const& entry);

/// Stores the tag's number. Absent: true, the field untouched. Not a single value: false.
bool storeNumber(Directory const& directory, unsigned short tag, std::int32_t& field);

/// The same for a number that must be there. Absent: false.
bool storeRequiredNumber(Directory const& directory, unsigned short tag, std::int32_t& field);

/// Stores the tag's text. Absent: true, the field untouched. Not all ASCII: false.
bool storeText(Directory const& directory, unsigned short tag, std::string& field);

/// Reads the directory at an offset from the TIFF header; null on failure.
Directory readDirectoryAt(std::shared_ptr<QVStream>& stream, std::uint32_t offset, Tags tags);

/// Reads the TIFF header at the stream's position and the directory it names; null on failure.
Directory readFirstDirectory(std::shared_ptr<QVStream>& stream, Tags tags);

/// Reads the directory that the entry under `pointer` leads to. Absent: true, `result` is null.
/// Not a single value, or the directory cannot be read: false.
bool followPointer(std::shared_ptr<QVStream>& stream, Directory const& directory,
                   unsigned short pointer, Tags tags, Directory& result);

/// The same under ExifIFDPointer, for the record's `storeInfoFromExifIFD`. A host's class may
/// override that, so the directory has `entries` unless the record is surely of the library's own.
bool followExifPointer(QVMetadata const& record, std::shared_ptr<QVStream>& stream,
                       Directory const& mainIFD, Tags tags, Directory& exifIFD);

/// Whether NewSubfileType's bit 0 marks a reduced-resolution version of another image.
bool isReducedImage(ValuePointer newSubfileType);

/// Stores the size of a directory that must describe a full-size image. False: a side or
/// NewSubfileType is absent or not a single value, or the image is a reduced one.
bool storeFullImageSize(Directory const& directory, std::int32_t& width, std::int32_t& height);

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_TIFF_DIRECTORIES_H
