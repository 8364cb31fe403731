#ifndef QUAVEL_APPS_TEXT_H
#define QUAVEL_APPS_TEXT_H

#include <cstddef>
#include <string>
#include <string_view>

namespace app {

/// Whether it is all visible ASCII. Nearly all texts are, and are not looked at further.
bool isPlain(std::string_view text);
/// A text from a file as UTF-8. Texts that are not UTF-8 are mostly Latin-1: when any byte is not
/// valid UTF-8, the whole text is read as Latin-1.
std::string textAsUtf8(std::string text);
/// A file name as UTF-8: each byte that is not UTF-8, and each NUL, is replaced by U+FFFD.
std::string pathAsUtf8(std::string const& path);

/// The text with all that could steer a terminal or mislead its reader made visible: control
/// characters, bytes that are not UTF-8 and characters that reorder their neighbours become \n, \t,
/// \xNN or \u{NNNN}. Always one line of valid UTF-8; other text is kept as it is.
std::string escaped(std::string const& text);
/// The same for a file's name, in which each backslash is doubled.
std::string escapedPath(std::string path);

/// Terminal cells that an escaped text takes.
std::size_t cells(std::string_view text);
/// The start or the end of an escaped text, cut with "…" if it takes more than `width` cells. The
/// start is also cut after `most` bytes, since any number of combining marks takes no cells.
std::string keepStart(std::string const& text, std::size_t width,
                      std::size_t most = std::string::npos);
std::string keepEnd(std::string const& text, std::size_t width);

}  // namespace app

#endif  // QUAVEL_APPS_TEXT_H
