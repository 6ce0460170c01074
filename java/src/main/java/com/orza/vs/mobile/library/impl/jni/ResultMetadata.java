package com.orza.vs.mobile.library.impl.jni;

/** Facts about one batch of decode results. */
public class ResultMetadata extends NativeObject {
  public ResultMetadata(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  ResultMetadata(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(ResultMetadata obj) {
    return (obj == null) ? 0 : obj.swigCPtr();
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_ResultMetadata(cPtr);
  }

  public ResultMetadata() {
    this(OrzaVSMobileJNI.new_ResultMetadata(), true);
  }

  public void setIsFinalAccumulation(boolean value) {
    OrzaVSMobileJNI.ResultMetadata_isFinalAccumulation_set(swigCPtr(), this, value);
  }

  public boolean getIsFinalAccumulation() {
    return OrzaVSMobileJNI.ResultMetadata_isFinalAccumulation_get(swigCPtr(), this);
  }

  public void setQueryID(String value) {
    OrzaVSMobileJNI.ResultMetadata_queryID_set(swigCPtr(), this, value);
  }

  public String getQueryID() {
    return OrzaVSMobileJNI.ResultMetadata_queryID_get(swigCPtr(), this);
  }

  public void setMobileDecorator(String value) {
    OrzaVSMobileJNI.ResultMetadata_mobileDecorator_set(swigCPtr(), this, value);
  }

  public String getMobileDecorator() {
    return OrzaVSMobileJNI.ResultMetadata_mobileDecorator_get(swigCPtr(), this);
  }

  /** Copies {@code value} into this object. */
  public void setAccumulatedQueries(VectorOfString value) {
    OrzaVSMobileJNI.ResultMetadata_accumulatedQueries_set(swigCPtr(), this, VectorOfString.getCPtr(value), value);
    nref.changed();
  }

  /** A view into this object (not a copy); valid while this object lives. */
  public VectorOfString getAccumulatedQueries() {
    long cPtr = OrzaVSMobileJNI.ResultMetadata_accumulatedQueries_get(swigCPtr(), this);
    return (cPtr == 0) ? null : new VectorOfString(cPtr, nref);
  }

  /** Back to the freshly constructed state. */
  public void clear() {
    OrzaVSMobileJNI.ResultMetadata_clear(swigCPtr(), this);
    nref.changed();
  }

  /** An owned copy that stays valid on its own, for example to keep the metadata of a callback. */
  public ResultMetadata copy() {
    ResultMetadata out = new ResultMetadata();
    out.setIsFinalAccumulation(getIsFinalAccumulation());
    out.setQueryID(getQueryID());
    out.setMobileDecorator(getMobileDecorator());
    out.setAccumulatedQueries(getAccumulatedQueries());
    return out;
  }
}
