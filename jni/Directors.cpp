#include "jni/Directors.h"

#include <cstdio>
#include <string>
#include <tuple>
#include <type_traits>
#include <utility>

#include "jni/JniCall.h"
#include "types/DiagnosticOutput.h"

using orzavs::jni::toHandle;

namespace {

#define ORZAVS_JAVA_TYPE(name) "Lcom/orza/vs/mobile/library/impl/jni/" name ";"

const Swig::DirectorMethod kEventMethods[SwigDirector_EventDelegateBase::kOperationCount] = {
    {"didReceiveEvent", "(" ORZAVS_JAVA_TYPE("ObjectModuleID") ORZAVS_JAVA_TYPE("ContentType")
                            ORZAVS_JAVA_TYPE("ActionID") ORZAVS_JAVA_TYPE("StatusID") ")V"},
    {"didProcessFrame",
     "(" ORZAVS_JAVA_TYPE("ObjectModuleID") ORZAVS_JAVA_TYPE("StatusID") "JI)V"},
    {"didDetect", "(" ORZAVS_JAVA_TYPE("VectorOfObjectInfo") ")V"},
    {"didDecode",
     "(" ORZAVS_JAVA_TYPE("VectorOfObjectInfo") ORZAVS_JAVA_TYPE("ResultMetadata") ")V"},
    {"didDetectInterestPoints", "(" ORZAVS_JAVA_TYPE("VectorOfPoint2f") ")V"},
    {"didReceiveServerError",
     "(" ORZAVS_JAVA_TYPE("ObjectModuleID") ORZAVS_JAVA_TYPE("ResponseStatus") "I)V"},
    {"suggestDarkScene", "()V"},
    {"suggestBoringEvent", "()V"},
    {"showMessage", "(Ljava/lang/String;)V"},
    {"didProcessFrameDecision", "(" ORZAVS_JAVA_TYPE("CameraStabilityIssue") "D)V"},
    {"didProcessModuleDecision",
     "(" ORZAVS_JAVA_TYPE("ObjectModuleID") ORZAVS_JAVA_TYPE("JudgeVerdictOnModule") ")V"},
};
std::atomic<jmethodID> gEventMethodIds[SwigDirector_EventDelegateBase::kOperationCount];
Swig::DirectorClass gEventClass("com/orza/vs/mobile/library/impl/jni/EventDelegateBase",
                                kEventMethods, SwigDirector_EventDelegateBase::kOperationCount,
                                gEventMethodIds);

const Swig::DirectorMethod kServerMethods[SwigDirector_ServerDelegate::kOperationCount] = {
    {"sendServerRequest", "(" ORZAVS_JAVA_TYPE("ServerRequest") ")Z"},
    {"sendServerRequestImpl", "(" ORZAVS_JAVA_TYPE("ServerRequest") ")Z"},
};
std::atomic<jmethodID> gServerMethodIds[SwigDirector_ServerDelegate::kOperationCount];
Swig::DirectorClass gServerClass("com/orza/vs/mobile/library/impl/jni/ServerDelegate",
                                 kServerMethods, SwigDirector_ServerDelegate::kOperationCount,
                                 gServerMethodIds);

#undef ORZAVS_JAVA_TYPE

// How one native argument travels in an upcall: enumerations and numbers by value, vectors and
// the metadata as the address of the caller's object (borrowed by Java for the call), the
// message as a new Java string deleted when the upcall ends.
template <class T, class Enable = void>
struct UpcallArg;

template <class T>
struct UpcallArg<T, std::enable_if_t<std::is_enum_v<T>>> {
  UpcallArg(JNIEnv*, T value) : value_(static_cast<jint>(value)) {}
  jint get() const { return value_; }
  jint value_;
};

template <>
struct UpcallArg<int32_t> {
  UpcallArg(JNIEnv*, int32_t value) : value_(value) {}
  jint get() const { return value_; }
  jint value_;
};

template <>
struct UpcallArg<int64_t> {
  UpcallArg(JNIEnv*, int64_t value) : value_(value) {}
  jlong get() const { return value_; }
  jlong value_;
};

template <>
struct UpcallArg<double> {
  UpcallArg(JNIEnv*, double value) : value_(value) {}
  jdouble get() const { return value_; }
  jdouble value_;
};

template <class T>
struct UpcallArg<T, std::enable_if_t<std::is_class_v<T> && !std::is_same_v<T, std::string>>> {
  UpcallArg(JNIEnv*, const T& value) : value_(toHandle(&value)) {}
  jlong get() const { return value_; }
  jlong value_;
};

template <>
struct UpcallArg<std::string> {
  UpcallArg(JNIEnv* env, const std::string& value)
      : env_(env), value_(orzavs::jni::toJavaString(env, value)) {}
  UpcallArg(UpcallArg&& other) noexcept : env_(other.env_), value_(other.value_) {
    other.value_ = nullptr;
  }
  UpcallArg(const UpcallArg&) = delete;
  UpcallArg& operator=(const UpcallArg&) = delete;
  ~UpcallArg() {
    if (value_ != nullptr) env_->DeleteLocalRef(value_);
  }
  jstring get() const { return value_; }
  JNIEnv* env_;
  jstring value_;
};

constexpr const char* kEventScope = "Tovra::EventDelegateBase::";
constexpr const char* kServerScope = "Tovra::Server::ServerDelegate::";

std::string qualified(const char* scope, const char* operation) {
  return std::string(scope) + operation;
}

// The Java object for an upcall, or null after raising the null-upcall NullPointerException
// in the calling thread (the object was never set or has been collected, or the module's
// upcall table is missing).
jobject upcallTarget(JNIEnv* env, const Swig::Director& director, int upcallIndex,
                     const char* scope, const char* operation) {
  jobject self = director.swig_get_self(env);
  if (self != nullptr && !env->IsSameObject(self, nullptr) &&
      Swig::upcallMethod(upcallIndex) != nullptr) {
    return self;
  }
  if (self != nullptr) env->DeleteLocalRef(self);
  const std::string message = "null upcall object in " + qualified(scope, operation) + " ";
  Swig::throwJavaException(env, Swig::JavaNullPointerException, message.c_str());
  return nullptr;
}

void reportDetached(const char* scope, const char* operation) {
  OrzaVSMobile::reportLinef("Skipped callback %s%s: the thread cannot be attached to the Java VM",
                            scope, operation);
}

}  // namespace

