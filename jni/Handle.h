#ifndef ORZAVS_JNI_HANDLE_H
#define ORZAVS_JNI_HANDLE_H

#include <jni.h>

#include <cstdint>

// Native objects cross JNI as a jlong holding their address. On a 32-bit target the address is
// zero-extended (never sign-extended), so a pointer above 2 GiB still round-trips and no handle
// is negative there. These two templates are the only place where the conversion is written.

namespace orzavs {
namespace jni {

template <typename T>
inline jlong toHandle(T* pointer) noexcept {
  return static_cast<jlong>(static_cast<uint64_t>(reinterpret_cast<uintptr_t>(pointer)));
}

// The object a handle names, or null. A handle with bits above the address width cannot name
// anything on this target (it did not come from toHandle); it is treated as null instead of
// being truncated into some unrelated address.
template <typename T>
inline T* fromHandle(jlong handle) noexcept {
  const uint64_t bits = static_cast<uint64_t>(handle);
  if constexpr (sizeof(uintptr_t) < sizeof(uint64_t)) {
    if (bits > static_cast<uint64_t>(UINTPTR_MAX)) return nullptr;
  }
  return reinterpret_cast<T*>(static_cast<uintptr_t>(bits));
}

}  // namespace jni
}  // namespace orzavs

#endif
