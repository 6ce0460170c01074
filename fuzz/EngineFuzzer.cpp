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
constexpr size_t kBodyCount = sizeof(kBodies) / sizeof(kBodies[0]);

// Reads the input from the front in fixed-size fields, so that a seed can be written by hand
// (fuzz/make_engine_seeds.py) and a mutation changes one field. Past the end every read is 0.
class Reader {
 public:
  Reader(const uint8_t* data, size_t size) : p_(data), end_(data + size) {}
  bool done() const { return p_ >= end_; }
  uint8_t u8() { return p_ < end_ ? *p_++ : 0; }
  uint32_t u32() {
    uint32_t v = 0;
    for (int i = 0; i < 4; ++i) v |= static_cast<uint32_t>(u8()) << (8 * i);
    return v;
  }
  int32_t i32() { return static_cast<int32_t>(u32()); }
  // A selector byte and a 32-bit value: 255 takes the value as it is, other selectors map it
  // into ranges worth trying.
  int32_t dimension() {
    const uint8_t sel = u8();
    const uint32_t v = u32();
    if (sel == 255) return static_cast<int32_t>(v);
    switch (sel % 10) {
      case 0: return -static_cast<int32_t>(v % 1000);
      case 1: return 1 + static_cast<int32_t>(v % 6);
      case 2: return INT32_MAX;
      case 3: return 100 + static_cast<int32_t>(v % 300);
      default: return 7 + static_cast<int32_t>(v % 58);
    }
  }
  int32_t format() {
    const uint8_t sel = u8();
    const uint32_t v = u32();
    if (sel == 255) return static_cast<int32_t>(v);
    switch (sel % 8) {
      case 0: return static_cast<int32_t>(v);
      case 1: return 3 + static_cast<int32_t>(v % 4);
      case 2: return OrzaVSMobile::GRAY;
      default: return static_cast<int32_t>(v % 3);
    }
  }
  // A row stride relative to a row of `rowBytes` bytes.
  int32_t stride(int64_t rowBytes) {
    const uint8_t sel = u8();
    const uint32_t v = u32();
    int64_t stride;
    if (sel == 255) return static_cast<int32_t>(v);
    switch (sel % 8) {
      case 0: stride = static_cast<int32_t>(v); break;
      case 1: stride = rowBytes - 1 - static_cast<int64_t>(v % 8); break;
      default: stride = rowBytes + static_cast<int64_t>(v % 25); break;
    }
    return static_cast<int32_t>(std::max<int64_t>(INT32_MIN, std::min<int64_t>(INT32_MAX, stride)));
  }
  Reply reply() {
    Reply r;
    const uint8_t code = u8();
    const uint32_t v = u32();
    r.code = code == 255 ? static_cast<int32_t>(v) : (code % 4 == 0 ? 500 : 200);
    const uint8_t body = u8();
    if (body % (kBodyCount + 1) < kBodyCount) {
      r.body = kBodies[body % (kBodyCount + 1)];
    } else {
      const size_t n = u8();
      for (size_t i = 0; i < n; ++i) r.body.push_back(static_cast<char>(u8()));
    }
    const uint8_t rtt = u8();
    r.roundTrip = rtt == 0 ? -1.0 : rtt / 10.0;
    return r;
  }

 private:
  const uint8_t* p_;
  const uint8_t* end_;
};

// Bytes the engine copies from a frame of this geometry (one plane, or 3/2 of it for YUV);
// -1 when it is too large to hand over here.
int64_t frameBytes(const ImageBuffer& image) {
  if (image.widthStep <= 0 || image.height <= 0) return 0;
  int64_t size = static_cast<int64_t>(image.widthStep) * image.height;
  if (static_cast<uint64_t>(size) > kMaxFrameBytes) return -1;
  if (OrzaVSMobile::isYUVFormat(image.format)) size = size * 3 / 2;
  return size;
}

// Pixels with something to find: noise, a flat plane (sharpness 0, no corners), a flat plane
// with bright and dark spots (isolated corners), or blocks (corners at every block corner).
void fillPixels(uint8_t mode, uint32_t seed, uint8_t* dst, size_t n, int32_t stride) {
  if (dst == nullptr || n == 0) return;
  uint32_t state = seed | 1u;
  auto next = [&state]() {
    state ^= state << 13;
    state ^= state >> 17;
    state ^= state << 5;
    return state;
  };
  const size_t row = stride > 0 ? static_cast<size_t>(stride) : 1;
  const uint8_t flat = static_cast<uint8_t>(state >> 24);
  for (size_t i = 0; i < n; ++i) {
    switch (mode % 4) {
      case 0: dst[i] = static_cast<uint8_t>(next()); break;
      case 1: dst[i] = flat; break;
      case 2: dst[i] = (next() % 61 == 0) ? static_cast<uint8_t>(flat ^ 0xC0) : flat; break;
      default: dst[i] = (((i % row) / 6 + (i / row) / 6) & 1) ? 200 : 30; break;
    }
  }
}

