// The exception conventions of the exported functions, checked against a stand-in JNIEnv that
// records the JNI calls made (no JVM needed).

#include <gtest/gtest.h>

#include <functional>
#include <list>
#include <new>
#include <stdexcept>
#include <string>
#include <vector>

#include "jni/JniCall.h"

namespace {

using orzavs::jni::guarded;
using orzavs::jni::JavaError;

// A JNIEnv whose functions record what the binding asks of the VM. Classes are stand-in
// handles; "java/lang/NullPointerException" and friends are found, any other name is not
// (unless listed in `knownClasses`).
struct FakeVm {
  std::vector<std::string> calls;
  std::vector<std::string> knownClasses;
  bool pending = false;
  std::string thrownClass;
  std::string thrownMessage;
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
      FakeVm* vm = current();
      vm->calls.push_back(std::string("FindClass ") + name);
      const std::string text(name);
      for (const std::string& known : vm->knownClasses) {
        if (known == text) return classHandle(text);
      }
      if (text.rfind("java/", 0) == 0) return classHandle(text);
      vm->pending = true;  // NoClassDefFoundError
      return nullptr;
    };
    table.GetMethodID = [](JNIEnv*, jclass, const char* name, const char*) -> jmethodID {
      current()->calls.push_back(std::string("GetMethodID ") + name);
      return reinterpret_cast<jmethodID>(1);
    };
    table.ThrowNew = [](JNIEnv*, jclass cls, const char* message) -> jint {
      FakeVm* vm = current();
      vm->thrownClass = *reinterpret_cast<std::string*>(cls);
      vm->thrownMessage = message;
      vm->pending = true;
      vm->calls.push_back("ThrowNew " + vm->thrownClass + " " + message);
      return 0;
    };
    table.DeleteLocalRef = [](JNIEnv*, jobject) {};
    env.functions = &table;
  }
  ~FakeVm() { current() = nullptr; }

  static FakeVm*& current() {
    static FakeVm* vm = nullptr;
    return vm;
  }
  // Class handles are pointers to interned names, so ThrowNew can tell which class it got.
  static jclass classHandle(const std::string& name) {
    static std::list<std::string> names;  // elements never move
    for (std::string& known : names) {
      if (known == name) return reinterpret_cast<jclass>(&known);
    }
    names.push_back(name);
    return reinterpret_cast<jclass>(&names.back());
  }
};

TEST(ExceptionTable, MapsEveryCodeAndFallsBackToUnknownError) {
  EXPECT_STREQ(Swig::javaExceptionClass(1), "java/lang/OutOfMemoryError");
  EXPECT_STREQ(Swig::javaExceptionClass(2), "java/io/IOException");
  EXPECT_STREQ(Swig::javaExceptionClass(3), "java/lang/RuntimeException");
  EXPECT_STREQ(Swig::javaExceptionClass(4), "java/lang/IndexOutOfBoundsException");
  EXPECT_STREQ(Swig::javaExceptionClass(5), "java/lang/ArithmeticException");
  EXPECT_STREQ(Swig::javaExceptionClass(6), "java/lang/IllegalArgumentException");
  EXPECT_STREQ(Swig::javaExceptionClass(7), "java/lang/NullPointerException");
  EXPECT_STREQ(Swig::javaExceptionClass(8), "java/lang/RuntimeException");
  EXPECT_STREQ(Swig::javaExceptionClass(9), "java/lang/UnknownError");
  EXPECT_STREQ(Swig::javaExceptionClass(0), "java/lang/UnknownError");
  EXPECT_STREQ(Swig::javaExceptionClass(42), "java/lang/UnknownError");
  EXPECT_STREQ(Swig::javaExceptionClass(-1), "java/lang/UnknownError");
}

TEST(ExceptionTable, ThrowingClearsFirstThenThrowsTheClassWithTheMessage) {
  FakeVm vm;
  vm.pending = true;
  Swig::throwJavaException(&vm.env, Swig::JavaIndexOutOfBoundsException, "key not found");
  ASSERT_GE(vm.calls.size(), 3u);
  EXPECT_EQ(vm.calls[0], "ExceptionClear");
  EXPECT_EQ(vm.calls[1], "FindClass java/lang/IndexOutOfBoundsException");
  EXPECT_EQ(vm.thrownClass, "java/lang/IndexOutOfBoundsException");
  EXPECT_EQ(vm.thrownMessage, "key not found");
  // Bytes that are not modified UTF-8 never reach ThrowNew.
  Swig::throwJavaException(&vm.env, Swig::JavaRuntimeException, "bad \xFF");
  EXPECT_EQ(vm.thrownMessage, "bad \xEF\xBF\xBD");
}

TEST(GuardedCall, MapsNativeExceptionsToJavaOnesAndReturnsZero) {
  FakeVm vm;
  struct Case {
    std::function<long()> body;
    std::string javaClass;
    std::string message;
  };
  const std::vector<Case> cases = {
      {[]() -> long { throw JavaError{7, "null string"}; }, "java/lang/NullPointerException", "null string"},
      {[]() -> long { throw std::out_of_range("vector index out of range"); },
       "java/lang/IndexOutOfBoundsException", "vector index out of range"},
      {[]() -> long { throw std::bad_alloc(); }, "java/lang/OutOfMemoryError", "std::bad_alloc"},
      {[]() -> long { throw std::invalid_argument("bad"); }, "java/lang/IllegalArgumentException", "bad"},
      {[]() -> long { throw std::runtime_error("odd"); }, "java/lang/RuntimeException", "odd"},
      {[]() -> long { throw 5; }, "java/lang/UnknownError", "unknown native exception"},
      {[]() -> long { throw Swig::DirectorException("java/lang/IllegalStateException", "from java"); },
       "java/lang/IllegalStateException", "from java"},
  };
  for (const Case& c : cases) {
    vm.pending = false;
    vm.thrownClass.clear();
    const long result = guarded(&vm.env, [&] { return c.body(); });
    EXPECT_EQ(result, 0L);
    EXPECT_TRUE(vm.pending);
    EXPECT_EQ(vm.thrownClass, c.javaClass);
    EXPECT_EQ(vm.thrownMessage, c.message);
  }
  vm.pending = false;
  EXPECT_EQ(guarded(&vm.env, [] { return 17; }), 17);
  EXPECT_FALSE(vm.pending);
}

// Parked callback exceptions keep their identity through global references, which need a real
// virtual machine: the JUnit suite checks them (DirectorTest, EngineEndToEndTest).

TEST(DirectorExceptionTest, ClassesThatCannotBeFoundComeBackAsRuntimeException) {
  FakeVm vm;
  Swig::DirectorException("com/example/Gone", "message").raiseJavaException(&vm.env);
  EXPECT_EQ(vm.thrownClass, "java/lang/RuntimeException");
  EXPECT_EQ(vm.thrownMessage, "message");
  Swig::DirectorException exception("java/lang/IllegalStateException", "kept");
  EXPECT_STREQ(exception.what(), "kept");
  EXPECT_STREQ(exception.classname(), "java/lang/IllegalStateException");
}

}  // namespace
