// The TIFF layer as a program of its own would use it: the first byte picks the wanted tags, the
// rest is a TIFF structure.

#include <algorithm>

#include "Fuzzing.h"

namespace quavel::fuzz {
namespace {

using Value = QVTiffImageFileDirectoryEntryValue;
using Entry = QVTiffImageFileDirectoryEntry;
using Directory = QVTiffImageFileDirectory;

constexpr std::size_t kMostValues = 65536;
constexpr int kMostDirectories = 4;

bool isInteger(EntryValueType type) {
  return type <= EntryValueType::LONG ||
         (type >= EntryValueType::SBYTE && type <= EntryValueType::SLONG);
}

void checkValue(Value const& value) {
  std::int32_t const number = value.slongValue();
  require(value.charValue() == static_cast<char>(number), "a char is the low byte");
  require(value.byteValue() == static_cast<std::uint8_t>(number), "a byte is the low byte");
  require(value.sbyteValue() == static_cast<std::int8_t>(number), "a signed byte is the low byte");
  require(value.shortValue() == static_cast<std::uint16_t>(number), "a short is the low half");
  require(value.sshortValue() == static_cast<std::int16_t>(number), "as is a signed one");
  if (isInteger(value.type)) {
    require(value.longValue() == static_cast<std::uint32_t>(number), "a long is the same bits");
    double const exact = value.type == EntryValueType::LONG ? value.longValue() : double{};
    require(value.type != EntryValueType::LONG || value.doubleValue() == exact, "longs are exact");
    require(value.floatValue() == static_cast<float>(value.doubleValue()), "floats are rounded");
  }
  Rational const ratio = value.rationalValue();
  SRational const signedRatio = value.sRationalValue();
  require(value.type == EntryValueType::RATIONAL || (ratio.numerator | ratio.denominator) == 0,
          "a pair is a RATIONAL's");
  require(value.type == EntryValueType::SRATIONAL ||
              (signedRatio.numerator | signedRatio.denominator) == 0,
          "a signed pair is an SRATIONAL's");
}

void checkEntry(Entry const& entry) {
  std::string text = "before";
  bool const isText = entry.convertToString(text);
  require(text.find('\0') == std::string::npos, "a text ends at its first NUL");
  if (!entry.values) {
    require(isText && text.empty(), "what has no values is an empty text");
    require((entry.bytes != nullptr) == (entry.dataCount <= 4), "few bytes are kept, more located");
    require(!entry.bytes || entry.bytes->size() <= 4, "few bytes are at most four");
    return;
  }
  require(entry.values->size() <= kMostValues, "the values are limited");
  require(text.size() <= entry.values->size(), "a text has one value for each character");
  for (auto const& value : *entry.values) {
    require(value->type == entry.values->front()->type, "values share their type");
    require(Value::sizeOfValueOfType(value->type) > 0, "values have a size");
    checkValue(*value);
  }
}

bool isSame(Entry const& one, Entry const& two) {
  if (!one.values || !two.values) {
    return !one.values && !two.values && one.dataOffset == two.dataOffset &&
           one.dataCount == two.dataCount;
  }
  return std::equal(one.values->begin(), one.values->end(), two.values->begin(), two.values->end(),
                    [](auto const& a, auto const& b) {
                      return a->type == b->type && std::memcmp(a->value, b->value, 8) == 0;
                    });
}

/// The listed read of a directory whose full read succeeded.
void checkFilter(Directory const& full, Directory const& listed,
                 std::vector<unsigned short> const& tags) {
  require(listed.nextIFDOffset == full.nextIFDOffset, "a list does not change the next offset");
  for (auto const& [tag, entry] : *listed.entries) {
    require(std::count(tags.begin(), tags.end(), tag) > 0, "only listed tags are kept");
  }
  for (unsigned short const tag : tags) {
    auto const wanted = full.entryForTag(tag);
    auto const kept = listed.entryForTag(tag);
    require((wanted != nullptr) == (kept != nullptr), "every listed tag there is, is kept");
    require(!kept || isSame(*wanted, *kept), "the first entry of a tag is the one kept");
  }
}

std::vector<unsigned short> wantedTags(std::uint8_t choice) {
  if (choice % 2 == 0) {
    return {0x0100, 0x0101, 0x0112, 0x8769, 0x014a, 0x00fe, 0x0132, 0x0110};
  }
  return {0xa434, 0x8827, 0x9202, 0x9201, 0x920a, 0x9003, 0x9204, 0xa405, 0x829a, 0x0112, 0x0112};
}

/// Reads the directory at the offset in both ways; 0 when the chain ends there.
std::uint32_t checkDirectory(std::shared_ptr<QVStream>& stream, std::uint32_t offset,
                             std::vector<unsigned short> const& tags) {
  Directory listed;
  stream->setOffset(offset);
  bool const isListedRead = listed.read(stream, tags);
  if (listed.entries) {
    for (auto const& [tag, entry] : *listed.entries) {
      checkEntry(*entry);
    }
  }
  Directory full;
  stream->setOffset(offset);
  if (!full.read(stream, {})) {
    require(full.nextIFDOffset == 0, "a failed read leaves the next offset");
    return isListedRead ? listed.nextIFDOffset : 0;
  }
  require(isListedRead, "what can be read whole can be read in part");
  for (auto const& [tag, entry] : *full.entries) {
    checkEntry(*entry);
  }
  checkFilter(full, listed, tags);
  return full.nextIFDOffset;
}

}  // namespace
}  // namespace quavel::fuzz

int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
  using namespace quavel;
  if (size == 0) {
    return 0;
  }
  std::vector<std::uint8_t> bytes(data + 1, data + size);
  auto const memory = std::make_shared<QVMStream>(bytes.data(), bytes.size());
  std::shared_ptr<QVStream> stream = memory;

  QVTiffHeader header;
  if (!header.read(stream, 42)) {
    return 0;
  }
  fuzz::require(memory->offset == 8, "a header is 8 bytes");
  fuzz::require((bytes[0] == 'I') == (stream->byteOrder == ByteOrder::LittleEndian),
                "the mark decides the byte order");
  auto const tags = fuzz::wantedTags(data[0]);
  std::uint32_t offset = header.firstIFDOffset;
  for (int i = 0; i < fuzz::kMostDirectories && offset != 0; ++i) {
    offset = fuzz::checkDirectory(stream, offset, tags);
  }
  fuzz::require(memory->offset <= memory->length, "a memory stream stays inside its bytes");
  return 0;
}
