#ifndef ORZAVS_VSEARCH_JPEGDEINTERLEAVE_H
#define ORZAVS_VSEARCH_JPEGDEINTERLEAVE_H

#include <cstddef>
#include <cstdint>

namespace Tovra {

// Splits `pairs` interleaved chroma pairs into a Cb row and a Cr row of `pairs` bytes each. With
// `cbFirst` the pairs are (Cb, Cr) as in NV12, otherwise (Cr, Cb) as in NV21. Reads exactly
// 2 * pairs bytes from `src`. Uses NEON or SSE2 where the target has it, 16 pairs at a time, and
// plain code for the rest; both give the same bytes.
void deinterleaveChroma(const uint8_t* src, size_t pairs, bool cbFirst, uint8_t* cb, uint8_t* cr);

}  // namespace Tovra

#endif
