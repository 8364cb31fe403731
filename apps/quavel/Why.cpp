#include "Why.h"

#include <quavel/QVMetadata.h>
#include <quavel/QVReader.h>

#include <cerrno>
#include <filesystem>
#include <system_error>

#include "Escape.h"
#include "WhyContent.h"
#include "WhyFields.h"
#include "WhyFormats.h"
#include "WhyWalk.h"

namespace app {

namespace why {

namespace fs = std::filesystem;

using quavel::QVReader;

namespace {

struct Format {
  char const* extension;
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

/// The extension as the library takes it from a path: any "." counts, and case does not.
std::string extensionOf(std::string const& path) {
  auto const dot = path.rfind('.');
  std::string extension = dot == std::string::npos ? "" : path.substr(dot + 1);
  if (extension.find('/') != std::string::npos) {
    return "";  // the "." was a folder's
  }
  for (char& letter : extension) {
    if (letter >= 'A' && letter <= 'Z') {
      letter = static_cast<char>(letter - 'A' + 'a');
    }
  }
  return extension;
}

Format const* formatOf(std::string const& extension) {
  for (auto const& format : kFormats) {
    if (extension == format.extension) {
      return &format;
    }
  }
  return nullptr;
}

std::string supportedExtensions() {
  std::string list;
  for (auto const& format : kFormats) {
    list += list.empty() ? "" : ", ";
    list += format.extension;
  }
  return list;
}

std::string cannotOpen(std::error_code const& error) {
  return "the file cannot be opened: " + error.message();
}

/// Why the path is nothing to be read; empty for a file with content. Nothing is opened: opening
/// a pipe would wait for its other end.
std::string whyNoFile(std::string const& path) {
  std::error_code error;
  auto const status = fs::status(path, error);
  if (!fs::exists(status)) {
    return cannotOpen(error);
  }
  if (fs::is_directory(status)) {
    return "it is a folder, not a file";
  }
  if (!fs::is_regular_file(status)) {
    return "it is not a regular file (a device, a pipe or a socket)";
  }
  return "";
}

std::string whyNoFormat(std::string const& extension) {
  std::string const subject = extension.empty()
                                  ? "the name has no extension"
                                  : "the extension \"" + escaped(extension) + "\" is not supported";
  return subject + "; it alone names the format, and must be one of " + supportedExtensions();
}

bool refuse(std::string const& path, std::string const& reason, std::ostream& out) {
  out << escaped(path) << ": no record: " << reason << ".\n";
  return false;
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

void explainRefusal(Walk const& walk, std::string const& path, std::ostream& out) {
  std::string reason = walk.reason;
  if (walk.isGivenUp()) {
    reason =
        "it asks for far more reads than a photo does: this walk over it was given up, and the "
        "library may have met a limit of its own";
  } else if (reason.empty()) {
    reason =
        "the library refuses it, but this walk over it found nothing wrong; a limit on the work "
        "for one file may have been exceeded";
  }
  refuse(path, reason, out);
  writeSteps(walk, out);
}

void explainRecord(Walk const& walk, quavel::QVMetadata const& record, std::string const& path,
                   Format const& format, std::ostream& out) {
  out << escaped(path) << ": a record, read as " << format.kind << ".\n";
  if (walk.isGivenUp()) {
    out << "  note: This walk over the file was given up for its length.\n";
  } else if (!walk.reason.empty()) {
    out << "  note: This walk would have refused the file: " << walk.reason
        << ". The record is what counts; please report the difference.\n";
  }
  writeSteps(walk, out);
  explainAbsences(walk, record, format.reader, format.kind, out);
}

bool explain(std::string const& path, std::ostream& out) {
  std::string const noFile = whyNoFile(path);
  if (!noFile.empty()) {
    return refuse(path, noFile, out);
  }
  std::string const extension = extensionOf(path);
  Format const* const format = formatOf(extension);
  if (format == nullptr) {
    return refuse(path, whyNoFormat(extension), out);
  }
  std::error_code error;
  auto const size = fs::file_size(path, error);
  Walk walk(path, static_cast<std::int64_t>(size));
  if (!error && !walk.isOpen()) {
    error.assign(errno, std::generic_category());
  }
  if (error) {
    return refuse(path, cannotOpen(error), out);
  }
  if (size == 0) {
    return refuse(path, "the file is empty", out);
  }

  QVReader const reader(path);  // it decides; the walk only explains
  format->walk(walk);
  walk.stream->baseOffset = 0;
  std::string const content = foreignContent(walk, extension);
  if (!content.empty()) {
    walk.notes.push_back("The file looks like " + content + "; its extension has it read as " +
                         format->kind);
  }
  if (!reader.metadata) {
    explainRefusal(walk, path, out);
    return false;
  }
  explainRecord(walk, *reader.metadata, path, *format, out);
  return true;
}

}  // namespace
}  // namespace why

bool explainFile(std::string const& path, std::ostream& out) { return why::explain(path, out); }

}  // namespace app
