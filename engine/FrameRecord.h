#ifndef ORZAVS_ENGINE_FRAMERECORD_H
#define ORZAVS_ENGINE_FRAMERECORD_H

#include <cstdint>
#include <vector>

#include "types/FrameData.h"
#include "types/ImageBuffer.h"

namespace Tovra {

// One frame the engine keeps beyond a call: its own copy of the pixels (or memory it lent to
// the client) and the geometry. Always held by std::shared_ptr; the pool keeps one reference,
// and a record is free exactly when the pool's is the only one.
struct FrameRecord {
  uint64_t frameId = 0;       // number assigned when last handed out
  double timeStamp = 0.0;     // seconds; getNewSlot() sets -1.0 ("not set") on hand-out
  std::vector<uint8_t> pixels;  // capacity is kept between uses
  int32_t height = 0;
  int32_t width = 0;
  int32_t numChannels = 0;
  int32_t widthStep = 0;
  int32_t format = 0;
  int32_t screenOrient = 0;
  int32_t flat = 0;
  int32_t sharpness = 0;  // nothing writes it: always 0, compared against by the take rule

  // Sizes `pixels` for the buffer's format, height and widthStep ((height*3)/2 rows for YUV)
  // and points buffer.data/allocLen at it, so the client can write the frame in place.
  // Refuses (false, buffer.data null, allocLen 0) negative rows or stride and sizes beyond
  // what allocLen can hold.
  bool lendBuffer(OrzaVSMobile::ImageBuffer& buffer);
  // Takes over one frame: geometry, time stamp, orientation, and the pixels (copied unless
  // they already are this record's memory). The byte count is widthStep*height, times 3/2 for
  // YUV; lent memory of another size is refused (false), and so is a source that cannot hold
  // that many bytes when its size is known, a null source, or a negative size.
  bool setSourceImage(const OrzaVSMobile::ImageBuffer& image,
                      const OrzaVSMobile::ExtraFrameData& extra);
};

}  // namespace Tovra

#endif
