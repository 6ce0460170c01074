// Exported functions of the plain records: constructors, destructors, fields, and the few
// member functions the records have.

#include <jni.h>

#include <algorithm>
#include <string>
#include <utility>

#include "OrzaVSMobile.h"
#include "jni/ExportSupport.h"
#include "jni/MobileUtils.h"
#include "jni/TypeNames.h"

using namespace orzavs::jni;

using OrzaVSMobile::ByteArray;
using OrzaVSMobile::ExtraFrameData;
using OrzaVSMobile::FrameID;
using OrzaVSMobile::FrameROI;
using OrzaVSMobile::ImageBuffer;
using OrzaVSMobile::Point2f;
using OrzaVSMobile::Point3d;
using Tovra::CameraResRequirement;
using Tovra::ObjectInfo;
using Tovra::ResultMetadata;
using Tovra::Server::ServerRequest;
using Tovra::Server::ServerResponse;
using Tovra::Server::ServerResponseHandler;
using ParamMap = Tovra::Server::ServerRequest::ParamMap;

// ---- StringPair ---------------------------------------------------------------------------------

ORZAVS_JNI_EXPORT(jlong, new_1StringPair_1_1SWIG_10)(JNIEnv* env, jclass) {
  return create<StringPair>(env);
}

ORZAVS_JNI_EXPORT(jlong, new_1StringPair_1_1SWIG_11)(JNIEnv* env, jclass, jstring first,
                                                     jstring second) {
  return guarded(env, [&] {
    std::string a = toStdString(env, first);
    std::string b = toStdString(env, second);
    return toHandle(new StringPair(std::move(a), std::move(b)));
  });
}

ORZAVS_JNI_EXPORT(jlong, new_1StringPair_1_1SWIG_12)(JNIEnv* env, jclass, jlong other, jobject) {
  return guarded(env, [&] { return toHandle(new StringPair(constRef<StringPair>(other))); });
}

ORZAVS_DELETE(StringPair, StringPair)
ORZAVS_FIELD_STRING(StringPair, StringPair, first)
ORZAVS_FIELD_STRING(StringPair, StringPair, second)

// ---- FrameROI, ExtraFrameData, FrameID, CameraResRequirement ------------------------------------

ORZAVS_NEW_DELETE(FrameROI, FrameROI)
ORZAVS_FIELD_VALUE(FrameROI, FrameROI, x, jint)
ORZAVS_FIELD_VALUE(FrameROI, FrameROI, y, jint)
ORZAVS_FIELD_VALUE(FrameROI, FrameROI, width, jint)
ORZAVS_FIELD_VALUE(FrameROI, FrameROI, height, jint)

ORZAVS_NEW_DELETE(ExtraFrameData, ExtraFrameData)
ORZAVS_FIELD_RECORD(ExtraFrameData, ExtraFrameData, displayROI)
ORZAVS_FIELD_RECORD(ExtraFrameData, ExtraFrameData, focusROI)
ORZAVS_FIELD_VALUE(ExtraFrameData, ExtraFrameData, screenOrient, jint)
ORZAVS_FIELD_VALUE(ExtraFrameData, ExtraFrameData, fieldOfView, jdouble)
ORZAVS_FIELD_VALUE(ExtraFrameData, ExtraFrameData, flat, jboolean)
ORZAVS_FIELD_VALUE(ExtraFrameData, ExtraFrameData, timeStamp, jdouble)

ORZAVS_NEW_DELETE(FrameID, FrameID)
ORZAVS_FIELD_STRING(FrameID, FrameID, id)

ORZAVS_NEW_DELETE(CameraResRequirement, CameraResRequirement)
ORZAVS_FIELD_VALUE(CameraResRequirement, CameraResRequirement, minHeight, jint)
ORZAVS_FIELD_VALUE(CameraResRequirement, CameraResRequirement, maxHeight, jint)

// ---- ImageBuffer --------------------------------------------------------------------------------

ORZAVS_JNI_EXPORT(jlong, new_1ImageBuffer_1_1SWIG_10)(JNIEnv* env, jclass) {
  return create<ImageBuffer>(env);
}

