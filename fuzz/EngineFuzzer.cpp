// The engine fed by a client that does everything in any order: frames of any format, size,
// stride and time stamp (in memory it owns, memory it allocated through the buffer, or memory
// the engine lent it, sometimes described with a geometry that no longer matches), lifecycle
// calls, still images, and server replies (to known and unknown ids, with any code and body,
// pushed later, inline from inside the transport, twice, to the wrong id), a transport that
// fails or throws, and engines destroyed while replies are still out.
//
// The engine is driven directly (the facade only forwards to it) so that the harness can wait
// for the worker to settle the job before a lifecycle call; otherwise every such call would
// sleep through the job's 50 ms poll and the fuzzer would crawl. One op in a few skips that
// wait on purpose.
//
// Checked on every callback: at most 50 interest points, all at least 3 pixels inside the
// frame; decoded results carry the module and no unknown content type; server errors carry
// the status that matches the code; and never more result callbacks than requests sent.

#include <fuzzer/FuzzedDataProvider.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <climits>
#include <cmath>
#include <condition_variable>
#include <cstdint>
#include <cstring>
#include <limits>
#include <memory>
#include <mutex>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include "FuzzSupport.h"
#include "engine/TovraStateEngine.h"
#include "server/ServerDelegate.h"
#include "types/EventDelegateBase.h"
#include "types/FrameData.h"
#include "types/ImageBuffer.h"

using OrzaVSMobile::ExtraFrameData;
using OrzaVSMobile::ImageBuffer;
using OrzaVSMobile::Point2f;
using orzavs_fuzz::GuardedBlock;

namespace {

constexpr uint64_t kMaxFrameBytes = 1u << 19;

class Events : public Tovra::EventDelegateBase {
 public:
  // Geometry of the frame being processed; interest points arrive on the calling thread.
  int frameWidth = 0;
  int frameHeight = 0;
  std::atomic<int> results{0};

  void didDetectInterestPoints(const std::vector<Point2f>& points) override {
    FUZZ_CHECK(points.size() <= 50);
    for (const Point2f& p : points) {
      FUZZ_CHECK(p.x >= 3 && p.x < frameWidth - 3 && p.y >= 3 && p.y < frameHeight - 3);
    }
  }
  void didDecode(const std::vector<Tovra::ObjectInfo>& objects,
                 const Tovra::ResultMetadata& metadata) override {
    ++results;
    FUZZ_CHECK(metadata.mobileDecorator == "TeskarMobileDecorator");
    for (const Tovra::ObjectInfo& o : objects) {
      FUZZ_CHECK(o.contentType != Tovra::UNSPECIFIED_CONTENT_TYPE);
      FUZZ_CHECK(o.srcObjectModule == Tovra::VISUAL_SEARCH_SERVICE_MOD);
    }
  }
  void didReceiveServerError(Tovra::ObjectModuleID module, Tovra::Server::ResponseStatus status,
                             int32_t code) override {
    ++results;
    FUZZ_CHECK(module == Tovra::VISUAL_SEARCH_SERVICE_MOD);
    FUZZ_CHECK(status == (code == 200 ? Tovra::Server::RESPONSE_PARSE_ERROR
                                      : Tovra::Server::RESPONSE_SERVER_ERROR));
  }
};

struct Reply {
  int32_t code = 200;
  std::string body;
  double roundTrip = -1.0;
};

enum class Mode { Record, Inline, InlineWrongId, InlineTwice, Fail, Throw, kCount };

// The client's transport. Requests are recorded (the harness answers them later) or answered
// from inside the send, as the current mode says.
class Transport : public Tovra::Server::ServerDelegate {
 public:
  bool sendServerRequestImpl(const Tovra::Server::ServerRequest& request) override {
    FUZZ_CHECK(request.id.rfind("TovraStateEngine-", 0) == 0);
    FUZZ_CHECK(request.params.count("vsearch_params_json") == 1);
    FUZZ_CHECK(request.metadata.count("version") == 1 && request.metadata.at("version") == "0.6");
    FUZZ_CHECK(request.responseHandler != nullptr);
    // The body is the JPEG; reading its first and last bytes proves the view is alive.
    FUZZ_CHECK(request.data.getData() != nullptr && request.data.getLength() >= 4);
    const uint8_t* jpeg = request.data.getData();
    const size_t n = static_cast<size_t>(request.data.getLength());
    FUZZ_CHECK(jpeg[0] == 0xFF && jpeg[1] == 0xD8 && jpeg[n - 2] == 0xFF && jpeg[n - 1] == 0xD9);
    Mode mode;
    Reply reply;
    {
      std::lock_guard<std::mutex> lock(mutex_);
      ids_.push_back(request.id);
      mode = answerEverything_ ? Mode::Inline : mode_;
      reply = inlineReply_;
    }
    switch (mode) {
      case Mode::Inline: push(request.id, reply); break;
      case Mode::InlineWrongId: push(request.id + "-", reply); break;
      case Mode::InlineTwice:
        push(request.id, reply);
        push(request.id, reply);
        break;
      case Mode::Fail: return false;
      case Mode::Throw: throw std::runtime_error("transport unavailable");
      default: break;
    }
    return true;
  }

