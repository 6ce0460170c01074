package com.orza.vs.mobile.library.impl.jni;

/**
 * One detected or decoded object. {@code subContents} nests objects of the same type;
 * {@code location} is its outline in frame pixels.
 */
public class ObjectInfo extends NativeObject {
  public ObjectInfo(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  ObjectInfo(long cPtr, Object parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(ObjectInfo obj) {
    return (obj == null) ? 0 : obj.swigCPtr;
  }

  @Override
  protected void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_ObjectInfo(cPtr);
  }

  public ObjectInfo(ContentType contentType) {
    this(OrzaVSMobileJNI.new_ObjectInfo__SWIG_0(contentType.swigValue()), true);
  }

  public ObjectInfo() {
    this(OrzaVSMobileJNI.new_ObjectInfo__SWIG_1(), true);
  }

  public void setSrcObjectModule(ObjectModuleID value) {
    OrzaVSMobileJNI.ObjectInfo_srcObjectModule_set(swigCPtr, this, value.swigValue());
  }

  public ObjectModuleID getSrcObjectModule() {
    return ObjectModuleID.swigToEnum(OrzaVSMobileJNI.ObjectInfo_srcObjectModule_get(swigCPtr, this));
  }

  public void setContentType(ContentType value) {
    OrzaVSMobileJNI.ObjectInfo_contentType_set(swigCPtr, this, value.swigValue());
  }

  public ContentType getContentType() {
    return ContentType.swigToEnum(OrzaVSMobileJNI.ObjectInfo_contentType_get(swigCPtr, this));
  }

  public void setContent(String value) {
    OrzaVSMobileJNI.ObjectInfo_content_set(swigCPtr, this, value);
  }

  public String getContent() {
    return OrzaVSMobileJNI.ObjectInfo_content_get(swigCPtr, this);
  }

  public void setProperties(String value) {
    OrzaVSMobileJNI.ObjectInfo_properties_set(swigCPtr, this, value);
  }

  public String getProperties() {
    return OrzaVSMobileJNI.ObjectInfo_properties_get(swigCPtr, this);
  }

  /** Copies {@code value} into this object. */
  public void setSubContents(VectorOfObjectInfo value) {
    OrzaVSMobileJNI.ObjectInfo_subContents_set(swigCPtr, this, VectorOfObjectInfo.getCPtr(value), value);
  }

  /** A view into this object (not a copy); valid while this object lives. */
  public VectorOfObjectInfo getSubContents() {
    long cPtr = OrzaVSMobileJNI.ObjectInfo_subContents_get(swigCPtr, this);
    return (cPtr == 0) ? null : new VectorOfObjectInfo(cPtr, this);
  }

  /** Copies {@code value} into this object. */
  public void setLocation(VectorOfPoint2f value) {
    OrzaVSMobileJNI.ObjectInfo_location_set(swigCPtr, this, VectorOfPoint2f.getCPtr(value), value);
  }

  /** A view into this object (not a copy); valid while this object lives. */
  public VectorOfPoint2f getLocation() {
    long cPtr = OrzaVSMobileJNI.ObjectInfo_location_get(swigCPtr, this);
    return (cPtr == 0) ? null : new VectorOfPoint2f(cPtr, this);
  }
}
