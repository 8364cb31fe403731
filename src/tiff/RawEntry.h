#ifndef QUAVEL_SRC_TIFF_RAWENTRY_H
#define QUAVEL_SRC_TIFF_RAWENTRY_H

#include <cstddef>
#include <cstdint>

namespace quavel::detail {

// Where the parts of a directory entry lie, in bytes from its start (TIFF 6.0).
inline constexpr std::size_t kEntryTypePosition = 2;
inline constexpr std::size_t kEntryCountPosition = 4;
inline constexpr std::size_t kEntryFieldPosition = 8;
inline constexpr std::size_t kEntryFieldSize = 4;
inline constexpr std::size_t kEntrySize = 12;

/// A directory entry behind its tag, before it is known what of it is used.
struct RawEntry {
  std::uint16_t typeCode;
  std::uint32_t count;
  std::uint8_t const* field;  ///< The values, or their offset.
  std::size_t fieldSize;      ///< Bytes that the data holds of it; 4 unless the data ends there.
};

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_TIFF_RAWENTRY_H
