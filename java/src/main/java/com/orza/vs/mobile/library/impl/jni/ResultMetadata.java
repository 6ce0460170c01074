package com.orza.vs.mobile.library.impl.jni;

/** Facts about one batch of decode results. */
public class ResultMetadata {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  public ResultMetadata(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  ResultMetadata(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  public static long getCPtr(ResultMetadata obj) {
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
        OrzaVSMobileJNI.delete_ResultMetadata(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
  }

  public ResultMetadata() {
    this(OrzaVSMobileJNI.new_ResultMetadata(), true);
  }

  public void setIsFinalAccumulation(boolean value) {
    OrzaVSMobileJNI.ResultMetadata_isFinalAccumulation_set(swigCPtr, this, value);
  }

  public boolean getIsFinalAccumulation() {
    return OrzaVSMobileJNI.ResultMetadata_isFinalAccumulation_get(swigCPtr, this);
  }

  public void setQueryID(String value) {
    OrzaVSMobileJNI.ResultMetadata_queryID_set(swigCPtr, this, value);
  }

  public String getQueryID() {
    return OrzaVSMobileJNI.ResultMetadata_queryID_get(swigCPtr, this);
  }

  public void setMobileDecorator(String value) {
    OrzaVSMobileJNI.ResultMetadata_mobileDecorator_set(swigCPtr, this, value);
  }

  public String getMobileDecorator() {
    return OrzaVSMobileJNI.ResultMetadata_mobileDecorator_get(swigCPtr, this);
  }

  /** Copies {@code value} into this object. */
  public void setAccumulatedQueries(VectorOfString value) {
    OrzaVSMobileJNI.ResultMetadata_accumulatedQueries_set(swigCPtr, this, VectorOfString.getCPtr(value), value);
  }

  /** A view into this object (not a copy); valid while this object lives. */
  public VectorOfString getAccumulatedQueries() {
    long cPtr = OrzaVSMobileJNI.ResultMetadata_accumulatedQueries_get(swigCPtr, this);
    return (cPtr == 0) ? null : new VectorOfString(cPtr, this);
  }

  /** Back to the freshly constructed state. */
  public void clear() {
    OrzaVSMobileJNI.ResultMetadata_clear(swigCPtr, this);
  }
}
