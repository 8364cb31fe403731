#include "Progress.h"

#include <sys/stat.h>

#include <algorithm>
#include <cstdio>
#include <exception>
#include <string>
#include <system_error>

#include "input/Source.h"
#include "terminal/Console.h"
#include "terminal/Interrupt.h"

namespace app {

namespace {

constexpr auto kQuietStart = std::chrono::milliseconds(500);   // without a progress line
constexpr auto kInterval = std::chrono::milliseconds(100);     // between updates of the line
constexpr auto kCountingSpell = std::chrono::milliseconds(1);  // then `countTotal` pauses
constexpr int kPauseFactor = 4;  // a pause is this many times as long as the spell before it

double secondsSince(std::chrono::steady_clock::time_point start) {
  return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}

/// Whether the inputs can be read twice: there is no list of paths, or it is a regular file.
bool isRereadable(std::string const& list) {
  struct stat status = {};
  bool const isFile = ::stat(list.c_str(), &status) == 0 && S_ISREG(status.st_mode);
  return list.empty() || (list != "-" && isFile);  // "-": standard input
}

std::string rate(std::size_t files, double seconds) {
  return std::to_string(static_cast<long>(static_cast<double>(files) / std::max(seconds, 1e-6)));
}

std::string duration(double seconds) {
  auto const whole = static_cast<long>(seconds) + 1;  // never "0 s"
  if (whole < 60) {
    return std::to_string(whole) + " s";
  }
  std::string const minutes = std::to_string(whole / 60 % 60) + " min";
  return whole < 3600 ? minutes : std::to_string(whole / 3600) + " h " + minutes;
}

}  // namespace

Progress::Progress(Console& console, Options const& options)
    : console_(console),
      options_(options),
      showsLine_(console.isTerminal() && !options.isQuiet),
      nextTick_(start_ + kQuietStart) {}

Progress::~Progress() {
  console_.hideProgress();
  {
    std::lock_guard<std::mutex> const lock(mutex_);
    isEnding_ = true;
  }
  endSignal_.notify_all();
  if (totalCounter_.joinable()) {
    totalCounter_.join();
  }
}

void Progress::tick() {
  auto const now = Clock::now();
  if (!showsLine_ || now < nextTick_) {
    return;
  }
  if (nextTick_ == start_ + kQuietStart) {  // the first update
    startCountingTotal();
  }
  nextTick_ = now + kInterval;
  console_.showProgress(line(secondsSince(start_)));
}

void Progress::startCountingTotal() {
  if (!isRereadable(options_.inputs.list)) {
    return;
  }
  interrupt::BlockSignals const block;  // inherited by the new thread, which so gets no signals
  try {
    totalCounter_ = std::thread([this] {
      try {
        countTotal();
      } catch (std::exception const&) {  // the total stays unknown
      }
    });
  } catch (std::system_error const&) {  // no thread: the total stays unknown too
  }
}

void Progress::countTotal() {
  Source source(options_.inputs, [](auto&&...) {});  // drops remarks: the run itself prints them
  Input input;
  std::size_t count = 0;
  auto spellStart = Clock::now();
  while (source.next(input)) {
    ++count;
    // Reading photos comes first: counting keeps the disk busy for a fifth of the time at most.
    auto const spell = Clock::now() - spellStart;
    if (spell >= kCountingSpell) {
      std::unique_lock<std::mutex> lock(mutex_);
      if (endSignal_.wait_for(lock, kPauseFactor * spell, [this] { return isEnding_; })) {
        return;
      }
      spellStart = Clock::now();
    }
  }
  total_ = count;
}

std::string Progress::line(double seconds) const {
  std::size_t const files = records_ + failures_;
  std::size_t const total = total_;
  bool const isTotalKnown = total > 0 && total >= files;  // files may be added after the count
  std::string text = std::to_string(files);
  if (isTotalKnown) {
    text += " of " + std::to_string(total);
  }
  text += " files, " + rate(files, seconds) + " files/s";
  if (isTotalKnown && files > 0) {
    double const secondsPerFile = seconds / static_cast<double>(files);
    text += ", " + duration(secondsPerFile * static_cast<double>(total - files)) + " left";
  }
  return text;
}

void Progress::sumUp() {
  std::size_t const files = records_ + failures_;
  // Of a single file, the output has said all: the record or, with --why, why there is none.
  bool const isOutputEnough = files == 1 && (failures_ == 0 || options_.form.isExplanation());
  if (options_.isQuiet || isOutputEnough) {
    return;
  }
  double const seconds = secondsSince(start_);
  char time[32];
  std::snprintf(time, sizeof time, "%.3f s", seconds);
  std::string const shown =
      options_.form.conditions.empty() ? "" : std::to_string(shown_) + " shown, ";
  console_.printMessage(std::to_string(files) + (files == 1 ? " file, " : " files, ") +
                        std::to_string(records_) + (records_ == 1 ? " record, " : " records, ") +
                        std::to_string(failures_) + " without record, " + shown + time + ", " +
                        rate(files, seconds) + " files/s");
}

}  // namespace app
