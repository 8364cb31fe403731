#include "photo/Photo.h"

#include <quavel/QVReader.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <ctime>
#include <exception>
#include <unordered_set>
#include <utility>

#include "photo/Field.h"
#include "photo/Reasons.h"

namespace app {

namespace {

using quavel::QVJournal;

constexpr std::size_t kMaxInput = std::size_t{1} << 30;  // bytes on standard input

Problem whyNotRegular(mode_t mode) {
  if (S_ISDIR(mode)) {  // only from a list of paths: a folder given as an argument is walked
    return {reason::kFolder, "a folder; give it as an argument to have its photos read"};
  }
  char const* const socketOrDevice = S_ISSOCK(mode) ? "socket" : "device";
  char const* const kind = S_ISFIFO(mode) ? "FIFO" : socketOrDevice;
  return {reason::kSpecialFile,
          std::string("a ") + kind + ", not a regular file; give a photo, or use --stdin"};
}

/// Why the path must not be given to the library; empty if it may.
Problem whyUnfit(std::string const& path) {
  struct stat status = {};
  if (::stat(path.c_str(), &status) == -1) {
    return reason::cannotOpen(errno);
  }
  return S_ISREG(status.st_mode) ? Problem() : whyNotRegular(status.st_mode);
}

/// All bytes of standard input; sets `problem` if they cannot all be read.
std::string readAll(Problem& problem) {
  constexpr std::size_t kStep = std::size_t{1} << 16;
  std::string bytes;
  while (bytes.size() <= kMaxInput) {
    std::size_t const size = bytes.size();
    bytes.resize(size + kStep);
    ssize_t const count = ::read(STDIN_FILENO, &bytes[size], kStep);
    bytes.resize(size + (count > 0 ? static_cast<std::size_t>(count) : 0));
    if (count == 0) {
      return bytes;
    }
    if (count == -1 && errno != EINTR) {
      problem = reason::cannotRead(errno);
      return bytes;
    }
  }
  problem = {reason::kTooLong, "longer than 1 GiB; give the file's path instead"};
  return bytes;
}

bool isDate(std::string const& text) {
  constexpr std::string_view kForm = "0000:00:00 00:00:00";  // 0: any digit
  bool const isWellFormed =
      std::equal(text.begin(), text.end(), kForm.begin(), kForm.end(),
                 [](char c, char form) { return form == '0' ? '0' <= c && c <= '9' : c == form; });
  std::tm time = {};
  char const* const end = ::strptime(text.c_str(), "%Y:%m:%d %H:%M:%S", &time);
  if (!isWellFormed || end != text.c_str() + text.size()) {  // of 96 seconds, it takes only the 9
    return false;
  }
  std::tm day = {};  // the date alone: a leap second would carry into the next day
  day.tm_year = time.tm_year;
  day.tm_mon = time.tm_mon;
  day.tm_mday = time.tm_mday;
  ::timegm(&day);  // turns a day that does not exist, such as 30 February, into a later one
  return day.tm_mday == time.tm_mday && time.tm_sec <= 60;  // `strptime` accepts 61
}

/// Fills the outcome from what `read` returns, unless it has a problem already. `read` may also set
/// `outcome.problem` and return null.
template <class Read>
void fill(Outcome& outcome, Detail detail, Read read) {
  if (outcome.problem) {
    return;
  }
  try {
    QVJournal journal(detail);
    outcome.record = read(journal);
    if (!outcome.record && !outcome.problem) {
      outcome.problem = reason::refusal(journal);
    }
    outcome.format = journal.format();
    if (detail == Detail::All) {
      outcome.notes = journal.notes();
      outcome.unnotedSteps = journal.furtherSteps();
    }
  } catch (std::exception const& error) {
    outcome.record = nullptr;
    outcome.problem = reason::failure(error);
  }
}

}  // namespace

std::string extensionOf(std::string_view path) {
  auto const dot = path.rfind('.');
  std::string extension(dot == std::string_view::npos ? "" : path.substr(dot + 1));
  for (char& c : extension) {
    c = 'A' <= c && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
  }
  return extension;
}

bool isPhotoExtension(std::string const& extension) {
  static quavel::QVReader const reader("");  // reads no file; is only asked for formats
  // Known extensions are cached, as asking for one makes a whole record; for others, it makes none.
  thread_local std::unordered_set<std::string> known;
  if (known.count(extension) == 0 && reader.createMetadata(extension) != nullptr) {
    known.insert(extension);
  }
  return known.count(extension) != 0;
}

std::string whyUnknown(std::string const& extension) {
  if (isPhotoExtension(extension)) {
    return {};
  }
  QVJournal journal(Detail::Refusals);
  journal.read(nullptr, 0, extension);  // refused for its extension, before the bytes matter
  return journal.refusal()->text;
}

std::string photoExtensions() {
  // The library lists the extensions only where it refuses an unknown one: "... these name a
  // format: tiff tif ...".
  std::string const refusal = whyUnknown("");
  return refusal.substr(refusal.rfind(": ") + 2);
}

Outcome readPhoto(Input input, Detail detail) {
  Outcome outcome;
  outcome.path = std::move(input.path);
  outcome.problem = std::move(input.problem);
  if (!input.isRegular && !outcome.problem) {  // not yet known to be a regular file
    outcome.problem = whyUnfit(outcome.path);
  }
  fill(outcome, detail, [&](QVJournal& journal) { return journal.read(outcome.path); });
  return outcome;
}

void tidyDates(quavel::QVMetadata& record, bool asIso) {
  for (auto* date : {&record.dateTimeOriginal, &record.dateTimeDigitized, &record.dateTime}) {
    if (isAbsent(*date)) {
      date->clear();
    } else if (asIso && isDate(*date)) {
      (*date)[4] = (*date)[7] = '-';
      (*date)[10] = 'T';
    }
  }
}

Outcome readStandardInput(std::string const& extension, Detail detail) {
  Outcome outcome;
  outcome.path = "-";
  fill(outcome, detail, [&](QVJournal& journal) {
    std::string bytes = readAll(outcome.problem);
    auto* const buffer = reinterpret_cast<unsigned char*>(bytes.data());
    return outcome.problem ? nullptr : journal.read(buffer, bytes.size(), extension);
  });
  return outcome;
}

}  // namespace app
