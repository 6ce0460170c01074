#include "jni/SwigRuntime.h"

#include <algorithm>

#include "jni/JniCall.h"

namespace Swig {

// ---------------------------------------------------------------------------------------------
// Exceptions

namespace {

struct ExceptionRow {
  int code;
  const char* javaClass;
};

const ExceptionRow kExceptionTable[] = {
    {JavaOutOfMemoryError, "java/lang/OutOfMemoryError"},
    {JavaIOException, "java/io/IOException"},
    {JavaRuntimeException, "java/lang/RuntimeException"},
    {JavaIndexOutOfBoundsException, "java/lang/IndexOutOfBoundsException"},
    {JavaArithmeticException, "java/lang/ArithmeticException"},
    {JavaIllegalArgumentException, "java/lang/IllegalArgumentException"},
    {JavaNullPointerException, "java/lang/NullPointerException"},
    {JavaDirectorPureVirtual, "java/lang/RuntimeException"},
    {JavaUnknownError, "java/lang/UnknownError"},
    {0, "java/lang/UnknownError"},  // every other code
};

}  // namespace

const char* javaExceptionClass(int code) noexcept {
  const ExceptionRow* row = kExceptionTable;
  while (row->code != code && row->code != 0) ++row;
  return row->javaClass;
}

void throwJavaException(JNIEnv* env, int code, const char* message) noexcept {
  env->ExceptionClear();
  jclass cls = env->FindClass(javaExceptionClass(code));
  if (cls == nullptr) return;  // its NoClassDefFoundError stays pending
  // ThrowNew takes modified UTF-8; a message built from other bytes is converted first.
  std::string text;
  try {
    text = orzavs::jni::javaSafeText(message != nullptr ? message : "");
  } catch (...) {
    text = "(message lost: out of memory)";
  }
  env->ThrowNew(cls, text.c_str());
  env->DeleteLocalRef(cls);
}

// ---------------------------------------------------------------------------------------------
// Module state

namespace {

const DirectorMethod kUpcalls[kUpcallCount] = {
    {"SwigDirector_EventDelegateBase_didReceiveEvent",
     "(Lcom/orza/vs/mobile/library/impl/jni/EventDelegateBase;IIII)V"},
    {"SwigDirector_EventDelegateBase_didProcessFrame",
     "(Lcom/orza/vs/mobile/library/impl/jni/EventDelegateBase;IIJI)V"},
    {"SwigDirector_EventDelegateBase_didDetect",
     "(Lcom/orza/vs/mobile/library/impl/jni/EventDelegateBase;J)V"},
    {"SwigDirector_EventDelegateBase_didDecode",
     "(Lcom/orza/vs/mobile/library/impl/jni/EventDelegateBase;JJ)V"},
    {"SwigDirector_EventDelegateBase_didDetectInterestPoints",
     "(Lcom/orza/vs/mobile/library/impl/jni/EventDelegateBase;J)V"},
    {"SwigDirector_EventDelegateBase_didReceiveServerError",
     "(Lcom/orza/vs/mobile/library/impl/jni/EventDelegateBase;III)V"},
    {"SwigDirector_EventDelegateBase_suggestDarkScene",
     "(Lcom/orza/vs/mobile/library/impl/jni/EventDelegateBase;)V"},
    {"SwigDirector_EventDelegateBase_suggestBoringEvent",
     "(Lcom/orza/vs/mobile/library/impl/jni/EventDelegateBase;)V"},
    {"SwigDirector_EventDelegateBase_showMessage",
     "(Lcom/orza/vs/mobile/library/impl/jni/EventDelegateBase;Ljava/lang/String;)V"},
    {"SwigDirector_EventDelegateBase_didProcessFrameDecision",
     "(Lcom/orza/vs/mobile/library/impl/jni/EventDelegateBase;ID)V"},
    {"SwigDirector_EventDelegateBase_didProcessModuleDecision",
     "(Lcom/orza/vs/mobile/library/impl/jni/EventDelegateBase;II)V"},
    {"SwigDirector_ServerDelegate_sendServerRequest",
     "(Lcom/orza/vs/mobile/library/impl/jni/ServerDelegate;J)Z"},
    {"SwigDirector_ServerDelegate_sendServerRequestImpl",
     "(Lcom/orza/vs/mobile/library/impl/jni/ServerDelegate;J)Z"},
};

// Written while Java initialises OrzaVSMobileJNI (before any director exists), read by every
// upcall on any thread. Atomics make the hand-over explicit: the identifiers are stored before
// the class is published, and readers load the class first.
std::atomic<jclass> gModuleClass{nullptr};
std::atomic<jmethodID> gUpcallMethods[kUpcallCount];

}  // namespace

void initModule(JNIEnv* env, jclass jniClass) noexcept {
  jclass global = static_cast<jclass>(env->NewGlobalRef(jniClass));
  if (global == nullptr) return;
  for (int i = 0; i < kUpcallCount; ++i) {
    jmethodID id = env->GetStaticMethodID(global, kUpcalls[i].name, kUpcalls[i].signature);
    if (id == nullptr) break;  // NoSuchMethodError stays pending for the Java caller
    gUpcallMethods[i].store(id, std::memory_order_relaxed);
  }
  // A second initialisation (the class loaded again by another class loader) takes over; the
  // previous global reference is kept, as upcalls on other threads may still be using it.
  gModuleClass.store(global, std::memory_order_release);
}

jclass moduleClass() noexcept { return gModuleClass.load(std::memory_order_acquire); }

jmethodID upcallMethod(int index) noexcept {
  if (index < 0 || index >= kUpcallCount) return nullptr;
  if (moduleClass() == nullptr) return nullptr;
  return gUpcallMethods[index].load(std::memory_order_relaxed);
}

// ---------------------------------------------------------------------------------------------
// Scope helpers

JavaString::JavaString(JNIEnv* env, jstring string) noexcept
    : env_(env), string_(string), chars_(nullptr) {
  if (string_ != nullptr) chars_ = env_->GetStringUTFChars(string_, nullptr);
}

JavaString::~JavaString() {
  if (chars_ != nullptr) env_->ReleaseStringUTFChars(string_, chars_);
}

// ---------------------------------------------------------------------------------------------
// JObjectWrapper

bool JObjectWrapper::set(JNIEnv* env, jobject object, bool memOwn, bool weakGlobal) {
  if (ref != nullptr) return false;
  isWeak = !memOwn || weakGlobal;
  if (object != nullptr) ref = isWeak ? env->NewWeakGlobalRef(object) : env->NewGlobalRef(object);
  return true;
}

jobject JObjectWrapper::get(JNIEnv* env) const {
  // A collected referent gives a null local reference.
  return ref != nullptr ? env->NewLocalRef(ref) : nullptr;
}

void JObjectWrapper::release(JNIEnv* env) {
  if (ref != nullptr) {
    // A weak reference is deleted whether or not its referent has been collected: deleting a
    // cleared weak reference is valid, and keeping it would leak the reference slot.
    if (isWeak) {
      env->DeleteWeakGlobalRef(static_cast<jweak>(ref));
    } else {
      env->DeleteGlobalRef(ref);
    }
  }
  ref = nullptr;
  isWeak = true;
}

void JObjectWrapper::java_change_ownership(JNIEnv* env, jobject jself, bool takeOrRelease) {
  if (takeOrRelease == isWeak) return;  // already the asked kind
  jobject replacement = takeOrRelease ? env->NewWeakGlobalRef(jself) : env->NewGlobalRef(jself);
  if (ref != nullptr) {
    if (isWeak) {
      env->DeleteWeakGlobalRef(static_cast<jweak>(ref));
    } else {
      env->DeleteGlobalRef(ref);
    }
  }
  ref = replacement;
  isWeak = takeOrRelease;
}

// ---------------------------------------------------------------------------------------------
// Director

Director::Director(JNIEnv* env) {
  if (env->GetJavaVM(&jvm) != JNI_OK) jvm = nullptr;
}

Director::~Director() {
  JNIEnvWrapper wrapper(this);
  if (JNIEnv* env = wrapper.getJNIEnv()) self.release(env);
}

void Director::swig_disconnect_director_self(const char* methodName) {
  JNIEnvWrapper wrapper(this);
  JNIEnv* env = wrapper.getJNIEnv();
  if (env == nullptr) return;
  jobject object = self.get(env);
  LocalRefGuard objectGuard(env, object);
  if (object == nullptr || env->IsSameObject(object, nullptr)) return;
  jclass cls = env->GetObjectClass(object);
  LocalRefGuard classGuard(env, cls);
  jmethodID method = env->GetMethodID(cls, methodName, "()V");
  if (method != nullptr) env->CallVoidMethod(object, method);
  // This runs inside a destructor: neither a missing method nor an exception from it can be
  // reported, and none may stay pending into the JNI calls that follow.
  env->ExceptionClear();
}

// ---------------------------------------------------------------------------------------------
// JNIEnvWrapper

namespace {

// The JDK's jni.h declares AttachCurrentThread with a void** out-parameter, Android's with
// JNIEnv**; the parameter type is taken from whichever header is in use.
template <class EnvOut>
jint attachCurrentThread(JavaVM* vm, JNIEnv** env, jint (JavaVM::*attach)(EnvOut, void*)) {
  return (vm->*attach)(reinterpret_cast<EnvOut>(env), nullptr);
}

}  // namespace

JNIEnvWrapper::JNIEnvWrapper(const Director* director) : director_(director) {
  JavaVM* vm = director_->swig_get_jvm();
  if (vm == nullptr) return;
  void* current = nullptr;
  envStatus_ = vm->GetEnv(&current, JNI_VERSION_1_2);
  // Attaching an attached thread is harmless and returns its environment.
  JNIEnv* env = nullptr;
  if (attachCurrentThread(vm, &env, &JavaVM::AttachCurrentThread) == JNI_OK) env_ = env;
}

JNIEnvWrapper::~JNIEnvWrapper() {
  if (envStatus_ == JNI_EDETACHED && env_ != nullptr) director_->swig_get_jvm()->DetachCurrentThread();
}

// ---------------------------------------------------------------------------------------------
// DirectorException

namespace {

// The result of a no-argument String method, or empty when it fails or returns null; any
// exception raised while asking is cleared.
bool callStringMethod(JNIEnv* env, jobject object, const char* name, std::string& out) {
  jclass cls = env->GetObjectClass(object);
  if (cls == nullptr) {
    env->ExceptionClear();
    return false;
  }
  jmethodID method = env->GetMethodID(cls, name, "()Ljava/lang/String;");
  env->DeleteLocalRef(cls);
  if (method == nullptr) {
    env->ExceptionClear();
    return false;
  }
  jstring value = static_cast<jstring>(env->CallObjectMethod(object, method));
  if (env->ExceptionCheck()) {
    env->ExceptionClear();
    if (value != nullptr) env->DeleteLocalRef(value);
    return false;
  }
  if (value == nullptr) return false;
  bool ok = false;
  {
    JavaString chars(env, value);
    if (chars.c_str() != nullptr) {
      out = chars.c_str();
      ok = true;
    } else {
      env->ExceptionClear();
    }
  }
  env->DeleteLocalRef(value);
  return ok;
}

}  // namespace

namespace {

struct GlobalRefDeleter {
  JavaVM* vm;
  void operator()(jobject ref) const noexcept {
    void* current = nullptr;
    const jint status = vm->GetEnv(&current, JNI_VERSION_1_2);
    JNIEnv* env = static_cast<JNIEnv*>(current);
    if (status == JNI_EDETACHED) {
      if (attachCurrentThread(vm, &env, &JavaVM::AttachCurrentThread) != JNI_OK) return;
    } else if (status != JNI_OK) {
      return;
    }
    env->DeleteGlobalRef(ref);
    if (status == JNI_EDETACHED) vm->DetachCurrentThread();
  }
};

}  // namespace

std::shared_ptr<_jobject> makeSharedGlobalRef(JNIEnv* env, jobject object) {
  if (object == nullptr) return nullptr;
  JavaVM* vm = nullptr;
  if (env->GetJavaVM(&vm) != JNI_OK || vm == nullptr) return nullptr;
  jobject global = env->NewGlobalRef(object);
  if (global == nullptr) return nullptr;
  try {
    return std::shared_ptr<_jobject>(global, GlobalRefDeleter{vm});
  } catch (...) {
    env->DeleteGlobalRef(global);  // out of memory for the count: the class and message remain
    return nullptr;
  }
}

DirectorException::DirectorException(JNIEnv* env, jthrowable throwable)
    : throwable_(makeSharedGlobalRef(env, throwable)) {
  if (throwable != nullptr) {
    jclass cls = env->GetObjectClass(throwable);
    if (cls != nullptr) {
      // Class.getName() on the throwable's class object.
      if (callStringMethod(env, cls, "getName", className_)) {
        std::replace(className_.begin(), className_.end(), '.', '/');
      }
      env->DeleteLocalRef(cls);
    } else {
      env->ExceptionClear();
    }
    if (!callStringMethod(env, throwable, "getMessage", message_)) message_.clear();
  }
  if (message_.empty()) message_ = "Could not get exception message in JavaExceptionMessage";
}

DirectorException::DirectorException(const char* className, const char* message)
    : className_(className != nullptr ? className : ""),
      message_(message != nullptr ? message : "") {}

void DirectorException::raiseJavaException(JNIEnv* env) const noexcept {
  env->ExceptionClear();
  if (throwable_ != nullptr && env->Throw(throwable()) == JNI_OK) return;
  jclass cls = className_.empty() ? nullptr : env->FindClass(className_.c_str());
  if (cls == nullptr) {
    env->ExceptionClear();
    throwJavaException(env, JavaRuntimeException, message_.c_str());
    return;
  }
  std::string text;
  try {
    text = orzavs::jni::javaSafeText(message_);
  } catch (...) {
    text = "(message lost: out of memory)";
  }
  // ThrowNew needs a (String) constructor; without one it would throw NoSuchMethodError
  // instead. Such a class is named in a RuntimeException's message.
  const bool buildable = env->GetMethodID(cls, "<init>", "(Ljava/lang/String;)V") != nullptr;
  if (buildable) {
    env->ThrowNew(cls, text.c_str());
    env->DeleteLocalRef(cls);
    return;
  }
  env->ExceptionClear();
  env->DeleteLocalRef(cls);
  throwJavaException(env, JavaRuntimeException, (className_ + ": " + message_).c_str());
}

// ---------------------------------------------------------------------------------------------
// DirectorClass

jclass DirectorClass::baseClass(JNIEnv* env) {
  jclass known = baseClass_.load(std::memory_order_acquire);
  if (known != nullptr) return known;
  jclass local = env->FindClass(className_);
  if (local == nullptr) return nullptr;  // NoClassDefFoundError stays pending
  jclass global = static_cast<jclass>(env->NewGlobalRef(local));
  env->DeleteLocalRef(local);
  if (global == nullptr) return nullptr;
  // Published only as a global reference. A thread that lost the race drops its own copy.
  jclass expected = nullptr;
  if (!baseClass_.compare_exchange_strong(expected, global, std::memory_order_acq_rel)) {
    env->DeleteGlobalRef(global);
    return expected;
  }
  return global;
}

void DirectorClass::connect(JNIEnv* env, Director& director, jobject jself, jclass jcls,
                            bool memOwn, bool weakGlobal, bool* overrideFlags) {
  if (!director.swig_set_self(env, jself, memOwn, weakGlobal)) return;
  jclass base = baseClass(env);
  if (base == nullptr) return;
  const bool derived = !env->IsSameObject(base, jcls);
  for (std::size_t i = 0; i < count_; ++i) {
    jmethodID baseMethod = methodIds_[i].load(std::memory_order_acquire);
    if (baseMethod == nullptr) {
      baseMethod = env->GetMethodID(base, methods_[i].name, methods_[i].signature);
      if (baseMethod == nullptr) return;  // NoSuchMethodError stays pending
      methodIds_[i].store(baseMethod, std::memory_order_release);
    }
    overrideFlags[i] = false;
    if (derived) {
      jmethodID method = env->GetMethodID(jcls, methods_[i].name, methods_[i].signature);
      overrideFlags[i] = (method != baseMethod);
      env->ExceptionClear();
    }
  }
}

}  // namespace Swig
