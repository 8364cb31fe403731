#include "support/Fixtures.h"

#include <filesystem>
#include <fstream>
#include <random>
#include <sstream>

#include "support/Fields.h"

namespace quavel::test {

namespace {

std::string const kOriginal = "2021:05:01 10:00:00";
Field const kDigitized = ascii(kDateTimeDigitized, "2021:05:01 10:00:01");
Field const kFileDate = ascii(kDateTime, "2022:06:02 11:00:00");

Directory plainTiff() {
  Directory const exif = {{ascii(kDateTimeOriginal, kOriginal), kDigitized,
                           characters(kMakerNote, "not a directory", kUndefined)}};
  return {{longs(kWidth, 6000), longs(kLength, 4000), ascii(kModel, "Camera"),
           shorts(kOrientation, 6), kFileDate, pointer(kExif, {exif})}};
}

/// Its full image is in the second SubIFD.
Directory reducedTiff() {
  Directory const preview = {{longs(kNewSubfileType, 1), longs(kWidth, 1024), longs(kLength, 683)}};
  Directory const full = {{longs(kNewSubfileType, 0), longs(kWidth, 6000), longs(kLength, 4000),
                           shorts(kOrientation, 3)}};
  Directory file = plainTiff();
  for (Field const& field : {longs(kNewSubfileType, 1), longs(kWidth, 256), longs(kLength, 171),
                             pointer(kSubIFDs, {preview, full, preview})}) {
    field(file);
  }
  return file;
}

Directory nef() {
  Directory const exif = {
      {ascii(kDateTimeOriginal, kOriginal), kDigitized, ascii(kOffsetTimeOriginal, "+02:00")}};
  Directory const preview = {{longs(kNewSubfileType, 1), longs(kWidth, 570)}};
  Directory const raw = {{longs(kNewSubfileType, 0), longs(kWidth, 6032), longs(kLength, 4032)}};
  return {{longs(kNewSubfileType, 1), longs(kWidth, 160), longs(kLength, 120),
           shorts(kOrientation, 8), kFileDate, pointer(kSubIFDs, {preview, raw, preview}),
           pointer(kExif, {exif})}};
}

Directory arw() {
  Directory file = nef();
  longs(kWidth, 1616)(file);
  pointer(kSubIFDs, {file[kSubIFDs].subdirectories[1]})(file);
  return file;
}

Directory jpegExif() {
  Directory const exif = {{ascii(kDateTimeOriginal, kOriginal), kDigitized, shorts(kPixelX, 3000),
                           shorts(kPixelY, 4000)}};
  return {{shorts(kOrientation, 6), kFileDate, pointer(kExif, {exif})}};
}

Directory cmt1() {
  return {{shorts(kWidth, 6000), shorts(kLength, 4000), ascii(kModel, "Camera R"),
           shorts(kOrientation, 6), ascii(kDateTime, kOriginal)}};
}

Bytes rafAround(ByteOrder order, Directory const& image) {
  return rafFile(jpegFile(order, image), tiff(order, rafRawSection()));
}

Bytes cr3Around(ByteOrder order, Directory const& main) {
  return cr3File(box("mvhd", Bytes(100, '\0')) +
                 uuidBox(box("free", "filler") + box("CMT1", tiff(order, main)) +
                         box("CMT2", tiff(order, cmt2())) + box("CMT3", tiff(order, main))) +
                 box("trak", Bytes(40, '\0')));
}

std::string const kDate = "dateTimeOriginal=" + kOriginal;
std::string const kDates =
    kDate + ", dateTimeDigitized=2021:05:01 10:00:01, dateTime=2022:06:02 11:00:00";
std::string const kTiff = "width=6000, height=4000, orientation=6, " + kDates;
std::string const kRawTiff = "width=6000, height=4000, orientation=6, isRaw, " + kDates;
std::string const kNef = "width=6032, height=4032, orientation=8, isRaw, " + kDate;
std::string const kJpeg = "width=3000, height=4000, orientation=6, " + kDate;
std::string const kRaf = "width=6160, height=4032, orientation=6, isRaw, " + kDate;
std::string const kCr3 =
    "width=6000, height=4000, orientation=6, isRaw, dateTime=2021:05:01 10:00:00, "
    "hasShootingInfo, model=Camera R, lensModel=Lens 35mm F1.8, iso=400, apexFNumber=4, "
    "apexExposureTime=0.0078125, apertureValue=4, shutterSpeedValue=7, focalLength=35, "
    "whiteBalance=0, meteringMode=5, exposureBiasValue=-0.5, focalLengthIn35mmFilm=56, "
    "exposureTime=0.00499999989, fNumber=5.5999999";

}  // namespace

Directory rafRawSection() {
  return {{pointer(kRafPointer, {{{longs(kRafWidth, 6160), longs(kRafLength, 4032)}}})}};
}

Directory cmt2() {
  return {{ratio(kExposureTime, 1, 200), ratio(kFNumber, 56, 10), shorts(kIso, 400),
           ratio(kShutterSpeed, 7, 1, kSRational), ratio(kAperture, 4, 1),
           ratio(kExposureBias, -1, 2, kSRational), shorts(kMeteringMode, 5),
           ratio(kFocalLength, 35, 1), shorts(kWhiteBalance, 0), shorts(kFocal35, 56),
           ascii(kLensModel, "Lens 35mm F1.8")}};
}

Bytes sof0(unsigned width, unsigned height) {
  return segment(0xffc0, '\x08' + u16(kMM, height) + u16(kMM, width) +
                             Bytes("\x03\x01\x22\x00\x02\x11\x01\x03\x11\x01", 10));
}

Bytes jpegFile(ByteOrder order, Directory const& image) {
  return "\xff\xd8" + exifSegment(tiff(order, image)) + segment(0xffdb, Bytes(65, '\x10')) +
         sof0() + segment(0xffda, Bytes(10, '\x01')) + "scan\xff\xd9";
}

Bytes rafHeader(std::size_t imageOffset, std::size_t rawSectionOffset) {
  Bytes header = "FUJIFILMCCD-RAW 0201";
  header.resize(84);
  header += u32(kMM, imageOffset);
  header.resize(100);
  header += u32(kMM, rawSectionOffset);
  header.resize(148);
  return header;
}

Bytes rafFile(Bytes const& image, Bytes const& rawSection) {
  return rafHeader(148, 148 + image.size()) + image + rawSection;
}

Bytes uuidBox(Bytes const& children, Bytes const& identifier) {
  Bytes const metadata = "\x85\xc0\xb6\x87\x82\x0f\x11\xe0\x81\x11\xf4\xce\x46\x2b\x6a\x48";
  return box("uuid", (identifier.empty() ? metadata : identifier) + children);
}

Bytes cr3File(Bytes const& moovChildren) {
  return box("ftyp", "crx isom") + box("moov", moovChildren) + box("mdat", Bytes(64, '\x7f'));
}

std::vector<Fixture> const& fixtures() {
  static std::vector<Fixture> const all = {
      {"plain", "tif", plainTiff, tiff, kTiff},
      {"scan", "tiff", reducedTiff, tiff, kTiff},
      {"negative", "dng", reducedTiff, tiff, kRawTiff},
      {"canyon", "cr2", plainTiff, tiff, kRawTiff},
      {"pocket", "nrw", reducedTiff, tiff, kRawTiff},
      {"studio", "3fr", reducedTiff, tiff, kRawTiff},
      {"night", "nef", nef, tiff, kNef},
      {"alley", "arw", arw, tiff, kNef},
      {"field", "raf", jpegExif, rafAround, kRaf},
      {"portrait", "jpg", jpegExif, jpegFile, kJpeg},
      {"postcard", "jpeg", jpegExif, jpegFile, kJpeg},
      {"river", "cr3", cmt1, cr3Around, kCr3},
  };
  return all;
}

Fixture const& fixtureOf(std::string const& extension) {
  return *std::find_if(fixtures().begin(), fixtures().end(),
                       [&](Fixture const& fixture) { return fixture.extension == extension; });
}

std::string describe(QVMetadata const& record) {
  std::ostringstream out;
  out.precision(9);
  eachField(record, [&](char const* name, auto const& value) {
    if constexpr (std::is_same_v<decltype(value), bool const&>) {
      out << (value ? name + std::string(", ") : "");
    } else if (!isAbsent(value)) {
      out << name << '=' << value << ", ";
    }
  });
  return out.str().substr(0, std::max<std::size_t>(out.str().size(), 2) - 2);
}

std::string describe(std::shared_ptr<QVMetadata> const& record) {
  return record ? describe(*record) : "none";
}

std::string readBuffer(Bytes bytes, std::string const& extension) {
  return describe(QVReader(dataOf(bytes), sizeOf(bytes), extension).metadata);
}

std::string readStream(std::shared_ptr<QVStream> stream, std::string const& extension) {
  auto const record = QVReader("").createMetadata(extension);
  bool const isRead = record->read(stream);
  return (isRead ? "" : "! ") + describe(*record);
}

TemporaryFile::TemporaryFile(Bytes const& bytes, std::string const& extension) {
  static thread_local std::mt19937_64 random{std::random_device{}()};
  auto const name = "quavel-" + std::to_string(random()) + "." + extension;
  path = (std::filesystem::temp_directory_path() / name).string();
  std::ofstream(path, std::ios::binary) << bytes;
}

TemporaryFile::~TemporaryFile() {
  std::error_code ignored;
  std::filesystem::remove(path, ignored);
}

}  // namespace quavel::test
