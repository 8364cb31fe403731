#include "quavel/QVCR2Image.h"

namespace quavel {

QVCR2Image::QVCR2Image() { isRaw = true; }

QVCR2Image::~QVCR2Image() = default;

}  // namespace quavel
