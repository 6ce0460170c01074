package com.orza.vs.mobile.library.impl.jni;

/** A pair of strings ({@code std::pair<std::string, std::string>}). */
public class StringPair {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  public StringPair(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  StringPair(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  public static long getCPtr(StringPair obj) {
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
        OrzaVSMobileJNI.delete_StringPair(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
  }

  public StringPair() {
    this(OrzaVSMobileJNI.new_StringPair__SWIG_0(), true);
  }

  public StringPair(String first, String second) {
    this(OrzaVSMobileJNI.new_StringPair__SWIG_1(first, second), true);
  }

  public StringPair(StringPair other) {
    this(OrzaVSMobileJNI.new_StringPair__SWIG_2(StringPair.getCPtr(other), other), true);
  }

  public void setFirst(String value) {
    OrzaVSMobileJNI.StringPair_first_set(swigCPtr, this, value);
  }

  public String getFirst() {
    return OrzaVSMobileJNI.StringPair_first_get(swigCPtr, this);
  }

  public void setSecond(String value) {
    OrzaVSMobileJNI.StringPair_second_set(swigCPtr, this, value);
  }

  public String getSecond() {
    return OrzaVSMobileJNI.StringPair_second_get(swigCPtr, this);
  }
}
