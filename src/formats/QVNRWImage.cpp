#include "quavel/QVNRWImage.h"

namespace quavel {

QVNRWImage::QVNRWImage() { isRaw = true; }

QVNRWImage::~QVNRWImage() = default;

}  // namespace quavel
