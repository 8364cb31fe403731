#ifndef QUAVEL_SRC_TIFF_TIFFWORDS_H
#define QUAVEL_SRC_TIFF_TIFFWORDS_H

#include <cstdint>
#include <string>

#include "journal/Words.h"

// How notes speak of TIFF structures.
namespace quavel::detail {

/// A tag: "0x0132 DateTime".
struct TagName {
  unsigned short tag;
};

/// A number of values: "2 SHORT values". The type must be known.
struct TypedCount {
  std::uint32_t count;
  std::uint16_t typeCode;
};

/// A directory's name: "IFD0 of the Exif segment" or "SubIFD 2 of 3".
struct DirectoryName {
  char const* name = "the directory";
  char const* structure = nullptr;  ///< Null for the structure that is the whole file.
  std::uint32_t number = 0;         ///< From 1 to `count`; 0: it is the only one of its kind.
  std::uint32_t count = 0;
};

void append(std::string& out, TagName tag);
void append(std::string& out, TypedCount values);
void append(std::string& out, DirectoryName const& directory);

/// The record's field that is filled from the tag's entry; null for none.
char const* fieldOf(unsigned short tag);

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_TIFF_TIFFWORDS_H
