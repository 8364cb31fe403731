#ifndef QUAVEL_APPS_PHOTO_H
#define QUAVEL_APPS_PHOTO_H

#include <string>
#include <string_view>

#include "photo/Outcome.h"

namespace app {

/// The extensions that name a format.
inline constexpr std::string_view kExtensions[] = {"tiff", "tif",  "dng", "nef", "cr2", "raf",
                                                   "arw",  "jpeg", "jpg", "nrw", "3fr", "cr3"};
/// All of them, separated by spaces.
std::string extensionList();

/// What follows the last ".", in lower case; empty when there is no ".".
std::string extensionOf(std::string_view path);
bool isPhotoExtension(std::string_view extension);

/// Reads one file. Opens nothing but a regular file, so it never waits for the writer of a FIFO.
Outcome readPhoto(Input input);

/// Reads one image from standard input, under the path "-".
Outcome readStandardInput(std::string const& extension);

}  // namespace app

#endif  // QUAVEL_APPS_PHOTO_H
