#ifndef QUAVEL_SRC_TIFF_ENTRYTABLE_H
#define QUAVEL_SRC_TIFF_ENTRYTABLE_H

#include <cstdint>
#include <map>
#include <memory>
#include <vector>

#include "quavel/QVTiffImageFileDirectoryEntryValue.h"
#include "tiff/EntryView.h"
#include "tiff/RawEntry.h"
#include "tiff/TiffWords.h"
#include "tiff/WantedTags.h"

namespace quavel {

class QVStream;
class QVTiffImageFileDirectoryEntry;

namespace detail {

class Journal;

/// A directory in a note: "IFD0 at 8".
struct PlacedDirectory {
  PartName const& name;
  std::int64_t position;  ///< In the file.
};
void append(std::string& out, PlacedDirectory directory);

/// A directory's wanted entries, with all their values in one array.
class EntryTable {
 public:
  struct Row {
    unsigned short tag;
    std::uint16_t typeCode;
    std::uint32_t count;
    std::int64_t position;        ///< Of the entry, in the file.
    std::uint32_t bytesOrOffset;  ///< Of an UNDEFINED entry: up to 4 bytes, or the offset of more.
    std::uint32_t firstValue;     ///< The index of its first value in the array.

    std::uint32_t valueCount() const { return typeCode == kUndefinedCode ? 0 : count; }
  };

  /// The directory's name and its position in the file are only for notes.
  EntryTable(PartName const& name, std::int64_t position) : name_(name), position_(position) {}

  /// Reads the directory at the stream's position: the entry count, then the wanted entries, until
  /// all have been met. To be called once. True: the stream stands after the directory's last
  /// entry. False: the count, a tag or a wanted entry cannot be read, or the read exceeds a limit.
  bool read(QVStream& stream, WantedTags& wanted);

  /// Seeks to `offset`, calls `read`, reads the next directory's offset. False: one of these fails.
  bool readWithNext(QVStream& stream, std::uint32_t offset, TagList tags,
                    std::uint32_t* nextIFDOffset);

  /// The first row with the tag, or null.
  Row const* find(unsigned short tag) const {
    for (Row const& row : rows_) {  // `std::find_if` takes more instructions: tables are short
      if (row.tag == tag) {
        return &row;
      }
    }
    return nullptr;
  }
  /// The first entry with the tag; false as a bool when there is none.
  EntryView entry(unsigned short tag) const {
    Row const* const row = find(tag);
    return row == nullptr ? EntryView()
                          : EntryView(values_.data() + row->firstValue, row->valueCount());
  }

  using Map = std::map<std::uint16_t, std::shared_ptr<QVTiffImageFileDirectoryEntry>>;
  /// The entries for a host to keep. The values are moved out of the table.
  std::shared_ptr<Map> takeEntries();

  PartName const& name() const { return name_; }
  std::int64_t position() const { return position_; }
  PlacedDirectory placed() const { return {name_, position_}; }
  Journal* journal() const { return journal_; }  ///< Of the read that filled the table, or null.

 private:
  bool readEntry(QVStream& stream, unsigned short tag, std::int64_t position,
                 RawEntry const& entry);
  bool refuseEntry(Row const& row, RawEntry const& entry) const;
  bool refuseValues(Row const& row, RawEntry const& entry, QVStream& stream) const;

  PartName name_;
  std::int64_t position_;
  std::uint16_t entryCount_ = 0;
  Journal* journal_ = nullptr;
  std::vector<Row> rows_;
  std::vector<QVTiffImageFileDirectoryEntryValue> values_;
};

// Hosts get entries as objects that share their values; the library's readers use `entry` instead.
// `takeEntries` and the next three functions, all in HostEntry.cpp, make what hosts get.
using ValueBlock = std::vector<QVTiffImageFileDirectoryEntryValue>;
using ValueList = std::vector<std::shared_ptr<QVTiffImageFileDirectoryEntryValue>>;

/// Pointers to `count` values of a block, from index `first` on; each keeps the block alive.
std::shared_ptr<ValueList> listOf(std::shared_ptr<ValueBlock> const& block, std::size_t first,
                                  std::size_t count);

/// What is kept of an UNDEFINED entry. Up to 4 bytes are kept as in the file; those that the file's
/// end cuts off are zeros. Of more bytes, their offset is kept, in this machine's byte order.
std::uint32_t undefinedBytesOrOffset(RawEntry const& entry, bool isReversed);

/// Stores in a host's entry the `count` bytes or the offset that `undefinedBytesOrOffset` has
/// given.
void storeUndefined(std::uint32_t count, std::uint32_t bytesOrOffset,
                    QVTiffImageFileDirectoryEntry& entry);

/// An entry in a note: "0x0132 DateTime at 0xe6 (230) in IFD0".
struct PlacedEntry {
  EntryTable const& table;
  unsigned short tag;
  std::int64_t position;
};
void append(std::string& out, PlacedEntry entry);

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_TIFF_ENTRYTABLE_H
