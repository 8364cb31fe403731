#ifndef QUAVEL_APPS_CONSOLE_H
#define QUAVEL_APPS_CONSOLE_H

#include <cstddef>
#include <string>

namespace app {

/// The width in cells of the terminal that `fd` is open on; 80 when the width is unknown.
std::size_t terminalWidth(int fd);

/// Standard error: messages, and on a terminal a progress line below them.
class Console {
 public:
  Console();

  /// Prints "quavel: " and the message, which must be safe for a terminal (see `escaped`).
  void printMessage(std::string const& message);
  /// Prints "quavel: path: problem", with both escaped.
  void printFileMessage(std::string const& path, std::string const& problem);

  bool isTerminal() const { return isTerminal_; }
  void showProgress(std::string const& line);
  void hideProgress();

 private:
  bool isTerminal_;
  bool isProgressShown_ = false;
};

}  // namespace app

#endif  // QUAVEL_APPS_CONSOLE_H
