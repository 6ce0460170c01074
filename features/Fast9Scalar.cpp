// Scalar FAST-9 kernels: the twin of the vector kernels, and the per-pixel test used for
// thresholds outside 0..254.

#include <algorithm>
#include <climits>
#include <cstring>

#include "features/Fast9Kernels.h"

namespace OrzaVSMobile {
namespace fast9detail {
namespace {

// True when the 16-bit circular mask has 9 or more contiguous set bits.
inline bool hasArcOf9(uint32_t mask) {
  const uint32_t mm = mask | (mask << 16);  // repeated so that arcs can wrap from 15 to 0
  uint32_t a = mm & (mm >> 1);              // bit i: bits i..i+1 of mm set
  a &= a >> 2;                              // bits i..i+3
  a &= a >> 4;                              // bits i..i+7
  a &= mm >> 8;                             // bits i..i+8
  return (a & 0xFFFFu) != 0;
}

// Maximum over the 16 arcs of 9 contiguous positions of the minimum of e over the arc.
inline int maxArcMin(const int e[16]) {
  int a2[16], a4[16];
  for (int k = 0; k < 16; ++k) a2[k] = std::min(e[k], e[(k + 1) & 15]);
  for (int k = 0; k < 16; ++k) a4[k] = std::min(a2[k], a2[(k + 2) & 15]);
  int best = INT_MIN;
  for (int k = 0; k < 16; ++k) {
    best = std::max(best, std::min(std::min(a4[k], a4[(k + 4) & 15]), e[(k + 8) & 15]));
  }
  return best;
}

// Highest t at which a pixel with circle differences d (p - c) is a corner: some arc has every
// d > t, or every -d > t. Lies in [-256, 254].
inline int cornerLimit(const int d[16]) {
  int neg[16];
  for (int k = 0; k < 16; ++k) neg[k] = -d[k];
  return std::max(maxArcMin(d), maxArcMin(neg)) - 1;
}

// Necessary condition for a corner from positions 0, 4, 8 and 12 alone: every arc of 9 holds
// two neighbouring ones of them, so for one polarity (0 or 8) and (4 or 12) must pass.
inline bool mayBeCorner(int d0, int d4, int d8, int d12, int b) {
  const bool maybeBright = (d0 > b || d8 > b) && (d4 > b || d12 > b);
  const bool maybeDark = (d0 < -b || d8 < -b) && (d4 < -b || d12 < -b);
  return maybeBright || maybeDark;
}

// The whole circle: corner test and score.
inline bool fullTest(const uint8_t* p, const ptrdiff_t off[16], int b, int* score) {
  const int c = p[0];
  int d[16];
  uint32_t bright = 0, dark = 0;
  for (int k = 0; k < 16; ++k) {
    d[k] = p[off[k]] - c;
    bright |= static_cast<uint32_t>(d[k] > b) << k;  // p > c + b
    dark |= static_cast<uint32_t>(d[k] < -b) << k;   // p < c - b
  }
  if (!hasArcOf9(bright) && !hasArcOf9(dark)) return false;
  *score = cornerLimit(d);  // at least b, since the pixel is a corner at b
  return true;
}

int detectRow(const uint8_t* row, ptrdiff_t stride, int width, int b, uint8_t* score, int32_t* xs) {
  ptrdiff_t off[16];
  circleOffsets(stride, off);
  const ptrdiff_t below = 3 * stride, above = -3 * stride;
  std::memset(score + 3, 0, static_cast<size_t>(width - 6));
  int n = 0;
  for (int x = 3; x < width - 3; ++x) {
    const uint8_t* p = row + x;
    const int c = p[0];
    const int d0 = p[below] - c, d8 = p[above] - c;
    // Positions 0 and 8 are 8 apart, so every arc of 9 holds one of them.
    if (d0 <= b && d0 >= -b && d8 <= b && d8 >= -b) continue;
    if (!mayBeCorner(d0, p[3] - c, d8, p[-3] - c, b)) continue;
    int s;
    if (!fullTest(p, off, b, &s)) continue;
    score[x] = static_cast<uint8_t>(s + 1);
    if (xs != nullptr) xs[n] = x;
    ++n;
  }
  return n;
}

int suppressRow(const uint8_t* above, const uint8_t* mid, const uint8_t* below, int width, int32_t* keptXs) {
  int n = 0;
  for (int x = 3; x < width - 3; ++x) {
    const uint8_t v = mid[x];
    if (v == 0) continue;
    if (mid[x - 1] >= v || mid[x + 1] >= v || above[x - 1] >= v || above[x] >= v || above[x + 1] >= v ||
        below[x - 1] >= v || below[x] >= v || below[x + 1] >= v) {
      continue;
    }
    keptXs[n++] = x;
  }
  return n;
}

const RowKernels kScalar = {detectRow, suppressRow, "scalar"};

}  // namespace

const RowKernels& scalarKernels() { return kScalar; }

void circleOffsets(ptrdiff_t s, ptrdiff_t off[16]) {
  const ptrdiff_t table[16] = {3 * s,  3 * s + 1,  2 * s + 2,  s + 3,  3,  -s + 3, -2 * s + 2, -3 * s + 1,
                               -3 * s, -3 * s - 1, -2 * s - 2, -s - 3, -3, s - 3,  2 * s - 2,  3 * s - 1};
  std::copy(table, table + 16, off);
}

bool cornerAt(const uint8_t* p, const ptrdiff_t off[16], int b, int* score) {
  const int c = p[0];
  if (!mayBeCorner(p[off[0]] - c, p[off[4]] - c, p[off[8]] - c, p[off[12]] - c, b)) return false;
  return fullTest(p, off, b, score);
}

int pixelScore(const uint8_t* p, ptrdiff_t stride, int b) {
  ptrdiff_t off[16];
  circleOffsets(stride, off);
  const int c = p[0];
  int d[16];
  for (int k = 0; k < 16; ++k) d[k] = p[off[k]] - c;
  // The binary search keeps `low` at the last threshold that passed, starting from b, so it
  // ends at the corner limit when that is at least b, and at b otherwise. (For b above 255
  // the search itself would never end; b is the answer there too.)
  return std::max(b, cornerLimit(d));
}

}  // namespace fast9detail
}  // namespace OrzaVSMobile
