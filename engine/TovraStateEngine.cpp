#include "engine/TovraStateEngine.h"

#include <cmath>
#include <ctime>
#include <locale>
#include <sstream>
#include <utility>

#include "features/InterestPoints.h"
#include "types/DiagnosticOutput.h"
#include "types/ImageFormat.h"

namespace Tovra {

using OrzaVSMobile::reportLine;
using OrzaVSMobile::reportLinef;

using OrzaVSMobile::ExtraFrameData;
using OrzaVSMobile::ImageBuffer;

namespace {

// The double just below 0.1 (bit pattern 0x3FB9999999999998). It decides the sharpness
// margins at .5 boundaries (a width of 15 gives a top margin of 1, not 2): keep it exactly.
constexpr double kSharpnessMarginFactor = 0.09999999999999998;
// Take rule: a frame is taken more than this long after the last one taken...
constexpr double kMinTakeInterval = 0.1;
// ...and a frame waiting for a free job is replaced once it is older than this.
constexpr double kMaxHeldAge = 0.4;

bool isContinuousFormat(int32_t format) {
  return format == OrzaVSMobile::GRAY || OrzaVSMobile::isYUVFormat(format);
}

// "<seconds>-<frameId>" in plain decimal, as a default text stream writes them.
std::string makeFrameKey(std::time_t seconds, uint64_t frameId) {
  std::ostringstream out;
  out.imbue(std::locale::classic());
  out << seconds << '-' << frameId;
  return out.str();
}

}  // namespace

TovraStateEngine::TovraStateEngine() : frameRecords_(kFrameRecordCount) {
  for (int i = 0; i < 1; ++i) jobs_.push_back(std::make_unique<VisualSearchServiceJob>());
}

TovraStateEngine::~TovraStateEngine() {
  // No lock: nobody else may be inside the engine while it is destroyed.
  reset();
  heldRecord_.reset();
  pendingBuffers_.clear();
  // Joins the worker: after this no job runs on another engine thread.
  executor_.reset();
  // Last job first. Each job withdraws from the server delegate before it goes, so a late
  // reply finds nothing to call.
  while (!jobs_.empty()) jobs_.pop_back();
}

void TovraStateEngine::setEventDelegate(EventDelegateBase* delegate) {
  if (delegate == nullptr) return;
  eventDelegate_ = delegate;
  for (auto& job : jobs_) job->setEventDelegate(delegate);
}

void TovraStateEngine::addObjectModule(ObjectModuleID id, Server::ServerDelegate* delegate) {
  if (id != VISUAL_SEARCH_SERVICE_MOD) return;
  serverDelegate_ = delegate;
  for (auto& job : jobs_) job->setServerDelegate(delegate);
}

void TovraStateEngine::getCameraResRequirement(CameraResRequirement& out) const {
  out.minHeight = 320;
  out.maxHeight = 720;
}

void TovraStateEngine::reset() {
  if (executor_) {
    executor_->cancelJobs();
    for (auto& job : jobs_) job->waitUntilSettled();
  }
  for (auto& job : jobs_) job->cancel();
  for (auto& entry : pendingBuffers_) {
    FrameRecord& record = *entry.second;
    // Only the pool and this map hold a lent record, so nothing else reads its pixels. The
    // client may still write into them (see retiredLentPixels_): keep the bytes alive.
    if (entry.second.use_count() <= 2 && record.pixels.capacity() > 0) {
      retiredLentPixels_.push_back(std::move(record.pixels));
      record.pixels = std::vector<uint8_t>();
      while (retiredLentPixels_.size() > kFrameRecordCount) retiredLentPixels_.pop_front();
    }
  }
  pendingBuffers_.clear();
  lastTakenTime_ = -1.0;
  heldRecord_.reset();
  frameRecords_.restart();  // a failed restart only prints its line
}

void TovraStateEngine::startEngine() {
  MutexLock lock(mutex_);
  if ((state_ | 2) != 2) return;  // only from STOPPED or PAUSED
  reset();
  auto fresh = std::make_unique<TovraExecutionEngine>(1);
  std::unique_ptr<TovraExecutionEngine> old = std::move(executor_);
  executor_ = std::move(fresh);
  old.reset();
  state_ = RUNNING;
}

void TovraStateEngine::stopEngine() {
  MutexLock lock(mutex_);
  if (state_ == STOPPED) return;
  reset();
  std::unique_ptr<TovraExecutionEngine> old = std::move(executor_);
  old.reset();
  state_ = STOPPED;
}

void TovraStateEngine::pauseEngine() {
  MutexLock lock(mutex_);
  if (state_ != RUNNING) return;
  reset();
  state_ = PAUSED;
}

void TovraStateEngine::resumeEngine() {
  MutexLock lock(mutex_);
  if (state_ != PAUSED) return;
  if (executor_) executor_->resumeJobs();
  state_ = RUNNING;
}

VisualSearchServiceJob* TovraStateEngine::idleJob() const {
  for (const auto& job : jobs_) {
    if (!job->isBusy()) return job.get();
  }
  return nullptr;
}

std::shared_ptr<FrameRecord> TovraStateEngine::takeLent(const std::string& frameKey) {
  if (frameKey.empty()) return nullptr;
  auto it = pendingBuffers_.find(frameKey);
  if (it == pendingBuffers_.end()) return nullptr;
  std::shared_ptr<FrameRecord> record = std::move(it->second);
  pendingBuffers_.erase(it);
  return record;
}

// Once a lent record has been handed back, the client's buffer would still point at the
// record's memory with a non-zero allocLen, and a later fill through it would write into a
// record that the pool may already have handed to another frame (or renewed). The buffer is
// therefore detached when it points at the record being consumed.
static void detachFromRecord(ImageBuffer& image, const std::shared_ptr<FrameRecord>& record) {
  if (record && !record->pixels.empty() && image.data == record->pixels.data()) {
    image.data = nullptr;
    image.allocLen = 0;
  }
}

void TovraStateEngine::dropLent(const std::string& frameKey, ImageBuffer& image) {
  detachFromRecord(image, takeLent(frameKey));
}

bool TovraStateEngine::acceptsGeometry(const ImageBuffer& image, bool packedAllowed) const {
  // The frame comes from the client; the engine reads its first plane (interest points,
  // sharpness) and copies it into a record. Frames whose description cannot be read safely
  // are dropped here with one line. (A frame whose memory is shorter than its geometry cannot
  // be detected when the memory is the caller's own; when its size is known it is checked.)
  if (image.data == nullptr) {
    reportLine("Skipped input frame: image has no pixel data");
    return false;
  }
  if (image.width <= 0 || image.height <= 0) {
    reportLinef("Skipped input frame: invalid image size %dx%d", image.width, image.height);
    return false;
  }
  int64_t rowBytes = image.width;
  if (packedAllowed && image.format != OrzaVSMobile::GRAY && !OrzaVSMobile::isYUVFormat(image.format) &&
      image.numChannels > 1) {
    rowBytes *= image.numChannels;
  }
  if (image.widthStep < rowBytes) {
    reportLinef("Skipped input frame: row stride %d is smaller than a row of %lld bytes",
                image.widthStep, static_cast<long long>(rowBytes));
    return false;
  }
  const int64_t known = image.knownLength();
  const int64_t plane = static_cast<int64_t>(image.height - 1) * image.widthStep + rowBytes;
  if (known >= 0 && known < plane) {
    reportLinef("Skipped input frame: image buffer holds %lld bytes, a %dx%d image needs %lld",
                static_cast<long long>(known), image.width, image.height,
                static_cast<long long>(plane));
    return false;
  }
  return true;
}

void TovraStateEngine::requestImageBuffer(ImageBuffer& buffer, std::string& frameKey) {
  MutexLock lock(mutex_);
  if (state_ != RUNNING) {
    reportLine("Failed to request image buffer: TSE not in RUNNING state");
    return;
  }
  std::shared_ptr<FrameRecord> record = frameRecords_.getNewSlot();
  if (!record) {
    reportLine("Failed to get a new frame record slot in getRequestImageBuffers");
    return;
  }
  if (!record->lendBuffer(buffer)) {
    // Negative height or stride, or a size beyond 2 GiB: nothing can be lent for it.
    reportLinef("Failed to request image buffer: invalid geometry (height %d, widthStep %d)",
                buffer.height, buffer.widthStep);
    return;
  }
  const std::string key = makeFrameKey(std::time(nullptr), record->frameId);
  frameKey.clear();
  frameKey = key;
  if (!pendingBuffers_.emplace(key, record).second) {
    // The key is already lent (only possible if the clock and the frame numbering both
    // repeat): the existing entry is kept and this record goes back to the pool, so the
    // buffer must not keep pointing at it.
    detachFromRecord(buffer, record);
  }
}

int32_t TovraStateEngine::sharpness(const ImageBuffer& image) {
  if (image.data == nullptr || image.width <= 0 || image.height <= 0) return 0;
  const int64_t width = image.width;
  const int64_t height = image.height;
  const int64_t stride = image.widthStep;
  // The top margin comes from the width and the left margin from the height: intended.
  const int64_t top = static_cast<int64_t>(std::round(static_cast<double>(width) * kSharpnessMarginFactor));
  const int64_t left = static_cast<int64_t>(std::round(static_cast<double>(height) * kSharpnessMarginFactor));
  uint32_t sum = 0;  // wraps modulo 2^32
  // The counter advances by 5 but the examined row by 1: consecutive rows from top + 1.
  int64_t y = top + 1;
  for (int64_t r = top; r < height - top; r += 5, ++y) {
    // A sample needs its whole 3x3 neighbourhood inside the plane; for the usual frame sizes
    // every sample has it, but tiny frames (height under 6, or very short and wide) would reach
    // outside the image, so such samples are skipped.
    if (y < 1 || y > height - 2) continue;
    const uint8_t* above = image.data + (y - 1) * stride;
    const uint8_t* row = image.data + y * stride;
    const uint8_t* below = image.data + (y + 1) * stride;
    for (int64_t x = left; x < width - left; x += 5) {
      if (x < 1 || x > width - 2) continue;
      const int neighbours = above[x - 1] + above[x] + above[x + 1] + row[x - 1] + row[x + 1] +
                             below[x - 1] + below[x] + below[x + 1];
      const int v = 8 * row[x] - neighbours;
      sum += static_cast<uint32_t>(v < 0 ? -v : v);
    }
  }
  return static_cast<int32_t>(sum);
}

void TovraStateEngine::process(const std::string& frameKey, ImageBuffer& image,
                               ExtraFrameData& extra) {
  MutexLock lock(mutex_);
  if (state_ != RUNNING) {
    reportLine("Skipped input frame: TSE not in RUNNING state");
    dropLent(frameKey, image);
    return;
  }
  if (!isContinuousFormat(image.format)) {
    reportLine("Failed to process non-GRAY/YUV format in continuous scanning mode");
    dropLent(frameKey, image);
    return;
  }
  if (!acceptsGeometry(image, false)) {
    dropLent(frameKey, image);
    return;
  }
  const double t = extra.timeStamp;

  OrzaVSMobile::detectInterestPoints(image, points_);
  if (eventDelegate_ != nullptr) eventDelegate_->didDetectInterestPoints(points_);

  bool take = false;
  if (heldRecord_) {
    take = sharpness(image) > heldRecord_->sharpness || t - heldRecord_->timeStamp > kMaxHeldAge;
  } else {
    take = lastTakenTime_ < 0 || t - lastTakenTime_ > kMinTakeInterval;
  }

  std::shared_ptr<FrameRecord> lent = takeLent(frameKey);
  bool dispatch = true;
  if (take) {
    // The right-hand side is evaluated while the previous held frame is still held, so the
    // pool never hands that one out again here.
    heldRecord_ = lent ? lent : frameRecords_.getNewSlot();
    if (!heldRecord_) {
      dispatch = false;  // pool exhausted: the held frame is dropped, this one not analysed
    } else if (heldRecord_->setSourceImage(image, extra)) {
      lastTakenTime_ = t;
    } else {
      dispatch = false;  // kept held (with this frame's time stamp) for later comparisons
    }
  }
  if (dispatch && heldRecord_) {
    VisualSearchServiceJob* job = idleJob();
    if (job != nullptr) {
      job->setFrameRecord(heldRecord_);
      heldRecord_.reset();
      if (executor_) executor_->addJob(job);
    }
  }
  detachFromRecord(image, lent);
}

void TovraStateEngine::processSingleImage(ImageBuffer& image, ExtraFrameData& extra) {
  MutexLock lock(mutex_);
  if (state_ != RUNNING) {
    reportLine("Skipped input frame: TSE not in RUNNING state");
    return;
  }
  if (!acceptsGeometry(image, true)) return;
  std::shared_ptr<FrameRecord> record = frameRecords_.getNewSlot();
  if (!record) {
    reportLine("Failed to get a new frame record slot");
    return;
  }
  if (!record->setSourceImage(image, extra)) {
    reportLine("Failed to set source image");
    return;
  }
  VisualSearchServiceJob* job = idleJob();
  if (job == nullptr) return;
  job->setFrameRecord(record);
  // Synchronous: the request is sent from this thread and the wait ends once the reply (which
  // the client pushes from another thread) has been handled.
  job->run();
  job->waitUntilDone();
}

EngineState TovraStateEngine::getState() const {
  MutexLock lock(mutex_);
  return state_;
}

const TovraExecutionEngine* TovraStateEngine::executor() const {
  MutexLock lock(mutex_);
  return executor_.get();
}

size_t TovraStateEngine::pendingBufferCount() const {
  MutexLock lock(mutex_);
  return pendingBuffers_.size();
}

bool TovraStateEngine::hasHeldRecord() const {
  MutexLock lock(mutex_);
  return static_cast<bool>(heldRecord_);
}

double TovraStateEngine::lastTakenTime() const {
  MutexLock lock(mutex_);
  return lastTakenTime_;
}

}  // namespace Tovra
