// Exported functions of the two delegates (their directors and the server classes), the engine
// facade, and the module's start-up.

#include <jni.h>

#include <string>

#include "jni/DiagnosticsListener.h"
#include "jni/Directors.h"
#include "jni/FrameNatives.h"
#include "jni/TypeNames.h"

using namespace orzavs::jni;

using OrzaVSMobile::ExtraFrameData;
using OrzaVSMobile::ImageBuffer;
using Tovra::EventDelegateBase;
using Tovra::ObjectInfo;
using Tovra::ResultMetadata;
using Tovra::TovraStateEngineFacade;
using Tovra::Server::ServerDelegate;
using Tovra::Server::ServerDelegateInterface;
using Tovra::Server::ServerRequest;
using Tovra::Server::ServerResponse;

namespace {

constexpr const char* kObjectsIsNull = "std::vector< Tovra::ObjectInfo > const & reference is null";
constexpr const char* kPointsIsNull = "std::vector< OrzaVSMobile::Point2f > const & reference is null";

inline bool isJavaTrue(jboolean value) { return value == JNI_TRUE; }

// The connect step of a director class. A handle that is not a director, or a null Java object,
// connects nothing.
template <class DirectorType, class Base>
void connectDirector(JNIEnv* env, jobject jself, jlong handle, jboolean memOwn, jboolean weak) {
  guarded(env, [&] {
    auto* director = dynamic_cast<DirectorType*>(fromHandle<Base>(handle));
    if (director == nullptr || jself == nullptr) return;
    jclass cls = env->GetObjectClass(jself);
    Swig::LocalRefGuard classGuard(env, cls);
    director->swig_connect_director(env, jself, cls, isJavaTrue(memOwn), isJavaTrue(weak));
  });
}

template <class Base>
void changeOwnership(JNIEnv* env, jobject jself, jlong handle, jboolean takeOrRelease) {
  guarded(env, [&] {
    auto* director = dynamic_cast<Swig::Director*>(fromHandle<Base>(handle));
    if (director == nullptr || jself == nullptr) return;
    director->swig_java_change_ownership(env, jself, isJavaTrue(takeOrRelease));
  });
}

}  // namespace

// ---- module ---------------------------------------------------------------------------------------

ORZAVS_JNI_EXPORT(void, swig_1module_1init)(JNIEnv* env, jclass cls) {
  Swig::initModule(env, cls);
  orzavs::jni::registerDiagnosticsNatives(env);
  registerFrameNatives(env);
}

// ---- EventDelegateBase ----------------------------------------------------------------------------

ORZAVS_JNI_EXPORT(jlong, new_1EventDelegateBase)(JNIEnv* env, jclass) {
  return guarded(env, [&] {
    return toHandle(static_cast<EventDelegateBase*>(new SwigDirector_EventDelegateBase(env)));
  });
}

ORZAVS_DELETE(EventDelegateBase, EventDelegateBase)

ORZAVS_JNI_EXPORT(void, EventDelegateBase_1director_1connect)(JNIEnv* env, jclass, jobject jself,
                                                              jlong self, jboolean memOwn,
                                                              jboolean weak) {
  connectDirector<SwigDirector_EventDelegateBase, EventDelegateBase>(env, jself, self, memOwn, weak);
}

ORZAVS_JNI_EXPORT(void, EventDelegateBase_1change_1ownership)(JNIEnv* env, jclass, jobject jself,
                                                              jlong self, jboolean take) {
  changeOwnership<EventDelegateBase>(env, jself, self, take);
}

