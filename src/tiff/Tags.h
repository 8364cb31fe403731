#ifndef QUAVEL_SRC_TIFF_TAGS_H
#define QUAVEL_SRC_TIFF_TAGS_H

// The tags read from TIFF 6.0 and Exif directories, under their standard names.
namespace quavel::tag {

inline constexpr unsigned short NewSubfileType = 0x00fe;
inline constexpr unsigned short ImageWidth = 0x0100;
inline constexpr unsigned short ImageLength = 0x0101;
inline constexpr unsigned short Model = 0x0110;
inline constexpr unsigned short Orientation = 0x0112;
inline constexpr unsigned short DateTime = 0x0132;
inline constexpr unsigned short SubIFDs = 0x014a;
inline constexpr unsigned short ExposureTime = 0x829a;
inline constexpr unsigned short FNumber = 0x829d;
inline constexpr unsigned short ExifIFDPointer = 0x8769;
inline constexpr unsigned short ISOSpeedRatings = 0x8827;
inline constexpr unsigned short DateTimeOriginal = 0x9003;
inline constexpr unsigned short DateTimeDigitized = 0x9004;
inline constexpr unsigned short OffsetTimeOriginal = 0x9011;
inline constexpr unsigned short ShutterSpeedValue = 0x9201;
inline constexpr unsigned short ApertureValue = 0x9202;
inline constexpr unsigned short ExposureBiasValue = 0x9204;
inline constexpr unsigned short MeteringMode = 0x9207;
inline constexpr unsigned short FocalLength = 0x920a;
inline constexpr unsigned short PixelXDimension = 0xa002;
inline constexpr unsigned short PixelYDimension = 0xa003;
inline constexpr unsigned short WhiteBalance = 0xa403;
inline constexpr unsigned short FocalLengthIn35mmFilm = 0xa405;
inline constexpr unsigned short LensModel = 0xa434;

// A RAF file's raw section: the vendor's directory and what it says of the raw image.
inline constexpr unsigned short RafDirectoryPointer = 0xf000;
inline constexpr unsigned short RafImageWidth = 0xf001;
inline constexpr unsigned short RafImageLength = 0xf002;

/// A tag's name, and the record's field that an entry under it gives, if any.
struct Name {
  unsigned short tag;
  char name[26];
  char field[22] =
      "";  // texts in place: pointers would be relocated whenever the library is loaded
};

inline constexpr Name kNames[] = {
    {NewSubfileType, "NewSubfileType"},
    {ImageWidth, "ImageWidth", "width"},
    {ImageLength, "ImageLength", "height"},
    {Model, "Model", "model"},
    {Orientation, "Orientation", "orientation"},
    {DateTime, "DateTime", "dateTime"},
    {SubIFDs, "SubIFDs"},
    {ExposureTime, "ExposureTime", "exposureTime"},
    {FNumber, "FNumber", "fNumber"},
    {ExifIFDPointer, "ExifIFDPointer"},
    {ISOSpeedRatings, "ISOSpeedRatings", "iso"},
    {DateTimeOriginal, "DateTimeOriginal", "dateTimeOriginal"},
    {DateTimeDigitized, "DateTimeDigitized", "dateTimeDigitized"},
    {OffsetTimeOriginal, "OffsetTimeOriginal"},
    {ShutterSpeedValue, "ShutterSpeedValue", "shutterSpeedValue"},
    {ApertureValue, "ApertureValue", "apertureValue"},
    {ExposureBiasValue, "ExposureBiasValue", "exposureBiasValue"},
    {MeteringMode, "MeteringMode", "meteringMode"},
    {FocalLength, "FocalLength", "focalLength"},
    {PixelXDimension, "PixelXDimension", "width"},
    {PixelYDimension, "PixelYDimension", "height"},
    {WhiteBalance, "WhiteBalance", "whiteBalance"},
    {FocalLengthIn35mmFilm, "FocalLengthIn35mmFilm", "focalLengthIn35mmFilm"},
    {LensModel, "LensModel", "lensModel"},
    {RafDirectoryPointer, "(the vendor directory)"},
    {RafImageWidth, "(the raw image's width)", "width"},
    {RafImageLength, "(the raw image's height)", "height"},
};

}  // namespace quavel::tag

#endif  // QUAVEL_SRC_TIFF_TAGS_H
