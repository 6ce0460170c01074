#include "jni/JniCall.h"
#include "types/DiagnosticOutput.h"

#include <atomic>
#include <cstdio>
#include <new>
#include <stdexcept>

namespace orzavs {
namespace jni {

void raise(int code, std::string message) { throw JavaError{code, std::move(message)}; }

// ---------------------------------------------------------------------------------------------
// Call frames

namespace {
thread_local CallFrame* tInnermostFrame = nullptr;
}  // namespace

CallFrame::CallFrame(JNIEnv* env) noexcept : env_(env), outer_(tInnermostFrame) {
  tInnermostFrame = this;
}

namespace {

// One line naming a Java exception that cannot be handed to Java code.
void printException(JNIEnv* env, const char* prefix, jthrowable throwable) noexcept {
  try {
    Swig::DirectorException described(env, throwable);
    OrzaVSMobile::reportLinef("%s: %s: %s", prefix, described.classname(), described.what());
  } catch (...) {
    OrzaVSMobile::reportLine(prefix);
  }
}

std::atomic<jmethodID> gReportUncaught{nullptr};

// Hands an exception that no Java caller can receive to the Java side's handler; false when
// that handler cannot be reached (the module is not initialised, or the call failed).
bool reportUncaught(JNIEnv* env, jthrowable throwable) noexcept {
  jclass module = Swig::moduleClass();
  if (module == nullptr) return false;
  jmethodID report = gReportUncaught.load(std::memory_order_acquire);
  if (report == nullptr) {
    report = env->GetStaticMethodID(module, "reportUncaughtCallbackException",
                                    "(Ljava/lang/Throwable;)V");
    if (report == nullptr) {
      env->ExceptionClear();
      return false;
    }
    gReportUncaught.store(report, std::memory_order_release);
  }
  env->CallStaticVoidMethod(module, report, throwable);
  if (!env->ExceptionCheck()) return true;
  env->ExceptionClear();
  return false;
}

}  // namespace

CallFrame::~CallFrame() {
  tInnermostFrame = outer_;
  if (parked_ == nullptr) return;
  if (env_->ExceptionCheck()) {
    jthrowable own = env_->ExceptionOccurred();
    env_->ExceptionClear();
    // The function's own exception is what Java sees (often the parked one itself, carried
    // out as a DirectorException); otherwise say what was dropped for it.
    if (!env_->IsSameObject(own, parked_)) {
      printException(env_, "Dropped Java exception from a callback", parked_);
    }
    env_->Throw(own);
    env_->DeleteLocalRef(own);
  } else {
    env_->Throw(parked_);
  }
  env_->DeleteGlobalRef(parked_);
}

CallFrame* CallFrame::current() noexcept { return tInnermostFrame; }

void CallFrame::park(JNIEnv* env, jthrowable throwable) noexcept {
  if (parked_ != nullptr || throwable == nullptr) return;  // the first exception wins
  parked_ = static_cast<jthrowable>(env->NewGlobalRef(throwable));
  if (parked_ == nullptr) {
    env->ExceptionClear();
    printException(env, "Dropped Java exception from a callback (out of memory)", throwable);
  }
}

void parkException(JNIEnv* env, jthrowable throwable, const char* where) noexcept {
  if (throwable == nullptr) return;
  if (CallFrame* frame = CallFrame::current()) {
    frame->park(env, throwable);
    return;
  }
  // No call from Java is in progress on this thread (an engine worker). Letting the exception
  // unwind would end the process or leave the engine mid-operation; the application's handler
  // gets it instead.
  if (reportUncaught(env, throwable)) return;
  char prefix[256];
  std::snprintf(prefix, sizeof prefix, "Uncaught Java exception from %s (no Java caller on this thread)",
                where);
  printException(env, prefix, throwable);
}

void parkPendingException(JNIEnv* env, const char* where) noexcept {
  if (!env->ExceptionCheck()) return;
  jthrowable throwable = env->ExceptionOccurred();
  env->ExceptionClear();
  parkException(env, throwable, where);
  env->DeleteLocalRef(throwable);
}

// ---------------------------------------------------------------------------------------------
// Exception mapping

void translateCurrentException(JNIEnv* env) noexcept {
  try {
    throw;
  } catch (const JavaError& error) {
    Swig::throwJavaException(env, error.code, error.message.c_str());
  } catch (const JavaPending&) {
    if (!env->ExceptionCheck()) Swig::throwJavaException(env, Swig::JavaOutOfMemoryError, "JNI call failed");
  } catch (const Swig::DirectorException& exception) {
    exception.raiseJavaException(env);
  } catch (const std::out_of_range& exception) {
    Swig::throwJavaException(env, Swig::JavaIndexOutOfBoundsException, exception.what());
  } catch (const std::bad_alloc& exception) {
    Swig::throwJavaException(env, Swig::JavaOutOfMemoryError, exception.what());
  } catch (const std::invalid_argument& exception) {
    Swig::throwJavaException(env, Swig::JavaIllegalArgumentException, exception.what());
  } catch (const std::length_error& exception) {
    Swig::throwJavaException(env, Swig::JavaIllegalArgumentException, exception.what());
  } catch (const std::exception& exception) {
    Swig::throwJavaException(env, Swig::JavaRuntimeException, exception.what());
  } catch (...) {
    Swig::throwJavaException(env, Swig::JavaUnknownError, "unknown native exception");
  }
}

// ---------------------------------------------------------------------------------------------
// Strings

std::string toStdString(JNIEnv* env, jstring string) {
  if (string == nullptr) raise(Swig::JavaNullPointerException, "null string");
  const char* chars = env->GetStringUTFChars(string, nullptr);
  if (chars == nullptr) throw JavaPending{};
  std::string result;
  try {
    result = chars;
  } catch (...) {
    env->ReleaseStringUTFChars(string, chars);
    throw;
  }
  env->ReleaseStringUTFChars(string, chars);
  return result;
}

namespace {

inline bool isContinuation(unsigned char byte) { return (byte & 0xC0) == 0x80; }

}  // namespace

bool isModifiedUtf8(const std::string& text) noexcept {
  const auto* bytes = reinterpret_cast<const unsigned char*>(text.data());
  const size_t size = text.size();
  for (size_t i = 0; i < size;) {
    const unsigned char lead = bytes[i];
    if (lead >= 0x01 && lead <= 0x7F) {
      i += 1;
    } else if (lead == 0xC0) {
      // The only overlong form modified UTF-8 has: C0 80 for U+0000.
      if (i + 1 >= size || bytes[i + 1] != 0x80) return false;
      i += 2;
    } else if (lead >= 0xC2 && lead <= 0xDF) {
      if (i + 1 >= size || !isContinuation(bytes[i + 1])) return false;
      i += 2;
    } else if (lead >= 0xE0 && lead <= 0xEF) {
      if (i + 2 >= size || !isContinuation(bytes[i + 1]) || !isContinuation(bytes[i + 2])) return false;
      if (lead == 0xE0 && bytes[i + 1] < 0xA0) return false;  // overlong
      i += 3;  // surrogates (ED A0..BF) are how modified UTF-8 writes supplementary characters
    } else {
      return false;  // NUL, stray continuation, C1, or a 4-byte lead
    }
  }
  return true;
}

std::u16string decodeUtf8(const std::string& text) {
  const auto* bytes = reinterpret_cast<const unsigned char*>(text.data());
  const size_t size = text.size();
  std::u16string out;
  out.reserve(size);
  for (size_t i = 0; i < size;) {
    const unsigned char lead = bytes[i];
    if (lead < 0x80) {
      out.push_back(static_cast<char16_t>(lead));
      i += 1;
    } else if (lead == 0xC0 && i + 1 < size && bytes[i + 1] == 0x80) {
      out.push_back(u'\0');
      i += 2;
    } else if (lead >= 0xC2 && lead <= 0xDF && i + 1 < size && isContinuation(bytes[i + 1])) {
      out.push_back(static_cast<char16_t>(((lead & 0x1F) << 6) | (bytes[i + 1] & 0x3F)));
      i += 2;
    } else if (lead >= 0xE0 && lead <= 0xEF && i + 2 < size && isContinuation(bytes[i + 1]) &&
               isContinuation(bytes[i + 2]) && !(lead == 0xE0 && bytes[i + 1] < 0xA0)) {
      out.push_back(static_cast<char16_t>(((lead & 0x0F) << 12) | ((bytes[i + 1] & 0x3F) << 6) |
                                          (bytes[i + 2] & 0x3F)));
      i += 3;
    } else if (lead >= 0xF0 && lead <= 0xF4 && i + 3 < size && isContinuation(bytes[i + 1]) &&
               isContinuation(bytes[i + 2]) && isContinuation(bytes[i + 3]) &&
               !(lead == 0xF0 && bytes[i + 1] < 0x90) && !(lead == 0xF4 && bytes[i + 1] > 0x8F)) {
      const uint32_t code = ((lead & 0x07u) << 18) | ((bytes[i + 1] & 0x3Fu) << 12) |
                            ((bytes[i + 2] & 0x3Fu) << 6) | (bytes[i + 3] & 0x3Fu);
      const uint32_t offset = code - 0x10000;
      out.push_back(static_cast<char16_t>(0xD800 + (offset >> 10)));
      out.push_back(static_cast<char16_t>(0xDC00 + (offset & 0x3FF)));
      i += 4;
    } else {
      out.push_back(u'\uFFFD');
      i += 1;
    }
  }
  return out;
}

std::string toModifiedUtf8(const std::u16string& text) {
  std::string out;
  out.reserve(text.size());
  for (char16_t unit : text) {
    const uint32_t code = unit;
    if (code >= 0x01 && code <= 0x7F) {
      out.push_back(static_cast<char>(code));
    } else if (code <= 0x7FF) {  // includes U+0000 as C0 80
      out.push_back(static_cast<char>(0xC0 | (code >> 6)));
      out.push_back(static_cast<char>(0x80 | (code & 0x3F)));
    } else {
      out.push_back(static_cast<char>(0xE0 | (code >> 12)));
      out.push_back(static_cast<char>(0x80 | ((code >> 6) & 0x3F)));
      out.push_back(static_cast<char>(0x80 | (code & 0x3F)));
    }
  }
  return out;
}

std::string javaSafeText(const std::string& text) {
  if (isModifiedUtf8(text)) return text;
  return toModifiedUtf8(decodeUtf8(text));
}

jstring toJavaString(JNIEnv* env, const std::string& text) {
  if (isModifiedUtf8(text)) return env->NewStringUTF(text.c_str());
  const std::u16string units = decodeUtf8(text);
  static_assert(sizeof(jchar) == sizeof(char16_t), "jchar is a UTF-16 unit");
  return env->NewString(reinterpret_cast<const jchar*>(units.data()), static_cast<jsize>(units.size()));
}

}  // namespace jni
}  // namespace orzavs
