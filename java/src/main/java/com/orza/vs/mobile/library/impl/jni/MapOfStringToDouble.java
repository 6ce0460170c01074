package com.orza.vs.mobile.library.impl.jni;

/**
 * A {@code std::map} as a {@link java.util.Map}: an ordered map from string to double.
 * See {@link NativeMap} for the rules on absent keys and lifetimes.
 */
public class MapOfStringToDouble extends NativeMap<Double> {
  public MapOfStringToDouble(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  MapOfStringToDouble(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  /** The native address of {@code obj} (0 for null); IllegalStateException once it is gone. */
  public static long getCPtr(MapOfStringToDouble obj) {
    return (obj == null) ? 0 : obj.nref.get();
  }

  /** An empty map. */
  public MapOfStringToDouble() {
    this(OrzaVSMobileJNI.new_MapOfStringToDouble__SWIG_0(), true);
  }

  /** A copy of {@code other}. */
  public MapOfStringToDouble(MapOfStringToDouble other) {
    this(OrzaVSMobileJNI.new_MapOfStringToDouble__SWIG_1(MapOfStringToDouble.getCPtr(other), other), true);
  }

  /** An owned map holding the entries of {@code entries}. */
  public MapOfStringToDouble(java.util.Map<String, ? extends Double> entries) {
    this();
    putAll(entries);
  }

  /** Same as {@link #getKeys}. */
  public VectorOfString getKeysForDoubleMap() {
    return getKeys();
  }

  /** Inserts or overwrites (a plain double, so that number literals need no boxing). */
  public void set(String key, double value) {
    set(key, Double.valueOf(value));
  }

  @Override
  int nativeSize(long cPtr) {
    return OrzaVSMobileJNI.MapOfStringToDouble_size(cPtr, this);
  }

  @Override
  boolean nativeEmpty(long cPtr) {
    return OrzaVSMobileJNI.MapOfStringToDouble_empty(cPtr, this);
  }

  @Override
  void nativeClear(long cPtr) {
    OrzaVSMobileJNI.MapOfStringToDouble_clear(cPtr, this);
  }

  @Override
  Double nativeGet(long cPtr, String key) {
    return OrzaVSMobileJNI.MapOfStringToDouble_get(cPtr, this, key);
  }

  @Override
  void nativeSet(long cPtr, String key, Double value) {
    OrzaVSMobileJNI.MapOfStringToDouble_set(cPtr, this, key, value);
  }

  @Override
  void nativeDel(long cPtr, String key) {
    OrzaVSMobileJNI.MapOfStringToDouble_del(cPtr, this, key);
  }

  @Override
  boolean nativeHasKey(long cPtr, String key) {
    return OrzaVSMobileJNI.MapOfStringToDouble_has_key(cPtr, this, key);
  }

  @Override
  long nativeKeys(long cPtr) {
    return OrzaVSMobileJNI.MapOfStringToDouble_getKeysForDoubleMap(cPtr, this);
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_MapOfStringToDouble(cPtr);
  }
}