int32_t nudge(int32_t value, int delta) {
  return static_cast<int32_t>(std::max<int64_t>(INT32_MIN, std::min<int64_t>(INT32_MAX, static_cast<int64_t>(value) + delta)));
}

// A frame in the caller's memory: borrowed (exactly the bytes its geometry names, followed by
// an unreadable page), allocated through the buffer (a little more or less than needed), or
// no memory at all.
struct ClientFrame {
  ImageBuffer image;
  std::unique_ptr<GuardedBlock> block;
};

void describe(Reader& in, ImageBuffer& img) {
  img.format = static_cast<OrzaVSMobile::ImageFormat>(in.format());
  img.width = in.dimension();
  img.height = in.dimension();
  img.numChannels = static_cast<int32_t>(in.u8() % 7) - 1;
  img.widthStep = in.stride(static_cast<int64_t>(img.width) * (img.numChannels > 1 ? img.numChannels : 1));
}

bool makeFrame(Reader& in, ClientFrame& frame) {
  ImageBuffer& img = frame.image;
  describe(in, img);
  const uint8_t memory = in.u8();
  const int delta = static_cast<int>(in.u8() % 129) - 64;
  const uint8_t pixelMode = in.u8();
  const uint32_t seed = in.u32();
  const int64_t bytes = frameBytes(img);
  if (bytes < 0) return false;
  switch (memory % 6) {
    case 0: {
      const int64_t n = std::max<int64_t>(0, bytes + delta);
      if (img.allocateBuffer(static_cast<int32_t>(n)) > 0) {
        fillPixels(pixelMode, seed, img.data, static_cast<size_t>(n), img.widthStep);
      }
      break;
    }
    case 1:
      img.data = nullptr;
      break;
    default:
      frame.block = std::make_unique<GuardedBlock>(
          static_cast<size_t>(bytes), memory % 6 >= 4 ? GuardedBlock::Aligned : GuardedBlock::EndAtPage);
      fillPixels(pixelMode, seed, frame.block->data(), frame.block->size(), img.widthStep);
      img.data = frame.block->data();
      break;
  }
  return true;
}

double nextTimeStamp(Reader& in, double& clock) {
  const uint8_t sel = in.u8();
  const uint32_t v = in.u32();
  switch (sel % 12) {
    case 0: return std::numeric_limits<double>::quiet_NaN();
    case 1: return -1.0;
    case 2: return static_cast<int32_t>(v) / 1000.0;
    case 3: clock += 0.1; return clock;
    case 4: clock += 0.41; return clock;
    case 5: return std::numeric_limits<double>::infinity();
    default: clock += (v % 300) / 1000.0; return clock;
  }
}

void fillExtra(Reader& in, ExtraFrameData& extra, double& clock) {
  extra.timeStamp = nextTimeStamp(in, clock);
  const uint8_t sel = in.u8();
  const int32_t orient = in.i32();
  extra.screenOrient = sel == 255 ? orient : 90 * (static_cast<int>(sel % 7) - 2);
  extra.flat = in.u8() & 1;
}

// A buffer lent by requestImageBuffer, with the key naming it and the number of resets the
// engine went through since (a client may still write into it across one reset, as a camera
// thread does while another thread pauses the engine; the engine keeps such memory alive).
struct Lent {
  ImageBuffer buffer;
  std::string key;
  int resetsAtLending = 0;
  bool returned = false;  // its key went back to the engine: the client lets go of the memory
};

// In verbose runs, names the ops that took 5 ms or more (what makes an input slow).
struct SlowOpReport {
  int op;
  std::chrono::steady_clock::time_point began;
  ~SlowOpReport() {
    if (!orzavs_fuzz::verbose()) return;
    const auto ms = std::chrono::duration_cast<std::chrono::milliseconds>(
                        std::chrono::steady_clock::now() - began).count();
    if (ms >= 5) std::fprintf(stderr, "  op %d took %lld ms\n", op, static_cast<long long>(ms));
  }
};

