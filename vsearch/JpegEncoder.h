#ifndef ORZAVS_VSEARCH_JPEGENCODER_H
#define ORZAVS_VSEARCH_JPEGENCODER_H

#include <cstdint>
#include <string>
#include <vector>

#include "types/ImageFormat.h"

namespace Tovra {

// Baseline JPEG encoders. Both empty `output` first and leave the complete stream in it on
// success; `work` is a scratch buffer (resized to 4096 bytes) that the library writes into and
// that is flushed into `output` a whole block at a time. Quality is clamped to [0, 100]. A fatal
// library error returns false (nothing thrown, nothing printed); `output` must then be ignored.
// On false, a non-null `failure` receives the reason: the library's own message, or what made
// the frame unacceptable before the library was called.
// Only a failure of `output` or `work` to grow is thrown (std::bad_alloc from the vector).
// Safe to call from several threads at once with distinct vectors.

// I420, NV21 or NV12 frame handed over as raw 4:2:0 planes (fast integer DCT). Every plane is
// addressed with the image width as its row length: `stride` is accepted but not used. The
// pixels must hold width*height luminance bytes followed by 2*((width*height)/4) chroma bytes:
// for I420 a U and a V plane of (width*height)/4 bytes, rows of width/2 bytes; for NV21/NV12
// rows of `width` bytes holding width/2 (V,U) or (U,V) pairs. No byte outside that frame is read.
// The samples the library needs past the picture's edges (it encodes whole 8x8 blocks) come from
// inside the same plane, or are mid-grey where the frame holds none. Returns false without
// reading anything for null pixels, a width or height below 1, or a format other than these three.
bool encodeYUVToJpeg(const uint8_t* pixels, int32_t height, int32_t width, int32_t stride,
                     OrzaVSMobile::ImageFormat format, std::vector<uint8_t>& output, int32_t quality,
                     std::vector<uint8_t>& work, std::string* failure = nullptr);

// Packed RGB, BGR(A) or grey rows, each starting `stride` bytes after the previous one; the frame
// spans (height-1)*stride + width*numChannels bytes and nothing outside it is read.
// numChannels < 2 is grey; otherwise RGB is taken as is and any other format as B,G,R(,A).
// Returns false without reading anything for null pixels, a width or height below 1, a negative
// stride, or numChannels below 1 or equal to 2 (rows too short for the 3 bytes a pixel the
// library is handed). A stride below the row length is accepted: rows then overlap.
bool encodePackedToJpeg(const uint8_t* pixels, int32_t height, int32_t width, int32_t stride,
                        int32_t numChannels, OrzaVSMobile::ImageFormat format,
                        std::vector<uint8_t>& output, int32_t quality, std::vector<uint8_t>& work,
                        std::string* failure = nullptr);

}  // namespace Tovra

#endif
