#ifndef QUAVEL_APPS_CONSOLE_H
#define QUAVEL_APPS_CONSOLE_H

#include <cstddef>
#include <string>

namespace app {

/// Cells in a line of the terminal; 80 when it is unknown.
std::size_t terminalWidth(int fd);

/// Standard error: messages, and a progress line below them.
class Console {
 public:
  Console();

  /// Prints "quavel: " and the message, which must be safe for a terminal.
  void printMessage(std::string const& message);
  /// The same about a file, whose name and problem are made safe.
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
