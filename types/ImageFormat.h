#ifndef ORZAVS_TYPES_IMAGEFORMAT_H
#define ORZAVS_TYPES_IMAGEFORMAT_H

#include <cstdint>

namespace OrzaVSMobile {

// Pixel layout of an ImageBuffer. The value travels as a 32-bit signed integer and may hold
// any value a client passes (the underlying type is fixed, so out-of-range values are valid
// objects of this type and are simply not one of the named layouts).
enum ImageFormat : int32_t {
  I420 = 0,  // planar 4:2:0: Y plane, then U (w*h/4 bytes), then V
  NV21 = 1,  // semi-planar 4:2:0: Y plane, then interleaved V,U pairs
  NV12 = 2,  // semi-planar 4:2:0: Y plane, then interleaved U,V pairs
  RGB = 3,   // packed R,G,B
  BGR = 4,   // packed B,G,R (numChannels 3)
  BGRA = 5,  // packed B,G,R,A (numChannels 4)
  BGRX = 6,  // packed B,G,R,pad (numChannels 4)
  GRAY = 7,  // one luminance byte a pixel
};

// True exactly for I420, NV21 and NV12; the value is taken as unsigned so negatives are not YUV.
inline bool isYUVFormat(int32_t format) { return static_cast<uint32_t>(format) < 3u; }

}  // namespace OrzaVSMobile

#endif
