#include "jni/DiagnosticsListener.h"

#include <cstring>

#include "types/Diagnostics.h"

namespace orzavs {
namespace jni {

namespace {

constexpr const char* kDiagnosticsClass = "com/orza/vs/mobile/library/impl/jni/Diagnostics";

// Where lines go when a Java listener is set. Written once, at the first registration, before
// any Java code can enable the sink; read by the sink on whatever thread prints a line.
struct JavaTarget {
  JavaVM* vm = nullptr;
  jclass diagnostics = nullptr;  // global reference, kept for the life of the process
  jmethodID deliver = nullptr;   // static void deliver(byte[])
};
JavaTarget gTarget;

// The JDK's jni.h declares AttachCurrentThread with a void** out-parameter, Android's with
// JNIEnv**; the parameter type is taken from whichever header is in use.
template <class EnvOut>
jint attach(JavaVM* vm, JNIEnv** env, jint (JavaVM::*attachFn)(EnvOut, void*)) {
  return (vm->*attachFn)(reinterpret_cast<EnvOut>(env), nullptr);
}

// The sink while a Java listener is set: hands the line's bytes to Diagnostics.deliver on the
// calling thread, attaching it to the VM for the call if it is a native thread.
void deliverToJava(void* context, const char* line) {
  const JavaTarget& target = *static_cast<const JavaTarget*>(context);
  JNIEnv* env = nullptr;
  const jint status = target.vm->GetEnv(reinterpret_cast<void**>(&env), JNI_VERSION_1_2);
  const bool attached = status == JNI_EDETACHED;
  if (attached && attach(target.vm, &env, &JavaVM::AttachCurrentThread) != JNI_OK) return;
  if (!attached && status != JNI_OK) return;
  // A line may report an exception that is still pending on this thread (it is about to reach
  // the Java caller): set it aside for the upcall and raise it again afterwards.
  jthrowable pending = env->ExceptionOccurred();
  if (pending != nullptr) env->ExceptionClear();
  const jsize length = static_cast<jsize>(std::strlen(line));
  jbyteArray bytes = env->NewByteArray(length);
  if (bytes != nullptr) {
    env->SetByteArrayRegion(bytes, 0, length, reinterpret_cast<const jbyte*>(line));
    env->CallStaticVoidMethod(target.diagnostics, target.deliver, bytes);
    env->DeleteLocalRef(bytes);
  }
  // deliver() catches what the listener throws; only an error (out of memory) can remain.
  env->ExceptionClear();
  if (pending != nullptr) {
    env->Throw(pending);
    env->DeleteLocalRef(pending);
  }
  if (attached) target.vm->DetachCurrentThread();
}

void JNICALL setEnabled(JNIEnv*, jclass, jboolean enabled) {
  if (enabled == JNI_TRUE && gTarget.deliver != nullptr) {
    OrzaVSMobile::setDiagnosticSink(&deliverToJava, &gTarget);
  } else {
    OrzaVSMobile::setDiagnosticSink(nullptr, nullptr);
  }
}

}  // namespace

void registerDiagnosticsNatives(JNIEnv* env) noexcept {
  if (env->ExceptionCheck()) return;  // the module failed to initialise: Java sees that error
  jclass cls = env->FindClass(kDiagnosticsClass);
  if (cls == nullptr) {
    env->ExceptionClear();
    return;
  }
  JNINativeMethod methods[] = {
      {const_cast<char*>("setEnabled"), const_cast<char*>("(Z)V"),
       reinterpret_cast<void*>(&setEnabled)}};
  if (env->RegisterNatives(cls, methods, 1) != JNI_OK) env->ExceptionClear();
  // The first registration names the target; a copy of the class loaded again by another class
  // loader gets its native method but delivers through the first one.
  if (gTarget.diagnostics == nullptr) {
    jmethodID deliver = env->GetStaticMethodID(cls, "deliver", "([B)V");
    JavaVM* vm = nullptr;
    if (deliver != nullptr && env->GetJavaVM(&vm) == JNI_OK) {
      gTarget.vm = vm;
      gTarget.diagnostics = static_cast<jclass>(env->NewGlobalRef(cls));
      gTarget.deliver = gTarget.diagnostics != nullptr ? deliver : nullptr;
    }
    env->ExceptionClear();
  }
  env->DeleteLocalRef(cls);
}

}  // namespace jni
}  // namespace orzavs
