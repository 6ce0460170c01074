package com.orza.vs.mobile.library.impl.jni;

/**
 * One request handed to a transport ({@link ServerDelegate#sendServerRequestImpl}). The request
 * passed to a transport is borrowed: copy what you need (id, params, metadata,
 * {@code getData().getData()}) before returning.
 */
public class ServerRequest extends NativeObject {
  public ServerRequest(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  ServerRequest(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(ServerRequest obj) {
    return (obj == null) ? 0 : obj.swigCPtr();
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_ServerRequest(cPtr);
  }

  public ServerRequest() {
    this(OrzaVSMobileJNI.new_ServerRequest__SWIG_0(), true);
  }

  public ServerRequest(ByteArray data, String id, MapOfStringToString params, MapOfStringToString metadata) {
    this(OrzaVSMobileJNI.new_ServerRequest__SWIG_1(ByteArray.getCPtr(data), data, id, MapOfStringToString.getCPtr(params), params, MapOfStringToString.getCPtr(metadata), metadata), true);
  }

  public ServerRequest(ByteArray data, String id, MapOfStringToString params) {
    this(OrzaVSMobileJNI.new_ServerRequest__SWIG_2(ByteArray.getCPtr(data), data, id, MapOfStringToString.getCPtr(params), params), true);
  }

  public ServerRequest(ByteArray data, String id) {
    this(OrzaVSMobileJNI.new_ServerRequest__SWIG_3(ByteArray.getCPtr(data), data, id), true);
  }

  public void setId(String value) {
    OrzaVSMobileJNI.ServerRequest_id_set(swigCPtr(), this, value);
  }

  public String getId() {
    return OrzaVSMobileJNI.ServerRequest_id_get(swigCPtr(), this);
  }

  /** Copies {@code value} into this object. */
  public void setParams(MapOfStringToString value) {
    OrzaVSMobileJNI.ServerRequest_params_set(swigCPtr(), this, MapOfStringToString.getCPtr(value), value);
    nref.changed();
  }

  /** A view into this object (not a copy); valid while this object lives. */
  public MapOfStringToString getParams() {
    long cPtr = OrzaVSMobileJNI.ServerRequest_params_get(swigCPtr(), this);
    return (cPtr == 0) ? null : new MapOfStringToString(cPtr, nref);
  }

  /** Copies {@code value} into this object. */
  public void setData(ByteArray value) {
    OrzaVSMobileJNI.ServerRequest_data_set(swigCPtr(), this, ByteArray.getCPtr(value), value);
    nref.changed();
  }

  /** A view into this object (not a copy); valid while this object lives. */
  public ByteArray getData() {
    long cPtr = OrzaVSMobileJNI.ServerRequest_data_get(swigCPtr(), this);
    return (cPtr == 0) ? null : new ByteArray(cPtr, nref);
  }

  /** Copies {@code value} into this object. */
  public void setMetadata(MapOfStringToString value) {
    OrzaVSMobileJNI.ServerRequest_metadata_set(swigCPtr(), this, MapOfStringToString.getCPtr(value), value);
    nref.changed();
  }

  /** A view into this object (not a copy); valid while this object lives. */
  public MapOfStringToString getMetadata() {
    long cPtr = OrzaVSMobileJNI.ServerRequest_metadata_get(swigCPtr(), this);
    return (cPtr == 0) ? null : new MapOfStringToString(cPtr, nref);
  }

  public void setResponseHandler(ServerResponseHandler value) {
    OrzaVSMobileJNI.ServerRequest_responseHandler_set(swigCPtr(), this, ServerResponseHandler.getCPtr(value), value);
  }

  /** The object pointed to (not owned by Java), or null. */
  public ServerResponseHandler getResponseHandler() {
    long cPtr = OrzaVSMobileJNI.ServerRequest_responseHandler_get(swigCPtr(), this);
    return (cPtr == 0) ? null : new ServerResponseHandler(cPtr, nref);
  }

  public void clear() {
    OrzaVSMobileJNI.ServerRequest_clear(swigCPtr(), this);
    nref.changed();
  }
}
