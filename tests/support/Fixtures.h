#ifndef QUAVEL_TESTS_FIXTURES_H
#define QUAVEL_TESTS_FIXTURES_H

#include <memory>

#include "quavel/quavel.h"
#include "support/ByteBuilder.h"

namespace quavel::test {

// Repeated here on purpose: a wrong number in the library must not repeat itself in the files.
// clang-format off
enum Tag : std::uint16_t {
  kNewSubfileType = 0x00fe, kWidth = 0x0100, kLength = 0x0101, kModel = 0x0110,
  kOrientation = 0x0112, kDateTime = 0x0132, kSubIFDs = 0x014a, kExposureTime = 0x829a,
  kFNumber = 0x829d, kExif = 0x8769, kIso = 0x8827, kDateTimeOriginal = 0x9003,
  kDateTimeDigitized = 0x9004, kOffsetTimeOriginal = 0x9011, kShutterSpeed = 0x9201,
  kAperture = 0x9202, kExposureBias = 0x9204, kMeteringMode = 0x9207, kMakerNote = 0x927c,
  kFocalLength = 0x920a, kPixelX = 0xa002, kPixelY = 0xa003, kWhiteBalance = 0xa403,
  kFocal35 = 0xa405, kLensModel = 0xa434, kRafPointer = 0xf000, kRafWidth = 0xf001,
  kRafLength = 0xf002,
};
// clang-format on

/// A JPEG segment: marker, length, payload.
inline Bytes segment(std::uint16_t marker, Bytes const& payload) {
  return u16(kMM, marker) + u16(kMM, payload.size() + 2) + payload;
}
inline Bytes exifSegment(Bytes const& tiffStructure) {
  return segment(0xffe1, Bytes("Exif\0\0", 6) + tiffStructure);
}
Bytes sof0(unsigned width = 4000, unsigned height = 3000);
/// SOI, the Exif segment and the frame header, followed by the start of a scan.
Bytes jpegFile(ByteOrder order, Directory const& image);

/// An ISO base media box: size, type, payload.
inline Bytes box(Bytes const& type, Bytes const& payload) {
  return u32(kMM, payload.size() + 8) + type + payload;
}
/// The metadata `uuid` box, or one of another identifier, around its children.
Bytes uuidBox(Bytes const& children, Bytes const& identifier = "");
/// `ftyp`, a `moov` around its children, `mdat`.
Bytes cr3File(Bytes const& moovChildren);

/// 148 bytes with the offsets of the embedded JPEG and of the TIFF structure that follows it.
Bytes rafHeader(std::size_t imageOffset, std::size_t rawSectionOffset);
Bytes rafFile(Bytes const& image, Bytes const& rawSection);

// Directories of well-made files beside those of the fixtures.
Directory rafRawSection();
Directory cmt2();

/// A well-made file of each extension: a directory, which tests edit, what is laid out around it in
/// either byte order, and the record that the file must give.
struct Fixture {
  std::string name;
  std::string extension;
  Directory (*directory)();
  Bytes (*layOut)(ByteOrder order, Directory const& directory);
  std::string expected;

  Bytes bytes(ByteOrder order) const { return layOut(order, directory()); }
};
std::vector<Fixture> const& fixtures();
Fixture const& fixtureOf(std::string const& extension);

/// The fields that are there, in their order: "width=160, isRaw"; "none" without a record.
std::string describe(QVMetadata const& record);
std::string describe(std::shared_ptr<QVMetadata> const& record);

inline unsigned char* dataOf(Bytes& bytes) {
  return reinterpret_cast<unsigned char*>(bytes.data());
}
/// As the library counts them: `unsigned long` is not as long everywhere.
inline unsigned long sizeOf(Bytes const& bytes) { return static_cast<unsigned long>(bytes.size()); }

/// The record that the bytes give, described.
std::string readBuffer(Bytes bytes, std::string const& extension);
/// The record that the stream gives, described; if it is refused, after "! " what was stored
/// before.
std::string readStream(std::shared_ptr<QVStream> stream, std::string const& extension);

struct OwnBytes {
  Bytes bytes;
};

/// A stream over bytes of its own that counts the calls and can be told to misbehave.
struct TestStream : OwnBytes, QVMStream {
  explicit TestStream(Bytes const& content, ByteOrder order = kMM)
      : OwnBytes{content}, QVMStream(dataOf(bytes), sizeOf(bytes)) {
    byteOrder = order;
  }

  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override {
    ++reads;
    return onRead ? onRead(destination, count) : deliver(destination, count);
  }
  void setOffset(long const& target) override {
    ++seeks;
    if (!onSeek || onSeek(target)) {
      QVMStream::setOffset(target);
    }
  }
  std::int64_t deliver(std::uint8_t* destination, std::size_t count) {
    return QVMStream::readBuffer(destination, std::min(count, mostAtOnce));
  }

  std::function<std::int64_t(std::uint8_t*, std::size_t)> onRead;  ///< Instead of `deliver`.
  std::function<bool(long)> onSeek;                                ///< False: the seek is refused.
  std::size_t mostAtOnce = SIZE_MAX;
  int reads = 0;
  int seeks = 0;
};

/// The same for the readers, which take the stream as a base.
inline std::shared_ptr<QVStream> streamOf(Bytes const& bytes, ByteOrder order = kMM,
                                          long position = 0) {
  auto stream = std::make_shared<TestStream>(bytes, order);
  stream->setOffset(position);
  return stream;
}

/// A file of its own in the temporary folder, removed at the end of its life.
class TemporaryFile {
 public:
  TemporaryFile(Bytes const& bytes, std::string const& extension);
  ~TemporaryFile();
  TemporaryFile(TemporaryFile const&) = delete;
  TemporaryFile& operator=(TemporaryFile const&) = delete;

  std::string path;
};

}  // namespace quavel::test

#endif  // QUAVEL_TESTS_FIXTURES_H
