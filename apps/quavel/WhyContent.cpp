#include "WhyContent.h"

#include <algorithm>
#include <string_view>

#include "terminal/Escape.h"

namespace app::why {

namespace {

using namespace std::string_view_literals;

// Enough for each of the signatures below.
constexpr std::size_t kOpeningSize = 16;
constexpr std::size_t kBrandPosition = 8;
constexpr std::size_t kBrandSize = 4;

struct Signature {
  std::size_t position;
  std::string_view bytes;
  char const* kind;
  std::string_view extensions;  ///< Those that promise it, each with a blank before and behind.
};

constexpr auto kTiffExtensions = " tiff tif dng nef cr2 arw nrw 3fr "sv;

constexpr Signature kSignatures[] = {
    {0, "II*\0"sv, "a TIFF structure", kTiffExtensions},
    {0, "MM\0*"sv, "a TIFF structure", kTiffExtensions},
    {0, "II+\0"sv, "a BigTIFF structure", kTiffExtensions},
    {0, "MM\0+"sv, "a BigTIFF structure", kTiffExtensions},
    {0, "\xff\xd8\xff"sv, "a JPEG file", " jpeg jpg "},
    {0, "FUJIFILM"sv, "a RAF file", " raf "},
    {4, "ftyp"sv, "an ISO base media file", " cr3 "},
    {0, "\x89PNG"sv, "a PNG file", ""},
    {0, "GIF8"sv, "a GIF file", ""},
    {0, "RIFF"sv, "a RIFF file (WebP, for example)", ""},
    {0, "BM"sv, "a BMP file", ""},
    {0, "%PDF"sv, "a PDF file", ""},
    {0, "8BPS"sv, "a PSD file", ""},
    {0, "PK\3\4"sv, "a ZIP archive", ""},
    {0, "<"sv, "markup text (HTML or XML)", ""},
    {0, "\0\0\0\0\0\0\0\0"sv, "a file that was emptied with zeros", ""},
};

}  // namespace

std::string foreignContent(Walk const& walk, std::string const& extension) {
  auto const bytes = walk.peek(0, kOpeningSize);
  std::string const opening(bytes.begin(), bytes.end());
  auto const* const found =
      std::find_if(std::begin(kSignatures), std::end(kSignatures), [&](Signature const& row) {
        return opening.size() >= row.position + row.bytes.size() &&
               opening.compare(row.position, row.bytes.size(), row.bytes) == 0;
      });
  if (found == std::end(kSignatures) ||
      found->extensions.find(' ' + extension + ' ') != std::string_view::npos) {
    return "";
  }
  std::string kind = found->kind;
  if (found->position != 0 && opening.size() >= kBrandPosition + kBrandSize) {
    kind += " of brand \"" + escaped(opening.substr(kBrandPosition, kBrandSize)) + '"';
  }
  return kind;
}

}  // namespace app::why
