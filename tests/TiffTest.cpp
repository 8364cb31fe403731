#include <gtest/gtest.h>

#include "support/Fixtures.h"

namespace quavel::test {
namespace {

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

TEST(TiffEntry, ReadsLongListsOfEightByteValues) {
  for (ByteOrder const order : kOrders) {
    Bytes doubles;
    std::vector<std::int64_t> halves;
    for (std::int64_t i = 0; i < 130; ++i) {
      halves.push_back(i);
      halves.push_back(1);
      doubles += number(order, i == 129 ? 0xc002000000000000 : 0, 8);
    }
    auto const fractions = readEntry(order, {1, kRational, 130, 4, halves});
    ASSERT_TRUE(fractions && fractions->values->size() == 130);
    EXPECT_EQ(fractions->values->at(64)->longValue(), 64U);
    EXPECT_EQ(fractions->values->at(129)->rationalValue().numerator, 129U);

    Source source(u16(order, kDouble) + u32(order, 130) + u32(order, 10) + doubles, order);
    QVTiffImageFileDirectoryEntry entry;
    ASSERT_TRUE(entry.read(source.stream));
    EXPECT_EQ(entry.values->back()->doubleValue(), -2.25);
  }
}

TEST(TiffEntry, LeavesTheStreamWhereItsLastReadEnded) {
  struct Row {
    Bytes bytes;
    bool isRead;
    long position;
  };
  Row const rows[] = {
      {u16(kMM, kShort) + u32(kMM, 1) + "abcdefgh", true, 8},
      {u16(kMM, kShort) + u32(kMM, 3) + u32(kMM, 12) + "..abcdef", true, 18},
      {u16(kMM, kUndefined) + u32(kMM, 0) + "abcd", true, 6},
      {u16(kMM, kUndefined) + u32(kMM, 9) + "abcd", true, 10},
      {u16(kMM, 99) + u32(kMM, 1) + "abcd", false, 2},
      {u16(kMM, kShort) + u32(kMM, 70000) + "abcd", false, 6},
  };
  for (Row const& row : rows) {
    Source source(row.bytes);
    EXPECT_EQ(QVTiffImageFileDirectoryEntry().read(source.stream), row.isRead);
    EXPECT_EQ(source.stream->getOffset(), row.position);
  }
  Source cut(u16(kMM, kUndefined) + u32(kMM, 4) + "AB");
  QVTiffImageFileDirectoryEntry entry;
  EXPECT_FALSE(entry.read(cut.stream));
  ASSERT_TRUE(entry.bytes);
  EXPECT_EQ(Bytes(entry.bytes->begin(), entry.bytes->end()), Bytes("AB\0\0", 4));
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

/// Longer than what is read at a time.
Bytes longText() {
  Bytes text;
  while (text.size() < 1300) {
    text += std::to_string(text.size()) + " ";
  }
  return text;
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
      {characters(1, longText()), true, longText()},
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
  auto const mixed = readEntry(kII, ascii(1, "ABC"));
  mixed->values->at(2)->type = EntryValueType::BYTE;
  std::string text;
  EXPECT_FALSE(mixed->convertToString(text));
  EXPECT_EQ(text, "AB");
}

TEST(TiffDirectory, KeepsTheFirstOfTheWantedTags) {
  Directory directory = {{shorts(kOrientation, {6}), ascii(kModel, "Camera"),
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
  QVTiffImageFileDirectory stopped;
  ASSERT_TRUE(stopped.read(source.stream, {kOrientation}));
  EXPECT_EQ(stopped.nextIFDOffset, 77U);

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

TEST(TiffDirectory, ReadsAListedTagOnceAndTheLongestLists) {
  // The second Orientation is malformed; 0x0140 and 0x0180 differ in their upper bits alone.
  Bytes const bytes = tiff(kII, {{shorts(kOrientation, {6}), values(kOrientation, 99, 1, {1}),
                                  shorts(0x0140, {1}), shorts(0x0180, {2})}});
  std::vector<unsigned short> tags = {kOrientation, 0x0140, 0x0180, 0x0140};
  for (int const more : {0, 40}) {
    for (int i = 0; i < more; ++i) {
      tags.push_back(static_cast<unsigned short>(0x9000 + i));
    }
    Source source(bytes, kII);
    source.stream->setOffset(8);
    QVTiffImageFileDirectory ifd;
    ASSERT_TRUE(ifd.read(source.stream, tags));
    ASSERT_EQ(ifd.entries->size(), 3U);
    EXPECT_EQ(ifd.entryForTag(0x0180)->values->front()->longValue(), 2U);
  }
}

/// Delivers nine bytes at most, or claims more than it was asked for.
struct OddStream : QVMStream {
  using QVMStream::QVMStream;
  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override {
    auto const delivered = QVMStream::readBuffer(destination, std::min<std::size_t>(count, 9));
    return claimsMore && count > 8 ? delivered + 1000 : delivered;
  }
  bool claimsMore = false;
};

TEST(TiffDirectory, TakesAStreamInPiecesButNoClaimBeyondWhatWasAsked) {
  for (bool const claimsMore : {false, true}) {
    Bytes bytes = tiff(kMM, plainTiff());
    auto const odd =
        std::make_shared<OddStream>(reinterpret_cast<unsigned char*>(bytes.data()), bytes.size());
    odd->claimsMore = claimsMore;
    std::shared_ptr<QVStream> stream = odd;
    EXPECT_EQ(QVTiffImage().read(stream), !claimsMore);
  }
}

TEST(TiffDirectory, ReadsValuesBehindTheFieldWhenTheSeekToThemIsRefused) {
  Bytes const before(100, '.');
  Directory const directory = {{claim(kModel, kAscii, 5, 50)}, 7};
  Directory const followed = {{claim(kModel, kAscii, 5, 50), claim(0x4845, 0x4c4c, 0x4f000000, 0)}};
  struct Row {
    Bytes bytes;
    Bytes values;
  };
  for (Row const& row : {Row{tiff(kMM, directory) + "HELLO", Bytes("\0\0\0\7H", 5)},
                         Row{tiff(kMM, followed), "HELLO"}}) {
    TemporaryFile const file(before + row.bytes.substr(8), "bin");
    std::shared_ptr<QVStream> stream = std::make_shared<QVFStream>(file.path);
    stream->setOffset(100);
    stream->baseOffset = -100;  // offset 50 is now before the start
    QVTiffImageFileDirectory ifd;
    ASSERT_TRUE(ifd.read(stream, {kModel}));
    Bytes values;
    for (auto const& value : *ifd.entryForTag(kModel)->values) {
      values.push_back(value->charValue());
    }
    EXPECT_EQ(values, row.values);
  }
}

TEST(TiffDirectory, StopsOnceAllWantedTagsAreFound) {
  Bytes const three =
      tiff(kII, {{shorts(1, {10}), shorts(65, {20}), shorts(3, {30})}, 0xffffffff}).substr(8, 38);
  Source source(u16(kII, 20) + three.substr(2), kII);
  QVTiffImageFileDirectory ifd;
  EXPECT_FALSE(ifd.read(source.stream, {4}));
  EXPECT_FALSE(ifd.entries);
  for (int const times : {1, 2, 9}) {
    std::vector<unsigned short> tags;
    for (int i = 0; i < times; ++i) {
      tags.insert(tags.end(), {3, 1});
    }
    source.stream->setOffset(0);
    ifd.entries = nullptr;
    // All are found; then the next directory's offset is missing.
    EXPECT_FALSE(ifd.read(source.stream, tags));
    ASSERT_TRUE(ifd.entries) << times;
    EXPECT_EQ(ifd.entries->size(), 2U);
    EXPECT_EQ(ifd.entryForTag(3)->values->front()->longValue(), 30U);
    EXPECT_EQ(ifd.nextIFDOffset, 0U);
  }
}

TEST(TiffDirectory, RefusesAnEntryThatIsCut) {
  Bytes const whole = tiff(kMM, {{shorts(kOrientation, {6})}});
  for (std::size_t const left : {0U, 5U, 7U, 9U}) {  // bytes of the entry
    Source source(whole.substr(0, 10 + left));
    source.stream->setOffset(8);
    QVTiffImageFileDirectory ifd;
    EXPECT_FALSE(ifd.read(source.stream, {kOrientation}));
    EXPECT_FALSE(ifd.entries) << left;
  }
}

}  // namespace
}  // namespace quavel::test
