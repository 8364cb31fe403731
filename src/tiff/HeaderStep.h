#ifndef QUAVEL_SRC_TIFF_HEADERSTEP_H
#define QUAVEL_SRC_TIFF_HEADERSTEP_H

namespace quavel {

class QVStream;
class QVTiffHeader;

namespace detail {

/// `QVTiffHeader::read` for the header of a structure that notes call "the Exif segment", say; null
/// for that of a whole file.
bool readTiffHeader(QVStream& stream, unsigned short expectedMagic, char const* structure,
                    QVTiffHeader& header);

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_TIFF_HEADERSTEP_H
