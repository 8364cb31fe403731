#ifndef QUAVEL_SRC_TIFF_DIRECTORIES_H
#define QUAVEL_SRC_TIFF_DIRECTORIES_H

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

namespace quavel {

class QVStream;
class QVTiffImageFileDirectory;
class QVTiffImageFileDirectoryEntry;
class QVTiffImageFileDirectoryEntryValue;

namespace detail {

// The steps that all readers of directories share. What an absent entry means is the reader's.

using Directory = std::shared_ptr<QVTiffImageFileDirectory>;
// Borrowed from a directory: looking at them costs no reference count.
using Entry = QVTiffImageFileDirectoryEntry const*;
using Value = QVTiffImageFileDirectoryEntryValue const*;

/// The entry kept for the tag, or null.
Entry findEntry(Directory const& directory, unsigned short tag);

/// How many values the entry holds; an UNDEFINED entry holds none.
std::size_t valueCount(Entry entry);

/// The entry's only value; null when it holds none or several.
Value singleValue(Entry entry);

/// Stores the tag's number. Absent: true, the field untouched. Not a single value: false.
bool storeNumber(Directory const& directory, unsigned short tag, std::int32_t& field);

/// The same for a number that must be there. Absent: false.
bool storeRequiredNumber(Directory const& directory, unsigned short tag, std::int32_t& field);

/// Stores the tag's text. Absent: true, the field untouched. Not all ASCII: false.
bool storeText(Directory const& directory, unsigned short tag, std::string& field);

/// Reads the directory at an offset from the TIFF header; null on failure.
Directory readDirectoryAt(std::shared_ptr<QVStream>& stream, std::uint32_t offset,
                          std::vector<unsigned short> const& tags);

/// Reads the TIFF header at the stream's position and the directory it names; null on failure.
Directory readFirstDirectory(std::shared_ptr<QVStream>& stream,
                             std::vector<unsigned short> const& tags);

/// Reads the directory that the entry under `pointer` leads to. Absent: true, `result` is null.
/// Not a single value, or the directory cannot be read: false.
bool followPointer(std::shared_ptr<QVStream>& stream, Directory const& directory,
                   unsigned short pointer, std::vector<unsigned short> const& tags,
                   Directory& result);

/// Whether NewSubfileType's bit 0 marks a reduced-resolution version of another image.
bool isReducedImage(Value newSubfileType);

/// Stores the size of a directory that must describe a full-size image. False: a side or
/// NewSubfileType is absent or not a single value, or the image is a reduced one.
bool storeFullImageSize(Directory const& directory, std::int32_t& width, std::int32_t& height);

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_TIFF_DIRECTORIES_H
