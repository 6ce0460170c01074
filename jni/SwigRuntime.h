#ifndef ORZAVS_JNI_SWIGRUNTIME_H
#define ORZAVS_JNI_SWIGRUNTIME_H

#include <jni.h>

#include <atomic>
#include <cstddef>
#include <exception>
#include <memory>
#include <string>

// The runtime that lets Java classes implement the library's callback interfaces (directors),
// and the exception table shared by every exported function.

namespace Swig {

// ---------------------------------------------------------------------------------------------
// Exceptions raised in Java.

enum JavaExceptionCode {
  JavaOutOfMemoryError = 1,
  JavaIOException = 2,
  JavaRuntimeException = 3,
  JavaIndexOutOfBoundsException = 4,
  JavaArithmeticException = 5,
  JavaIllegalArgumentException = 6,
  JavaNullPointerException = 7,
  JavaDirectorPureVirtual = 8,
  JavaUnknownError = 9,
};

// The Java class thrown for `code`; a code outside the table gives "java/lang/UnknownError".
const char* javaExceptionClass(int code) noexcept;

// Clears any pending Java exception, then throws a new instance of the class of `code` with
// `message` (nothing is thrown if the class cannot be found).
void throwJavaException(JNIEnv* env, int code, const char* message) noexcept;

// ---------------------------------------------------------------------------------------------
// Module state: the OrzaVSMobileJNI class and its static upcall methods, written once by
// swig_module_init while Java initialises that class, read by every upcall afterwards.

enum UpcallIndex {
  kEventDidReceiveEvent = 0,
  kEventDidProcessFrame = 1,
  kEventDidDetect = 2,
  kEventDidDecode = 3,
  kEventDidDetectInterestPoints = 4,
  kEventDidReceiveServerError = 5,
  kEventSuggestDarkScene = 6,
  kEventSuggestBoringEvent = 7,
  kEventShowMessage = 8,
  kEventDidProcessFrameDecision = 9,
  kEventDidProcessModuleDecision = 10,
  kServerSendServerRequest = 11,
  kServerSendServerRequestImpl = 12,
  kUpcallCount = 13,
};

// Takes a global reference to `jniClass`, then looks up the upcall methods in index order,
// stopping at the first that is missing (its lookup error stays pending).
void initModule(JNIEnv* env, jclass jniClass) noexcept;
jclass moduleClass() noexcept;
// Null until initModule found it.
jmethodID upcallMethod(int index) noexcept;

// ---------------------------------------------------------------------------------------------
// Scope helpers.

// Deletes one local reference when the scope ends (a native thread attached for an upcall has
// a small local frame, and Java threads may make many upcalls in one native call).
class LocalRefGuard {
 public:
  LocalRefGuard(JNIEnv* env, jobject ref) noexcept : env_(env), ref_(ref) {}
  ~LocalRefGuard() {
    if (ref_ != nullptr) env_->DeleteLocalRef(ref_);
  }
  LocalRefGuard(const LocalRefGuard&) = delete;
  LocalRefGuard& operator=(const LocalRefGuard&) = delete;

 private:
  JNIEnv* env_;
  jobject ref_;
};

// The UTF-8 characters of a Java string, released when the scope ends. c_str() is null for a
// null string or when the characters could not be fetched (an exception is then pending).
class JavaString {
 public:
  JavaString(JNIEnv* env, jstring string) noexcept;
  ~JavaString();
  JavaString(const JavaString&) = delete;
  JavaString& operator=(const JavaString&) = delete;
  const char* c_str() const noexcept { return chars_; }

 private:
  JNIEnv* env_;
  jstring string_;
  const char* chars_;
};

// ---------------------------------------------------------------------------------------------
// Directors.

// The reference from a native director to the Java object that implements it: a weak global
// reference while Java owns the native object, a strong one while native code owns it.
class JObjectWrapper {
 public:
  JObjectWrapper() = default;
  JObjectWrapper(const JObjectWrapper&) = delete;
  JObjectWrapper& operator=(const JObjectWrapper&) = delete;

  // Holds `object` (weak when weakGlobal or when Java keeps the memory); false, with nothing
  // changed, when an object is already held.
  bool set(JNIEnv* env, jobject object, bool memOwn, bool weakGlobal);
  // A new local reference to the object; null when none is held or it has been collected.
  jobject get(JNIEnv* env) const;
  void release(JNIEnv* env);
  // takeOrRelease true: Java owns the native object, hold `jself` weakly; false: hold strongly.
  void java_change_ownership(JNIEnv* env, jobject jself, bool takeOrRelease);
  bool weak() const noexcept { return isWeak; }

