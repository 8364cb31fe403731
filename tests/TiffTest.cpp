#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <limits>

#include "support/Fixtures.h"

namespace quavel::test {
namespace {

using Value = QVTiffImageFileDirectoryEntryValue;

/// A stream that keeps its bytes.
struct Source {
  explicit Source(Bytes data, ByteOrder order = kMM)
      : bytes(std::move(data)),
        stream(std::make_shared<QVMStream>(reinterpret_cast<unsigned char*>(bytes.data()),
                                           bytes.size())) {
    stream->byteOrder = order;
  }
  Bytes bytes;
  std::shared_ptr<QVStream> stream;
};

TEST(TiffHeader, DecidesTheByteOrder) {
  struct Row {
    Bytes bytes;
    bool isRead;
    ByteOrder order;
    std::uint32_t offset;
  };
  Row const rows[] = {
      {Bytes("II\x2a\0\x08\x01\0\0", 8), true, kII, 0x108},
      {Bytes("MM\0\x2a\0\0\x01\x08", 8), true, kMM, 0x108},
      {Bytes("II\0\x2a\x08\0\0\0", 8), false, kII, 0},
      {Bytes("MM\0\x55\0\0\0\x08", 8), false, kMM, 0},
      {Bytes("IM\x2a\0\x08\0\0\0", 8), false, kMM, 0},
      {"I", false, kMM, 0},
      {Bytes("II\x2a", 3), false, kII, 0},
  };
  for (Row const& row : rows) {
    SCOPED_TRACE(row.bytes);
    Source source(row.bytes);
    QVTiffHeader header;
    EXPECT_EQ(header.read(source.stream, 42), row.isRead);
    EXPECT_EQ(source.stream->byteOrder, row.order);
    EXPECT_EQ(header.firstIFDOffset, row.offset);
  }
  Source shortened(Bytes("II\x2a\0\x08\0", 6));
  EXPECT_FALSE(QVTiffHeader().read(shortened.stream, 42));
}

TEST(TiffValue, ConvertsEveryTypeToEveryOther) {
  struct Row {
    char const* name;
    EntryValueType type;
    Bytes stored;  // big-endian
    int s8;
    int s16;
    std::int64_t u32;
    std::int64_t s32;
    double real;
  };
  constexpr double kInfinity = std::numeric_limits<double>::infinity();
  constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();
  Row const rows[] = {
      {"byte", EntryValueType::BYTE, "\xfe", -2, 254, 254, 254, 254},
      {"ascii", EntryValueType::ASCII, "\xff", -1, -1, 4294967295, -1, -1},
      {"sbyte", EntryValueType::SBYTE, "\x80", -128, -128, 4294967168, -128, -128},
      {"short", EntryValueType::SHORT, "\xff\xfe", -2, -2, 65534, 65534, 65534},
      {"sshort", EntryValueType::SSHORT, "\xff\xfe", -2, -2, 4294967294, -2, -2},
      {"long", EntryValueType::LONG, Bytes("\0\x01\x11\x70", 4), 112, 4464, 70000, 70000, 70000},
      {"big long", EntryValueType::LONG, "\xff\xff\xff\xfd", -3, -3, 4294967293, -3, 4294967293},
      {"slong", EntryValueType::SLONG, "\xff\xff\xff\xfd", -3, -3, 4294967293, -3, -3},
      {"7/2", EntryValueType::RATIONAL, Bytes("\0\0\0\7\0\0\0\2", 8), 3, 3, 3, 3, 3.5},
      {"5/0", EntryValueType::RATIONAL, Bytes("\0\0\0\5\0\0\0\0", 8), 0, 0, 0, 0, kInfinity},
      {"0/0", EntryValueType::RATIONAL, Bytes(8, '\0'), 0, 0, 0, 0, kNaN},
      {"huge/1", EntryValueType::RATIONAL, Bytes("\xff\xff\xff\xfe\0\0\0\1", 8), -2, -2, 4294967294,
       -2, 4294967294},
      {"-7/2", EntryValueType::SRATIONAL, Bytes("\xff\xff\xff\xf9\0\0\0\2", 8), -3, -3, 4294967293,
       -3, -3.5},
      {"-5/0", EntryValueType::SRATIONAL, Bytes("\xff\xff\xff\xfb\0\0\0\0", 8), 0, 0, 0, 0,
       -kInfinity},
      {"least/-1", EntryValueType::SRATIONAL, Bytes("\x80\0\0\0\xff\xff\xff\xff", 8), 0, 0,
       2147483648, -2147483648, 2147483648.0},
      {"float", EntryValueType::FLOAT, Bytes("\xbf\xc0\0\0", 4), -1, -1, 0, -1, -1.5},
      {"double 1e10", EntryValueType::DOUBLE, Bytes("\x42\x02\xa0\x5f\x20\0\0\0", 8), -1, -1,
       4294967295, 2147483647, 1e10},
      {"double -1e10", EntryValueType::DOUBLE, Bytes("\xc2\x02\xa0\x5f\x20\0\0\0", 8), 0, 0, 0,
       -2147483648, -1e10},
      {"NaN", EntryValueType::DOUBLE, Bytes("\x7f\xf8\0\0\0\0\0\0", 8), 0, 0, 0, 0, kNaN},
  };
  for (Row const& row : rows) {
    SCOPED_TRACE(row.name);
    EXPECT_EQ(Value::sizeOfValueOfType(row.type), row.stored.size());
    Source source(row.stored);
    Value value;
    value.type = row.type;
    ASSERT_TRUE(value.read(source.stream));
    EXPECT_EQ(value.charValue(), row.s8);
    EXPECT_EQ(value.sbyteValue(), row.s8);
    EXPECT_EQ(value.byteValue(), row.s8 & 0xff);
    EXPECT_EQ(value.sshortValue(), row.s16);
    EXPECT_EQ(value.shortValue(), row.s16 & 0xffff);
    EXPECT_EQ(value.longValue(), row.u32);
    EXPECT_EQ(value.slongValue(), row.s32);
    if (std::isnan(row.real)) {
      EXPECT_TRUE(std::isnan(value.doubleValue()) && std::isnan(value.floatValue()));
    } else {
      EXPECT_EQ(value.doubleValue(), row.real);
      EXPECT_EQ(value.floatValue(), static_cast<float>(row.real));
    }
    Source cut(row.stored.substr(1));
    EXPECT_FALSE(value.read(cut.stream));
  }
}

TEST(TiffValue, DividesInTheResultsPrecision) {
  Source source(Bytes("\0\0\0\1\0\0\0\3", 8));
  Value value;
  value.type = EntryValueType::RATIONAL;
  ASSERT_TRUE(value.read(source.stream));
  EXPECT_EQ(value.floatValue(), 1.0F / 3.0F);
  EXPECT_EQ(value.doubleValue(), 1.0 / 3.0);
  EXPECT_EQ(value.rationalValue().numerator, 1U);
  EXPECT_EQ(value.rationalValue().denominator, 3U);
  EXPECT_EQ(value.sRationalValue().denominator, 0);
  value.type = EntryValueType::SRATIONAL;
  EXPECT_EQ(value.sRationalValue().numerator, 1);
  EXPECT_EQ(value.sRationalValue().denominator, 3);
  EXPECT_EQ(value.rationalValue().denominator, 0U);
}

TEST(TiffValue, GivesZeroForWhatIsNoType) {
  for (int const type : {6, 12, 255}) {
    Source source("\1\1\1\1\1\1\1\1");
    Value value;
    value.type = static_cast<EntryValueType>(type);
    std::memset(value.value, 1, sizeof(value.value));
    EXPECT_FALSE(value.read(source.stream));
    EXPECT_EQ(source.stream->getOffset(), 0);
    EXPECT_EQ(Value::sizeOfValueOfType(value.type), 0U);
    EXPECT_EQ(value.byteValue() + value.charValue() + value.shortValue() + value.slongValue(), 0);
    EXPECT_EQ(value.longValue(), 0U);
    EXPECT_EQ(value.floatValue() + value.doubleValue(), 0.0);
  }
}

/// The only entry of a directory that was read with it, or null.
std::shared_ptr<QVTiffImageFileDirectoryEntry> readEntry(ByteOrder order, Field const& field) {
  Source source(tiff(order, {{field}}), order);
  source.stream->setOffset(10 + 2);
  auto entry = std::make_shared<QVTiffImageFileDirectoryEntry>();
  return entry->read(source.stream) ? entry : nullptr;
}

TEST(TiffEntry, ReadsValuesFromTheFieldAndFromBehind) {
  for (ByteOrder const order : kOrders) {
    for (Field const& field :
         {shorts(1, {258, 2}), shorts(1, {258, 2, 3}), longs(1, {258}), values(1, kIfd, 4, {258}),
          values(1, kSShort, 2, {258}), values(1, kSLong, 4, {258, 9})}) {
      auto const entry = readEntry(order, field);
      ASSERT_TRUE(entry && entry->values);
      ASSERT_EQ(entry->values->size(), field.numbers.size());
      EXPECT_EQ(entry->values->front()->longValue(), 258U);
      EXPECT_EQ(entry->values->back()->longValue(), field.numbers.back());
    }
  }
  auto const empty = readEntry(kII, shorts(1, {}));
  ASSERT_TRUE(empty && empty->values);
  EXPECT_TRUE(empty->values->empty());
}

TEST(TiffEntry, KeepsUndefinedBytesApart) {
  auto const inlineBytes = readEntry(kMM, characters(1, "abcd", kUndefined));
  ASSERT_TRUE(inlineBytes && inlineBytes->bytes);
  EXPECT_EQ(Bytes(inlineBytes->bytes->begin(), inlineBytes->bytes->end()), "abcd");
  EXPECT_FALSE(inlineBytes->values);
  auto const none = readEntry(kMM, characters(1, "", kUndefined));
  ASSERT_TRUE(none && none->bytes);
  EXPECT_TRUE(none->bytes->empty());
  auto const elsewhere = readEntry(kMM, claim(1, kUndefined, 70000, 123456));
  ASSERT_TRUE(elsewhere);
  EXPECT_FALSE(elsewhere->values || elsewhere->bytes);
  EXPECT_EQ(elsewhere->dataCount, 70000U);
  EXPECT_EQ(elsewhere->dataOffset, 123456U);
  std::string text = "old";
  EXPECT_TRUE(elsewhere->convertToString(text));
  EXPECT_EQ(text, "");
}

TEST(TiffEntry, RefusesWhatItCannotRead) {
  for (Field const& field :
       {values(1, 0, 1, {1}), values(1, 14, 1, {1}), values(1, 65535, 1, {1}),
        claim(1, kRational, 1, 5000), claim(1, kLong, 1073741825, 8), claim(1, kByte, 65537, 8)}) {
    EXPECT_FALSE(readEntry(kII, field)) << "type " << field.type << " count " << field.count;
  }
  Bytes const whole = u16(kMM, kLong) + u32(kMM, 2) + u32(kMM, 0);
  Bytes const undefined = u16(kMM, kUndefined) + u32(kMM, 5) + u32(kMM, 0);
  for (std::size_t length = 0; length < whole.size(); ++length) {
    for (Bytes const& bytes : {whole, undefined}) {
      Source source(bytes.substr(0, length));
      QVTiffImageFileDirectoryEntry entry;
      EXPECT_FALSE(entry.read(source.stream)) << length;
      EXPECT_FALSE(entry.values);
    }
  }
}

TEST(TiffEntry, ReadsAsManyValuesAsAreAllowed) {
  Bytes const data = u16(kMM, kByte) + u32(kMM, 65536) + u32(kMM, 10) + Bytes(65536, '\7');
  Source source(data);
  QVTiffImageFileDirectoryEntry entry;
  ASSERT_TRUE(entry.read(source.stream));
  ASSERT_EQ(entry.values->size(), 65536U);
  EXPECT_EQ(entry.values->back()->byteValue(), 7);
}

TEST(TiffEntry, ConvertsTextUpToTheFirstNul) {
  struct Row {
    Field field;
    bool isText;
    std::string text;
  };
  Row const rows[] = {
      {ascii(1, "ABCDE"), true, "ABCDE"},
      {characters(1, Bytes("AB\0CD", 5)), true, "AB"},
      {characters(1, "ABC"), true, "ABC"},
      {characters(1, "trailing  "), true, "trailing  "},
      {characters(1, "\xe9t\xe9!!"), true, "\xe9t\xe9!!"},
      {characters(1, ""), true, ""},
      {longs(1, {65}), false, ""},
      {characters(1, "AB", kByte), false, ""},
  };
  for (Row const& row : rows) {
    auto const entry = readEntry(kII, row.field);
    ASSERT_TRUE(entry);
    std::string text = "old";
    EXPECT_EQ(entry->convertToString(text), row.isText);
    EXPECT_EQ(text, row.text);
  }
}

TEST(TiffDirectory, KeepsTheFirstOfTheWantedTags) {
  Directory directory = {{ascii(kModel, "Camera"), shorts(kOrientation, {6}),
                          shorts(kOrientation, {8}), values(0xbeef, 99, 1, {1}),
                          longs(kExif, {1234})}};
  directory.next = 77;
  Source source(tiff(kMM, directory));
  QVTiffImageFileDirectory ifd;
  EXPECT_FALSE(ifd.entryForTag(kOrientation));
  source.stream->setOffset(8);
  ASSERT_TRUE(ifd.read(source.stream, {kOrientation, kExif, kLensModel, kExif}));
  EXPECT_EQ(ifd.entries->size(), 2U);
  EXPECT_EQ(ifd.entryForTag(kOrientation)->values->front()->longValue(), 6U);
  EXPECT_EQ(ifd.nextIFDOffset, 77U);
  EXPECT_FALSE(ifd.entryForTag(kModel));

  source.stream->setOffset(8);
  EXPECT_FALSE(ifd.read(source.stream, {}));  // it wants the entry of type 99 too
  EXPECT_EQ(ifd.entries->size(), 2U);
  directory.remove(0xbeef);
  Source all(tiff(kMM, directory));
  all.stream->setOffset(8);
  ASSERT_TRUE(ifd.read(all.stream, {}));
  EXPECT_EQ(ifd.entries->size(), 3U);
  EXPECT_EQ(ifd.entryForTag(kOrientation)->values->front()->longValue(), 6U);

  Source empty(tiff(kII, {{}, 9}), kII);
  empty.stream->setOffset(8);
  ASSERT_TRUE(ifd.read(empty.stream, {kOrientation}));
  EXPECT_TRUE(ifd.entries->empty());
  EXPECT_EQ(ifd.nextIFDOffset, 9U);
}

TEST(TiffDirectory, StopsOnceAllWantedTagsAreFound) {
  Bytes const three =
      tiff(kII, {{shorts(1, {10}), shorts(2, {20}), shorts(3, {30})}, 0xffffffff}).substr(8, 38);
  Source source(u16(kII, 20) + three.substr(2), kII);
  QVTiffImageFileDirectory ifd;
  EXPECT_FALSE(ifd.read(source.stream, {4}));
  EXPECT_FALSE(ifd.entries);
  source.stream->setOffset(0);
  // All were found; then the next directory's offset is missing.
  EXPECT_FALSE(ifd.read(source.stream, {3, 1}));
  ASSERT_TRUE(ifd.entries);
  EXPECT_EQ(ifd.entryForTag(3)->values->front()->longValue(), 30U);
  EXPECT_EQ(ifd.nextIFDOffset, 0U);
}

}  // namespace
}  // namespace quavel::test
