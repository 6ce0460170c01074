#include "vsearch/JpegDeinterleave.h"

#if defined(__ARM_NEON) || defined(__ARM_NEON__)
#include <arm_neon.h>
#define ORZAVS_DEINTERLEAVE_NEON 1
#elif defined(__SSE2__)
#include <emmintrin.h>
#define ORZAVS_DEINTERLEAVE_SSE2 1
#endif

namespace Tovra {

void deinterleaveChroma(const uint8_t* src, size_t pairs, bool cbFirst, uint8_t* cb, uint8_t* cr) {
  // The first and second byte of each pair go to `first` and `second`.
  uint8_t* first = cbFirst ? cb : cr;
  uint8_t* second = cbFirst ? cr : cb;
  size_t i = 0;
#if defined(ORZAVS_DEINTERLEAVE_NEON)
  for (; i + 16 <= pairs; i += 16) {
    const uint8x16x2_t v = vld2q_u8(src + 2 * i);
    vst1q_u8(first + i, v.val[0]);
    vst1q_u8(second + i, v.val[1]);
  }
#elif defined(ORZAVS_DEINTERLEAVE_SSE2)
  const __m128i lowBytes = _mm_set1_epi16(0x00FF);
  for (; i + 16 <= pairs; i += 16) {
    const __m128i a = _mm_loadu_si128(reinterpret_cast<const __m128i*>(src + 2 * i));
    const __m128i b = _mm_loadu_si128(reinterpret_cast<const __m128i*>(src + 2 * i + 16));
    const __m128i evens = _mm_packus_epi16(_mm_and_si128(a, lowBytes), _mm_and_si128(b, lowBytes));
    const __m128i odds = _mm_packus_epi16(_mm_srli_epi16(a, 8), _mm_srli_epi16(b, 8));
    _mm_storeu_si128(reinterpret_cast<__m128i*>(first + i), evens);
    _mm_storeu_si128(reinterpret_cast<__m128i*>(second + i), odds);
  }
#endif
  for (; i < pairs; ++i) {
    first[i] = src[2 * i];
    second[i] = src[2 * i + 1];
  }
}

}  // namespace Tovra
