#include "features/Fast9.h"

#include <algorithm>
#include <cstdint>

#include "features/Fast9Kernels.h"

namespace OrzaVSMobile {

using fast9detail::RowKernels;

namespace {

// A plane the detector can work on: non-null, at least 7x7, rows at least `width` apart, and
// small enough that every byte offset fits in ptrdiff_t. Anything else has no corners.
bool usablePlane(const uint8_t* plane, int width, int height, int stride) {
  if (plane == nullptr || width < 7 || height < 7 || stride < width) return false;
  const int64_t span = static_cast<int64_t>(height - 1) * stride + width;  // < 2^62
  return static_cast<uint64_t>(span) <= static_cast<uint64_t>(PTRDIFF_MAX);
}

const RowKernels& pickKernels(Fast9Path path) {
  const RowKernels* simd = fast9detail::simdKernels();
  if (path == Fast9Path::Best && simd != nullptr) return *simd;
  return fast9detail::scalarKernels();
}

// Per-thread scratch reused across calls, so steady-state detection makes no allocation: a
// ring of three score rows (rows y-1, y, y+1), an all-zero row standing for the rows outside
// the tested band, and room for one row's corner columns. The kernels write only columns
// 3..width-4 of a row, so columns 0..2 and width-3.. stay 0 from the first allocation on.
struct Scratch {
  std::vector<uint8_t> rows[3];
  std::vector<uint8_t> zeroRow;
  std::vector<int32_t> xs;

