// The exception conventions of the exported functions, checked against a stand-in JNIEnv that
// records the JNI calls made (no JVM needed), and the text conversions between C++ and Java.

#include <gtest/gtest.h>

#include <functional>
#include <new>
#include <set>
#include <stdexcept>
#include <string>
#include <vector>

#include "jni/JniCall.h"

namespace {

using orzavs::jni::decodeUtf8;
using orzavs::jni::isModifiedUtf8;

// A JNIEnv whose functions record what the binding asks of the VM. Class handles point at
// interned names, so ThrowNew can tell which class it got; "java/..." classes are found, any
// other name is not (NoClassDefFoundError becomes pending).
struct FakeVm {
  std::vector<std::string> calls;
  bool pending = false;
  std::string thrownClass, thrownMessage;
  JNINativeInterface_ table{};
  JNIEnv env{};

  FakeVm() {
    current() = this;
    table.ExceptionClear = [](JNIEnv*) {
      current()->calls.push_back("ExceptionClear");
      current()->pending = false;
    };
    table.ExceptionCheck = [](JNIEnv*) -> jboolean { return current()->pending ? JNI_TRUE : JNI_FALSE; };
    table.FindClass = [](JNIEnv*, const char* name) -> jclass {
      static std::set<std::string> names;  // elements never move
      current()->calls.push_back(std::string("FindClass ") + name);
      if (std::string(name).rfind("java/", 0) != 0) return current()->pending = true, nullptr;
      return reinterpret_cast<jclass>(const_cast<std::string*>(&*names.insert(name).first));
    };
    table.GetMethodID = [](JNIEnv*, jclass, const char*, const char*) { return reinterpret_cast<jmethodID>(1); };
    table.ThrowNew = [](JNIEnv*, jclass cls, const char* message) -> jint {
      FakeVm* vm = current();
      vm->thrownClass = *reinterpret_cast<const std::string*>(cls);
      vm->thrownMessage = message;
      vm->pending = true;
      vm->calls.push_back("ThrowNew");
      return 0;
    };
    table.DeleteLocalRef = [](JNIEnv*, jobject) {};
    env.functions = &table;
  }
  ~FakeVm() { current() = nullptr; }
  std::string thrown() const { return thrownClass + ": " + thrownMessage; }
  static FakeVm*& current() {
    static FakeVm* vm = nullptr;
    return vm;
  }
};

TEST(ExceptionTable, MapsEveryCodeAndFallsBackToUnknownError) {
  const char* const classes[] = {"java/lang/UnknownError", "java/lang/OutOfMemoryError", "java/io/IOException",
                                 "java/lang/RuntimeException", "java/lang/IndexOutOfBoundsException",
                                 "java/lang/ArithmeticException", "java/lang/IllegalArgumentException",
                                 "java/lang/NullPointerException", "java/lang/RuntimeException",
                                 "java/lang/UnknownError"};
  for (int code = 0; code <= 9; ++code) EXPECT_STREQ(Swig::javaExceptionClass(code), classes[code]) << code;
  for (int code : {42, -1}) EXPECT_STREQ(Swig::javaExceptionClass(code), "java/lang/UnknownError");
}

TEST(ExceptionTable, ThrowingClearsFirstThenThrowsTheClassWithTheMessage) {
  FakeVm vm;
  vm.pending = true;
  Swig::throwJavaException(&vm.env, Swig::JavaIndexOutOfBoundsException, "key not found");
  EXPECT_EQ(vm.calls, (std::vector<std::string>{"ExceptionClear", "FindClass java/lang/IndexOutOfBoundsException",
                                                "ThrowNew"}));
  EXPECT_EQ(vm.thrown(), "java/lang/IndexOutOfBoundsException: key not found");
  // Bytes that are not modified UTF-8 never reach ThrowNew.
  Swig::throwJavaException(&vm.env, Swig::JavaRuntimeException, "bad \xFF");
  EXPECT_EQ(vm.thrownMessage, "bad \xEF\xBF\xBD");
  // A director exception whose class cannot be found comes back as a RuntimeException.
  Swig::DirectorException("com/example/Gone", "message").raiseJavaException(&vm.env);
  EXPECT_EQ(vm.thrown(), "java/lang/RuntimeException: message");
  Swig::DirectorException exception("java/lang/IllegalStateException", "kept");
  EXPECT_STREQ(exception.what(), "kept");
  EXPECT_STREQ(exception.classname(), "java/lang/IllegalStateException");
}

TEST(GuardedCall, MapsNativeExceptionsToJavaOnesAndReturnsZero) {
  FakeVm vm;
  const struct { std::function<void()> raise; const char* javaClass; const char* message; } cases[] = {
      {[] { throw orzavs::jni::JavaError{7, "null string"}; }, "java/lang/NullPointerException", "null string"},
      {[] { throw std::out_of_range("vector index out of range"); }, "java/lang/IndexOutOfBoundsException",
       "vector index out of range"},
      {[] { throw std::bad_alloc(); }, "java/lang/OutOfMemoryError", "std::bad_alloc"},
      {[] { throw std::invalid_argument("bad"); }, "java/lang/IllegalArgumentException", "bad"},
      {[] { throw std::runtime_error("odd"); }, "java/lang/RuntimeException", "odd"},
      {[] { throw 5; }, "java/lang/UnknownError", "unknown native exception"},
      {[] { throw Swig::DirectorException("java/lang/IllegalStateException", "from java"); },
       "java/lang/IllegalStateException", "from java"}};
  for (const auto& c : cases) {
    vm.pending = false;
    vm.thrownClass.clear();
    EXPECT_EQ(orzavs::jni::guarded(&vm.env, [&] { return c.raise(), 17L; }), 0L);
    EXPECT_TRUE(vm.pending);
    EXPECT_EQ(vm.thrown(), std::string(c.javaClass) + ": " + c.message);
  }
  vm.pending = false;
  EXPECT_EQ(orzavs::jni::guarded(&vm.env, [] { return 17; }), 17);
  EXPECT_FALSE(vm.pending);
}

// Parked callback exceptions keep their identity through global references, which need a real
// virtual machine: the JUnit suite checks them (DirectorTest, EngineEndToEndTest).

TEST(JavaText, ModifiedUtf8IsRecognised) {
  for (const std::string& valid : {std::string(""), std::string("plain ascii"),
                                   std::string("caf\xC3\xA9 \xE2\x82\xAC"),        // 2- and 3-byte forms
                                   std::string("a\xC0\x80" "b"),                   // U+0000 as C0 80
                                   std::string("\xED\xA0\xBD\xED\xB8\x80")}) {     // a surrogate pair
    EXPECT_TRUE(isModifiedUtf8(valid)) << valid;
  }
  for (const std::string& invalid : {std::string("a\0b", 3),       // raw NUL
                                     std::string("\xF0\x9F\x98\x80"),  // standard 4-byte form
                                     std::string("\xC3"), std::string("\xE2\x82"),  // truncated
                                     std::string("\x80"),                           // stray continuation
                                     std::string("\xC1\x81"), std::string("\xE0\x80\x80")}) {  // overlong
    EXPECT_FALSE(isModifiedUtf8(invalid)) << invalid;
  }
}

TEST(JavaText, DecodesStandardAndModifiedUtf8AndReplacesInvalidBytes) {
  const struct { std::string utf8; std::u16string text; } cases[] = {
      {"A\xC3\xA9\xE2\x82\xAC", u"A\u00e9\u20ac"}, {"\xF0\x9F\x98\x80", u"\U0001F600"},
      {"\xED\xA0\xBD\xED\xB8\x80", u"\U0001F600"}, {std::string("a\0b", 3), std::u16string(u"a\0b", 3)},
      {std::string("\xC0\x80", 2), std::u16string(1, u'\0')}, {"\xFF" "a", u"\uFFFDa"}, {"a\xC3", u"a\uFFFD"},
      {"\xE2\x82" "x", u"\uFFFD\uFFFDx"}, {"\xF4\x90\x80\x80", u"\uFFFD\uFFFD\uFFFD\uFFFD"}};  // > U+10FFFF
  for (const auto& c : cases) EXPECT_EQ(decodeUtf8(c.utf8), c.text) << c.utf8;
}

TEST(JavaText, EncodingGivesModifiedUtf8AndSafeTextRepairsOnlyWhatIsInvalid) {
  const std::u16string text = std::u16string(u"x\0\u00e9\u20ac\U0001F600", 6);
  const std::string encoded = orzavs::jni::toModifiedUtf8(text);
  EXPECT_EQ(encoded, std::string("x\xC0\x80\xC3\xA9\xE2\x82\xAC\xED\xA0\xBD\xED\xB8\x80"));
  EXPECT_EQ(decodeUtf8(encoded), text);
  EXPECT_EQ(orzavs::jni::javaSafeText("vector index out of range"), "vector index out of range");
  const std::string repaired = orzavs::jni::javaSafeText("bad \xFF byte \xF0\x9F\x98\x80");
  EXPECT_TRUE(isModifiedUtf8(repaired));
  EXPECT_EQ(decodeUtf8(repaired), u"bad \uFFFD byte \U0001F600");
}

}  // namespace
