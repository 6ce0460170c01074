#ifndef ORZAVS_JNI_EXPORTSUPPORT_H
#define ORZAVS_JNI_EXPORTSUPPORT_H

#include <jni.h>

#include <string>
#include <utility>

#include "jni/Handle.h"
#include "jni/JniCall.h"

// Building blocks of the exported functions. Each family of functions is a list of one-line
// macro uses; the macros only name the functions and hand their arguments to the templates
// below, where the conventions live.

// The exported symbol of Java method `name` of OrzaVSMobileJNI (`name` already mangled: "_1"
// for each underscore of the Java name).
#define ORZAVS_JNI_EXPORT(ret, name) \
  extern "C" JNIEXPORT ret JNICALL Java_com_orza_vs_mobile_library_impl_jni_OrzaVSMobileJNI_##name

namespace orzavs {
namespace jni {

// The binding's name of each native type, as it appears in its exception messages.
template <class T>
struct Named;

#define ORZAVS_JNI_NAMED(Type, text)       \
  template <>                              \
  struct Named<Type> {                     \
    static constexpr const char* name = text; \
  };

template <class T>
T& selfOf(jlong handle) {
  return self<T>(handle, Named<T>::name);
}

template <class T>
std::string referenceIsNull(const char* qualifier) {
  return std::string(Named<T>::name) + qualifier;
}

// A record-typed argument taken by const reference.
template <class T>
const T& constRef(jlong handle) {
  T* object = fromHandle<T>(handle);
  if (object == nullptr) raise(Swig::JavaNullPointerException, referenceIsNull<T>(" const & reference is null"));
  return *object;
}

// A record-typed argument taken by reference that the callee may change.
template <class T>
T& mutableRef(jlong handle) {
  T* object = fromHandle<T>(handle);
  if (object == nullptr) raise(Swig::JavaNullPointerException, referenceIsNull<T>(" & reference is null"));
  return *object;
}

// --- construction and destruction ----------------------------------------------------------------

template <class T, class... Args>
jlong create(JNIEnv* env, Args&&... args) {
  return guarded(env, [&] { return toHandle(new T(std::forward<Args>(args)...)); });
}

// Destroys through delete (virtually for polymorphic types); a null handle is ignored.
template <class T>
void destroy(JNIEnv* env, jlong handle) {
  guarded(env, [&] { delete fromHandle<T>(handle); });
}

// --- fields --------------------------------------------------------------------------------------

// Numbers, enumerations and bools. A setter with a null object handle does nothing.
template <class T, class F, class J>
void setValueField(JNIEnv* env, jlong handle, F T::*member, J value) {
  guarded(env, [&] {
    if (T* object = fromHandle<T>(handle)) object->*member = static_cast<F>(value);
  });
}

template <class J, class T, class F>
J getValueField(JNIEnv* env, jlong handle, F T::*member) {
  return guarded(env, [&] { return static_cast<J>(selfOf<T>(handle).*member); });
}

template <class T>
void setStringField(JNIEnv* env, jlong handle, std::string T::*member, jstring value) {
  guarded(env, [&] {
    std::string text = toStdString(env, value);
    if (T* object = fromHandle<T>(handle)) object->*member = std::move(text);
  });
}

template <class T>
jstring getStringField(JNIEnv* env, jlong handle, std::string T::*member) {
  return guarded(env, [&] { return toJavaString(env, selfOf<T>(handle).*member); });
}

// A record-typed field: the setter copies the pointed-to value in (a null value handle is not
// defined for it and raises NullPointerException); the getter returns a handle into the parent.
template <class T, class F>
void setRecordField(JNIEnv* env, jlong handle, F T::*member, jlong value) {
  guarded(env, [&] {
    const F& source = constRef<F>(value);
    if (T* object = fromHandle<T>(handle)) object->*member = source;
  });
}

template <class T, class F>
jlong getRecordField(JNIEnv* env, jlong handle, F T::*member) {
  return guarded(env, [&] { return toHandle(&(selfOf<T>(handle).*member)); });
}

// A pointer field (not owned by the record): handles in and out, null allowed.
template <class T, class F>
void setPointerField(JNIEnv* env, jlong handle, F* T::*member, jlong value) {
  guarded(env, [&] {
    if (T* object = fromHandle<T>(handle)) object->*member = fromHandle<F>(value);
  });
}

template <class T, class F>
jlong getPointerField(JNIEnv* env, jlong handle, F* T::*member) {
  return guarded(env, [&] { return toHandle(selfOf<T>(handle).*member); });
}

}  // namespace jni
}  // namespace orzavs

