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
    startBlockIfFull();
    T* const object = block_->end();
    ++block_->used;
    return {block_, ::new (object) T()};
  }

  /// Appends `count` new objects to a list, one for each call of `fill` on them.
  template <class Fill>
  void appendTo(std::vector<std::shared_ptr<T>>& list, std::size_t count, Fill fill) {
    while (count > 0) {
      startBlockIfFull();
      std::size_t const run = std::min(count, kBlockSize - block_->used);
      T* const first = block_->end();
      for (std::size_t i = 0; i < run; ++i) {
        fill(*::new (first + i) T());
        ++block_->used;
      }
      for (std::size_t i = 0; i < run; ++i) {
        list.emplace_back(block_, first + i);
      }
      count -= run;
    }
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

  void startBlockIfFull() {
    if (!block_ || block_->used == kBlockSize) {
      block_ = std::make_shared<Block>();
    }
  }

  std::shared_ptr<Block> block_;
};

/// What the entries of one directory are made of. The three kinds own each other in this order,
/// so each needs blocks of its own: a block that owned itself would never be freed.
struct EntryPools {
  using ValueList = std::vector<std::shared_ptr<QVTiffImageFileDirectoryEntryValue>>;

  BlockPool<QVTiffImageFileDirectoryEntry, 12> entries;
  BlockPool<ValueList, 12> lists;
  BlockPool<QVTiffImageFileDirectoryEntryValue, 64> values;  // a date takes 20, a model up to 32
};

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_TIFF_ENTRYPOOLS_H
