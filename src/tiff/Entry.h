#ifndef QUAVEL_SRC_TIFF_ENTRY_H
#define QUAVEL_SRC_TIFF_ENTRY_H

#include <cstddef>
#include <memory>
#include <string>

#include "quavel/QVTiffImageFileDirectoryEntryValue.h"

namespace quavel {

class QVTiffImageFileDirectoryEntry;

namespace detail {

using ValuePointer = QVTiffImageFileDirectoryEntryValue const*;

/// A view of one entry's values, which must outlive it: a reader's own directory has an array of
/// them, a public entry has shared pointers. As a bool: false when there is no entry.
class Entry {
 public:
  Entry() = default;
  explicit Entry(QVTiffImageFileDirectoryEntry const& entry);
  Entry(ValuePointer values, std::size_t count) : exists_(true), values_(values), size_(count) {}

  explicit operator bool() const { return exists_; }

  /// The number of values; 0 for an UNDEFINED entry, which has bytes instead.
  std::size_t size() const { return size_; }
  ValuePointer operator[](std::size_t i) const { return shared_ ? shared_[i].get() : values_ + i; }

  /// Stores the ASCII values up to a NUL. False: a value of another type ends them earlier.
  bool convertToString(std::string& out) const;

 private:
  bool exists_ = false;
  ValuePointer values_ = nullptr;  // an array of values
  std::shared_ptr<QVTiffImageFileDirectoryEntryValue> const* shared_ = nullptr;  // or pointers
  std::size_t size_ = 0;
};

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_TIFF_ENTRY_H
