// Handles: native addresses crossing JNI as jlong. 32-bit Android keeps much of its heap above
// 2 GiB, where a sign-extending cast would give Java a negative handle naming nothing. Inside a
// HighHeapScope this binary's operator new serves the thread from an arena mapped above 2 GiB
// (32-bit targets skip if the system will not map one; 64-bit hosts use it wherever it lies).

#include <jni.h>
#include <sys/mman.h>

#include <gtest/gtest.h>

#include <cstdint>
#include <cstdlib>
#include <ios>
#include <new>

#include "jni/Handle.h"

#define ORZAVS_TEST_JNI(name) Java_com_orza_vs_mobile_library_impl_jni_OrzaVSMobileJNI_##name

extern "C" {
jlong ORZAVS_TEST_JNI(new_1Point2f_1_1SWIG_11)(JNIEnv*, jclass, jfloat, jfloat);
void ORZAVS_TEST_JNI(delete_1Point2f)(JNIEnv*, jclass, jlong);
jfloat ORZAVS_TEST_JNI(Point2f_1x_1get)(JNIEnv*, jclass, jlong, jobject);
void ORZAVS_TEST_JNI(Point2f_1x_1set)(JNIEnv*, jclass, jlong, jobject, jfloat);
jfloat ORZAVS_TEST_JNI(Point2f_1y_1get)(JNIEnv*, jclass, jlong, jobject);
jlong ORZAVS_TEST_JNI(new_1VectorOfPoint2f_1_1SWIG_10)(JNIEnv*, jclass);
void ORZAVS_TEST_JNI(delete_1VectorOfPoint2f)(JNIEnv*, jclass, jlong);
void ORZAVS_TEST_JNI(VectorOfPoint2f_1add)(JNIEnv*, jclass, jlong, jobject, jlong, jobject);
jint ORZAVS_TEST_JNI(VectorOfPoint2f_1size)(JNIEnv*, jclass, jlong, jobject);
jlong ORZAVS_TEST_JNI(VectorOfPoint2f_1get)(JNIEnv*, jclass, jlong, jobject, jint);
}

