#include "tiff/Directories.h"

#include "quavel/QVStream.h"
#include "quavel/QVTiffHeader.h"
#include "quavel/QVTiffImageFileDirectory.h"
#include "quavel/QVTiffImageFileDirectoryEntry.h"
#include "quavel/QVTiffImageFileDirectoryEntryValue.h"
#include "tiff/Tags.h"

namespace quavel::detail {

namespace {

constexpr unsigned short kTiffMagic = 42;

bool storeNumberOf(Entry entry, std::int32_t& field) {
  auto const* const value = singleValue(entry);
  if (!value) {
    return false;
  }
  field = static_cast<std::int32_t>(value->longValue());
  return true;
}

}  // namespace

Entry findEntry(Directory const& directory, unsigned short tag) {
  if (!directory->entries) {
    return nullptr;
  }
  auto const found = directory->entries->find(tag);
  return found == directory->entries->end() ? nullptr : found->second.get();
}

std::size_t valueCount(Entry entry) { return entry->values ? entry->values->size() : 0; }

Value singleValue(Entry entry) {
  return valueCount(entry) == 1 ? entry->values->front().get() : nullptr;
}

bool storeNumber(Directory const& directory, unsigned short tag, std::int32_t& field) {
  auto const* const entry = findEntry(directory, tag);
  return !entry || storeNumberOf(entry, field);
}

bool storeRequiredNumber(Directory const& directory, unsigned short tag, std::int32_t& field) {
  auto const* const entry = findEntry(directory, tag);
  return entry && storeNumberOf(entry, field);
}

bool storeText(Directory const& directory, unsigned short tag, std::string& field) {
  auto const* const entry = findEntry(directory, tag);
  return !entry || entry->convertToString(field);
}

Directory readDirectoryAt(std::shared_ptr<QVStream>& stream, std::uint32_t offset,
                          std::vector<unsigned short> const& tags) {
  stream->setOffset(offset);
  auto directory = std::make_shared<QVTiffImageFileDirectory>();
  if (!directory->read(stream, tags)) {
    return nullptr;
  }
  return directory;
}

Directory readFirstDirectory(std::shared_ptr<QVStream>& stream,
                             std::vector<unsigned short> const& tags) {
  QVTiffHeader header;
  if (!header.read(stream, kTiffMagic)) {
    return nullptr;
  }
  return readDirectoryAt(stream, header.firstIFDOffset, tags);
}

bool followPointer(std::shared_ptr<QVStream>& stream, Directory const& directory,
                   unsigned short pointer, std::vector<unsigned short> const& tags,
                   Directory& result) {
  result = nullptr;
  auto const* const entry = findEntry(directory, pointer);
  if (!entry) {
    return true;
  }
  auto const* const offset = singleValue(entry);
  if (!offset) {
    return false;
  }
  result = readDirectoryAt(stream, offset->longValue(), tags);
  return result != nullptr;
}

bool isReducedImage(Value newSubfileType) { return (newSubfileType->longValue() & 1U) != 0; }

bool storeFullImageSize(Directory const& directory, std::int32_t& width, std::int32_t& height) {
  auto const* const entry = findEntry(directory, tag::NewSubfileType);
  auto const* const newSubfileType = entry ? singleValue(entry) : nullptr;
  if (!newSubfileType || isReducedImage(newSubfileType)) {
    return false;
  }
  return storeRequiredNumber(directory, tag::ImageWidth, width) &&
         storeRequiredNumber(directory, tag::ImageLength, height);
}

}  // namespace quavel::detail
