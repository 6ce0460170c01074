#include "engine/FrameRecord.h"

#include <cstring>

namespace Tovra {

using OrzaVSMobile::ExtraFrameData;
using OrzaVSMobile::ImageBuffer;

bool FrameRecord::lendBuffer(ImageBuffer& buffer) {
  buffer.data = nullptr;
  buffer.allocLen = 0;
  // Rows first, then bytes: for a YUV frame of odd height this rounds differently from the
  // byte count setSourceImage() expects, and such a lent frame is then refused there.
  int64_t rows = buffer.height;
  if (OrzaVSMobile::isYUVFormat(buffer.format)) rows = (rows * 3) / 2;
  const int64_t size = rows * buffer.widthStep;
  // Hardening: the geometry comes from the client. Negative rows or stride, or a size that
  // allocLen cannot describe, would size the storage from garbage: nothing is lent.
  if (rows < 0 || buffer.widthStep < 0 || size > INT32_MAX) return false;
  pixels.resize(static_cast<size_t>(size));
  // lend() also tells the buffer the block's true size, so a fill through it stays inside the
  // record's storage whatever allocLen is set to later.
  buffer.lend(pixels.data(), static_cast<int32_t>(pixels.size()));
  return true;
}

bool FrameRecord::setSourceImage(const ImageBuffer& image, const ExtraFrameData& extra) {
  timeStamp = extra.timeStamp;
  height = image.height;
  width = image.width;
  numChannels = image.numChannels;
  widthStep = image.widthStep;
  format = image.format;
  // Bytes first, then the 3/2 factor (see lendBuffer for why the two rules differ).
  int64_t size = static_cast<int64_t>(image.widthStep) * image.height;
  if (OrzaVSMobile::isYUVFormat(image.format)) size = (size * 3) / 2;
  const bool lent = !pixels.empty() && image.data == pixels.data();
  if (!lent) {
    // Hardening: the geometry and the source come from the client. A negative or
    // unrepresentable size, a missing source, or a source block known to be shorter than the
    // geometry says would copy from outside the given memory: the frame is refused.
    if (size < 0 || size > INT32_MAX) return false;
    if (size > 0 && image.data == nullptr) return false;
    const int64_t available = image.knownLength();
    if (available >= 0 && available < size) return false;
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
