#ifndef QUAVEL_APPS_ESCAPE_H
#define QUAVEL_APPS_ESCAPE_H

#include <string>

namespace app {

/// The text with all that could steer a terminal or mislead its reader made visible: control
/// characters, bytes that are no UTF-8 and characters that reorder their neighbours become \n, \t,
/// \xNN or \u{NNNN}. Always one line of valid UTF-8; other text is kept as it is.
std::string escaped(std::string const& text);

}  // namespace app

#endif  // QUAVEL_APPS_ESCAPE_H
