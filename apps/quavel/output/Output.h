#ifndef QUAVEL_APPS_OUTPUT_H
#define QUAVEL_APPS_OUTPUT_H

#include <string>
#include <string_view>
#include <vector>

namespace app {

class Console;

/// Thrown when nobody reads the output any more.
struct OutputClosed {};

/// Standard output. What is added in one piece stays whole, even when the command is interrupted
/// (in a pipe, up to PIPE_BUF bytes).
class Output {
 public:
  explicit Output(Console& console);

  /// Holds the piece until the next `flush`.
  void add(std::string_view piece);
  /// Writes what is held. Throws OutputClosed, or std::system_error for any other failure.
  void flush();
  /// Writes a head like "[" now, the tail at `finish` or on an interrupt. The tail is not copied.
  void enclose(std::string_view head, char const* tail);
  /// Flushes, and writes the tail unless an earlier call has.
  void finish();
  /// Tries to finish after a failure; throws nothing.
  void giveUp() noexcept;

  bool isTerminal() const { return isTerminal_; }

 private:
  Console& console_;
  bool isTerminal_;
  bool isFile_;  // a regular file, which gets all pieces in one write
  std::string pending_;
  std::vector<std::size_t> ends_;  // where each piece ends in `pending_`
  char const* tail_ = nullptr;
};

}  // namespace app

#endif  // QUAVEL_APPS_OUTPUT_H
