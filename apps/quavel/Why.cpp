#include "Why.h"

#include <filesystem>
#include <string_view>
#include <system_error>

#include "WhyContent.h"
#include "WhyFields.h"
#include "WhyFormats.h"
#include "WhyWalk.h"
#include "photo/Photo.h"
#include "terminal/Escape.h"

namespace app {

namespace why {

namespace {

struct Format {
  std::string_view extension;
  char const* kind;
  Reader reader;
  void (*walk)(Walk&);
};

constexpr Format kFormats[] = {
    {"tiff", "TIFF", kTiffReader, walkTiff}, {"tif", "TIFF", kTiffReader, walkTiff},
    {"dng", "DNG", kTiffReader, walkTiff},   {"nef", "NEF", kNefReader, walkNef},
    {"cr2", "CR2", kTiffReader, walkTiff},   {"raf", "RAF", kRafReader, walkRaf},
    {"arw", "ARW", kArwReader, walkArw},     {"jpeg", "JPEG", kJpegReader, walkJpeg},
    {"jpg", "JPEG", kJpegReader, walkJpeg},  {"nrw", "NRW", kTiffReader, walkTiff},
    {"3fr", "3FR", kTiffReader, walkTiff},   {"cr3", "CR3", kCr3Reader, walkCr3},
};

Format const* formatOf(std::string_view extension) {
  for (auto const& format : kFormats) {
    if (extension == format.extension) {
      return &format;
    }
  }
  return nullptr;
}

/// The size of a regular file; 0 for anything else. Nothing is opened: opening a FIFO would wait
/// for its other end.
std::int64_t sizeOfFile(std::string const& path) {
  std::error_code error;
  if (!std::filesystem::is_regular_file(path, error)) {
    return 0;
  }
  auto const size = std::filesystem::file_size(path, error);
  return error ? 0 : static_cast<std::int64_t>(size);
}

void writeSteps(Walk const& walk, std::ostream& out) {
  for (auto const& step : walk.steps) {
    out << "  read: " << step << '\n';
  }
  if (walk.furtherSteps != 0) {
    out << "  read: " << walk.furtherSteps << " more\n";
  }
  for (auto const& note : walk.notes) {
    out << "  note: " << note << ".\n";
  }
}

void explainRefusal(Walk const& walk, std::ostream& out) {
  if (!walk.limit().empty()) {
    out << "no record: " << walk.limit()
        << "; this walk gives up there, as the library may have done.\n";
  } else if (!walk.reason.empty()) {
    out << "no record: " << walk.reason << ".\n";
  } else {
    out << "no record: the library refuses it, but this walk over it found nothing wrong; a limit "
           "on the work for one file may have been exceeded.\n";
  }
  writeSteps(walk, out);
}

void explainRecord(Walk const& walk, Outcome const& outcome, Format const& format,
                   std::ostream& out) {
  out << "a record, read as " << format.kind << ".\n";
  if (!walk.limit().empty()) {
    out << "  note: This walk was given up: " << walk.limit() << ".\n";
  } else if (!walk.reason.empty()) {
    out << "  note: This walk would have refused the file: " << walk.reason
        << ". The record is what counts; please report the difference.\n";
  }
  writeSteps(walk, out);
  explainAbsences(walk, outcome, format.reader, format.kind, out);
}

void explainContent(Outcome const& outcome, Format const& format, Walk& walk, std::ostream& out) {
  format.walk(walk);
  walk.stream->baseOffset = 0;
  std::string const content = foreignContent(walk, std::string(format.extension));
  if (!content.empty()) {
    walk.notes.push_back("The file looks like " + content + "; its extension has it read as " +
                         format.kind);
  }
  if (outcome.record) {
    explainRecord(walk, outcome, format, out);
  } else {
    explainRefusal(walk, out);
  }
}

}  // namespace
}  // namespace why

bool explainFile(std::string const& path, std::ostream& out) {
  out << escaped(path) << ": ";
  Outcome const outcome = readPhoto({path, false, ""});  // decides; the walk only explains
  auto const* const format = why::formatOf(extensionOf(path));
  std::int64_t const size = format == nullptr ? 0 : why::sizeOfFile(path);
  if (size > 0) {
    why::Walk walk(path, size);
    if (walk.isOpen()) {
      why::explainContent(outcome, *format, walk, out);
      return outcome.record != nullptr;
    }
  }
  if (!outcome.record) {
    out << "no record: it " << escaped(outcome.error) << ".\n";
    return false;
  }
  out << "a record, but the file has gone since it was read.\n";
  return true;
}

}  // namespace app
