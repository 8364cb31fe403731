#ifndef QUAVEL_FUZZ_FUZZING_H
#define QUAVEL_FUZZ_FUZZING_H

#include <array>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <tuple>
#include <vector>

#include "quavel/quavel.h"

/// The fuzzer's entry point; 0 keeps the input in the corpus.
extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size);

namespace quavel::fuzz {

/// Ends the program when what must hold does not; `assert` would be gone from a release build.
inline void require(bool holds, char const* what) {
  if (!holds) {
    std::fprintf(stderr, "Broken: %s\n", what);
    std::abort();
  }
}

/// What the front end is given: the first byte names the format, the rest is the file.
struct Input {
  Input(std::uint8_t const* data, std::size_t size)
      : extension(kExtensions[size == 0 ? 0 : data[0] % kExtensions.size()]),
        bytes(size == 0 ? data : data + 1, data + size) {}

  static constexpr std::array<char const*, 13> kExtensions = {
      "tiff", "tif", "dng", "nef", "cr2", "raf", "arw", "jpeg", "jpg", "nrw", "3fr", "cr3", "txt"};

  bool isOneOf(std::vector<std::string> const& extensions) const {
    for (std::string const& candidate : extensions) {
      if (extension == candidate) {
        return true;
      }
    }
    return false;
  }

  std::string extension;
  std::vector<std::uint8_t> bytes;  // of its own exact size, so that a read beyond it is noticed
};

/// All fields, to be compared; floats by their bits, as a NaN differs from itself.
inline auto fieldsOf(QVMetadata const& record) {
  auto const bits = [](float number) {
    std::uint32_t result = 0;
    std::memcpy(&result, &number, sizeof(result));
    return result;
  };
  return std::make_tuple(
      std::make_tuple(record.width, record.height, record.orientation, record.isRaw,
                      record.dateTimeOriginal, record.dateTimeDigitized, record.dateTime,
                      record.hasShootingInfo, record.model, record.lensModel, record.iso,
                      record.whiteBalance, record.meteringMode, record.focalLengthIn35mmFilm),
      std::make_tuple(bits(record.apexFNumber), bits(record.apexExposureTime),
                      bits(record.apertureValue), bits(record.shutterSpeedValue),
                      bits(record.focalLength), bits(record.exposureBiasValue),
                      bits(record.exposureTime), bits(record.fNumber)));
}

/// Whether the two are the same record, or both no record.
inline bool isSame(std::shared_ptr<QVMetadata> const& one, std::shared_ptr<QVMetadata> const& two) {
  if (!one || !two) {
    return !one && !two;
  }
  return fieldsOf(*one) == fieldsOf(*two);
}

}  // namespace quavel::fuzz

#endif  // QUAVEL_FUZZ_FUZZING_H
