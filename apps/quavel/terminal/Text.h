#ifndef QUAVEL_APPS_TEXT_H
#define QUAVEL_APPS_TEXT_H

#include <cstddef>
#include <string>
#include <string_view>

namespace app {

/// Nothing but visible ASCII, as nearly all texts are: not worth a look at each character.
bool isPlain(std::string_view text);
/// A text out of a file as UTF-8. Files that are not UTF-8 are mostly Latin-1: when any byte is
/// wrong, all from 0x80 on are taken as the characters of that number.
std::string textAsUtf8(std::string text);
/// A file name as UTF-8, each byte that is none, and each NUL, replaced by U+FFFD.
std::string pathAsUtf8(std::string const& path);

/// The text with all that could steer a terminal or mislead its reader made visible: control
/// characters, bytes that are no UTF-8 and characters that reorder their neighbours become \n, \t,
/// \xNN or \u{NNNN}. Always one line of valid UTF-8; other text is kept as it is.
std::string escaped(std::string const& text);
/// The same for a file's name, whose own backslashes become two each.
std::string escapedPath(std::string path);

/// Terminal cells that an escaped text takes.
std::size_t cells(std::string_view text);
/// The start of an escaped text, respectively its end, cut with "…" to fit the cells.
/// The start has no more bytes than `most` besides: marks take no cells.
std::string keepStart(std::string const& text, std::size_t width,
                      std::size_t most = std::string::npos);
std::string keepEnd(std::string const& text, std::size_t width);

}  // namespace app

#endif  // QUAVEL_APPS_TEXT_H
