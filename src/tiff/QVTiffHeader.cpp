#include "quavel/QVTiffHeader.h"

#include <algorithm>

#include "journal/Journal.h"
#include "journal/Reading.h"
#include "stream/Bytes.h"
#include "tiff/ReaderDirectory.h"

namespace quavel {

namespace {

// Both bytes of a mark are equal, so it can be read in either byte order.
constexpr unsigned short kLittleEndianMark = 0x4949;  // "II"
constexpr unsigned short kBigEndianMark = 0x4d4d;     // "MM"

constexpr std::int64_t kMagicPosition = 2;           // from the header's start
constexpr std::int64_t kFirstIFDOffsetPosition = 4;  // likewise

constexpr unsigned short kBigTiffMagic = 43;

}  // namespace

QVTiffHeader::QVTiffHeader() = default;

bool QVTiffHeader::read(std::shared_ptr<QVStream>& stream, unsigned short expectedMagic) {
  return detail::readTiffHeader(*stream, expectedMagic, *this);
}

bool detail::readTiffHeader(QVStream& stream, unsigned short expectedMagic, QVTiffHeader& header,
                            char const* structure) {
  Journal* const journal = journalOf(stream);
  // Where the header should begin, for notes. The stream may stand before `baseOffset`: it stops at
  // the end of a buffer, and a damaged file may put `baseOffset` beyond that.
  std::int64_t const start = std::max(positionForNotes(journal, stream), stream.baseOffset);
  PartName const name = {"the TIFF header", structure};

  unsigned short mark = 0;
  if (!stream.readShort(&mark)) {
    return refuseCut(journal, start, sizeof(mark), "{}", name);
  }
  if (mark != kLittleEndianMark && mark != kBigEndianMark) {
    auto const asInFile = stream.byteOrder == ByteOrder::BigEndian ? mark : reversed(mark);
    return refuse(journal, QVReason::OtherKind, start,
                  "{} at {} begins with {}, not with 49 49 (\"II\") or 4d 4d (\"MM\")", name,
                  Offset{start}, HexPair{asInFile});
  }
  bool const isLittle = mark == kLittleEndianMark;
  stream.byteOrder = isLittle ? ByteOrder::LittleEndian : ByteOrder::BigEndian;

  unsigned short magic = 0;
  if (!stream.readShort(&magic)) {
    return refuseCut(journal, start + kMagicPosition, sizeof(magic), "{} at {}", name,
                     Offset{start});
  }
  if (magic != expectedMagic) {
    return refuse(journal, QVReason::OtherKind, start, "{} at {} has magic {}, not {}{}", name,
                  Offset{start}, magic, expectedMagic,
                  magic == kBigTiffMagic ? "; 43 marks a BigTIFF, which is not read" : "");
  }
  if (!stream.readLong(&header.firstIFDOffset)) {
    return refuseCut(journal, start + kFirstIFDOffsetPosition, sizeof(header.firstIFDOffset),
                     "{} at {}", name, Offset{start});
  }
  noteStep(journal, start, "{} at {}: {}-endian", name, Offset{start}, isLittle ? "little" : "big");
  return true;
}

}  // namespace quavel
