#ifndef QUAVEL_APPS_TEXT_H
#define QUAVEL_APPS_TEXT_H

#include <cstddef>
#include <string>
#include <string_view>

namespace app {

/// Whether all bytes are printable ASCII. Nearly all texts are, and need no conversion.
bool isPrintableAscii(std::string_view text);
/// A text from a file as UTF-8. If any of it is not valid UTF-8, all of it is taken for Latin-1.
std::string textAsUtf8(std::string text);
/// A file name as UTF-8: each byte that is not UTF-8, and each NUL, is replaced by U+FFFD. (A NUL
/// is in a path from a list that is split at the wrong character.)
std::string pathAsUtf8(std::string const& path);

/// Makes visible all that could steer a terminal or mislead its reader: control characters, bytes
/// that are not UTF-8 and characters that reorder their neighbours become \n, \t, \xNN or \u{NNNN}.
/// The result is always one line of valid UTF-8.
std::string escaped(std::string const& text);
/// The same for a path, which must be exact: its own backslashes are doubled, to tell them from
/// those of an escape.
std::string escapedPath(std::string path);

/// The number of terminal cells that an escaped text takes.
std::size_t widthOf(std::string_view text);
/// The start or the end of an escaped text, cut with "…" if it takes more than `width` cells. The
/// start is also cut at `maxBytes`, since combining marks take no cells, however many there are.
std::string keepStart(std::string const& text, std::size_t width,
                      std::size_t maxBytes = std::string::npos);
std::string keepEnd(std::string const& text, std::size_t width);

}  // namespace app

#endif  // QUAVEL_APPS_TEXT_H
