#ifndef QUAVEL_SRC_TIFF_TIFFWORDS_H
#define QUAVEL_SRC_TIFF_TIFFWORDS_H

#include <cstdint>
#include <string>

#include "journal/Words.h"

// How notes speak of TIFF structures.
namespace quavel::detail {

/// A tag: "0x0132 DateTime".
struct TagName {
  unsigned short number;
};

/// A number of values: "2 SHORT values". `typeCode` must be a known one, 1 to 13.
struct TypedCount {
  std::uint32_t count;
  std::uint16_t typeCode;
};

/// The name of a directory or a header in a TIFF structure: "IFD0 of the Exif segment".
struct PartName {
  char const* name = "the directory";
  char const* structure = nullptr;  ///< What holds the TIFF structure; null: it is the whole file.
  std::uint32_t number = 0;         ///< From 1 to `count`: "SubIFD 2 of 3". 0: there is only one.
  std::uint32_t count = 0;
};

/// "SubIFD 2 of 3" for `index` 1.
inline PartName subIFDName(std::uint32_t index, std::uint32_t count) {
  return {"SubIFD", /*structure=*/nullptr, /*number=*/index + 1, count};
}

void append(std::string& out, TagName tag);
void append(std::string& out, TypedCount values);
void append(std::string& out, PartName const& part);

/// The name of the record's field that is filled from the tag's entry; null for none.
char const* fieldOf(unsigned short tag);

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_TIFF_TIFFWORDS_H