  void push(const std::string& id, const Reply& reply) {
    Tovra::Server::ServerResponse response;
    response.id = id;
    response.responseCode = reply.code;
    response.responseStr = reply.body;
    response.roundtripTime = reply.roundTrip;
    pushServerResponse(response);
  }

  void setMode(Mode mode, const Reply& reply) {
    std::lock_guard<std::mutex> lock(mutex_);
    mode_ = mode;
    inlineReply_ = reply;
  }
  // Still images block until their reply is handled: while one is processed, every request is
  // answered inline with its own id.
  void answerEverything(bool on, const Reply& reply) {
    std::lock_guard<std::mutex> lock(mutex_);
    answerEverything_ = on;
    if (on) inlineReply_ = reply;
  }
  std::vector<std::string> ids() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return ids_;
  }

 private:
  mutable std::mutex mutex_;
  std::vector<std::string> ids_;
  Mode mode_ = Mode::Record;
  bool answerEverything_ = false;
  Reply inlineReply_;
};

const char* const kBodies[] = {
    R"({"queryId":"q1","quillmark":{"searchResult":[{"content":"B0001","contentType":"PIDN","properties":{}},{"content":"?","contentType":"Other","properties":{}},{"content":"","contentType":"BoundingBox","properties":{"boundingBox":{"tlx":1,"tly":2,"trx":3,"try":4,"brx":5,"bry":6,"blx":7,"bly":8}}}],"resultMetadata":{"finalAccumulation":true,"accumulatedQueries":["q0"]}}})",
    R"({"queryId":"","quillmark":{"searchResult":[],"resultMetadata":{"finalAccumulation":false}}})",
    R"({"queryId":"q2"})",
    "<html>502 Bad Gateway</html>",
    "",
};

Reply pickReply(FuzzedDataProvider& in) {
  Reply r;
  switch (in.ConsumeIntegralInRange(0, 5)) {
    case 0: r.code = 500; break;
    case 1: r.code = in.ConsumeIntegral<int32_t>(); break;
    default: r.code = 200; break;
  }
  const size_t pick = in.ConsumeIntegralInRange<size_t>(0, sizeof(kBodies) / sizeof(kBodies[0]));
  r.body = pick < sizeof(kBodies) / sizeof(kBodies[0]) ? kBodies[pick] : in.ConsumeRandomLengthString(256);
  r.roundTrip = in.ConsumeBool() ? -1.0 : in.ConsumeFloatingPoint<double>();
  return r;
}

int32_t pickDimension(FuzzedDataProvider& in) {
  switch (in.ConsumeIntegralInRange(0, 9)) {
    case 0: return in.ConsumeIntegralInRange<int32_t>(INT32_MIN, 0);
    case 1: return in.ConsumeIntegralInRange<int32_t>(1, 6);
    case 2: return INT32_MAX;
    case 3: return in.ConsumeIntegralInRange<int32_t>(100, 400);
    default: return in.ConsumeIntegralInRange<int32_t>(7, 64);
  }
}

int32_t pickFormat(FuzzedDataProvider& in) {
  switch (in.ConsumeIntegralInRange(0, 9)) {
    case 0: return in.ConsumeIntegral<int32_t>();
    case 1: return in.ConsumeIntegralInRange(3, 6);
    case 2: return OrzaVSMobile::GRAY;
    default: return in.ConsumeIntegralInRange(0, 2);
  }
}

int32_t pickStride(FuzzedDataProvider& in, int32_t width, int32_t numChannels) {
  const int64_t row = static_cast<int64_t>(width) * (numChannels > 1 ? numChannels : 1);
  int64_t stride;
  switch (in.ConsumeIntegralInRange(0, 7)) {
    case 0: stride = in.ConsumeIntegral<int32_t>(); break;
    case 1: stride = row - in.ConsumeIntegralInRange(1, 8); break;
    case 2: stride = width; break;
    default: stride = row + in.ConsumeIntegralInRange(0, 24); break;
  }
  return static_cast<int32_t>(std::max<int64_t>(INT32_MIN, std::min<int64_t>(INT32_MAX, stride)));
}

