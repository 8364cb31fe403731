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

/// A view of an entry's values, which belong to a reader's directory or a host's and must outlive
/// it. It may be empty: there is no such entry.
class Entry {
 public:
  Entry() = default;
  explicit Entry(QVTiffImageFileDirectoryEntry const& entry);
  Entry(ValuePointer values, std::size_t count) : exists_(true), values_(values), size_(count) {}

  explicit operator bool() const { return exists_; }

  /// An UNDEFINED entry holds no values.
  std::size_t size() const { return size_; }
  ValuePointer operator[](std::size_t i) const { return shared_ ? shared_[i].get() : values_ + i; }

  /// As that of `QVTiffImageFileDirectoryEntry`.
  bool convertToString(std::string& out) const;

 private:
  bool exists_ = false;
  ValuePointer values_ = nullptr;  // side by side, or
  std::shared_ptr<QVTiffImageFileDirectoryEntryValue> const* shared_ = nullptr;
  std::size_t size_ = 0;
};

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_TIFF_ENTRY_H
