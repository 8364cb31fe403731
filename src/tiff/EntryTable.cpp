#include "tiff/EntryTable.h"

#include <algorithm>

#include "journal/Journal.h"
#include "journal/Reading.h"
#include "quavel/QVTiffImageFileDirectoryEntry.h"
#include "stream/Bytes.h"
#include "tiff/EntryWalk.h"

namespace quavel::detail {

namespace {

// Enough for most directories. At 9 bytes each, they take just below 1 KB: glibc's `malloc` is
// slower for larger blocks.
constexpr std::size_t kReservedValues = 112;

// A damaged directory may declare 65535 entries: what is reserved for them has a bound.
constexpr std::size_t kMaxReservedRows = 256;

bool refuseEntryCount(Journal* journal, EntryTable const& table) {
  return refuseCut(journal, table.position(), kEntryCountSize, "the entry count of {}",
                   table.placed());
}

bool refuseNextOffset(Journal* journal, EntryTable const& table, std::uint16_t entryCount) {
  std::int64_t const entriesSize = std::int64_t{kEntrySize} * entryCount;
  return refuseCut(journal, table.position() + kEntryCountSize + entriesSize, sizeof(std::uint32_t),
                   "the offset of the next directory, after the {} entries of {}", entryCount,
                   table.placed());
}

}  // namespace

bool EntryTable::read(QVStream& stream, WantedTags& wanted) {
  Reading& reading = readingOf(stream);
  journal_ = reading.journal;
  if (!stream.readShort(&entryCount_)) {
    return refuseEntryCount(journal_, *this);
  }
  if (!reading.spend(Work::Directories, 1)) {
    return false;
  }

  rows_.reserve(std::min({std::size_t{entryCount_}, wanted.left(), kMaxReservedRows}));
  values_.reserve(kReservedValues);
  EntryWalk walk(stream, entryCount_, position_ + kEntryCountSize);
  for (; !walk.isAtEnd() && !wanted.allMet(); walk.advance()) {
    if (!walk.bufferEntry()) {  // not even the tag is there
      return refuseCut(journal_, walk.position(), kEntryTagSize, "entry {} of {} of {}",
                       walk.number(), entryCount_, placed());
    }
    unsigned short const tag = walk.tag();
    if (!wanted.take(tag)) {
      continue;
    }
    RawEntry entry;
    // The walk may have read ahead, so the stream goes to the entry's end first. `readValues` seeks
    // from there to the values; a host's stream that ignores this seek is read from the entry's
    // end.
    if (!seek(stream, walk.nextOffset()) || !walk.parseRest(&entry)) {
      return refuseCut(journal_, walk.position() + std::int64_t{kEntryTypePosition},
                       kEntryFieldPosition - kEntryTypePosition, "{}",
                       PlacedEntry{*this, tag, walk.position()});
    }
    if (!readEntry(stream, tag, walk.position(), entry)) {
      return false;
    }
  }

  // The walk may have stopped early, and reading values has moved the stream. This fails only if
  // the directory ends beyond the last offset that a stream can have.
  if (!seek(stream, walk.endOffset())) {
    return refuseNextOffset(journal_, *this, entryCount_);
  }
  return reading.spend(Work::Entries, walk.passed());
}

bool EntryTable::readEntry(QVStream& stream, unsigned short tag, std::int64_t position,
                           RawEntry const& entry) {
  auto const firstValue = static_cast<std::uint32_t>(values_.size());
  Row row = {tag, entry.typeCode, entry.count, position, /*bytesOrOffset=*/0, firstValue};
  if (!isKnown(entry.typeCode) || hasTooManyValues(entry) || !hasUsedFieldBytes(entry)) {
    return refuseEntry(row, entry);
  }
  if (entry.typeCode == kUndefinedCode) {
    row.bytesOrOffset = undefinedBytesOrOffset(entry, needsReversal(stream));
  } else if (!readingOf(stream).spend(Work::Values, entry.count)) {
    return false;
  } else if (!readValues(stream, entry, values_)) {
    return refuseValues(row, entry, stream);
  }
  rows_.push_back(row);
  return true;
}

bool EntryTable::readWithNext(QVStream& stream, std::uint32_t offset, TagList tags,
                              std::uint32_t* nextIFDOffset) {
  if (!seek(stream, offset)) {
    return refuseEntryCount(readingOf(stream).journal, *this);  // `journal_` is not set yet
  }
  WantedTags wanted(tags.begin(), tags.size());
  if (!read(stream, wanted)) {
    return false;
  }
  if (!stream.readLong(nextIFDOffset)) {
    return refuseNextOffset(journal_, *this, entryCount_);
  }
  noteStep(journal_, position_, "{}: has {} of the {} wanted entries", placed(),
           static_cast<std::uint32_t>(rows_.size()), static_cast<std::uint32_t>(tags.size()));
  return true;
}

bool EntryTable::refuseEntry(Row const& row, RawEntry const& entry) const {
  PlacedEntry const place = {*this, row.tag, row.position};
  if (!isKnown(row.typeCode)) {
    return refuse(journal_, QVReason::MalformedEntry, row.position,
                  "{}: field type {} is not one of TIFF's, 1 to 13", place,
                  std::uint32_t{row.typeCode});
  }
  if (hasTooManyValues(entry)) {
    return refuse(journal_, QVReason::TooManyValues, row.position,
                  "{}: it declares {}; more than {} are refused", place,
                  TypedCount{row.count, row.typeCode}, kMaxValuesOfEntry);
  }
  return refuseCut(journal_, row.position + std::int64_t{kEntryFieldPosition},
                   static_cast<std::int64_t>(usedFieldSize(entry)), "{}", place);
}

bool EntryTable::refuseValues(Row const& row, RawEntry const& entry, QVStream& stream) const {
  if (journal_ == nullptr) {
    return false;
  }
  std::int64_t const begin = stream.baseOffset + valueOffset(entry, needsReversal(stream));
  std::int64_t const end = begin + static_cast<std::int64_t>(sizeOfValues(entry));
  return refuse(journal_, journal_->cutReason(), begin,
                "{}: its {} would begin at {} and end at {}, but {}",
                PlacedEntry{*this, row.tag, row.position}, TypedCount{row.count, row.typeCode},
                Offset{begin}, Offset{end}, journal_->cutText(end));
}

void append(std::string& out, PlacedDirectory directory) {
  append(out, directory.name);
  out += " at ";
  append(out, Offset{directory.position});
}

void append(std::string& out, PlacedEntry entry) {
  append(out, TagName{entry.tag});
  out += " at ";
  append(out, Offset{entry.position});
  out += " in ";
  append(out, entry.table.name());
}

}  // namespace quavel::detail
