#include <gtest/gtest.h>

#include "support/Streams.h"

namespace quavel::test {
namespace {

using Entry = QVTiffImageFileDirectoryEntry;

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
      {Bytes("IM\0\x2a\0\0\0\x08", 8), false, kMM, 0},
      {Bytes("MI\0\x2a\0\0\0\x08", 8), false, kMM, 0},
      {"I", false, kMM, 0},
      {Bytes("II\x2a", 3), false, kII, 0},
      {Bytes("II\x2a\0\x08\0", 6), false, kII, 0},
  };
  for (Row const& row : rows) {
    SCOPED_TRACE(row.bytes);
    auto stream = streamOf(row.bytes);
    QVTiffHeader header;
    EXPECT_EQ(header.read(stream, 42), row.isRead);
    EXPECT_EQ(stream->byteOrder, row.order);
    if (row.isRead) {
      EXPECT_EQ(header.firstIFDOffset, row.offset);
    }
  }
}

/// The only entry of a directory that was read with it, or null.
std::shared_ptr<Entry> readEntry(ByteOrder order, Field const& field) {
  auto stream = streamOf(tiff(order, {{field}}), order, 10 + 2);
  auto entry = std::make_shared<Entry>();
  return entry->read(stream) ? entry : nullptr;
}

TEST(TiffEntry, ReadsValuesInTheFieldAndElsewhere) {
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
    // More than is read at a time.
    Bytes doubles;
    std::vector<std::int64_t> halves;
    for (std::int64_t i = 0; i < 130; ++i) {
      halves.insert(halves.end(), {i, 1});
      doubles += number(order, i == 129 ? 0xc002000000000000 : 0, 8);
    }
    auto const fractions = readEntry(order, {1, kRational, 130, 4, halves});
    ASSERT_TRUE(fractions && fractions->values->size() == 130);
    EXPECT_EQ(fractions->values->at(64)->longValue(), 64U);
    EXPECT_EQ(fractions->values->at(129)->rationalValue().numerator, 129U);
    auto stream = streamOf(u16(order, kDouble) + u32(order, 130) + u32(order, 10) + doubles, order);
    Entry entry;
    ASSERT_TRUE(entry.read(stream));
    EXPECT_EQ(entry.values->back()->doubleValue(), -2.25);
  }
  auto const empty = readEntry(kII, shorts(1, {}));
  ASSERT_TRUE(empty && empty->values);
  EXPECT_TRUE(empty->values->empty());
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
    auto stream = streamOf(row.bytes);
    EXPECT_EQ(Entry().read(stream), row.isRead);
    EXPECT_EQ(stream->getOffset(), row.position);
  }
}

TEST(TiffEntry, KeepsUndefinedBytesApart) {
  for (Bytes const bytes : {"", "a", "abcd"}) {
    auto const entry = readEntry(kMM, characters(1, bytes, kUndefined));
    ASSERT_TRUE(entry && entry->bytes);
    EXPECT_EQ(Bytes(entry->bytes->begin(), entry->bytes->end()), bytes);
    EXPECT_FALSE(entry->values);
  }
  for (std::uint32_t const count : {5U, 70000U, 2000000U, 0xffffffffU}) {
    auto const entry = readEntry(kII, claim(1, kUndefined, count, 123456));
    ASSERT_TRUE(entry) << count;
    EXPECT_FALSE(entry->values || entry->bytes);
    EXPECT_EQ(entry->dataCount, count);
    EXPECT_EQ(entry->dataOffset, 123456U);
    std::string text = "old";
    EXPECT_TRUE(entry->convertToString(text));
    EXPECT_EQ(text, "");
  }
  auto cut = streamOf(u16(kMM, kUndefined) + u32(kMM, 4) + "AB");
  Entry entry;
  EXPECT_FALSE(entry.read(cut));
  ASSERT_TRUE(entry.bytes);
  EXPECT_EQ(Bytes(entry.bytes->begin(), entry.bytes->end()), Bytes("AB\0\0", 4));
}

