// Runs one piece of work a given number of times on one 1280x720 frame, so that an instruction
// counter (the qemu plugin) can weigh it against the peer a user would otherwise pick:
//   peer_insn_driver <frame> <work> <calls>
// <frame> is a benchmark frame's name ("1280x720 texture") or a JPEG photograph, scaled to cover
// 1280x720 and cropped at its centre, its Y, Cb and Cr planes giving an NV21 frame. <work>:
//   process    the engine's per-frame path: process() through the facade on a frame that is not
//              taken (interest points and their callback); one taken frame comes first, its
//              request answered before the counted calls begin
//   cvfast     OpenCV's cv::FAST on the Y plane, threshold 50, with non-maximum suppression
//   encode     the worker's encoder: NV21 to JPEG at quality 50
//   tjencode   TurboJPEG's tjCompressFromYUV on an I420 copy of the frame (made before the
//              calls), 4:2:0, quality 50; tjencode-fastdct with its fast integer DCT
// The instructions of one call are (count(1 + n calls) - count(1 call)) / n: start-up, frame
// preparation and the first call's buffer growth cancel out. Prints what the work found or
// made, so that runs can be checked against each other.
#include <algorithm>
#include <condition_variable>
#include <csetjmp>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <mutex>
#include <string>
#include <vector>

// jpeglib.h needs size_t and FILE declared first.
#include <jpeglib.h>
#include <turbojpeg.h>

#include <opencv2/core.hpp>
#include <opencv2/features2d.hpp>

#include "bench/BenchFrames.h"
#include "engine/TovraStateEngineFacade.h"
#include "server/ServerDelegate.h"
#include "types/EventDelegateBase.h"
#include "types/ImageBuffer.h"
#include "vsearch/JpegEncoder.h"

namespace {

constexpr int kWidth = 1280;
constexpr int kHeight = 720;

struct JpegError {
  jpeg_error_mgr mgr;
  std::jmp_buf jump;
};

// A JPEG photograph as a 1280x720 NV21 frame: each plane scaled (bilinear) to cover the frame and
// cropped at its centre.
bool photoToNv21(const char* path, std::vector<uint8_t>& nv21) {
  FILE* file = std::fopen(path, "rb");
  if (file == nullptr) return false;
  jpeg_decompress_struct info;
  JpegError error;
  info.err = jpeg_std_error(&error.mgr);
  error.mgr.error_exit = [](j_common_ptr c) { std::longjmp(reinterpret_cast<JpegError*>(c->err)->jump, 1); };
  std::vector<uint8_t> ycc;
  if (setjmp(error.jump) != 0) {
    jpeg_destroy_decompress(&info);
    std::fclose(file);
    return false;
  }
  jpeg_create_decompress(&info);
  jpeg_stdio_src(&info, file);
  jpeg_read_header(&info, TRUE);
  info.out_color_space = JCS_YCbCr;
  jpeg_start_decompress(&info);
  const int w = static_cast<int>(info.output_width);
  const int h = static_cast<int>(info.output_height);
  ycc.resize(static_cast<size_t>(w) * h * 3);
  while (info.output_scanline < info.output_height) {
    JSAMPROW row = ycc.data() + static_cast<size_t>(info.output_scanline) * w * 3;
    jpeg_read_scanlines(&info, &row, 1);
  }
  jpeg_finish_decompress(&info);
  jpeg_destroy_decompress(&info);
  std::fclose(file);

  const double scale = std::max(static_cast<double>(kWidth) / w, static_cast<double>(kHeight) / h);
  const double offX = (w * scale - kWidth) / 2;
  const double offY = (h * scale - kHeight) / 2;
  auto sample = [&](double x, double y, int c) {  // bilinear, x and y in frame pixels
    double sx = std::min(std::max((x + offX) / scale - 0.5, 0.0), w - 1.0);
    double sy = std::min(std::max((y + offY) / scale - 0.5, 0.0), h - 1.0);
    int x0 = static_cast<int>(sx), y0 = static_cast<int>(sy);
    int x1 = std::min(x0 + 1, w - 1), y1 = std::min(y0 + 1, h - 1);
    double fx = sx - x0, fy = sy - y0;
    auto at = [&](int xx, int yy) { return ycc[(static_cast<size_t>(yy) * w + xx) * 3 + c]; };
    double v = (at(x0, y0) * (1 - fx) + at(x1, y0) * fx) * (1 - fy) + (at(x0, y1) * (1 - fx) + at(x1, y1) * fx) * fy;
    return static_cast<uint8_t>(v + 0.5);
  };
  nv21.resize(static_cast<size_t>(kWidth) * kHeight * 3 / 2);
  for (int y = 0; y < kHeight; ++y)
    for (int x = 0; x < kWidth; ++x) nv21[static_cast<size_t>(y) * kWidth + x] = sample(x, y, 0);
  uint8_t* vu = nv21.data() + static_cast<size_t>(kWidth) * kHeight;
  for (int y = 0; y < kHeight / 2; ++y) {
    for (int x = 0; x < kWidth / 2; ++x) {
      vu[static_cast<size_t>(y) * kWidth + 2 * x] = sample(2 * x + 0.5, 2 * y + 0.5, 2);
      vu[static_cast<size_t>(y) * kWidth + 2 * x + 1] = sample(2 * x + 0.5, 2 * y + 0.5, 1);
    }
  }
  return true;
}

// Answers every request at once with one result, on the sending thread, and counts them.
class InstantTransport : public Tovra::Server::ServerDelegate {
 public:
  bool sendServerRequestImpl(const Tovra::Server::ServerRequest& request) override {
    Tovra::Server::ServerResponse reply;
    reply.id = request.id;
    reply.responseStr =
        "{\"queryId\":\"q\",\"quillmark\":{\"searchResult\":[{\"content\":\"x\",\"contentType\":"
        "\"PIDN\",\"properties\":{}}],\"resultMetadata\":{\"finalAccumulation\":true}}}";
    pushServerResponse(reply);
    return true;
  }
};

class Events : public Tovra::EventDelegateBase {
 public:
  void didDetectInterestPoints(const std::vector<OrzaVSMobile::Point2f>& points) override {
    lastCount = points.size();
    ++callbacks;
  }
  void didDecode(const std::vector<Tovra::ObjectInfo>&, const Tovra::ResultMetadata&) override {
    std::lock_guard<std::mutex> lock(mutex);
    ++decodes;
    decoded.notify_all();
  }
  size_t lastCount = 0;
  size_t callbacks = 0;
  std::mutex mutex;
  std::condition_variable decoded;
  int decodes = 0;
};

}  // namespace

