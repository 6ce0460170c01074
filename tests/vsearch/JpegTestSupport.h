#ifndef ORZAVS_TESTS_VSEARCH_JPEGTESTSUPPORT_H
#define ORZAVS_TESTS_VSEARCH_JPEGTESTSUPPORT_H

// Helpers for the JPEG encoder tests: frames in exactly-sized memory with an unreadable page
// right after their last byte, synthetic frame content, a libjpeg decoder on a memory source
// and PSNR.

#include <sys/mman.h>
#include <unistd.h>

#include <cmath>
#include <csetjmp>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <stdexcept>
#include <vector>

#include <jpeglib.h>

#include "types/ImageFormat.h"

namespace jpeg_test {

// `size` bytes that end exactly where an inaccessible page begins: reading one byte past the
// end faults at once, whoever reads (our code or the uninstrumented JPEG library).
class GuardedBytes {
 public:
  explicit GuardedBytes(size_t size) : size_(size) {
    const size_t page = static_cast<size_t>(sysconf(_SC_PAGESIZE));
    const size_t dataPages = (size + page - 1) / page;
    mapped_ = (dataPages + 1) * page;
    void* base = mmap(nullptr, mapped_, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    if (base == MAP_FAILED) throw std::runtime_error("mmap failed");
    base_ = static_cast<uint8_t*>(base);
    if (mprotect(base_ + dataPages * page, page, PROT_NONE) != 0) {
      munmap(base_, mapped_);
      throw std::runtime_error("mprotect failed");
    }
    data_ = base_ + dataPages * page - size;
  }
  GuardedBytes(const std::vector<uint8_t>& bytes) : GuardedBytes(bytes.size()) {  // NOLINT
    if (!bytes.empty()) std::memcpy(data_, bytes.data(), bytes.size());
  }
  ~GuardedBytes() { munmap(base_, mapped_); }
  GuardedBytes(const GuardedBytes&) = delete;
  GuardedBytes& operator=(const GuardedBytes&) = delete;

  uint8_t* data() { return data_; }
  size_t size() const { return size_; }

 private:
  size_t size_;
  size_t mapped_ = 0;
  uint8_t* base_ = nullptr;
  uint8_t* data_ = nullptr;
};

// A planar 4:2:0 image: Y is width x height, U and V are (width/2) x (height/2), the chroma
// layout the encoder's addressing uses (integer halves).
struct Yuv420 {
  int width = 0;
  int height = 0;
  std::vector<uint8_t> y, u, v;
  int chromaWidth() const { return width / 2; }
  int chromaHeight() const { return height / 2; }
};

inline uint8_t clampByte(double v) { return static_cast<uint8_t>(v < 0 ? 0 : v > 255 ? 255 : std::lround(v)); }

// Deterministic pseudo-random bytes (xorshift32).
class Noise {
 public:
  explicit Noise(uint32_t seed) : state_(seed ? seed : 1u) {}
  uint8_t next() {
    state_ ^= state_ << 13;
    state_ ^= state_ >> 17;
    state_ ^= state_ << 5;
    return static_cast<uint8_t>(state_ >> 24);
  }