namespace {

using orzavs::jni::fromHandle;
using orzavs::jni::toHandle;

constexpr size_t kArenaSize = 1u << 20;
constexpr uint64_t kTopBit32 = 0x80000000u;
constexpr bool k32Bit = sizeof(void*) == 4;

uint8_t* gArena = nullptr;
size_t gArenaUsed = 0;
thread_local bool tUseArena = false;

bool inArena(const void* p) {
  const auto* b = static_cast<const uint8_t*>(p);
  return gArena != nullptr && b >= gArena && b < gArena + kArenaSize;
}

// Maps the arena once, trying a few addresses whose top 32-bit bit is set.
uint8_t* arena() {
  for (uintptr_t hint : {0xB0000000u, 0xA0000000u, 0xC0000000u, 0x90000000u}) {
    if (gArena != nullptr) break;
    void* p = mmap(reinterpret_cast<void*>(hint), kArenaSize, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    if (p == MAP_FAILED) continue;
    if (!k32Bit || (reinterpret_cast<uintptr_t>(p) & kTopBit32) != 0) gArena = static_cast<uint8_t*>(p);
    else munmap(p, kArenaSize);
  }
  return gArena;
}

// While alive, this thread's allocations come from the arena (which never frees).
struct HighHeapScope {
  HighHeapScope() { tUseArena = true; }
  ~HighHeapScope() { tUseArena = false; }
};

uint64_t bits(jlong handle) { return static_cast<uint64_t>(handle); }

// A handle names an arena object: on 32 bits the zero-extended address, top bit set (fatal:
// exported functions must not be handed a handle that names nothing).
void assertHighHandle(jlong handle) {
  if (k32Bit) {
    ASSERT_GT(handle, 0) << std::hex << bits(handle);
    ASSERT_NE(bits(handle) & kTopBit32, 0u) << std::hex << bits(handle);
  }
  ASSERT_TRUE(inArena(fromHandle<void>(handle))) << std::hex << bits(handle);
}

TEST(Handle, ConvertsAddressesWithoutSignExtensionAndRejectsWiderHandles) {
  int record = 0;
  EXPECT_EQ(fromHandle<int>(toHandle(&record)), &record);
  EXPECT_EQ(fromHandle<const int>(toHandle(static_cast<const int*>(&record))), &record);
  EXPECT_EQ(toHandle(static_cast<int*>(nullptr)), 0);
  EXPECT_EQ(fromHandle<int>(0), nullptr);
  auto* high = reinterpret_cast<int*>(static_cast<uintptr_t>(0xF0001234u));
  EXPECT_EQ(toHandle(high), static_cast<jlong>(0xF0001234LL));  // positive, not sign-extended
  EXPECT_EQ(fromHandle<int>(toHandle(high)), high);
  const jlong wide = static_cast<jlong>(0x1F0001234LL);
  // On 32 bits a handle wider than an address, or a sign-extended address, names nothing.
  EXPECT_EQ(reinterpret_cast<uintptr_t>(fromHandle<int>(wide)), k32Bit ? 0u : static_cast<uintptr_t>(wide));
  if (k32Bit) {
    EXPECT_EQ(fromHandle<int>(-4), nullptr);
  }
}

TEST(Handle, ObjectsAboveTwoGigabytesRoundTripThroughExportedFunctions) {
  if (arena() == nullptr) GTEST_SKIP() << "the system mapped no memory above 2 GiB for this 32-bit process";
  HighHeapScope high;
  const jlong point = ORZAVS_TEST_JNI(new_1Point2f_1_1SWIG_11)(nullptr, nullptr, 1.5f, -2.25f);
  ASSERT_NO_FATAL_FAILURE(assertHighHandle(point));
  EXPECT_EQ(ORZAVS_TEST_JNI(Point2f_1x_1get)(nullptr, nullptr, point, nullptr), 1.5f);
  EXPECT_EQ(ORZAVS_TEST_JNI(Point2f_1y_1get)(nullptr, nullptr, point, nullptr), -2.25f);
  ORZAVS_TEST_JNI(Point2f_1x_1set)(nullptr, nullptr, point, nullptr, 7.0f);
  EXPECT_EQ(ORZAVS_TEST_JNI(Point2f_1x_1get)(nullptr, nullptr, point, nullptr), 7.0f);
  if (k32Bit) {
    // The address sign-extended, as a plain cast gives it, names nothing: the setter ignores it.
    const jlong signExtended = static_cast<jlong>(static_cast<int32_t>(static_cast<uint32_t>(bits(point))));
    ASSERT_LT(signExtended, 0);
    ORZAVS_TEST_JNI(Point2f_1x_1set)(nullptr, nullptr, signExtended, nullptr, 99.0f);
    EXPECT_EQ(ORZAVS_TEST_JNI(Point2f_1x_1get)(nullptr, nullptr, point, nullptr), 7.0f);
  }
  ORZAVS_TEST_JNI(delete_1Point2f)(nullptr, nullptr, point);

  const jlong vector = ORZAVS_TEST_JNI(new_1VectorOfPoint2f_1_1SWIG_10)(nullptr, nullptr);
  ASSERT_NO_FATAL_FAILURE(assertHighHandle(vector));
  for (int i = 0; i < 3; ++i) {
    const jlong p = ORZAVS_TEST_JNI(new_1Point2f_1_1SWIG_11)(nullptr, nullptr, static_cast<float>(i), 0.5f * i);
    ORZAVS_TEST_JNI(VectorOfPoint2f_1add)(nullptr, nullptr, vector, nullptr, p, nullptr);
    ORZAVS_TEST_JNI(delete_1Point2f)(nullptr, nullptr, p);
  }
  ASSERT_EQ(ORZAVS_TEST_JNI(VectorOfPoint2f_1size)(nullptr, nullptr, vector, nullptr), 3);
  for (int i = 0; i < 3; ++i) {
    // A handle into the vector's own storage, which the arena also holds: a borrowed element.
    const jlong element = ORZAVS_TEST_JNI(VectorOfPoint2f_1get)(nullptr, nullptr, vector, nullptr, i);
    ASSERT_NO_FATAL_FAILURE(assertHighHandle(element));
    EXPECT_EQ(ORZAVS_TEST_JNI(Point2f_1x_1get)(nullptr, nullptr, element, nullptr), static_cast<float>(i));
    EXPECT_EQ(ORZAVS_TEST_JNI(Point2f_1y_1get)(nullptr, nullptr, element, nullptr), 0.5f * i);
  }
  ORZAVS_TEST_JNI(delete_1VectorOfPoint2f)(nullptr, nullptr, vector);
}

}  // namespace

// Allocation for the whole test binary: the arena for a thread inside a HighHeapScope, malloc
// otherwise. Arena blocks are never reused.
void* operator new(std::size_t size) {
  if (tUseArena && gArena != nullptr) {
    const size_t rounded = (size + 15u) & ~static_cast<size_t>(15u);
    if (rounded > kArenaSize - gArenaUsed) throw std::bad_alloc();
    gArenaUsed += rounded;
    return gArena + gArenaUsed - rounded;
  }
  if (void* p = std::malloc(size == 0 ? 1 : size)) return p;
  throw std::bad_alloc();
}

void operator delete(void* p) noexcept {
  if (!inArena(p)) std::free(p);
}

void operator delete(void* p, std::size_t) noexcept { operator delete(p); }
