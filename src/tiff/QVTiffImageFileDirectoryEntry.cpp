#include "quavel/QVTiffImageFileDirectoryEntry.h"

#include "quavel/QVStream.h"
#include "quavel/QVTiffImageFileDirectoryEntryValue.h"

namespace quavel {

namespace {

using Value = QVTiffImageFileDirectoryEntryValue;
using ValueList = std::vector<std::shared_ptr<Value>>;

constexpr unsigned short kUndefinedCode = 7;
constexpr std::uint32_t kValueFieldSize = 4;

// The wanted entries of real files hold some hundred values at most, the longest being texts. The
// bound keeps what a damaged count can make an entry allocate below 2 MB.
constexpr std::uint32_t kMostValues = 65536;

std::shared_ptr<ValueList> readValues(std::shared_ptr<QVStream>& stream, EntryValueType type,
                                      std::uint32_t count) {
  auto values = std::make_shared<ValueList>();
  for (std::uint32_t i = 0; i < count; ++i) {
    auto value = std::make_shared<Value>();
    value->type = type;
    if (!value->read(stream)) {
      return nullptr;
    }
    values->push_back(std::move(value));
  }
  return values;
}

}  // namespace

QVTiffImageFileDirectoryEntry::QVTiffImageFileDirectoryEntry() = default;

bool QVTiffImageFileDirectoryEntry::read(std::shared_ptr<QVStream>& stream) {
  unsigned short code = 0;
  if (!stream->readShort(&code)) {
    return false;
  }
  if (code == 0 || code >= fieldTypeToValueType.size()) {
    return false;
  }
  std::uint32_t count = 0;
  if (!stream->readLong(&count)) {
    return false;
  }
  if (code == kUndefinedCode) {
    return readUndefined(stream, count);
  }
  if (count > kMostValues) {
    return false;
  }

  EntryValueType const type = fieldTypeToValueType[code];
  if (std::uint64_t{count} * Value::sizeOfValueOfType(type) > kValueFieldSize) {
    std::uint32_t valuesOffset = 0;
    if (!stream->readLong(&valuesOffset)) {
      return false;
    }
    stream->setOffset(valuesOffset);
  }

  auto newValues = readValues(stream, type, count);
  if (!newValues) {
    return false;
  }
  values = std::move(newValues);
  return true;
}

bool QVTiffImageFileDirectoryEntry::readUndefined(std::shared_ptr<QVStream>& stream,
                                                  std::uint32_t count) {
  if (count > kValueFieldSize) {
    if (!stream->readLong(&dataOffset)) {
      return false;
    }
    dataCount = count;
    return true;
  }
  bytes = std::make_shared<std::vector<std::uint8_t>>(count);
  return stream->readBuffer(bytes->data(), count) == static_cast<std::int64_t>(count);
}

bool QVTiffImageFileDirectoryEntry::convertToString(std::string& out) const {
  out.clear();
  if (!values) {
    return true;
  }
  for (auto const& value : *values) {
    if (value->type != EntryValueType::ASCII) {
      return false;
    }
    char const character = value->charValue();
    if (character == '\0') {
      return true;
    }
    out.push_back(character);
  }
  return true;
}

}  // namespace quavel
