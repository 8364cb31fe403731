#ifndef QUAVEL_TESTS_FIXTURES_H
#define QUAVEL_TESTS_FIXTURES_H

#include <memory>
#include <string>
#include <vector>

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

constexpr ByteOrder kII = ByteOrder::LittleEndian;
constexpr ByteOrder kMM = ByteOrder::BigEndian;
constexpr ByteOrder kOrders[] = {kII, kMM};

// The directories of one well-made file each, to be edited and laid out.
Directory plainTiff();
Directory reducedTiff();  // its full image is in the second SubIFD
Directory nef();
Directory arw();
Directory jpegExif();
Directory rafRawSection();
Directory cmt1();
Directory cmt2();

constexpr unsigned kFrameWidth = 4000;
constexpr unsigned kFrameHeight = 3000;

/// A JPEG segment: marker, length, payload.
inline Bytes segment(std::uint16_t marker, Bytes const& payload) {
  return u16(kMM, marker) + u16(kMM, payload.size() + 2) + payload;
}

/// An ISO base media box: size, type, payload.
inline Bytes box(Bytes const& type, Bytes const& payload) {
  return u32(kMM, payload.size() + 8) + type + payload;
}

Bytes sof0(unsigned width = kFrameWidth, unsigned height = kFrameHeight);
Bytes exifSegment(Bytes const& tiffStructure);
/// SOI, the Exif segment and the frame header, followed by the start of a scan.
Bytes jpegFile(Bytes const& tiffStructure);
/// `image` is the embedded JPEG, `rawSection` a TIFF structure.
Bytes rafFile(Bytes const& image, Bytes const& rawSection);
/// The metadata `uuid` box, or one of another identifier, around its children.
Bytes uuidBox(Bytes const& children, Bytes const& identifier = "");
/// `ftyp`, a `moov` around its children, `mdat`.
Bytes cr3File(Bytes const& moovChildren);

/// One well-made file of each extension, in either byte order, and the record it must give.
struct Fixture {
  std::string name;
  std::string extension;
  Bytes (*bytes)(ByteOrder order);
  std::string expected;
};
std::vector<Fixture> const& fixtures();

/// The fields that are there, in their order: "width=160 isRaw"; "none" without a record.
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
