#ifndef QUAVEL_SRC_JOURNAL_WORDS_H
#define QUAVEL_SRC_JOURNAL_WORDS_H

#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <string>

namespace quavel::detail {

/// An offset in the file, in a note: "0x1f2 (498)", or just "8" below 10.
struct Offset {
  std::int64_t value;
};

/// Bytes of the file: "ff d8 ff e0".
struct HexBytes {
  std::uint8_t const* bytes;
  std::size_t count;
};

/// Two bytes of the file, held as a big-endian number: "ff d8".
struct HexPair {
  std::uint16_t value;
};

/// A 16-bit code of the file: "0xffe1".
struct HexCode {
  std::uint16_t value;
};

/// Text of the file, for quotation marks around it: printable ASCII as it is, other bytes like
/// \x1b.
struct QuotedBytes {
  std::uint8_t const* bytes;
  std::size_t count;
};

void append(std::string& out, char const* text);
void append(std::string& out, std::string const& text);
void append(std::string& out, std::int64_t number);
inline void append(std::string& out, std::uint16_t number) { append(out, std::int64_t{number}); }
inline void append(std::string& out, std::uint32_t number) { append(out, std::int64_t{number}); }
void append(std::string& out, Offset offset);
void append(std::string& out, HexBytes bytes);
void append(std::string& out, HexPair pair);
void append(std::string& out, HexCode code);
void append(std::string& out, QuotedBytes bytes);

/// A part of a note's text: a value of any type for which there is an `append` function. The value
/// must outlive the word.
class Word {
 public:
  template <class Value>
  Word(Value const& value)
      : value_(&value), append_([](std::string& out, void const* erased) {
          append(out, *static_cast<Value const*>(erased));
        }) {}

  void appendTo(std::string& out) const { append_(out, value_); }

 private:
  void const* value_;  // of the type that `append_` was made for
  void (*append_)(std::string& out, void const* value);
};

/// The pattern with each "{}" replaced by the next word, cut to the 500 bytes of a note's text.
std::string composed(char const* pattern, std::initializer_list<Word> words);

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_JOURNAL_WORDS_H
