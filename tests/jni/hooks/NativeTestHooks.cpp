// Native helpers for the Java tests of the binding: they call delegates the way the engine does,
// from a native thread that the Java VM does not know, and report what the thread's attachment
// looked like before and after. This library uses only the JNI function table and virtual calls
// on the handles Java passes; it needs nothing from libOrzaVSMobile at link time.

#include <jni.h>

#include <exception>
#include <string>
#include <thread>
#include <typeinfo>
#include <vector>

#include "jni/Handle.h"
#include "server/ServerDelegate.h"
#include "types/EventDelegateBase.h"

using orzavs::jni::fromHandle;

#define ORZAVS_TEST_HOOK(ret, name) \
  extern "C" JNIEXPORT ret JNICALL Java_com_orza_vs_mobile_library_impl_jni_NativeTestHooks_##name

namespace {

bool isAttached(JavaVM* vm) {
  void* env = nullptr;
  return vm->GetEnv(&env, JNI_VERSION_1_2) == JNI_OK;
}

// Runs `call` on a new native thread and describes it, as a Java string: "detached-before;" or
// "attached-before;", what `call` said, "threw=<type>:<what>;" if it threw a std::exception, and
// "detached-after" or "attached-after".
template <class Call>
jstring onNativeThread(JNIEnv* env, Call call) {
  JavaVM* vm = nullptr;
  env->GetJavaVM(&vm);
  std::string report;
  std::thread([&] {
    report += isAttached(vm) ? "attached-before;" : "detached-before;";
    try {
      report += call();
    } catch (const std::exception& e) {
      report += std::string("threw=") + typeid(e).name() + ":" + e.what() + ";";
    }
    report += isAttached(vm) ? "attached-after" : "detached-after";
  }).join();
  return env->NewStringUTF(report.c_str());
}

std::string fromJava(JNIEnv* env, jstring text) {
  if (text == nullptr) return std::string();
  const char* chars = env->GetStringUTFChars(text, nullptr);
  std::string result = chars != nullptr ? chars : "";
  if (chars != nullptr) env->ReleaseStringUTFChars(text, chars);
  return result;
}

}  // namespace

// showMessage(message) on a native thread.
ORZAVS_TEST_HOOK(jstring, showMessageOnNativeThread)(JNIEnv* env, jclass, jlong delegate, jstring message) {
  auto* target = fromHandle<Tovra::EventDelegateBase>(delegate);
  const std::string text = fromJava(env, message);
  return onNativeThread(env, [&] {
    target->showMessage(text);
    return std::string("called;");
  });
}

// didDecode on a native thread with `count` results ("result-0", ...; contentType 10 with a
// four-corner location) and metadata whose queryID is `queryId`.
ORZAVS_TEST_HOOK(jstring, didDecodeOnNativeThread)(JNIEnv* env, jclass, jlong delegate, jint count, jstring queryId) {
  auto* target = fromHandle<Tovra::EventDelegateBase>(delegate);
  std::vector<Tovra::ObjectInfo> results;
  for (int i = 0; i < count; ++i) {
    Tovra::ObjectInfo info(static_cast<Tovra::ContentType>(10));
    info.srcObjectModule = Tovra::VISUAL_SEARCH_SERVICE_MOD;
    info.content = "result-" + std::to_string(i);
    info.location = {{1.0f, 2.0f}, {3.0f, 2.0f}, {3.0f, 4.0f}, {1.0f, 4.0f}};
    results.push_back(info);
  }
  Tovra::ResultMetadata metadata;
  metadata.queryID = fromJava(env, queryId);
  metadata.accumulatedQueries = {"q-1", "q-2"};
  return onNativeThread(env, [&] {
    target->didDecode(results, metadata);
    return std::string("called;");
  });
}

// sendServerRequest of a request with id `id` on a native thread, as the engine's worker does.
ORZAVS_TEST_HOOK(jstring, sendRequestOnNativeThread)(JNIEnv* env, jclass, jlong delegate, jstring id) {
  auto* target = fromHandle<Tovra::Server::ServerDelegate>(delegate);
  Tovra::Server::ServerRequest request;
  request.id = fromJava(env, id);
  return onNativeThread(env, [&] {
    return std::string(target->sendServerRequest(request) ? "result=true;" : "result=false;");
  });
}

// showMessage(message) on the calling Java thread; true when the thread is still attached after.
ORZAVS_TEST_HOOK(jboolean, showMessageOnThisThread)(JNIEnv* env, jclass, jlong delegate, jstring message) {
  auto* target = fromHandle<Tovra::EventDelegateBase>(delegate);
  target->showMessage(fromJava(env, message));
  // A Java exception raised by the callback is returned to Java by the library's own frame
  // only inside its exported functions; here none may be pending.
  JavaVM* vm = nullptr;
  env->GetJavaVM(&vm);
  return static_cast<jboolean>(isAttached(vm) && !env->ExceptionCheck());
}
