#include "terminal/Console.h"

#include <sys/ioctl.h>
#include <unistd.h>

#include "terminal/Interrupt.h"
#include "terminal/Text.h"

namespace app {

std::size_t terminalWidth(int fd) {
  winsize size = {};
  bool const isKnown = ::ioctl(fd, TIOCGWINSZ, &size) == 0 && size.ws_col > 0;
  return isKnown ? size.ws_col : 80;
}

Console::Console() : isTerminal_(::isatty(STDERR_FILENO) == 1) {}

void Console::printMessage(std::string const& message) {
  hideProgress();
  // A failure is ignored: there is no other place to report it.
  writeAll(STDERR_FILENO, "quavel: " + message + "\n");
}

void Console::printFileMessage(std::string const& path, std::string const& problem) {
  printMessage((path.empty() ? "''" : escapedPath(path)) + ": " + escaped(problem));
}

void Console::showProgress(std::string const& line) {
  isProgressShown_ = true;
  interrupt::setProgressShown(true);  // first, so that an interrupt erases a half-written line too
  // Some terminals go to the next line once the last cell is written, so that cell stays free.
  writeAll(STDERR_FILENO, kEraseLine + keepStart(line, terminalWidth(STDERR_FILENO) - 1));
}

void Console::hideProgress() {
  if (isProgressShown_) {
    writeAll(STDERR_FILENO, kEraseLine);
    isProgressShown_ = false;
    interrupt::setProgressShown(false);
  }
}

}  // namespace app
