#include "jni/JniCall.h"
#include "types/DiagnosticOutput.h"

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

CallFrame::~CallFrame() {
  tInnermostFrame = outer_;
  if (!parked_) return;
  if (env_->ExceptionCheck()) {
    // The function's own exception is what Java sees; say what was dropped for it.
    OrzaVSMobile::reportLinef("Dropped Java exception from a callback: %s: %s",
                              className_.c_str(), message_.c_str());
    return;
  }
  Swig::DirectorException(className_.c_str(), message_.c_str()).raiseJavaException(env_);
}

CallFrame* CallFrame::current() noexcept { return tInnermostFrame; }

void CallFrame::park(const char* className, const char* message) {
  if (parked_) return;  // the first exception wins
  className_ = className;
  message_ = message;
  parked_ = true;
}

void parkException(const char* className, const char* message, const char* where) noexcept {
  CallFrame* frame = CallFrame::current();
  if (frame != nullptr) {
    try {
      frame->park(className, message);
      return;
    } catch (...) {
      // Out of memory while keeping it: fall through and print it instead.
    }
  }
  // No call from Java is in progress on this thread (an engine worker): nobody can receive it,
  // and letting it unwind would end the process or leave the engine mid-operation. It is
  // reported on standard output instead.
  OrzaVSMobile::reportLinef("Dropped Java exception from %s (no Java caller on this thread): %s: %s",
                            where, className, message);
}

void parkPendingException(JNIEnv* env, const char* where) noexcept {
  if (!env->ExceptionCheck()) return;
  jthrowable throwable = env->ExceptionOccurred();
  env->ExceptionClear();
  try {
    Swig::DirectorException exception(env, throwable);
    env->DeleteLocalRef(throwable);
    parkException(exception.classname(), exception.what(), where);
  } catch (...) {
    env->DeleteLocalRef(throwable);
    OrzaVSMobile::reportLinef("Dropped Java exception from %s", where);
  }
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
