#ifndef QUAVEL_SRC_TIFF_ENTRYTABLE_H
#define QUAVEL_SRC_TIFF_ENTRYTABLE_H

#include <algorithm>
#include <cstdint>
#include <map>
#include <memory>
#include <vector>

#include "quavel/QVTiffImageFileDirectoryEntryValue.h"
#include "tiff/Entry.h"
#include "tiff/RawEntry.h"
#include "tiff/TiffWords.h"
#include "tiff/WantedTags.h"

namespace quavel {

class QVStream;
class QVTiffImageFileDirectoryEntry;

namespace detail {

class Journal;

/// The wanted entries of a directory as they are read, their values side by side. A host gets a map
/// made from it, of which it may keep any entry and any value.
class EntryTable {
 public:
  struct Row {
    unsigned short tag;
    std::uint16_t typeCode;
    std::uint32_t count;
    std::int64_t position;  ///< Of the entry, in the file.
    std::uint32_t field;    ///< UNDEFINED: its bytes as in the file, or their offset.
    std::uint32_t first;    ///< Index of its first value, if it has any.

    std::uint32_t valueCount() const { return typeCode == kUndefinedCode ? 0 : count; }
  };

  /// For a directory at a position in the file.
  EntryTable(DirectoryName const& name, std::int64_t position) : name_(name), position_(position) {}

  /// Reads the entry count at the stream's position, which is the directory's, and the wanted
  /// entries, until all have been met. To be called once. True: the stream stands after the last
  /// entry. False: the count, a tag or a wanted entry cannot be read, or the read has done too much
  /// work.
  bool read(QVStream& stream, WantedTags& wanted);

  /// The same at an offset, then the next directory's offset. Also false when that cannot be read.
  bool readWithNext(QVStream& stream, std::uint32_t offset, TagList tags,
                    std::uint32_t* nextIFDOffset);

  /// The first row with the tag, or null.
  Row const* find(unsigned short tag) const {
    auto const found =
        std::find_if(rows_.begin(), rows_.end(), [tag](Row const& row) { return row.tag == tag; });
    return found == rows_.end() ? nullptr : &*found;
  }
  /// The same with its values, or none.
  Entry entry(unsigned short tag) const {
    Row const* const row = find(tag);
    return row == nullptr ? Entry() : Entry(values_.data() + row->first, row->valueCount());
  }

  using Map = std::map<std::uint16_t, std::shared_ptr<QVTiffImageFileDirectoryEntry>>;
  /// Moves the values out: the table has none afterwards.
  std::shared_ptr<Map> takeEntries();

  DirectoryName const& name() const { return name_; }
  std::int64_t position() const { return position_; }
  Journal* journal() const { return journal_; }  ///< Of the read that filled the table; or null.

 private:
  bool readEntry(QVStream& stream, unsigned short tag, std::int64_t position,
                 RawEntry const& entry);
  bool refuseEntry(Row const& row, RawEntry const& entry) const;
  bool refuseValues(Row const& row, RawEntry const& entry, QVStream& stream) const;

  DirectoryName name_;
  std::int64_t position_;
  std::uint16_t entryCount_ = 0;
  Journal* journal_ = nullptr;
  std::vector<Row> rows_;
  std::vector<QVTiffImageFileDirectoryEntryValue> values_;
};

// An entry as hosts get it: each value can outlive the others.

using ValueBlock = std::vector<QVTiffImageFileDirectoryEntryValue>;
using ValueList = std::vector<std::shared_ptr<QVTiffImageFileDirectoryEntryValue>>;

/// Pointers to some of a block's values; each shares the ownership of the block.
std::shared_ptr<ValueList> listOf(std::shared_ptr<ValueBlock> const& block, std::size_t first,
                                  std::size_t count);

/// The field of an UNDEFINED entry: up to 4 bytes as in the file, missing ones as 0, or the offset
/// of more.
std::uint32_t undefinedField(RawEntry const& entry, bool isReversed);

/// Stores such a field.
void storeUndefined(std::uint32_t count, std::uint32_t field, QVTiffImageFileDirectoryEntry& entry);

/// "IFD0 at 8"
struct PlacedDirectory {
  EntryTable const* table;
};
void append(std::string& out, PlacedDirectory directory);

/// "0x0132 DateTime at 0xe6 (230) in IFD0"
struct PlacedEntry {
  EntryTable const& table;
  EntryTable::Row row;
};
void append(std::string& out, PlacedEntry entry);

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_TIFF_ENTRYTABLE_H
