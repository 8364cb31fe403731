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

/// A view of the values of an entry in a reader's own directory or in a host's. The values must
/// outlive the view. As a bool: false when no entry was found.
class Entry {
 public:
  Entry() = default;
  explicit Entry(QVTiffImageFileDirectoryEntry const& entry);
  Entry(ValuePointer values, std::size_t count) : exists_(true), values_(values), size_(count) {}

  explicit operator bool() const { return exists_; }

  /// The number of values; 0 for an UNDEFINED entry, which has bytes instead.
  std::size_t size() const { return size_; }
  ValuePointer operator[](std::size_t i) const { return shared_ ? shared_[i].get() : values_ + i; }

  /// Like `QVTiffImageFileDirectoryEntry::convertToString`.
  bool convertToString(std::string& out) const;

 private:
  bool exists_ = false;
  ValuePointer values_ = nullptr;  // the values in a reader's own directory
  std::shared_ptr<QVTiffImageFileDirectoryEntryValue> const* shared_ = nullptr;  // in a host's
  std::size_t size_ = 0;
};

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_TIFF_ENTRY_H
