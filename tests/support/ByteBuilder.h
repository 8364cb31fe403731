#ifndef QUAVEL_TESTS_BYTEBUILDER_H
#define QUAVEL_TESTS_BYTEBUILDER_H

#include <algorithm>
#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "quavel/QVStream.h"

// Lays files out as the formats do. A file is written as it is nested: a directory holds its
// fields, a pointer field its sub-directories, a box its children.
namespace quavel::test {

using Bytes = std::string;

constexpr ByteOrder kII = ByteOrder::LittleEndian;
constexpr ByteOrder kMM = ByteOrder::BigEndian;
constexpr ByteOrder kOrders[] = {kII, kMM};

/// The number's low `size` bytes.
inline Bytes number(ByteOrder order, std::uint64_t value, int size) {
  Bytes bytes;
  for (int i = 0; i < size; ++i) {
    int const place = order == kII ? i : size - 1 - i;
    bytes.push_back(static_cast<char>(value >> (8 * place) & 0xffU));
  }
  return bytes;
}
inline Bytes u16(ByteOrder order, std::uint64_t value) { return number(order, value, 2); }
inline Bytes u32(ByteOrder order, std::uint64_t value) { return number(order, value, 4); }

// clang-format off
enum Type : std::uint16_t { kByte = 1, kAscii, kShort, kLong, kRational, kSByte, kUndefined,
                            kSShort, kSLong, kSRational, kFloat, kDouble, kIfd };
// clang-format on

struct Directory;

/// A directory entry. What is written is `count` and then `numbers`, each `numberSize` bytes wide
/// (a rational is two of them), or a pointer to each of `subdirectories`; out of line when they
/// exceed 4 bytes.
struct Field {
  std::uint16_t tag = 0;
  std::uint16_t type = 0;
  std::uint32_t count = 0;
  int numberSize = 1;
  std::vector<std::int64_t> numbers = {};
  std::vector<Directory> subdirectories = {};

  /// As an edit, it replaces the field of its tag, or adds itself.
  void operator()(Directory& directory) const;
};

struct Directory {
  std::vector<Field> fields;
  std::uint32_t next = 0;

  /// The field of the tag, which is added unless it is there.
  Field& operator[](std::uint16_t tag) {
    auto const found = std::find_if(fields.begin(), fields.end(),
                                    [tag](Field const& field) { return field.tag == tag; });
    return found == fields.end() ? fields.emplace_back(Field{tag}) : *found;
  }
};

inline void Field::operator()(Directory& directory) const { directory[tag] = *this; }

template <class... Numbers>
Field values(std::uint16_t tag, std::uint16_t type, int size, Numbers... numbers) {
  return {tag, type, sizeof...(numbers), size, {static_cast<std::int64_t>(numbers)...}};
}
template <class... Numbers>
Field shorts(std::uint16_t tag, Numbers... numbers) {
  return values(tag, kShort, 2, numbers...);
}
template <class... Numbers>
Field longs(std::uint16_t tag, Numbers... numbers) {
  return values(tag, kLong, 4, numbers...);
}
inline Field ratio(std::uint16_t tag, std::int64_t numerator, std::int64_t denominator,
                   std::uint16_t type = kRational) {
  return {tag, type, 1, 4, {numerator, denominator}};
}
/// Characters as they stand, or with the NUL that ends a well-made text.
inline Field characters(std::uint16_t tag, Bytes const& text, std::uint16_t type = kAscii) {
  return {tag, type, static_cast<std::uint32_t>(text.size()), 1, {text.begin(), text.end()}};
}
inline Field ascii(std::uint16_t tag, Bytes const& text) { return characters(tag, text + '\0'); }
inline Field pointer(std::uint16_t tag, std::vector<Directory> const& subdirectories) {
  return {tag, kLong, static_cast<std::uint32_t>(subdirectories.size()), 4, {}, subdirectories};
}
/// An entry that claims any type and count, whatever its field holds.
inline Field claim(std::uint16_t tag, std::uint16_t type, std::uint32_t count,
                   std::uint32_t valueField) {
  return {tag, type, count, 4, {valueField}};
}

using Edit = std::function<void(Directory&)>;

inline Edit drop(std::uint16_t tag) {
  return [tag](Directory& directory) {
    auto& all = directory.fields;
    all.erase(std::remove_if(all.begin(), all.end(), [&](auto& field) { return field.tag == tag; }),
              all.end());
  };
}
/// Edits the sub-directory that the field points to, or the one of that index.
inline Edit in(std::uint16_t tag, Edit const& edit, std::size_t index = 0) {
  return [=](Directory& directory) { edit(directory[tag].subdirectories.at(index)); };
}
inline Edit both(Edit const& one, Edit const& other) {
  return [=](Directory& directory) { one(directory), other(directory); };
}
inline void clear(Directory& directory) { directory = {}; }

/// The directory as it stands `start` bytes after the TIFF header's first byte, followed by its
/// values and sub-directories.
inline Bytes directoryAt(ByteOrder order, std::size_t start, Directory const& directory) {
  std::size_t const end = start + 2 + 12 * directory.fields.size() + 4;
  Bytes entries = u16(order, directory.fields.size());
  Bytes rest;
  for (Field const& field : directory.fields) {
    Bytes data;
    for (std::int64_t const value : field.numbers) {
      data += number(order, static_cast<std::uint64_t>(value), field.numberSize);
    }
    for (Directory const& subdirectory : field.subdirectories) {
      data += u32(order, end + rest.size());
      rest += directoryAt(order, end + rest.size(), subdirectory);
    }
    entries += u16(order, field.tag) + u16(order, field.type) + u32(order, field.count);
    if (data.size() > 4) {
      rest += data;
      data = u32(order, end + rest.size() - data.size());
    }
    entries += data + Bytes(4 - data.size(), '\0');
  }
  return entries + u32(order, directory.next) + rest;
}

/// A whole TIFF structure.
inline Bytes tiff(ByteOrder order, Directory const& first) {
  return (order == kII ? "II" : "MM") + u16(order, 42) + u32(order, 8) +
         directoryAt(order, 8, first);
}

}  // namespace quavel::test

#endif  // QUAVEL_TESTS_BYTEBUILDER_H
