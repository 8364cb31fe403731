#include "WhyNames.h"

#include <array>
#include <iomanip>
#include <sstream>

namespace app::why {

namespace {

struct TagName {
  unsigned short tag;
  char const* name;
};

constexpr TagName kTagNames[] = {
    {tag::NewSubfileType, "NewSubfileType"},
    {tag::ImageWidth, "ImageWidth"},
    {tag::ImageLength, "ImageLength"},
    {tag::Model, "Model"},
    {tag::Orientation, "Orientation"},
    {tag::DateTime, "DateTime"},
    {tag::SubIFDs, "SubIFDs"},
    {tag::ExposureTime, "ExposureTime"},
    {tag::FNumber, "FNumber"},
    {tag::ExifIFDPointer, "ExifIFDPointer"},
    {tag::ISOSpeedRatings, "ISOSpeedRatings"},
    {tag::DateTimeOriginal, "DateTimeOriginal"},
    {tag::DateTimeDigitized, "DateTimeDigitized"},
    {tag::OffsetTimeOriginal, "OffsetTimeOriginal"},
    {tag::ShutterSpeedValue, "ShutterSpeedValue"},
    {tag::ApertureValue, "ApertureValue"},
    {tag::ExposureBiasValue, "ExposureBiasValue"},
    {tag::MeteringMode, "MeteringMode"},
    {tag::FocalLength, "FocalLength"},
    {tag::PixelXDimension, "PixelXDimension"},
    {tag::PixelYDimension, "PixelYDimension"},
    {tag::WhiteBalance, "WhiteBalance"},
    {tag::FocalLengthIn35mmFilm, "FocalLengthIn35mmFilm"},
    {tag::LensModel, "LensModel"},
    {tag::RafDirectoryPointer, "(the vendor directory)"},
    {tag::RafImageWidth, "(the raw image's width)"},
    {tag::RafImageLength, "(the raw image's height)"},
};

constexpr std::array<char const*, 14> kFieldTypeNames = {
    nullptr,     "BYTE",   "ASCII", "SHORT",     "LONG",  "RATIONAL", "SBYTE",
    "UNDEFINED", "SSHORT", "SLONG", "SRATIONAL", "FLOAT", "DOUBLE",   "IFD"};

}  // namespace

std::string tagText(unsigned short tag) {
  std::ostringstream text;
  text << "0x" << std::hex << std::setfill('0') << std::setw(4) << tag;
  for (auto const& row : kTagNames) {
    if (row.tag == tag) {
      text << ' ' << row.name;
    }
  }
  return text.str();
}

std::string fieldTypeText(unsigned short code) {
  if (code == 0 || code >= kFieldTypeNames.size()) {
    return "type " + std::to_string(code);
  }
  return kFieldTypeNames[code];
}

}  // namespace app::why
