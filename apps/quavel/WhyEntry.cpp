#include "WhyEntry.h"

#include <quavel/QVTiffImageFileDirectoryEntry.h>
#include <quavel/QVTiffImageFileDirectoryEntryValue.h>

#include <cstdint>
#include <set>

#include "WhyNames.h"

namespace app::why {

using quavel::QVTiffImageFileDirectoryEntryValue;

namespace {

constexpr long kCountSize = 2;
constexpr long kEntrySize = 12;
constexpr std::int64_t kValueFieldSize = 4;
constexpr unsigned short kLastCode = 13;
constexpr std::uint32_t kMostValues = 65536;  // the library's limit

/// An entry's fields as stored; what lies beyond the end of the data is 0.
struct RawEntry {
  std::int64_t position = 0;  ///< In the file.
  unsigned short tag = 0;
  unsigned short code = 0;
  std::uint32_t count = 0;
  std::uint32_t valueField = 0;
};

std::int64_t positionOfEntry(WalkedDirectory const& directory, std::uint32_t index) {
  return directory.position + kCountSize + std::int64_t{kEntrySize} * index;
}

void seekInFile(Walk const& walk, std::int64_t position) {
  walk.stream->setOffset(static_cast<long>(position - walk.stream->baseOffset));
}

bool readFields(Walk const& walk, std::int64_t position, RawEntry& entry) {
  entry.position = position;
  seekInFile(walk, position);
  auto& stream = *walk.stream;
  return stream.readShort(&entry.tag) && stream.readShort(&entry.code) &&
         stream.readLong(&entry.count) && stream.readLong(&entry.valueField);
}

std::string placeOf(WalkedDirectory const& directory, RawEntry const& entry) {
  return tagText(entry.tag) + " at " + offsetText(entry.position) + " in " + directory.name;
}

std::string contentOf(RawEntry const& entry) {
  return std::to_string(entry.count) + ' ' + fieldTypeText(entry.code) +
         (entry.count == 1 ? " value" : " values");
}

/// Why an entry of a known type was refused though its own 12 bytes are there, which is never so
/// with UNDEFINED ones: their bytes are not looked at elsewhere.
std::string whyValuesUnread(Walk const& walk, RawEntry const& entry) {
  if (entry.count > kMostValues) {
    return "it declares " + contentOf(entry) + "; more than " + std::to_string(kMostValues) +
           " are refused";
  }
  auto const type = quavel::fieldTypeToValueType[entry.code];
  std::int64_t const size =
      std::int64_t{entry.count} * QVTiffImageFileDirectoryEntryValue::sizeOfValueOfType(type);
  std::int64_t const begin =
      size > kValueFieldSize ? walk.inFile(entry.valueField) : entry.position + 8;
  std::string const pronoun =
      entry.count == 1 ? "its " : "its " + std::to_string(entry.count) + ' ';
  return pronoun + fieldTypeText(entry.code) + (entry.count == 1 ? " value" : " values") +
         " would begin at " + offsetText(begin) + " and end at " + offsetText(begin + size) +
         ", but " + walk.fileEnd();
}

std::string whyEntryUnread(Walk& walk, WalkedDirectory const& directory, RawEntry& entry) {
  bool const isWhole = readFields(walk, entry.position, entry);
  std::string const place = placeOf(directory, entry);
  if (isWhole && (entry.code == 0 || entry.code > kLastCode)) {
    return place + ": field " + fieldTypeText(entry.code) +
           " is neither one of TIFF's 12 nor 13 (IFD)";
  }
  return isWhole ? place + ": " + whyValuesUnread(walk, entry) : walk.cut(place);
}

/// The first entry with the tag, which the directory has.
RawEntry findEntry(Walk const& walk, WalkedDirectory const& directory, unsigned short tag) {
  seekInFile(walk, directory.position);
  unsigned short count = 0;
  walk.stream->readShort(&count);
  RawEntry entry;
  for (std::uint32_t i = 0; i < count; ++i) {
    bool const isWhole = readFields(walk, positionOfEntry(directory, i), entry);
    if (!isWhole || entry.tag == tag) {
      break;
    }
  }
  return entry;
}

}  // namespace

std::string whyUnread(Walk& walk, WalkedDirectory const& directory, Tags const& tags) {
  seekInFile(walk, directory.position);
  unsigned short count = 0;
  if (!walk.stream->readShort(&count)) {
    return walk.cut("the entry count of " + directory.text());
  }
  std::set<unsigned short> wanted(tags.begin(), tags.end());
  for (std::uint32_t i = 0; i < count && !wanted.empty(); ++i) {
    RawEntry entry;
    entry.position = positionOfEntry(directory, i);
    seekInFile(walk, entry.position);
    if (!walk.stream->readShort(&entry.tag)) {
      return walk.cut("entry " + std::to_string(i + 1) + " of " + std::to_string(count) + " of " +
                      directory.text());
    }
    quavel::QVTiffImageFileDirectoryEntry parsed;
    if (wanted.erase(entry.tag) != 0 && !parsed.read(walk.stream)) {
      return whyEntryUnread(walk, directory, entry);
    }
  }
  seekInFile(walk, positionOfEntry(directory, count));
  std::uint32_t next = 0;
  if (!walk.stream->readLong(&next)) {
    return walk.cut("the offset of the next directory, behind the " + std::to_string(count) +
                    " entries of " + directory.text());
  }
  return directory.text() + " cannot be read";
}

std::string entryText(Walk& walk, WalkedDirectory const& directory, unsigned short tag) {
  return placeOf(directory, findEntry(walk, directory, tag));
}

std::string contentText(Walk& walk, WalkedDirectory const& directory, unsigned short tag) {
  return contentOf(findEntry(walk, directory, tag));
}

}  // namespace app::why