// Ops and their fields (each field has a fixed size; see make_engine_seeds.py):
//   0 lifecycle      which(1)            start, stop, pause, resume; waits for the worker first
//   1 lifecycle      which(1) wait(1)    the same, waiting only when wait is odd
//   2 process        frame, extra, key(1)
//   3 request        description, pixels requestImageBuffer, then the camera fills the memory
//   4 process lent   pick(1) change(1) value(4) extra, key(1)
//   5 still image    frame, extra, reply
//   6 push reply     which(1) reply
//   7 transport mode mode(1) reply
//   8 wait           (none)              until the worker has sent (or given up) the request
//   9 recreate       (none)              destroy the engine (replies still out), build a new one
//  10 configure      which(1) id(4)      delegates, only while stopped
//  11 write lent     pick(1) how(1) allocLen(4) count(1)
// where frame = description, memory(1) delta(1), pixels: mode(1) seed(4);
//       description = format(5) width(5) height(5) channels(1) stride(5);
//       extra = time(5) orientation(1+4) flat(1); reply = code(1+4) body(1 [+1+n]) rtt(1).
class Harness {
 public:
  explicit Harness(Reader& in) : in_(in) { createEngine(); }

  ~Harness() {
    settle();
    engine_.reset();
    // Late replies to every request ever sent: the engines that sent them are gone, so nothing
    // may reach a destroyed job.
    for (const std::string& id : transport_.ids()) transport_.push(id, Reply());
    FUZZ_CHECK(events_.results.load() <= static_cast<int>(transport_.ids().size()));
  }

