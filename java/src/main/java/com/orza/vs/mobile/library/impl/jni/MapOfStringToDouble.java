package com.orza.vs.mobile.library.impl.jni;

/**
 * An ordered map from string to double. A missing key in {@link #get} or {@link #del} raises IndexOutOfBoundsException
 * "key not found"; a null key raises NullPointerException "null string".
 */
public class MapOfStringToDouble {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  public MapOfStringToDouble(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  MapOfStringToDouble(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  public static long getCPtr(MapOfStringToDouble obj) {
    return (obj == null) ? 0 : obj.swigCPtr;
  }

  @Override
  protected void finalize() {
    delete();
  }

  /** Frees the native object if this proxy owns it; afterwards the proxy is unusable. */
  public synchronized void delete() {
    if (swigCPtr != 0) {
      if (swigCMemOwn) {
        swigCMemOwn = false;
        OrzaVSMobileJNI.delete_MapOfStringToDouble(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
  }

  public MapOfStringToDouble() {
    this(OrzaVSMobileJNI.new_MapOfStringToDouble__SWIG_0(), true);
  }

  /** A copy of {@code other}. */
  public MapOfStringToDouble(MapOfStringToDouble other) {
    this(OrzaVSMobileJNI.new_MapOfStringToDouble__SWIG_1(MapOfStringToDouble.getCPtr(other), other), true);
  }

  public int size() {
    return OrzaVSMobileJNI.MapOfStringToDouble_size(swigCPtr, this);
  }

  public boolean empty() {
    return OrzaVSMobileJNI.MapOfStringToDouble_empty(swigCPtr, this);
  }

  public void clear() {
    OrzaVSMobileJNI.MapOfStringToDouble_clear(swigCPtr, this);
  }

  public double get(String key) {
    return OrzaVSMobileJNI.MapOfStringToDouble_get(swigCPtr, this, key);
  }

  /** Inserts or overwrites. */
  public void set(String key, double x) {
    OrzaVSMobileJNI.MapOfStringToDouble_set(swigCPtr, this, key, x);
  }

  public void del(String key) {
    OrzaVSMobileJNI.MapOfStringToDouble_del(swigCPtr, this, key);
  }

  public boolean has_key(String key) {
    return OrzaVSMobileJNI.MapOfStringToDouble_has_key(swigCPtr, this, key);
  }

  /** Every key in ascending order, as a new vector owned by the caller. */
  public VectorOfString getKeysForDoubleMap() {
    return new VectorOfString(OrzaVSMobileJNI.MapOfStringToDouble_getKeysForDoubleMap(swigCPtr, this), true);
  }

  /** Same as {@link #getKeysForDoubleMap}. */
  public VectorOfString getKeys() {
    return getKeysForDoubleMap();
  }
}
