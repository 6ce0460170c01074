#include "types/ImageBuffer.h"

#include <algorithm>
#include <cstring>
#include <new>

namespace OrzaVSMobile {

ImageBuffer::ImageBuffer()
    : format(NV21), definition(0), width(0), height(0), widthStep(0), numChannels(0),
      data(nullptr), allocLen(0) {}

ImageBuffer::ImageBuffer(int32_t def, ImageFormat fmt, int32_t w, int32_t h, int32_t step,
                         int32_t channels, uint8_t* pixels)
    : format(fmt), definition(def), width(w), height(h), widthStep(step), numChannels(channels),
      data(pixels), allocLen(0) {}

ImageBuffer::ImageBuffer(const ImageBuffer& other)
    : format(other.format), definition(other.definition), width(other.width),
      height(other.height), widthStep(other.widthStep), numChannels(other.numChannels),
      data(other.data), allocLen(other.allocLen), lent_(other.lent_), lentLen_(other.lentLen_),
      released_(other.released_) {
  // A copy of a buffer that points at its own block owns a duplicate of the bytes: two owners
  // of one block would free it twice, and a copy that merely pointed at the other's block
  // would be left dangling when the other is released or destroyed.
  if (other.owned_ != nullptr && other.data == other.owned_) {
    owned_ = new uint8_t[static_cast<size_t>(other.ownedLen_)];
    ownedLen_ = other.ownedLen_;
    if (ownedLen_ > 0) std::memcpy(owned_, other.owned_, static_cast<size_t>(ownedLen_));
    data = owned_;
  }
}

ImageBuffer& ImageBuffer::operator=(const ImageBuffer& other) {
  if (this != &other) {
    ImageBuffer copy(other);
    std::swap(format, copy.format);
    std::swap(definition, copy.definition);
    std::swap(width, copy.width);
    std::swap(height, copy.height);
    std::swap(widthStep, copy.widthStep);
    std::swap(numChannels, copy.numChannels);
    std::swap(data, copy.data);
    std::swap(allocLen, copy.allocLen);
    std::swap(owned_, copy.owned_);
    std::swap(ownedLen_, copy.ownedLen_);
    std::swap(lent_, copy.lent_);
    std::swap(lentLen_, copy.lentLen_);
    std::swap(released_, copy.released_);
  }
  return *this;
}

ImageBuffer::~ImageBuffer() { delete[] owned_; }

void ImageBuffer::freeOwned() {
  if (owned_ == nullptr) return;
  delete[] owned_;
  released_ = owned_;
  owned_ = nullptr;
  ownedLen_ = 0;
}

int32_t ImageBuffer::allocateBuffer(int32_t length) {
  releaseBuffer();
  // A zero-length block, or one whose allocLen the caller zeroed, is still ours to free.
  freeOwned();
  // A negative length is a request for more than can ever be had: it fails like one.
  if (length < 0) return 0;
  uint8_t* block = new (std::nothrow) uint8_t[static_cast<size_t>(length)];
  if (block == nullptr) return 0;
  owned_ = block;
  ownedLen_ = length;
  data = block;
  allocLen = length;
  return length;
}

void ImageBuffer::releaseBuffer() {
  if (allocLen == 0) return;
  // Only the block this buffer allocated is freed. Memory lent by the engine also has a
  // non-zero allocLen, and a client (or Java) may have pointed `data` elsewhere; freeing
  // `data` blindly would free memory this buffer never owned.
  freeOwned();
  allocLen = 0;
}

void ImageBuffer::lend(uint8_t* block, int32_t length) {
  lent_ = block;
  lentLen_ = (block != nullptr && length > 0) ? length : 0;
  data = block;
  allocLen = lentLen_;
}

int64_t ImageBuffer::knownLength() const {
  if (data == nullptr) return 0;
  if (owned_ != nullptr && data == owned_) return ownedLen_;
  if (lent_ != nullptr && data == lent_) return lentLen_;
  if (released_ != nullptr && data == released_) return 0;
  return -1;
}

int32_t ImageBuffer::capacity() const {
  if (allocLen <= 0) return 0;
  // Never trust allocLen beyond the real size of a block this buffer knows: the Java side can
  // set allocLen (and data) to anything.
  const int64_t known = knownLength();
  if (known >= 0) return static_cast<int32_t>(std::min<int64_t>(allocLen, known));
  return allocLen;
}

int32_t ImageBuffer::fillBuffer(const uint8_t* source, int32_t length) {
  if (data == nullptr) return 0;
  // Hardening: a null source or a negative length would copy from an invalid or huge range;
  // both copy nothing and report 0.
  if (source == nullptr || length < 0) return 0;
  const int32_t count = std::min(length, capacity());
  if (count <= 0) return 0;
  std::memcpy(data, source, static_cast<size_t>(count));
  return count;
}

int32_t ImageBuffer::fillBufferWithByteBuffer(const uint8_t* source, int32_t length) {
  return fillBuffer(source, length);
}

int32_t ImageBuffer::fillBufferWithByteBuffer(const uint8_t* first, int32_t firstLength,
                                              const uint8_t* second, int32_t secondLength) {
  if (data == nullptr) return 0;
  const int32_t cap = capacity();
  // Hardening as in fillBuffer: a null plane or a negative length contributes nothing.
  int32_t firstCount = (first == nullptr || firstLength < 0) ? 0 : std::min(firstLength, cap);
  if (firstCount < 0) firstCount = 0;
  if (firstCount > 0) std::memcpy(data, first, static_cast<size_t>(firstCount));
  int32_t secondCount =
      (second == nullptr || secondLength < 0) ? 0 : std::min(secondLength, cap - firstCount);
  if (secondCount < 0) secondCount = 0;
  if (secondCount > 0) std::memcpy(data + firstCount, second, static_cast<size_t>(secondCount));
  return firstCount + secondCount;
}

}  // namespace OrzaVSMobile
