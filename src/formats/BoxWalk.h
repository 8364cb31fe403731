#ifndef QUAVEL_SRC_FORMATS_BOXWALK_H
#define QUAVEL_SRC_FORMATS_BOXWALK_H

#include <memory>

namespace quavel {

class QVCR3BoxHeader;
class QVStream;

namespace detail {

/// Reads the box header at the stream's position and moves behind the box. False: the header cannot
/// be read, or its size does not even cover the header.
bool stepOverBox(std::shared_ptr<QVStream>& stream, QVCR3BoxHeader& header);

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_FORMATS_BOXWALK_H
