#ifndef QUAVEL_SRC_TIFF_HOSTENTRY_H
#define QUAVEL_SRC_TIFF_HOSTENTRY_H

#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include "quavel/QVTiffImageFileDirectoryEntryValue.h"

namespace quavel {

class QVTiffImageFileDirectoryEntry;

namespace detail {

struct RawEntry;

// An entry as hosts get it: each value can be kept by itself.

using ValueBlock = std::vector<QVTiffImageFileDirectoryEntryValue>;
using ValueList = std::vector<std::shared_ptr<QVTiffImageFileDirectoryEntryValue>>;

/// Some of a block's values one by one; each keeps the block.
std::shared_ptr<ValueList> listOf(std::shared_ptr<ValueBlock> const& block, std::size_t first,
                                  std::size_t count);

/// The field of an UNDEFINED entry: up to 4 bytes as they lie in the file, missing ones as 0, or
/// the offset of more.
std::uint32_t undefinedField(RawEntry const& entry, bool isReversed);

/// Stores such a field.
void storeUndefined(std::uint32_t count, std::uint32_t field, QVTiffImageFileDirectoryEntry& entry);

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_TIFF_HOSTENTRY_H
