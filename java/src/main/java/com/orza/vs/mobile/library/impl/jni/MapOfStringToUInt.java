package com.orza.vs.mobile.library.impl.jni;

/**
 * A {@code std::map} as a {@link java.util.Map}: an ordered map from string to unsigned 32-bit integer (values 0 to 4294967295; a value set from Java is taken modulo 2^32).
 * See {@link NativeMap} for the rules on absent keys and lifetimes.
 */
public class MapOfStringToUInt extends NativeMap<Long> {
  public MapOfStringToUInt(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  MapOfStringToUInt(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  /** The native address of {@code obj} (0 for null); IllegalStateException once it is gone. */
  public static long getCPtr(MapOfStringToUInt obj) {
    return (obj == null) ? 0 : obj.nref.get();
  }

  /** An empty map. */
  public MapOfStringToUInt() {
    this(OrzaVSMobileJNI.new_MapOfStringToUInt__SWIG_0(), true);
  }

  /** A copy of {@code other}. */
  public MapOfStringToUInt(MapOfStringToUInt other) {
    this(OrzaVSMobileJNI.new_MapOfStringToUInt__SWIG_1(MapOfStringToUInt.getCPtr(other), other), true);
  }

  /** An owned map holding the entries of {@code entries}. */
  public MapOfStringToUInt(java.util.Map<String, ? extends Long> entries) {
    this();
    putAll(entries);
  }

  /** Same as {@link #getKeys}. */
  public VectorOfString getKeysForIntMap() {
    return getKeys();
  }

  /** Inserts or overwrites (a plain long, so that number literals need no boxing). */
  public void set(String key, long value) {
    set(key, Long.valueOf(value));
  }

  @Override
  int nativeSize(long cPtr) {
    return OrzaVSMobileJNI.MapOfStringToUInt_size(cPtr, this);
  }

  @Override
  boolean nativeEmpty(long cPtr) {
    return OrzaVSMobileJNI.MapOfStringToUInt_empty(cPtr, this);
  }

  @Override
  void nativeClear(long cPtr) {
    OrzaVSMobileJNI.MapOfStringToUInt_clear(cPtr, this);
  }

  @Override
  Long nativeGet(long cPtr, String key) {
    return OrzaVSMobileJNI.MapOfStringToUInt_get(cPtr, this, key);
  }

  @Override
  void nativeSet(long cPtr, String key, Long value) {
    OrzaVSMobileJNI.MapOfStringToUInt_set(cPtr, this, key, value);
  }

  @Override
  void nativeDel(long cPtr, String key) {
    OrzaVSMobileJNI.MapOfStringToUInt_del(cPtr, this, key);
  }

  @Override
  boolean nativeHasKey(long cPtr, String key) {
    return OrzaVSMobileJNI.MapOfStringToUInt_has_key(cPtr, this, key);
  }

  @Override
  long nativeKeys(long cPtr) {
    return OrzaVSMobileJNI.MapOfStringToUInt_getKeysForIntMap(cPtr, this);
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_MapOfStringToUInt(cPtr);
  }
}