 private:
  jobject ref = nullptr;
  bool isWeak = true;
};

class Director {
 public:
  explicit Director(JNIEnv* env);
  virtual ~Director();
  Director(const Director&) = delete;
  Director& operator=(const Director&) = delete;

  JavaVM* swig_get_jvm() const noexcept { return jvm; }
  jobject swig_get_self(JNIEnv* env) const { return self.get(env); }
  bool swig_set_self(JNIEnv* env, jobject jself, bool memOwn, bool weakGlobal) {
    return self.set(env, jself, memOwn, weakGlobal);
  }
  void swig_java_change_ownership(JNIEnv* env, jobject jself, bool takeOrRelease) {
    self.java_change_ownership(env, jself, takeOrRelease);
  }
  bool swig_self_is_weak() const noexcept { return self.weak(); }

 protected:
  // Calls the Java object's no-argument method `methodName` (if the object is still there and
  // has it), so that the proxy forgets the native object being destroyed.
  void swig_disconnect_director_self(const char* methodName);

 private:
  JavaVM* jvm = nullptr;
  JObjectWrapper self;
};

// The calling thread's environment for the length of one upcall. Attaches a thread that the
// virtual machine does not know and detaches it again at the end; a thread that was attached
// before stays attached.
class JNIEnvWrapper {
 public:
  explicit JNIEnvWrapper(const Director* director);
  ~JNIEnvWrapper();
  JNIEnvWrapper(const JNIEnvWrapper&) = delete;
  JNIEnvWrapper& operator=(const JNIEnvWrapper&) = delete;
  // Null when the thread could not be attached.
  JNIEnv* getJNIEnv() const noexcept { return env_; }

 private:
  const Director* director_;
  JNIEnv* env_ = nullptr;
  int envStatus_ = JNI_OK;
};

// A Java exception raised by a Java override, carried through native code: its class name
// with "/" separators and its message.
class DirectorException : public std::exception {
 public:
  // Also keeps a global reference to `throwable` itself, so that Java can get the very object
  // back (class, message, cause, stack trace and fields intact).
  DirectorException(JNIEnv* env, jthrowable throwable);
  DirectorException(const char* className, const char* message);
  const char* what() const noexcept override { return message_.c_str(); }
  const char* classname() const noexcept { return className_.c_str(); }
  // The original Java exception (a global reference), or null when it is not known.
  jthrowable throwable() const noexcept { return static_cast<jthrowable>(throwable_.get()); }
  // Throws the original exception in Java again; without one, a new exception of the described
  // class (RuntimeException when the class cannot be found or built from a message).
  void raiseJavaException(JNIEnv* env) const noexcept;

 private:
  std::string className_;
  std::string message_;
  // Shared by the copies that C++ makes of a thrown exception; the last one deletes the global
  // reference, attaching its thread for that if the thread is not attached.
  std::shared_ptr<_jobject> throwable_;
};

// A new global reference to `object`, deleted when the last owner lets it go (on any thread);
// empty for a null object or when the reference cannot be made.
std::shared_ptr<_jobject> makeSharedGlobalRef(JNIEnv* env, jobject object);

// One operation that Java may override: its name and Java signature.
struct DirectorMethod {
  const char* name;
  const char* signature;
};

// What a director class looks up when its first object connects: the Java base class and the
// base class's method identifiers. Every field is published only once it holds its final
// value (the class as a global reference), so a second thread connecting at the same time
// either sees nothing and looks it up itself, or sees a usable value.
class DirectorClass {
 public:
  DirectorClass(const char* javaClassName, const DirectorMethod* methods, std::size_t count,
                std::atomic<jmethodID>* methodIds) noexcept
      : className_(javaClassName), methods_(methods), count_(count), methodIds_(methodIds) {}

  // The connect step: holds the Java object, then sets overrideFlags[i] for each operation
  // that the object's class overrides.
  void connect(JNIEnv* env, Director& director, jobject jself, jclass jcls, bool memOwn,
               bool weakGlobal, bool* overrideFlags);

 private:
  jclass baseClass(JNIEnv* env);

  const char* className_;
  const DirectorMethod* methods_;
  std::size_t count_;
  std::atomic<jmethodID>* methodIds_;
  std::atomic<jclass> baseClass_{nullptr};
};

}  // namespace Swig

#endif
