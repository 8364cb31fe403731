#ifndef QUAVEL_SRC_TIFF_WANTEDTAGS_H
#define QUAVEL_SRC_TIFF_WANTEDTAGS_H

#include <array>
#include <bitset>
#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <memory>

namespace quavel::detail {

/// The tags whose entries a reader looks at. Some, such as OffsetTimeOriginal, are not used but
/// only checked: a malformed entry among them is a sign of damage, and the file is refused.
using TagList = std::initializer_list<unsigned short>;

/// The tags that are still wanted while a directory is read. A listed tag is wanted until it is
/// met; with an empty list, every entry is wanted, even one with a repeated tag.
class WantedTags {
 public:
  WantedTags(unsigned short const* tags, std::size_t count) : wantsAll_(count == 0) {
    if (wantsAll_) {
      mask_ = ~std::uint64_t{0};
    } else if (count > kMaxShortList) {
      longList_ = std::make_unique<LongList>();
    }
    for (auto const* tag = tags; tag != tags + count; ++tag) {
      add(*tag);
    }
  }

  /// Whether the tag is still wanted. If it is listed, it is struck off the list.
  bool take(unsigned short tag) {
    if (!mayBeWanted(tag)) {
      return false;
    }
    return wantsAll_ || (longList_ ? takeFromLongList(tag) : takeFromShortList(tag));
  }

  /// How many listed tags are still to be met; SIZE_MAX when every entry is wanted.
  std::size_t left() const { return wantsAll_ ? SIZE_MAX : left_; }

  /// Whether there is a list and all its tags have been met.
  bool allMet() const { return left_ == 0 && !wantsAll_; }

 private:
  static constexpr std::size_t kMaxShortList = 16;  // only hosts' lists are longer
  using LongList = std::bitset<std::size_t{UINT16_MAX} + 1>;

  static std::uint64_t bitOf(unsigned short tag) { return std::uint64_t{1} << (tag % 64); }
  bool mayBeWanted(unsigned short tag) const { return (mask_ & bitOf(tag)) != 0; }

  void add(unsigned short tag) {
    if (longList_) {
      left_ += longList_->test(tag) ? 0 : 1;
      longList_->set(tag);
    } else if (!mayBeWanted(tag) || find(tag) == left_) {  // not yet listed
      shortList_[left_++] = tag;
    }
    mask_ |= bitOf(tag);
  }

  bool takeFromLongList(unsigned short tag) {
    bool const isWanted = longList_->test(tag);
    longList_->reset(tag);
    left_ -= isWanted ? 1 : 0;
    return isWanted;
  }

  bool takeFromShortList(unsigned short tag) {
    std::size_t const i = find(tag);
    if (i == left_) {
      return false;
    }
    shortList_[i] = shortList_[--left_];  // the last one fills the gap
    return true;
  }

  /// The tag's index in the short list; `left_` when it is not there.
  std::size_t find(unsigned short tag) const {
    std::size_t i = 0;
    while (i < left_ && shortList_[i] != tag) {
      ++i;
    }
    return i;
  }

  bool const wantsAll_;
  std::uint64_t mask_ = 0;  // the `bitOf` of all listed tags: rules out most others quickly
  /// How many listed tags are still to be met. In a short list, they come first.
  std::size_t left_ = 0;
  std::array<unsigned short, kMaxShortList> shortList_;
  std::unique_ptr<LongList> longList_;  // null while the short list is enough
};

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_TIFF_WANTEDTAGS_H
