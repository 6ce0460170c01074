#ifndef ORZAVS_JNI_DIAGNOSTICSLISTENER_H
#define ORZAVS_JNI_DIAGNOSTICSLISTENER_H

#include <jni.h>

namespace orzavs {
namespace jni {

// Binds the native method of the Java class Diagnostics (RegisterNatives), through which a Java
// listener receives the library's diagnostic lines. Called once while OrzaVSMobileJNI
// initialises; without that class (an app that stripped it) nothing is bound and no exception
// is left pending.
void registerDiagnosticsNatives(JNIEnv* env) noexcept;

}  // namespace jni
}  // namespace orzavs

#endif