ORZAVS_JNI_EXPORT(jlong, new_1ImageBuffer_1_1SWIG_11)(JNIEnv* env, jclass, jint definition,
                                                      jint format, jint width, jint height,
                                                      jint widthStep, jint numChannels,
                                                      jlong data) {
  return create<ImageBuffer>(env, definition, static_cast<OrzaVSMobile::ImageFormat>(format), width,
                             height, widthStep, numChannels, fromHandle<uint8_t>(data));
}

ORZAVS_DELETE(ImageBuffer, ImageBuffer)
ORZAVS_FIELD_VALUE(ImageBuffer, ImageBuffer, width, jint)
ORZAVS_FIELD_VALUE(ImageBuffer, ImageBuffer, height, jint)
ORZAVS_FIELD_VALUE(ImageBuffer, ImageBuffer, widthStep, jint)
ORZAVS_FIELD_VALUE(ImageBuffer, ImageBuffer, numChannels, jint)
ORZAVS_FIELD_VALUE(ImageBuffer, ImageBuffer, format, jint)
ORZAVS_FIELD_VALUE(ImageBuffer, ImageBuffer, definition, jint)

// `data` and `allocLen` decide where a fill writes, so Java may not combine them freely. Every
// fill is already bounded by the real size of memory the buffer knows (its own block, a block
// the engine lent it); memory it does not know is trusted up to allocLen. Hence:
// - pointing `data` at memory the buffer does not know makes the buffer borrow it (allocLen 0),
//   so such memory can be read by the engine but never filled;
// - allocLen may be lowered, or raised up to the size of the known block `data` points at,
//   but never raised over unknown memory: other values raise IllegalArgumentException.
ORZAVS_JNI_EXPORT(void, ImageBuffer_1data_1set)(JNIEnv* env, jclass, jlong self, jobject,
                                                jlong value) {
  guarded(env, [&] {
    ImageBuffer* buffer = fromHandle<ImageBuffer>(self);
    if (buffer == nullptr) return;
    buffer->data = fromHandle<uint8_t>(value);
    if (buffer->knownLength() < 0) buffer->allocLen = 0;
  });
}

ORZAVS_JNI_EXPORT(jlong, ImageBuffer_1data_1get)(JNIEnv* env, jclass, jlong self, jobject) {
  return guarded(env, [&] { return toHandle(selfOf<ImageBuffer>(self).data); });
}

ORZAVS_JNI_EXPORT(void, ImageBuffer_1allocLen_1set)(JNIEnv* env, jclass, jlong self, jobject,
                                                    jint value) {
  guarded(env, [&] {
    ImageBuffer* buffer = fromHandle<ImageBuffer>(self);
    if (buffer == nullptr) return;
    const bool allowed = value >= 0 && (value <= buffer->allocLen || value <= buffer->knownLength());
    if (!allowed) {
      raise(Swig::JavaIllegalArgumentException,
            "allocLen " + std::to_string(value) + " exceeds the memory this buffer holds");
    }
    buffer->allocLen = value;
  });
}

ORZAVS_JNI_EXPORT(jint, ImageBuffer_1allocLen_1get)(JNIEnv* env, jclass, jlong self, jobject) {
  return guarded(env, [&] { return static_cast<jint>(selfOf<ImageBuffer>(self).allocLen); });
}

ORZAVS_JNI_EXPORT(jint, ImageBuffer_1allocateBuffer)(JNIEnv* env, jclass, jlong self, jobject,
                                                     jint length) {
  return guarded(env, [&] { return static_cast<jint>(selfOf<ImageBuffer>(self).allocateBuffer(length)); });
}

// The array is pinned for the copy and released without copying back. The count is bounded by
// the array's own length as well, so a length beyond the array reads nothing outside it.
ORZAVS_JNI_EXPORT(jint, ImageBuffer_1fillBuffer)(JNIEnv* env, jclass, jlong self, jobject,
                                                 jbyteArray source, jint length) {
  return guarded(env, [&]() -> jint {
    ImageBuffer& buffer = selfOf<ImageBuffer>(self);
    if (source == nullptr) return 0;
    const jint count = std::min(length, env->GetArrayLength(source));
    void* bytes = env->GetPrimitiveArrayCritical(source, nullptr);
    if (bytes == nullptr) throw JavaPending{};
    const int32_t copied = buffer.fillBuffer(static_cast<const uint8_t*>(bytes), count);
    env->ReleasePrimitiveArrayCritical(source, bytes, JNI_ABORT);
    return copied;
  });
}