  void prepare(int width) {
    const size_t w = static_cast<size_t>(width);
    if (zeroRow.size() != w) {
      for (auto& r : rows) r.assign(w, 0);
      zeroRow.assign(w, 0);
      xs.resize(w);
    }
  }
};

Scratch& scratch() {
  thread_local Scratch s;
  return s;
}

// Any threshold, any plane: the per-pixel test, with exact scores down to negative thresholds.
void detectAnyThreshold(const uint8_t* plane, int width, int height, int stride, int threshold,
                        std::vector<Fast9Corner>& corners, std::vector<int>& scores) {
  // Below -32767 every pixel passes both tests exactly as at -32767, and -b cannot overflow.
  threshold = std::max(threshold, -32767);
  ptrdiff_t off[16];
  fast9detail::circleOffsets(stride, off);
  for (int y = 3; y < height - 3; ++y) {
    const uint8_t* row = plane + static_cast<ptrdiff_t>(y) * stride;
    for (int x = 3; x < width - 3; ++x) {
      int score;
      if (fast9detail::cornerAt(row + x, off, threshold, &score)) {
        corners.push_back(Fast9Corner{x, y});
        scores.push_back(score);
      }
    }
  }
}

}  // namespace

const char* fast9BestPathName() {
  const RowKernels* simd = fast9detail::simdKernels();
  return simd != nullptr ? simd->name : fast9detail::scalarKernels().name;
}

void fast9Detect(const uint8_t* plane, int width, int height, int stride, int threshold,
                 std::vector<Fast9Corner>& corners, std::vector<int>& scores, Fast9Path path) {
  corners.clear();
  scores.clear();
  // From 255 up no 8-bit difference can pass the test.
  if (!usablePlane(plane, width, height, stride) || threshold >= 255) return;
  if (threshold < 0) {
    detectAnyThreshold(plane, width, height, stride, threshold, corners, scores);
    return;
  }
  const RowKernels& k = pickKernels(path);
  Scratch& s = scratch();
  s.prepare(width);
  uint8_t* row = s.rows[0].data();
  int32_t* xs = s.xs.data();
  for (int y = 3; y < height - 3; ++y) {
    const int n = k.detect(plane + static_cast<ptrdiff_t>(y) * stride, stride, width, threshold, row, xs);
    for (int i = 0; i < n; ++i) {
      corners.push_back(Fast9Corner{xs[i], y});
      scores.push_back(row[xs[i]] - 1);
    }
  }
}

void fast9Suppress(const Fast9Corner* corners, const int* scores, size_t count, std::vector<Fast9Corner>& kept,
                   std::vector<int>& keptScores) {
  kept.clear();
  keptScores.clear();
  if (count == 0 || corners == nullptr || scores == nullptr) return;
  // Row index: first list position of every row up to the last corner's row, -1 when empty.
  const int lastRow = corners[count - 1].y;
  if (lastRow < 0) return;  // not a row-ordered list of plane coordinates
  std::vector<ptrdiff_t> rowStart(static_cast<size_t>(lastRow) + 1, -1);
  for (size_t i = count; i-- > 0;) {
    if (corners[i].y >= 0 && corners[i].y <= lastRow) {
      rowStart[static_cast<size_t>(corners[i].y)] = static_cast<ptrdiff_t>(i);
    }
  }
  const ptrdiff_t n = static_cast<ptrdiff_t>(count);
  ptrdiff_t above = 0, below = 0;  // forward-only cursors into rows y-1 and y+1
  for (ptrdiff_t i = 0; i < n; ++i) {
    const int v = scores[i];
    const int x = corners[i].x, y = corners[i].y;
    if (i > 0 && corners[i - 1].y == y && corners[i - 1].x == x - 1 && scores[i - 1] >= v) continue;
    if (i + 1 < n && corners[i + 1].y == y && corners[i + 1].x == x + 1 && scores[i + 1] >= v) continue;
    bool suppressed = false;
    if (y > 0 && y - 1 <= lastRow && rowStart[static_cast<size_t>(y - 1)] >= 0) {
      if (above >= n || corners[above].y < y - 1) above = rowStart[static_cast<size_t>(y - 1)];
      while (above < n && corners[above].y == y - 1 && corners[above].x < x - 1) ++above;
      for (ptrdiff_t j = above; j < n && corners[j].y == y - 1 && corners[j].x <= x + 1; ++j) {
        if (scores[j] >= v) {
          suppressed = true;
          break;
        }
      }
    }
    if (!suppressed && y >= 0 && y < lastRow && rowStart[static_cast<size_t>(y + 1)] >= 0) {
      if (below >= n || corners[below].y < y + 1) below = rowStart[static_cast<size_t>(y + 1)];
      while (below < n && corners[below].y == y + 1 && corners[below].x < x - 1) ++below;
      for (ptrdiff_t j = below; j < n && corners[j].y == y + 1 && corners[j].x <= x + 1; ++j) {
        if (scores[j] >= v) {
          suppressed = true;
          break;
        }
      }
    }
    if (suppressed) continue;
    kept.push_back(corners[i]);
    keptScores.push_back(v);
  }
}

void fast9DetectNonmax(const uint8_t* plane, int width, int height, int stride, int threshold,
                       std::vector<Fast9Corner>& kept, std::vector<int>& keptScores, Fast9Path path) {
  kept.clear();
  keptScores.clear();
  if (!usablePlane(plane, width, height, stride) || threshold >= 255) return;
  if (threshold < 0) {
    // Scores below 0 do not fit the byte score rows: take the general road.
    std::vector<Fast9Corner> raw;
    std::vector<int> rawScores;
    detectAnyThreshold(plane, width, height, stride, threshold, raw, rawScores);
    fast9Suppress(raw.data(), rawScores.data(), raw.size(), kept, keptScores);
    return;
  }
  const RowKernels& k = pickKernels(path);
  Scratch& s = scratch();
  s.prepare(width);
  const uint8_t* const zero = s.zeroRow.data();
  int32_t* const xs = s.xs.data();
  bool hasCorners[3] = {false, false, false};

  // Row y is settled once row y+1 is scored: a corner is kept when its score is strictly
  // above every neighbour's in the 3x3 window (a non-corner counts as 0, below any corner).
  // This is the list suppression's rule: a neighbour corner with a score >= its own drops it.
  const int first = 3, last = height - 4;
  auto settle = [&](int y) {
    if (!hasCorners[y % 3]) return;
    const uint8_t* above = y > first ? s.rows[(y - 1) % 3].data() : zero;
    const uint8_t* below = y < last ? s.rows[(y + 1) % 3].data() : zero;
    const uint8_t* mid = s.rows[y % 3].data();
    const int n = k.suppress(above, mid, below, width, xs);
    for (int i = 0; i < n; ++i) {
      kept.push_back(Fast9Corner{xs[i], y});
      keptScores.push_back(mid[xs[i]] - 1);
    }
  };
  for (int y = first; y <= last; ++y) {
    hasCorners[y % 3] = k.detect(plane + static_cast<ptrdiff_t>(y) * stride, stride, width, threshold,
                                 s.rows[y % 3].data(), nullptr) != 0;
    if (y > first) settle(y - 1);
  }
  settle(last);
}

void fast9Score(const uint8_t* plane, int stride, const Fast9Corner* corners, size_t count, int threshold,
                std::vector<int>& scores) {
  scores.clear();
  if (plane == nullptr || corners == nullptr) return;
  scores.reserve(count);
  for (size_t i = 0; i < count; ++i) {
    const uint8_t* p = plane + static_cast<ptrdiff_t>(corners[i].y) * stride + corners[i].x;
    scores.push_back(fast9detail::pixelScore(p, stride, threshold));
  }
}

}  // namespace OrzaVSMobile
