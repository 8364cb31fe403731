#include "tiff/TiffWords.h"

#include <algorithm>
#include <iterator>

#include "tiff/Tags.h"

namespace quavel::detail {

namespace {

constexpr char kNamesByTypeCode[][10] = {"",          "BYTE",  "ASCII",     "SHORT",  "LONG",
                                         "RATIONAL",  "SBYTE", "UNDEFINED", "SSHORT", "SLONG",
                                         "SRATIONAL", "FLOAT", "DOUBLE",    "IFD"};

tag::Tag const* findTag(unsigned short number) {
  auto const* const found =
      std::find_if(std::begin(tag::kAll), std::end(tag::kAll),
                   [number](tag::Tag const& row) { return row.number == number; });
  return found == std::end(tag::kAll) ? nullptr : found;
}

}  // namespace

void append(std::string& out, TagName tag) {
  append(out, HexCode{tag.number});
  if (auto const* const row = findTag(tag.number)) {
    out.append(" ").append(row->name);
  }
}

void append(std::string& out, TypedCount values) {
  append(out, values.count);
  out.append(" ").append(kNamesByTypeCode[values.typeCode]);
  out += values.count == 1 ? " value" : " values";
}

void append(std::string& out, PartName const& part) {
  out += part.name;
  if (part.number != 0) {
    out.append(" ").append(std::to_string(part.number));
    out.append(" of ").append(std::to_string(part.count));
  }
  if (part.structure != nullptr) {
    out.append(" of ").append(part.structure);
  }
}

char const* fieldOf(unsigned short tag) {
  auto const* const row = findTag(tag);
  bool const hasField = row != nullptr && row->field[0] != '\0';  // an empty array: none
  return hasField ? row->field : nullptr;
}

}  // namespace quavel::detail
