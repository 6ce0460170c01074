#ifndef ORZAVS_TESTS_SUPPORT_GUARDEDBYTES_H
#define ORZAVS_TESTS_SUPPORT_GUARDEDBYTES_H

#include <sys/mman.h>
#include <unistd.h>

#include <cstdint>
#include <cstring>
#include <stdexcept>
#include <vector>

namespace orzavs_test {

// A copy of `bytes` in its own pages, with an unreadable page right after its last byte and
// another before its first: a read outside the copy faults at once, whoever reads (our code
// or an uninstrumented library), sanitizer or not.
class GuardedBytes {
 public:
  explicit GuardedBytes(const std::vector<uint8_t>& bytes) {
    const size_t page = static_cast<size_t>(sysconf(_SC_PAGESIZE));
    const size_t dataPages = (bytes.size() + page - 1) / page + 1;
    length_ = (dataPages + 2) * page;
    void* m = mmap(nullptr, length_, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    if (m == MAP_FAILED) throw std::runtime_error("mmap failed");
    base_ = static_cast<uint8_t*>(m);
    if (mprotect(base_, page, PROT_NONE) != 0 || mprotect(base_ + (dataPages + 1) * page, page, PROT_NONE) != 0) {
      munmap(base_, length_);
      throw std::runtime_error("mprotect failed");
    }
    data_ = base_ + (dataPages + 1) * page - bytes.size();
    if (!bytes.empty()) std::memcpy(data_, bytes.data(), bytes.size());
  }
  ~GuardedBytes() { munmap(base_, length_); }
  GuardedBytes(const GuardedBytes&) = delete;
  GuardedBytes& operator=(const GuardedBytes&) = delete;
  const uint8_t* data() const { return data_; }

 private:
  size_t length_ = 0;
  uint8_t* base_ = nullptr;
  uint8_t* data_ = nullptr;
};

}  // namespace orzavs_test

#endif
