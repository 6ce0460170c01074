// JPEG encoding at quality 50, the way the visual search job encodes frames: our YUV encoder on
// the NV21 camera frame against TurboJPEG's tjCompressFromYUV (4:2:0, same quality, same
// pixels). TurboJPEG takes planar I420 only, so it is timed on an I420 copy made before timing,
// and once more with the NV21 -> I420 conversion inside the timed call. It is run with the fast
// integer DCT (what our encoder uses) and with its default DCT. Our encoder on the I420 copy and
// the packed encoder (grey and BGR) are listed for reference.

#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#include "bench/BenchHarness.h"
#include "vsearch/JpegEncoder.h"

#ifdef ORZAVS_HAVE_TURBOJPEG
#include <turbojpeg.h>
#endif

namespace {

using namespace orzavs_bench;
using OrzaVSMobile::ImageFormat;

constexpr int kQuality = 50;

// Planar I420 of an NV21 frame (U plane, then V plane).
void nv21ToI420(const BenchFrame& f, uint8_t* i420) {
  const size_t luma = static_cast<size_t>(f.width) * f.height;
  const size_t quarter = luma / 4;
  std::memcpy(i420, f.luma(), luma);
  const uint8_t* vu = f.chroma();
  uint8_t* u = i420 + luma;
  uint8_t* v = u + quarter;
  for (size_t i = 0; i < quarter; ++i) {
    v[i] = vu[2 * i];
    u[i] = vu[2 * i + 1];
  }
}

// Packed B,G,R pixels of an NV21 frame (BT.601 full range), for the packed encoder.
std::vector<uint8_t> nv21ToBgr(const BenchFrame& f) {
  std::vector<uint8_t> bgr(static_cast<size_t>(f.width) * f.height * 3);
  auto clamp = [](int x) { return static_cast<uint8_t>(x < 0 ? 0 : x > 255 ? 255 : x); };
  for (int r = 0; r < f.height; ++r) {
    for (int c = 0; c < f.width; ++c) {
      const int y = f.luma()[r * f.width + c];
      const uint8_t* vu = f.chroma() + (r / 2) * f.width + (c / 2) * 2;
      const int v = vu[0] - 128, u = vu[1] - 128;
      uint8_t* px = &bgr[(static_cast<size_t>(r) * f.width + c) * 3];
      px[0] = clamp(y + (113 * u) / 64);
      px[1] = clamp(y - (22 * u + 46 * v) / 64);
      px[2] = clamp(y + (90 * v) / 64);
    }
  }
  return bgr;
}

void runJpegBench(const std::vector<const BenchFrame*>& frames) {
  printHeading("jpeg: encoding at quality 50 (ratio = ours / TurboJPEG; below 1 is faster)");
  std::vector<uint8_t> out, work;
  for (const BenchFrame* fp : frames) {
    const BenchFrame& f = *fp;
    const size_t lumaLen = static_cast<size_t>(f.width) * f.height;
    std::vector<uint8_t> i420(lumaLen + 2 * (lumaLen / 4));
    nv21ToI420(f, i420.data());

    auto oursNv21 = [&] {
      if (!Tovra::encodeYUVToJpeg(f.nv21.data(), f.height, f.width, f.width, OrzaVSMobile::NV21, out,
                                  kQuality, work))
        std::printf("encode failed\n");
      keep(out.data());
    };
    auto oursI420 = [&] {
      Tovra::encodeYUVToJpeg(i420.data(), f.height, f.width, f.width, OrzaVSMobile::I420, out, kQuality,
                             work);
      keep(out.data());
    };
    const Timing ours = measure(oursNv21);
    printTiming(f.name, "ours NV21", ours);
    const std::vector<uint8_t> oursStream = out;
    printTiming(f.name, "ours I420", measure(oursI420));
    const std::vector<uint8_t> oursI420Stream = out;

#ifdef ORZAVS_HAVE_TURBOJPEG
    tjhandle tj = tjInitCompress();
    const unsigned long capacity = tjBufSize(f.width, f.height, TJSAMP_420);
    unsigned char* tjBuf = tjAlloc(static_cast<int>(capacity));
    unsigned long tjSize = 0;
    std::vector<uint8_t> scratchI420(i420.size());
    auto peer = [&](const uint8_t* planar, int flags) {
      tjSize = capacity;
      if (tjCompressFromYUV(tj, planar, f.width, 1, f.height, TJSAMP_420, &tjBuf, &tjSize, kQuality,
                            flags | TJFLAG_NOREALLOC) != 0)
        std::printf("tjCompressFromYUV failed: %s\n", tjGetErrorStr2(tj));
      keep(tjBuf);
    };
    const Timing fast = measure([&] { peer(i420.data(), TJFLAG_FASTDCT); });
    printTiming(f.name, "TurboJPEG I420, fast DCT", fast);
    auto sameAsPeer = [&](const std::vector<uint8_t>& stream) {
      return tjSize == stream.size() && std::memcmp(tjBuf, stream.data(), tjSize) == 0;
    };
    const bool identical = sameAsPeer(oursStream), identicalI420 = sameAsPeer(oursI420Stream);
    const Timing fastConv = measure([&] {
      nv21ToI420(f, scratchI420.data());
      peer(scratchI420.data(), TJFLAG_FASTDCT);
    });
    printTiming(f.name, "TurboJPEG NV21->I420+enc, fast DCT", fastConv);
    const Timing deflt = measure([&] { peer(i420.data(), 0); });
    printTiming(f.name, "TurboJPEG I420, default DCT", deflt);
    printRatio(f.name, "ours NV21 / TJ I420 fast DCT", ours, fast);
    printRatio(f.name, "ours NV21 / TJ conv+enc fast DCT", ours, fastConv);
    printRatio(f.name, "ours NV21 / TJ I420 default DCT", ours, deflt);
    // The library encodes whole 8x8 blocks. Where a plane's height is not a multiple of 8 (1080
    // rows: chroma rows 540 to 543), the samples below the picture come from the previous band's
    // chroma rows on our semi-planar path, from the last row on our planar path and in TurboJPEG:
    // only the planar streams can then be identical.
    std::printf("  %-18s %-34s NV21 %s, I420 %s (ours %zu bytes, TurboJPEG %lu bytes)\n", f.name.c_str(),
                "streams vs TJ fast DCT", identical ? "byte-identical" : "differs",
                identicalI420 ? "byte-identical" : "differs", oursStream.size(), tjSize);
    tjFree(tjBuf);
    tjDestroy(tj);
#else
    std::printf("  %-18s %-34s NV21 %zu bytes, I420 %zu bytes (TurboJPEG not found: no peer)\n",
                f.name.c_str(), "ours streams", oursStream.size(), oursI420Stream.size());
#endif

    const std::vector<uint8_t> bgr = nv21ToBgr(f);
    printTiming(f.name, "ours packed grey", measure([&] {
                  Tovra::encodePackedToJpeg(f.luma(), f.height, f.width, f.width, 1, OrzaVSMobile::GRAY, out,
                                            kQuality, work);
                  keep(out.data());
                }));
    printTiming(f.name, "ours packed BGR", measure([&] {
                  Tovra::encodePackedToJpeg(bgr.data(), f.height, f.width, f.width * 3, 3, OrzaVSMobile::BGR,
                                            out, kQuality, work);
                  keep(out.data());
                }));
  }
}

}  // namespace

ORZAVS_BENCH_SECTION("jpeg", runJpegBench);
