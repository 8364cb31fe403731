#include "terminal/Text.h"

#include <locale.h>
#include <wchar.h>

#include <algorithm>
#include <cstdint>
#include <iterator>

namespace app {

namespace {

/// Makes the C library's `wcwidth` know all characters on this thread, whatever the user's locale.
class Utf8Scope {
 public:
  Utf8Scope() : previous_(::uselocale(utf8())) {}
  ~Utf8Scope() { ::uselocale(previous_); }
  Utf8Scope(Utf8Scope const&) = delete;
  Utf8Scope& operator=(Utf8Scope const&) = delete;

 private:
  static locale_t utf8() {
    static locale_t const locale = ::newlocale(LC_CTYPE_MASK, "C.UTF-8", nullptr);
    return locale;
  }

  locale_t previous_;
};

struct Lead {
  unsigned char first;
  unsigned char last;
  std::size_t length;
  std::uint32_t least;  // what is smaller has a shorter form
};

// Decoded here, as the C library takes numbers above U+10FFFF and longer forms for characters.
constexpr Lead kLeads[] = {{0xc2, 0xdf, 2, 0x80}, {0xe0, 0xef, 3, 0x800}, {0xf0, 0xf4, 4, 0x10000}};

constexpr std::string_view kEllipsis = "…";

std::size_t cellsOf(Character const& character) {
  Utf8Scope const scope;
  int const width = ::wcwidth(character.code);
  return width < 0 ? 1 : static_cast<std::size_t>(width);
}

/// Bytes at the start of `text` that fit the cells, and are no more than `most`.
std::size_t fittingBytes(std::string_view text, std::size_t width, std::size_t most) {
  std::size_t bytes = 0;
  std::size_t used = 0;
  while (bytes < text.size()) {
    Character const next = firstCharacter(text.substr(bytes));
    used += cellsOf(next);
    if (used > width || bytes + next.length > most) {
      break;
    }
    bytes += next.length;
  }
  return bytes;
}

}  // namespace

Character firstCharacter(std::string_view text) {
  auto const byte = static_cast<unsigned char>(text.front());
  if (byte < 0x80) {
    return {static_cast<wchar_t>(byte), 1, true};
  }
  Character const invalid = {static_cast<wchar_t>(byte), 1, false};
  auto const* const lead =
      std::find_if(std::begin(kLeads), std::end(kLeads),
                   [byte](Lead const& row) { return row.first <= byte && byte <= row.last; });
  if (lead == std::end(kLeads) || text.size() < lead->length) {
    return invalid;
  }
  std::uint32_t code = byte & (0x7fU >> lead->length);
  for (std::size_t i = 1; i < lead->length; ++i) {
    auto const next = static_cast<unsigned char>(text[i]);
    if ((next & 0xc0) != 0x80) {
      return invalid;
    }
    code = code << 6 | (next & 0x3f);
  }
  bool const isSurrogate = 0xd800 <= code && code <= 0xdfff;
  if (code < lead->least || code > 0x10ffff || isSurrogate) {
    return invalid;
  }
  return {static_cast<wchar_t>(code), lead->length, true};
}

bool isAscii(std::string_view text) {
  return std::all_of(text.begin(), text.end(),
                     [](char c) { return static_cast<unsigned char>(c) < 0x80; });
}

bool isUtf8(std::string_view text) {
  if (isAscii(text)) {
    return true;
  }
  while (!text.empty()) {
    Character const next = firstCharacter(text);
    if (!next.isValid) {
      return false;
    }
    text.remove_prefix(next.length);
  }
  return true;
}

std::string textAsUtf8(std::string text) {
  if (isUtf8(text)) {
    return text;
  }
  std::string utf8;
  for (char const c : text) {
    auto const byte = static_cast<unsigned char>(c);
    if (byte < 0x80) {
      utf8 += c;
      continue;
    }
    utf8 += static_cast<char>(0xc0 | byte >> 6);
    utf8 += static_cast<char>(0x80 | (byte & 0x3f));
  }
  return utf8;
}

std::string pathAsUtf8(std::string const& path) {
  if (isUtf8(path) && path.find('\0') == std::string::npos) {
    return path;
  }
  std::string utf8;
  for (std::string_view rest = path; !rest.empty();) {
    Character const next = firstCharacter(rest);
    utf8 += next.isValid && next.code != 0 ? rest.substr(0, next.length) : "\xef\xbf\xbd";
    rest.remove_prefix(next.length);
  }
  return utf8;
}

std::size_t cells(std::string_view text) {
  if (isAscii(text)) {
    return text.size();
  }
  std::size_t sum = 0;
  while (!text.empty()) {
    Character const next = firstCharacter(text);
    sum += cellsOf(next);
    text.remove_prefix(next.length);
  }
  return sum;
}

std::string keepStart(std::string const& text, std::size_t width, std::size_t most) {
  if (text.size() <= most && cells(text) <= width) {
    return text;
  }
  if (width == 0) {
    return {};
  }
  return text.substr(0, fittingBytes(text, width - 1, most)).append(kEllipsis);
}

std::string keepEnd(std::string const& text, std::size_t width) {
  std::size_t const all = cells(text);
  if (all <= width) {
    return text;
  }
  if (width == 0) {
    return {};
  }
  std::size_t dropped = 0;
  std::size_t left = all;
  while (dropped < text.size()) {
    Character const next = firstCharacter(std::string_view(text).substr(dropped));
    std::size_t const taken = cellsOf(next);
    if (left < width && taken > 0) {  // a mark would go to the ellipsis
      break;
    }
    left -= taken;
    dropped += next.length;
  }
  return std::string(kEllipsis) + text.substr(dropped);
}

}  // namespace app
