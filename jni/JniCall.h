#ifndef ORZAVS_JNI_JNICALL_H
#define ORZAVS_JNI_JNICALL_H

#include <jni.h>

#include <string>
#include <type_traits>

#include "jni/Handle.h"
#include "jni/SwigRuntime.h"

// The conventions every exported function follows, written once: the call frame, exception
// mapping, reference and string checks, string conversion.

namespace orzavs {
namespace jni {

// Thrown inside an exported function's body to end it with a Java exception of `code`.
struct JavaError {
  int code;
  std::string message;
};

// Thrown when a JNI call failed and left its own Java exception pending: the function just
// returns its zero value.
struct JavaPending {};

[[noreturn]] void raise(int code, std::string message);

// One native method call from Java on this thread. Exceptions that Java callbacks raise while
// it runs, and that must not unwind through engine code, are parked here (as a global reference
// to the exception object itself) and thrown into Java again when the call returns, so the Java
// caller catches the very object the callback threw. The first one wins; an exception that the
// function itself raised is kept, unless it is that same object. Frames nest when a callback
// calls back into the library.
class CallFrame {
 public:
  explicit CallFrame(JNIEnv* env) noexcept;
  ~CallFrame();
  CallFrame(const CallFrame&) = delete;
  CallFrame& operator=(const CallFrame&) = delete;

  // The innermost frame of this thread; null on a thread that Java did not call into (an
  // engine worker).
  static CallFrame* current() noexcept;
  // Keeps `throwable` (a local or global reference; no exception may be pending).
  void park(JNIEnv* env, jthrowable throwable) noexcept;

 private:
  JNIEnv* env_;
  CallFrame* outer_;
  jthrowable parked_ = nullptr;  // a global reference
};

// Moves a Java exception that is pending on `env` into the current call frame. On a thread
// without one (no Java caller can receive it) it goes to the application's handler for
// callback exceptions (OrzaVSMobileJNI.reportUncaughtCallbackException), or, when that cannot
// be reached, to one line on standard output naming `where`. Nothing happens when no exception
// is pending; none is pending afterwards.
void parkPendingException(JNIEnv* env, const char* where) noexcept;
// The same for an exception that is not pending.
void parkException(JNIEnv* env, jthrowable throwable, const char* where) noexcept;

// Maps the exception being handled to a Java exception. Call only from a catch block.
void translateCurrentException(JNIEnv* env) noexcept;

// Runs the body of an exported function: a C++ exception becomes a pending Java exception and
// the function returns its zero value (0, false, null).
template <class Body>
auto guarded(JNIEnv* env, Body&& body) noexcept -> decltype(body()) {
  using Result = decltype(body());
  CallFrame frame(env);
  try {
    return body();
  } catch (...) {
    translateCurrentException(env);
  }
  if constexpr (std::is_void_v<Result>) {
    return;
  } else {
    return Result();
  }
}

// An argument taken by reference: a null handle raises NullPointerException `message`
// (for example "Tovra::ResultMetadata const & reference is null").
template <class T>
T& deref(jlong handle, const char* message) {
  T* object = fromHandle<T>(handle);
  if (object == nullptr) raise(Swig::JavaNullPointerException, message);
  return *object;
}

// The object a member function or field getter works on. A null handle is not defined for
// them; it raises NullPointerException "<type> object is null" instead of being dereferenced.
template <class T>
T& self(jlong handle, const char* typeName) {
  T* object = fromHandle<T>(handle);
  if (object == nullptr) raise(Swig::JavaNullPointerException, std::string(typeName) + " object is null");
  return *object;
}

// A string argument: null raises NullPointerException "null string"; characters that cannot
// be fetched end the call with the pending Java error.
std::string toStdString(JNIEnv* env, jstring string);

// A new Java string for `text`. Modified UTF-8 (what Java hands out) goes through NewStringUTF
// unchanged. Other bytes, such as the 4-byte sequences of standard UTF-8 or invalid input in a
// server's reply, are undefined for NewStringUTF (and fatal under Android's CheckJNI): they
// are decoded here instead, invalid bytes as U+FFFD.
jstring toJavaString(JNIEnv* env, const std::string& text);

// True when `text` is valid modified UTF-8 without NUL bytes.
bool isModifiedUtf8(const std::string& text) noexcept;
// `text` as UTF-16, decoding UTF-8 and modified UTF-8 (surrogates and C0 80), invalid bytes as
// U+FFFD.
std::u16string decodeUtf8(const std::string& text);
// `text` as modified UTF-8 (what NewStringUTF and ThrowNew accept).
std::string toModifiedUtf8(const std::u16string& text);
// `text` itself when it is valid modified UTF-8, else its modified UTF-8 re-encoding.
std::string javaSafeText(const std::string& text);

}  // namespace jni
}  // namespace orzavs

#endif
