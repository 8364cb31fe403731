#ifndef QUAVEL_SRC_TIFF_ENTRYVIEW_H
#define QUAVEL_SRC_TIFF_ENTRYVIEW_H

#include <cstddef>
#include <memory>
#include <string>

#include "quavel/QVTiffImageFileDirectoryEntryValue.h"

namespace quavel {

class QVTiffImageFileDirectoryEntry;

namespace detail {

using ValuePointer = QVTiffImageFileDirectoryEntryValue const*;

/// A view of one entry's values, which must outlive it. They are an array (in an EntryTable) or
/// shared pointers (in an entry that a host sees). As a bool: false when there is no entry.
class EntryView {
 public:
  EntryView() = default;
  explicit EntryView(QVTiffImageFileDirectoryEntry const& entry);
  EntryView(ValuePointer values, std::size_t count)
      : exists_(true), values_(values), size_(count) {}

  explicit operator bool() const { return exists_; }

  /// The number of values; 0 for an UNDEFINED entry, whose bytes a view does not give.
  std::size_t size() const { return size_; }
  ValuePointer operator[](std::size_t i) const { return shared_ ? shared_[i].get() : values_ + i; }

  /// Stores the text before the first NUL. False: a value before that NUL is not of type ASCII (a
  /// host's entry may mix types), and `out` holds the text before that value.
  bool convertToString(std::string& out) const;

 private:
  bool exists_ = false;
  ValuePointer values_ = nullptr;  // an array of values
  std::shared_ptr<QVTiffImageFileDirectoryEntryValue> const* shared_ = nullptr;  // or pointers
  std::size_t size_ = 0;
};

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_TIFF_ENTRYVIEW_H