TEST(TiffEntry, RefusesWhatItCannotRead) {
  for (Field const& field : {values(1, 0, 1, {1}), values(1, 14, 1, {1}), values(1, 65535, 1, {1}),
                             claim(1, kRational, 1, 5000), claim(1, kLong, 1073741825, 8)}) {
    EXPECT_FALSE(readEntry(kII, field)) << "type " << field.type << " count " << field.count;
  }
  Bytes const whole = u16(kMM, kLong) + u32(kMM, 2) + u32(kMM, 0);
  Bytes const undefined = u16(kMM, kUndefined) + u32(kMM, 5) + u32(kMM, 0);
  for (std::size_t length = 0; length < whole.size(); ++length) {
    for (Bytes const& bytes : {whole, undefined}) {
      auto stream = streamOf(bytes.substr(0, length));
      Entry entry;
      EXPECT_FALSE(entry.read(stream)) << length;
      EXPECT_FALSE(entry.values);
    }
  }
}

TEST(TiffEntry, ReadsAsManyValuesAsAreAllowed) {
  for (std::uint32_t const count : {65536U, 65537U}) {
    auto stream = streamOf(u16(kMM, kByte) + u32(kMM, count) + u32(kMM, 10) + Bytes(65537, '\7'));
    Entry entry;
    EXPECT_EQ(entry.read(stream), count == 65536);
    if (entry.values) {
      EXPECT_EQ(entry.values->size(), 65536U);
      EXPECT_EQ(entry.values->back()->byteValue(), 7);
    }
  }
}

