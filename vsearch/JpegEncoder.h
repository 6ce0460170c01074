#ifndef ORZAVS_VSEARCH_JPEGENCODER_H
#define ORZAVS_VSEARCH_JPEGENCODER_H

#include <cstdint>
#include <vector>

#include "types/ImageFormat.h"

namespace Tovra {

// Baseline JPEG encoders. Both empty `output` first and leave the complete stream in it on
// success; `work` is a scratch buffer (resized to 4096 bytes) that the library writes into and
// that is flushed into `output` a whole block at a time. Quality is clamped to [0, 100]. A fatal
// library error returns false (nothing thrown); `output` must then be ignored.

// I420, NV21 or NV12 frame handed over as raw 4:2:0 planes (fast integer DCT). Every plane is
// addressed with the image width as its row length: `stride` is accepted but not used. The
// pixels must hold width*height luminance bytes followed by the chroma bytes of the format.
bool encodeYUVToJpeg(const uint8_t* pixels, int32_t height, int32_t width, int32_t stride,
                     OrzaVSMobile::ImageFormat format, std::vector<uint8_t>& output, int32_t quality,
                     std::vector<uint8_t>& work);

// Packed RGB, BGR(A) or grey rows, each starting `stride` bytes after the previous one.
// numChannels < 2 is grey; otherwise RGB is taken as is and any other format as B,G,R(,A).
bool encodePackedToJpeg(const uint8_t* pixels, int32_t height, int32_t width, int32_t stride,
                        int32_t numChannels, OrzaVSMobile::ImageFormat format,
                        std::vector<uint8_t>& output, int32_t quality, std::vector<uint8_t>& work);

}  // namespace Tovra

#endif
