package com.orza.vs.mobile.library.impl.jni;

/**
 * One detected or decoded object. {@code subContents} nests objects of the same type;
 * {@code location} is its outline in frame pixels.
 */
public class ObjectInfo extends NativeObject {
  public ObjectInfo(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  ObjectInfo(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(ObjectInfo obj) {
    return (obj == null) ? 0 : obj.swigCPtr();
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_ObjectInfo(cPtr);
  }

  public ObjectInfo(ContentType contentType) {
    this(OrzaVSMobileJNI.new_ObjectInfo__SWIG_0(contentType.swigValue()), true);
  }

  public ObjectInfo() {
    this(OrzaVSMobileJNI.new_ObjectInfo__SWIG_1(), true);
  }

  public void setSrcObjectModule(ObjectModuleID value) {
    OrzaVSMobileJNI.ObjectInfo_srcObjectModule_set(swigCPtr(), this, value.swigValue());
  }

  public ObjectModuleID getSrcObjectModule() {
    return ObjectModuleID.swigToEnum(OrzaVSMobileJNI.ObjectInfo_srcObjectModule_get(swigCPtr(), this));
  }

  public void setContentType(ContentType value) {
    OrzaVSMobileJNI.ObjectInfo_contentType_set(swigCPtr(), this, value.swigValue());
  }

  public ContentType getContentType() {
    return ContentType.swigToEnum(OrzaVSMobileJNI.ObjectInfo_contentType_get(swigCPtr(), this));
  }

  public void setContent(String value) {
    OrzaVSMobileJNI.ObjectInfo_content_set(swigCPtr(), this, value);
  }

  public String getContent() {
    return OrzaVSMobileJNI.ObjectInfo_content_get(swigCPtr(), this);
  }

  public void setProperties(String value) {
    OrzaVSMobileJNI.ObjectInfo_properties_set(swigCPtr(), this, value);
  }

  public String getProperties() {
    return OrzaVSMobileJNI.ObjectInfo_properties_get(swigCPtr(), this);
  }

  /** Copies {@code value} into this object. */
  public void setSubContents(VectorOfObjectInfo value) {
    OrzaVSMobileJNI.ObjectInfo_subContents_set(swigCPtr(), this, VectorOfObjectInfo.getCPtr(value), value);
    nref.changed();
  }

  /** A view into this object (not a copy); valid while this object lives and its sub-contents are not replaced. */
  public VectorOfObjectInfo getSubContents() {
    long cPtr = OrzaVSMobileJNI.ObjectInfo_subContents_get(swigCPtr(), this);
    return (cPtr == 0) ? null : new VectorOfObjectInfo(cPtr, nref);
  }

  /** Copies {@code value} into this object. */
  public void setLocation(VectorOfPoint2f value) {
    OrzaVSMobileJNI.ObjectInfo_location_set(swigCPtr(), this, VectorOfPoint2f.getCPtr(value), value);
    nref.changed();
  }

  /** A view into this object (not a copy); valid while this object lives and its location is not replaced. */
  public VectorOfPoint2f getLocation() {
    long cPtr = OrzaVSMobileJNI.ObjectInfo_location_get(swigCPtr(), this);
    return (cPtr == 0) ? null : new VectorOfPoint2f(cPtr, nref);
  }

  /**
   * An owned deep copy (sub-contents and location included) that stays valid on its own, for
   * example to keep a result handed to a callback.
   */
  public ObjectInfo copy() {
    long from = swigCPtr();
    ObjectInfo out = new ObjectInfo();
    long to = out.swigCPtr();
    // Enumerations as their native values, so that a value without a Java constant is kept too.
    OrzaVSMobileJNI.ObjectInfo_contentType_set(to, out, OrzaVSMobileJNI.ObjectInfo_contentType_get(from, this));
    OrzaVSMobileJNI.ObjectInfo_srcObjectModule_set(to, out,
        OrzaVSMobileJNI.ObjectInfo_srcObjectModule_get(from, this));
    out.setContent(getContent());
    out.setProperties(getProperties());
    out.setSubContents(getSubContents());
    out.setLocation(getLocation());
    return out;
  }
}
