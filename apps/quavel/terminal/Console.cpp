#include "terminal/Console.h"

#include <sys/ioctl.h>
#include <unistd.h>

#include <cerrno>
#include <string_view>

#include "terminal/Interrupt.h"
#include "terminal/Text.h"

namespace app {

namespace {

constexpr std::string_view kEraseLine = "\r\x1b[K";

/// What cannot be said on standard error cannot be said at all.
void write(std::string_view bytes) {
  while (!bytes.empty()) {
    ssize_t const count = ::write(STDERR_FILENO, bytes.data(), bytes.size());
    if (count > 0) {
      bytes.remove_prefix(static_cast<std::size_t>(count));
    } else if (errno != EINTR) {
      return;
    }
  }
}

}  // namespace

Console::Console() : isTerminal_(::isatty(STDERR_FILENO) == 1) {}

void Console::say(std::string const& message) {
  hideProgress();
  write("quavel: " + message + "\n");
}

void Console::sayOf(std::string const& path, std::string const& problem) {
  say((path.empty() ? "''" : escaped(path)) + ": " + escaped(problem));
}

void Console::showProgress(std::string const& line) {
  winsize size = {};
  bool const isKnown = ::ioctl(STDERR_FILENO, TIOCGWINSZ, &size) == 0 && size.ws_col > 0;
  isProgressShown_ = true;
  interrupt::setProgressShown(true);
  write(std::string(kEraseLine) + keepStart(line, isKnown ? size.ws_col - 1U : 79U));
}

void Console::hideProgress() {
  if (isProgressShown_) {
    write(kEraseLine);
    isProgressShown_ = false;
    interrupt::setProgressShown(false);
  }
}

}  // namespace app
