#ifndef ORZAVS_FUZZ_FUZZSUPPORT_H
#define ORZAVS_FUZZ_FUZZSUPPORT_H

// Helpers shared by the fuzz targets.

#include <sys/mman.h>
#include <unistd.h>

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#if defined(__has_feature)
#if __has_feature(address_sanitizer)
#include <sanitizer/asan_interface.h>
#define ORZAVS_FUZZ_POISON(addr, size) ASAN_POISON_MEMORY_REGION(addr, size)
#define ORZAVS_FUZZ_UNPOISON(addr, size) ASAN_UNPOISON_MEMORY_REGION(addr, size)
#endif
#endif
#ifndef ORZAVS_FUZZ_POISON
#define ORZAVS_FUZZ_POISON(addr, size) ((void)(addr), (void)(size))
#define ORZAVS_FUZZ_UNPOISON(addr, size) ((void)(addr), (void)(size))
#endif

#include <vector>

// A property that must hold for every input; a violation is reported like a crash, so the
// fuzzer keeps the input that broke it.
#define FUZZ_CHECK(cond)                                                              \
  do {                                                                                \
    if (!(cond)) {                                                                    \
      std::fprintf(stderr, "FUZZ_CHECK failed at %s:%d: %s\n", __FILE__, __LINE__, #cond); \
      std::abort();                                                                   \
    }                                                                                 \
  } while (0)

namespace orzavs_fuzz {

// ORZAVS_FUZZ_VERBOSE=1 makes the targets print what each input stands for (for replaying a
// crash file by hand).
inline bool verbose() {
  static const bool on = std::getenv("ORZAVS_FUZZ_VERBOSE") != nullptr;
  return on;
}

// FNV-1a of a byte vector, to tell outputs apart in verbose runs.
inline uint32_t checksum(const std::vector<uint8_t>& bytes) {
  uint32_t h = 2166136261u;
  for (uint8_t b : bytes) h = (h ^ b) * 16777619u;
  return h;
}

// `size` bytes followed by an unreadable page, with everything around them poisoned for
// AddressSanitizer. Two placements, since AddressSanitizer marks memory in 8-byte granules and
// can poison the end of a granule but not its start:
//  - EndAtPage: the last byte is the last of its page, so any read past the end faults at once,
//    even from code that is not instrumented (the system's JPEG library); a read just before the
//    start is caught only when the start falls on a granule boundary.
//  - Aligned: the start is 8-byte aligned, so instrumented code is caught reading even one byte
//    before the start or after the end; uninstrumented code only once it reaches the page.
// The bytes start out zero.
class GuardedBlock {
 public:
  enum Placement { EndAtPage, Aligned };

  explicit GuardedBlock(size_t size, Placement placement = EndAtPage) : size_(size) {
    const size_t page = static_cast<size_t>(sysconf(_SC_PAGESIZE));
    const size_t body = (size + 8 + page - 1) / page * page;
    mapLen_ = body + page;
    void* base = mmap(nullptr, mapLen_, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    if (base == MAP_FAILED) {
      std::perror("mmap");
      std::abort();
    }
    map_ = static_cast<uint8_t*>(base);
    mprotect(map_ + body, page, PROT_NONE);
    size_t offset = body - size;
    if (placement == Aligned) offset &= ~static_cast<size_t>(7);
    data_ = map_ + offset;
    ORZAVS_FUZZ_POISON(map_, offset);
    ORZAVS_FUZZ_POISON(data_ + size, body - offset - size);
    body_ = body;
  }
  ~GuardedBlock() {
    ORZAVS_FUZZ_UNPOISON(map_, body_);
    munmap(map_, mapLen_);
  }
  GuardedBlock(const GuardedBlock&) = delete;
  GuardedBlock& operator=(const GuardedBlock&) = delete;

  uint8_t* data() const { return data_; }
  size_t size() const { return size_; }

  // Copies as many of `bytes` as fit, then repeats them (or leaves zeros when there are none).
  void fill(const uint8_t* bytes, size_t count) {
    if (count == 0 || size_ == 0) return;
    for (size_t done = 0; done < size_;) {
      const size_t n = (size_ - done < count) ? size_ - done : count;
      std::memcpy(data_ + done, bytes, n);
      done += n;
    }
  }

 private:
  uint8_t* map_ = nullptr;
  size_t mapLen_ = 0;
  size_t body_ = 0;
  uint8_t* data_ = nullptr;
  size_t size_ = 0;
};

}  // namespace orzavs_fuzz

#endif
