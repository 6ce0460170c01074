package com.orza.vs.mobile.library.impl.jni;

/**
 * A {@code std::map} as a {@link java.util.Map}: an ordered map from string to string; a null value raises NullPointerException "null string".
 * See {@link NativeMap} for the rules on absent keys and lifetimes.
 */
public class MapOfStringToString extends NativeMap<String> {
  public MapOfStringToString(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  MapOfStringToString(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  /** The native address of {@code obj} (0 for null); IllegalStateException once it is gone. */
  public static long getCPtr(MapOfStringToString obj) {
    return (obj == null) ? 0 : obj.nref.get();
  }

  /** An empty map. */
  public MapOfStringToString() {
    this(OrzaVSMobileJNI.new_MapOfStringToString__SWIG_0(), true);
  }

  /** A copy of {@code other}. */
  public MapOfStringToString(MapOfStringToString other) {
    this(OrzaVSMobileJNI.new_MapOfStringToString__SWIG_1(MapOfStringToString.getCPtr(other), other), true);
  }

  /** An owned map holding the entries of {@code entries}. */
  public MapOfStringToString(java.util.Map<String, ? extends String> entries) {
    this();
    putAll(entries);
  }

  @Override
  int nativeSize(long cPtr) {
    return OrzaVSMobileJNI.MapOfStringToString_size(cPtr, this);
  }

  @Override
  boolean nativeEmpty(long cPtr) {
    return OrzaVSMobileJNI.MapOfStringToString_empty(cPtr, this);
  }

  @Override
  void nativeClear(long cPtr) {
    OrzaVSMobileJNI.MapOfStringToString_clear(cPtr, this);
  }

  @Override
  String nativeGet(long cPtr, String key) {
    return OrzaVSMobileJNI.MapOfStringToString_get(cPtr, this, key);
  }

  @Override
  void nativeSet(long cPtr, String key, String value) {
    OrzaVSMobileJNI.MapOfStringToString_set(cPtr, this, key, value);
  }

  @Override
  void nativeDel(long cPtr, String key) {
    OrzaVSMobileJNI.MapOfStringToString_del(cPtr, this, key);
  }

  @Override
  boolean nativeHasKey(long cPtr, String key) {
    return OrzaVSMobileJNI.MapOfStringToString_has_key(cPtr, this, key);
  }

  @Override
  long nativeKeys(long cPtr) {
    return OrzaVSMobileJNI.MapOfStringToString_getKeys(cPtr, this);
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_MapOfStringToString(cPtr);
  }
}
