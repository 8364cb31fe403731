#include "quavel/QVReader.h"

#include "front/Formats.h"
#include "quavel/QVMStream.h"

namespace quavel {

QVReader::QVReader(std::string const& path) : metadata(detail::readPath(path)) {}

QVReader::QVReader(unsigned char* buffer, unsigned long const& length, std::string const& extension)
    : metadata(detail::readStream(std::make_shared<QVMStream>(buffer, length), extension)) {}

QVReader::~QVReader() = default;

std::string QVReader::getPathExtension(std::string const& path) const {
  return detail::extensionOf(path);
}

std::shared_ptr<QVMetadata> QVReader::createMetadata(std::string const& extension) const {
  auto const* const format = detail::formatOf(extension);
  return format == nullptr ? nullptr : format->makeRecord();
}

}  // namespace quavel
