#ifndef ORZAVS_TESTS_FEATURES_FAST9REFERENCE_H
#define ORZAVS_TESTS_FEATURES_FAST9REFERENCE_H

// A deliberately plain FAST-9 written straight from the detector's definition, to check the
// optimised detector against: per-pixel segment test with the circle listed position by
// position, the corner score by binary search on the threshold, suppression by comparing every
// pair of corners. Slow, obviously correct, small planes only.

#include <cstdint>
#include <cstdlib>
#include <random>
#include <vector>

#include "features/Fast9.h"

namespace fast9ref {

using OrzaVSMobile::Fast9Corner;

// Circle positions 0..15 as (dx, dy): straight below the centre first, then towards +x.
constexpr int kCircle[16][2] = {{0, 3},  {1, 3},   {2, 2},   {3, 1},   {3, 0},  {3, -1},  {2, -2},  {1, -3},
                                {0, -3}, {-1, -3}, {-2, -2}, {-3, -1}, {-3, 0}, {-3, 1}, {-2, 2}, {-1, 3}};

inline bool isCorner(const uint8_t* plane, int stride, int x, int y, int b) {
  const int c = plane[static_cast<ptrdiff_t>(y) * stride + x];
  for (int polarity = 0; polarity < 2; ++polarity) {
    for (int start = 0; start < 16; ++start) {
      bool all = true;
      for (int i = 0; i < 9 && all; ++i) {
        const int k = (start + i) % 16;
        const int p = plane[static_cast<ptrdiff_t>(y + kCircle[k][1]) * stride + x + kCircle[k][0]];
        all = polarity == 0 ? (p > c + b) : (p < c - b);
      }
      if (all) return true;
    }
  }
  return false;
}

// Binary search as defined; b must not exceed 255 (above that the search never ends).
inline int score(const uint8_t* plane, int stride, int x, int y, int b) {
  int low = b, high = 255;
  do {
    const int t = (low + high) / 2;
    (isCorner(plane, stride, x, y, t) ? low : high) = t;
  } while (!(low == high - 1 || low == high));
  return low;
}

struct Detection { std::vector<Fast9Corner> corners; std::vector<int> scores; };

inline Detection detect(const uint8_t* plane, int width, int height, int stride, int b) {
  Detection d;
  for (int y = 3; y < height - 3; ++y) {
    for (int x = 3; x < width - 3; ++x) {
      if (isCorner(plane, stride, x, y, b)) {
        d.corners.push_back(Fast9Corner{x, y});
        d.scores.push_back(score(plane, stride, x, y, b));
      }
    }
  }
  return d;
}

// Dropped when a corner among the 8 neighbours has a score >= its own.
inline Detection suppress(const Detection& raw) {
  Detection kept;
  for (size_t i = 0; i < raw.corners.size(); ++i) {
    const Fast9Corner c = raw.corners[i];
    bool dominated = false;
    for (size_t j = 0; j < raw.corners.size(); ++j) {
      const Fast9Corner n = raw.corners[j];
      dominated |= j != i && std::abs(n.x - c.x) <= 1 && std::abs(n.y - c.y) <= 1 && raw.scores[j] >= raw.scores[i];
    }
    if (!dominated) {
      kept.corners.push_back(c);
      kept.scores.push_back(raw.scores[i]);
    }
  }
  return kept;
}

// Planes of several kinds, exactly the (height-1)*stride + width bytes their geometry spans,
// every byte (row padding included) drawn from `rng`: noise, low contrast, flat rectangles of a
// few levels with single-pixel specks, or values at both ends (where c + b and c - b leave 0..255).
enum class Content { Noise, LowContrast, Blocks, Extremes };

inline std::vector<uint8_t> makePlane(int width, int height, int stride, Content content, std::mt19937& rng) {
  std::vector<uint8_t> p(static_cast<size_t>(height - 1) * stride + static_cast<size_t>(width));
  std::uniform_int_distribution<int> any(0, 255);
  for (auto& v : p) v = static_cast<uint8_t>(any(rng));  // padding keeps this garbage
  for (int y = 0; y < height; ++y) {
    for (int x = 0; x < width; ++x) {
      const int speck = (x * 7 + y * 13) % 17 == 0 ? 60 : 0;
      const int v = content == Content::Noise         ? any(rng)
                    : content == Content::LowContrast ? 100 + any(rng) % 61
                    : content == Content::Blocks      ? ((x / 5 + y / 4) % 3) * 90 + speck
                    : any(rng) % 2                    ? any(rng) % 12
                                                      : 244 + any(rng) % 12;
      p[static_cast<size_t>(y) * stride + x] = static_cast<uint8_t>(v);
    }
  }
  return p;
}

}  // namespace fast9ref

#endif
