// Exported functions of the container families: five vectors and three maps. A family is one
// macro line; the operations themselves are written once, in VectorFamily and MapFamily.

#include <jni.h>

#include <limits>
#include <map>
#include <stdexcept>
#include <string>
#include <type_traits>
#include <vector>

#include "jni/TypeNames.h"

using namespace orzavs::jni;

namespace {

// Element and value conversion: numbers by value (a Java long set into an unsigned 32-bit map
// value is taken modulo 2^32), strings through the string conventions.
template <class T, class J>
T fromJava(JNIEnv* env, J value) {
  if constexpr (std::is_same_v<T, std::string>) {
    return toStdString(env, value);
  } else {
    (void)env;
    return static_cast<T>(value);
  }
}

template <class J, class T>
J toJava(JNIEnv* env, const T& value) {
  if constexpr (std::is_same_v<T, std::string>) {
    return toJavaString(env, value);
  } else {
    (void)env;
    return static_cast<J>(value);
  }
}

// Sizes cross as Java int; a container never holds more than fits.
template <class N>
jint toJint(N count) {
  return count > static_cast<N>(std::numeric_limits<jint>::max()) ? std::numeric_limits<jint>::max()
                                                                   : static_cast<jint>(count);
}

// An element count from Java. Negative counts are not defined for the native operations (they
// would become huge unsigned sizes): they raise IllegalArgumentException.
size_t elementCount(jint n) {
  if (n < 0) raise(Swig::JavaIllegalArgumentException, "vector size must not be negative");
  return static_cast<size_t>(n);
}

template <class V>
struct VectorFamily {
  using Element = typename V::value_type;

  static typename V::reference at(V& vector, jint i) {
    if (i < 0 || static_cast<size_t>(i) >= vector.size()) throw std::out_of_range("vector index out of range");
    return vector[static_cast<size_t>(i)];
  }

  static jlong create(JNIEnv* env) { return orzavs::jni::create<V>(env); }
  static jlong createFilled(JNIEnv* env, jint n) {
    return guarded(env, [&] { return toHandle(new V(elementCount(n))); });
  }
  static jint size(JNIEnv* env, jlong self) {
    return guarded(env, [&] { return toJint(selfOf<V>(self).size()); });
  }
  static jint capacity(JNIEnv* env, jlong self) {
    return guarded(env, [&] { return toJint(selfOf<V>(self).capacity()); });
  }
  static void reserve(JNIEnv* env, jlong self, jint n) {
    guarded(env, [&] { selfOf<V>(self).reserve(elementCount(n)); });
  }
  static jboolean isEmpty(JNIEnv* env, jlong self) {
    return guarded(env, [&] { return static_cast<jboolean>(selfOf<V>(self).empty()); });
  }
  static void clear(JNIEnv* env, jlong self) {
    guarded(env, [&] { selfOf<V>(self).clear(); });
  }

  // Numbers and strings: by value.
  template <class J>
  static void addValue(JNIEnv* env, jlong self, J x) {
    guarded(env, [&] {
      Element value = fromJava<Element>(env, x);
      selfOf<V>(self).push_back(std::move(value));
    });
  }
  template <class J>
  static J getValue(JNIEnv* env, jlong self, jint i) {
    return guarded(env, [&] { return toJava<J>(env, at(selfOf<V>(self), i)); });
  }
  template <class J>
  static void setValue(JNIEnv* env, jlong self, jint i, J x) {
    guarded(env, [&] {
      Element value = fromJava<Element>(env, x);
      at(selfOf<V>(self), i) = std::move(value);
    });
  }

  // Records: copied in from a handle (checked as a reference), handed out as a handle into the
  // vector.
  static void addRecord(JNIEnv* env, jlong self, jlong x, const char* nullMessage) {
    guarded(env, [&] {
      const Element& value = deref<Element>(x, nullMessage);
      selfOf<V>(self).push_back(value);
    });
  }
  static jlong getRecord(JNIEnv* env, jlong self, jint i) {
    return guarded(env, [&] { return toHandle(&at(selfOf<V>(self), i)); });
  }
  static void setRecord(JNIEnv* env, jlong self, jint i, jlong x, const char* nullMessage) {
    guarded(env, [&] {
      const Element& value = deref<Element>(x, nullMessage);
      at(selfOf<V>(self), i) = value;
    });
  }
};

template <class M>
struct MapFamily {
  using Value = typename M::mapped_type;

  static typename M::iterator find(M& map, const std::string& key) {
    auto it = map.find(key);
    if (it == map.end()) throw std::out_of_range("key not found");
    return it;
  }

