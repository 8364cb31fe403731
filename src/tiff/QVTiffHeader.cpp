#include "quavel/QVTiffHeader.h"

#include "quavel/QVStream.h"

namespace quavel {

namespace {

// Each reads the same in either byte order.
constexpr unsigned short kLittleEndianMark = 0x4949;  // "II"
constexpr unsigned short kBigEndianMark = 0x4d4d;     // "MM"

}  // namespace

QVTiffHeader::QVTiffHeader() = default;

bool QVTiffHeader::read(std::shared_ptr<QVStream>& stream, unsigned short expectedMagic) {
  unsigned short mark = 0;
  if (!stream->readShort(&mark)) {
    return false;
  }
  if (mark != kLittleEndianMark && mark != kBigEndianMark) {
    return false;
  }
  stream->byteOrder = mark == kLittleEndianMark ? ByteOrder::LittleEndian : ByteOrder::BigEndian;

  unsigned short magic = 0;
  if (!stream->readShort(&magic) || magic != expectedMagic) {
    return false;
  }
  return stream->readLong(&firstIFDOffset);
}

}  // namespace quavel