// Bytes the engine copies from a frame of this geometry (one plane, or 3/2 of it for YUV);
// -1 when it is too large to hand over here.
int64_t frameBytes(const ImageBuffer& image) {
  if (image.widthStep <= 0 || image.height <= 0) return 0;
  int64_t size = static_cast<int64_t>(image.widthStep) * image.height;
  if (static_cast<uint64_t>(size) > kMaxFrameBytes) return -1;
  if (OrzaVSMobile::isYUVFormat(image.format)) size = size * 3 / 2;
  return size;
}

void fillBytes(FuzzedDataProvider& in, uint8_t* dst, size_t n) {
  if (dst == nullptr || n == 0) return;
  const std::vector<uint8_t> bytes = in.ConsumeBytes<uint8_t>(in.ConsumeIntegralInRange<size_t>(0, 256));
  if (bytes.empty()) {
    std::memset(dst, 0x80, n);
    return;
  }
  for (size_t i = 0; i < n; ++i) dst[i] = bytes[i % bytes.size()];
}

// A frame in the caller's memory: borrowed (exactly the bytes its geometry names, followed by
// an unreadable page), allocated through the buffer (a little more or less than needed), or
// no memory at all.
struct ClientFrame {
  ImageBuffer image;
  std::unique_ptr<GuardedBlock> block;
};

bool makeFrame(FuzzedDataProvider& in, ClientFrame& frame) {
  ImageBuffer& img = frame.image;
  img.format = static_cast<OrzaVSMobile::ImageFormat>(pickFormat(in));
  img.width = pickDimension(in);
  img.height = pickDimension(in);
  img.numChannels = in.ConsumeIntegralInRange<int32_t>(-1, 5);
  img.widthStep = pickStride(in, img.width, img.numChannels);
  img.definition = in.ConsumeIntegral<int32_t>();
  const int64_t bytes = frameBytes(img);
  if (bytes < 0) return false;
  switch (in.ConsumeIntegralInRange(0, 5)) {
    case 0: {
      const int64_t n = std::max<int64_t>(0, bytes + in.ConsumeIntegralInRange(-64, 64));
      if (img.allocateBuffer(static_cast<int32_t>(n)) > 0) fillBytes(in, img.data, static_cast<size_t>(n));
      break;
    }
    case 1:
      img.data = nullptr;
      break;
    default:
      frame.block = std::make_unique<GuardedBlock>(static_cast<size_t>(bytes));
      fillBytes(in, frame.block->data(), frame.block->size());
      img.data = frame.block->data();
      break;
  }
  return true;
}

double nextTimeStamp(FuzzedDataProvider& in, double& clock) {
  switch (in.ConsumeIntegralInRange(0, 11)) {
    case 0: return std::numeric_limits<double>::quiet_NaN();
    case 1: return -1.0;
    case 2: return in.ConsumeFloatingPoint<double>();
    case 3: clock += 0.1; return clock;
    case 4: clock += 0.41; return clock;
    default: clock += in.ConsumeFloatingPointInRange(0.0, 0.3); return clock;
  }
}

void fillExtra(FuzzedDataProvider& in, ExtraFrameData& extra, double& clock) {
  extra.timeStamp = nextTimeStamp(in, clock);
  extra.screenOrient = in.ConsumeBool() ? 90 * in.ConsumeIntegralInRange(-2, 4) : in.ConsumeIntegral<int32_t>();
  extra.flat = in.ConsumeBool();
}

int32_t nudge(int32_t value, int delta) {
  return static_cast<int32_t>(std::max<int64_t>(INT32_MIN, std::min<int64_t>(INT32_MAX, static_cast<int64_t>(value) + delta)));
}

// A buffer lent by requestImageBuffer, with the key naming it and the number of resets the
// engine went through since (a client may still write into it across one reset, as a camera
// thread does while another thread pauses the engine; the engine keeps such memory alive).
struct Lent {
  ImageBuffer buffer;
  std::string key;
  int resetsAtLending = 0;
};

class Harness {
 public:
  explicit Harness(FuzzedDataProvider& in) : in_(in) { createEngine(); }

  ~Harness() {
    settle();
    engine_.reset();
    // Late replies to every request ever sent: the engines that sent them are gone (or have
    // moved on), so nothing may reach a destroyed job.
    for (const std::string& id : transport_.ids()) transport_.push(id, Reply());
    FUZZ_CHECK(events_.results.load() <= static_cast<int>(transport_.ids().size()));
  }

