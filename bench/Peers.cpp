#include "Peers.h"

#include <libexif/exif-data.h>
#include <libraw/libraw.h>

#include <exiv2/exiv2.hpp>

namespace quavel::bench {
namespace {

bool readWithExiv2(std::string const& path, std::string const& /*extension*/) {
  try {
    auto const image = Exiv2::ImageFactory::open(path);
    image->readMetadata();
    return true;
  } catch (Exiv2::Error const&) {
    return false;
  }
}

bool readWithExif(std::string const& path, std::string const& extension) {
  if (extension != "jpeg" && extension != "jpg") {
    return false;
  }
  ExifData* const data = exif_data_new_from_file(path.c_str());
  exif_data_unref(data);
  return data != nullptr;
}

bool readWithRaw(std::string const& path, std::string const& /*extension*/) {
  // Its users keep one for many files: the object is large.
  static LibRaw raw;
  raw.set_dataerror_handler(nullptr, nullptr);
  bool const isRead = raw.open_file(path.c_str()) == LIBRAW_SUCCESS;
  raw.recycle();
  return isRead;
}

}  // namespace

std::vector<Peer> allPeers() {
  Exiv2::LogMsg::setLevel(Exiv2::LogMsg::mute);
  return {{"libexiv2", readWithExiv2}, {"libexif", readWithExif}, {"LibRaw", readWithRaw}};
}

}  // namespace quavel::bench
