#ifndef ORZAVS_JNI_FRAMENATIVES_H
#define ORZAVS_JNI_FRAMENATIVES_H

#include <jni.h>

namespace orzavs {
namespace jni {

// Binds the native methods of com.orza.vs.mobile.library.session.FrameNatives (camera planes
// into an image buffer, interest points into a float array) with RegisterNatives, so that the
// library's export list stays the binding's alone. Called once while OrzaVSMobileJNI
// initialises; when that class is absent (an app that strips it) nothing is bound and no
// exception is left pending.
void registerFrameNatives(JNIEnv* env) noexcept;

}  // namespace jni
}  // namespace orzavs

#endif
