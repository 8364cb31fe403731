#include "support/Edits.h"

namespace quavel::test {
namespace {

std::string const kOriginal = "dateTimeOriginal=2021:05:01 10:00:00";

Bytes rafAroundImage(ByteOrder order, Directory const& image) {
  return rafFile(jpegFile(tiff(order, image)), tiff(order, rafRawSection()));
}

Bytes rafAroundRawSection(ByteOrder order, Directory const& rawSection) {
  ByteOrder const other = order == kII ? kMM : kII;
  return rafFile(jpegFile(tiff(other, jpegExif())), tiff(order, rawSection));
}

TEST(Raf, ReadsTheImagesDirectories) {
  std::string const size = "width=6160 height=4032 ";
  check<QVRafImage>(
      jpegExif,
      {{"well made", noEdit, true, size + "orientation=6 isRaw " + kOriginal},
       {"no Exif", [](auto& f) { f.remove(kExif); }, true, size + "orientation=6 isRaw"},
       {"a size of its own",
        [](auto& f) {
          f.set(longs(kWidth, {1, 2}));
        },
        true, size + "orientation=6 isRaw " + kOriginal},
       {"orientation of 2",
        [](auto& f) {
          f.set(shorts(kOrientation, {1, 1}));
        },
        false, "isRaw"},
       {"pointer of 0", [](auto& f) { f.set(longs(kExif, {})); }, false, "orientation=6 isRaw"},
       {"Exif beyond the end", [](auto& f) { f.set(longs(kExif, {100000})); }, false,
        "orientation=6 isRaw"},
       {"date in numbers", [](auto& f) { f.sub(kExif).set(shorts(kDateTimeOriginal, {1})); }, false,
        "orientation=6 isRaw"}},
      rafAroundImage);
}

TEST(Raf, ReadsTheRawSection) {
  std::string const image = "orientation=6 isRaw " + kOriginal;
  check<QVRafImage>(rafRawSection,
                    {{"well made", noEdit, true, "width=6160 height=4032 " + image},
                     {"width only", [](auto& f) { f.sub(kRafPointer).remove(kRafLength); }, true,
                      "width=6160 " + image},
                     {"no pointer", [](auto& f) { f.remove(kRafPointer); }, false, image},
                     {"pointer of 2",
                      [](auto& f) {
                        f.set(longs(kRafPointer, {8, 8}));
                      },
                      false, image},
                     {"vendor directory beyond the end",
                      [](auto& f) { f.set(longs(kRafPointer, {100000})); }, false, image},
                     {"width of 2",
                      [](auto& f) {
                        f.sub(kRafPointer).set(longs(kRafWidth, {1, 2}));
                      },
                      false, image},
                     {"height of 2",
                      [](auto& f) {
                        f.sub(kRafPointer).set(longs(kRafLength, {1, 2}));
                      },
                      false, "width=6160 " + image}},
                    rafAroundRawSection);
}

TEST(Raf, RefusesAnotherMagicAndAnImageThatDoesNotBeginWithExif) {
  Bytes const rawSection = tiff(kII, rafRawSection());
  Bytes lowerCase = rafFile(jpegFile(tiff(kII, jpegExif())), rawSection);
  lowerCase[7] = 'm';
  EXPECT_FALSE(readBuffer(lowerCase, "raf"));
  Bytes jfif = jpegFile(tiff(kII, jpegExif()));
  jfif.insert(2, segment(0xffe0, "JFIF"));
  EXPECT_FALSE(readBuffer(rafFile(jfif, rawSection), "raf"));
}

TEST(Raf, AddsToTheImagesOffsetIn32Bits) {
  Bytes file = "FUJIFILM" + tiff(kMM, {{shorts(kOrientation, {3})}});
  file.resize(84);
  file += u32(kMM, 0xfffffffc);  // the TIFF header 12 bytes on is at offset 8
  EXPECT_FALSE(readBuffer(file, "raf"));
  file.resize(100);
  EXPECT_FALSE(readBuffer(file, "raf"));
  file += u32(kMM, 104) + tiff(kII, rafRawSection());
  EXPECT_EQ(describe(readBuffer(file, "raf")), "width=6160 height=4032 orientation=3 isRaw");
}

TEST(Raf, StoresTheSizeOfADirectoryThatHasOne) {
  QVRafImage raf;
  auto directory = std::make_shared<QVTiffImageFileDirectory>();
  Bytes bytes = tiff(kMM, plainTiff());
  std::shared_ptr<QVStream> stream =
      std::make_shared<QVMStream>(reinterpret_cast<unsigned char*>(bytes.data()), bytes.size());
  stream->setOffset(8);
  ASSERT_TRUE(directory->read(stream, {}));
  EXPECT_TRUE(raf.storeInfoFromMainIFD(directory));
  EXPECT_EQ(describe(raf), "width=6000 height=4000 orientation=6");
}

}  // namespace
}  // namespace quavel::test
