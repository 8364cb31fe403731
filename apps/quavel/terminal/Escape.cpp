#include "terminal/Escape.h"

#include <algorithm>
#include <cstdio>
#include <string_view>

#include "terminal/Text.h"

namespace app {

namespace {

struct Range {
  wchar_t first;
  wchar_t last;
};

// Characters without a glyph of their own that change how their neighbours or the line appear. The
// joiners U+200C and U+200D are left in: scripts and emoji need them.
constexpr Range kHidden[] = {
    {0x0000, 0x001f},   {0x007f, 0x009f},                                      // controls
    {0x061c, 0x061c},   {0x200e, 0x200f}, {0x202a, 0x202e}, {0x2066, 0x2069},  // direction
    {0x2028, 0x2029},  // line and paragraph separators
    {0x200b, 0x200b},   {0x2060, 0x2064}, {0xfeff, 0xfeff}, {0xfff9, 0xfffb},
    {0xe0000, 0xe007f},  // tags
};

bool isHidden(wchar_t code) {
  return std::any_of(std::begin(kHidden), std::end(kHidden),
                     [code](Range range) { return range.first <= code && code <= range.last; });
}

std::string shown(Character const& character) {
  if (character.code == L'\n' || character.code == L'\t') {
    return character.code == L'\n' ? "\\n" : "\\t";
  }
  char text[16];
  bool const isByte = !character.isValid || character.code < 0x80;
  std::snprintf(text, sizeof text, isByte ? "\\x%02x" : "\\u{%04x}",
                static_cast<unsigned>(character.code));
  return text;
}

}  // namespace

std::string escaped(std::string const& text) {
  std::string result;
  for (std::string_view rest = text; !rest.empty();) {
    Character const next = firstCharacter(rest);
    if (next.isValid && !isHidden(next.code)) {
      result += rest.substr(0, next.length);
    } else {
      result += shown(next);
    }
    rest.remove_prefix(next.length);
  }
  return result;
}

}  // namespace app
