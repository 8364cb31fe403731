#ifndef QUAVEL_SRC_TIFF_RAWENTRY_H
#define QUAVEL_SRC_TIFF_RAWENTRY_H

#include <cstddef>
#include <cstdint>

namespace quavel {

class QVStream;
class QVTiffImageFileDirectoryEntryValue;

namespace detail {

// Where the parts of a directory entry lie, in bytes from its start (TIFF 6.0).
inline constexpr std::size_t kEntryTypePosition = 2;
inline constexpr std::size_t kEntryCountPosition = 4;
inline constexpr std::size_t kEntryFieldPosition = 8;
inline constexpr std::size_t kEntryFieldSize = 4;
inline constexpr std::size_t kEntrySize = 12;

inline constexpr std::uint16_t kUndefinedCode = 7;

/// A directory entry behind its tag, before it is known what of it is used.
struct RawEntry {
  std::uint16_t typeCode;
  std::uint32_t count;
  std::uint8_t const* field;  ///< The values, or their offset.
  std::size_t fieldSize;      ///< Bytes that the data holds of it; 4 unless the data ends there.
};

/// Whether it is the code of a field type.
bool isKnown(std::uint16_t typeCode);

/// Whether the type is known and there are not too many values.
bool isAllowed(RawEntry const& entry);

/// How many bytes of the field an entry of a known type makes use of.
std::size_t usedFieldSize(RawEntry const& entry);

/// Whether all that it uses of the field is in the data.
bool isWhole(RawEntry const& entry);

/// Where an entry's values go.
class ValueSink {
 public:
  /// `count` more values, side by side, to be filled before the next call.
  virtual QVTiffImageFileDirectoryEntryValue* addValues(std::size_t count) = 0;

 protected:
  ~ValueSink() = default;
};

/// Reads the values of a whole, allowed entry that is not UNDEFINED. False: they are not all in the
/// data.
bool readValues(QVStream& stream, RawEntry const& entry, ValueSink& sink);

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_TIFF_RAWENTRY_H
