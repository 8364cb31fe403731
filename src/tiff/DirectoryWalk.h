#ifndef QUAVEL_SRC_TIFF_DIRECTORYWALK_H
#define QUAVEL_SRC_TIFF_DIRECTORYWALK_H

#include "tiff/RawEntry.h"
#include "tiff/WantedTags.h"

namespace quavel::detail {

/// What takes the wanted entries of a directory.
class EntrySink {
 public:
  /// False: the entry is malformed, or its values are not in the data. May leave the stream
  /// anywhere.
  virtual bool addEntry(unsigned short tag, RawEntry const& entry, QVStream& stream) = 0;

 protected:
  ~EntrySink() = default;
};

/// Reads the entry count at the stream's position and gives the wanted entries to the sink, until
/// all were met. True: the stream stands behind the last entry. False: the count, a tag or a wanted
/// entry cannot be read, or they hold too many values.
bool walkDirectory(QVStream& stream, WantedTags& wanted, EntrySink& sink);

}  // namespace quavel::detail

#endif  // QUAVEL_SRC_TIFF_DIRECTORYWALK_H