namespace {

// The readable bytes of a direct byte buffer: its address and min(length, capacity). A null or
// heap (non-direct) buffer gives a null address, which copies nothing.
std::pair<const uint8_t*, jint> directBytes(JNIEnv* env, jobject buffer, jint length) {
  if (buffer == nullptr) return {nullptr, 0};
  const auto* address = static_cast<const uint8_t*>(env->GetDirectBufferAddress(buffer));
  const jlong capacity = env->GetDirectBufferCapacity(buffer);
  if (address == nullptr || capacity < 0) return {nullptr, 0};
  return {address, static_cast<jint>(std::min<jlong>(length, capacity))};
}

}  // namespace

ORZAVS_JNI_EXPORT(jint, ImageBuffer_1fillBufferWithByteBuffer_1_1SWIG_10)(JNIEnv* env, jclass,
                                                                          jlong self, jobject,
                                                                          jobject source,
                                                                          jint length) {
  return guarded(env, [&] {
    ImageBuffer& buffer = selfOf<ImageBuffer>(self);
    const auto bytes = directBytes(env, source, length);
    return static_cast<jint>(buffer.fillBufferWithByteBuffer(bytes.first, bytes.second));
  });
}

ORZAVS_JNI_EXPORT(jint, ImageBuffer_1fillBufferWithByteBuffer_1_1SWIG_11)(
    JNIEnv* env, jclass, jlong self, jobject, jobject first, jint firstLength, jobject second,
    jint secondLength) {
  return guarded(env, [&] {
    ImageBuffer& buffer = selfOf<ImageBuffer>(self);
    const auto a = directBytes(env, first, firstLength);
    const auto b = directBytes(env, second, secondLength);
    return static_cast<jint>(buffer.fillBufferWithByteBuffer(a.first, a.second, b.first, b.second));
  });
}

ORZAVS_JNI_EXPORT(void, ImageBuffer_1releaseBuffer)(JNIEnv* env, jclass, jlong self, jobject) {
  guarded(env, [&] { selfOf<ImageBuffer>(self).releaseBuffer(); });
}

// ---- ByteArray ----------------------------------------------------------------------------------

ORZAVS_JNI_EXPORT(jlong, new_1ByteArray_1_1SWIG_10)(JNIEnv* env, jclass) {
  return create<ByteArray>(env);
}

ORZAVS_JNI_EXPORT(jlong, new_1ByteArray_1_1SWIG_11)(JNIEnv* env, jclass, jlong other, jobject) {
  return guarded(env, [&] { return toHandle(new ByteArray(constRef<ByteArray>(other))); });
}

ORZAVS_DELETE(ByteArray, ByteArray)

// A fresh Java copy of the bytes. No bytes (null data, a length of 0 or below) give an empty
// array rather than a copy from a null or negative range.
ORZAVS_JNI_EXPORT(jbyteArray, ByteArray_1getData)(JNIEnv* env, jclass, jlong self, jobject) {
  return guarded(env, [&]() -> jbyteArray {
    const ByteArray& bytes = selfOf<ByteArray>(self);
    const jsize length = (bytes.getData() != nullptr && bytes.getLength() > 0) ? bytes.getLength() : 0;
    jbyteArray array = env->NewByteArray(length);
    if (array == nullptr) throw JavaPending{};
    if (length > 0) {
      env->SetByteArrayRegion(array, 0, length, reinterpret_cast<const jbyte*>(bytes.getData()));
    }
    return array;
  });
}

ORZAVS_JNI_EXPORT(jint, ByteArray_1getLength)(JNIEnv* env, jclass, jlong self, jobject) {
  return guarded(env, [&] { return static_cast<jint>(selfOf<ByteArray>(self).getLength()); });
}

ORZAVS_JNI_EXPORT(void, ByteArray_1clear)(JNIEnv* env, jclass, jlong self, jobject) {
  guarded(env, [&] { selfOf<ByteArray>(self).clear(); });
}

// ---- Point2f, Point3d ---------------------------------------------------------------------------

ORZAVS_JNI_EXPORT(jlong, new_1Point2f_1_1SWIG_10)(JNIEnv* env, jclass) {
  return create<Point2f>(env);
}

