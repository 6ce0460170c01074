#include "vsearch/JpegEncoder.h"

#include <csetjmp>
#include <cstddef>
#include <cstdint>
#include <cstdio>  // jpeglib.h needs FILE and size_t declared first
#include <cstring>
#include <exception>
#include <limits>
#include <string>

#include <jerror.h>
#include <jpeglib.h>

#include "vsearch/JpegDeinterleave.h"

// How the library is driven
// -------------------------
// Every library call runs inside one error frame, compressIn. libjpeg reports fatal errors
// through a hook that must not return; ours keeps the library's message and longjmps back to the
// jump point that compressIn set. longjmp skips C++ destructors, so every function between the
// jump point and the hook (compressIn, the compress routines it runs, libjpeg's own C frames and
// the destination callbacks) holds only trivially destructible objects. The caller's vectors are
// reached through plain pointers.
//
// The output vector grows inside the destination callbacks, which run inside libjpeg's C frames.
// A C++ exception must never unwind through those frames, so a failed growth is caught in the
// callback, stored in an exception_ptr owned by the public entry point, and turned into a library
// error (which longjmps back and destroys the compressor). The entry point rethrows it after
// the compressor is gone: growth failures of the caller's vectors still reach the caller as
// exceptions, while every other library error is reported as `false`.
//
// Memory the encoders need besides the caller's vectors (the semi-planar chroma work areas, the
// scratch rows at the picture's edges, the colour conversion row) comes from the library's
// per-image pool, so it is released by jpeg_destroy_compress on the success and the error path
// alike, and the library's own out-of-memory handling covers it.

