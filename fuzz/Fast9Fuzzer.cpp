// The FAST step over arbitrary planes and geometry. The plane sits between poisoned memory and
// an unreadable page (see GuardedBlock), so no read outside it goes unnoticed. Every result is compared with a plain reference written from the
// definition (segment test, binary-search score, 8-neighbour suppression with >=), the vector
// kernel with the scalar one, and the engine's interest-point step with the best-50 rule.

#include <fuzzer/FuzzedDataProvider.h>

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cstring>
#include <functional>
#include <vector>

#include "FuzzSupport.h"
#include "features/Fast9.h"
#include "features/InterestPoints.h"
#include "types/ImageBuffer.h"

using OrzaVSMobile::Fast9Corner;
using OrzaVSMobile::Fast9Path;
using orzavs_fuzz::GuardedBlock;

namespace {

// The circle of radius 3, in order round it.
constexpr int kDx[16] = {0, 1, 2, 3, 3, 3, 2, 1, 0, -1, -2, -3, -3, -3, -2, -1};
constexpr int kDy[16] = {3, 3, 2, 1, 0, -1, -2, -3, -3, -3, -2, -1, 0, 1, 2, 3};

struct Plane {
  const uint8_t* data;
  int width;
  int height;
  int stride;
  int at(int x, int y) const { return data[static_cast<ptrdiff_t>(y) * stride + x]; }
};

bool referenceIsCorner(const Plane& p, int x, int y, int b) {
  const int c = p.at(x, y);
  bool brighter[16], darker[16];
  for (int i = 0; i < 16; ++i) {
    const int v = p.at(x + kDx[i], y + kDy[i]);
    brighter[i] = v > c + b;
    darker[i] = v < c - b;
  }
  for (int start = 0; start < 16; ++start) {
    bool allB = true, allD = true;
    for (int k = 0; k < 9; ++k) {
      allB = allB && brighter[(start + k) % 16];
      allD = allD && darker[(start + k) % 16];
    }
    if (allB || allD) return true;
  }
  return false;
}

int referenceScore(const Plane& p, int x, int y, int b) {
  int low = b, high = 255;
  while (!(low == high - 1 || low == high)) {
    const int t = (low + high) / 2;
    if (referenceIsCorner(p, x, y, t)) {
      low = t;
    } else {
      high = t;
    }
  }
  return low;
}

struct Reference {
  std::vector<Fast9Corner> raw;
  std::vector<int> rawScores;
  std::vector<Fast9Corner> kept;
  std::vector<int> keptScores;
};

Reference reference(const Plane& p, int b) {
  Reference r;
  if (p.width < 7 || p.height < 7 || p.stride < p.width) return r;
  std::vector<int> grid(static_cast<size_t>(p.width) * static_cast<size_t>(p.height), -1000);
  for (int y = 3; y < p.height - 3; ++y) {
    for (int x = 3; x < p.width - 3; ++x) {
      if (!referenceIsCorner(p, x, y, b)) continue;
      const int s = referenceScore(p, x, y, b);
      r.raw.push_back(Fast9Corner{x, y});
      r.rawScores.push_back(s);
      grid[static_cast<size_t>(y) * static_cast<size_t>(p.width) + static_cast<size_t>(x)] = s;
    }
  }
  for (size_t i = 0; i < r.raw.size(); ++i) {
    const Fast9Corner c = r.raw[i];
    const int v = r.rawScores[i];
    bool suppressed = false;
    for (int dy = -1; dy <= 1 && !suppressed; ++dy) {
      for (int dx = -1; dx <= 1; ++dx) {
        if (dx == 0 && dy == 0) continue;
        const int s = grid[static_cast<size_t>(c.y + dy) * static_cast<size_t>(p.width) +
                           static_cast<size_t>(c.x + dx)];
        if (s != -1000 && s >= v) {
          suppressed = true;
          break;
        }
      }
    }
    if (!suppressed) {
      r.kept.push_back(c);
      r.keptScores.push_back(v);
    }
  }
  return r;
}

int pickThreshold(FuzzedDataProvider& in) {
  switch (in.ConsumeIntegralInRange(0, 7)) {
    case 0: return in.ConsumeIntegralInRange(-300, -1);  // scalar kernel only
    case 1: return in.ConsumeIntegralInRange(250, 300);
    case 2: return 0;
    default: return in.ConsumeIntegralInRange(1, 120);
  }
}

// Fills the plane so that corners, exact-threshold differences and equal scores all occur.
void fillPlane(FuzzedDataProvider& in, const Plane& p, uint8_t* data, int threshold) {
  const int mode = in.ConsumeIntegralInRange(0, 3);
  const int base = in.ConsumeIntegral<uint8_t>();
  const std::vector<uint8_t> bytes = in.ConsumeRemainingBytes<uint8_t>();
  size_t next = 0;
  auto take = [&]() -> uint8_t { return bytes.empty() ? 0 : bytes[next++ % bytes.size()]; };
  for (int y = 0; y < p.height; ++y) {
    for (int x = 0; x < p.width; ++x) {
      const uint8_t v = take();
      int value;
      switch (mode) {
        case 0: value = v; break;
        case 1: value = base + (static_cast<int>(v % 5) - 2) * std::max(threshold, 0); break;  // steps of b
        case 2: value = (v < 232) ? base : v; break;  // a flat plane with a few spikes
        default: value = base + (static_cast<int>(v % 3) - 1) * (std::max(threshold, 0) + (v >> 7)); break;
      }
      data[static_cast<ptrdiff_t>(y) * p.stride + x] = static_cast<uint8_t>(std::clamp(value, 0, 255));
    }
  }
}

int32_t pickDimension(FuzzedDataProvider& in) {
  switch (in.ConsumeIntegralInRange(0, 7)) {
    case 0: return in.ConsumeIntegralInRange<int32_t>(INT32_MIN, 0);
    case 1: return in.ConsumeIntegralInRange<int32_t>(1, 8);
    case 2: return in.ConsumeIntegralInRange<int32_t>(60, 160);  // several vector widths
    case 3: return INT32_MAX;
    default: return in.ConsumeIntegralInRange<int32_t>(7, 48);
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  FuzzedDataProvider in(data, size);
  const int32_t width = pickDimension(in);
  const int32_t height = pickDimension(in);
  int64_t wantedStride;
  switch (in.ConsumeIntegralInRange(0, 4)) {
    case 0: wantedStride = in.ConsumeIntegral<int32_t>(); break;
    case 1: wantedStride = static_cast<int64_t>(width) - in.ConsumeIntegralInRange(1, 4); break;
    default: wantedStride = static_cast<int64_t>(width) + in.ConsumeIntegralInRange(0, 40); break;
  }
  const int32_t stride = static_cast<int32_t>(std::clamp<int64_t>(wantedStride, INT32_MIN, INT32_MAX));
  const int threshold = pickThreshold(in);

  // Bytes a plane of this geometry spans; geometry the detector must refuse gets none at all.
  const bool usable = width >= 7 && height >= 7 && stride >= width;
  uint64_t bytes = 0;
  if (usable) {
    bytes = static_cast<uint64_t>(height - 1) * static_cast<uint64_t>(stride) + static_cast<uint64_t>(width);
    if (bytes > (1u << 20) || static_cast<uint64_t>(width) * static_cast<uint64_t>(height) > 8000) return 0;
  }
  GuardedBlock block(static_cast<size_t>(bytes), in.ConsumeBool() ? GuardedBlock::Aligned : GuardedBlock::EndAtPage);
  const Plane plane{block.data(), usable ? width : 0, usable ? height : 0, stride};
  if (usable) {
    std::memset(block.data(), 0x5A, block.size());  // row padding: never part of the plane
    fillPlane(in, plane, block.data(), threshold);
  }

  // Segment test and scores, both kernels, against the reference.
  std::vector<Fast9Corner> corners, scalarCorners, kept, scalarKept, suppressed;
  std::vector<int> scores, scalarScores, keptScores, scalarKeptScores, suppressedScores, rescored;
  OrzaVSMobile::fast9Detect(block.data(), width, height, stride, threshold, corners, scores);
  OrzaVSMobile::fast9Detect(block.data(), width, height, stride, threshold, scalarCorners,
                            scalarScores, Fast9Path::Scalar);
  FUZZ_CHECK(corners == scalarCorners && scores == scalarScores);
  const Reference ref = usable ? reference(plane, threshold) : Reference{};
  FUZZ_CHECK(scalarCorners == ref.raw && scalarScores == ref.rawScores);

  // Suppression, one-pass and separate, against the reference.
  OrzaVSMobile::fast9DetectNonmax(block.data(), width, height, stride, threshold, kept, keptScores);
  OrzaVSMobile::fast9DetectNonmax(block.data(), width, height, stride, threshold, scalarKept,
                                  scalarKeptScores, Fast9Path::Scalar);
  FUZZ_CHECK(kept == scalarKept && keptScores == scalarKeptScores);
  FUZZ_CHECK(kept == ref.kept && keptScores == ref.keptScores);
  OrzaVSMobile::fast9Suppress(ref.raw.data(), ref.rawScores.data(), ref.raw.size(), suppressed,
                              suppressedScores);
  FUZZ_CHECK(suppressed == ref.kept && suppressedScores == ref.keptScores);
  if (usable) {
    OrzaVSMobile::fast9Score(block.data(), stride, ref.kept.data(), ref.kept.size(), threshold, rescored);
    FUZZ_CHECK(rescored == ref.keptScores);
  }

  // The engine's step at threshold 50, through an ImageBuffer as the engine hands it over.
  OrzaVSMobile::ImageBuffer image(0, OrzaVSMobile::GRAY, width, height, stride, 1, block.data());
  std::vector<OrzaVSMobile::Point2f> points(3);
  OrzaVSMobile::detectInterestPoints(image, points);
  const Reference at50 = usable ? (threshold == 50 ? ref : reference(plane, 50)) : Reference{};
  if (at50.kept.size() <= 50) {
    FUZZ_CHECK(points.size() == at50.kept.size());
    for (size_t i = 0; i < points.size(); ++i) {
      FUZZ_CHECK(points[i].x == static_cast<float>(at50.kept[i].x));
      FUZZ_CHECK(points[i].y == static_cast<float>(at50.kept[i].y));
    }
  } else {
    // Exactly 50 distinct kept corners whose scores are the 50 highest.
    FUZZ_CHECK(points.size() == 50);
    std::vector<int> chosen;
    for (const auto& pt : points) {
      const auto it = std::find_if(at50.kept.begin(), at50.kept.end(), [&](const Fast9Corner& c) {
        return static_cast<float>(c.x) == pt.x && static_cast<float>(c.y) == pt.y;
      });
      FUZZ_CHECK(it != at50.kept.end());
      chosen.push_back(at50.keptScores[static_cast<size_t>(it - at50.kept.begin())]);
    }
    for (size_t i = 0; i < points.size(); ++i) {
      for (size_t j = i + 1; j < points.size(); ++j) {
        FUZZ_CHECK(points[i].x != points[j].x || points[i].y != points[j].y);
      }
    }
    std::vector<int> best = at50.keptScores;
    std::sort(best.begin(), best.end(), std::greater<int>());
    best.resize(50);
    std::sort(chosen.begin(), chosen.end(), std::greater<int>());
    FUZZ_CHECK(chosen == best);
  }
  return 0;
}
