#include <gtest/gtest.h>

#include "support/Streams.h"

namespace quavel::test {
namespace {

using Entry = QVTiffImageFileDirectoryEntry;
using TagList = std::vector<unsigned short>;

TEST(TiffHeader, DecidesTheByteOrder) {
  struct Row {
    Bytes bytes;
    bool isRead;
    ByteOrder order;
  };
  Row const rows[] = {
      {Bytes("II\x2a\0\x08\x01\0\0", 8), true, kII},
      {Bytes("MM\0\x2a\0\0\x01\x08", 8), true, kMM},
      {Bytes("II\0\x2a\x08\0\0\0", 8), false, kII},
      {Bytes("MM\0\x55\0\0\0\x08", 8), false, kMM},
      {Bytes("IM\x2a\0\x08\0\0\0", 8), false, kMM},
      {Bytes("IM\0\x2a\0\0\0\x08", 8), false, kMM},
      {Bytes("MI\0\x2a\0\0\0\x08", 8), false, kMM},
      {"I", false, kMM},
      {Bytes("II\x2a", 3), false, kII},
      {Bytes("II\x2a\0\x08\0", 6), false, kII},
  };
  for (Row const& row : rows) {
    SCOPED_TRACE(row.bytes);
    auto stream = streamOf(row.bytes);
    QVTiffHeader header;
    EXPECT_EQ(header.read(stream, 42), row.isRead);
    EXPECT_EQ(stream->byteOrder, row.order);
    EXPECT_TRUE(!row.isRead || header.firstIFDOffset == 0x108);
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

/// The only entry of a directory that was read with it; null: it cannot be read.
std::shared_ptr<Entry> readEntry(ByteOrder order, Field const& field) {
  auto stream = streamOf(tiff(order, {{field}}), order, 10 + 2);
  auto entry = std::make_shared<Entry>();
  return entry->read(stream) ? entry : nullptr;
}

TEST(TiffEntry, ReadsValuesInTheFieldAndElsewhere) {
  std::pair<Field, std::string> const rows[] = {
      {shorts(1, {}), "="},
      {shorts(1, {258, 2}), "258 2"},
      {shorts(1, {258, 2, 3}), "258 2 3"},
      {longs(1, {70000}), "70000"},
      {values(1, kIfd, 4, {258}), "258"},
      {values(1, kSShort, 2, {258}), "258"},
      {values(1, kSLong, 4, {258, 9}), "258 9"},
      {ascii(1, "AB"), "65 66 0=AB"},
      {characters(1, Bytes("AB\0CD", 5)), "65 66 0 67 68=AB"},
      {characters(1, "A  "), "65 32 32=A  "},
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
      auto const entry = readEntry(order, field);
      EXPECT_EQ(entry ? shown(*entry) : "none", expected);
    }
  }
  auto const mixed = readEntry(kII, ascii(1, "ABC"));
  mixed->values->at(2)->type = EntryValueType::BYTE;
  std::string text;
  EXPECT_FALSE(mixed->convertToString(text));
  EXPECT_EQ(text, "AB");
}

TEST(TiffEntry, ReadsValuesInSeveralParts) {
  Bytes text = "\xe9";
  while (text.size() < 1300) {
    text += std::to_string(text.size()) + " ";
  }
  for (ByteOrder const order : kOrders) {
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
    std::string found;
    EXPECT_TRUE(readEntry(order, characters(1, text))->convertToString(found));
    EXPECT_EQ(found, text);
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
      {u16(kMM, kByte) + u32(kMM, 65536) + u32(kMM, 10) + Bytes(65536, '\7'), true, 65546},
      {u16(kMM, kByte) + u32(kMM, 65537) + u32(kMM, 10) + Bytes(65537, '\7'), false, 6},
  };
  for (Row const& row : rows) {
    auto stream = streamOf(row.bytes);
    EXPECT_EQ(Entry().read(stream), row.isRead);
    EXPECT_EQ(stream->getOffset(), row.position);
  }
}

TEST(TiffEntry, RefusesWhatItCannotRead) {
  for (Field const& field : {values(1, 0, 1, {1}), values(1, 14, 1, {1}), values(1, 65535, 1, {1}),
                             claim(1, kRational, 1, 5000), claim(1, kLong, 1073741825, 8)}) {
    EXPECT_FALSE(readEntry(kII, field)) << "type " << field.type << " count " << field.count;
  }
  for (Bytes const& whole : {u16(kMM, kLong) + u32(kMM, 2) + u32(kMM, 0),
                             u16(kMM, kUndefined) + u32(kMM, 5) + u32(kMM, 0)}) {
    for (std::size_t length = 0; length < whole.size(); ++length) {
      auto stream = streamOf(whole.substr(0, length));
      Entry entry;
      EXPECT_FALSE(entry.read(stream) || entry.values) << length;
    }
  }
  auto cut = streamOf(u16(kMM, kUndefined) + u32(kMM, 4) + "AB");
  Entry entry;
  EXPECT_FALSE(entry.read(cut));
  EXPECT_EQ(shown(entry), Bytes("[AB\0\0]=", 7));
}

/// Reads the directory, or what follows its first 8 bytes, into `ifd`: "274: 6, 34665: 1234, next
/// 77"; after "! " what is there when it cannot be read.
std::string readInto(QVTiffImageFileDirectory& ifd, Bytes const& tiffBytes, TagList const& tags) {
  ByteOrder const order = tiffBytes[0] == 'I' ? kII : kMM;
  auto stream = streamOf(tiffBytes, order, 8);
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
  Directory directory = {{shorts(274, {6}), ascii(272, "Camera"), shorts(274, {8}),
                          values(0xbeef, 99, 1, {1}), longs(34665, {1234})},
                         77};
  Bytes const bytes = tiff(kMM, directory);
  EXPECT_EQ(readDirectory(bytes, {274, 34665, 42036, 34665}), "274: 6, 34665: 1234, next 77");
  EXPECT_EQ(readDirectory(bytes, {274}), "274: 6, next 77");
  EXPECT_EQ(readDirectory(tiff(kII, {{}, 9}), {274}), "next 9");
  QVTiffImageFileDirectory ifd;
  readInto(ifd, bytes, {274});
  EXPECT_EQ(readInto(ifd, bytes, {}), "! 274: 6, next 77");  // it wants the entry of type 99 too
  drop(0xbeef)(directory);
  EXPECT_EQ(readInto(ifd, tiff(kMM, directory), {}),
            "272: 67 97 109 101 114 97 0=Camera, 274: 6, 34665: 1234, next 77");
  EXPECT_TRUE(ifd.entryForTag(274) && !ifd.entryForTag(273));
}

TEST(TiffDirectory, ReadsAListedTagOnceInListsOfAnyLength) {
  // The second 274 is malformed; 0x0140 and 0x0180 differ in their upper bits alone.
  Bytes const bytes = tiff(kII, {{shorts(274, {6}), values(274, 99, 1, {1}), shorts(0x0140, {1}),
                                  shorts(0x0180, {2}), shorts(0x9000, {3})}});
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
  Directory const three = {{shorts(1, {10}), shorts(65, {20}), shorts(3, {30})}, 0xffffffff};
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
}

TEST(TiffDirectory, RefusesAnEntryThatIsCut) {
  Bytes const whole = tiff(kMM, {{shorts(1, {6})}, 7});
  EXPECT_EQ(readDirectory(whole, {1}), "1: 6, next 7");
  for (std::size_t length = 8; length < whole.size(); ++length) {
    bool const isThere = length >= 20;  // its two bytes are, those after it do not matter
    EXPECT_EQ(readDirectory(whole.substr(0, length), {1}), isThere ? "! 1: 6, next 0" : "! next 0");
  }
}

TEST(TiffDirectory, RefusesACountAboveWhatWasAskedFor) {
  auto const odd = std::make_shared<TestStream>(tiff(kMM, plainTiff()));
  odd->onRead = [&](auto* destination, std::size_t count) {
    return odd->deliver(destination, count) + (count > 8 ? 1000 : 0);
  };
  QVJournal journal;
  EXPECT_FALSE(journal.read(odd, "tif"));
  EXPECT_EQ(journal.refusal()->reason, QVReason::ReadError);
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