  static jlong create(JNIEnv* env) { return orzavs::jni::create<M>(env); }
  static jlong createCopy(JNIEnv* env, jlong other) {
    return guarded(env, [&] { return toHandle(new M(constRef<M>(other))); });
  }
  static jint size(JNIEnv* env, jlong self) {
    return guarded(env, [&] { return toJint(selfOf<M>(self).size()); });
  }
  static jboolean empty(JNIEnv* env, jlong self) {
    return guarded(env, [&] { return static_cast<jboolean>(selfOf<M>(self).empty()); });
  }
  static void clear(JNIEnv* env, jlong self) {
    guarded(env, [&] { selfOf<M>(self).clear(); });
  }
  template <class J>
  static J get(JNIEnv* env, jlong self, jstring key) {
    return guarded(env, [&] {
      M& map = selfOf<M>(self);
      return toJava<J>(env, find(map, toStdString(env, key))->second);
    });
  }
  template <class J>
  static void set(JNIEnv* env, jlong self, jstring key, J x) {
    guarded(env, [&] {
      M& map = selfOf<M>(self);
      std::string k = toStdString(env, key);
      Value value = fromJava<Value>(env, x);
      map[std::move(k)] = std::move(value);
    });
  }
  static void del(JNIEnv* env, jlong self, jstring key) {
    guarded(env, [&] {
      M& map = selfOf<M>(self);
      map.erase(find(map, toStdString(env, key)));
    });
  }
  static jboolean hasKey(JNIEnv* env, jlong self, jstring key) {
    return guarded(env, [&] {
      M& map = selfOf<M>(self);
      return static_cast<jboolean>(map.count(toStdString(env, key)) != 0);
    });
  }
  // Every key in the map's order, in a new vector that Java owns.
  static jlong keys(JNIEnv* env, jlong self) {
    return guarded(env, [&] {
      const M& map = selfOf<M>(self);
      std::vector<std::string> result;
      result.reserve(map.size());
      for (const auto& entry : map) result.push_back(entry.first);
      return toHandle(new std::vector<std::string>(std::move(result)));
    });
  }
};

}  // namespace

