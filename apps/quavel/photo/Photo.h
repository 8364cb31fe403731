#ifndef QUAVEL_APPS_PHOTO_H
#define QUAVEL_APPS_PHOTO_H

#include <quavel/QVJournal.h>

#include <string>
#include <string_view>

#include "photo/Outcome.h"

namespace app {

using Detail = quavel::QVJournal::Detail;

/// The text after the path's last ".", in lower case; empty when the path has no ".".
std::string extensionOf(std::string_view path);
/// Whether an extension in lower case names a format.
bool isPhotoExtension(std::string const& extension);
/// Why an extension names no format; empty when it names one.
std::string whyUnknown(std::string const& extension);
/// All extensions that name a format: "tiff tif dng ...".
std::string photoExtensions();

/// Reads one file. Opens nothing but a regular file, so it never waits for the writer of a FIFO.
/// The outcome has notes only with `Detail::All`.
Outcome readPhoto(Input input, Detail detail);

/// Clears dates that are only blanks and colons. With `asIso`, well-formed Exif dates become
/// "2018-02-21T12:08:56"; any other text stays as it is.
void tidyDates(quavel::QVMetadata& record, bool asIso);

/// Reads one image from standard input, under the path "-".
Outcome readStandardInput(std::string const& extension, Detail detail);

}  // namespace app

#endif  // QUAVEL_APPS_PHOTO_H
