#include "WhyDirectory.h"

#include <quavel/QVTiffHeader.h>
#include <quavel/QVTiffImageFileDirectoryEntry.h>

#include <limits>

#include "WhyEntry.h"
#include "WhyNames.h"

namespace app::why {

using quavel::EntryValueType;
using quavel::QVTiffHeader;
using quavel::QVTiffImageFileDirectory;

namespace {

constexpr unsigned short kTiffMagic = 42;
constexpr unsigned short kBigTiffMagic = 43;
constexpr std::size_t kMarkSize = 2;

// Stored in the record, it cannot be told from a number that is not there.
constexpr std::uint32_t kAbsentNumber = std::numeric_limits<std::uint32_t>::max();

bool stopAtHeader(Walk& walk, std::string const& header, std::int64_t position) {
  std::string const subject = "the " + header + " at " + offsetText(position);
  auto const mark = walk.peek(position, kMarkSize);
  if (mark.size() < kMarkSize) {
    return walk.stop(walk.cut("the " + header));
  }
  if (mark != std::vector<std::uint8_t>{'I', 'I'} && mark != std::vector<std::uint8_t>{'M', 'M'}) {
    return walk.stop(subject + " begins with " + hexText(mark) +
                     ", not with 49 49 (\"II\") or 4d 4d (\"MM\")");
  }
  walk.stream->setOffset(static_cast<long>(position + 2 - walk.stream->baseOffset));
  unsigned short magic = 0;
  std::uint32_t offset = 0;
  if (!walk.stream->readShort(&magic) || (magic == kTiffMagic && !walk.stream->readLong(&offset))) {
    return walk.stop(walk.cut(subject));
  }
  return walk.stop(subject + " has magic " + std::to_string(magic) + ", not 42" +
                   (magic == kBigTiffMagic ? "; 43 marks a BigTIFF, which is not read" : ""));
}

}  // namespace

std::string WalkedDirectory::text() const { return name + " at " + offsetText(position); }

std::string missingText(WalkedDirectory const& directory, unsigned short tag) {
  return "no " + tagText(tag) + " in " + directory.text();
}

Directory walkFirstDirectory(Walk& walk, std::string const& structure, Tags const& tags) {
  std::string const suffix = structure.empty() ? "" : " of " + structure;
  std::int64_t const position = walk.position();
  QVTiffHeader header;
  if (!header.read(walk.stream, kTiffMagic)) {
    stopAtHeader(walk, "TIFF header" + suffix, position);
    return std::nullopt;
  }
  bool const isLittle = walk.stream->byteOrder == quavel::ByteOrder::LittleEndian;
  walk.passed("TIFF header" + suffix + " at " + offsetText(position) +
              (isLittle ? ": little-endian" : ": big-endian"));
  return walkDirectory(walk, "IFD0" + suffix, header.firstIFDOffset, tags);
}

Directory walkDirectory(Walk& walk, std::string const& name, std::uint32_t offset,
                        Tags const& tags) {
  WalkedDirectory directory = {name, walk.inFile(offset),
                               std::make_shared<QVTiffImageFileDirectory>()};
  walk.stream->setOffset(offset);
  if (!directory.ifd->read(walk.stream, tags)) {
    walk.stop(whyUnread(walk, directory, tags));
    return std::nullopt;
  }
  walk.passed(directory.text() + ": has " + std::to_string(directory.ifd->entries->size()) +
              " of the " + std::to_string(tags.size()) + " wanted entries");
  return directory;
}

bool walkPointer(Walk& walk, WalkedDirectory const& directory, unsigned short pointer,
                 std::string const& name, Tags const& tags, Directory& result) {
  Value offset;
  if (!walkValue(walk, directory, pointer, "", offset)) {
    return false;
  }
  if (!offset) {
    return true;
  }
  result = walkDirectory(walk, name, offset->longValue(), tags);
  return result.has_value();
}

bool walkValue(Walk& walk, WalkedDirectory const& directory, unsigned short tag,
               std::string const& field, Value& result) {
  result = nullptr;
  auto const entry = directory.ifd->entryForTag(tag);
  if (!entry) {
    walk.absent(field, missingText(directory, tag));
    return true;
  }
  if (!entry->values) {
    return walk.stop(entryText(walk, directory, tag) + " is of type UNDEFINED; one number wanted");
  }
  if (entry->values->size() != 1) {
    return walk.stop(entryText(walk, directory, tag) + " holds " +
                     contentText(walk, directory, tag) + "; exactly one wanted");
  }
  result = entry->values->front();
  return true;
}

bool walkNumber(Walk& walk, WalkedDirectory const& directory, unsigned short tag,
                std::string const& field) {
  Value value;
  if (!walkValue(walk, directory, tag, field, value)) {
    return false;
  }
  if (value && value->longValue() == kAbsentNumber) {
    walk.absent(field, entryText(walk, directory, tag) + " is -1, which counts as absent");
  }
  return true;
}

bool walkRequiredNumber(Walk& walk, WalkedDirectory const& directory, unsigned short tag,
                        std::string const& purpose, std::uint32_t& result) {
  Value value;
  if (!walkValue(walk, directory, tag, "", value)) {
    return false;
  }
  if (!value) {
    return walk.stop(missingText(directory, tag) + "; " + purpose);
  }
  result = value->longValue();
  return true;
}

bool walkText(Walk& walk, WalkedDirectory const& directory, unsigned short tag,
              std::string const& field) {
  auto const entry = directory.ifd->entryForTag(tag);
  if (!entry) {
    walk.absent(field, missingText(directory, tag));
    return true;
  }
  std::string text;
  if (!entry->convertToString(text)) {
    return walk.stop(entryText(walk, directory, tag) + " holds " +
                     contentText(walk, directory, tag) + "; ASCII text wanted");
  }
  if (text.empty()) {
    walk.absent(field, entryText(walk, directory, tag) + " holds no text (" +
                           contentText(walk, directory, tag) + ')');
  }
  return true;
}

bool walkDates(Walk& walk, WalkedDirectory const& exifIFD, bool wantsDigitized) {
  return walkText(walk, exifIFD, tag::DateTimeOriginal, "dateTimeOriginal") &&
         (!wantsDigitized || walkText(walk, exifIFD, tag::DateTimeDigitized, "dateTimeDigitized"));
}

bool walkFullImageSize(Walk& walk, WalkedDirectory const& directory) {
  std::uint32_t subfileType = 0;
  if (!walkRequiredNumber(walk, directory, tag::NewSubfileType,
                          "the raw image must say that it is of full size", subfileType)) {
    return false;
  }
  if ((subfileType & 1U) != 0) {
    return walk.stop(directory.text() + " declares a reduced image (NewSubfileType " +
                     std::to_string(subfileType) + "); the raw image of full size is wanted there");
  }
  std::uint32_t side = 0;
  std::string const purpose = "the raw image's size is wanted there";
  return walkRequiredNumber(walk, directory, tag::ImageWidth, purpose, side) &&
         walkRequiredNumber(walk, directory, tag::ImageLength, purpose, side) &&
         walkNumber(walk, directory, tag::ImageWidth, "width") &&
         walkNumber(walk, directory, tag::ImageLength, "height");
}

}  // namespace app::why
