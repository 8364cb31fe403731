#include "journal/Words.h"

#include <algorithm>
#include <string_view>

namespace quavel::detail {

namespace {

constexpr std::size_t kMaxTextLength = 500;

constexpr std::int64_t kFirstHexadecimal = 10;  // below it, hexadecimal and decimal look the same

void appendHex(std::string& out, std::uint64_t number, int minDigits) {
  int digits = minDigits;
  while (digits < 16 && (number >> (4 * digits)) != 0) {  // 64 bits are 16 digits
    ++digits;
  }
  for (int shift = 4 * (digits - 1); shift >= 0; shift -= 4) {
    out += "0123456789abcdef"[(number >> shift) & 0xfU];
  }
}

}  // namespace

void append(std::string& out, char const* text) { out += text; }

void append(std::string& out, std::string const& text) { out += text; }

void append(std::string& out, std::int64_t number) { out += std::to_string(number); }

void append(std::string& out, Offset offset) {
  if (offset.value < kFirstHexadecimal) {
    append(out, offset.value);
    return;
  }
  out += "0x";
  appendHex(out, static_cast<std::uint64_t>(offset.value), 1);
  out += " (";
  append(out, offset.value);
  out += ')';
}

void append(std::string& out, HexBytes bytes) {
  for (std::size_t i = 0; i < bytes.count; ++i) {
    out += i == 0 ? "" : " ";
    appendHex(out, bytes.bytes[i], 2);
  }
}

void append(std::string& out, HexPair pair) {
  appendHex(out, pair.value >> 8U, 2);
  out += ' ';
  appendHex(out, pair.value & 0xffU, 2);
}

void append(std::string& out, HexCode code) {
  out += "0x";
  appendHex(out, code.value, 4);
}

void append(std::string& out, QuotedBytes bytes) {
  for (std::size_t i = 0; i < bytes.count; ++i) {
    std::uint8_t const byte = bytes.bytes[i];
    if (byte >= ' ' && byte <= '~') {
      out += static_cast<char>(byte);
    } else {
      out += "\\x";
      appendHex(out, byte, 2);
    }
  }
}

std::string composed(char const* pattern, std::initializer_list<Word> words) {
  std::string text;
  text.reserve(kMaxTextLength / 4);  // enough for most texts
  std::string_view rest = pattern;
  for (Word const& word : words) {
    auto const brace = rest.find('{');  // of a "{}": patterns have no other braces
    if (brace == rest.npos) {
      break;  // the pattern needs no more words: some callers choose between two patterns
    }
    text += rest.substr(0, brace);
    word.appendTo(text);
    rest.remove_prefix(brace + 2);
  }
  text += rest;
  text.resize(std::min(text.size(), kMaxTextLength));
  return text;
}

}  // namespace quavel::detail