TEST(TiffEntry, ConvertsTextUpToTheFirstNul) {
  Bytes longText;  // longer than what is read at a time
  while (longText.size() < 1300) {
    longText += std::to_string(longText.size()) + " ";
  }
  std::pair<Field, std::string> const rows[] = {
      {ascii(1, "ABCDE"), "ABCDE"},
      {characters(1, Bytes("AB\0CD", 5)), "AB"},
      {characters(1, "ABC"), "ABC"},
      {characters(1, "trailing  "), "trailing  "},
      {characters(1, longText), longText},
      {characters(1, "\xe9t\xe9!!"), "\xe9t\xe9!!"},
      {characters(1, ""), ""},
      {longs(1, {65}), "! "},
      {characters(1, "AB", kByte), "! "},
  };
  for (auto const& [field, expected] : rows) {
    auto const entry = readEntry(kII, field);
    ASSERT_TRUE(entry);
    std::string text = "old";
    bool const isText = entry->convertToString(text);
    EXPECT_EQ((isText ? "" : "! ") + text, expected);
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
  QVTiffImageFileDirectory ifd;
  EXPECT_FALSE(ifd.entryForTag(kOrientation));
  auto const read = [&](std::vector<unsigned short> const& tags) {
    auto stream = streamOf(tiff(kMM, directory), kMM, 8);
    return ifd.read(stream, tags);
  };
  ASSERT_TRUE(read({kOrientation, kExif, kLensModel, kExif}));
  EXPECT_EQ(ifd.entries->size(), 2U);
  EXPECT_EQ(ifd.entryForTag(kOrientation)->values->front()->longValue(), 6U);
  EXPECT_EQ(ifd.nextIFDOffset, 77U);
  EXPECT_FALSE(ifd.entryForTag(kModel));
  directory.next = 78;
  ASSERT_TRUE(read({kOrientation}));  // found at once, after which the rest is skipped
  EXPECT_EQ(ifd.nextIFDOffset, 78U);

  EXPECT_FALSE(read({}));  // it wants the entry of type 99 too
  EXPECT_EQ(ifd.entries->size(), 1U);
  drop(0xbeef)(directory);
  ASSERT_TRUE(read({}));
  EXPECT_EQ(ifd.entries->size(), 3U);
  EXPECT_EQ(ifd.entryForTag(kOrientation)->values->front()->longValue(), 6U);
  directory = {{}, 9};
  ASSERT_TRUE(read({kOrientation}));
  EXPECT_TRUE(ifd.entries->empty());
  EXPECT_EQ(ifd.nextIFDOffset, 9U);
}

TEST(TiffDirectory, ReadsAListedTagOnceInListsOfAnyLength) {
  // The second Orientation is malformed; 0x0140 and 0x0180 differ in their upper bits alone.
  Bytes const bytes = tiff(kII, {{shorts(kOrientation, {6}), values(kOrientation, 99, 1, {1}),
                                  shorts(0x0140, {1}), shorts(0x0180, {2}), shorts(0x9000, {3})}});
  for (std::size_t const count : {4U, 15U, 16U, 17U, 40U}) {  // 16 fit into the short list
    std::vector<unsigned short> tags = {kOrientation, 0x0140, 0x0180, 0x0140};
    for (int tag = 0x9000; tags.size() <= count; ++tag) {
      tags.push_back(static_cast<unsigned short>(tag));
    }
    auto stream = streamOf(bytes, kII, 8);
    QVTiffImageFileDirectory ifd;
    ASSERT_TRUE(ifd.read(stream, tags)) << count;
    ASSERT_EQ(ifd.entries->size(), 4U) << count;
    EXPECT_EQ(ifd.entryForTag(0x0180)->values->front()->longValue(), 2U);
  }
}

TEST(TiffDirectory, TakesNoClaimBeyondWhatWasAskedFor) {
  auto const odd = std::make_shared<TestStream>(tiff(kMM, plainTiff()));
  odd->onRead = [&](auto* destination, std::size_t count) {
    return odd->deliver(destination, count) + (count > 8 ? 1000 : 0);
  };
  std::shared_ptr<QVStream> const stream = odd;
  EXPECT_EQ(readStream(stream, "tif"), "! ");
}

TEST(TiffDirectory, ReadsOnAfterTheFieldWhenTheSeekToValuesIsRefused) {
  Field const model = claim(kModel, kAscii, 5, 50);
  std::pair<Bytes, Bytes> const rows[] = {
      {tiff(kMM, {{model}, 7}) + "HELLO", Bytes("\0\0\0\7H", 5)},
      {tiff(kMM, {{model, claim(0x4845, 0x4c4c, 0x4f000000, 0)}}), "HELLO"},
  };
  for (auto const& [bytes, expected] : rows) {
    auto const refusing = std::make_shared<TestStream>(bytes);
    refusing->setOffset(8);
    refusing->onSeek = [](long target) { return target != 50; };
    std::shared_ptr<QVStream> stream = refusing;
    QVTiffImageFileDirectory ifd;
    ASSERT_TRUE(ifd.read(stream, {kModel}));
    Bytes found;
    for (auto const& value : *ifd.entryForTag(kModel)->values) {
      found.push_back(value->charValue());
    }
    EXPECT_EQ(found, expected);
  }
}

TEST(TiffDirectory, StopsOnceAllWantedTagsAreFound) {
  Bytes const three =
      tiff(kII, {{shorts(1, {10}), shorts(65, {20}), shorts(3, {30})}, 0xffffffff}).substr(8, 38);
  for (int const times : {0, 1, 2, 9}) {
    std::vector<unsigned short> tags = {static_cast<unsigned short>(times == 0 ? 4 : 1)};
    for (int i = 0; i < times; ++i) {
      tags.insert(tags.end(), {3, 1});
    }
    // It claims 20 entries. Where all wanted are found, only the next directory's offset is
    // missing.
    auto stream = streamOf(u16(kII, 20) + three.substr(2), kII);
    QVTiffImageFileDirectory ifd;
    EXPECT_FALSE(ifd.read(stream, tags));
    ASSERT_EQ(ifd.entries != nullptr, times != 0) << times;
    if (ifd.entries) {
      EXPECT_EQ(ifd.entries->size(), 2U);
      EXPECT_EQ(ifd.entryForTag(3)->values->front()->longValue(), 30U);
      EXPECT_EQ(ifd.nextIFDOffset, 0U);
    }
  }
}

TEST(TiffDirectory, RefusesAnEntryThatIsCut) {
  Bytes const whole = tiff(kMM, {{shorts(kOrientation, {6})}});
  for (std::size_t length = 8; length < whole.size(); ++length) {
    auto stream = streamOf(whole.substr(0, length), kMM, 8);
    QVTiffImageFileDirectory ifd;
    EXPECT_FALSE(ifd.read(stream, {kOrientation}));
    EXPECT_EQ(ifd.entries != nullptr, length >= 10 + 10) << length;  // its two bytes are there
  }
}

}  // namespace
}  // namespace quavel::test