  void step() {
    const int op = in_.u8() % 12;
    if (orzavs_fuzz::verbose()) std::fprintf(stderr, "op %d\n", op);
    SlowOpReport report{op, std::chrono::steady_clock::now()};
    switch (op) {
      case 0: lifecycle(in_.u8() % 4, true); break;
      case 1: {
        const int which = in_.u8() % 4;
        lifecycle(which, (in_.u8() & 1) != 0);
        break;
      }
      case 2: processFrame(); break;
      case 3: requestBuffer(); break;
      case 4: processLent(); break;
      case 5: processSingle(); break;
      case 6: pushReply(); break;
      case 7: {
        const Mode mode = static_cast<Mode>(in_.u8() % static_cast<int>(Mode::kCount));
        transport_.setMode(mode, in_.reply());
        break;
      }
      case 8: waitForRequest(); break;
      case 9: recreate(); break;
      case 10: configure(); break;
      default: writeLent(); break;
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

  // The key passed with a frame. Every process call hands its key back to the engine, so
  // the lent buffer it names is the client's no longer.
  std::string pickKey(const std::string& own) {
    const uint8_t sel = in_.u8();
    std::string key;
    switch (sel % 8) {
      case 0: break;
      case 1: key = "1700000000-" + std::to_string(sel); break;
      case 2: if (!lent_.empty()) key = lent_[sel % lent_.size()].key; break;
      default: key = own; break;
    }
    for (Lent& l : lent_) {
      if (!key.empty() && l.key == key) l.returned = true;
    }
    return key;
  }

  void processFrame() {
    ClientFrame frame;
    const bool ok = makeFrame(in_, frame);
    ExtraFrameData extra;
    fillExtra(in_, extra, clock_);
    const std::string key = pickKey(std::string());
    if (!ok) return;
    events_.frameWidth = frame.image.width;
    events_.frameHeight = frame.image.height;
    if (orzavs_fuzz::verbose()) {
      std::fprintf(stderr, "  process format %d %dx%d stride %d t %.3f key '%s'\n", frame.image.format,
                   frame.image.width, frame.image.height, frame.image.widthStep, extra.timeStamp, key.c_str());
    }
    engine_->process(key, frame.image, extra);
  }

  void requestBuffer() {
    Lent l;
    describe(in_, l.buffer);
    const uint8_t pixelMode = in_.u8();
    const uint32_t seed = in_.u32();
    if (frameBytes(l.buffer) < 0) return;
    engine_->requestImageBuffer(l.buffer, l.key);
    if (l.key.empty()) return;
    FUZZ_CHECK(state_ == Tovra::RUNNING);
    FUZZ_CHECK(l.buffer.knownLength() == l.buffer.allocLen);
    // The camera writes the frame into the lent memory, all of it.
    fillPixels(pixelMode, seed, l.buffer.data, static_cast<size_t>(l.buffer.allocLen), l.buffer.widthStep);
    l.resetsAtLending = resets_;
    lent_.push_back(std::move(l));
  }

  Lent* pickLent(uint8_t sel) {
    if (lent_.empty()) return nullptr;
    Lent& l = lent_[sel % lent_.size()];
    // Once its key went back to the engine, or beyond one reset, the engine has let the memory
    // go; a client must not touch it then.
    return !l.returned && resets_ - l.resetsAtLending <= 1 ? &l : nullptr;
  }

  void writeLent() {
    Lent* l = pickLent(in_.u8());
    const uint8_t sel = in_.u8();
    const int32_t allocLen = in_.i32();
    const size_t count = static_cast<size_t>(in_.u8()) * 16;
    if (l == nullptr || l->buffer.data == nullptr) return;
    // A fill through the buffer, as the Java side makes it: never past the lent block, whatever
    // allocLen says.
    if (sel & 1) l->buffer.allocLen = allocLen;
    std::vector<uint8_t> bytes(count, sel);
    l->buffer.fillBuffer(bytes.data(), static_cast<int32_t>(bytes.size()));
  }

  void processLent() {
    Lent* l = pickLent(in_.u8());
    const uint8_t change = in_.u8();
    const int32_t value = in_.i32();
    ExtraFrameData extra;
    fillExtra(in_, extra, clock_);
    if (l == nullptr) {
      pickKey(std::string());
      return;
    }
    ImageBuffer& image = l->buffer;
    // The client fills in the rest of the description, not always consistently with what it
    // asked the memory for.
    switch (change % 8) {
      case 0: image.height = nudge(image.height, value % 4); break;
      case 1: image.format = static_cast<OrzaVSMobile::ImageFormat>(value % 9); break;
      case 2: image.widthStep = nudge(image.widthStep, value % 4); break;
      case 3: image.width = value; break;
      default: break;
    }
    if (change & 0x80) image.width = image.widthStep;  // the usual case: no row padding
    events_.frameWidth = image.width;
    events_.frameHeight = image.height;
    l->returned = true;
    engine_->process(pickKey(l->key), image, extra);
  }

  void processSingle() {
    ClientFrame frame;
    const bool ok = makeFrame(in_, frame);
    ExtraFrameData extra;
    fillExtra(in_, extra, clock_);
    const Reply reply = in_.reply();
    if (!ok) return;
    settle();
    transport_.answerEverything(true, reply);
    engine_->processSingleImage(frame.image, extra);
    transport_.answerEverything(false, Reply());
  }

  void pushReply() {
    const uint8_t which = in_.u8();
    const Reply reply = in_.reply();
    const std::vector<std::string> ids = transport_.ids();
    std::string id;
    if (which % 8 == 0 || ids.empty()) {
      id = "TovraStateEngine-" + std::to_string(which);
    } else if (which % 8 == 1) {
      id = ids.front();
    } else {
      id = ids[ids.size() - 1 - std::min<size_t>(ids.size() - 1, which % 4)];
    }
    transport_.push(id, reply);
  }

  // Lets the worker hand over the request of a frame just dispatched (or give it up).
  void waitForRequest() {
    const Tovra::VisualSearchServiceJob& job = engine_->job(0);
    for (;;) {
      const Tovra::JobState s = job.state();
      if (s != Tovra::Queued && s != Tovra::Running) break;
      std::this_thread::sleep_for(std::chrono::microseconds(50));
    }
  }

  void recreate() {
    settle();
    engine_.reset();
    createEngine();
  }

  // The delegates can be changed only while the engine is stopped.
  void configure() {
    const uint8_t which = in_.u8();
    const int32_t id = in_.i32();
    if (state_ != Tovra::STOPPED) return;
    settle();
    switch (which % 4) {
      case 0: engine_->addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, nullptr); break;
      case 1: engine_->addObjectModule(static_cast<Tovra::ObjectModuleID>(id), nullptr); break;
      case 2: engine_->setEventDelegate(nullptr); break;
      default: engine_->addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport_); break;
    }
    Tovra::CameraResRequirement req;
    engine_->getCameraResRequirement(req);
    FUZZ_CHECK(req.minHeight == 320 && req.maxHeight == 720);
  }

  Reader& in_;
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
  Reader in(data, size);
  Harness harness(in);
  for (int i = 0; i < 64 && !in.done(); ++i) harness.step();
  return 0;
}