 private:
  uint32_t state_;
};

// Gentle gradients and waves: what baseline JPEG reproduces well.
inline Yuv420 smoothYuv(int width, int height) {
  Yuv420 img;
  img.width = width;
  img.height = height;
  img.y.resize(static_cast<size_t>(width) * height);
  for (int r = 0; r < height; ++r)
    for (int c = 0; c < width; ++c)
      img.y[static_cast<size_t>(r) * width + c] =
          clampByte(128 + 50 * std::sin(c / 23.0) + 40 * std::cos(r / 31.0) + 0.1 * (c - r));
  const int cw = img.chromaWidth(), ch = img.chromaHeight();
  img.u.resize(static_cast<size_t>(cw) * ch);
  img.v.resize(static_cast<size_t>(cw) * ch);
  for (int r = 0; r < ch; ++r)
    for (int c = 0; c < cw; ++c) {
      img.u[static_cast<size_t>(r) * cw + c] = clampByte(128 + 40 * std::sin((c + r) / 19.0));
      img.v[static_cast<size_t>(r) * cw + c] = clampByte(120 + 35 * std::cos((c - 2 * r) / 27.0));
    }
  return img;
}

// Independent noise in every sample: compresses badly, so streams are long.
inline Yuv420 noiseYuv(int width, int height, uint32_t seed) {
  Yuv420 img;
  img.width = width;
  img.height = height;
  Noise n(seed);
  img.y.resize(static_cast<size_t>(width) * height);
  for (auto& b : img.y) b = n.next();
  img.u.resize(static_cast<size_t>(img.chromaWidth()) * img.chromaHeight());
  img.v.resize(img.u.size());
  for (auto& b : img.u) b = n.next();
  for (auto& b : img.v) b = n.next();
  return img;
}

// Bytes the encoder may read for a YUV frame: the luminance plane and 2 * ((w*h)/4) chroma bytes.
inline size_t yuvFrameSize(int width, int height) {
  const size_t luma = static_cast<size_t>(width) * height;
  return luma + 2 * (luma / 4);
}

// Lays the image out as the encoder reads `format`: I420 planes of (w/2)-byte rows one after
// the other; NV21/NV12 chroma rows of `width` bytes holding (w/2) pairs. Bytes the layout does
// not use are filled with `filler`.
inline std::vector<uint8_t> packYuv(const Yuv420& img, OrzaVSMobile::ImageFormat format, uint8_t filler = 0x55) {
  const size_t w = static_cast<size_t>(img.width), h = static_cast<size_t>(img.height);
  const size_t cw = w / 2, ch = h / 2;
  std::vector<uint8_t> out(yuvFrameSize(img.width, img.height), filler);
  std::memcpy(out.data(), img.y.data(), w * h);
  if (format == OrzaVSMobile::I420) {
    const size_t quarter = (w * h) / 4;
    for (size_t i = 0; i < cw * ch; ++i) {
      out[w * h + i] = img.u[i];
      out[w * h + quarter + i] = img.v[i];
    }
  } else {
    const bool uFirst = format == OrzaVSMobile::NV12;
    for (size_t r = 0; r < ch; ++r)
      for (size_t c = 0; c < cw; ++c) {
        uint8_t* pair = &out[w * h + r * w + 2 * c];
        pair[uFirst ? 0 : 1] = img.u[r * cw + c];
        pair[uFirst ? 1 : 0] = img.v[r * cw + c];
      }
  }
  return out;
}

// Interleaved 8-bit pixels (any channel count) of a smooth colour image, rows `stride` bytes
// apart; padding bytes are filled with `filler`.
inline std::vector<uint8_t> smoothPacked(int width, int height, int channels, int stride, uint8_t filler = 0xA5) {
  std::vector<uint8_t> out(static_cast<size_t>(height - 1) * stride + static_cast<size_t>(width) * channels, filler);
  for (int r = 0; r < height; ++r)
    for (int c = 0; c < width; ++c)
      for (int k = 0; k < channels; ++k)
        out[static_cast<size_t>(r) * stride + static_cast<size_t>(c) * channels + k] =
            clampByte(128 + 60 * std::sin((c + 7 * k) / (17.0 + 5 * k)) + 40 * std::cos((r - 3 * k) / 29.0));
  return out;
}

// Copies `height` rows of `rowBytes` bytes from rows `fromStride` apart to rows `toStride` apart.
inline std::vector<uint8_t> restride(const std::vector<uint8_t>& src, int height, size_t rowBytes, size_t fromStride,
                                     size_t toStride, uint8_t filler) {
  std::vector<uint8_t> out(static_cast<size_t>(height - 1) * toStride + rowBytes, filler);
  for (int r = 0; r < height; ++r)
    std::memcpy(&out[r * toStride], &src[r * fromStride], rowBytes);
  return out;
}

// What the decoder saw in a stream.
struct Decoded {
  bool ok = false;           // header and all scan lines read without a fatal error
  int width = 0;
  int height = 0;
  int components = 0;        // output components (1 grey, 3 colour)
  J_COLOR_SPACE jpegColorSpace = JCS_UNKNOWN;
  int hSamp[3] = {0, 0, 0};
  int vSamp[3] = {0, 0, 0};
  bool progressive = false;
  bool arithmetic = false;
  int maxQuantValue = 0;     // largest entry of any quantisation table
  long warnings = 0;         // corrupt-data and premature-end warnings
  size_t bytesLeft = 0;      // stream bytes the decoder did not consume
  std::vector<uint8_t> pixels;  // width * height * components, rows tight
};

namespace detail {

struct DecodeError {
  jpeg_error_mgr pub;
  std::jmp_buf jump;
};

[[noreturn]] inline void decodeErrorExit(j_common_ptr cinfo) {
  std::longjmp(reinterpret_cast<DecodeError*>(cinfo->err)->jump, 1);
}
inline void silentMessage(j_common_ptr) {}

// Reads the stream; with `out` null only the header. Holds only trivially destructible objects
// because the error hook longjmps back here.
inline bool decodeRaw(const uint8_t* data, size_t size, J_COLOR_SPACE outSpace, Decoded* info, uint8_t* out) {
  jpeg_decompress_struct cinfo;
  std::memset(&cinfo, 0, sizeof cinfo);
  DecodeError err;
  cinfo.err = jpeg_std_error(&err.pub);
  err.pub.error_exit = decodeErrorExit;
  err.pub.output_message = silentMessage;
  if (setjmp(err.jump)) {
    jpeg_destroy_decompress(&cinfo);
    return false;
  }
  jpeg_create_decompress(&cinfo);
  jpeg_mem_src(&cinfo, const_cast<unsigned char*>(data), static_cast<unsigned long>(size));
  jpeg_read_header(&cinfo, TRUE);
  info->width = static_cast<int>(cinfo.image_width);
  info->height = static_cast<int>(cinfo.image_height);
  info->jpegColorSpace = cinfo.jpeg_color_space;
  info->progressive = cinfo.progressive_mode != 0;
  info->arithmetic = cinfo.arith_code != 0;
  for (int c = 0; c < cinfo.num_components && c < 3; ++c) {
    info->hSamp[c] = cinfo.comp_info[c].h_samp_factor;
    info->vSamp[c] = cinfo.comp_info[c].v_samp_factor;
  }
  info->maxQuantValue = 0;
  for (int t = 0; t < NUM_QUANT_TBLS; ++t) {
    if (cinfo.quant_tbl_ptrs[t] == nullptr) continue;
    for (int i = 0; i < DCTSIZE2; ++i)
      if (cinfo.quant_tbl_ptrs[t]->quantval[i] > info->maxQuantValue) info->maxQuantValue = cinfo.quant_tbl_ptrs[t]->quantval[i];
  }
  cinfo.out_color_space = cinfo.jpeg_color_space == JCS_GRAYSCALE ? JCS_GRAYSCALE : outSpace;
  info->components = cinfo.out_color_space == JCS_GRAYSCALE ? 1 : 3;
  if (out == nullptr) {
    jpeg_destroy_decompress(&cinfo);
    return true;
  }
  cinfo.do_fancy_upsampling = FALSE;  // chroma samples are replicated: easy to compare
  jpeg_start_decompress(&cinfo);
  const size_t rowBytes = static_cast<size_t>(cinfo.output_width) * cinfo.output_components;
  while (cinfo.output_scanline < cinfo.output_height) {
    JSAMPROW row = out + rowBytes * cinfo.output_scanline;
    jpeg_read_scanlines(&cinfo, &row, 1);
  }
  jpeg_finish_decompress(&cinfo);
  info->warnings = err.pub.num_warnings;
  info->bytesLeft = cinfo.src->bytes_in_buffer;
  jpeg_destroy_decompress(&cinfo);
  return true;
}

}  // namespace detail

// Decodes a whole stream. Colour streams come out in `outSpace` (JCS_YCbCr or JCS_RGB).
inline Decoded decodeJpeg(const std::vector<uint8_t>& jpeg, J_COLOR_SPACE outSpace = JCS_YCbCr) {
  Decoded d;
  if (jpeg.empty() || !detail::decodeRaw(jpeg.data(), jpeg.size(), outSpace, &d, nullptr)) return d;
  d.pixels.assign(static_cast<size_t>(d.width) * d.height * d.components, 0);
  d.ok = detail::decodeRaw(jpeg.data(), jpeg.size(), outSpace, &d, d.pixels.data());
  return d;
}

// PSNR in dB between two equally long series of samples (infinity when identical).
template <typename GetA, typename GetB>
double psnr(size_t count, GetA a, GetB b) {
  double sum = 0;
  for (size_t i = 0; i < count; ++i) {
    const double d = static_cast<double>(a(i)) - static_cast<double>(b(i));
    sum += d * d;
  }
  if (sum == 0) return INFINITY;
  return 10.0 * std::log10(255.0 * 255.0 / (sum / static_cast<double>(count)));
}

// Luminance PSNR of a YCbCr-decoded frame against the source image.
inline double lumaPsnr(const Decoded& d, const Yuv420& img) {
  const size_t n = static_cast<size_t>(img.width) * img.height;
  return psnr(n, [&](size_t i) { return d.pixels[i * d.components]; }, [&](size_t i) { return img.y[i]; });
}

// PSNR of one chroma plane (1 = Cb, 2 = Cr) over the samples the source defines: the decoded
// sample at (2x, 2y) is the replicated chroma sample (x, y).
inline double chromaPsnr(const Decoded& d, const Yuv420& img, int plane) {
  const int cw = img.chromaWidth();
  const size_t n = static_cast<size_t>(cw) * img.chromaHeight();
  const std::vector<uint8_t>& src = plane == 1 ? img.u : img.v;
  return psnr(
      n,
      [&](size_t i) {
        const size_t x = 2 * (i % cw), y = 2 * (i / cw);
        return d.pixels[(y * d.width + x) * 3 + plane];
      },
      [&](size_t i) { return src[i]; });
}

}  // namespace jpeg_test

#endif
