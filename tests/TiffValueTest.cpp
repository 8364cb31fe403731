#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <limits>

#include "support/Streams.h"

namespace quavel::test {
namespace {

using Value = QVTiffImageFileDirectoryEntryValue;

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
      {"7/4", EntryValueType::SRATIONAL, Bytes("\0\0\0\7\0\0\0\4", 8), 1, 1, 1, 1, 1.75},
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
    auto stream = streamOf(row.stored);
    Value value;
    value.type = row.type;
    ASSERT_TRUE(value.read(stream));
    EXPECT_EQ(static_cast<signed char>(value.charValue()), row.s8);
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
    auto cut = streamOf(row.stored.substr(1));
    EXPECT_FALSE(value.read(cut));
  }
}

TEST(TiffValue, DividesInTheResultsPrecision) {
  auto stream = streamOf(Bytes("\1\0\0\1\0\0\0\5", 8));  // 16777217: too much for a float
  Value value;
  value.type = EntryValueType::RATIONAL;
  ASSERT_TRUE(value.read(stream));
  EXPECT_EQ(value.doubleValue(), 3355443.4);
  EXPECT_EQ(value.floatValue(), 3355443.25F);  // rounding the double would give .5
  EXPECT_EQ(value.rationalValue().numerator, 16777217U);
  EXPECT_EQ(value.rationalValue().denominator, 5U);
  EXPECT_EQ(value.sRationalValue().denominator, 0);
  value.type = EntryValueType::SRATIONAL;
  EXPECT_EQ(value.sRationalValue().numerator, 16777217);
  EXPECT_EQ(value.sRationalValue().denominator, 5);
  EXPECT_EQ(value.rationalValue().denominator, 0U);
}

TEST(TiffValue, GivesZeroForWhatIsNotAType) {
  for (int const type : {6, 12, 255}) {
    auto stream = streamOf("\1\1\1\1\1\1\1\1");
    Value value;
    value.type = static_cast<EntryValueType>(type);
    std::memset(value.value, 1, sizeof(value.value));
    EXPECT_FALSE(value.read(stream));
    EXPECT_EQ(stream->getOffset(), 0);
    EXPECT_EQ(Value::sizeOfValueOfType(value.type), 0U);
    EXPECT_EQ(value.byteValue() + value.charValue() + value.shortValue() + value.slongValue(), 0);
    EXPECT_EQ(value.longValue(), 0U);
    EXPECT_EQ(value.floatValue() + value.doubleValue(), 0.0);
  }
}

}  // namespace
}  // namespace quavel::test
