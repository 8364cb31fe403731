#include "terminal/Text.h"

#include <utf8proc.h>

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <cstring>

namespace app {

namespace {

constexpr std::string_view kEllipsis = "…";

/// One character, or one byte that is not part of a valid character.
struct Character {
  utf8proc_int32_t code;  // of an invalid byte: its value
  std::string_view bytes;
  bool isValid;
};

/// Removes the first character from a text that is not empty.
Character takeCharacter(std::string_view& text) {
  auto const* const bytes = reinterpret_cast<utf8proc_uint8_t const*>(text.data());
  utf8proc_int32_t code = 0;
  auto const length = utf8proc_iterate(bytes, static_cast<utf8proc_ssize_t>(text.size()), &code);
  bool const isValid = length > 0;
  std::size_t const taken = isValid ? static_cast<std::size_t>(length) : 1;
  Character const character = {isValid ? code : *bytes, text.substr(0, taken), isValid};
  text.remove_prefix(taken);
  return character;
}

std::size_t cellsOf(Character const& character) {
  auto const* const property = utf8proc_get_property(character.code);
  switch (property->boundclass) {
    case UTF8PROC_BOUNDCLASS_V:
    case UTF8PROC_BOUNDCLASS_T:
      return 0;  // the later letters of a Hangul syllable, within the cells of the first
    case UTF8PROC_BOUNDCLASS_PREPEND:
      return 1;  // the Arabic signs that enclose a number: visible, but their charwidth is 0
    default:
      // Spacing marks too have a charwidth of 0, although they stand beside their letter.
      return property->category == UTF8PROC_CATEGORY_MC ? 1 : property->charwidth;
  }
}

/// Whether a character has no glyph of its own but changes how the text around it appears.
bool isHidden(Character const& character) {
  constexpr utf8proc_int32_t kNonJoiner = 0x200c;
  constexpr utf8proc_int32_t kJoiner = 0x200d;
  switch (utf8proc_category(character.code)) {
    case UTF8PROC_CATEGORY_CC:  // control characters
    case UTF8PROC_CATEGORY_ZL:  // the line separator
    case UTF8PROC_CATEGORY_ZP:  // the paragraph separator
      return true;
    case UTF8PROC_CATEGORY_CF:  // format characters
      // Scripts and emoji need the joiners; the Arabic signs that enclose a number are visible.
      return character.code != kNonJoiner && character.code != kJoiner &&
             utf8proc_get_property(character.code)->boundclass != UTF8PROC_BOUNDCLASS_PREPEND;
    default:
      return false;
  }
}

std::string escapeFor(Character const& character) {
  if (character.code == '\n' || character.code == '\t') {
    return character.code == '\n' ? "\\n" : "\\t";
  }
  char text[16];
  bool const isOneByte = !character.isValid || character.code < 0x80;
  std::snprintf(text, sizeof text, isOneByte ? "\\x%02x" : "\\u{%04x}",
                static_cast<unsigned>(character.code));
  return text;
}

bool isUtf8(std::string_view text) {
  bool isValid = true;
  while (isValid && !text.empty()) {
    isValid = takeCharacter(text).isValid;
  }
  return isValid;
}

}  // namespace

bool isPrintableAscii(std::string_view text) {
  // Eight bytes at a time. A byte from 0x80 on has its top bit set. One below ' ' sets it when ' '
  // is subtracted, and 0x7f sets it when 1 is added. A printable byte never does. A borrow or a
  // carry can change the next byte, but it comes only from a byte that is not printable: the answer
  // is the same.
  constexpr std::uint64_t kOnes = 0x0101010101010101;
  constexpr std::uint64_t kSpaces = kOnes * ' ';
  std::uint64_t word = 0;
  std::uint64_t found = 0;
  for (; text.size() >= sizeof word; text.remove_prefix(sizeof word)) {
    std::memcpy(&word, text.data(), sizeof word);
    found |= word | (word - kSpaces) | (word + kOnes);
  }
  // The last bytes, fewer than eight. The rest of the word stays spaces, which are printable.
  word = kSpaces;
  for (char const c : text) {
    word = (word << 8U) | static_cast<unsigned char>(c);
  }
  found |= word | (word - kSpaces) | (word + kOnes);
  return (found & (kOnes * 0x80)) == 0;
}

std::string textAsUtf8(std::string text) {
  if (isPrintableAscii(text) || isUtf8(text)) {
    return text;
  }
  std::string utf8;
  for (char const c : text) {  // in Latin-1, a byte is the code of its character
    utf8proc_uint8_t bytes[4];
    auto const length = utf8proc_encode_char(static_cast<unsigned char>(c), bytes);
    utf8.append(bytes, bytes + length);
  }
  return utf8;
}

std::string pathAsUtf8(std::string const& path) {
  if (isPrintableAscii(path)) {
    return path;
  }
  std::string utf8;
  for (std::string_view rest = path; !rest.empty();) {
    Character const next = takeCharacter(rest);
    utf8 += next.isValid && next.code != 0 ? next.bytes : "\xef\xbf\xbd";  // U+FFFD
  }
  return utf8;
}

std::string escaped(std::string const& text) {
  if (isPrintableAscii(text)) {
    return text;
  }
  std::string result;
  for (std::string_view rest = text; !rest.empty();) {
    Character const next = takeCharacter(rest);
    result += next.isValid && !isHidden(next) ? std::string(next.bytes) : escapeFor(next);
  }
  return result;
}

std::string escapedPath(std::string path) {
  for (auto at = path.find('\\'); at != std::string::npos; at = path.find('\\', at + 2)) {
    path.insert(at, 1, '\\');
  }
  return escaped(path);
}

std::size_t widthOf(std::string_view text) {
  if (isPrintableAscii(text)) {
    return text.size();
  }
  std::size_t sum = 0;
  while (!text.empty()) {
    sum += cellsOf(takeCharacter(text));
  }
  return sum;
}

std::string keepStart(std::string const& text, std::size_t width, std::size_t maxBytes) {
  if (text.size() <= maxBytes && widthOf(text) <= width) {
    return text;
  }
  std::size_t keptBytes = 0;
  std::size_t cells = 0;
  for (std::string_view rest = text; !rest.empty();) {
    Character const next = takeCharacter(rest);
    cells += cellsOf(next);
    if (cells >= width || keptBytes + next.bytes.size() > maxBytes) {  // the "…" needs a cell
      break;
    }
    keptBytes += next.bytes.size();
  }
  return width == 0 ? "" : text.substr(0, keptBytes).append(kEllipsis);
}

std::string keepEnd(std::string const& text, std::size_t width) {
  std::size_t keptCells = widthOf(text);
  if (keptCells <= width) {
    return text;
  }
  std::string_view kept = text;
  while (!kept.empty()) {
    std::string_view rest = kept;
    std::size_t const firstCells = cellsOf(takeCharacter(rest));
    if (keptCells < width && firstCells > 0) {  // the "…" fits, and no mark would stand upon it
      break;
    }
    keptCells -= firstCells;
    kept = rest;
  }
  return width == 0 ? "" : std::string(kEllipsis).append(kept);
}

}  // namespace app