int main(int argc, char** argv) {
  if (argc != 4) {
    std::fprintf(stderr, "usage: %s <frame name | photo.jpg> <process|cvfast|encode|tjencode|tjencode-fastdct> <calls>\n",
                 argv[0]);
    return 2;
  }
  const std::string source = argv[1];
  const std::string work = argv[2];
  const int calls = std::atoi(argv[3]);
  std::vector<uint8_t> nv21;
  if (source.size() > 4 && source.compare(source.size() - 4, 4, ".jpg") == 0) {
    if (!photoToNv21(source.c_str(), nv21)) {
      std::fprintf(stderr, "cannot read the JPEG photograph %s\n", source.c_str());
      return 2;
    }
  } else {
    const auto frames = orzavs_bench::selectFrames(source);
    if (frames.size() != 1 || frames[0]->width != kWidth || frames[0]->height != kHeight) {
      std::fprintf(stderr, "'%s' must name exactly one 1280x720 benchmark frame\n", source.c_str());
      return 2;
    }
    nv21 = frames[0]->nv21;
  }

  if (work == "process") {
    Events events;
    InstantTransport transport;
    Tovra::TovraStateEngineFacade facade(&events);
    facade.addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
    facade.startEngine();
    OrzaVSMobile::ImageBuffer image(0, OrzaVSMobile::NV21, kWidth, kHeight, kWidth, 1, nv21.data());
    OrzaVSMobile::ExtraFrameData extra;
    extra.timeStamp = 1.0;
    facade.process(image, extra);  // taken: encoded and answered on the worker
    {
      std::unique_lock<std::mutex> lock(events.mutex);
      events.decoded.wait(lock, [&] { return events.decodes == 1; });
    }
    for (int i = 1; i < calls; ++i) facade.process(image, extra);  // same time stamp: not taken
    facade.stopEngine();
    std::printf("process: %zu callbacks, %zu points on the last frame, %d requests\n", events.callbacks,
                events.lastCount, events.decodes);
  } else if (work == "cvfast") {
    cv::Mat luma(kHeight, kWidth, CV_8UC1, nv21.data());
    std::vector<cv::KeyPoint> keypoints;
    for (int i = 0; i < calls; ++i) cv::FAST(luma, keypoints, 50, true);
    std::printf("cv::FAST: %zu corners\n", keypoints.size());
  } else if (work == "encode") {
    std::vector<uint8_t> out, scratch;
    for (int i = 0; i < calls; ++i)
      Tovra::encodeYUVToJpeg(nv21.data(), kHeight, kWidth, kWidth, OrzaVSMobile::NV21, out, 50, scratch);
    std::printf("encode: %zu bytes\n", out.size());
  } else if (work == "tjencode" || work == "tjencode-fastdct") {
    const size_t luma = static_cast<size_t>(kWidth) * kHeight, quarter = luma / 4;
    std::vector<uint8_t> i420(luma + 2 * quarter);
    std::memcpy(i420.data(), nv21.data(), luma);
    for (size_t i = 0; i < quarter; ++i) {
      i420[luma + quarter + i] = nv21[luma + 2 * i];  // V
      i420[luma + i] = nv21[luma + 2 * i + 1];        // U
    }
    const int flags = TJFLAG_NOREALLOC | (work == "tjencode-fastdct" ? TJFLAG_FASTDCT : 0);
    tjhandle tj = tjInitCompress();
    const unsigned long capacity = tjBufSize(kWidth, kHeight, TJSAMP_420);
    unsigned char* buf = tjAlloc(static_cast<int>(capacity));
    unsigned long size = 0;
    for (int i = 0; i < calls; ++i) {
      size = capacity;
      if (tjCompressFromYUV(tj, i420.data(), kWidth, 1, kHeight, TJSAMP_420, &buf, &size, 50, flags) != 0) {
        std::fprintf(stderr, "tjCompressFromYUV: %s\n", tjGetErrorStr2(tj));
        return 1;
      }
    }
    tjFree(buf);
    tjDestroy(tj);
    std::printf("%s: %lu bytes\n", work.c_str(), size);
  } else {
    std::fprintf(stderr, "unknown work '%s'\n", work.c_str());
    return 2;
  }
  return 0;
}
