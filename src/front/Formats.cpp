#include "front/Formats.h"

#include <algorithm>
#include <cerrno>
#include <new>
#include <system_error>
#include <utility>

#include "journal/Journal.h"
#include "journal/Reading.h"
#include "quavel/QV3FRImage.h"
#include "quavel/QVARWImage.h"
#include "quavel/QVCR2Image.h"
#include "quavel/QVCR3Image.h"
#include "quavel/QVDNGImage.h"
#include "quavel/QVJPEGImage.h"
#include "quavel/QVNRWImage.h"
#include "quavel/QVNefImage.h"
#include "quavel/QVRafImage.h"
#include "quavel/QVTiffImage.h"
#include "stream/PositionedFile.h"

namespace quavel::detail {

namespace {

/// Memory for a record of any class, as none adds members to QVMetadata. One storage type keeps
/// the library small: `make_shared` is compiled once, not for each class.
struct RecordStorage {
  RecordStorage() {}  // with `= default`, `make_shared` would set the bytes to zero
  ~RecordStorage() { record->~QVMetadata(); }

  QVMetadata* record;
  alignas(QVMetadata) unsigned char bytes[sizeof(QVMetadata)];
};

template <class Image>
std::shared_ptr<QVMetadata> make() {
  static_assert(sizeof(Image) == sizeof(QVMetadata));
  auto const storage = std::make_shared<RecordStorage>();
  storage->record = new (storage->bytes) Image;  // throws nothing, so `record` is always set
  return {storage, storage->record};             // points to the record and shares the storage
}

constexpr Format kFormats[] = {
    {"tiff", "TIFF", kTiff, make<QVTiffImage>}, {"tif", "TIFF", kTiff, make<QVTiffImage>},
    {"dng", "DNG", kTiff, make<QVDNGImage>},    {"nef", "NEF", kNef, make<QVNefImage>},
    {"cr2", "CR2", kTiff, make<QVCR2Image>},    {"raf", "RAF", kRaf, make<QVRafImage>},
    {"arw", "ARW", kArw, make<QVARWImage>},     {"jpeg", "JPEG", kJpeg, make<QVJPEGImage>},
    {"jpg", "JPEG", kJpeg, make<QVJPEGImage>},  {"nrw", "NRW", kTiff, make<QVNRWImage>},
    {"3fr", "3FR", kTiff, make<QV3FRImage>},    {"cr3", "CR3", kCr3, make<QVCR3Image>},
};

/// ASCII only: in a Turkish locale, the C library would not turn "TIF" into "tif".
char lowerCase(char letter) {
  return letter >= 'A' && letter <= 'Z' ? static_cast<char>(letter - 'A' + 'a') : letter;
}

void refuseExtension(Journal* journal, std::string const& extension) {
  std::string known;
  for (auto const& format : kFormats) {
    known.append(known.empty() ? "" : " ").append(format.extension);
  }
  if (extension.empty() || extension.find('/') != std::string::npos) {  // as in "a.d/photo"
    refuse(journal, QVReason::UnknownExtension, -1,
           "there is no extension; these name a format: {}", known);
    return;
  }
  auto const* const bytes = reinterpret_cast<std::uint8_t const*>(extension.data());
  // At most 100 bytes of it, so that the known extensions fit into the note too.
  QuotedBytes const quoted = {bytes, std::min<std::size_t>(extension.size(), 100)};
  refuse(journal, QVReason::UnknownExtension, -1,
         "the extension \"{}\" names no format; these do: {}", quoted, known);
}

}  // namespace

std::string extensionOf(std::string const& path) {
  // If only a folder's name has a ".", the result contains a "/" and so is not a known extension.
  auto const dot = path.rfind('.');
  return dot == std::string::npos ? std::string() : path.substr(dot + 1);
}

Format const* formatOf(std::string_view extension) {
  for (auto const& format : kFormats) {
    if (extension == format.extension) {
      return &format;
    }
  }
  return nullptr;
}

std::shared_ptr<QVMetadata> readPath(std::string const& path, Journal* journal) {
  std::string extension = extensionOf(path);
  std::transform(extension.begin(), extension.end(), extension.begin(), lowerCase);
  int fd = -1;
  auto stream = openReadAhead(path, &fd);
  if (journal != nullptr) {
    journal->fd = fd;  // for the file's size
  }
  if (journal != nullptr && fd == -1) {
    // Opening has failed: the stream has no bytes, so `readStream` refuses it too. The first
    // refusal counts.
    journal->systemError = errno;
    refuse(journal, QVReason::CannotOpen, -1, "the file cannot be opened: {}",
           std::generic_category().message(journal->systemError));
  }
  return readStream(std::move(stream), extension, journal);
}

std::shared_ptr<QVMetadata> readStream(std::shared_ptr<QVStream> stream,
                                       std::string const& extension, Journal* journal) {
  auto const* const format = formatOf(extension);
  if (format == nullptr) {
    refuseExtension(journal, extension);
    return nullptr;
  }
  auto const scope = ReadScope::begin(*stream, journal);
  std::int64_t const start = positionForNotes(journal, *stream);  // not used without a journal
  auto record = format->makeRecord();
  if (!record->read(stream)) {
    record = nullptr;
  }
  if (journal != nullptr) {
    journal->format = format->name;
    if (record) {
      noteAbsences(*format, *record, *journal);
    } else {
      noteOtherContent(*format, *stream, start, *journal);
    }
  }
  return record;
}

}  // namespace quavel::detail
