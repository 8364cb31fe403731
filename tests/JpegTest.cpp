#include <gtest/gtest.h>

#include "support/Fixtures.h"

namespace quavel::test {
namespace {

std::string const kOriginal = "dateTimeOriginal=2021:05:01 10:00:00";

/// What a JPEG file around the edited Exif structure gives, the same in both byte orders.
template <class Edit>
std::string afterEdit(Edit edit) {
  Directory directory = jpegExif();
  edit(directory);
  std::string const result = describe(readBuffer(jpegFile(tiff(kII, directory)), "jpg"));
  EXPECT_EQ(describe(readBuffer(jpegFile(tiff(kMM, directory)), "jpg")), result);
  return result;
}

std::string read(Bytes const& bytes) { return describe(readBuffer(bytes, "jpeg")); }

TEST(Jpeg, ReconcilesTheTwoSizes) {
  std::string const frame = "width=4000 height=3000 ";
  EXPECT_EQ(afterEdit([](auto&) {}), "width=3000 height=4000 orientation=6 " + kOriginal);
  EXPECT_EQ(afterEdit([](auto& f) { f.set(shorts(kOrientation, {1})); }),
            frame + "orientation=1 " + kOriginal);
  EXPECT_EQ(afterEdit([](auto& f) { f.remove(kOrientation); }), frame + kOriginal);
  EXPECT_EQ(afterEdit([](auto& f) { f.set(shorts(kOrientation, {0})); }),
            "width=3000 height=4000 orientation=0 " + kOriginal);
  EXPECT_EQ(afterEdit([](auto& f) { f.sub(kExif).set(shorts(kPixelX, {2999})); }),
            "width=2999 height=4000 orientation=6 " + kOriginal);
  EXPECT_EQ(afterEdit([](auto& f) { f.sub(kExif).set(shorts(kPixelY, {500})); }),
            frame + "orientation=6 " + kOriginal);
  EXPECT_EQ(afterEdit([](auto& f) { f.sub(kExif).remove(kPixelX); }),
            frame + "orientation=6 " + kOriginal);
  EXPECT_EQ(afterEdit([](auto& f) { f.remove(kExif); }), frame + "orientation=6");
}

TEST(Jpeg, PrefersTheTiffSizeTags) {
  EXPECT_EQ(afterEdit([](auto& f) {
              f.sub(kExif).set(longs(kWidth, {501}));
              f.sub(kExif).set(longs(kLength, {502}));
              f.sub(kExif).set(shorts(kPixelX, {1, 2}));
            }),
            "width=501 height=502 orientation=6 " + kOriginal);
}

TEST(Jpeg, RefusesMalformedEntries) {
  EXPECT_EQ(afterEdit([](auto& f) { f.set(shorts(kOrientation, {1, 1})); }), "none");
  EXPECT_EQ(afterEdit([](auto& f) { f.set(longs(kExif, {8, 8})); }), "none");
  EXPECT_EQ(afterEdit([](auto& f) { f.set(longs(kExif, {100000})); }), "none");
  EXPECT_EQ(afterEdit([](auto& f) { f.sub(kExif).set(longs(kWidth, {1, 2})); }), "none");
  EXPECT_EQ(afterEdit([](auto& f) { f.sub(kExif).set(longs(kPixelX, {})); }), "none");
  EXPECT_EQ(afterEdit([](auto& f) { f.sub(kExif).set(longs(kLength, {1, 2})); }), "none");
  EXPECT_EQ(afterEdit([](auto& f) { f.sub(kExif).set(longs(kPixelY, {1, 2})); }), "none");
  EXPECT_EQ(afterEdit([](auto& f) { f.sub(kExif).set(longs(kDateTimeOriginal, {1})); }), "none");
}

TEST(Jpeg, WalksOverOtherSegments) {
  Bytes const exif = exifSegment(tiff(kII, jpegExif()));
  std::string const all = "width=3000 height=4000 orientation=6 " + kOriginal;
  std::string const frame = "width=4000 height=3000";
  Bytes const soi = "\xff\xd8";
  EXPECT_EQ(read(soi), "");
  EXPECT_EQ(read(soi + segment(0xffe0, "JFIF") + exif + sof0()), all);
  EXPECT_EQ(read(soi + segment(0xffe1, "http://ns.adobe") + exif + sof0()), all);
  EXPECT_EQ(read(soi + segment(0xffe1, "http://ns.adobe") + sof0() + exif), frame);
  EXPECT_EQ(read(soi + sof0() + exif), all);
  EXPECT_EQ(read(soi + sof0(5, 9) + sof0(7, 3) + segment(0xffe1, "abcd")), "width=7 height=9");
  EXPECT_EQ(read(soi + sof0(7, 3) + sof0(5, 9) + segment(0xffe1, "abcd")), "width=7 height=9");
  EXPECT_EQ(read(soi + sof0(0, 9) + segment(0xffe1, "abcd")), "");
  EXPECT_EQ(read(soi + exif + segment(0xffc2, sof0().substr(4))), all);  // progressive
  EXPECT_EQ(read(soi + "\xff\xdd\xff\xff\xff\xff" + sof0()), frame);     // DRI: 4 bytes on
  for (char const* const marker : {"\xff\xd0", "\xff\xd7", "\xff\xd8", "\xff\xd9"}) {
    EXPECT_EQ(read(soi + marker + "\xff\xff" + sof0()), frame);  // 2 bytes on
  }
  // The Exif structure may change the byte order, and the next segment's length is big-endian.
  EXPECT_EQ(read(soi + exif + segment(0xffdb, Bytes(300, '\0')) + sof0()), all);
}

TEST(Jpeg, EndsWithTheDataOnlyBetweenSegments) {
  Bytes const soi = "\xff\xd8";
  EXPECT_EQ(read(soi + "\xff"), "");
  EXPECT_EQ(read(soi + "\xff\xdb"), "none");
  EXPECT_EQ(read(soi + "\xff\xe1\x01"), "none");
  EXPECT_EQ(read(soi + "\xff\xe1\x01\x01" + "Exi"), "none");
  EXPECT_EQ(read(soi + "\xff\xe1\x01\x01" + "Exif\xff"), "none");
  EXPECT_EQ(read(soi + exifSegment("II+")), "none");
  EXPECT_EQ(read(soi + sof0().substr(0, 8)), "none");
  EXPECT_EQ(read(soi + Bytes("\xff\xc0\xff\xff") + sof0().substr(4)), "width=4000 height=3000");
  EXPECT_EQ(read(soi + segment(0xffdb, "quantization").substr(0, 8)), "");
  EXPECT_EQ(read(Bytes("\xff\xd7") + sof0()), "none");
  EXPECT_EQ(read("\xff"), "none");
}

TEST(Jpeg, GoesOnAfterALengthThatLeadsBack) {
  // A length of 0 ends at its own first byte, one of 1 at its second.
  EXPECT_EQ(read(Bytes("\xff\xd8\xff\xdb\0\0", 6) + Bytes("\0\4\0\0", 4) + sof0()),
            "width=4000 height=3000");
  EXPECT_EQ(read(Bytes("\xff\xd8", 2) + Bytes(1000, '\0')), "none");
}

TEST(Jpeg, WalksThousandsOfSegments) {
  Bytes file = "\xff\xd8";
  for (int i = 0; i < 20000; ++i) {
    file += "\xff\xd9\xff\xff";  // EOI, and the two bytes that it skips
  }
  EXPECT_EQ(read(file + sof0()), "width=4000 height=3000");
}

TEST(Jpeg, SkipsElevenMarkersByAFixedLength) {
  EXPECT_EQ(QVJPEGImage::markerSkipLengths.size(), 11U);
  EXPECT_EQ(QVJPEGImage::markerSkipLengths.at(0xffdd), 4);
  EXPECT_EQ(QVJPEGImage::markerSkipLengths.at(0xffd3), 2);
}

}  // namespace
}  // namespace quavel::test
