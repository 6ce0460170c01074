#ifndef ORZAVS_VSEARCH_JPEGDEINTERLEAVE_H
#define ORZAVS_VSEARCH_JPEGDEINTERLEAVE_H

#include <cstddef>
#include <cstdint>

namespace Tovra {

// Splits `pairs` interleaved chroma pairs into a Cb row and a Cr row (each `pairs` bytes).
// With `cbFirst` the pairs are (Cb, Cr) as in NV12, otherwise (Cr, Cb) as in NV21. Reads exactly
// 2 * pairs bytes from `src`. Uses SIMD where the target has it; the scalar twin gives the same
// bytes and is exported for comparison.
void deinterleaveChroma(const uint8_t* src, size_t pairs, bool cbFirst, uint8_t* cb, uint8_t* cr);
void deinterleaveChromaScalar(const uint8_t* src, size_t pairs, bool cbFirst, uint8_t* cb, uint8_t* cr);

}  // namespace Tovra

#endif
