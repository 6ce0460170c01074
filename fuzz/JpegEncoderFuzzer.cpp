// Both JPEG encoders over arbitrary geometry, strides, formats, channel counts and qualities.
// The input's first bytes choose the geometry, the rest are the pixels. Each frame sits in a
// block exactly as large as the encoder's contract asks for, either ending at an unreadable page
// (a read past it faults even inside the uninstrumented JPEG library) or 8-byte aligned with
// poisoned surroundings (any stray read by instrumented code is reported). Every stream produced is
// decoded again and checked; equivalent frames (NV21 and NV12 with swapped chroma, padded and
// unpadded packed rows, any YUV stride, BGR and RGB) must give identical bytes.

#include <fuzzer/FuzzedDataProvider.h>

#include <csetjmp>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <vector>

#include <jpeglib.h>

#include "FuzzSupport.h"
#include "types/ImageFormat.h"
#include "vsearch/JpegEncoder.h"

using OrzaVSMobile::ImageFormat;
using orzavs_fuzz::GuardedBlock;

namespace {

// Largest frame the harness hands over (bigger geometry is only tried where it needs no bytes).
constexpr uint64_t kMaxFrameBytes = 1u << 21;

struct DecodeError {
  jpeg_error_mgr pub;
  std::jmp_buf jump;
};

[[noreturn]] void decodeErrorExit(j_common_ptr cinfo) {
  std::longjmp(reinterpret_cast<DecodeError*>(cinfo->err)->jump, 1);
}
void silentMessage(j_common_ptr) {}

struct Decoded {
  bool ok;
  unsigned width;
  unsigned height;
  int components;
};

// Decodes a whole stream; only trivially destructible objects live in this frame (longjmp).
Decoded decode(const uint8_t* bytes, size_t size, JSAMPLE* row, size_t rowCapacity) {
  jpeg_decompress_struct cinfo;
  std::memset(&cinfo, 0, sizeof cinfo);
  DecodeError err;
  cinfo.err = jpeg_std_error(&err.pub);
  err.pub.error_exit = decodeErrorExit;
  err.pub.output_message = silentMessage;
  if (setjmp(err.jump)) {
    jpeg_destroy_decompress(&cinfo);
    return Decoded{false, 0, 0, 0};
  }
  jpeg_create_decompress(&cinfo);
  jpeg_mem_src(&cinfo, const_cast<unsigned char*>(bytes), static_cast<unsigned long>(size));
  jpeg_read_header(&cinfo, TRUE);
  jpeg_start_decompress(&cinfo);
  const Decoded info{true, cinfo.output_width, cinfo.output_height, cinfo.output_components};
  if (static_cast<size_t>(cinfo.output_width) * static_cast<size_t>(cinfo.output_components) >
      rowCapacity) {
    jpeg_destroy_decompress(&cinfo);
    return Decoded{false, 0, 0, 0};
  }
  while (cinfo.output_scanline < cinfo.output_height) {
    JSAMPROW rows[1] = {row};
    jpeg_read_scanlines(&cinfo, rows, 1);
  }
  jpeg_finish_decompress(&cinfo);
  jpeg_destroy_decompress(&cinfo);
  return info;
}

void checkStream(const std::vector<uint8_t>& jpeg, int width, int height, bool grey) {
  FUZZ_CHECK(jpeg.size() >= 4);
  FUZZ_CHECK(jpeg[0] == 0xFF && jpeg[1] == 0xD8);
  FUZZ_CHECK(jpeg[jpeg.size() - 2] == 0xFF && jpeg[jpeg.size() - 1] == 0xD9);
  std::vector<JSAMPLE> row(static_cast<size_t>(width) * 3);
  const Decoded d = decode(jpeg.data(), jpeg.size(), row.data(), row.size());
  FUZZ_CHECK(d.ok);
  FUZZ_CHECK(d.width == static_cast<unsigned>(width) && d.height == static_cast<unsigned>(height));
  FUZZ_CHECK(d.components == (grey ? 1 : 3));
}

int32_t pickDimension(FuzzedDataProvider& in) {
  switch (in.ConsumeIntegralInRange(0, 9)) {
    case 0: return in.ConsumeIntegralInRange<int32_t>(INT32_MIN, 0);
    case 1: return in.ConsumeIntegralInRange<int32_t>(65400, 70000);  // around the library's limit
    case 2: return in.ConsumeIntegralInRange<int32_t>(1, 3);
    case 3: return in.ConsumeIntegralInRange<int32_t>(14, 18);
    case 4: return in.ConsumeIntegralInRange<int32_t>(30, 34);
    case 5: return INT32_MAX;
    default: return in.ConsumeIntegralInRange<int32_t>(1, 96);
  }
}

ImageFormat pickFormat(FuzzedDataProvider& in) {
  if (in.ConsumeIntegralInRange(0, 15) == 0) return static_cast<ImageFormat>(in.ConsumeIntegral<int32_t>());
  return static_cast<ImageFormat>(in.ConsumeIntegralInRange(0, 7));
}

int32_t pickQuality(FuzzedDataProvider& in) {
  switch (in.ConsumeIntegralInRange(0, 3)) {
    case 0: return in.ConsumeIntegral<int32_t>();
    case 1: return 50;  // what the job asks for
    default: return in.ConsumeIntegralInRange<int32_t>(-5, 105);
  }
}

// Bytes the YUV encoder's contract says the frame holds: the luminance plane and two chroma
// planes of (width*height)/4 bytes each (the semi-planar layouts interleave the same bytes).
// -1 when the frame cannot be handed over honestly here.
int64_t yuvFrameBytes(int32_t width, int32_t height) {
  if (width <= 0 || height <= 0) return 0;
  const uint64_t luma = static_cast<uint64_t>(width) * static_cast<uint64_t>(height);
  const uint64_t total = luma + 2 * (luma / 4);
  return total > kMaxFrameBytes ? -1 : static_cast<int64_t>(total);
}

// Bytes a packed frame spans: height-1 strides and one row of width*numChannels bytes.
int64_t packedFrameBytes(int32_t width, int32_t height, int32_t stride, int32_t numChannels) {
  if (width <= 0 || height <= 0 || numChannels <= 0 || stride < 0) return 0;
  const uint64_t total = static_cast<uint64_t>(height - 1) * static_cast<uint64_t>(stride) +
                         static_cast<uint64_t>(width) * static_cast<uint64_t>(numChannels);
  return total > kMaxFrameBytes ? -1 : static_cast<int64_t>(total);
}

void fuzzYuv(FuzzedDataProvider& in) {
  const int32_t width = pickDimension(in);
  const int32_t height = pickDimension(in);
  ImageFormat format = static_cast<ImageFormat>(in.ConsumeIntegralInRange(0, 2));
  if (in.ConsumeIntegralInRange(0, 15) == 0) format = pickFormat(in);  // wrong layouts too
  const int32_t stride = in.ConsumeIntegral<int32_t>();
  const int32_t quality = pickQuality(in);
  const int64_t bytes = yuvFrameBytes(width, height);
  if (bytes < 0) return;
  if (orzavs_fuzz::verbose()) {
    std::printf("yuv: %dx%d stride %d format %d quality %d\n", width, height, stride,
                static_cast<int>(format), quality);
  }
  const GuardedBlock::Placement placement = in.ConsumeBool() ? GuardedBlock::Aligned : GuardedBlock::EndAtPage;
  GuardedBlock frame(static_cast<size_t>(bytes), placement);
  const std::vector<uint8_t> pixels = in.ConsumeRemainingBytes<uint8_t>();
  frame.fill(pixels.data(), pixels.size());

  std::vector<uint8_t> out, work;
  const bool ok = Tovra::encodeYUVToJpeg(frame.data(), height, width, stride, format, out, quality, work);
  const bool valid = width > 0 && height > 0 && width <= 65500 && height <= 65500 &&
                     OrzaVSMobile::isYUVFormat(format);
  FUZZ_CHECK(ok == valid);
  if (!ok) return;
  if (orzavs_fuzz::verbose()) std::printf("stream: %zu bytes, checksum %08x\n", out.size(), orzavs_fuzz::checksum(out));
  checkStream(out, width, height, false);

  // The stride is not used, and a second run reads the same bytes.
  std::vector<uint8_t> again, work2(7, 0xAA);
  FUZZ_CHECK(Tovra::encodeYUVToJpeg(frame.data(), height, width, width, format, again, quality, work2));
  FUZZ_CHECK(again == out);

  if (format != OrzaVSMobile::I420) {
    // The same frame in the other semi-planar layout: every chroma pair swapped.
    GuardedBlock swapped(static_cast<size_t>(bytes), placement);
    std::memcpy(swapped.data(), frame.data(), static_cast<size_t>(bytes));
    const size_t luma = static_cast<size_t>(width) * static_cast<size_t>(height);
    for (size_t i = luma; i + 1 < static_cast<size_t>(bytes); i += 2) {
      std::swap(swapped.data()[i], swapped.data()[i + 1]);
    }
    const ImageFormat other = format == OrzaVSMobile::NV21 ? OrzaVSMobile::NV12 : OrzaVSMobile::NV21;
    FUZZ_CHECK(Tovra::encodeYUVToJpeg(swapped.data(), height, width, stride, other, again, quality, work));
    // Pairs are swapped in whole rows: with an odd width the rows of pairs do not line up with
    // the byte pairs counted from the plane's start, so only even widths compare.
    if (width % 2 == 0) FUZZ_CHECK(again == out);
  }
}

void fuzzPacked(FuzzedDataProvider& in) {
  const int32_t width = pickDimension(in);
  const int32_t height = pickDimension(in);
  const ImageFormat format = pickFormat(in);
  int32_t numChannels;
  switch (in.ConsumeIntegralInRange(0, 4)) {
    case 0: numChannels = in.ConsumeIntegralInRange<int32_t>(-2, 6); break;
    case 1: numChannels = 1; break;
    case 2: numChannels = 4; break;
    default: numChannels = 3; break;
  }
  int32_t stride;
  const int64_t rowBytes = static_cast<int64_t>(width) * numChannels;
  switch (in.ConsumeIntegralInRange(0, 5)) {
    case 0: stride = in.ConsumeIntegral<int32_t>(); break;
    case 1: stride = static_cast<int32_t>(rowBytes - in.ConsumeIntegralInRange(0, 8)); break;
    default: stride = static_cast<int32_t>(rowBytes + in.ConsumeIntegralInRange(0, 40)); break;
  }
  const int32_t quality = pickQuality(in);
  const int64_t bytes = packedFrameBytes(width, height, stride, numChannels);
  if (bytes < 0) return;
  if (orzavs_fuzz::verbose()) {
    std::printf("packed: %dx%d stride %d channels %d format %d quality %d\n", width, height,
                stride, numChannels, static_cast<int>(format), quality);
  }
  const GuardedBlock::Placement placement = in.ConsumeBool() ? GuardedBlock::Aligned : GuardedBlock::EndAtPage;
  GuardedBlock frame(static_cast<size_t>(bytes), placement);
  const std::vector<uint8_t> pixels = in.ConsumeRemainingBytes<uint8_t>();
  frame.fill(pixels.data(), pixels.size());

  std::vector<uint8_t> out, work;
  const bool ok = Tovra::encodePackedToJpeg(frame.data(), height, width, stride, numChannels,
                                            format, out, quality, work);
  const bool valid = width > 0 && height > 0 && width <= 65500 && height <= 65500 && stride >= 0 &&
                     numChannels >= 1 && numChannels != 2;
  FUZZ_CHECK(ok == valid);
  if (!ok) return;
  const bool grey = numChannels < 2;
  if (orzavs_fuzz::verbose()) std::printf("stream: %zu bytes, checksum %08x\n", out.size(), orzavs_fuzz::checksum(out));
  checkStream(out, width, height, grey);

  // The same rows without padding encode identically.
  if (stride >= rowBytes && height > 1) {
    const size_t row = static_cast<size_t>(rowBytes);
    GuardedBlock tight(row * static_cast<size_t>(height), placement);
    for (int32_t r = 0; r < height; ++r) {
      std::memcpy(tight.data() + static_cast<size_t>(r) * row,
                  frame.data() + static_cast<size_t>(r) * static_cast<size_t>(stride), row);
    }
    std::vector<uint8_t> again;
    FUZZ_CHECK(Tovra::encodePackedToJpeg(tight.data(), height, width, static_cast<int32_t>(row),
                                         numChannels, format, again, quality, work));
    FUZZ_CHECK(again == out);
  }

  // B,G,R rows give the same stream as the R,G,B rows they stand for.
  if (numChannels == 3 && format != OrzaVSMobile::RGB && stride >= rowBytes) {
    GuardedBlock rgb(static_cast<size_t>(bytes), placement);
    std::memcpy(rgb.data(), frame.data(), static_cast<size_t>(bytes));
    for (int32_t r = 0; r < height; ++r) {
      uint8_t* p = rgb.data() + static_cast<size_t>(r) * static_cast<size_t>(stride);
      for (int32_t x = 0; x < width; ++x) std::swap(p[3 * x], p[3 * x + 2]);
    }
    std::vector<uint8_t> again;
    FUZZ_CHECK(Tovra::encodePackedToJpeg(rgb.data(), height, width, stride, 3, OrzaVSMobile::RGB,
                                         again, quality, work));
    FUZZ_CHECK(again == out);
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  FuzzedDataProvider in(data, size);
  if (in.ConsumeBool()) {
    fuzzYuv(in);
  } else {
    fuzzPacked(in);
  }
  return 0;
}
