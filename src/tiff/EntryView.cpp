#include "tiff/EntryView.h"

#include "quavel/QVTiffImageFileDirectoryEntry.h"

namespace quavel::detail {

EntryView::EntryView(QVTiffImageFileDirectoryEntry const& entry) : exists_(true) {
  if (entry.values) {
    shared_ = entry.values->data();
    size_ = entry.values->size();
  }
}

bool EntryView::convertToString(std::string& out) const {
  // Sized for the longest possible text and cut afterwards: appending would check the capacity for
  // every character.
  out.resize(size_);
  char* const text = out.data();
  std::size_t length = 0;
  bool isText = true;
  for (; length < size_; ++length) {
    ValuePointer const character = (*this)[length];
    isText = character->type == EntryValueType::ASCII;
    if (!isText || character->value[0] == '\0') {
      break;
    }
    text[length] = static_cast<char>(character->value[0]);
  }
  out.resize(length);
  return isText;
}

}  // namespace quavel::detail
