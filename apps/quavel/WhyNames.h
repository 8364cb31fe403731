#ifndef QUAVEL_APPS_WHYNAMES_H
#define QUAVEL_APPS_WHYNAMES_H

#include <string>

namespace app::why {

/// The tags that the readers want, by their standard names.
namespace tag {

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
inline constexpr unsigned short RafDirectoryPointer = 0xf000;
inline constexpr unsigned short RafImageWidth = 0xf001;
inline constexpr unsigned short RafImageLength = 0xf002;

}  // namespace tag

/// "0x0112 Orientation"
std::string tagText(unsigned short tag);

/// The TIFF name of a field type's code in a file; "type 99" for what is none.
std::string fieldTypeText(unsigned short code);

}  // namespace app::why

#endif  // QUAVEL_APPS_WHYNAMES_H
