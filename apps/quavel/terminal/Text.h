#ifndef QUAVEL_APPS_TEXT_H
#define QUAVEL_APPS_TEXT_H

#include <cstddef>
#include <string>
#include <string_view>

namespace app {

/// One character at the start of a text, or one byte that begins none.
struct Character {
  wchar_t code;        ///< The byte's value when it is not valid.
  std::size_t length;  ///< Bytes; at least 1.
  bool isValid;        ///< It is UTF-8.
};

/// Takes the first character of `text`, which must not be empty.
Character firstCharacter(std::string_view text);

bool isAscii(std::string_view text);
bool isUtf8(std::string_view text);

/// A text out of a file as UTF-8. Files that are not UTF-8 are mostly Latin-1: when any byte is
/// wrong, all from 0x80 on are taken as the characters of that number.
std::string textAsUtf8(std::string text);
/// A file name as UTF-8, each byte that is none, and each NUL, replaced by U+FFFD.
std::string pathAsUtf8(std::string const& path);

/// Terminal cells that an escaped text takes.
std::size_t cells(std::string_view text);
/// The start of an escaped text, respectively its end, cut with "…" to fit the cells.
/// The start has no more bytes than `most` besides: marks take no cells.
std::string keepStart(std::string const& text, std::size_t width,
                      std::size_t most = std::string::npos);
std::string keepEnd(std::string const& text, std::size_t width);

}  // namespace app

#endif  // QUAVEL_APPS_TEXT_H
