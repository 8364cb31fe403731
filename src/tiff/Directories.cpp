#include "tiff/Directories.h"

#include "front/RecordOrigin.h"
#include "quavel/QVStream.h"
#include "quavel/QVTiffHeader.h"
#include "quavel/QVTiffImageFileDirectory.h"
#include "quavel/QVTiffImageFileDirectoryEntry.h"
#include "tiff/BareDirectory.h"
#include "tiff/Tags.h"

namespace quavel::detail {

namespace {

constexpr unsigned short kTiffMagic = 42;

/// As `readDirectoryAt`, but with `entries`.
Directory readForHostAt(std::shared_ptr<QVStream>& stream, std::uint32_t offset, Tags tags) {
  stream->setOffset(offset);
  auto directory = std::make_shared<QVTiffImageFileDirectory>();
  return directory->read(stream, tags) ? directory : nullptr;
}

/// As `followPointer`, with a choice of how the directory is read.
bool follow(decltype(readDirectoryAt)* readAt, std::shared_ptr<QVStream>& stream,
            Directory const& directory, unsigned short pointer, Tags tags, Directory& result) {
  result = nullptr;
  auto const entry = findEntry(directory, pointer);
  if (!entry) {
    return true;
  }
  auto const* const offset = singleValue(entry);
  if (!offset) {
    return false;
  }
  result = readAt(stream, offset->longValue(), tags);
  return result != nullptr;
}

bool storeNumberOf(Entry const& entry, std::int32_t& field) {
  auto const* const value = singleValue(entry);
  if (!value) {
    return false;
  }
  field = static_cast<std::int32_t>(value->longValue());
  return true;
}

}  // namespace

Entry findEntry(Directory const& directory, unsigned short tag) {
  if (auto const* const bare = BareDirectory::of(*directory)) {
    return bare->find(tag);
  }
  if (!directory->entries) {
    return {};
  }
  auto const found = directory->entries->find(tag);
  bool const isThere = found != directory->entries->end() && found->second;
  return isThere ? Entry(*found->second) : Entry();
}

ValuePointer singleValue(Entry const& entry) { return entry.size() == 1 ? entry[0] : nullptr; }

bool storeNumber(Directory const& directory, unsigned short tag, std::int32_t& field) {
  auto const entry = findEntry(directory, tag);
  return !entry || storeNumberOf(entry, field);
}

bool storeRequiredNumber(Directory const& directory, unsigned short tag, std::int32_t& field) {
  auto const entry = findEntry(directory, tag);
  return entry && storeNumberOf(entry, field);
}

bool storeText(Directory const& directory, unsigned short tag, std::string& field) {
  auto const entry = findEntry(directory, tag);
  return !entry || entry.convertToString(field);
}

Directory readDirectoryAt(std::shared_ptr<QVStream>& stream, std::uint32_t offset, Tags tags) {
  stream->setOffset(offset);
  auto directory = std::make_shared<BareDirectory>();
  return directory->read(*stream, tags) ? directory : nullptr;
}

Directory readFirstDirectory(std::shared_ptr<QVStream>& stream, Tags tags) {
  QVTiffHeader header;
  if (!header.read(stream, kTiffMagic)) {
    return nullptr;
  }
  return readDirectoryAt(stream, header.firstIFDOffset, tags);
}

bool followPointer(std::shared_ptr<QVStream>& stream, Directory const& directory,
                   unsigned short pointer, Tags tags, Directory& result) {
  return follow(readDirectoryAt, stream, directory, pointer, tags, result);
}

bool followExifPointer(QVMetadata const& record, std::shared_ptr<QVStream>& stream,
                       Directory const& mainIFD, Tags tags, Directory& exifIFD) {
  bool const isOwn = RecordOrigin::isReadersOwn(record);
  return follow(isOwn ? readDirectoryAt : readForHostAt, stream, mainIFD, tag::ExifIFDPointer, tags,
                exifIFD);
}

bool isReducedImage(ValuePointer newSubfileType) { return (newSubfileType->longValue() & 1U) != 0; }

bool storeFullImageSize(Directory const& directory, std::int32_t& width, std::int32_t& height) {
  auto const entry = findEntry(directory, tag::NewSubfileType);
  auto const* const newSubfileType = singleValue(entry);
  if (!newSubfileType || isReducedImage(newSubfileType)) {
    return false;
  }
  return storeRequiredNumber(directory, tag::ImageWidth, width) &&
         storeRequiredNumber(directory, tag::ImageLength, height);
}

}  // namespace quavel::detail