ORZAVS_JNI_EXPORT(jlong, new_1Point2f_1_1SWIG_11)(JNIEnv* env, jclass, jfloat x, jfloat y) {
  return create<Point2f>(env, x, y);
}

ORZAVS_DELETE(Point2f, Point2f)
ORZAVS_FIELD_VALUE(Point2f, Point2f, x, jfloat)
ORZAVS_FIELD_VALUE(Point2f, Point2f, y, jfloat)

ORZAVS_JNI_EXPORT(jlong, new_1Point3d_1_1SWIG_10)(JNIEnv* env, jclass) {
  return create<Point3d>(env);
}

ORZAVS_JNI_EXPORT(jlong, new_1Point3d_1_1SWIG_11)(JNIEnv* env, jclass, jdouble x, jdouble y,
                                                  jdouble z) {
  return create<Point3d>(env, x, y, z);
}

ORZAVS_DELETE(Point3d, Point3d)
ORZAVS_FIELD_VALUE(Point3d, Point3d, x, jdouble)
ORZAVS_FIELD_VALUE(Point3d, Point3d, y, jdouble)
ORZAVS_FIELD_VALUE(Point3d, Point3d, z, jdouble)

// ---- ResultMetadata, ObjectInfo -----------------------------------------------------------------

ORZAVS_NEW_DELETE(ResultMetadata, ResultMetadata)
ORZAVS_FIELD_VALUE(ResultMetadata, ResultMetadata, isFinalAccumulation, jboolean)
ORZAVS_FIELD_STRING(ResultMetadata, ResultMetadata, queryID)
ORZAVS_FIELD_STRING(ResultMetadata, ResultMetadata, mobileDecorator)
ORZAVS_FIELD_RECORD(ResultMetadata, ResultMetadata, accumulatedQueries)

ORZAVS_JNI_EXPORT(void, ResultMetadata_1clear)(JNIEnv* env, jclass, jlong self, jobject) {
  guarded(env, [&] { selfOf<ResultMetadata>(self).clear(); });
}

ORZAVS_JNI_EXPORT(jlong, new_1ObjectInfo_1_1SWIG_10)(JNIEnv* env, jclass, jint contentType) {
  return create<ObjectInfo>(env, static_cast<Tovra::ContentType>(contentType));
}

ORZAVS_JNI_EXPORT(jlong, new_1ObjectInfo_1_1SWIG_11)(JNIEnv* env, jclass) {
  return create<ObjectInfo>(env);
}

ORZAVS_DELETE(ObjectInfo, ObjectInfo)
ORZAVS_FIELD_VALUE(ObjectInfo, ObjectInfo, srcObjectModule, jint)
ORZAVS_FIELD_VALUE(ObjectInfo, ObjectInfo, contentType, jint)
ORZAVS_FIELD_STRING(ObjectInfo, ObjectInfo, content)
ORZAVS_FIELD_STRING(ObjectInfo, ObjectInfo, properties)
ORZAVS_FIELD_RECORD(ObjectInfo, ObjectInfo, subContents)
ORZAVS_FIELD_RECORD(ObjectInfo, ObjectInfo, location)

// ---- ServerResponse, ServerResponseHandler, ServerRequest ---------------------------------------

ORZAVS_NEW_DELETE(ServerResponse, ServerResponse)
ORZAVS_FIELD_STRING(ServerResponse, ServerResponse, id)
ORZAVS_FIELD_VALUE(ServerResponse, ServerResponse, responseCode, jint)
ORZAVS_FIELD_STRING(ServerResponse, ServerResponse, responseStr)
ORZAVS_FIELD_VALUE(ServerResponse, ServerResponse, roundtripTime, jdouble)
ORZAVS_FIELD_VALUE(ServerResponse, ServerResponse, compressed, jboolean)

ORZAVS_JNI_EXPORT(void, ServerResponseHandler_1handleServerResponse)(JNIEnv* env, jclass,
                                                                     jlong self, jobject,
                                                                     jlong response, jobject) {
  guarded(env, [&] {
    ServerResponseHandler& handler = selfOf<ServerResponseHandler>(self);
    handler.handleServerResponse(constRef<ServerResponse>(response));
  });
}

