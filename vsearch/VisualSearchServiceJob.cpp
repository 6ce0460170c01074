#include "vsearch/VisualSearchServiceJob.h"

#include <algorithm>
#include <chrono>
#include <exception>
#include <thread>

#include "types/DiagnosticOutput.h"
#include "types/ImageFormat.h"
#include "vsearch/JpegEncoder.h"
#include "vsearch/VisualSearchRequest.h"
#include "vsearch/VisualSearchResponseParser.h"

namespace Tovra {

using OrzaVSMobile::reportLine;
using OrzaVSMobile::reportLinef;

namespace {

constexpr int32_t kJpegQuality = 50;
constexpr size_t kJpegWorkBytes = 4096;
constexpr auto kPollInterval = std::chrono::milliseconds(50);

// Any channel count below 2 means one grey byte a pixel. The encoder wants that said as 1
// (it refuses counts below 1), while a client's buffer often leaves numChannels at 0 for grey
// and YUV frames (the ImageBuffer default).
int32_t packedChannels(int32_t numChannels) { return numChannels < 2 ? 1 : numChannels; }

}  // namespace

VisualSearchServiceJob::VisualSearchServiceJob() = default;

VisualSearchServiceJob::~VisualSearchServiceJob() {
  waitUntilSettled();
  state_.store(Finished);
  // A delegate keeps a plain pointer to this job under the id of every request still waiting
  // for its reply. Left there, a reply pushed after this destructor would call into freed
  // memory. forgetHandler() drops those entries and waits until a reply being delivered to this
  // job on another thread has returned, so nothing can reach the job once it is gone. (The
  // client keeps its delegates alive while the facade lives.)
  for (Server::ServerDelegate* delegate : delegatesUsed_) delegate->forgetHandler(this);
}

void VisualSearchServiceJob::markQueued() {
  withExecutor_.store(true);
  state_.store(Queued);
}

void VisualSearchServiceJob::finishUnlessAwaiting() {
  if (state_.load() != AwaitingReply) state_.store(Finished);
  withExecutor_.store(false);
}

bool VisualSearchServiceJob::isBusy() const {
  return isBusyState(state_.load()) || withExecutor_.load();
}

void VisualSearchServiceJob::waitUntilDone() const {
  for (;;) {
    const int32_t s = state_.load();
    if (s != Queued && s != Running && s != AwaitingReply) return;
    std::this_thread::sleep_for(kPollInterval);
  }
}

void VisualSearchServiceJob::waitUntilSettled() const {
  for (;;) {
    const int32_t s = state_.load();
    if (s != Queued && s != Running && !withExecutor_.load()) return;
    std::this_thread::sleep_for(kPollInterval);
  }
}

void VisualSearchServiceJob::cancel() { state_.store(Finished); }

std::string VisualSearchServiceJob::lastQueryId() const {
  MutexLock lock(lastQueryMutex_);
  return lastQueryId_;
}

double VisualSearchServiceJob::lastQueryRoundTripTime() const {
  MutexLock lock(lastQueryMutex_);
  return lastQueryRoundTripTime_;
}

bool VisualSearchServiceJob::recordCoversImage(const FrameRecord& record) {
  const int64_t width = record.width;
  const int64_t height = record.height;
  if (width <= 0 || height <= 0) return false;
  const int64_t available = static_cast<int64_t>(record.pixels.size());
  int64_t needed = 0;
  if (OrzaVSMobile::isYUVFormat(record.format)) {
    // The YUV encoder ignores the stride: it reads a luminance plane of width x height bytes
    // and two chroma planes of (width x height) / 4 bytes after it.
    const int64_t luma = width * height;
    needed = luma + 2 * (luma / 4);
  } else {
    // Packed and grey rows start `widthStep` bytes apart; the encoder reads at most
    // numChannels bytes a pixel from each (it refuses channel counts it cannot handle).
    const int64_t stride = record.widthStep;
    if (stride < 0) return false;
    const int64_t bytesPerPixel = record.numChannels > 1 ? record.numChannels : 1;
    needed = (height - 1) * stride + width * bytesPerPixel;
  }
  return needed <= available;
}

void VisualSearchServiceJob::run() {
  Server::ServerDelegate* const delegate = serverDelegate_;
  if (delegate == nullptr || !frameRecord_) {
    state_.store(Finished);
    return;
  }
  state_.store(Running);
  try {
    jpegWork_.resize(kJpegWorkBytes);
    const FrameRecord& record = *frameRecord_;
    // The record's geometry and its pixel storage both come from the client; an encoder handed
    // a geometry its storage does not cover would read outside it.
    if (!recordCoversImage(record)) {
      reportLinef("Skipped frame %llu: its pixels do not cover a %dx%d image",
                  static_cast<unsigned long long>(record.frameId), record.width, record.height);
      state_.store(Finished);
      return;
    }
    const auto format = static_cast<OrzaVSMobile::ImageFormat>(record.format);
    const bool encoded =
        OrzaVSMobile::isYUVFormat(record.format)
            ? encodeYUVToJpeg(record.pixels.data(), record.height, record.width, record.widthStep,
                              format, jpegOutput_, kJpegQuality, jpegWork_)
            : encodePackedToJpeg(record.pixels.data(), record.height, record.width,
                                 record.widthStep, packedChannels(record.numChannels), format,
                                 jpegOutput_, kJpegQuality, jpegWork_);
    if (!encoded || jpegOutput_.size() > static_cast<size_t>(INT32_MAX)) {
      state_.store(Finished);
      return;
    }

    VisualSearchRequestInfo info;
    info.extraFlag = false;
    info.rotation = visualSearchRotation(record.screenOrient);
    info.height = record.height;
    info.width = record.width;
    info.jpegData = OrzaVSMobile::ByteArray(jpegOutput_.data(), static_cast<int32_t>(jpegOutput_.size()));
    info.intentId = 0;
    info.intentScore = 0.0;
    std::string queryId;
    double roundTrip = -1.0;
    {
      MutexLock lock(lastQueryMutex_);
      queryId = lastQueryId_;
      roundTrip = lastQueryRoundTripTime_;
    }
    buildVisualSearchRequest(request_, info, record.frameId, queryId, roundTrip);
    request_.responseHandler = this;
    // The request holds the JPEG, not the frame: the record can go back to the pool now.
    frameRecord_.reset();
    if (std::find(delegatesUsed_.begin(), delegatesUsed_.end(), delegate) == delegatesUsed_.end()) {
      delegatesUsed_.push_back(delegate);
    }
    // AwaitingReply is set before the request is handed over, not after: the delegate registers
    // the id first and a transport may push the reply before sendServerRequest() returns (on
    // its own thread, or even on this one). A reply that found the job still Running would be
    // ignored and the job would wait for it forever. Nothing below touches the state again.
    state_.store(AwaitingReply);
    delegate->sendServerRequest(request_);  // the result is not looked at: errors come as replies
  } catch (const std::exception& e) {
    // Out of memory while building, or a transport that threw. This may run on a worker
    // thread, where an escaping exception would end the process: the frame is given up.
    reportLinef("Visual search request failed: %s", e.what());
    int32_t expected = Running;
    if (!state_.compare_exchange_strong(expected, Finished)) {
      expected = AwaitingReply;
      state_.compare_exchange_strong(expected, Finished);
    }
  } catch (...) {
    reportLine("Visual search request failed");
    int32_t expected = Running;
    if (!state_.compare_exchange_strong(expected, Finished)) {
      expected = AwaitingReply;
      state_.compare_exchange_strong(expected, Finished);
    }
  }
}

void VisualSearchServiceJob::handleServerResponse(const Server::ServerResponse& response) {
  if (state_.load() != AwaitingReply) return;  // stray, late or repeated reply
  // Only one reply is handled at a time; one arriving meanwhile on another thread is dropped,
  // as it would be once the first has finished the job.
  if (handlingReply_.exchange(true)) return;
  // Whatever happens below (an exception from the client's callback included), the job ends
  // Finished and the claim is released, so it never stays busy for good.
  struct Settle {
    VisualSearchServiceJob* job;
    ~Settle() {
      job->state_.store(Finished);
      job->handlingReply_.store(false);
    }
  };
  if (state_.load() != AwaitingReply) {
    handlingReply_.store(false);
    return;
  }
  Settle settle{this};

  std::vector<ObjectInfo> results;
  ResultMetadata metadata;
  Server::ResponseStatus status = Server::RESPONSE_SERVER_ERROR;
  if (response.responseCode == 200) {
    status = parseVisualSearchResponse(response.responseStr, results, metadata)
                 ? Server::RESPONSE_SUCCESS
                 : Server::RESPONSE_PARSE_ERROR;
  }
  {
    MutexLock lock(lastQueryMutex_);
    lastQueryId_ = metadata.queryID;
    lastQueryRoundTripTime_ = response.roundtripTime;
  }
  if (status != Server::RESPONSE_SUCCESS) {
    reportLinef("VSS SERVER ERROR: response: %s", response.responseStr.c_str());
    if (eventDelegate_ != nullptr) {
      eventDelegate_->didReceiveServerError(VISUAL_SEARCH_SERVICE_MOD, status, response.responseCode);
    }
    return;
  }
  results.erase(std::remove_if(results.begin(), results.end(),
                               [](const ObjectInfo& info) {
                                 return info.contentType == UNSPECIFIED_CONTENT_TYPE;
                               }),
                results.end());
  for (ObjectInfo& info : results) info.srcObjectModule = VISUAL_SEARCH_SERVICE_MOD;
  if (eventDelegate_ != nullptr) eventDelegate_->didDecode(results, metadata);
}

}  // namespace Tovra