// Each operation twice: the virtual call (which reaches a Java override through the director)
// and the base class's own implementation (what a Java override's super call reaches).
// `params` are the JNI parameters after the proxy object, the rest the native arguments.
#define ORZAVS_EVENT_OPERATION(op, params, ...)                                                     \
  ORZAVS_JNI_EXPORT(void, EventDelegateBase_1##op)(JNIEnv * env, jclass, jlong self, jobject params) { \
    guarded(env, [&] {                                                                            \
      EventDelegateBase& delegate = selfOf<EventDelegateBase>(self);                              \
      delegate.op(__VA_ARGS__);                                                                   \
    });                                                                                           \
  }                                                                                               \
  ORZAVS_JNI_EXPORT(void, EventDelegateBase_1##op##SwigExplicitEventDelegateBase)                 \
  (JNIEnv * env, jclass, jlong self, jobject params) {                                            \
    guarded(env, [&] {                                                                            \
      EventDelegateBase& delegate = selfOf<EventDelegateBase>(self);                              \
      delegate.EventDelegateBase::op(__VA_ARGS__);                                                \
    });                                                                                           \
  }

#define ORZAVS_PARAMS(...) , __VA_ARGS__
#define ORZAVS_NO_PARAMS

ORZAVS_EVENT_OPERATION(didReceiveEvent,
                       ORZAVS_PARAMS(jint module, jint contentType, jint action, jint status),
                       static_cast<Tovra::ObjectModuleID>(module),
                       static_cast<Tovra::ContentType>(contentType),
                       static_cast<Tovra::ActionID>(action), static_cast<Tovra::StatusID>(status))
ORZAVS_EVENT_OPERATION(didProcessFrame,
                       ORZAVS_PARAMS(jint module, jint status, jlong value64, jint value32),
                       static_cast<Tovra::ObjectModuleID>(module),
                       static_cast<Tovra::StatusID>(status), static_cast<int64_t>(value64),
                       static_cast<int32_t>(value32))
ORZAVS_EVENT_OPERATION(didDetect, ORZAVS_PARAMS(jlong objects, jobject),
                       deref<const std::vector<ObjectInfo>>(objects, kObjectsIsNull))
ORZAVS_EVENT_OPERATION(didDecode,
                       ORZAVS_PARAMS(jlong objects, jobject, jlong metadata, jobject),
                       deref<const std::vector<ObjectInfo>>(objects, kObjectsIsNull),
                       constRef<ResultMetadata>(metadata))
ORZAVS_EVENT_OPERATION(didDetectInterestPoints, ORZAVS_PARAMS(jlong points, jobject),
                       deref<const std::vector<OrzaVSMobile::Point2f>>(points, kPointsIsNull))
ORZAVS_EVENT_OPERATION(didReceiveServerError,
                       ORZAVS_PARAMS(jint module, jint status, jint responseCode),
                       static_cast<Tovra::ObjectModuleID>(module),
                       static_cast<Tovra::Server::ResponseStatus>(status),
                       static_cast<int32_t>(responseCode))
ORZAVS_EVENT_OPERATION(suggestDarkScene, ORZAVS_NO_PARAMS, )
ORZAVS_EVENT_OPERATION(suggestBoringEvent, ORZAVS_NO_PARAMS, )
ORZAVS_EVENT_OPERATION(showMessage, ORZAVS_PARAMS(jstring message), toStdString(env, message))
ORZAVS_EVENT_OPERATION(didProcessFrameDecision, ORZAVS_PARAMS(jint issue, jdouble value),
                       static_cast<Tovra::CameraStabilityIssue>(issue), value)
ORZAVS_EVENT_OPERATION(didProcessModuleDecision, ORZAVS_PARAMS(jint module, jint verdict),
                       static_cast<Tovra::ObjectModuleID>(module),
                       static_cast<Tovra::JudgeVerdictOnModule>(verdict))

#undef ORZAVS_EVENT_OPERATION
#undef ORZAVS_PARAMS
#undef ORZAVS_NO_PARAMS

// ---- ServerDelegate, ServerDelegateInterface -----------------------------------------------------

ORZAVS_JNI_EXPORT(jlong, new_1ServerDelegate)(JNIEnv* env, jclass) {
  return guarded(env, [&] {
    return toHandle(static_cast<ServerDelegate*>(new SwigDirector_ServerDelegate(env)));
  });
}

ORZAVS_DELETE(ServerDelegate, ServerDelegate)

ORZAVS_JNI_EXPORT(void, ServerDelegate_1director_1connect)(JNIEnv* env, jclass, jobject jself,
                                                           jlong self, jboolean memOwn,
                                                           jboolean weak) {
  connectDirector<SwigDirector_ServerDelegate, ServerDelegate>(env, jself, self, memOwn, weak);
}

ORZAVS_JNI_EXPORT(void, ServerDelegate_1change_1ownership)(JNIEnv* env, jclass, jobject jself,
                                                           jlong self, jboolean take) {
  changeOwnership<ServerDelegate>(env, jself, self, take);
}

ORZAVS_JNI_EXPORT(jboolean, ServerDelegate_1sendServerRequest)(JNIEnv* env, jclass, jlong self,
                                                               jobject, jlong request, jobject) {
  return guarded(env, [&] {
    ServerDelegate& delegate = selfOf<ServerDelegate>(self);
    return static_cast<jboolean>(delegate.sendServerRequest(constRef<ServerRequest>(request)));
  });
}

ORZAVS_JNI_EXPORT(jboolean, ServerDelegate_1sendServerRequestSwigExplicitServerDelegate)(
    JNIEnv* env, jclass, jlong self, jobject, jlong request, jobject) {
  return guarded(env, [&] {
    ServerDelegate& delegate = selfOf<ServerDelegate>(self);
    return static_cast<jboolean>(
        delegate.ServerDelegate::sendServerRequest(constRef<ServerRequest>(request)));
  });
}

ORZAVS_JNI_EXPORT(jboolean, ServerDelegate_1sendServerRequestImpl)(JNIEnv* env, jclass, jlong self,
                                                                   jobject, jlong request, jobject) {
  return guarded(env, [&] {
    ServerDelegate& delegate = selfOf<ServerDelegate>(self);
    return static_cast<jboolean>(delegate.sendServerRequestImpl(constRef<ServerRequest>(request)));
  });
}

ORZAVS_JNI_EXPORT(void, ServerDelegate_1pushServerResponse)(JNIEnv* env, jclass, jlong self, jobject,
                                                            jlong response, jobject) {
  guarded(env, [&] {
    ServerDelegate& delegate = selfOf<ServerDelegate>(self);
    delegate.pushServerResponse(constRef<ServerResponse>(response));
  });
}

ORZAVS_JNI_EXPORT(jlong, ServerDelegate_1SWIGUpcast)(JNIEnv*, jclass, jlong self) {
  return toHandle(static_cast<ServerDelegateInterface*>(fromHandle<ServerDelegate>(self)));
}

ORZAVS_JNI_EXPORT(jboolean, ServerDelegateInterface_1sendServerRequest)(JNIEnv* env, jclass,
                                                                        jlong self, jobject,
                                                                        jlong request, jobject) {
  return guarded(env, [&] {
    ServerDelegateInterface& delegate = selfOf<ServerDelegateInterface>(self);
    return static_cast<jboolean>(delegate.sendServerRequest(constRef<ServerRequest>(request)));
  });
}

ORZAVS_DELETE(ServerDelegateInterface, ServerDelegateInterface)

// ---- TovraStateEngineFacade -----------------------------------------------------------------------

namespace {

using Facade = TovraStateEngineFacade;
using StringMap = std::map<std::string, std::string>;

Facade& facadeOf(jlong handle) { return selfOf<Facade>(handle); }

}  // namespace

ORZAVS_JNI_EXPORT(jlong, new_1TovraStateEngineFacade)(JNIEnv* env, jclass, jlong eventDelegate,
                                                      jobject) {
  return create<Facade>(env, fromHandle<EventDelegateBase>(eventDelegate));
}

ORZAVS_DELETE(TovraStateEngineFacade, Facade)

// Operations without arguments, one line each.
#define ORZAVS_FACADE_OPERATION(op)                                                                 \
  ORZAVS_JNI_EXPORT(void, TovraStateEngineFacade_1##op)(JNIEnv * env, jclass, jlong self, jobject) { \
    guarded(env, [&] { facadeOf(self).op(); });                                                   \
  }

ORZAVS_FACADE_OPERATION(startEngine)
ORZAVS_FACADE_OPERATION(stopEngine)
ORZAVS_FACADE_OPERATION(pauseEngine)
ORZAVS_FACADE_OPERATION(resumeEngine)
ORZAVS_FACADE_OPERATION(enableSingleImageMode)
ORZAVS_FACADE_OPERATION(disableSingleImageMode)
ORZAVS_FACADE_OPERATION(removeAllObjectModules)
ORZAVS_FACADE_OPERATION(enableEventLogging)

#undef ORZAVS_FACADE_OPERATION

ORZAVS_JNI_EXPORT(void, TovraStateEngineFacade_1process_1_1SWIG_10)(JNIEnv* env, jclass, jlong self,
                                                                    jobject, jlong image, jobject,
                                                                    jlong extra, jobject) {
  guarded(env, [&] {
    Facade& facade = facadeOf(self);
    facade.process(mutableRef<ImageBuffer>(image), mutableRef<ExtraFrameData>(extra));
  });
}

ORZAVS_JNI_EXPORT(void, TovraStateEngineFacade_1process_1_1SWIG_11)(JNIEnv* env, jclass, jlong self,
                                                                    jobject, jstring frameKey,
                                                                    jlong image, jobject, jlong extra,
                                                                    jobject) {
  guarded(env, [&] {
    Facade& facade = facadeOf(self);
    const std::string key = toStdString(env, frameKey);
    facade.process(key, mutableRef<ImageBuffer>(image), mutableRef<ExtraFrameData>(extra));
  });
}

ORZAVS_JNI_EXPORT(void, TovraStateEngineFacade_1processSingleImage)(JNIEnv* env, jclass, jlong self,
                                                                    jobject, jlong image, jobject,
                                                                    jlong extra, jobject) {
  guarded(env, [&] {
    Facade& facade = facadeOf(self);
    facade.processSingleImage(mutableRef<ImageBuffer>(image), mutableRef<ExtraFrameData>(extra));
  });
}

// The frame key is an in-out string: Java passes a one-element String array, whose element (null
// counts as empty) goes in and receives the key. A null or empty array raises, as a null
// reference would.
ORZAVS_JNI_EXPORT(void, TovraStateEngineFacade_1requestImageBuffer)(JNIEnv* env, jclass, jlong self,
                                                                    jobject, jlong buffer, jobject,
                                                                    jobjectArray frameKey) {
  guarded(env, [&] {
    Facade& facade = facadeOf(self);
    ImageBuffer& image = mutableRef<ImageBuffer>(buffer);
    if (frameKey == nullptr) raise(Swig::JavaNullPointerException, "std::string & reference is null");
    if (env->GetArrayLength(frameKey) < 1) {
      raise(Swig::JavaIndexOutOfBoundsException, "std::string & array must hold one element");
    }
    std::string key;
    {
      auto current = static_cast<jstring>(env->GetObjectArrayElement(frameKey, 0));
      Swig::LocalRefGuard currentGuard(env, current);
      if (current != nullptr) key = toStdString(env, current);
    }
    facade.requestImageBuffer(image, key);
    jstring result = toJavaString(env, key);
    if (result == nullptr) throw JavaPending{};
    Swig::LocalRefGuard resultGuard(env, result);
    env->SetObjectArrayElement(frameKey, 0, result);  // an ArrayStoreException stays pending
  });
}

ORZAVS_JNI_EXPORT(void, TovraStateEngineFacade_1addObjectModule_1_1SWIG_10)(JNIEnv* env, jclass,
                                                                            jlong self, jobject,
                                                                            jint id, jlong delegate,
                                                                            jobject) {
  guarded(env, [&] {
    facadeOf(self).addObjectModule(static_cast<Tovra::ObjectModuleID>(id),
                                   fromHandle<ServerDelegate>(delegate));
  });
}

ORZAVS_JNI_EXPORT(void, TovraStateEngineFacade_1addObjectModule_1_1SWIG_11)(JNIEnv* env, jclass,
                                                                            jlong self, jobject,
                                                                            jint id, jlong delegate,
                                                                            jobject, jstring props) {
  guarded(env, [&] {
    Facade& facade = facadeOf(self);
    const std::string properties = toStdString(env, props);
    facade.addObjectModule(static_cast<Tovra::ObjectModuleID>(id),
                           fromHandle<ServerDelegate>(delegate), properties);
  });
}

ORZAVS_JNI_EXPORT(void, TovraStateEngineFacade_1addObjectModule_1_1SWIG_12)(JNIEnv* env, jclass,
                                                                            jlong self, jobject,
                                                                            jint id, jlong props,
                                                                            jobject) {
  guarded(env, [&] {
    Facade& facade = facadeOf(self);
    facade.addObjectModule(static_cast<Tovra::ObjectModuleID>(id), constRef<StringMap>(props));
  });
}

ORZAVS_JNI_EXPORT(void, TovraStateEngineFacade_1removeObjectModule)(JNIEnv* env, jclass, jlong self,
                                                                    jobject, jint id) {
  guarded(env, [&] { facadeOf(self).removeObjectModule(static_cast<Tovra::ObjectModuleID>(id)); });
}

ORZAVS_JNI_EXPORT(void, TovraStateEngineFacade_1readProps)(JNIEnv* env, jclass, jlong self, jobject,
                                                           jstring props) {
  guarded(env, [&] {
    Facade& facade = facadeOf(self);
    facade.readProps(toStdString(env, props));
  });
}

ORZAVS_JNI_EXPORT(void, TovraStateEngineFacade_1readObjectModuleProps_1_1SWIG_10)(
    JNIEnv* env, jclass, jlong self, jobject, jint id, jstring props) {
  guarded(env, [&] {
    Facade& facade = facadeOf(self);
    facade.readObjectModuleProps(static_cast<Tovra::ObjectModuleID>(id), toStdString(env, props));
  });
}

ORZAVS_JNI_EXPORT(void, TovraStateEngineFacade_1readObjectModuleProps_1_1SWIG_11)(
    JNIEnv* env, jclass, jlong self, jobject, jlong props, jobject) {
  guarded(env, [&] {
    Facade& facade = facadeOf(self);
    facade.readObjectModuleProps(constRef<StringMap>(props));
  });
}

ORZAVS_JNI_EXPORT(void, TovraStateEngineFacade_1getCameraResRequirement)(JNIEnv* env, jclass,
                                                                         jlong self, jobject,
                                                                         jlong out, jobject) {
  guarded(env, [&] {
    Facade& facade = facadeOf(self);
    facade.getCameraResRequirement(mutableRef<Tovra::CameraResRequirement>(out));
  });
}

ORZAVS_JNI_EXPORT(void, TovraStateEngineFacade_1getAndClearMetrics)(JNIEnv* env, jclass, jlong self,
                                                                    jobject, jlong counts, jobject,
                                                                    jlong values, jobject) {
  guarded(env, [&] {
    Facade& facade = facadeOf(self);
    facade.getAndClearMetrics(mutableRef<std::map<std::string, unsigned int>>(counts),
                              mutableRef<std::map<std::string, double>>(values));
  });
}

ORZAVS_JNI_EXPORT(void, TovraStateEngineFacade_1saveEventLog)(JNIEnv* env, jclass, jlong self,
                                                              jobject, jstring path) {
  guarded(env, [&] {
    Facade& facade = facadeOf(self);
    facade.saveEventLog(toStdString(env, path));
  });
}
