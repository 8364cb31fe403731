#include <gtest/gtest.h>

#include <cmath>

#include "support/Fixtures.h"

namespace quavel::test {
namespace {

using Entry = QVTiffImageFileDirectoryEntry;
using TagList = std::vector<unsigned short>;
using Type = EntryValueType;
using Value = QVTiffImageFileDirectoryEntryValue;

TEST(TiffValue, ConvertsEveryTypeToEveryOther) {
  struct Row {
    Type type;
    std::uint64_t stored;
    std::int32_t whole;      // narrower integers are its low bits
    std::uint32_t positive;  // the same, except where only one of the two can hold the number
    double real;
  };
  Row const rows[] = {
      {Type::BYTE, 0xfe, 254, 254, 254},
      {Type::ASCII, 0xff, -1, 0xffffffff, -1},
      {Type::SBYTE, 0x80, -128, 0xffffff80, -128},
      {Type::SHORT, 0xfffe, 65534, 65534, 65534},
      {Type::SSHORT, 0xfffe, -2, 0xfffffffe, -2},
      {Type::LONG, 70000, 70000, 70000, 70000},
      {Type::LONG, 0xfffffffd, -3, 0xfffffffd, 4294967293},
      {Type::SLONG, 0xfffffffd, -3, 0xfffffffd, -3},
      {Type::RATIONAL, 0x0000000700000002, 3, 3, 3.5},
      {Type::RATIONAL, 0x0000000500000000, 0, 0, INFINITY},
      {Type::RATIONAL, 0, 0, 0, NAN},
      {Type::RATIONAL, 0xfffffffe00000001, -2, 0xfffffffe, 4294967294},
      {Type::SRATIONAL, 0xfffffff900000002, -3, 0xfffffffd, -3.5},
      {Type::SRATIONAL, 0x0000000700000004, 1, 1, 1.75},
      {Type::SRATIONAL, 0xfffffffb00000000, 0, 0, -INFINITY},
      {Type::SRATIONAL, 0x80000000ffffffff, INT32_MIN, 0x80000000, 2147483648.0},
      {Type::FLOAT, 0xbfc00000, -1, 0, -1.5},
      {Type::FLOAT, 0x4f32d05e, INT32_MAX, 3000000000, 3e9},
      {Type::DOUBLE, 0x4202a05f20000000, INT32_MAX, UINT32_MAX, 1e10},
      {Type::DOUBLE, 0xc202a05f20000000, INT32_MIN, 0, -1e10},
      {Type::DOUBLE, 0x7ff8000000000000, 0, 0, NAN},
  };
  for (Row const& row : rows) {
    SCOPED_TRACE(&row - rows);
    auto const size = Value::sizeOfValueOfType(row.type);
    auto stream = streamOf(number(kMM, row.stored, static_cast<int>(size)));
    Value value;
    value.type = row.type;
    ASSERT_TRUE(value.read(stream));
    EXPECT_EQ(value.charValue(), static_cast<char>(row.whole));
    EXPECT_EQ(value.sbyteValue(), static_cast<std::int8_t>(row.whole));
    EXPECT_EQ(value.byteValue(), static_cast<std::uint8_t>(row.whole));
    EXPECT_EQ(value.sshortValue(), static_cast<std::int16_t>(row.whole));
    EXPECT_EQ(value.shortValue(), static_cast<std::uint16_t>(row.whole));
    EXPECT_EQ(value.slongValue(), row.whole);
    EXPECT_EQ(value.longValue(), row.positive);
    if (std::isnan(row.real)) {
      EXPECT_TRUE(std::isnan(value.doubleValue()) && std::isnan(value.floatValue()));
    } else {
      EXPECT_EQ(value.doubleValue(), row.real);
      EXPECT_EQ(value.floatValue(), static_cast<float>(row.real));
    }
    for (std::size_t const length : {size - 1, size / 3}) {
      auto cut = streamOf(Bytes(length, '\1'));
      EXPECT_FALSE(value.read(cut));
    }
  }
}

TEST(TiffValue, DividesInTheResultsPrecisionAndIsZeroWithoutAType) {
  auto stream = streamOf(Bytes("\1\0\0\1\0\0\0\5", 8));  // 16777217: too much for a float
  Value value;
  value.type = Type::RATIONAL;
  ASSERT_TRUE(value.read(stream));
  EXPECT_EQ(value.doubleValue(), 3355443.4);
  EXPECT_EQ(value.floatValue(), 3355443.25F);  // rounding the double would give .5
  auto const isPair = [](auto pair) { return pair.numerator == 16777217 && pair.denominator == 5; };
  EXPECT_TRUE(isPair(value.rationalValue()) && value.sRationalValue().denominator == 0);
  value.type = Type::SRATIONAL;
  EXPECT_TRUE(isPair(value.sRationalValue()) && value.rationalValue().denominator == 0);

  for (int const noType : {6, 12, 255}) {
    value.type = static_cast<Type>(noType);
    stream->setOffset(0);
    EXPECT_FALSE(value.read(stream));
    EXPECT_EQ(stream->getOffset(), 0);
    EXPECT_EQ(Value::sizeOfValueOfType(value.type), 0U);
    EXPECT_EQ(value.doubleValue() + value.floatValue() + value.longValue(), 0.0);
    EXPECT_EQ(value.byteValue() + value.charValue() + value.shortValue() + value.slongValue(), 0);
  }
}

/// "258 2", "[bytes]" or "5 at 1234"; after "=", the entry as a text, if it is one.
std::string shown(Entry const& entry) {
  std::string all;
  for (std::size_t i = 0; entry.values && i < entry.values->size(); ++i) {
    all += (i == 0 ? "" : " ") + std::to_string(entry.values->at(i)->longValue());
  }
  if (entry.bytes) {
    all += "[" + Bytes(entry.bytes->begin(), entry.bytes->end()) + "]";
  } else if (!entry.values) {
    all += std::to_string(entry.dataCount) + " at " + std::to_string(entry.dataOffset);
  }
  std::string text = "old";
  return entry.convertToString(text) ? all + "=" + text : all;
}

TEST(TiffEntry, ReadsValuesInTheFieldAndElsewhere) {
  Field fractions = {1, kRational, 130, 4};  // more than are read at once
  std::string numerators;
  for (int i = 0; i < 130; ++i) {
    fractions.numbers.insert(fractions.numbers.end(), {i, 1});
    numerators += (i == 0 ? "" : " ") + std::to_string(i);
  }
  std::pair<Field, std::string> const rows[] = {
      {shorts(1), "="},
      {shorts(1, 258, 2), "258 2"},
      {shorts(1, 258, 2, 3), "258 2 3"},
      {longs(1, 70000), "70000"},
      {values(1, kIfd, 4, 258), "258"},
      {values(1, kSShort, 2, 258), "258"},
      {values(1, kSLong, 4, 258, 9), "258 9"},
      {values(1, kDouble, 8, 0x4002000000000000, 0x4008000000000000), "2 3"},
      {fractions, numerators},
      {ascii(1, "AB"), "65 66 0=AB"},
      {characters(1, Bytes("AB\0CD", 5)), "65 66 0 67 68=AB"},
      {characters(1, "\xe9  "), "4294967273 32 32=\xe9  "},
      {characters(1, "AB", kByte), "65 66"},
      {characters(1, "", kUndefined), "[]="},
      {characters(1, "a", kUndefined), "[a]="},
      {characters(1, "abcd", kUndefined), "[abcd]="},
      {claim(1, kUndefined, 5, 123456), "5 at 123456="},
      {claim(1, kUndefined, 2000000, 123456), "2000000 at 123456="},
      {claim(1, kUndefined, 0xffffffff, 123456), "4294967295 at 123456="},
  };
  for (ByteOrder const order : kOrders) {
    for (auto const& [field, expected] : rows) {
      auto stream = streamOf(tiff(order, {{field}}), order, 10 + 2);
      Entry entry;
      EXPECT_EQ(entry.read(stream) ? shown(entry) : "none", expected);
    }
  }
  for (Field const& field : {values(1, 0, 1, 1), values(1, 14, 1, 1), values(1, 65535, 1, 1),
                             claim(1, kRational, 1, 5000), claim(1, kLong, 1073741825, 8)}) {
    auto stream = streamOf(tiff(kII, {{field}}), kII, 10 + 2);
    EXPECT_FALSE(Entry().read(stream)) << field.type;
  }
  auto stream = streamOf(tiff(kII, {{ascii(1, "ABC")}}), kII, 10 + 2);
  Entry mixed;
  ASSERT_TRUE(mixed.read(stream));
  mixed.values->at(2)->type = EntryValueType::BYTE;
  EXPECT_EQ(shown(mixed), "65 66 67 0");
  std::string text;
  EXPECT_FALSE(mixed.convertToString(text));
  EXPECT_EQ(text, "AB");
}

TEST(TiffEntry, LeavesTheStreamWhereItsLastReadEnded) {
  std::tuple<Bytes, bool, long> const rows[] = {
      {u16(kMM, kShort) + u32(kMM, 1) + "abcdefgh", true, 8},
      {u16(kMM, kShort) + u32(kMM, 3) + u32(kMM, 12) + "..abcdef", true, 18},
      {u16(kMM, kUndefined) + u32(kMM, 0) + "abcd", true, 6},
      {u16(kMM, kUndefined) + u32(kMM, 9) + "abcd", true, 10},
      {"\1", false, 1},
      {u16(kMM, 99) + u32(kMM, 1) + "abcd", false, 2},
      {u16(kMM, kLong) + "\1\1\1", false, 5},
      {u16(kMM, kLong) + u32(kMM, 1) + "\1\1\1", false, 9},
      {u16(kMM, kUndefined) + u32(kMM, 5) + "\1\1\1", false, 9},
      {u16(kMM, kByte) + u32(kMM, 65536) + u32(kMM, 10) + Bytes(65536, '\7'), true, 65546},
      {u16(kMM, kByte) + u32(kMM, 65537) + u32(kMM, 10) + Bytes(65537, '\7'), false, 6},
  };
  for (auto const& [bytes, isRead, position] : rows) {
    auto stream = streamOf(bytes);
    EXPECT_EQ(Entry().read(stream), isRead);
    EXPECT_EQ(stream->getOffset(), position);
  }
  auto cut = streamOf(u16(kMM, kUndefined) + u32(kMM, 4) + "AB");
  Entry entry;
  EXPECT_FALSE(entry.read(cut));
  EXPECT_EQ(shown(entry), Bytes("[AB\0\0]=", 7));
}

/// Reads the first directory into `ifd`: "274: 6, 34665: 1234, next 77"; after "! " what is there
/// when it cannot be read.
std::string readInto(QVTiffImageFileDirectory& ifd, Bytes const& tiffBytes, TagList const& tags) {
  auto stream = streamOf(tiffBytes);
  QVTiffHeader header;
  EXPECT_TRUE(header.read(stream, 42) && header.firstIFDOffset == 8);
  std::string all = ifd.read(stream, tags) ? "" : "! ";
  if (ifd.entries) {
    for (auto const& [tag, entry] : *ifd.entries) {
      all += std::to_string(tag) + ": " + shown(*entry) + ", ";
    }
  }
  return all + "next " + std::to_string(ifd.nextIFDOffset);
}
std::string readDirectory(Bytes const& tiffBytes, TagList const& tags) {
  QVTiffImageFileDirectory ifd;
  EXPECT_FALSE(ifd.entryForTag(274));
  return readInto(ifd, tiffBytes, tags);
}

TEST(TiffDirectory, KeepsTheFirstOfTheWantedTags) {
  Directory directory = {{shorts(274, 6), ascii(272, "Camera"), shorts(274, 8),
                          values(0xbeef, 99, 1, 1), longs(34665, 1234)},
                         77};
  Bytes const bytes = tiff(kMM, directory);
  EXPECT_EQ(readDirectory(bytes, {274, 34665, 42036, 34665}), "274: 6, 34665: 1234, next 77");
  EXPECT_EQ(readDirectory(tiff(kII, {{}, 9}), {274}), "next 9");
  QVTiffImageFileDirectory ifd;
  EXPECT_EQ(readInto(ifd, bytes, {274}), "274: 6, next 77");
  EXPECT_EQ(readInto(ifd, bytes, {}), "! 274: 6, next 77");  // it wants the entry of type 99 too
  drop(0xbeef)(directory);
  EXPECT_EQ(readInto(ifd, tiff(kMM, directory), {}),
            "272: 67 97 109 101 114 97 0=Camera, 274: 6, 34665: 1234, next 77");
  EXPECT_TRUE(ifd.entryForTag(274) && !ifd.entryForTag(273));
}

TEST(TiffDirectory, ReadsAListedTagOnceInListsOfAnyLength) {
  // The second 274 is malformed; 0x0140 and 0x0180 differ in their upper bits alone.
  Bytes const bytes = tiff(kII, {{shorts(274, 6), values(274, 99, 1, 1), shorts(0x0140, 1),
                                  shorts(0x0180, 2), shorts(0x9000, 3)}});
  for (std::size_t const count : {4U, 15U, 16U, 17U, 40U}) {
    TagList tags = {274, 0x0140, 0x0180};
    for (int tag = 0x9000; tags.size() < count; ++tag) {
      tags.push_back(static_cast<unsigned short>(tag));
    }
    EXPECT_EQ(readDirectory(bytes, tags), "274: 6, 320: 1, 384: 2, 36864: 3, next 0") << count;
    tags.push_back(0x0140);
    EXPECT_EQ(readDirectory(bytes, tags), "274: 6, 320: 1, 384: 2, 36864: 3, next 0") << count;
  }
}

TEST(TiffDirectory, StopsOnceAllWantedTagsAreFound) {
  Directory const three = {{shorts(1, 10), shorts(65, 20), shorts(3, 30)}, 0xffffffff};
  Bytes bytes = tiff(kII, three).substr(0, 46);
  bytes[8] = 20;  // entries that it claims
  EXPECT_EQ(readDirectory(bytes, {4}), "! next 0");
  for (int const times : {1, 2, 9}) {
    TagList tags = {1};
    for (int i = 0; i < times; ++i) {
      tags.insert(tags.end(), {3, 1});
    }
    // All are found; then the next directory's offset is missing.
    EXPECT_EQ(readDirectory(bytes, tags), "! 1: 10, 3: 30, next 0");
  }
  Bytes const whole = tiff(kMM, {{shorts(1, 6)}, 7});
  for (std::size_t length = 8; length < whole.size(); ++length) {
    bool const isThere = length >= 20;  // its two bytes are, those after it do not matter
    EXPECT_EQ(readDirectory(whole.substr(0, length), {1}), isThere ? "! 1: 6, next 0" : "! next 0");
  }
}

TEST(TiffDirectory, ReadsOnAfterTheFieldWhenTheSeekToValuesIsRefused) {
  Field const model = claim(1, kAscii, 5, 50);
  std::pair<Bytes, std::string> const rows[] = {
      {tiff(kMM, {{model}, 7}) + "HELLO", "0 0 0 7 72="},
      {tiff(kMM, {{model, claim(0x4845, 0x4c4c, 0x4f000000, 0)}}), "72 69 76 76 79=HELLO"},
  };
  for (auto const& [bytes, expected] : rows) {
    auto const refusing = std::make_shared<TestStream>(bytes);
    refusing->setOffset(8);
    refusing->onSeek = [](long target) { return target != 50; };
    std::shared_ptr<QVStream> stream = refusing;
    QVTiffImageFileDirectory ifd;
    ASSERT_TRUE(ifd.read(stream, {1}));
    EXPECT_EQ(shown(*ifd.entryForTag(1)), expected);
  }
}

}  // namespace
}  // namespace quavel::test
