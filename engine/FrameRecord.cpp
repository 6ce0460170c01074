#include "engine/FrameRecord.h"

#include <cstring>

namespace Tovra {

using OrzaVSMobile::ExtraFrameData;
using OrzaVSMobile::ImageBuffer;

bool FrameRecord::lendBuffer(ImageBuffer& buffer) {
  buffer.data = nullptr;
  buffer.allocLen = 0;
  int64_t rows = buffer.height;
  if (OrzaVSMobile::isYUVFormat(buffer.format)) rows = (static_cast<int64_t>(buffer.height) * 3) / 2;
  const int64_t size = rows * buffer.widthStep;
  // Hardening: negative geometry or a size beyond what allocLen can describe cannot be lent.
  if (rows < 0 || buffer.widthStep < 0 || size > INT32_MAX) return false;
  pixels.resize(static_cast<size_t>(size));
  buffer.data = pixels.data();
  buffer.allocLen = static_cast<int32_t>(pixels.size());
  return true;
}

bool FrameRecord::setSourceImage(const ImageBuffer& image, const ExtraFrameData& extra) {
  timeStamp = extra.timeStamp;
  height = image.height;
  width = image.width;
  numChannels = image.numChannels;
  widthStep = image.widthStep;
  format = image.format;
  int64_t size = static_cast<int64_t>(image.widthStep) * image.height;
  if (OrzaVSMobile::isYUVFormat(image.format)) size = (size * 3) / 2;
  const bool lent = !pixels.empty() && image.data == pixels.data();
  if (!lent) {
    // Hardening: a negative size or a missing source would copy an invalid range.
    if (size < 0 || size > INT32_MAX || (size > 0 && image.data == nullptr)) return false;
    pixels.resize(static_cast<size_t>(size));
    if (size > 0) std::memcpy(pixels.data(), image.data, static_cast<size_t>(size));
  } else if (static_cast<int64_t>(pixels.size()) != size) {
    return false;
  }
  screenOrient = extra.screenOrient;
  flat = extra.flat ? 1 : 0;
  return true;
}

}  // namespace Tovra
