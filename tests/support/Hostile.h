#ifndef QUAVEL_TESTS_HOSTILE_H
#define QUAVEL_TESTS_HOSTILE_H

#include "support/Fixtures.h"

// Well-formed little-endian files that make a reader read the same bytes as often as it lets them.
namespace quavel::test {

/// How much each directory of such a file asks for: up to 65535 entries and 65536 values.
struct Greed {
  std::size_t entries;
  std::uint32_t values;
};

/// Filler entries around those given, with room for their values. A directory begins at each of
/// the first 400 multiples of 12 bytes: the structures that share it may have different bases.
inline Bytes sharedDirectory(Greed greed, std::vector<Field> const& fields) {
  constexpr std::size_t kFirstFieldSlot = 400;
  Bytes const filler = u16(kII, greed.entries) + "\xff\xff" + Bytes(8, '\0');
  Bytes bytes;
  for (std::size_t i = 0; i < greed.entries + kFirstFieldSlot; ++i) {
    bytes += filler;
  }
  std::size_t position = 12 * kFirstFieldSlot + 2;
  for (Field const& field : fields) {
    bytes.replace(position, 12,
                  u16(kII, field.tag) + u16(kII, field.type) + u32(kII, field.count) +
                      u32(kII, static_cast<std::uint64_t>(field.rawField)));
    position += 12;
  }
  return bytes + Bytes(8 * std::size_t{greed.values}, '\1');
}

/// The header of a TIFF structure that begins at `base` of the file, as does its directory at
/// `directory`; 12 bytes long.
inline Bytes headerTo(std::size_t base, std::size_t directory) {
  return Bytes("II*\0", 4) + u32(kII, directory - base) + Bytes(4, '\0');
}

/// As many SubIFDs as values, all of them one directory that never says what it is.
inline Bytes repeatedSubIFDs(Greed greed) {
  constexpr std::uint32_t kList = 38;  // after a directory of two entries
  std::uint32_t const shared = kList + 4 * greed.values;
  Bytes bytes =
      tiff(kII, {{shorts(kNewSubfileType, {1}), claim(kSubIFDs, kLong, greed.values, kList)}});
  for (std::uint32_t i = 0; i < greed.values; ++i) {
    bytes += u32(kII, shared);
  }
  return bytes + sharedDirectory(greed, {claim(kWidth, kRational, greed.values, 0),
                                         claim(kLength, kRational, greed.values, 0),
                                         claim(kOrientation, kRational, greed.values, 0)});
}

/// Exif segments whose first and Exif directories are all one.
inline Bytes repeatedExif(Greed greed, std::size_t segments) {
  constexpr std::size_t kFirstBase = 12;
  constexpr std::size_t kSpacing = 24;
  std::size_t const shared = 2 + kSpacing * segments + sof0().size();
  Bytes bytes = "\xff\xd8";
  for (std::size_t i = 0; i < segments; ++i) {
    bytes += exifSegment(headerTo(kFirstBase + kSpacing * i, shared) + Bytes(2, '\0'));
  }
  return bytes + sof0() +
         sharedDirectory(greed, {claim(kExif, kLong, 1, static_cast<std::uint32_t>(shared) - 12),
                                 claim(kDateTimeOriginal, kAscii, greed.values, 0),
                                 claim(kOffsetTimeOriginal, kRational, greed.values, 0),
                                 claim(kWidth, kLong, 1, 600), claim(kLength, kLong, 1, 600),
                                 claim(kPixelX, kRational, greed.values, 0),
                                 claim(kPixelY, kRational, greed.values, 0)});
}

/// Metadata boxes that all hold `boxes` times the one directory.
inline Bytes repeatedBoxes(Greed greed, std::size_t uuids, std::size_t boxes) {
  constexpr std::size_t kBoxSize = 8 + 12;
  std::size_t const uuidSize = 24 + kBoxSize * boxes;
  std::size_t const moovSize = 8 + uuids * uuidSize;
  Bytes children;
  for (std::size_t i = 0; i < uuids; ++i) {
    Bytes metadata;
    for (std::size_t k = 0; k < boxes; ++k) {
      std::size_t const base = 8 + i * uuidSize + 24 + k * kBoxSize + 8;
      metadata += box("CMT1", headerTo(base, moovSize));
    }
    children += uuidBox(metadata);
  }
  return box("moov", children) +
         sharedDirectory(
             greed,
             {claim(kDateTime, kAscii, greed.values, 0), claim(kModel, kAscii, greed.values, 0),
              claim(kExif, kRational, greed.values, 0), claim(kSubIFDs, kRational, greed.values, 0),
              claim(kNewSubfileType, kRational, greed.values, 0)});
}

/// One directory whose eleven wanted entries all hold as many values as they may.
inline Bytes widestDirectory(Greed greed) {
  std::vector<Field> fields;
  for (Field const& field : cmt2().fields) {
    fields.push_back(claim(field.tag, kRational, greed.values, 0));
  }
  return cr3File(uuidBox(box("CMT2", headerTo(0, 12) + sharedDirectory(greed, fields))));
}

}  // namespace quavel::test

#endif  // QUAVEL_TESTS_HOSTILE_H
