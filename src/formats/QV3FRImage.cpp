#include "quavel/QV3FRImage.h"

namespace quavel {

QV3FRImage::QV3FRImage() { isRaw = true; }

QV3FRImage::~QV3FRImage() = default;

}  // namespace quavel
