// The engine's per-frame path: process() through the facade on NV21 camera frames, with a
// transport that answers every request at once (on the sending thread). Reports the time
// process() takes on the calling thread against the interest-point step alone, the heap
// allocations per frame in steady state, and the time from process() to the request reaching
// the transport.
//
// Allocations are counted by replacing the global operator new of this program; counting is
// off except while this section measures, and costs one relaxed load per allocation otherwise.

#include <algorithm>
#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstdio>
#include <cstdlib>
#include <mutex>
#include <new>
#include <string>
#include <thread>
#include <vector>

#include "bench/BenchHarness.h"
#include "engine/TovraStateEngineFacade.h"
#include "features/InterestPoints.h"
#include "server/ServerDelegate.h"
#include "types/EventDelegateBase.h"
#include "types/ImageBuffer.h"

namespace {

std::atomic<bool> g_countAllocations{false};
std::atomic<uint64_t> g_allocationsAllThreads{0};
thread_local uint64_t t_allocationsThisThread = 0;

void* countedAllocate(std::size_t size) {
  if (g_countAllocations.load(std::memory_order_relaxed)) {
    ++t_allocationsThisThread;
    g_allocationsAllThreads.fetch_add(1, std::memory_order_relaxed);
  }
  void* p = std::malloc(size == 0 ? 1 : size);
  if (p == nullptr) throw std::bad_alloc();
  return p;
}

}  // namespace

void* operator new(std::size_t size) { return countedAllocate(size); }
void* operator new[](std::size_t size) { return countedAllocate(size); }
void operator delete(void* p) noexcept { std::free(p); }
void operator delete[](void* p) noexcept { std::free(p); }
void operator delete(void* p, std::size_t) noexcept { std::free(p); }
void operator delete[](void* p, std::size_t) noexcept { std::free(p); }

namespace {

using namespace orzavs_bench;
using Clock = std::chrono::steady_clock;

// Answers at once, on the thread that sends (the engine's worker), and notes when each request
// arrived.
class InstantTransport : public Tovra::Server::ServerDelegate {
 public:
  bool sendServerRequestImpl(const Tovra::Server::ServerRequest& request) override {
    const Clock::time_point now = Clock::now();
    Tovra::Server::ServerResponse reply;
    reply.id = request.id;
    reply.responseStr =
        "{\"queryId\":\"q\",\"quillmark\":{\"searchResult\":[{\"content\":\"x\",\"contentType\":"
        "\"PIDN\",\"properties\":{}}],\"resultMetadata\":{\"finalAccumulation\":true}}}";
    {
      std::lock_guard<std::mutex> lock(mutex);
      lastArrival = now;
      ++requests;
      jpegBytes += static_cast<uint64_t>(request.data.length);
    }
    pushServerResponse(reply);
    {
      std::lock_guard<std::mutex> lock(mutex);
      ++answered;
    }
    changed.notify_all();
    return true;
  }