// -----------------------------------------------------------------------------------------------
// SwigDirector_EventDelegateBase

SwigDirector_EventDelegateBase::SwigDirector_EventDelegateBase(JNIEnv* env)
    : Tovra::EventDelegateBase(), Swig::Director(env), overrideFlags() {}

SwigDirector_EventDelegateBase::~SwigDirector_EventDelegateBase() {
  swig_disconnect_director_self("swigDirectorDisconnect");
}

void SwigDirector_EventDelegateBase::swig_connect_director(JNIEnv* env, jobject jself, jclass jcls,
                                                           bool swigMemOwn, bool weakGlobal) {
  gEventClass.connect(env, *this, jself, jcls, swigMemOwn, weakGlobal, overrideFlags);
}

template <class BaseCall, class... Args>
void SwigDirector_EventDelegateBase::upcall(int flag, const char* operation, BaseCall&& baseCall,
                                            const Args&... args) {
  Swig::JNIEnvWrapper wrapper(this);
  if (!overrideFlags[flag]) {
    baseCall();
    return;
  }
  JNIEnv* env = wrapper.getJNIEnv();
  if (env == nullptr) {
    reportDetached(kEventScope, operation);
    return;
  }
  // The upcall index of each operation equals its flag index.
  jobject target = upcallTarget(env, *this, flag, kEventScope, operation);
  Swig::LocalRefGuard targetGuard(env, target);
  if (target != nullptr) {
    std::tuple<UpcallArg<Args>...> converted(UpcallArg<Args>(env, args)...);
    if (!env->ExceptionCheck()) {  // a failed string conversion leaves OutOfMemoryError
      std::apply(
          [&](const auto&... arg) {
            env->CallStaticVoidMethod(Swig::moduleClass(), Swig::upcallMethod(flag), target,
                                      arg.get()...);
          },
          converted);
    }
  }
  // The override's exception (or the null-upcall error) must not unwind through the engine:
  // it goes to the Java caller of the current native call, or is reported and dropped.
  if (env->ExceptionCheck()) {
    const std::string where = qualified(kEventScope, operation);
    orzavs::jni::parkPendingException(env, where.c_str());
  }
}

void SwigDirector_EventDelegateBase::didReceiveEvent(Tovra::ObjectModuleID module,
                                                     Tovra::ContentType contentType,
                                                     Tovra::ActionID action,
                                                     Tovra::StatusID status) {
  upcall(Swig::kEventDidReceiveEvent, "didReceiveEvent",
         [&] { EventDelegateBase::didReceiveEvent(module, contentType, action, status); }, module,
         contentType, action, status);
}

void SwigDirector_EventDelegateBase::didProcessFrame(Tovra::ObjectModuleID module,
                                                     Tovra::StatusID status, int64_t value64,
                                                     int32_t value32) {
  upcall(Swig::kEventDidProcessFrame, "didProcessFrame",
         [&] { EventDelegateBase::didProcessFrame(module, status, value64, value32); }, module,
         status, value64, value32);
}

void SwigDirector_EventDelegateBase::didDetect(const std::vector<Tovra::ObjectInfo>& objects) {
  upcall(Swig::kEventDidDetect, "didDetect", [&] { EventDelegateBase::didDetect(objects); },
         objects);
}

void SwigDirector_EventDelegateBase::didDecode(const std::vector<Tovra::ObjectInfo>& objects,
                                               const Tovra::ResultMetadata& metadata) {
  upcall(Swig::kEventDidDecode, "didDecode",
         [&] { EventDelegateBase::didDecode(objects, metadata); }, objects, metadata);
}

void SwigDirector_EventDelegateBase::didDetectInterestPoints(
    const std::vector<OrzaVSMobile::Point2f>& points) {
  upcall(Swig::kEventDidDetectInterestPoints, "didDetectInterestPoints",
         [&] { EventDelegateBase::didDetectInterestPoints(points); }, points);
}

