#ifndef ORZAVS_JNI_DIRECTORS_H
#define ORZAVS_JNI_DIRECTORS_H

#include <jni.h>

#include "jni/SwigRuntime.h"
#include "server/ServerDelegate.h"
#include "types/EventDelegateBase.h"

// Native classes whose operations a Java subclass of the matching proxy implements.
//
// Where a Java override's exception goes. The engine calls the event delegate in the middle of
// its own work (interest points with its lock held and a frame half processed; decode results
// while a reply is being settled), so an exception unwinding from an event callback would leave
// that work undone. The event director is therefore the boundary: a Java exception from an
// event override is parked in the current call from Java and rethrown there when that call
// returns (process(), pushServerResponse(), or a direct call of the delegate) as the very same
// Java object, or handed to the application's callback exception handler on a native thread. The engine's sends, by contrast, are built to fail: the visual
// search job catches what sendServerRequest throws and gives the frame up, so the server
// director throws Swig::DirectorException to its native caller as a director does; when the
// caller is an exported function, the exception goes back into Java.

class SwigDirector_EventDelegateBase : public Tovra::EventDelegateBase, public Swig::Director {
 public:
  static constexpr int kOperationCount = 11;

  explicit SwigDirector_EventDelegateBase(JNIEnv* env);
  ~SwigDirector_EventDelegateBase() override;

  void didReceiveEvent(Tovra::ObjectModuleID module, Tovra::ContentType contentType,
                       Tovra::ActionID action, Tovra::StatusID status) override;
  void didProcessFrame(Tovra::ObjectModuleID module, Tovra::StatusID status, int64_t value64,
                       int32_t value32) override;
  void didDetect(const std::vector<Tovra::ObjectInfo>& objects) override;
  void didDecode(const std::vector<Tovra::ObjectInfo>& objects,
                 const Tovra::ResultMetadata& metadata) override;
  void didDetectInterestPoints(const std::vector<OrzaVSMobile::Point2f>& points) override;
  void didReceiveServerError(Tovra::ObjectModuleID module, Tovra::Server::ResponseStatus status,
                             int32_t responseCode) override;
  void suggestDarkScene() override;
  void suggestBoringEvent() override;
  void showMessage(const std::string& message) override;
  void didProcessFrameDecision(Tovra::CameraStabilityIssue issue, double value) override;
  void didProcessModuleDecision(Tovra::ObjectModuleID module,
                                Tovra::JudgeVerdictOnModule verdict) override;

  void swig_connect_director(JNIEnv* env, jobject jself, jclass jcls, bool swigMemOwn,
                             bool weakGlobal);
  bool swig_overrides(int n) const noexcept {
    return n >= 0 && n < kOperationCount && overrideFlags[n];
  }

 private:
  template <class BaseCall, class... Args>
  void upcall(int flag, const char* operation, BaseCall&& baseCall, const Args&... args);

  bool overrideFlags[kOperationCount];
};

class SwigDirector_ServerDelegate : public Tovra::Server::ServerDelegate, public Swig::Director {
 public:
  static constexpr int kOperationCount = 2;

  explicit SwigDirector_ServerDelegate(JNIEnv* env);
  ~SwigDirector_ServerDelegate() override;

  bool sendServerRequest(const Tovra::Server::ServerRequest& request) override;
  bool sendServerRequestImpl(const Tovra::Server::ServerRequest& request) override;

  void swig_connect_director(JNIEnv* env, jobject jself, jclass jcls, bool swigMemOwn,
                             bool weakGlobal);
  bool swig_overrides(int n) const noexcept {
    return n >= 0 && n < kOperationCount && overrideFlags[n];
  }

 private:
  bool upcall(int upcallIndex, const char* operation, const Tovra::Server::ServerRequest& request);

  bool overrideFlags[kOperationCount];
};

#endif
