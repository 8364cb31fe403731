#include "quavel/QVDNGImage.h"

namespace quavel {

QVDNGImage::QVDNGImage() { isRaw = true; }

QVDNGImage::~QVDNGImage() = default;

}  // namespace quavel
