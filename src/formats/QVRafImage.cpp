#include "quavel/QVRafImage.h"

#include <array>

#include "formats/Steps.h"
#include "stream/Bytes.h"
#include "tiff/Tags.h"

namespace quavel {

using namespace detail;

namespace {

constexpr std::array<std::uint8_t, 8> kMagic = {'F', 'U', 'J', 'I', 'F', 'I', 'L', 'M'};

// Positions in the file's header, which is big-endian even if the sections are not.
constexpr long kImageOffsetPosition = 84;
constexpr long kRawSectionOffsetPosition = 100;

// In the JPEG: SOI, the APP1 marker, a length (2 bytes each), "Exif" and two zeros.
constexpr std::uint32_t kBytesBeforeTiffHeader = 12;

bool readSectionOffset(std::shared_ptr<QVStream>& stream, char const* section, long position,
                       std::uint32_t& offset) {
  stream->byteOrder = ByteOrder::BigEndian;
  stream->setOffset(position);
  if (!stream->readLong(&offset)) {
    return refuseCut(journalOf(*stream), position, sizeof(offset), "the offset of {}", section);
  }
  noteStep(journalOf(*stream), position, "offset of {} at {}: {}", section, Offset{position},
           Offset{offset});
  return true;
}

/// Whether a JPEG begins with SOI and an Exif segment. The segment's length, bytes 4 and 5, may be
/// any.
bool opensWithExif(std::array<std::uint8_t, kBytesBeforeTiffHeader> const& bytes) {
  return std::memcmp(bytes.data(), "\xff\xd8\xff\xe1", 4) == 0 &&
         std::memcmp(bytes.data() + 6, "Exif\0\0", 6) == 0;
}

/// Notes what the embedded image begins with, if that may be why its directories are not found.
void noteOtherOpening(QVStream& stream, std::uint32_t imageOffset) {
  Journal* const journal = journalOf(stream);
  // `baseOffset` is still at the TIFF header in the image: this offset is usually -12.
  if (!wantsAllNotes(journal) || !seek(stream, imageOffset - stream.baseOffset)) {
    return;
  }
  std::array<std::uint8_t, kBytesBeforeTiffHeader> opening = {};
  std::size_t const received = readUpTo(stream, opening.data(), opening.size());
  if (received != 0 && !opensWithExif(opening)) {
    noteHint(journal, QVReason::OtherOpening, imageOffset,
             "The embedded JPEG at {} begins with {}; wanted: ff d8, then at once an Exif segment "
             "(ff e1, its length, 45 78 69 66 00 00)",
             Offset{imageOffset}, HexBytes{opening.data(), received});
  }
}

}  // namespace

bool QVRafImage::read(std::shared_ptr<QVStream>& stream) {
  auto const scope = ReadScope::beginOrJoin(*stream);
  Journal* const journal = scope.reading().journal;
  isRaw = true;

  std::array<std::uint8_t, kMagic.size()> magic;
  if (!readExactly(*stream, magic.data(), magic.size())) {
    return refuseCut(journal, 0, magic.size(), "the file's magic \"FUJIFILM\"");
  }
  if (magic != kMagic) {
    return refuse(journal, QVReason::OtherKind, 0, "the file begins with {}, not with \"FUJIFILM\"",
                  HexBytes{magic.data(), magic.size()});
  }

  std::uint32_t imageOffset = 0;
  if (!readSectionOffset(stream, "the embedded JPEG", kImageOffsetPosition, imageOffset)) {
    return false;
  }
  // Added in 32 bits on purpose, as all offsets of the file have 32 bits: a sum beyond 4 GB, which
  // only a damaged file has, wraps around.
  stream->baseOffset = imageOffset + kBytesBeforeTiffHeader;
  stream->setOffset(0);
  if (!readMainIFD(stream)) {
    noteOtherOpening(*stream, imageOffset);
    return false;
  }

  stream->baseOffset = 0;
  std::uint32_t rawSectionOffset = 0;
  if (!readSectionOffset(stream, "the raw section", kRawSectionOffsetPosition, rawSectionOffset)) {
    return false;
  }
  stream->baseOffset = rawSectionOffset;
  stream->setOffset(0);
  return readFujiIFD(stream);
}

bool QVRafImage::readMainIFD(std::shared_ptr<QVStream>& stream) {
  auto const scope = ReadScope::beginOrJoin(*stream);
  auto const mainIFD = readFirstDirectory(stream, {tag::Orientation, tag::ExifIFDPointer},
                                          "the embedded JPEG's Exif segment");
  if (!mainIFD || !storeInfoFromMainIFD(mainIFD)) {
    return false;
  }

  DirectoryPointer exifIFD;  // not used further
  return readAndStoreExifIFD(*this, stream, mainIFD,
                             {tag::DateTimeOriginal, tag::OffsetTimeOriginal}, exifIFD);
}

bool QVRafImage::readFujiIFD(std::shared_ptr<QVStream>& stream) {
  auto const scope = ReadScope::beginOrJoin(*stream);
  auto const rawSectionIFD =
      readFirstDirectory(stream, {tag::RafDirectoryPointer}, "the raw section");
  if (!rawSectionIFD) {
    return false;
  }

  DirectoryPointer vendorIFD;
  if (!followPointer(stream, rawSectionIFD, tag::RafDirectoryPointer, "the vendor directory",
                     {tag::RafImageWidth, tag::RafImageLength}, vendorIFD)) {
    return false;
  }
  if (!vendorIFD) {
    return refuse(journalOf(*stream), QVReason::MissingPart, positionOf(rawSectionIFD),
                  "no {} in {}; the raw image's size is found through it",
                  TagName{tag::RafDirectoryPointer}, placed(rawSectionIFD));
  }
  return storeInfoFromFujiTagsIFD(vendorIFD);
}

bool QVRafImage::storeInfoFromMainIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  // `readMainIFD` asks for no size, but a host may pass a directory that has one.
  return storeOptionalNumber(ifd, tag::ImageWidth, width) &&
         storeOptionalNumber(ifd, tag::ImageLength, height) &&
         storeOptionalNumber(ifd, tag::Orientation, orientation);
}

bool QVRafImage::storeInfoFromFujiTagsIFD(std::shared_ptr<QVTiffImageFileDirectory> const& ifd) {
  return storeOptionalNumber(ifd, tag::RafImageWidth, width) &&
         storeOptionalNumber(ifd, tag::RafImageLength, height);
}

}  // namespace quavel
