#ifndef ORZAVS_BENCH_BENCHFRAMES_H
#define ORZAVS_BENCH_BENCHFRAMES_H

#include <cstdint>
#include <string>
#include <vector>

namespace orzavs_bench {

// One generated camera frame in NV21: the Y plane (width x height, stride == width), then the
// interleaved V,U plane at half resolution in both directions (width x height/2 bytes).
// Width and height are even.
struct BenchFrame {
  std::string name;     // e.g. "1280x720 smooth"
  std::string content;  // "smooth" or "texture"
  int width;
  int height;
  std::vector<uint8_t> nv21;

  const uint8_t* luma() const { return nv21.data(); }
  const uint8_t* chroma() const { return nv21.data() + static_cast<size_t>(width) * height; }
};

// The benchmark frames, generated once on first use (deterministic: the same bytes on every
// run and machine). Order: 640x480, 1280x720, 1920x1080, each first "smooth" (gradients, soft
// blobs, a few hard edges, mild noise) then "texture" (text-like strokes, a woven fabric
// pattern and foliage-like speckle).
const std::vector<BenchFrame>& benchFrames();

// Frames whose name contains `filter` (all when empty), in the order above.
std::vector<const BenchFrame*> selectFrames(const std::string& filter);

}  // namespace orzavs_bench

#endif
