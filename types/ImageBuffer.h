#ifndef ORZAVS_TYPES_IMAGEBUFFER_H
#define ORZAVS_TYPES_IMAGEBUFFER_H

#include <cstdint>

#include "types/ImageFormat.h"

namespace OrzaVSMobile {

// The pixels of one frame plus their geometry.
//
// Ownership: `allocLen` is the capacity every fill uses and marks the memory as owned. Memory
// obtained through allocateBuffer() is owned by this buffer and freed by releaseBuffer() or the
// destructor. Memory that the engine lends (requestImageBuffer) also carries a non-zero
// `allocLen` so that the client can fill it, but it is never freed by this buffer: the buffer
// remembers privately which block it allocated itself and frees only that one.
//
// Bounds: every field is public (the Java side can set `data` and `allocLen` to anything), so
// the buffer also remembers the true size of the blocks it knows: its own block, the block lent
// to it through lend(), and the address of the block it freed last. A fill into one of those
// never writes past the block, whatever `allocLen` says; a fill through the stale address of a
// freed block copies nothing. Memory the buffer knows nothing about (a caller's own pixels) is
// trusted up to `allocLen`, which is 0 unless the caller set it.
//
// Copies are deep for owned memory (the copy owns a duplicate) and shallow otherwise.
struct ImageBuffer {
  ImageFormat format;
  int32_t definition;
  int32_t width;
  int32_t height;
  int32_t widthStep;
  int32_t numChannels;
  uint8_t* data;
  int32_t allocLen;

  // NV21, everything else zero, no data.
  ImageBuffer();
  // Borrows `data` (allocLen 0). Note: `definition` comes first although `format` is stored first.
  ImageBuffer(int32_t definition, ImageFormat format, int32_t width, int32_t height,
              int32_t widthStep, int32_t numChannels, uint8_t* data);
  ImageBuffer(const ImageBuffer& other);
  ImageBuffer& operator=(const ImageBuffer& other);
  ~ImageBuffer();

  // Frees owned memory, then allocates `length` bytes and owns them. Returns `length`, or 0 when
  // the allocation fails (negative lengths always fail); the buffer is then empty.
  int32_t allocateBuffer(int32_t length);
  // Gives up owned memory: allocLen becomes 0, `data` keeps its (now stale) value.
  void releaseBuffer();
  // Copies min(length, allocLen) bytes from `source` into `data`; returns the count copied.
  // A null `data` or source, a negative length, or a stale `data` copies nothing and returns 0.
  int32_t fillBuffer(const uint8_t* source, int32_t length);
  // Same as fillBuffer; the binding passes a direct byte buffer's memory.
  int32_t fillBufferWithByteBuffer(const uint8_t* source, int32_t length);
  // Two planes (luminance, then chroma) placed back to back; returns the total count copied.
  // A null plane or a negative length contributes 0 bytes (the second plane then starts after
  // whatever the first one really copied).
  int32_t fillBufferWithByteBuffer(const uint8_t* first, int32_t firstLength,
                                   const uint8_t* second, int32_t secondLength);

  // Points the buffer at `length` bytes that another owner keeps alive (the engine's frame
  // records): data = block, allocLen = length. The buffer never frees that block, and fills
  // through it never go past `length` bytes even if allocLen is raised later.
  void lend(uint8_t* block, int32_t length);

  // Bytes known to be readable at `data`: the size of the buffer's own or lent block when
  // `data` points at it, 0 when `data` is null or the stale address of a released block, and
  // -1 when `data` is memory this buffer knows nothing about (the caller vouches for it).
  int64_t knownLength() const;

 private:
  // Usable bytes at `data` for a fill: allocLen, bounded by the real size of a known block.
  int32_t capacity() const;
  // Frees the block allocateBuffer() made, remembering its address as stale.
  void freeOwned();

  uint8_t* owned_ = nullptr;  // the block allocateBuffer() made, if any
  int32_t ownedLen_ = 0;
  uint8_t* lent_ = nullptr;  // the block lent through lend(), never freed here
  int32_t lentLen_ = 0;
  const uint8_t* released_ = nullptr;  // address of the block freed last (stale if `data` is it)
};

}  // namespace OrzaVSMobile

#endif