#define ORZAVS_VECTOR_COMMON(Java, Vec)                                                        \
  ORZAVS_JNI_EXPORT(jlong, new_1##Java##_1_1SWIG_10)(JNIEnv * env, jclass) {                   \
    return VectorFamily<Vec>::create(env);                                                     \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(jlong, new_1##Java##_1_1SWIG_11)(JNIEnv * env, jclass, jint n) {           \
    return VectorFamily<Vec>::createFilled(env, n);                                            \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(jint, Java##_1size)(JNIEnv * env, jclass, jlong self, jobject) {           \
    return VectorFamily<Vec>::size(env, self);                                                 \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(jint, Java##_1capacity)(JNIEnv * env, jclass, jlong self, jobject) {       \
    return VectorFamily<Vec>::capacity(env, self);                                             \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(void, Java##_1reserve)(JNIEnv * env, jclass, jlong self, jobject, jint n) { \
    VectorFamily<Vec>::reserve(env, self, n);                                                  \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(jboolean, Java##_1isEmpty)(JNIEnv * env, jclass, jlong self, jobject) {    \
    return VectorFamily<Vec>::isEmpty(env, self);                                              \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(void, Java##_1clear)(JNIEnv * env, jclass, jlong self, jobject) {          \
    VectorFamily<Vec>::clear(env, self);                                                       \
  }                                                                                            \
  ORZAVS_DELETE(Java, Vec)

// A vector of numbers or strings: the eleven functions, elements by value.
#define ORZAVS_VECTOR_OF_VALUES(Java, Vec, JType)                                              \
  ORZAVS_VECTOR_COMMON(Java, Vec)                                                              \
  ORZAVS_JNI_EXPORT(void, Java##_1add)(JNIEnv * env, jclass, jlong self, jobject, JType x) {   \
    VectorFamily<Vec>::addValue(env, self, x);                                                 \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(JType, Java##_1get)(JNIEnv * env, jclass, jlong self, jobject, jint i) {   \
    return VectorFamily<Vec>::getValue<JType>(env, self, i);                                   \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(void, Java##_1set)                                                         \
  (JNIEnv * env, jclass, jlong self, jobject, jint i, JType x) {                               \
    VectorFamily<Vec>::setValue(env, self, i, x);                                              \
  }

// A vector of records: the eleven functions, elements copied in and viewed by handle.
#define ORZAVS_VECTOR_OF_RECORDS(Java, Vec, nullMessage)                                       \
  ORZAVS_VECTOR_COMMON(Java, Vec)                                                              \
  ORZAVS_JNI_EXPORT(void, Java##_1add)                                                         \
  (JNIEnv * env, jclass, jlong self, jobject, jlong x, jobject) {                              \
    VectorFamily<Vec>::addRecord(env, self, x, nullMessage);                                   \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(jlong, Java##_1get)(JNIEnv * env, jclass, jlong self, jobject, jint i) {   \
    return VectorFamily<Vec>::getRecord(env, self, i);                                         \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(void, Java##_1set)                                                         \
  (JNIEnv * env, jclass, jlong self, jobject, jint i, jlong x, jobject) {                      \
    VectorFamily<Vec>::setRecord(env, self, i, x, nullMessage);                                \
  }

// A map from string: its eleven functions; `Keys` names its key-listing function.
#define ORZAVS_MAP_OF_STRING_TO(Java, Map, JType, Keys)                                        \
  ORZAVS_JNI_EXPORT(jlong, new_1##Java##_1_1SWIG_10)(JNIEnv * env, jclass) {                   \
    return MapFamily<Map>::create(env);                                                        \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(jlong, new_1##Java##_1_1SWIG_11)(JNIEnv * env, jclass, jlong other, jobject) { \
    return MapFamily<Map>::createCopy(env, other);                                             \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(jint, Java##_1size)(JNIEnv * env, jclass, jlong self, jobject) {           \
    return MapFamily<Map>::size(env, self);                                                    \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(jboolean, Java##_1empty)(JNIEnv * env, jclass, jlong self, jobject) {      \
    return MapFamily<Map>::empty(env, self);                                                   \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(void, Java##_1clear)(JNIEnv * env, jclass, jlong self, jobject) {          \
    MapFamily<Map>::clear(env, self);                                                          \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(JType, Java##_1get)(JNIEnv * env, jclass, jlong self, jobject, jstring key) { \
    return MapFamily<Map>::get<JType>(env, self, key);                                         \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(void, Java##_1set)                                                         \
  (JNIEnv * env, jclass, jlong self, jobject, jstring key, JType x) {                          \
    MapFamily<Map>::set(env, self, key, x);                                                    \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(void, Java##_1del)(JNIEnv * env, jclass, jlong self, jobject, jstring key) { \
    MapFamily<Map>::del(env, self, key);                                                       \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(jboolean, Java##_1has_1key)                                                \
  (JNIEnv * env, jclass, jlong self, jobject, jstring key) {                                   \
    return MapFamily<Map>::hasKey(env, self, key);                                             \
  }                                                                                            \
  ORZAVS_JNI_EXPORT(jlong, Java##_1##Keys)(JNIEnv * env, jclass, jlong self, jobject) {        \
    return MapFamily<Map>::keys(env, self);                                                    \
  }                                                                                            \
  ORZAVS_DELETE(Java, Map)

namespace {
using VectorOfInt = std::vector<int>;
using VectorOfDouble = std::vector<double>;
using VectorOfString = std::vector<std::string>;
using VectorOfPoint2f = std::vector<OrzaVSMobile::Point2f>;
using VectorOfObjectInfo = std::vector<Tovra::ObjectInfo>;
using MapOfStringToUInt = std::map<std::string, unsigned int>;
using MapOfStringToDouble = std::map<std::string, double>;
using MapOfStringToString = std::map<std::string, std::string>;
}  // namespace

ORZAVS_VECTOR_OF_VALUES(VectorOfInt, VectorOfInt, jint)
ORZAVS_VECTOR_OF_VALUES(VectorOfDouble, VectorOfDouble, jdouble)
ORZAVS_VECTOR_OF_VALUES(VectorOfString, VectorOfString, jstring)
ORZAVS_VECTOR_OF_RECORDS(VectorOfPoint2f, VectorOfPoint2f,
                         "std::vector< OrzaVSMobile::Point2< float > >::value_type const & reference is null")
ORZAVS_VECTOR_OF_RECORDS(VectorOfObjectInfo, VectorOfObjectInfo,
                         "std::vector< Tovra::ObjectInfo >::value_type const & reference is null")

ORZAVS_MAP_OF_STRING_TO(MapOfStringToUInt, MapOfStringToUInt, jlong, getKeysForIntMap)
ORZAVS_MAP_OF_STRING_TO(MapOfStringToDouble, MapOfStringToDouble, jdouble, getKeysForDoubleMap)
ORZAVS_MAP_OF_STRING_TO(MapOfStringToString, MapOfStringToString, jstring, getKeys)
