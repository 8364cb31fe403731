#ifndef QUAVEL_SRC_FORMATS_BOXTYPES_H
#define QUAVEL_SRC_FORMATS_BOXTYPES_H

#include <cstdint>

// Box types of a CR3 file: four characters as one big-endian number.
namespace quavel::box {

inline constexpr std::uint32_t Moov = 0x6d6f6f76;
inline constexpr std::uint32_t Uuid = 0x75756964;
inline constexpr std::uint32_t CMT1 = 0x434d5431;  // a TIFF structure with the main directory
inline constexpr std::uint32_t CMT2 = 0x434d5432;  // one with the Exif directory

/// A box begins with its size and its type, of 4 bytes each.
inline constexpr std::uint32_t kHeaderSize = 8;

}  // namespace quavel::box

#endif  // QUAVEL_SRC_FORMATS_BOXTYPES_H