  std::mutex mutex;
  std::condition_variable changed;
  Clock::time_point lastArrival;
  uint64_t requests = 0;
  uint64_t answered = 0;
  uint64_t jpegBytes = 0;
};

class QuietEvents : public Tovra::EventDelegateBase {
 public:
  void didDetectInterestPoints(const std::vector<OrzaVSMobile::Point2f>& points) override {
    lastCount = points.size();
  }
  void didDecode(const std::vector<Tovra::ObjectInfo>&, const Tovra::ResultMetadata&) override {
    decodes.fetch_add(1);
  }
  size_t lastCount = 0;
  std::atomic<uint64_t> decodes{0};
};

void runPipelineBench(const std::vector<const BenchFrame*>& frames) {
  printHeading("pipeline: process() through the facade, NV21, instant transport, 30 fps time stamps");
  for (const BenchFrame* f : frames) {
    if (f->width != 1280 || f->height != 720) continue;
    QuietEvents events;
    InstantTransport transport;
    Tovra::TovraStateEngineFacade facade(&events);
    facade.addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
    facade.startEngine();

    OrzaVSMobile::ImageBuffer image(0, OrzaVSMobile::NV21, f->width, f->height, f->width, 1,
                                    const_cast<uint8_t*>(f->nv21.data()));
    OrzaVSMobile::ExtraFrameData extra;
    double t = 0.0;
    auto processFrame = [&] {
      extra.timeStamp = (t += 1.0 / 30.0);
      facade.process(image, extra);
    };
    std::vector<OrzaVSMobile::Point2f> points;
    auto interestPointsOnly = [&] {
      OrzaVSMobile::detectInterestPoints(image, points);
      keep(points.data());
    };

    const TimingPair pair = measurePair(processFrame, interestPointsOnly);
    printTiming(f->name, "process() on the calling thread", pair.a);
    printTiming(f->name, "interest points alone", pair.b);
    printRatio(f->name, "process() / interest points", pair.a, pair.b);
    // The same with no frame taken (the time stamp stands still): the per-frame overhead alone,
    // without the copy of every fourth frame and the encoding on the other core.
    const double frozen = t;
    auto processUntaken = [&] {
      extra.timeStamp = frozen;
      facade.process(image, extra);
    };
    const TimingPair untaken = measurePair(processUntaken, interestPointsOnly);
    printTiming(f->name, "process(), no frame taken", untaken.a);
    printRatio(f->name, "process() untaken / interest points", untaken.a, untaken.b);

    // Steady state: allocations on the calling thread and on every thread over many frames.
    // At 30 fps about every fourth frame is taken, so the worker encodes and sends meanwhile.
    for (int i = 0; i < 30; ++i) processFrame();
    std::this_thread::sleep_for(std::chrono::milliseconds(100));
    const int counted = 300;
    uint64_t requestsBefore = 0;
    {
      std::lock_guard<std::mutex> lock(transport.mutex);
      requestsBefore = transport.requests;
    }
    t_allocationsThisThread = 0;
    g_allocationsAllThreads = 0;
    g_countAllocations = true;
    for (int i = 0; i < counted; ++i) processFrame();
    const uint64_t callingThread = t_allocationsThisThread;
    std::this_thread::sleep_for(std::chrono::milliseconds(100));  // let the last request finish
    g_countAllocations = false;
    const uint64_t allThreads = g_allocationsAllThreads.load();
    uint64_t requestsDuring = 0;
    {
      std::lock_guard<std::mutex> lock(transport.mutex);
      requestsDuring = transport.requests - requestsBefore;
    }
    std::printf("  %-18s %-34s %.2f per frame on the calling thread (%llu in %d frames)\n",
                f->name.c_str(), "heap allocations", static_cast<double>(callingThread) / counted,
                static_cast<unsigned long long>(callingThread), counted);
    std::printf("  %-18s %-34s %.1f per request on all threads (%llu for %llu requests)\n",
                f->name.c_str(), "heap allocations",
                requestsDuring ? static_cast<double>(allThreads - callingThread) / requestsDuring : 0.0,
                static_cast<unsigned long long>(allThreads - callingThread),
                static_cast<unsigned long long>(requestsDuring));

    // Latency from process() to the transport, for frames that are taken (one second apart,
    // so every one is taken) with the job idle.
    std::vector<double> latencies;
    for (int i = 0; i < 41; ++i) {
      uint64_t answeredBefore = 0;
      {
        std::lock_guard<std::mutex> lock(transport.mutex);
        answeredBefore = transport.answered;
      }
      std::this_thread::sleep_for(std::chrono::milliseconds(5));  // the worker settles the job
      extra.timeStamp = (t += 1.0);
      const Clock::time_point start = Clock::now();
      facade.process(image, extra);
      std::unique_lock<std::mutex> lock(transport.mutex);
      transport.changed.wait(lock, [&] { return transport.answered > answeredBefore; });
      latencies.push_back(std::chrono::duration<double, std::milli>(transport.lastArrival - start).count());
    }
    std::sort(latencies.begin(), latencies.end());
    uint64_t jpegBytes = 0, requests = 0;
    {
      std::lock_guard<std::mutex> lock(transport.mutex);
      jpegBytes = transport.jpegBytes;
      requests = transport.requests;
    }
    std::printf("  %-18s %-34s %10.3f %10.3f %6zu\n", f->name.c_str(), "process() -> transport (ms)",
                latencies[latencies.size() / 2], latencies.front(), latencies.size());
    std::printf("  %-18s %-34s %llu requests, %.0f JPEG bytes each, %zu points last frame\n",
                f->name.c_str(), "totals", static_cast<unsigned long long>(requests),
                requests ? static_cast<double>(jpegBytes) / requests : 0.0, events.lastCount);
    facade.stopEngine();
  }
}

}  // namespace

ORZAVS_BENCH_SECTION("pipeline", runPipelineBench);
