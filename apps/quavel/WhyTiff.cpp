#include <quavel/QVTiffImageFileDirectoryEntry.h>

#include <algorithm>
#include <string>
#include <vector>

#include "WhyDirectory.h"
#include "WhyFormats.h"
#include "WhyNames.h"

namespace app::why {

namespace {

// The library's limit.
constexpr std::size_t kMostSubIFDs = 64;

// What is named of SubIFDs that were passed over.
constexpr std::size_t kMostNamed = 4;

bool isReduced(Value const& subfileType) { return (subfileType->longValue() & 1U) != 0; }

/// Reads one SubIFD. True: `full` holds it when it is of full size, else `why` tells what it is.
bool examineSubIFD(Walk& walk, std::string const& name, std::uint32_t offset, Directory& full,
                   std::string& why) {
  auto const subIFD =
      walkDirectory(walk, name, offset,
                    {tag::ImageWidth, tag::ImageLength, tag::Orientation, tag::NewSubfileType});
  Value type;
  if (!subIFD || !walkValue(walk, *subIFD, tag::NewSubfileType, "", type)) {
    return false;
  }
  if (!type) {
    why = subIFD->text() + " has no " + tagText(tag::NewSubfileType);
  } else if (isReduced(type)) {
    why = subIFD->text() + " declares a reduced image too";
  } else {
    full = subIFD;
  }
  return true;
}

Directory stopWithoutFullImage(Walk& walk, std::string const& why,
                               std::vector<std::string> const& notes) {
  walk.stop(why);
  walk.notes.insert(walk.notes.end(), notes.begin(), notes.end());
  return std::nullopt;
}

Directory chooseSubIFD(Walk& walk, WalkedDirectory const& mainIFD) {
  auto const entry = mainIFD.ifd->entryForTag(tag::SubIFDs);
  std::string const subject = mainIFD.text() + " declares a reduced image (NewSubfileType bit 0)";
  std::size_t const count = entry && entry->values ? entry->values->size() : 0;
  if (count == 0) {
    return stopWithoutFullImage(
        walk, subject + " and names no 0x014a SubIFDs where the full image could be", {});
  }
  std::vector<std::string> notes;
  for (std::size_t i = 0; i < std::min(count, kMostSubIFDs); ++i) {
    Directory full;
    std::string why;
    std::string const name = "SubIFD " + std::to_string(i + 1) + " of " + std::to_string(count);
    if (!examineSubIFD(walk, name, (*entry->values)[i]->longValue(), full, why) || full) {
      return full;
    }
    if (i < kMostNamed) {
      notes.push_back(why);
    }
  }
  if (count > kMostSubIFDs) {
    walk.exceed("none of the first " + std::to_string(kMostSubIFDs) + " of its " +
                std::to_string(count) + " SubIFDs says that it is the full image");
    return std::nullopt;
  }
  return stopWithoutFullImage(walk,
                              subject + " and none of its " + std::to_string(count) +
                                  " SubIFDs says that it is the full image",
                              notes);
}

Directory chooseFullImage(Walk& walk, WalkedDirectory const& mainIFD) {
  Value type;
  if (!walkValue(walk, mainIFD, tag::NewSubfileType, "", type)) {
    return std::nullopt;
  }
  return type && isReduced(type) ? chooseSubIFD(walk, mainIFD) : mainIFD;
}

void walkExif(Walk& walk, WalkedDirectory const& mainIFD) {
  Directory exifIFD;
  if (!walkPointer(walk, mainIFD, tag::ExifIFDPointer, "the Exif IFD",
                   {tag::DateTimeOriginal, tag::OffsetTimeOriginal, tag::DateTimeDigitized},
                   exifIFD)) {
    return;
  }
  if (exifIFD) {
    walkDates(walk, *exifIFD, true);
    return;
  }
  for (auto const* field : {"dateTimeOriginal", "dateTimeDigitized"}) {
    walk.absent(field, missingText(mainIFD, tag::ExifIFDPointer));
  }
}

}  // namespace

void walkTiff(Walk& walk) {
  auto const mainIFD =
      walkFirstDirectory(walk, "",
                         {tag::ImageWidth, tag::ImageLength, tag::Orientation, tag::ExifIFDPointer,
                          tag::SubIFDs, tag::NewSubfileType, tag::DateTime});
  if (!mainIFD || !walkNumber(walk, *mainIFD, tag::Orientation, "orientation") ||
      !walkText(walk, *mainIFD, tag::DateTime, "dateTime")) {
    return;
  }
  auto const full = chooseFullImage(walk, *mainIFD);
  if (full && walkNumber(walk, *full, tag::ImageWidth, "width") &&
      walkNumber(walk, *full, tag::ImageLength, "height")) {
    walkExif(walk, *mainIFD);
  }
}

}  // namespace app::why