ORZAVS_DELETE(ServerResponseHandler, ServerResponseHandler)

ORZAVS_JNI_EXPORT(jlong, new_1ServerRequest_1_1SWIG_10)(JNIEnv* env, jclass) {
  return create<ServerRequest>(env);
}

namespace {

constexpr const char* kParamMapIsNull = "Tovra::Server::ServerRequest::ParamMap const & reference is null";

jlong newServerRequest(JNIEnv* env, jlong data, jstring id, const jlong* params, const jlong* metadata) {
  return guarded(env, [&] {
    const ByteArray& body = constRef<ByteArray>(data);
    const std::string requestId = toStdString(env, id);
    const ParamMap none;
    const ParamMap& p = params != nullptr ? deref<ParamMap>(*params, kParamMapIsNull) : none;
    const ParamMap& m = metadata != nullptr ? deref<ParamMap>(*metadata, kParamMapIsNull) : none;
    return toHandle(new ServerRequest(body, requestId, p, m));
  });
}

}  // namespace

ORZAVS_JNI_EXPORT(jlong, new_1ServerRequest_1_1SWIG_11)(JNIEnv* env, jclass, jlong data, jobject,
                                                        jstring id, jlong params, jobject,
                                                        jlong metadata, jobject) {
  return newServerRequest(env, data, id, &params, &metadata);
}

ORZAVS_JNI_EXPORT(jlong, new_1ServerRequest_1_1SWIG_12)(JNIEnv* env, jclass, jlong data, jobject,
                                                        jstring id, jlong params, jobject) {
  return newServerRequest(env, data, id, &params, nullptr);
}

ORZAVS_JNI_EXPORT(jlong, new_1ServerRequest_1_1SWIG_13)(JNIEnv* env, jclass, jlong data, jobject,
                                                        jstring id) {
  return newServerRequest(env, data, id, nullptr, nullptr);
}

ORZAVS_DELETE(ServerRequest, ServerRequest)
ORZAVS_FIELD_STRING(ServerRequest, ServerRequest, id)
ORZAVS_FIELD_RECORD(ServerRequest, ServerRequest, params)
ORZAVS_FIELD_RECORD(ServerRequest, ServerRequest, data)
ORZAVS_FIELD_RECORD(ServerRequest, ServerRequest, metadata)
ORZAVS_FIELD_POINTER(ServerRequest, ServerRequest, responseHandler)

ORZAVS_JNI_EXPORT(void, ServerRequest_1clear)(JNIEnv* env, jclass, jlong self, jobject) {
  guarded(env, [&] { selfOf<ServerRequest>(self).clear(); });
}

// ---- NEONAccelerationResult, MobileUtils --------------------------------------------------------

ORZAVS_NEW_DELETE(NEONAccelerationResult, NEONAccelerationResult)
ORZAVS_FIELD_STRING(NEONAccelerationResult, NEONAccelerationResult, resultStr)

ORZAVS_NEW_DELETE(MobileUtils, MobileUtils)

ORZAVS_JNI_EXPORT(jboolean, MobileUtils_1setupLogging)(JNIEnv* env, jclass, jstring path) {
  return guarded(env, [&] {
    return static_cast<jboolean>(MobileUtils::setupLogging(toStdString(env, path)));
  });
}

ORZAVS_JNI_EXPORT(jboolean, MobileUtils_1testNeonSupport)(JNIEnv* env, jclass) {
  return guarded(env, [&] { return static_cast<jboolean>(MobileUtils::testNeonSupport()); });
}

ORZAVS_JNI_EXPORT(jboolean, MobileUtils_1setupNeonFunctions)(JNIEnv* env, jclass) {
  return guarded(env, [&] { return static_cast<jboolean>(MobileUtils::setupNeonFunctions()); });
}

ORZAVS_JNI_EXPORT(void, MobileUtils_1testNeon)(JNIEnv* env, jclass, jlong result, jobject) {
  guarded(env, [&] { MobileUtils::testNeon(mutableRef<NEONAccelerationResult>(result)); });
}

// ---- free function ------------------------------------------------------------------------------

ORZAVS_JNI_EXPORT(jboolean, isYUVFormat)(JNIEnv*, jclass, jint format) {
  return static_cast<jboolean>(OrzaVSMobile::isYUVFormat(format));
}
