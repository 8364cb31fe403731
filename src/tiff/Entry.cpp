#include "tiff/Entry.h"

#include "quavel/QVTiffImageFileDirectoryEntry.h"

namespace quavel::detail {

Entry::Entry(QVTiffImageFileDirectoryEntry const& entry) : exists_(true) {
  if (entry.values) {
    shared_ = entry.values->data();
    size_ = entry.values->size();
  }
}

bool Entry::convertToString(std::string& out) const {
  // Resized to the greatest possible length, then cut: each append would check the capacity.
  out.resize(size_);
  char* const text = out.data();
  std::size_t length = 0;
  bool isText = true;
  for (; length < size_; ++length) {
    auto const* const value = (*this)[length];
    isText = value->type == EntryValueType::ASCII;
    text[length] = static_cast<char>(value->value[0]);
    if (!isText || text[length] == '\0') {
      break;
    }
  }
  out.resize(length);
  return isText;
}

}  // namespace quavel::detail
