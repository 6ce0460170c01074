// Random sequences of ImageBuffer operations as a client (or the Java side, which can set every
// field) would make them: allocate with any length, fill from one or two planes with any
// lengths including negative ones, release, copy, assign, lend outside memory, and overwrite
// `data` and `allocLen`. AddressSanitizer watches every copy; after each step the results are
// checked against what the operations promise.

#include <fuzzer/FuzzedDataProvider.h>

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cstring>
#include <memory>
#include <vector>

#include "FuzzSupport.h"
#include "types/ImageBuffer.h"

using OrzaVSMobile::ImageBuffer;
using orzavs_fuzz::GuardedBlock;

namespace {

constexpr int kBuffers = 3;
constexpr int32_t kMaxAlloc = 1 << 16;

// What the harness knows about each buffer, to tell an honest call from a lying one.
struct Model {
  uint8_t* own = nullptr;  // block returned by the last allocateBuffer(), while not released
  int32_t ownLen = 0;
  uint8_t* lent = nullptr;  // block lent through lend()
  int32_t lentLen = 0;
};

int32_t pickLength(FuzzedDataProvider& in) {
  switch (in.ConsumeIntegralInRange(0, 7)) {
    case 0: return 0;
    case 1: return -1;
    case 2: return INT32_MIN;
    case 3: return in.ConsumeIntegralInRange<int32_t>(INT32_MIN, -1);
    default: return in.ConsumeIntegralInRange<int32_t>(0, kMaxAlloc);
  }
}

// A source of `length` readable bytes (none for a negative length), cut from the input.
std::unique_ptr<GuardedBlock> makeSource(FuzzedDataProvider& in, int32_t length) {
  const size_t n = length > 0 ? static_cast<size_t>(length) : 0;
  auto block = std::make_unique<GuardedBlock>(n, in.ConsumeBool() ? GuardedBlock::Aligned : GuardedBlock::EndAtPage);
  std::vector<uint8_t> bytes = in.ConsumeBytes<uint8_t>(std::min<size_t>(n, 64));
  block->fill(bytes.data(), bytes.size());
  return block;
}

// Bytes a fill may honestly write: allocLen when the buffer's memory is a block the harness
// knows and allocLen does not claim more than that block holds; -1 when allocLen lies.
int64_t honestCapacity(const ImageBuffer& b, const Model& m) {
  if (b.data == nullptr) return 0;
  int64_t real = -1;
  if (m.own != nullptr && b.data == m.own) real = m.ownLen;
  else if (m.lent != nullptr && b.data == m.lent) real = m.lentLen;
  if (real < 0) return -1;
  if (b.allocLen > real) return -1;
  return std::max<int32_t>(b.allocLen, 0);
}

void checkInvariants(const ImageBuffer& b, const Model& m) {
  if (b.data != nullptr && m.own != nullptr && b.data == m.own) {
    FUZZ_CHECK(b.knownLength() == m.ownLen);
  } else if (b.data != nullptr && m.lent != nullptr && b.data == m.lent) {
    FUZZ_CHECK(b.knownLength() == m.lentLen);
  }
  if (b.data == nullptr) FUZZ_CHECK(b.knownLength() == 0);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  FuzzedDataProvider in(data, size);
  ImageBuffer buffers[kBuffers];
  Model models[kBuffers];
  // Memory lent from outside (as the engine lends a frame record's pixels). The buffers never
  // touch it when they are destroyed.
  std::vector<std::unique_ptr<GuardedBlock>> lentBlocks;

  for (int step = 0; step < 64 && in.remaining_bytes() > 0; ++step) {
    const int i = in.ConsumeIntegralInRange(0, kBuffers - 1);
    ImageBuffer& b = buffers[i];
    Model& m = models[i];
    switch (in.ConsumeIntegralInRange(0, 9)) {
      case 0: {  // allocate
        const int32_t len = pickLength(in);
        const int32_t got = b.allocateBuffer(len);
        if (len < 0) {
          FUZZ_CHECK(got == 0 && b.allocLen == 0);
          m.own = nullptr;
          m.ownLen = 0;
        } else {
          FUZZ_CHECK(got == len && b.allocLen == len && b.data != nullptr);
          m.own = b.data;
          m.ownLen = len;
        }
        break;
      }
      case 1: {  // release
        uint8_t* before = b.data;
        const bool owned = b.allocLen != 0;  // a zero allocLen releases nothing
        b.releaseBuffer();
        FUZZ_CHECK(b.allocLen == 0 && b.data == before);
        if (owned) {
          m.own = nullptr;
          m.ownLen = 0;
        }
        break;
      }
      case 2:
      case 3: {  // one-plane fill, from a byte array or a direct buffer
        const int32_t len = pickLength(in);
        auto src = makeSource(in, len);
        const int64_t cap = honestCapacity(b, m);
        const int32_t got = (step & 1) ? b.fillBuffer(src->data(), len)
                                       : b.fillBufferWithByteBuffer(src->data(), len);
        FUZZ_CHECK(got >= 0 && got <= std::max(len, 0));
        if (b.data == nullptr) FUZZ_CHECK(got == 0);
        if (cap >= 0) FUZZ_CHECK(got == std::max<int64_t>(0, std::min<int64_t>(len, cap)));
        if (got > 0) FUZZ_CHECK(std::memcmp(b.data, src->data(), static_cast<size_t>(got)) == 0);
        break;
      }
      case 4: {  // two-plane fill
        const int32_t len1 = pickLength(in);
        const int32_t len2 = pickLength(in);
        auto src1 = makeSource(in, len1);
        auto src2 = makeSource(in, len2);
        const int64_t cap = honestCapacity(b, m);
        const int32_t got = b.fillBufferWithByteBuffer(src1->data(), len1, src2->data(), len2);
        FUZZ_CHECK(got >= 0 && got <= std::max(len1, 0) + std::max(len2, 0));
        if (b.data == nullptr) FUZZ_CHECK(got == 0);
        if (cap >= 0) {
          const int64_t first = std::max<int64_t>(0, std::min<int64_t>(len1, cap));
          const int64_t second = std::max<int64_t>(0, std::min<int64_t>(len2, cap - first));
          FUZZ_CHECK(got == first + second);
          if (first > 0) FUZZ_CHECK(std::memcmp(b.data, src1->data(), static_cast<size_t>(first)) == 0);
          if (second > 0) {
            FUZZ_CHECK(std::memcmp(b.data + first, src2->data(), static_cast<size_t>(second)) == 0);
          }
        }
        break;
      }
      case 5: {  // copy construction from another buffer, then assignment back
        const int j = in.ConsumeIntegralInRange(0, kBuffers - 1);
        ImageBuffer copy(buffers[j]);
        FUZZ_CHECK(copy.width == buffers[j].width && copy.allocLen == buffers[j].allocLen);
        if (models[j].own != nullptr && buffers[j].data == models[j].own) {
          // An owning buffer's copy owns a duplicate of the bytes.
          FUZZ_CHECK(copy.data != buffers[j].data);
          FUZZ_CHECK(copy.knownLength() == models[j].ownLen);
          if (models[j].ownLen > 0) {
            FUZZ_CHECK(std::memcmp(copy.data, buffers[j].data,
                                   static_cast<size_t>(models[j].ownLen)) == 0);
          }
        }
        copy.fillBuffer(reinterpret_cast<const uint8_t*>("copy"), 4);
        break;
      }
      case 6: {  // assignment between buffers (self-assignment included)
        const int j = in.ConsumeIntegralInRange(0, kBuffers - 1);
        const bool owning = models[j].own != nullptr && buffers[j].data == models[j].own;
        const int32_t ownLen = models[j].ownLen;
        uint8_t* lent = models[j].lent;
        const int32_t lentLen = models[j].lentLen;
        const bool self = (i == j);
        b = buffers[j];
        if (!self) {
          m.own = owning ? b.data : nullptr;
          m.ownLen = owning ? ownLen : 0;
          m.lent = lent;
          m.lentLen = lentLen;
          if (owning) FUZZ_CHECK(b.data != buffers[j].data);
        }
        break;
      }
      case 7: {  // lend outside memory to the buffer
        const int32_t len = in.ConsumeIntegralInRange<int32_t>(-4, 4096);
        lentBlocks.push_back(std::make_unique<GuardedBlock>(
            len > 0 ? static_cast<size_t>(len) : 0, in.ConsumeBool() ? GuardedBlock::Aligned : GuardedBlock::EndAtPage));
        uint8_t* block = lentBlocks.back()->data();
        b.lend(block, len);
        m.lent = block;
        m.lentLen = len > 0 ? len : 0;
        FUZZ_CHECK(b.data == block && b.allocLen == m.lentLen);
        break;
      }
      case 8: {  // the Java side overwrites allocLen with any value
        b.allocLen = in.ConsumeIntegral<int32_t>();
        break;
      }
      case 9: {  // the Java side points data at null or back at a block the buffer knew
        switch (in.ConsumeIntegralInRange(0, 2)) {
          case 0: b.data = nullptr; break;
          case 1: if (m.own != nullptr) b.data = m.own; break;
          default: if (m.lent != nullptr) b.data = m.lent; break;
        }
        break;
      }
    }
    for (int k = 0; k < kBuffers; ++k) checkInvariants(buffers[k], models[k]);
  }
  return 0;
}