  void step() {
    switch (in_.ConsumeIntegralInRange(0, 19)) {
      case 0: lifecycle(in_.ConsumeIntegralInRange(0, 3), true); break;
      case 1: lifecycle(in_.ConsumeIntegralInRange(0, 3), in_.ConsumeIntegralInRange(0, 7) != 0); break;
      case 2:
      case 3:
      case 4: processFrame(); break;
      case 5: requestBuffer(); break;
      case 6:
      case 7: processLent(); break;
      case 8: processSingle(); break;
      case 9:
      case 10: pushReply(); break;
      case 11: transport_.setMode(static_cast<Mode>(in_.ConsumeIntegralInRange(0, static_cast<int>(Mode::kCount) - 1)),
                                  pickReply(in_));
        break;
      case 12: waitForRequest(); break;
      case 13: recreate(); break;
      case 14: configure(); break;
      case 15: writeLent(); break;
      default: processFrame(); break;
    }
  }

 private:
  void createEngine() {
    engine_ = std::make_unique<Tovra::TovraStateEngine>();
    engine_->setEventDelegate(&events_);
    engine_->addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport_);
    state_ = Tovra::STOPPED;
    lent_.clear();
  }

  // Waits until the job has left the worker's hands (the engine's own wait polls at 50 ms).
  void settle() {
    if (!engine_) return;
    const Tovra::VisualSearchServiceJob& job = engine_->job(0);
    for (;;) {
      const Tovra::JobState s = job.state();
      if (s != Tovra::Queued && s != Tovra::Running) break;
      std::this_thread::sleep_for(std::chrono::microseconds(50));
    }
    std::this_thread::sleep_for(std::chrono::microseconds(20));
    job.waitUntilSettled();
  }

  void lifecycle(int which, bool settleFirst) {
    if (settleFirst) settle();
    const Tovra::EngineState before = state_;
    switch (which) {
      case 0:
        engine_->startEngine();
        if (before != Tovra::RUNNING) ++resets_;
        state_ = Tovra::RUNNING;
        break;
      case 1:
        engine_->stopEngine();
        if (before != Tovra::STOPPED) ++resets_;
        state_ = Tovra::STOPPED;
        break;
      case 2:
        engine_->pauseEngine();
        if (before == Tovra::RUNNING) {
          ++resets_;
          state_ = Tovra::PAUSED;
        }
        break;
      default:
        engine_->resumeEngine();
        if (before == Tovra::PAUSED) state_ = Tovra::RUNNING;
        break;
    }
    FUZZ_CHECK(engine_->getState() == state_);
    FUZZ_CHECK((engine_->executor() != nullptr) == (state_ != Tovra::STOPPED));
  }

  void processFrame() {
    ClientFrame frame;
    if (!makeFrame(in_, frame)) return;
    ExtraFrameData extra;
    fillExtra(in_, extra, clock_);
    events_.frameWidth = frame.image.width;
    events_.frameHeight = frame.image.height;
    std::string key;
    switch (in_.ConsumeIntegralInRange(0, 3)) {
      case 0: key = in_.ConsumeRandomLengthString(24); break;
      case 1: if (!lent_.empty()) key = lent_[in_.ConsumeIntegralInRange<size_t>(0, lent_.size() - 1)].key; break;
      default: break;
    }
    engine_->process(key, frame.image, extra);
  }

  void requestBuffer() {
    Lent l;
    l.buffer.format = static_cast<OrzaVSMobile::ImageFormat>(pickFormat(in_));
    l.buffer.width = pickDimension(in_);
    l.buffer.height = pickDimension(in_);
    l.buffer.numChannels = in_.ConsumeIntegralInRange<int32_t>(-1, 4);
    l.buffer.widthStep = pickStride(in_, l.buffer.width, l.buffer.numChannels);
    if (frameBytes(l.buffer) < 0) return;
    engine_->requestImageBuffer(l.buffer, l.key);
    if (l.key.empty()) {
      FUZZ_CHECK(l.buffer.allocLen == 0 || state_ == Tovra::RUNNING);
      return;
    }
    FUZZ_CHECK(l.buffer.knownLength() == l.buffer.allocLen);
    // The camera writes the frame into the lent memory, using all of it.
    fillBytes(in_, l.buffer.data, static_cast<size_t>(l.buffer.allocLen));
    l.resetsAtLending = resets_;
    lent_.push_back(std::move(l));
  }

  Lent* pickLent() {
    if (lent_.empty()) return nullptr;
    Lent& l = lent_[in_.ConsumeIntegralInRange<size_t>(0, lent_.size() - 1)];
    // Beyond one reset the engine has let the memory go; a client must not touch it then.
    return resets_ - l.resetsAtLending <= 1 ? &l : nullptr;
  }

  void writeLent() {
    Lent* l = pickLent();
    if (l == nullptr || l->buffer.data == nullptr) return;
    // A fill through the buffer, as the Java side makes it; it never writes past the block.
    const std::vector<uint8_t> bytes = in_.ConsumeBytes<uint8_t>(in_.ConsumeIntegralInRange<size_t>(0, 1024));
    l->buffer.allocLen = in_.ConsumeBool() ? l->buffer.allocLen : in_.ConsumeIntegral<int32_t>();
    l->buffer.fillBuffer(bytes.data(), static_cast<int32_t>(bytes.size()));
  }

  void processLent() {
    Lent* l = pickLent();
    if (l == nullptr) return;
    ImageBuffer& image = l->buffer;
    // The client fills in the rest of the description, not always consistently with what it
    // asked the memory for.
    switch (in_.ConsumeIntegralInRange(0, 5)) {
      case 0: image.height = nudge(image.height, in_.ConsumeIntegralInRange(-3, 3)); break;
      case 1: image.format = static_cast<OrzaVSMobile::ImageFormat>(pickFormat(in_)); break;
      case 2: image.widthStep = nudge(image.widthStep, in_.ConsumeIntegralInRange(-3, 3)); break;
      case 3: image.width = pickDimension(in_); break;
      default: break;
    }
    if (image.width > image.widthStep && in_.ConsumeBool()) image.width = image.widthStep;
    ExtraFrameData extra;
    fillExtra(in_, extra, clock_);
    events_.frameWidth = image.width;
    events_.frameHeight = image.height;
    std::string key = l->key;
    if (in_.ConsumeIntegralInRange(0, 5) == 0) key.clear();
    engine_->process(key, image, extra);
  }

  void processSingle() {
    ClientFrame frame;
    if (!makeFrame(in_, frame)) return;
    ExtraFrameData extra;
    fillExtra(in_, extra, clock_);
    settle();
    transport_.answerEverything(true, pickReply(in_));
    engine_->processSingleImage(frame.image, extra);
    transport_.answerEverything(false, Reply());
  }

  void pushReply() {
    const std::vector<std::string> ids = transport_.ids();
    std::string id;
    switch (in_.ConsumeIntegralInRange(0, 5)) {
      case 0: id = in_.ConsumeRandomLengthString(40); break;
      case 1: if (!ids.empty()) id = ids.front(); break;
      default: if (!ids.empty()) id = ids[ids.size() - 1 - in_.ConsumeIntegralInRange<size_t>(0, std::min<size_t>(ids.size() - 1, 3))]; break;
    }
    transport_.push(id, pickReply(in_));
  }

  // Gives the worker a moment to hand over a request that a frame just dispatched.
  void waitForRequest() {
    const size_t before = transport_.ids().size();
    for (int i = 0; i < 100 && transport_.ids().size() == before; ++i) {
      std::this_thread::sleep_for(std::chrono::microseconds(100));
    }
  }

  void recreate() {
    settle();
    engine_.reset();
    createEngine();
  }

  // The delegates can be changed only while the engine is stopped.
  void configure() {
    if (state_ != Tovra::STOPPED) return;
    settle();
    switch (in_.ConsumeIntegralInRange(0, 3)) {
      case 0: engine_->addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, nullptr); break;
      case 1: engine_->addObjectModule(static_cast<Tovra::ObjectModuleID>(in_.ConsumeIntegral<int32_t>()), nullptr); break;
      case 2: engine_->setEventDelegate(nullptr); break;
      default: engine_->addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport_); break;
    }
    Tovra::CameraResRequirement req;
    engine_->getCameraResRequirement(req);
    FUZZ_CHECK(req.minHeight == 320 && req.maxHeight == 720);
  }

  FuzzedDataProvider& in_;
  Events events_;
  Transport transport_;
  std::unique_ptr<Tovra::TovraStateEngine> engine_;
  Tovra::EngineState state_ = Tovra::STOPPED;
  int resets_ = 0;
  double clock_ = 0.0;
  std::vector<Lent> lent_;
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  FuzzedDataProvider in(data, size);
  Harness harness(in);
  for (int i = 0; i < 48 && in.remaining_bytes() > 0; ++i) harness.step();
  return 0;
}
