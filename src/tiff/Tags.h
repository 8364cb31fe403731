#ifndef QUAVEL_SRC_TIFF_TAGS_H
#define QUAVEL_SRC_TIFF_TAGS_H

// The tags that are read. Those of TIFF and Exif have their standard names.
namespace quavel::tag {

/// A tag, its name for notes, and the record's field that is filled from its entry, if any.
struct Tag {
  unsigned short number;
  char name[26];  // an array: pointers would be relocated each time the library is loaded
  char field[22] = "";

  constexpr operator unsigned short() const { return number; }
};

inline constexpr Tag NewSubfileType = {0x00fe, "NewSubfileType"};
inline constexpr Tag ImageWidth = {0x0100, "ImageWidth", "width"};
inline constexpr Tag ImageLength = {0x0101, "ImageLength", "height"};
inline constexpr Tag Model = {0x0110, "Model", "model"};
inline constexpr Tag Orientation = {0x0112, "Orientation", "orientation"};
inline constexpr Tag DateTime = {0x0132, "DateTime", "dateTime"};
inline constexpr Tag SubIFDs = {0x014a, "SubIFDs"};
inline constexpr Tag ExposureTime = {0x829a, "ExposureTime", "exposureTime"};
inline constexpr Tag FNumber = {0x829d, "FNumber", "fNumber"};
inline constexpr Tag ExifIFDPointer = {0x8769, "ExifIFDPointer"};
inline constexpr Tag ISOSpeedRatings = {0x8827, "ISOSpeedRatings", "iso"};
inline constexpr Tag DateTimeOriginal = {0x9003, "DateTimeOriginal", "dateTimeOriginal"};
inline constexpr Tag DateTimeDigitized = {0x9004, "DateTimeDigitized", "dateTimeDigitized"};
// Not used. But a malformed entry with this tag is a sign of damage, so it is looked at.
inline constexpr Tag OffsetTimeOriginal = {0x9011, "OffsetTimeOriginal"};
inline constexpr Tag ShutterSpeedValue = {0x9201, "ShutterSpeedValue", "shutterSpeedValue"};
inline constexpr Tag ApertureValue = {0x9202, "ApertureValue", "apertureValue"};
inline constexpr Tag ExposureBiasValue = {0x9204, "ExposureBiasValue", "exposureBiasValue"};
inline constexpr Tag MeteringMode = {0x9207, "MeteringMode", "meteringMode"};
inline constexpr Tag FocalLength = {0x920a, "FocalLength", "focalLength"};
inline constexpr Tag PixelXDimension = {0xa002, "PixelXDimension", "width"};
inline constexpr Tag PixelYDimension = {0xa003, "PixelYDimension", "height"};
inline constexpr Tag WhiteBalance = {0xa403, "WhiteBalance", "whiteBalance"};
inline constexpr Tag FocalLengthIn35mmFilm = {0xa405, "FocalLengthIn35mmFilm",
                                              "focalLengthIn35mmFilm"};
inline constexpr Tag LensModel = {0xa434, "LensModel", "lensModel"};

// In a RAF file's raw section: the vendor's directory, and the raw image's size in it.
inline constexpr Tag RafDirectoryPointer = {0xf000, "(the vendor directory)"};
inline constexpr Tag RafImageWidth = {0xf001, "(the raw image's width)", "width"};
inline constexpr Tag RafImageLength = {0xf002, "(the raw image's height)", "height"};

/// For notes, which find a tag's name and field by its number.
inline constexpr Tag kAll[] = {NewSubfileType,
                               ImageWidth,
                               ImageLength,
                               Model,
                               Orientation,
                               DateTime,
                               SubIFDs,
                               ExposureTime,
                               FNumber,
                               ExifIFDPointer,
                               ISOSpeedRatings,
                               DateTimeOriginal,
                               DateTimeDigitized,
                               OffsetTimeOriginal,
                               ShutterSpeedValue,
                               ApertureValue,
                               ExposureBiasValue,
                               MeteringMode,
                               FocalLength,
                               PixelXDimension,
                               PixelYDimension,
                               WhiteBalance,
                               FocalLengthIn35mmFilm,
                               LensModel,
                               RafDirectoryPointer,
                               RafImageWidth,
                               RafImageLength};

}  // namespace quavel::tag

#endif  // QUAVEL_SRC_TIFF_TAGS_H