// One field = one line: its getter and its setter. `Java` is the Java class name, `Type` the
// native type (an alias without commas), `field` the member.
#define ORZAVS_FIELD_VALUE(Java, Type, field, JType)                                        \
  ORZAVS_JNI_EXPORT(void, Java##_1##field##_1set)                                           \
  (JNIEnv * env, jclass, jlong self, jobject, JType value) {                                 \
    orzavs::jni::setValueField(env, self, &Type::field, value);                             \
  }                                                                                         \
  ORZAVS_JNI_EXPORT(JType, Java##_1##field##_1get)(JNIEnv * env, jclass, jlong self, jobject) { \
    return orzavs::jni::getValueField<JType>(env, self, &Type::field);                      \
  }

#define ORZAVS_FIELD_STRING(Java, Type, field)                                              \
  ORZAVS_JNI_EXPORT(void, Java##_1##field##_1set)                                           \
  (JNIEnv * env, jclass, jlong self, jobject, jstring value) {                              \
    orzavs::jni::setStringField(env, self, &Type::field, value);                            \
  }                                                                                         \
  ORZAVS_JNI_EXPORT(jstring, Java##_1##field##_1get)(JNIEnv * env, jclass, jlong self, jobject) { \
    return orzavs::jni::getStringField(env, self, &Type::field);                            \
  }

#define ORZAVS_FIELD_RECORD(Java, Type, field)                                              \
  ORZAVS_JNI_EXPORT(void, Java##_1##field##_1set)                                           \
  (JNIEnv * env, jclass, jlong self, jobject, jlong value, jobject) {                        \
    orzavs::jni::setRecordField(env, self, &Type::field, value);                            \
  }                                                                                         \
  ORZAVS_JNI_EXPORT(jlong, Java##_1##field##_1get)(JNIEnv * env, jclass, jlong self, jobject) { \
    return orzavs::jni::getRecordField(env, self, &Type::field);                            \
  }

#define ORZAVS_FIELD_POINTER(Java, Type, field)                                             \
  ORZAVS_JNI_EXPORT(void, Java##_1##field##_1set)                                           \
  (JNIEnv * env, jclass, jlong self, jobject, jlong value, jobject) {                        \
    orzavs::jni::setPointerField(env, self, &Type::field, value);                           \
  }                                                                                         \
  ORZAVS_JNI_EXPORT(jlong, Java##_1##field##_1get)(JNIEnv * env, jclass, jlong self, jobject) { \
    return orzavs::jni::getPointerField(env, self, &Type::field);                           \
  }

// The default constructor and the destructor of a record.
#define ORZAVS_NEW_DELETE(Java, Type)                                                       \
  ORZAVS_JNI_EXPORT(jlong, new_1##Java)(JNIEnv * env, jclass) {                             \
    return orzavs::jni::create<Type>(env);                                                  \
  }                                                                                         \
  ORZAVS_JNI_EXPORT(void, delete_1##Java)(JNIEnv * env, jclass, jlong self) {               \
    orzavs::jni::destroy<Type>(env, self);                                                  \
  }

#define ORZAVS_DELETE(Java, Type)                                                           \
  ORZAVS_JNI_EXPORT(void, delete_1##Java)(JNIEnv * env, jclass, jlong self) {               \
    orzavs::jni::destroy<Type>(env, self);                                                  \
  }

#endif
