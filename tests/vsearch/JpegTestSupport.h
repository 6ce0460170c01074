#ifndef ORZAVS_TESTS_VSEARCH_JPEGTESTSUPPORT_H
#define ORZAVS_TESTS_VSEARCH_JPEGTESTSUPPORT_H

// Helpers for the JPEG encoder tests: synthetic 4:2:0 frames, a libjpeg decoder on a memory
// source and PSNR.

#include <cmath>
#include <csetjmp>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <vector>

#include <jpeglib.h>

#include "support/GuardedBytes.h"
#include "types/ImageFormat.h"

namespace jpeg_test {

using orzavs_test::GuardedBytes;

// A planar 4:2:0 picture: Y is width x height, U and V are (width/2) x (height/2), the chroma
// geometry the encoder's addressing uses.
struct Yuv420 {
  int width = 0, height = 0;
  std::vector<uint8_t> y, u, v;
  int cw() const { return width / 2; }
  int ch() const { return height / 2; }
};

inline uint8_t clampByte(double v) {
  return static_cast<uint8_t>(v < 0 ? 0 : v > 255 ? 255 : std::lround(v));
}

// Gentle gradients and waves (what baseline JPEG reproduces well), or independent noise in every
// sample (which compresses badly, so streams are long).
inline Yuv420 makeYuv(int width, int height, bool noise = false) {
  Yuv420 img{width, height, {}, {}, {}};
  uint32_t state = 12345;
  auto next = [&] {
    state ^= state << 13, state ^= state >> 17, state ^= state << 5;
    return static_cast<uint8_t>(state >> 24);
  };
  for (int r = 0; r < height; ++r)
    for (int c = 0; c < width; ++c)
      img.y.push_back(noise ? next()
                            : clampByte(128 + 50 * std::sin(c / 23.0) + 40 * std::cos(r / 31.0) + 0.1 * (c - r)));
  for (int r = 0; r < img.ch(); ++r)
    for (int c = 0; c < img.cw(); ++c) {
      img.u.push_back(noise ? next() : clampByte(128 + 40 * std::sin((c + r) / 19.0)));
      img.v.push_back(noise ? next() : clampByte(120 + 35 * std::cos((c - 2 * r) / 27.0)));
    }
  return img;
}

// The picture laid out as the encoder reads `format`: luminance, then 2 * ((w*h)/4) chroma bytes
// (I420: U and V planes of (w*h)/4 bytes, rows of w/2; NV21/NV12: rows of w bytes holding w/2
// pairs). Bytes the layout leaves unused hold 0x55.
inline std::vector<uint8_t> packYuv(const Yuv420& img, OrzaVSMobile::ImageFormat format) {
  const size_t w = img.width, h = img.height, cw = img.cw(), quarter = (w * h) / 4;
  std::vector<uint8_t> out(w * h + 2 * quarter, 0x55);
  std::memcpy(out.data(), img.y.data(), w * h);
  for (size_t r = 0; r < static_cast<size_t>(img.ch()); ++r)
    for (size_t c = 0; c < cw; ++c) {
      const uint8_t u = img.u[r * cw + c], v = img.v[r * cw + c];
      if (format == OrzaVSMobile::I420) {
        out[w * h + r * cw + c] = u;
        out[w * h + quarter + r * cw + c] = v;
      } else {
        out[w * h + r * w + 2 * c] = format == OrzaVSMobile::NV12 ? u : v;
        out[w * h + r * w + 2 * c + 1] = format == OrzaVSMobile::NV12 ? v : u;
      }
    }
  return out;
}

// What the decoder saw in a stream; colour comes out as YCbCr or RGB, chroma replicated.
struct Decoded {
  bool ok = false;  // header and every scan line read without a fatal error
  int width = 0, height = 0, components = 0;
  J_COLOR_SPACE colorSpace = JCS_UNKNOWN;
  int samp[3][2] = {};  // h and v sampling factors of the first three components
  bool progressive = false;
  int maxQuant = 0;      // largest entry of any quantisation table
  long warnings = 0;     // corrupt-data and premature-end warnings
  size_t bytesLeft = 0;  // stream bytes the decoder did not consume
  std::vector<uint8_t> pixels;
};

struct DecodeError {
  jpeg_error_mgr pub;
  std::jmp_buf jump;
};

// Reads the header, then every scan line, into `d`. Only trivially destructible objects live in
// this frame because the error hook longjmps back (the pixels belong to the caller's `d`).
inline bool decodeRaw(const std::vector<uint8_t>& jpeg, J_COLOR_SPACE space, Decoded* d) {
  jpeg_decompress_struct c;
  std::memset(&c, 0, sizeof c);
  DecodeError err;
  c.err = jpeg_std_error(&err.pub);
  err.pub.error_exit = [](j_common_ptr info) { std::longjmp(reinterpret_cast<DecodeError*>(info->err)->jump, 1); };
  err.pub.output_message = [](j_common_ptr) {};  // silent
  if (setjmp(err.jump)) {
    jpeg_destroy_decompress(&c);
    return false;
  }
  jpeg_create_decompress(&c);
  jpeg_mem_src(&c, jpeg.data(), static_cast<unsigned long>(jpeg.size()));
  jpeg_read_header(&c, TRUE);
  d->width = static_cast<int>(c.image_width);
  d->height = static_cast<int>(c.image_height);
  d->colorSpace = c.jpeg_color_space;
  d->progressive = c.progressive_mode != 0;
  for (int i = 0; i < c.num_components && i < 3; ++i)
    d->samp[i][0] = c.comp_info[i].h_samp_factor, d->samp[i][1] = c.comp_info[i].v_samp_factor;
  for (int t = 0; t < NUM_QUANT_TBLS; ++t)
    for (int i = 0; c.quant_tbl_ptrs[t] != nullptr && i < DCTSIZE2; ++i)
      if (c.quant_tbl_ptrs[t]->quantval[i] > d->maxQuant) d->maxQuant = c.quant_tbl_ptrs[t]->quantval[i];
  c.out_color_space = c.jpeg_color_space == JCS_GRAYSCALE ? JCS_GRAYSCALE : space;
  d->components = c.out_color_space == JCS_GRAYSCALE ? 1 : 3;
  d->pixels.assign(static_cast<size_t>(d->width) * d->height * d->components, 0);
  c.do_fancy_upsampling = FALSE;
  jpeg_start_decompress(&c);
  while (c.output_scanline < c.output_height) {
    JSAMPROW row = &d->pixels[static_cast<size_t>(c.output_width) * d->components * c.output_scanline];
    jpeg_read_scanlines(&c, &row, 1);
  }
  jpeg_finish_decompress(&c);
  d->warnings = err.pub.num_warnings;
  d->bytesLeft = c.src->bytes_in_buffer;
  jpeg_destroy_decompress(&c);
  return true;
}

inline Decoded decodeJpeg(const std::vector<uint8_t>& jpeg, J_COLOR_SPACE space = JCS_YCbCr) {
  Decoded d;
  d.ok = !jpeg.empty() && decodeRaw(jpeg, space, &d);
  return d;
}

// PSNR in dB of n samples of `a` against `b` (infinite when equal).
inline double psnr(const uint8_t* a, const uint8_t* b, size_t n) {
  double sum = 0;
  for (size_t i = 0; i < n; ++i) sum += std::pow(double(a[i]) - double(b[i]), 2);
  return sum == 0 ? INFINITY : 10.0 * std::log10(255.0 * 255.0 * static_cast<double>(n) / sum);
}

// PSNR of component 0 (Y), 1 (Cb) or 2 (Cr) of a YCbCr decode against the source's plane: with
// replicated chroma the decoded sample at (2x, 2y) is chroma sample (x, y).
inline double planePsnr(const Decoded& d, const Yuv420& img, int plane) {
  const int scale = plane == 0 ? 1 : 2;
  const std::vector<uint8_t>& source = plane == 0 ? img.y : plane == 1 ? img.u : img.v;
  std::vector<uint8_t> decoded;
  for (int y = 0; y < img.height / scale; ++y)
    for (int x = 0; x < img.width / scale; ++x) decoded.push_back(d.pixels[scale * (y * d.width + x) * 3 + plane]);
  return psnr(decoded.data(), source.data(), decoded.size());
}

}  // namespace jpeg_test

#endif