namespace Tovra {
namespace {

using OrzaVSMobile::ImageFormat;

constexpr size_t kWorkBufferSize = 4096;
constexpr JSAMPLE kMidGrey = 0x80;

struct ErrorManager {
  jpeg_error_mgr pub;  // first member: the library hands the hook a jpeg_error_mgr*
  std::jmp_buf jump;
  char reason[JMSG_LENGTH_MAX];  // the library's message for the fatal error
};

struct Destination {
  jpeg_destination_mgr pub;  // first member: the library hands callbacks a jpeg_destination_mgr*
  std::vector<uint8_t>* work;
  std::vector<uint8_t>* output;
  std::exception_ptr* growthFailure;  // where a failed growth of `output` is kept
};

[[noreturn]] void jumpBackOnFatalError(j_common_ptr cinfo) {
  // Nothing is printed: the message is kept for the caller, and the error frame (compressIn)
  // destroys the compressor.
  ErrorManager* err = reinterpret_cast<ErrorManager*>(cinfo->err);
  (*err->pub.format_message)(cinfo, err->reason);
  std::longjmp(err->jump, 1);
}

// Appends the first `count` bytes of the work buffer to the output. Returns false, with the
// exception stored, when the output cannot grow. Its own frame is gone before any longjmp.
bool appendWork(Destination* dest, size_t count) noexcept {
  try {
    const uint8_t* begin = dest->work->data();
    dest->output->insert(dest->output->end(), begin, begin + count);
    return true;
  } catch (...) {
    *dest->growthFailure = std::current_exception();
    return false;
  }
}

void initDestination(j_compress_ptr) {}

boolean emptyOutputBuffer(j_compress_ptr cinfo) {
  Destination* dest = reinterpret_cast<Destination*>(cinfo->dest);
  // The library calls this only when the buffer is full: the whole work buffer is flushed.
  if (!appendWork(dest, dest->work->size())) ERREXIT1(cinfo, JERR_OUT_OF_MEMORY, 0);
  dest->pub.next_output_byte = dest->work->data();
  dest->pub.free_in_buffer = dest->work->size();
  return TRUE;
}

void terminateDestination(j_compress_ptr cinfo) {
  Destination* dest = reinterpret_cast<Destination*>(cinfo->dest);
  const size_t used = dest->work->size() - dest->pub.free_in_buffer;
  if (used != 0 && !appendWork(dest, used)) ERREXIT1(cinfo, JERR_OUT_OF_MEMORY, 0);
}

// Everything a compress routine needs from its public entry point (trivially destructible).
struct Session {
  std::vector<uint8_t>* work;
  std::vector<uint8_t>* output;
  std::exception_ptr* growthFailure;
  int quality;  // already clamped to [0, 100]
  char* reason;  // JMSG_LENGTH_MAX bytes: the library's message when it fails
};

void attachDestination(j_compress_ptr cinfo, Destination* dest, const Session& session) {
  dest->pub.init_destination = initDestination;
  dest->pub.empty_output_buffer = emptyOutputBuffer;
  dest->pub.term_destination = terminateDestination;
  dest->work = session.work;
  dest->output = session.output;
  dest->growthFailure = session.growthFailure;
  dest->pub.next_output_byte = session.work->data();
  dest->pub.free_in_buffer = session.work->size();
  cinfo->dest = &dest->pub;
}

int clampQuality(int32_t quality) {
  if (quality <= 0) return 0;
  if (quality >= 100) return 100;
  return quality;
}

// The one error frame of the encoders. Creates the compressor with its error manager and
// destination, runs `compress` (which sets the parameters and writes the whole image) and
// destroys the compressor, on success and on a fatal library error alike. The jump point is set
// here, in a frame that stays live while `compress` and the library run; everything between it
// and the error hook is trivially destructible (see the top of this file).
template <class Frame>
bool compressIn(const Frame& frame, const Session& session,
                void (*compress)(j_compress_ptr, const Frame&, const Session&)) {
  jpeg_compress_struct cinfo;
  std::memset(&cinfo, 0, sizeof cinfo);  // a failed create then leaves nothing to free
  ErrorManager err;
  Destination dest;
  cinfo.err = jpeg_std_error(&err.pub);
  err.pub.error_exit = jumpBackOnFatalError;
  if (setjmp(err.jump)) {
    jpeg_destroy_compress(&cinfo);
    std::memcpy(session.reason, err.reason, sizeof err.reason);
    return false;
  }
  jpeg_create_compress(&cinfo);  // checks the library's own version and record size
  attachDestination(&cinfo, &dest, session);
  compress(&cinfo, frame, session);
  jpeg_finish_compress(&cinfo);
  jpeg_destroy_compress(&cinfo);
  return true;
}

// Largest byte count a frame may span so that every offset into it is a valid ptrdiff_t.
constexpr uint64_t kMaxFrameBytes = static_cast<uint64_t>(std::numeric_limits<std::ptrdiff_t>::max());

// ---------------------------------------------------------------------------------------------
// YUV 4:2:0 frames, handed to the library as raw planes.

struct YuvFrame {
  const uint8_t* pixels;  // width*height luminance bytes, then 2*((width*height)/4) chroma bytes
  int width;
  int height;
  ImageFormat format;
};

// One plane of the frame as the band addressing walks it.
struct Plane {
  const uint8_t* start;
  uint64_t length;  // bytes that belong to the plane
  size_t rowLen;    // bytes from the start of one row to the next
  size_t rows;      // rows of the picture the plane holds (0: none)
};

// Returns the row the library reads as row `row` of the plane, from which `extent` bytes can be
// read. Rows of the picture that lie inside the plane are handed over where they are, so the
// library sees exactly the addressed bytes. At the bottom and right edges the library still
// reads whole 8x8 blocks: it completes the last block row from rows past the picture and the
// last block column from bytes past each row, and those samples go into the stream even though
// the decoder crops them. So that no plane is ever read beyond its own end (and the stream never
// depends on the bytes of another plane or on memory past the frame):
//  - rows past the picture repeat its last row, as the library itself pads scan-line input;
//  - a row whose read reaches past the plane's end is copied into `scratch[index]` and
//    completed with its last byte;
//  - a plane without rows (width or height 1) reads as mid-grey.
// `scratch` is null until some row of the band needs it (see needsScratch).
const JSAMPLE* planeRow(const Plane& plane, size_t row, size_t extent, JSAMPLE* scratch, size_t index) {
  if (plane.rows == 0) {
    JSAMPLE* copy = scratch + index * extent;
    std::memset(copy, kMidGrey, extent);
    return copy;
  }
  if (row >= plane.rows) row = plane.rows - 1;
  const uint64_t offset = static_cast<uint64_t>(row) * plane.rowLen;
  const uint64_t room = plane.length - offset;  // at least one row of bytes
  if (extent <= room) return plane.start + offset;
  JSAMPLE* copy = scratch + index * extent;
  std::memcpy(copy, plane.start + offset, static_cast<size_t>(room));
  std::memset(copy + room, copy[room - 1], extent - static_cast<size_t>(room));
  return copy;
}

// True when planeRow needs scratch for any of the `count` rows from `first`.
bool needsScratch(const Plane& plane, size_t first, size_t count, size_t extent) {
  if (plane.rows == 0) return true;
  size_t last = first + count - 1;
  if (last >= plane.rows) last = plane.rows - 1;
  return static_cast<uint64_t>(last) * plane.rowLen + extent > plane.length;
}

JSAMPLE* allocateImageBytes(j_compress_ptr cinfo, size_t size) {
  return static_cast<JSAMPLE*>(
      (*cinfo->mem->alloc_small)(reinterpret_cast<j_common_ptr>(cinfo), JPOOL_IMAGE, size));
}

void compressYuv(j_compress_ptr cinfo, const YuvFrame& frame, const Session& session) {

  cinfo->image_width = static_cast<JDIMENSION>(frame.width);
  cinfo->image_height = static_cast<JDIMENSION>(frame.height);
  cinfo->input_components = 3;
  cinfo->in_color_space = JCS_YCbCr;
  jpeg_set_defaults(cinfo);
  jpeg_set_quality(cinfo, session.quality, TRUE);
  jpeg_set_colorspace(cinfo, JCS_YCbCr);
  cinfo->raw_data_in = TRUE;
#if JPEG_LIB_VERSION >= 70
  cinfo->do_fancy_downsampling = FALSE;
#endif
  cinfo->dct_method = JDCT_IFAST;
  cinfo->comp_info[0].h_samp_factor = 2;
  cinfo->comp_info[0].v_samp_factor = 2;
  cinfo->comp_info[1].h_samp_factor = 1;
  cinfo->comp_info[1].v_samp_factor = 1;
  cinfo->comp_info[2].h_samp_factor = 1;
  cinfo->comp_info[2].v_samp_factor = 1;
  jpeg_start_compress(cinfo, TRUE);  // rejects sizes the library cannot handle

  // From here the width and height are at most JPEG_MAX_DIMENSION.
  const size_t width = static_cast<size_t>(frame.width);
  const size_t height = static_cast<size_t>(frame.height);
  const size_t chromaRowLen = width / 2;
  const uint64_t lumaLen = static_cast<uint64_t>(width) * height;
  const uint64_t quarter = lumaLen / 4;
  // Bytes the library may read from each row it is handed: whole MCUs of 16 luminance and 8
  // chroma columns (raw input must be readable up to the block padding).
  const size_t mcuColumns = (width + 15) / 16;
  const size_t lumaExtent = mcuColumns * 16;
  const size_t chromaExtent = mcuColumns * 8;
  const bool semiPlanar = frame.format != OrzaVSMobile::I420;

  const Plane luma{frame.pixels, lumaLen, width, height};
  const size_t chromaRows = chromaRowLen != 0 ? height / 2 : 0;
  const Plane cbPlane{frame.pixels + lumaLen, quarter, chromaRowLen, chromaRows};
  const Plane crPlane{frame.pixels + lumaLen + quarter, quarter, chromaRowLen, chromaRows};
  const uint8_t* pairs = frame.pixels + lumaLen;  // NV21/NV12: rows of `width` bytes
  const uint64_t pairsLen = 2 * quarter;

  JSAMPROW lumaRows[16];
  JSAMPROW cbRows[8];
  JSAMPROW crRows[8];
  JSAMPARRAY planes[3] = {lumaRows, cbRows, crRows};

  // Semi-planar chroma is de-interleaved into two areas of 8 rows of chromaRowLen bytes, back to
  // back, each followed by padding so that the library's read of whole MCUs from the last row
  // stays inside. Rows the last band does not refill keep the previous band's samples; before
  // the first band the areas hold mid-grey, so the stream never depends on stale memory.
  if (semiPlanar) {
    const size_t areaSize = 8 * chromaRowLen + chromaExtent;
    JSAMPLE* areas = allocateImageBytes(cinfo, 2 * areaSize);
    std::memset(areas, kMidGrey, 2 * areaSize);
    for (size_t k = 0; k < 8; ++k) {
      cbRows[k] = areas + k * chromaRowLen;
      crRows[k] = areas + areaSize + k * chromaRowLen;
    }
  }
  // NV21 pairs are (V, U), NV12 pairs (U, V).
  const bool cbFirst = frame.format == OrzaVSMobile::NV12;

  // Edge rows (see planeRow), allocated when a band first needs them.
  JSAMPLE* lumaScratch = nullptr;
  JSAMPLE* cbScratch = nullptr;
  JSAMPLE* crScratch = nullptr;

  while (cinfo->next_scanline < cinfo->image_height) {
    const size_t next = cinfo->next_scanline;
    const size_t chromaFirst = next / 2;

    if (lumaScratch == nullptr && (needsScratch(luma, next, 16, lumaExtent) ||
                                   (!semiPlanar && (needsScratch(cbPlane, chromaFirst, 8, chromaExtent) ||
                                                    needsScratch(crPlane, chromaFirst, 8, chromaExtent))))) {
      lumaScratch = allocateImageBytes(cinfo, 16 * lumaExtent + 2 * 8 * chromaExtent);
      cbScratch = lumaScratch + 16 * lumaExtent;
      crScratch = cbScratch + 8 * chromaExtent;
    }

    // The library only reads its input rows; its row type is not const.
    for (size_t k = 0; k < 16; ++k)
      lumaRows[k] = const_cast<JSAMPROW>(planeRow(luma, next + k, lumaExtent, lumaScratch, k));

    if (semiPlanar) {
      // Only chroma rows that exist in the frame are de-interleaved.
      const size_t remaining = (height - next) / 2;
      const size_t rows = remaining < 8 ? remaining : 8;
      for (size_t k = 0; k < rows; ++k) {
        const uint64_t offset = static_cast<uint64_t>(width) * (chromaFirst + k);
        // The frame always holds these pairs; the bound only guards the arithmetic.
        if (offset >= pairsLen) break;
        size_t count = chromaRowLen;
        if (2 * static_cast<uint64_t>(count) > pairsLen - offset)
          count = static_cast<size_t>((pairsLen - offset) / 2);
        deinterleaveChroma(pairs + offset, count, cbFirst, cbRows[k], crRows[k]);
      }
    } else {
      for (size_t k = 0; k < 8; ++k) {
        cbRows[k] = const_cast<JSAMPROW>(planeRow(cbPlane, chromaFirst + k, chromaExtent, cbScratch, k));
        crRows[k] = const_cast<JSAMPROW>(planeRow(crPlane, chromaFirst + k, chromaExtent, crScratch, k));
      }
    }

    // The library takes one band of 16 rows and advances next_scanline by 16; a zero count
    // would mean it took nothing, and looping on would never end.
    if (jpeg_write_raw_data(cinfo, planes, 16) == 0) ERREXIT(cinfo, JERR_CANT_SUSPEND);
  }
}

// ---------------------------------------------------------------------------------------------
// Packed and grey frames, handed to the library one scan line at a time.

struct PackedFrame {
  const uint8_t* pixels;
  int width;
  int height;
  ptrdiff_t stride;
  int numChannels;
  ImageFormat format;
};

void compressPacked(j_compress_ptr cinfo, const PackedFrame& frame, const Session& session) {

  cinfo->image_width = static_cast<JDIMENSION>(frame.width);
  cinfo->image_height = static_cast<JDIMENSION>(frame.height);
  const bool grey = frame.numChannels < 2;
  cinfo->input_components = grey ? 1 : 3;
  cinfo->in_color_space = grey ? JCS_GRAYSCALE : JCS_RGB;
  jpeg_set_defaults(cinfo);
  jpeg_set_quality(cinfo, session.quality, TRUE);
  jpeg_start_compress(cinfo, TRUE);  // rejects sizes the library cannot handle

  const size_t width = static_cast<size_t>(frame.width);
  const bool asIs = frame.format == OrzaVSMobile::RGB;
  JSAMPLE* converted = (!grey && !asIs) ? allocateImageBytes(cinfo, 3 * width) : nullptr;

  for (int r = 0; r < frame.height; ++r) {
    const uint8_t* src = frame.pixels + r * frame.stride;
    JSAMPROW row = const_cast<JSAMPROW>(src);  // the library only reads its input rows
    if (!asIs && frame.numChannels == 3) {
      for (size_t x = 0; x < width; ++x) {
        converted[3 * x + 0] = src[3 * x + 2];
        converted[3 * x + 1] = src[3 * x + 1];
        converted[3 * x + 2] = src[3 * x + 0];
      }
      row = converted;
    } else if (!asIs && frame.numChannels == 4) {
      for (size_t x = 0; x < width; ++x) {
        converted[3 * x + 0] = src[4 * x + 2];
        converted[3 * x + 1] = src[4 * x + 1];
        converted[3 * x + 2] = src[4 * x + 0];
      }
      row = converted;
    }
    if (jpeg_write_scanlines(cinfo, &row, 1) != 1) ERREXIT(cinfo, JERR_CANT_SUSPEND);
  }
}

// Runs the error frame for `frame` and hands the library's message to `failure` if it fails.
// A failed growth of the caller's vectors is rethrown once the compressor is gone.
template <class Frame>
bool encode(const Frame& frame, void (*compress)(j_compress_ptr, const Frame&, const Session&),
            std::vector<uint8_t>& output, int32_t quality, std::vector<uint8_t>& work,
            std::string* failure) {
  std::exception_ptr growthFailure;
  char reason[JMSG_LENGTH_MAX] = "";
  const Session session{&work, &output, &growthFailure, clampQuality(quality), reason};
  const bool ok = compressIn(frame, session, compress);
  if (growthFailure) std::rethrow_exception(growthFailure);
  if (!ok && failure != nullptr) *failure = reason;
  return ok;
}

bool refuse(std::string* failure, const char* reason) {
  if (failure != nullptr) *failure = reason;
  return false;
}

}  // namespace

bool encodeYUVToJpeg(const uint8_t* pixels, int32_t height, int32_t width, int32_t /*stride*/,
                     OrzaVSMobile::ImageFormat format, std::vector<uint8_t>& output, int32_t quality,
                     std::vector<uint8_t>& work, std::string* failure) {
  work.resize(kWorkBufferSize);
  output.clear();

  // Outside input: frames without pixels, without area, or in a layout this encoder does not
  // know are refused here, before any byte is read.
  if (pixels == nullptr || width <= 0 || height <= 0) return refuse(failure, "no pixels or no area");
  if (format != OrzaVSMobile::I420 && format != OrzaVSMobile::NV21 && format != OrzaVSMobile::NV12)
    return refuse(failure, "not a YUV 4:2:0 format");
  const uint64_t lumaLen = static_cast<uint64_t>(width) * static_cast<uint64_t>(height);
  if (lumaLen + 2 * (lumaLen / 4) > kMaxFrameBytes) return refuse(failure, "frame too large");
  return encode(YuvFrame{pixels, width, height, format}, &compressYuv, output, quality, work,
                failure);
}

bool encodePackedToJpeg(const uint8_t* pixels, int32_t height, int32_t width, int32_t stride,
                        int32_t numChannels, OrzaVSMobile::ImageFormat format, std::vector<uint8_t>& output,
                        int32_t quality, std::vector<uint8_t>& work, std::string* failure) {
  work.resize(kWorkBufferSize);
  output.clear();

  // Outside input: refused before any byte is read.
  //  - no pixels or no area;
  //  - a channel count below 1 or of 2: the library would be handed rows longer than the
  //    width * numChannels bytes the frame holds (3 bytes a pixel for any count of 2 or more);
  //  - a negative stride: rows would lie before `pixels`, outside the memory handed over.
  // A stride smaller than a row is accepted: the rows then overlap inside the frame.
  if (pixels == nullptr || width <= 0 || height <= 0) return refuse(failure, "no pixels or no area");
  if (numChannels < 1 || numChannels == 2 || stride < 0)
    return refuse(failure, "invalid channel count or stride");
  const uint64_t span = static_cast<uint64_t>(height - 1) * static_cast<uint64_t>(stride) +
                        static_cast<uint64_t>(width) * static_cast<uint64_t>(numChannels);
  if (span > kMaxFrameBytes) return refuse(failure, "frame too large");
  return encode(PackedFrame{pixels, width, height, stride, numChannels, format}, &compressPacked,
                output, quality, work, failure);
}

}  // namespace Tovra
