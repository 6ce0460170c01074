#ifndef ORZAVS_TYPES_BYTEARRAY_H
#define ORZAVS_TYPES_BYTEARRAY_H

#include <cstdint>

namespace OrzaVSMobile {

// A view of bytes that somebody else keeps alive. Copying copies the pointer; nothing here
// ever frees memory.
struct ByteArray {
  uint8_t* data = nullptr;
  int32_t length = 0;

  ByteArray() = default;
  ByteArray(const ByteArray& other) = default;
  ByteArray(uint8_t* bytes, int32_t len) : data(bytes), length(len) {}
  ByteArray& operator=(const ByteArray& other) = default;

  void clear() {
    data = nullptr;
    length = 0;
  }
  int32_t getLength() const { return length; }
  uint8_t* getData() const { return data; }
};

}  // namespace OrzaVSMobile

#endif
