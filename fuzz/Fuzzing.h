#ifndef QUAVEL_FUZZ_FUZZING_H
#define QUAVEL_FUZZ_FUZZING_H

#include <array>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <type_traits>
#include <vector>

#include "quavel/quavel.h"
#include "support/Fields.h"

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

  /// A new one goes before "txt", which no format has: the seeds keep their first byte.
  static constexpr std::array kExtensions = {"tiff", "tif", "dng", "nef", "cr2", "raf", "arw",
                                             "jpeg", "jpg", "nrw", "3fr", "cr3", "txt"};

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

/// All fields as bytes, to be compared: a float's NaN differs from itself.
inline std::string bytesOf(QVMetadata const& record) {
  std::string bytes;
  test::eachField(record, [&](char const*, auto const& value) {
    if constexpr (std::is_same_v<decltype(value), std::string const&>) {
      bytes += value + '\0';
    } else {
      bytes.append(reinterpret_cast<char const*>(&value), sizeof(value));
    }
  });
  return bytes;
}

/// Whether the two are the same record, or both no record.
inline bool isSame(std::shared_ptr<QVMetadata> const& one, std::shared_ptr<QVMetadata> const& two) {
  return one && two ? bytesOf(*one) == bytesOf(*two) : !one && !two;
}

}  // namespace quavel::fuzz

#endif  // QUAVEL_FUZZ_FUZZING_H
