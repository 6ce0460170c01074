// The native twin of JavaBench's Java loop: the same frames through the C++ facade, so that the
// cost the Java binding adds to process() can be measured side by side in one process.

#include <jni.h>

#include <chrono>
#include <cstdio>
#include <ctime>
#include <cstdint>
#include <string>
#include <vector>

#include "OrzaVSMobile.h"

namespace {

class CountingDelegate : public Tovra::EventDelegateBase {
 public:
  void didDetectInterestPoints(const std::vector<OrzaVSMobile::Point2f>& points) override {
    total += points.size();
  }
  uint64_t total = 0;
};

}  // namespace

// Streams `count` frames (cycling through `frames`, direct byte buffers of NV21) through
// requestImageBuffer + fillBufferWithByteBuffer + process, as the Java loop does, and returns
// the calling thread's CPU time in nanoseconds (robust on a busy machine; the per-frame work all
// happens on the calling thread) and the wall time in wallOut[0]. `countPoints` selects a delegate that reads every frame's interest
// points; otherwise the base delegate absorbs them. The interest-point total goes to
// pointsOut[0].
extern "C" JNIEXPORT jlong JNICALL Java_com_orza_vs_mobile_library_bench_JavaBench_nativeLoop(
    JNIEnv* env, jclass, jobjectArray frames, jint width, jint height, jint count,
    jboolean countPoints, jlongArray pointsOut, jlongArray wallOut) {
  const jsize frameCount = env->GetArrayLength(frames);
  std::vector<const uint8_t*> addresses;
  std::vector<jint> lengths;
  for (jsize i = 0; i < frameCount; ++i) {
    jobject buffer = env->GetObjectArrayElement(frames, i);
    addresses.push_back(static_cast<const uint8_t*>(env->GetDirectBufferAddress(buffer)));
    lengths.push_back(static_cast<jint>(env->GetDirectBufferCapacity(buffer)));
    env->DeleteLocalRef(buffer);
  }
  if (frameCount == 0 || addresses[0] == nullptr) return -1;

  CountingDelegate counting;
  Tovra::EventDelegateBase absorbing;
  Tovra::EventDelegateBase* delegate = countPoints ? &counting : &absorbing;
  Tovra::TovraStateEngineFacade facade(delegate);
  facade.startEngine();
  OrzaVSMobile::ImageBuffer image;
  OrzaVSMobile::ExtraFrameData extra;
  std::string key;
  double time = 100.0;

  timespec cpuStart{};
  clock_gettime(CLOCK_THREAD_CPUTIME_ID, &cpuStart);
  const auto start = std::chrono::steady_clock::now();
  for (jint i = 0; i < count; ++i) {
    image.format = OrzaVSMobile::NV21;
    image.width = width;
    image.height = height;
    image.widthStep = width;
    image.numChannels = 1;
    key.clear();
    facade.requestImageBuffer(image, key);
    image.fillBufferWithByteBuffer(addresses[i % frameCount], lengths[i % frameCount]);
    time += 1.0 / 30.0;
    extra.timeStamp = time;
    facade.process(key, image, extra);
  }
  const auto elapsed = std::chrono::steady_clock::now() - start;
  timespec cpuEnd{};
  clock_gettime(CLOCK_THREAD_CPUTIME_ID, &cpuEnd);
  facade.stopEngine();
  std::fflush(stdout);  // the engine's lines, before Java prints

  const jlong total = static_cast<jlong>(counting.total);
  env->SetLongArrayRegion(pointsOut, 0, 1, &total);
  const jlong wall = static_cast<jlong>(std::chrono::duration_cast<std::chrono::nanoseconds>(elapsed).count());
  env->SetLongArrayRegion(wallOut, 0, 1, &wall);
  return static_cast<jlong>(cpuEnd.tv_sec - cpuStart.tv_sec) * 1000000000LL +
         (cpuEnd.tv_nsec - cpuStart.tv_nsec);
}
