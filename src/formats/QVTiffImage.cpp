#include "quavel/QVTiffImage.h"

#include "formats/Steps.h"
#include "tiff/Tags.h"

namespace quavel {

using namespace detail;

namespace {

/// The first SubIFD that has NewSubfileType and is not a reduced image; null: none, or a failure.
DirectoryPointer readFullImageSubIFD(std::shared_ptr<QVStream>& stream,
                                     DirectoryPointer const& mainIFD) {
  Journal* const journal = journalOf(*stream);
  auto const subIFDs = findEntry(mainIFD, tag::SubIFDs);
  auto const count = static_cast<std::uint32_t>(subIFDs.size());
  for (std::uint32_t i = 0; i < count; ++i) {
    // The SubIFD's Orientation is not used (the main IFD's is). As `TagList` says, it is listed so
    // that a malformed one refuses the file.
    auto subIFD =
        readDirectoryAt(stream, subIFDName(i, count), subIFDs[i]->longValue(),
                        {tag::ImageWidth, tag::ImageLength, tag::Orientation, tag::NewSubfileType});
    ValuePointer type = nullptr;  // stays null if the entry is absent
    if (!subIFD || !findNumber(subIFD, tag::NewSubfileType, type)) {
      return nullptr;
    }
    // By TIFF, no NewSubfileType means a full image. In a SubIFD that is not trusted: it could as
    // well be a preview.
    if (type != nullptr && !isReducedImage(type->longValue())) {
      return subIFD;
    }
    noteHint(
        journal, QVReason::PassedOver, positionOf(subIFD),
        type == nullptr ? "{} has no 0x00fe NewSubfileType" : "{} declares a reduced image too",
        placed(subIFD));
  }
  refuse(journal, QVReason::MissingPart, positionOf(mainIFD),
         count == 0 ? "{} declares a reduced image (NewSubfileType bit 0) and names no 0x014a "
                      "SubIFDs where the full image could be"
                    : "{} declares a reduced image (NewSubfileType bit 0) and none of its {} "
                      "SubIFDs says that it is the full image",
         placed(mainIFD), count);  // the first pattern has no place for the count
  return nullptr;
}

/// The directory of the full-size image; null when there is none, or on failure.
DirectoryPointer chooseFullImageIFD(std::shared_ptr<QVStream>& stream,
                                    DirectoryPointer const& mainIFD) {
  ValuePointer type = nullptr;
  if (!findNumber(mainIFD, tag::NewSubfileType, type)) {
    return nullptr;
  }
  bool const isReduced = type != nullptr && isReducedImage(type->longValue());
  return isReduced ? readFullImageSubIFD(stream, mainIFD) : mainIFD;
}

}  // namespace

bool QVTiffImage::read(std::shared_ptr<QVStream>& stream) {
  auto const scope = ReadScope::beginOrJoin(*stream);
  auto const mainIFD = readFirstDirectory(
      stream, {tag::ImageWidth, tag::ImageLength, tag::Orientation, tag::ExifIFDPointer,
               tag::SubIFDs, tag::NewSubfileType, tag::DateTime});
  if (!mainIFD || !storeInfoFromMainIFD(mainIFD)) {
    return false;
  }

  auto const fullImageIFD = chooseFullImageIFD(stream, mainIFD);
  if (!fullImageIFD || !storeInfoFromFullImageIFD(fullImageIFD)) {
    return false;
  }

  DirectoryPointer exifIFD;  // not used further; OffsetTimeOriginal in it is only checked
  return readAndStoreExifIFD(
      *this, stream, mainIFD,
      {tag::DateTimeOriginal, tag::OffsetTimeOriginal, tag::DateTimeDigitized}, exifIFD);
}

bool QVTiffImage::storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  return storeOptionalNumber(ifd, tag::Orientation, orientation) &&
         storeOptionalText(ifd, tag::DateTime, dateTime);
}

bool QVTiffImage::storeInfoFromFullImageIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  return storeOptionalNumber(ifd, tag::ImageWidth, width) &&
         storeOptionalNumber(ifd, tag::ImageLength, height);
}

}  // namespace quavel
