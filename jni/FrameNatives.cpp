// The native half of the session package's frame input: camera planes described by their row
// and pixel strides, either lent to an image buffer as they are (when they already form NV21 or
// NV12 in one block) or copied in one pass into the memory the engine lent to the buffer, plus
// a bulk read of a point vector. Every argument comes from application code and is checked; a
// bad one raises a Java exception with a one-line message and writes nothing.

#include "jni/FrameNatives.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "jni/Handle.h"
#include "types/ImageBuffer.h"
#include "types/Point.h"

namespace orzavs {
namespace jni {
namespace {

using OrzaVSMobile::ImageBuffer;
using OrzaVSMobile::ImageFormat;

constexpr const char* kFrameNativesClass = "com/orza/vs/mobile/library/session/FrameNatives";

// A check failed: the Java exception is already thrown, the function returns at once.
struct Thrown {};

[[noreturn]] void fail(JNIEnv* env, const char* javaClass, const std::string& message) {
  jclass cls = env->FindClass(javaClass);
  if (cls != nullptr) {
    env->ThrowNew(cls, message.c_str());
    env->DeleteLocalRef(cls);
  }
  throw Thrown{};
}

[[noreturn]] void badArgument(JNIEnv* env, const std::string& message) {
  fail(env, "java/lang/IllegalArgumentException", message);
}

ImageBuffer& imageOf(JNIEnv* env, jlong handle) {
  ImageBuffer* image = fromHandle<ImageBuffer>(handle);
  if (image == nullptr) fail(env, "java/lang/NullPointerException", "image buffer is null or deleted");
  return *image;
}

// One plane: its memory (a direct buffer, whole capacity) and its strides.
struct Plane {
  const uint8_t* data = nullptr;
  int64_t capacity = 0;
  int64_t rowStride = 0;
  int64_t pixelStride = 0;
};

Plane planeOf(JNIEnv* env, const char* name, jobject buffer, jint rowStride, jint pixelStride) {
  if (buffer == nullptr) fail(env, "java/lang/NullPointerException", std::string(name) + " plane is null");
  Plane plane;
  plane.data = static_cast<const uint8_t*>(env->GetDirectBufferAddress(buffer));
  plane.capacity = env->GetDirectBufferCapacity(buffer);
  if (plane.data == nullptr || plane.capacity < 0) {
    badArgument(env, std::string(name) + " plane is not a direct ByteBuffer");
  }
  if (pixelStride < 1 || rowStride < 1) {
    badArgument(env, std::string(name) + " plane: row stride " + std::to_string(rowStride) +
                         " and pixel stride " + std::to_string(pixelStride) + " must be positive");
  }
  plane.rowStride = rowStride;
  plane.pixelStride = pixelStride;
  return plane;
}

// Checks that `plane` holds `width` x `height` samples: each row fits in its stride and the last
// sample lies inside the buffer.
void requireSamples(JNIEnv* env, const char* name, const Plane& plane, int64_t width, int64_t height) {
  const int64_t rowSpan = (width - 1) * plane.pixelStride + 1;
  if (rowSpan > plane.rowStride) {
    badArgument(env, std::string(name) + " plane: row stride " + std::to_string(plane.rowStride) +
                         " is shorter than a row of " + std::to_string(rowSpan) + " bytes");
  }
  const int64_t needed = (height - 1) * plane.rowStride + rowSpan;
  if (plane.capacity < needed) {
    badArgument(env, std::string(name) + " plane holds " + std::to_string(plane.capacity) +
                         " bytes, the frame needs " + std::to_string(needed));
  }
}

void requireGeometry(JNIEnv* env, jint width, jint height) {
  if (width <= 0 || height <= 0 || width % 2 != 0 || height % 2 != 0 || width > 16384 || height > 16384) {
    badArgument(env, "frame size " + std::to_string(width) + "x" + std::to_string(height) +
                         " must be even and between 2 and 16384");
  }
}

// The three planes of a YUV 4:2:0 frame, checked. Android guarantees a luminance pixel stride
// of 1 and equal strides for the two chroma planes.
struct Planes {
  Plane y, u, v;
};

Planes planesOf(JNIEnv* env, jobject y, jint yRowStride, jobject u, jobject v, jint uvRowStride,
                jint uvPixelStride, jint width, jint height) {
  requireGeometry(env, width, height);
  Planes p;
  p.y = planeOf(env, "Y", y, yRowStride, 1);
  p.u = planeOf(env, "U", u, uvRowStride, uvPixelStride);
  p.v = planeOf(env, "V", v, uvRowStride, uvPixelStride);
  requireSamples(env, "Y", p.y, width, height);
  requireSamples(env, "U", p.u, width / 2, height / 2);
  requireSamples(env, "V", p.v, width / 2, height / 2);
  return p;
}

// Addresses as numbers: the planes are separate objects, so where one lies relative to another
// is compared without pointer arithmetic across them.
uintptr_t addressOf(const uint8_t* p, int64_t offset = 0) {
  return reinterpret_cast<uintptr_t>(p) + static_cast<uintptr_t>(offset);
}

// Whether the luminance plane runs up to `chroma` and the two chroma views reach the end of a
// frame of `frameBytes`: then every byte the engine reads lies inside the given buffers.
bool coversFrame(const Planes& p, uintptr_t chroma, int64_t frameBytes) {
  const uintptr_t chromaEnd = std::max(addressOf(p.u.data, p.u.capacity), addressOf(p.v.data, p.v.capacity));
  return addressOf(p.y.data, p.y.capacity) >= chroma && chromaEnd >= addressOf(p.y.data, frameBytes);
}

// Lends the planes to the image when they already are one NV21 or NV12 block (chroma pairs
// interleaved, chroma rows right after the luminance rows, one row stride for both). Returns the
// format used, or -1 when the frame must be copied.
jint wrapPlanes(JNIEnv* env, jclass, jlong imageHandle, jobject y, jint yRowStride, jobject u,
                jobject v, jint uvRowStride, jint uvPixelStride, jint width, jint height) {
  try {
    ImageBuffer& image = imageOf(env, imageHandle);
    const Planes p = planesOf(env, y, yRowStride, u, v, uvRowStride, uvPixelStride, width, height);
    if (uvPixelStride != 2 || uvRowStride != yRowStride) return -1;
    const int64_t lumaBytes = int64_t{yRowStride} * height;
    const int64_t frameBytes = lumaBytes * 3 / 2;
    if (frameBytes > INT32_MAX) return -1;
    const uintptr_t chromaStart = addressOf(p.y.data, lumaBytes);
    const uintptr_t u0 = addressOf(p.u.data);
    const uintptr_t v0 = addressOf(p.v.data);
    ImageFormat format;
    if (v0 == chromaStart && u0 == chromaStart + 1) {
      format = ImageFormat::NV21;
    } else if (u0 == chromaStart && v0 == chromaStart + 1) {
      format = ImageFormat::NV12;
    } else {
      return -1;
    }
    if (!coversFrame(p, chromaStart, frameBytes)) return -1;
    image.format = format;
    image.width = width;
    image.height = height;
    image.widthStep = yRowStride;
    image.data = const_cast<uint8_t*>(p.y.data);  // read by the engine, never written
    image.allocLen = 0;
    return static_cast<jint>(format);
  } catch (const Thrown&) {
    return -1;
  }
}

// Writes the planes as NV21 into the image's memory (lent by the engine, described beforehand
// with the same width and height), in one pass over the source.
void copyPlanes(JNIEnv* env, jclass, jlong imageHandle, jobject y, jint yRowStride, jobject u,
                jobject v, jint uvRowStride, jint uvPixelStride, jint width, jint height) {
  try {
    ImageBuffer& image = imageOf(env, imageHandle);
    const Planes p = planesOf(env, y, yRowStride, u, v, uvRowStride, uvPixelStride, width, height);
    const int64_t step = image.widthStep;
    const int64_t frameBytes = step * height * 3 / 2;
    const int64_t writable = std::min<int64_t>(image.allocLen, image.knownLength());
    if (image.format != ImageFormat::NV21 || image.width != width || image.height != height ||
        step < width || image.data == nullptr || writable < frameBytes) {
      fail(env, "java/lang/IllegalStateException",
           "the image buffer does not hold a writable NV21 frame of " + std::to_string(width) + "x" +
               std::to_string(height));
    }
    uint8_t* out = image.data;
    for (int64_t row = 0; row < height; ++row) {
      std::memcpy(out + row * step, p.y.data + row * p.y.rowStride, static_cast<size_t>(width));
    }
    uint8_t* chroma = out + step * height;
    const int64_t pairs = width / 2;
    const int64_t ps = p.u.pixelStride;
    for (int64_t row = 0; row < height / 2; ++row) {
      uint8_t* dst = chroma + row * step;
      const uint8_t* vRow = p.v.data + row * p.v.rowStride;
      const uint8_t* uRow = p.u.data + row * p.u.rowStride;
      if (ps == 2 && addressOf(uRow) == addressOf(vRow, 1)) {
        std::memcpy(dst, vRow, static_cast<size_t>(width));  // already V,U pairs
        continue;
      }
      for (int64_t i = 0; i < pairs; ++i) {
        dst[2 * i] = vRow[i * ps];
        dst[2 * i + 1] = uRow[i * ps];
      }
    }
  } catch (const Thrown&) {
  }
}

// The points of a std::vector<Point2f> as x0, y0, x1, y1, ... in a new float array.
jfloatArray pointsOf(JNIEnv* env, jclass, jlong vectorHandle) {
  try {
    const auto* points = fromHandle<std::vector<OrzaVSMobile::Point2f>>(vectorHandle);
    if (points == nullptr) fail(env, "java/lang/NullPointerException", "point vector is null or deleted");
    const jsize count = static_cast<jsize>(points->size() * 2);
    jfloatArray out = env->NewFloatArray(count);
    if (out == nullptr) return nullptr;  // OutOfMemoryError pending
    if (count > 0) {
      std::vector<jfloat> xy(static_cast<size_t>(count));
      for (size_t i = 0; i < points->size(); ++i) {
        xy[2 * i] = (*points)[i].x;
        xy[2 * i + 1] = (*points)[i].y;
      }
      env->SetFloatArrayRegion(out, 0, count, xy.data());
    }
    return out;
  } catch (const Thrown&) {
    return nullptr;
  }
}

}  // namespace

void registerFrameNatives(JNIEnv* env) noexcept {
  if (env->ExceptionCheck()) return;  // module start-up already failed; leave its error
  jclass cls = env->FindClass(kFrameNativesClass);
  if (cls == nullptr) {
    env->ExceptionClear();  // the session package is not part of this application
    return;
  }
  static const JNINativeMethod methods[] = {
      {const_cast<char*>("wrapPlanes"),
       const_cast<char*>("(JLjava/nio/ByteBuffer;ILjava/nio/ByteBuffer;Ljava/nio/ByteBuffer;IIII)I"),
       reinterpret_cast<void*>(&wrapPlanes)},
      {const_cast<char*>("copyPlanes"),
       const_cast<char*>("(JLjava/nio/ByteBuffer;ILjava/nio/ByteBuffer;Ljava/nio/ByteBuffer;IIII)V"),
       reinterpret_cast<void*>(&copyPlanes)},
      {const_cast<char*>("points"), const_cast<char*>("(J)[F"), reinterpret_cast<void*>(&pointsOf)},
  };
  // A failure leaves NoSuchMethodError pending; the class's first native call reports it.
  if (env->RegisterNatives(cls, methods, sizeof(methods) / sizeof(methods[0])) != 0) env->ExceptionClear();
  env->DeleteLocalRef(cls);
}

}  // namespace jni
}  // namespace orzavs