void SwigDirector_EventDelegateBase::didReceiveServerError(Tovra::ObjectModuleID module,
                                                           Tovra::Server::ResponseStatus status,
                                                           int32_t responseCode) {
  upcall(Swig::kEventDidReceiveServerError, "didReceiveServerError",
         [&] { EventDelegateBase::didReceiveServerError(module, status, responseCode); }, module,
         status, responseCode);
}

void SwigDirector_EventDelegateBase::suggestDarkScene() {
  upcall(Swig::kEventSuggestDarkScene, "suggestDarkScene",
         [&] { EventDelegateBase::suggestDarkScene(); });
}

void SwigDirector_EventDelegateBase::suggestBoringEvent() {
  upcall(Swig::kEventSuggestBoringEvent, "suggestBoringEvent",
         [&] { EventDelegateBase::suggestBoringEvent(); });
}

void SwigDirector_EventDelegateBase::showMessage(const std::string& message) {
  upcall(Swig::kEventShowMessage, "showMessage", [&] { EventDelegateBase::showMessage(message); },
         message);
}

void SwigDirector_EventDelegateBase::didProcessFrameDecision(Tovra::CameraStabilityIssue issue,
                                                             double value) {
  upcall(Swig::kEventDidProcessFrameDecision, "didProcessFrameDecision",
         [&] { EventDelegateBase::didProcessFrameDecision(issue, value); }, issue, value);
}

void SwigDirector_EventDelegateBase::didProcessModuleDecision(Tovra::ObjectModuleID module,
                                                              Tovra::JudgeVerdictOnModule verdict) {
  upcall(Swig::kEventDidProcessModuleDecision, "didProcessModuleDecision",
         [&] { EventDelegateBase::didProcessModuleDecision(module, verdict); }, module, verdict);
}

// -----------------------------------------------------------------------------------------------
// SwigDirector_ServerDelegate

SwigDirector_ServerDelegate::SwigDirector_ServerDelegate(JNIEnv* env)
    : Tovra::Server::ServerDelegate(), Swig::Director(env), overrideFlags() {}

SwigDirector_ServerDelegate::~SwigDirector_ServerDelegate() {
  swig_disconnect_director_self("swigDirectorDisconnect");
}

void SwigDirector_ServerDelegate::swig_connect_director(JNIEnv* env, jobject jself, jclass jcls,
                                                        bool swigMemOwn, bool weakGlobal) {
  gServerClass.connect(env, *this, jself, jcls, swigMemOwn, weakGlobal, overrideFlags);
}

bool SwigDirector_ServerDelegate::upcall(int upcallIndex, const char* operation,
                                         const Tovra::Server::ServerRequest& request) {
  Swig::JNIEnvWrapper wrapper(this);
  JNIEnv* env = wrapper.getJNIEnv();
  if (env == nullptr) {
    reportDetached(kServerScope, operation);
    return false;
  }
  jobject target = upcallTarget(env, *this, upcallIndex, kServerScope, operation);
  Swig::LocalRefGuard targetGuard(env, target);
  if (target == nullptr) {
    const std::string where = qualified(kServerScope, operation);
    orzavs::jni::parkPendingException(env, where.c_str());
    return false;
  }
  const jboolean accepted = env->CallStaticBooleanMethod(
      Swig::moduleClass(), Swig::upcallMethod(upcallIndex), target, toHandle(&request));
  if (jthrowable thrown = env->ExceptionOccurred()) {
    env->ExceptionClear();
    Swig::DirectorException exception(env, thrown);
    // The engine catches this and gives the frame up, so the Java side would never see it: the
    // Java caller on this thread gets the same object when its call returns (nothing extra
    // when the exception reaches it directly), or, on the worker, the callback handler does.
    const std::string where = qualified(kServerScope, operation);
    orzavs::jni::parkException(env, thrown, where.c_str());
    env->DeleteLocalRef(thrown);
    throw exception;
  }
  return accepted != JNI_FALSE;
}

bool SwigDirector_ServerDelegate::sendServerRequest(const Tovra::Server::ServerRequest& request) {
  Swig::JNIEnvWrapper wrapper(this);
  if (!overrideFlags[0]) return ServerDelegate::sendServerRequest(request);
  return upcall(Swig::kServerSendServerRequest, "sendServerRequest", request);
}

bool SwigDirector_ServerDelegate::sendServerRequestImpl(const Tovra::Server::ServerRequest& request) {
  Swig::JNIEnvWrapper wrapper(this);
  if (overrideFlags[1]) return upcall(Swig::kServerSendServerRequestImpl, "sendServerRequestImpl", request);
  JNIEnv* env = wrapper.getJNIEnv();
  if (env != nullptr) {
    Swig::throwJavaException(
        env, Swig::JavaDirectorPureVirtual,
        "Attempted to invoke pure virtual method Tovra::Server::ServerDelegate::sendServerRequestImpl.");
    orzavs::jni::parkPendingException(env, "Tovra::Server::ServerDelegate::sendServerRequestImpl");
  }
  return false;
}
