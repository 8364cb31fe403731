#include "quavel/QVReader.h"

#include <algorithm>
#include <string_view>
#include <utility>

#include "front/RecordOrigin.h"
#include "quavel/QV3FRImage.h"
#include "quavel/QVARWImage.h"
#include "quavel/QVCR2Image.h"
#include "quavel/QVCR3Image.h"
#include "quavel/QVDNGImage.h"
#include "quavel/QVJPEGImage.h"
#include "quavel/QVMStream.h"
#include "quavel/QVNRWImage.h"
#include "quavel/QVNefImage.h"
#include "quavel/QVRafImage.h"
#include "quavel/QVTiffImage.h"
#include "stream/PositionedFile.h"

namespace quavel {

namespace {

template <class Format>
std::shared_ptr<QVMetadata> make() {
  return std::make_shared<Format>();
}

/// ASCII alone: in a Turkish locale the C library would not make "tif" of "TIF".
char lowerCase(char letter) {
  return letter >= 'A' && letter <= 'Z' ? static_cast<char>(letter - 'A' + 'a') : letter;
}

struct ExtensionRow {
  std::string_view extension;
  std::shared_ptr<QVMetadata> (*makeRecord)();
};

constexpr ExtensionRow kExtensions[] = {
    {"tiff", make<QVTiffImage>}, {"tif", make<QVTiffImage>},  {"dng", make<QVDNGImage>},
    {"nef", make<QVNefImage>},   {"cr2", make<QVCR2Image>},   {"raf", make<QVRafImage>},
    {"arw", make<QVARWImage>},   {"jpeg", make<QVJPEGImage>}, {"jpg", make<QVJPEGImage>},
    {"nrw", make<QVNRWImage>},   {"3fr", make<QV3FRImage>},   {"cr3", make<QVCR3Image>},
};

/// The record that a read of the whole stream fills, or null.
std::shared_ptr<QVMetadata> readRecord(QVReader const& reader, std::string const& extension,
                                       std::shared_ptr<QVStream> stream) {
  auto record = reader.createMetadata(extension);
  if (!record) {
    return nullptr;
  }
  detail::RecordOrigin::setReadersOwn(*record, true);
  bool const isRead = record->read(stream);
  detail::RecordOrigin::setReadersOwn(*record, false);
  return isRead ? record : nullptr;
}

}  // namespace

QVReader::QVReader(std::string const& path) {
  std::string extension = getPathExtension(path);
  std::transform(extension.begin(), extension.end(), extension.begin(), lowerCase);
  metadata = readRecord(*this, extension, detail::openReadAhead(path));
}

QVReader::QVReader(unsigned char* buffer, unsigned long const& length,
                   std::string const& extension) {
  metadata = readRecord(*this, extension, std::make_shared<QVMStream>(buffer, length));
}

QVReader::~QVReader() = default;

std::string QVReader::getPathExtension(std::string const& path) const {
  // A "." in a folder's name counts too when the file's has none; no format is named so.
  auto const dot = path.rfind('.');
  return dot == std::string::npos ? std::string() : path.substr(dot + 1);
}

std::shared_ptr<QVMetadata> QVReader::createMetadata(std::string const& extension) const {
  for (auto const& row : kExtensions) {
    if (extension == row.extension) {
      return row.makeRecord();
    }
  }
  return nullptr;
}

}  // namespace quavel
