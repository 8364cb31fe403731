#ifndef QUAVEL_SRC_TIFF_ENTRYPOOLS_H
#define QUAVEL_SRC_TIFF_ENTRYPOOLS_H

#include <algorithm>
#include <cstddef>
#include <memory>
#include <new>
#include <vector>

#include "quavel/QVTiffImageFileDirectoryEntry.h"
#include "quavel/QVTiffImageFileDirectoryEntryValue.h"

namespace quavel::detail {

/// Makes shared objects a block at a time: one allocation for `kBlockSize` of them. Each keeps its
/// whole block alive, so what is made together should be let go together.
template <class T, std::size_t kBlockSize>
class BlockPool {
 public:
  std::shared_ptr<T> make() {
    T* const object = makeInBlock();
    return {block_, object};
  }

  /// Appends a new object to a list. The objects come from two blocks in turn: when a list is let
  /// go, counting down the same block at every step would make each step wait for the one before.
  T& appendTo(std::vector<std::shared_ptr<T>>& list) {
    block_.swap(otherBlock_);
    T* const object = makeInBlock();
    list.emplace_back(block_, object);
    return *object;
  }

 private:
  /// Room for the objects; only those that were made are ever touched.
  struct Block {
    Block() {}  // not "= default": that would have all slots zeroed
    ~Block() { std::destroy(reinterpret_cast<T*>(slots), end()); }
    Block(Block const&) = delete;
    Block& operator=(Block const&) = delete;

    T* end() { return reinterpret_cast<T*>(slots) + used; }

    std::size_t used = 0;
    alignas(T) std::byte slots[kBlockSize * sizeof(T)];
  };

  T* makeInBlock() {
    if (!block_ || block_->used == kBlockSize) {
      block_ = std::make_shared<Block>();
    }
    T* const object = ::new (block_->end()) T();
    ++block_->used;
    return object;
  }

  std::shared_ptr<Block> block_;
  std::shared_ptr<Block> otherBlock_;
};

/// What the entries of one directory are made of. The three kinds own each other in this order,
/// so each needs blocks of its own: a block that owned itself would never be freed.
struct EntryPools {
  using ValueList = std::vector<std::shared_ptr<QVTiffImageFileDirectoryEntryValue>>;

  BlockPool<QVTiffImageFileDirectoryEntry, 12> entries;
  BlockPool<ValueList, 12> lists;
  BlockPool<QVTiffImageFileDirectoryEntryValue, 32> values;  // a date takes 20, a lens 40
};

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_TIFF_ENTRYPOOLS_H
