// Vector FAST-9 kernels (segment test with scores, and suppression): 16 pixels of a row at a
// time, SSE2 on x86 and NEON on ARM.
//
// For a block of 16 centres c and one circle position, the bright margin is p -sat c and the
// dark margin c -sat p (unsigned saturating subtraction, so a margin is max(difference, 0)).
// A pixel is a corner at threshold b >= 0 exactly when, for one polarity, the minimum margin
// over some arc of 9 contiguous positions exceeds b; that maximum over arcs of the arc minimum,
// minus one, is also the corner's score. Clamping the margins at 0 changes neither: a corner's
// arc minimum is at least b + 1 >= 1. Most blocks are rejected early by positions 0 and 8, then
// by 0, 4, 8, 12, two neighbouring ones of which lie in every arc of 9.

#include "features/Fast9Kernels.h"

#if defined(__SSE2__)
#include <emmintrin.h>
#elif defined(__ARM_NEON) || defined(__ARM_NEON__)
#include <arm_neon.h>
#define ORZAVS_FAST9_NEON 1
#endif

namespace OrzaVSMobile {
namespace fast9detail {

#if defined(__SSE2__) || defined(ORZAVS_FAST9_NEON)
namespace {

// The few 16 x u8 operations the kernels need. Masks are vectors with all-ones or zero lanes.
#if defined(__SSE2__)
struct VecOps {
  using V = __m128i;
  static V load(const uint8_t* p) { return _mm_loadu_si128(reinterpret_cast<const __m128i*>(p)); }
  static void store(uint8_t* p, V v) { _mm_storeu_si128(reinterpret_cast<__m128i*>(p), v); }
  static V splat(uint8_t v) { return _mm_set1_epi8(static_cast<char>(v)); }
  static V subs(V a, V b) { return _mm_subs_epu8(a, b); }
  static V adds(V a, V b) { return _mm_adds_epu8(a, b); }
  static V vmin(V a, V b) { return _mm_min_epu8(a, b); }
  static V vmax(V a, V b) { return _mm_max_epu8(a, b); }
  static V vor(V a, V b) { return _mm_or_si128(a, b); }
  static bool anyNonZero(V a) { return _mm_movemask_epi8(_mm_cmpeq_epi8(a, _mm_setzero_si128())) != 0xFFFF; }
  // Mask of the lanes where a > t (unsigned).
  static V greater(V a, V t) {
    return _mm_xor_si128(_mm_cmpeq_epi8(_mm_subs_epu8(a, t), _mm_setzero_si128()), _mm_set1_epi8(-1));
  }
  // a where a > t, else 0.
  static V keepGreater(V a, V t) {
    return _mm_andnot_si128(_mm_cmpeq_epi8(_mm_subs_epu8(a, t), _mm_setzero_si128()), a);
  }
  // Bit i set for each set lane i of a mask.
  static unsigned laneBits(V mask) { return static_cast<unsigned>(_mm_movemask_epi8(mask)); }
  static constexpr const char* kName = "SSE2";
};
#else
struct VecOps {
  using V = uint8x16_t;
  static V load(const uint8_t* p) { return vld1q_u8(p); }
  static void store(uint8_t* p, V v) { vst1q_u8(p, v); }
  static V splat(uint8_t v) { return vdupq_n_u8(v); }
  static V subs(V a, V b) { return vqsubq_u8(a, b); }
  static V adds(V a, V b) { return vqaddq_u8(a, b); }
  static V vmin(V a, V b) { return vminq_u8(a, b); }
  static V vmax(V a, V b) { return vmaxq_u8(a, b); }
  static V vor(V a, V b) { return vorrq_u8(a, b); }
  static bool anyNonZero(V a) {
    const uint8x8_t folded = vorr_u8(vget_low_u8(a), vget_high_u8(a));
    return vget_lane_u64(vreinterpret_u64_u8(folded), 0) != 0;
  }
  static V greater(V a, V t) { return vcgtq_u8(a, t); }
  static V keepGreater(V a, V t) { return vandq_u8(a, vcgtq_u8(a, t)); }
  static unsigned laneBits(V mask) {
    static const uint8_t kBits[16] = {1, 2, 4, 8, 16, 32, 64, 128, 1, 2, 4, 8, 16, 32, 64, 128};
    const uint8x16_t bits = vandq_u8(mask, vld1q_u8(kBits));
    uint8x8_t sum = vpadd_u8(vget_low_u8(bits), vget_high_u8(bits));
    sum = vpadd_u8(sum, sum);
    sum = vpadd_u8(sum, sum);  // lane 0: bits of lanes 0-7, lane 1: bits of lanes 8-15
    return static_cast<unsigned>(vget_lane_u8(sum, 0)) | (static_cast<unsigned>(vget_lane_u8(sum, 1)) << 8);
  }
  static constexpr const char* kName = "NEON";
};
#endif

using V = VecOps::V;

// Maximum over the 16 arcs of 9 contiguous positions of the arc's minimum margin. Arcs k and
// k+1 share positions k+1 .. k+8, so the pair's best is min(min m[k+1..k+8], max(m[k], m[k+9])):
// eight pairs (k even) need the 8-position minima at odd starts only, built from minima of 4
// and of 2 at odd starts.
inline V maxArcMin(const V m[16]) {
  V a2[8], a4[8];
#pragma GCC unroll 8
  for (int i = 0; i < 8; ++i) a2[i] = VecOps::vmin(m[2 * i + 1], m[(2 * i + 2) & 15]);  // m[j..j+1], j = 2i+1
#pragma GCC unroll 8
  for (int i = 0; i < 8; ++i) a4[i] = VecOps::vmin(a2[i], a2[(i + 1) & 7]);  // m[j..j+3]
  V best = VecOps::vmin(VecOps::vmin(a4[0], a4[2]), VecOps::vmax(m[0], m[9]));
#pragma GCC unroll 8
  for (int i = 1; i < 8; ++i) {
    const V a8 = VecOps::vmin(a4[i], a4[(i + 2) & 7]);  // m[j..j+7]
    best = VecOps::vmax(best, VecOps::vmin(a8, VecOps::vmax(m[2 * i], m[(2 * i + 9) & 15])));
  }
  return best;
}

// Runs `block(x, laneMask)` over the centres first <= x < xEnd in blocks of 16 (xEnd - 16 >= 3,
// so a block never starts left of the first centre of the row). The last block is moved back to
// end at xEnd; its lanes that were already covered are masked off (their score bytes come out
// the same when the block stores them again).
template <class Block>
inline void forEachBlock(int first, int xEnd, Block&& block) {
  for (int x = first; x < xEnd; x += 16) {
    unsigned from = 0;
    if (x + 16 > xEnd) {
      from = static_cast<unsigned>(x - (xEnd - 16));
      x = xEnd - 16;
    }
    block(x, (0xFFFFu << from) & 0xFFFFu);
  }
}

// Non-zero lanes where position 0 or 8 passes the test at threshold b (hi = c +sat b,
// lo = c -sat b; saturation is exact: p > 255 or p < 0 never holds). Every arc of 9 holds
// position 0 or 8 (they are 8 apart), so elsewhere there is no corner.
inline V farFromCentre(V hi, V lo, V p0, V p8) {
  return VecOps::vor(VecOps::vor(VecOps::subs(p0, hi), VecOps::subs(lo, p0)),
                     VecOps::vor(VecOps::subs(p8, hi), VecOps::subs(lo, p8)));
}

struct RowPointers {
  const uint8_t *rm3, *rm2, *rm1, *r0, *rp1, *rp2, *rp3;
  RowPointers(const uint8_t* row, ptrdiff_t s)
      : rm3(row - 3 * s), rm2(row - 2 * s), rm1(row - s), r0(row), rp1(row + s), rp2(row + 2 * s),
        rp3(row + 3 * s) {}
};

// The rest of the test for the 16 centres at x, once positions 0 and 8 let some lane through:
// positions 0, 4, 8, 12, then the whole circle. Stores the block's score bytes and returns
// them (non-zero exactly in the corner lanes).
inline V finishBlock(const RowPointers& r, int x, V thr, V c, V p0, V p8, uint8_t* score) {
  const V p4 = VecOps::load(r.r0 + x + 3), p12 = VecOps::load(r.r0 + x - 3);
  const V bq = VecOps::vmin(VecOps::vmax(VecOps::subs(p0, c), VecOps::subs(p8, c)),
                            VecOps::vmax(VecOps::subs(p4, c), VecOps::subs(p12, c)));
  const V dq = VecOps::vmin(VecOps::vmax(VecOps::subs(c, p0), VecOps::subs(c, p8)),
                            VecOps::vmax(VecOps::subs(c, p4), VecOps::subs(c, p12)));
  // A polarity whose quarter test fails in every lane has no corner in the block: its arc value
  // stays <= b in every lane and cannot be a corner's score, so it is not computed.
  const bool brightAny = VecOps::anyNonZero(VecOps::subs(bq, thr));
  const bool darkAny = VecOps::anyNonZero(VecOps::subs(dq, thr));
  if (!brightAny && !darkAny) {
    VecOps::store(score + x, VecOps::splat(0));
    return VecOps::splat(0);
  }
  const V p[16] = {p0,
                   VecOps::load(r.rp3 + x + 1),
                   VecOps::load(r.rp2 + x + 2),
                   VecOps::load(r.rp1 + x + 3),
                   p4,
                   VecOps::load(r.rm1 + x + 3),
                   VecOps::load(r.rm2 + x + 2),
                   VecOps::load(r.rm3 + x + 1),
                   p8,
                   VecOps::load(r.rm3 + x - 1),
                   VecOps::load(r.rm2 + x - 2),
                   VecOps::load(r.rm1 + x - 3),
                   p12,
                   VecOps::load(r.rp1 + x - 3),
                   VecOps::load(r.rp2 + x - 2),
                   VecOps::load(r.rp3 + x - 1)};
  V m[16];
  V best = VecOps::splat(0);
  if (brightAny) {
#pragma GCC unroll 16
    for (int k = 0; k < 16; ++k) m[k] = VecOps::subs(p[k], c);
    best = maxArcMin(m);
  }
  if (darkAny) {
#pragma GCC unroll 16
    for (int k = 0; k < 16; ++k) m[k] = VecOps::subs(c, p[k]);
    best = VecOps::vmax(best, maxArcMin(m));
  }
  // Corner lanes keep best (= score + 1 >= b + 1), the others become 0.
  const V kept = VecOps::keepGreater(best, thr);
  VecOps::store(score + x, kept);
  return kept;
}

int detectRow(const uint8_t* row, ptrdiff_t s, int width, int b, uint8_t* score, int32_t* xs) {
  // A block reads columns x-3 .. x+18; rows too narrow for one block go to the scalar kernel.
  if (width - 6 < 16) return scalarKernels().detect(row, s, width, b, score, xs);
  const RowPointers r(row, s);
  const V thr = VecOps::splat(static_cast<uint8_t>(b));
  const V zero = VecOps::splat(0);
  const int xEnd = width - 3;  // centres are 3 <= x < xEnd
  int n = 0;
  // Records the corners of a block from its score bytes; `lanes` leaves out lanes that an
  // earlier block already covered.
  auto emit = [&](int x, V scores, unsigned lanes) {
    if (xs == nullptr) {
      n |= static_cast<int>(VecOps::anyNonZero(scores));
      return;
    }
    unsigned mask = VecOps::laneBits(VecOps::greater(scores, zero)) & lanes;
    for (; mask != 0; mask &= mask - 1) xs[n++] = x + __builtin_ctz(mask);
  };
  int x = 3;
  // Two blocks at a time while both fit: on smooth content nearly every pair is rejected by
  // positions 0 and 8 alone.
  for (; x + 32 <= xEnd; x += 32) {
    const V c0 = VecOps::load(r.r0 + x), c1 = VecOps::load(r.r0 + x + 16);
    const V a0 = VecOps::load(r.rp3 + x), a1 = VecOps::load(r.rp3 + x + 16);
    const V b0 = VecOps::load(r.rm3 + x), b1 = VecOps::load(r.rm3 + x + 16);
    const V far0 = farFromCentre(VecOps::adds(c0, thr), VecOps::subs(c0, thr), a0, b0);
    const V far1 = farFromCentre(VecOps::adds(c1, thr), VecOps::subs(c1, thr), a1, b1);
    if (!VecOps::anyNonZero(VecOps::vor(far0, far1))) {
      VecOps::store(score + x, zero);
      VecOps::store(score + x + 16, zero);
      continue;
    }
    if (VecOps::anyNonZero(far0)) {
      emit(x, finishBlock(r, x, thr, c0, a0, b0, score), 0xFFFFu);
    } else {
      VecOps::store(score + x, zero);
    }
    if (VecOps::anyNonZero(far1)) {
      emit(x + 16, finishBlock(r, x + 16, thr, c1, a1, b1, score), 0xFFFFu);
    } else {
      VecOps::store(score + x + 16, zero);
    }
  }
  // Then single blocks.
  forEachBlock(x, xEnd, [&](int bx, unsigned laneMask) {
    const V c = VecOps::load(r.r0 + bx), a = VecOps::load(r.rp3 + bx), bl = VecOps::load(r.rm3 + bx);
    if (!VecOps::anyNonZero(farFromCentre(VecOps::adds(c, thr), VecOps::subs(c, thr), a, bl))) {
      VecOps::store(score + bx, zero);
      return;
    }
    emit(bx, finishBlock(r, bx, thr, c, a, bl, score), laneMask);
  });
  return n;
}

int suppressRow(const uint8_t* above, const uint8_t* mid, const uint8_t* below, int width, int32_t* keptXs) {
  if (width - 6 < 16) return scalarKernels().suppress(above, mid, below, width, keptXs);
  int n = 0;
  forEachBlock(3, width - 3, [&](int x, unsigned laneMask) {
    const V v = VecOps::load(mid + x);
    if (!VecOps::anyNonZero(v)) return;
    V around = VecOps::vmax(VecOps::load(mid + x - 1), VecOps::load(mid + x + 1));
    around = VecOps::vmax(around, VecOps::vmax(VecOps::load(above + x - 1), VecOps::load(above + x)));
    around = VecOps::vmax(around, VecOps::vmax(VecOps::load(above + x + 1), VecOps::load(below + x - 1)));
    around = VecOps::vmax(around, VecOps::vmax(VecOps::load(below + x), VecOps::load(below + x + 1)));
    for (unsigned mask = VecOps::laneBits(VecOps::greater(v, around)) & laneMask; mask != 0; mask &= mask - 1) {
      keptXs[n++] = x + __builtin_ctz(mask);
    }
  });
  return n;
}

const RowKernels kVector = {detectRow, suppressRow, VecOps::kName};

}  // namespace

const RowKernels* simdKernels() { return &kVector; }

#else

const RowKernels* simdKernels() { return nullptr; }

#endif

}  // namespace fast9detail
}  // namespace OrzaVSMobile
