#ifndef ORZAVS_FEATURES_FAST9KERNELS_H
#define ORZAVS_FEATURES_FAST9KERNELS_H

// Row kernels of the FAST-9 detector (internal to features/).
//
// Score rows: one byte per column of a row, 0 where the pixel is no corner, score + 1 where it
// is. This needs 0 <= threshold <= 254 (then 1 <= score + 1 <= 255); the driver sends other
// thresholds to the per-pixel cornerAt().

#include <cstddef>
#include <cstdint>

namespace OrzaVSMobile {
namespace fast9detail {

// Segment test on the pixels 3 <= x < width-3 of one row. `row` points at column 0 of the row;
// rows row-3*stride .. row+3*stride must be readable in columns 0..width-1. Writes score[x]
// for every x in [3, width-3) and nothing else. When `xs` is not null, appends the corner
// columns in increasing order (room for width entries) and returns their number; otherwise
// returns non-zero exactly when the row has a corner. Requires width >= 7, 0 <= b <= 254.
using DetectRowFn = int (*)(const uint8_t* row, ptrdiff_t stride, int width, int b, uint8_t* score, int32_t* xs);

// Non-maximum suppression of the middle row of three score rows (rows y-1, y, y+1; columns
// 0..width-1, columns 0..2 and width-3.. hold 0). Appends to `keptXs` (room for width entries)
// the columns whose value is non-zero and strictly above all 8 neighbours, in increasing
// order, and returns their number.
using SuppressRowFn = int (*)(const uint8_t* above, const uint8_t* mid, const uint8_t* below, int width,
                              int32_t* keptXs);

struct RowKernels {
  DetectRowFn detect;
  SuppressRowFn suppress;
  const char* name;
};

const RowKernels& scalarKernels();
// The vector kernels compiled for this target, or null when there are none.
const RowKernels* simdKernels();

// Circle displacements for row stride s, in circle order: position 0 straight below the
// centre, then round towards +x.
void circleOffsets(ptrdiff_t s, ptrdiff_t off[16]);

// Segment test of one pixel at any threshold b (negative ones included). On a corner returns
// true and sets *score.
bool cornerAt(const uint8_t* p, const ptrdiff_t off[16], int b, int* score);

// Score of one pixel at threshold b, corner or not: the binary search's result, i.e. the
// highest threshold >= b at which the pixel is a corner, or b when it is none at b.
int pixelScore(const uint8_t* p, ptrdiff_t stride, int b);

}  // namespace fast9detail
}  // namespace OrzaVSMobile

#endif
