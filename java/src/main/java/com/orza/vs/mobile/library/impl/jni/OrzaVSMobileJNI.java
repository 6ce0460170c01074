package com.orza.vs.mobile.library.impl.jni;

/**
 * The native methods of the library, one per exported function, and the static methods that the
 * library calls back (directors). Applications use the proxy classes instead.
 *
 * <p>Conventions: every native object crosses as a {@code long} handle (its address), followed
 * by the proxy that holds it (so that the proxy stays reachable during the call); enumerations
 * cross as {@code int}. Errors come back as Java exceptions: NullPointerException for a null
 * reference, string or object, IndexOutOfBoundsException for container indices and keys.
 *
 * <p>The library is loaded when this class initialises: from the absolute path in the system
 * property {@code orzavs.library.path} when it is set (tests, tools), otherwise with
 * {@code System.loadLibrary("OrzaVSMobile")}.
 */
public class OrzaVSMobileJNI {
  /** System property naming the native library file to load instead of the default. */
  public static final String LIBRARY_PATH_PROPERTY = "orzavs.library.path";

  static {
    String path = System.getProperty(LIBRARY_PATH_PROPERTY);
    if (path != null && !path.isEmpty()) {
      System.load(path);
    } else {
      System.loadLibrary("OrzaVSMobile");
    }
    swig_module_init();
  }

  private OrzaVSMobileJNI() {}

  private final static native void swig_module_init();

  // ---------------------------------------------------------------------------------------
  // Exported functions, by family.

  public final static native long new_StringPair__SWIG_0();
  public final static native long new_StringPair__SWIG_1(String jarg1, String jarg2);
  public final static native long new_StringPair__SWIG_2(long jarg1, StringPair jarg1_);
  public final static native void delete_StringPair(long jarg1);
  public final static native void StringPair_first_set(long jarg1, StringPair jarg1_, String jarg2);
  public final static native String StringPair_first_get(long jarg1, StringPair jarg1_);
  public final static native void StringPair_second_set(long jarg1, StringPair jarg1_, String jarg2);
  public final static native String StringPair_second_get(long jarg1, StringPair jarg1_);
  public final static native long new_FrameROI();
  public final static native void delete_FrameROI(long jarg1);
  public final static native void FrameROI_x_set(long jarg1, FrameROI jarg1_, int jarg2);
  public final static native int FrameROI_x_get(long jarg1, FrameROI jarg1_);
  public final static native void FrameROI_y_set(long jarg1, FrameROI jarg1_, int jarg2);
  public final static native int FrameROI_y_get(long jarg1, FrameROI jarg1_);
  public final static native void FrameROI_width_set(long jarg1, FrameROI jarg1_, int jarg2);
  public final static native int FrameROI_width_get(long jarg1, FrameROI jarg1_);
  public final static native void FrameROI_height_set(long jarg1, FrameROI jarg1_, int jarg2);
  public final static native int FrameROI_height_get(long jarg1, FrameROI jarg1_);
  public final static native long new_ExtraFrameData();
  public final static native void delete_ExtraFrameData(long jarg1);
  public final static native void ExtraFrameData_displayROI_set(long jarg1, ExtraFrameData jarg1_, long jarg2, FrameROI jarg2_);
  public final static native long ExtraFrameData_displayROI_get(long jarg1, ExtraFrameData jarg1_);
  public final static native void ExtraFrameData_focusROI_set(long jarg1, ExtraFrameData jarg1_, long jarg2, FrameROI jarg2_);
  public final static native long ExtraFrameData_focusROI_get(long jarg1, ExtraFrameData jarg1_);
  public final static native void ExtraFrameData_screenOrient_set(long jarg1, ExtraFrameData jarg1_, int jarg2);
  public final static native int ExtraFrameData_screenOrient_get(long jarg1, ExtraFrameData jarg1_);
  public final static native void ExtraFrameData_fieldOfView_set(long jarg1, ExtraFrameData jarg1_, double jarg2);
  public final static native double ExtraFrameData_fieldOfView_get(long jarg1, ExtraFrameData jarg1_);
  public final static native void ExtraFrameData_flat_set(long jarg1, ExtraFrameData jarg1_, boolean jarg2);
  public final static native boolean ExtraFrameData_flat_get(long jarg1, ExtraFrameData jarg1_);
  public final static native void ExtraFrameData_timeStamp_set(long jarg1, ExtraFrameData jarg1_, double jarg2);
  public final static native double ExtraFrameData_timeStamp_get(long jarg1, ExtraFrameData jarg1_);
  public final static native long new_ImageBuffer__SWIG_0();
  public final static native long new_ImageBuffer__SWIG_1(int jarg1, int jarg2, int jarg3, int jarg4, int jarg5, int jarg6, long jarg7);
  public final static native void delete_ImageBuffer(long jarg1);
  public final static native void ImageBuffer_width_set(long jarg1, ImageBuffer jarg1_, int jarg2);
  public final static native int ImageBuffer_width_get(long jarg1, ImageBuffer jarg1_);
  public final static native void ImageBuffer_height_set(long jarg1, ImageBuffer jarg1_, int jarg2);
  public final static native int ImageBuffer_height_get(long jarg1, ImageBuffer jarg1_);
  public final static native void ImageBuffer_widthStep_set(long jarg1, ImageBuffer jarg1_, int jarg2);
  public final static native int ImageBuffer_widthStep_get(long jarg1, ImageBuffer jarg1_);
  public final static native void ImageBuffer_numChannels_set(long jarg1, ImageBuffer jarg1_, int jarg2);
  public final static native int ImageBuffer_numChannels_get(long jarg1, ImageBuffer jarg1_);
  public final static native void ImageBuffer_format_set(long jarg1, ImageBuffer jarg1_, int jarg2);
  public final static native int ImageBuffer_format_get(long jarg1, ImageBuffer jarg1_);
  public final static native void ImageBuffer_definition_set(long jarg1, ImageBuffer jarg1_, int jarg2);
  public final static native int ImageBuffer_definition_get(long jarg1, ImageBuffer jarg1_);
  public final static native void ImageBuffer_data_set(long jarg1, ImageBuffer jarg1_, long jarg2);
  public final static native long ImageBuffer_data_get(long jarg1, ImageBuffer jarg1_);
  public final static native void ImageBuffer_allocLen_set(long jarg1, ImageBuffer jarg1_, int jarg2);
  public final static native int ImageBuffer_allocLen_get(long jarg1, ImageBuffer jarg1_);
  public final static native int ImageBuffer_allocateBuffer(long jarg1, ImageBuffer jarg1_, int jarg2);
  public final static native int ImageBuffer_fillBuffer(long jarg1, ImageBuffer jarg1_, byte[] jarg2, int jarg3);
  public final static native int ImageBuffer_fillBufferWithByteBuffer__SWIG_0(long jarg1, ImageBuffer jarg1_, java.nio.ByteBuffer jarg2, int jarg3);
  public final static native int ImageBuffer_fillBufferWithByteBuffer__SWIG_1(long jarg1, ImageBuffer jarg1_, java.nio.ByteBuffer jarg2, int jarg3, java.nio.ByteBuffer jarg4, int jarg5);
  public final static native void ImageBuffer_releaseBuffer(long jarg1, ImageBuffer jarg1_);
  public final static native long new_ByteArray__SWIG_0();
  public final static native long new_ByteArray__SWIG_1(long jarg1, ByteArray jarg1_);
  public final static native void delete_ByteArray(long jarg1);
  public final static native byte[] ByteArray_getData(long jarg1, ByteArray jarg1_);
  public final static native int ByteArray_getLength(long jarg1, ByteArray jarg1_);
  public final static native void ByteArray_clear(long jarg1, ByteArray jarg1_);
  public final static native long new_FrameID();
  public final static native void delete_FrameID(long jarg1);
  public final static native void FrameID_id_set(long jarg1, FrameID jarg1_, String jarg2);
  public final static native String FrameID_id_get(long jarg1, FrameID jarg1_);
  public final static native long new_CameraResRequirement();
  public final static native void delete_CameraResRequirement(long jarg1);
  public final static native void CameraResRequirement_minHeight_set(long jarg1, CameraResRequirement jarg1_, int jarg2);
  public final static native int CameraResRequirement_minHeight_get(long jarg1, CameraResRequirement jarg1_);
  public final static native void CameraResRequirement_maxHeight_set(long jarg1, CameraResRequirement jarg1_, int jarg2);
  public final static native int CameraResRequirement_maxHeight_get(long jarg1, CameraResRequirement jarg1_);
  public final static native long new_Point2f__SWIG_0();
  public final static native long new_Point2f__SWIG_1(float jarg1, float jarg2);
  public final static native void delete_Point2f(long jarg1);
  public final static native void Point2f_x_set(long jarg1, Point2f jarg1_, float jarg2);
  public final static native float Point2f_x_get(long jarg1, Point2f jarg1_);
  public final static native void Point2f_y_set(long jarg1, Point2f jarg1_, float jarg2);
  public final static native float Point2f_y_get(long jarg1, Point2f jarg1_);
  public final static native long new_Point3d__SWIG_0();
  public final static native long new_Point3d__SWIG_1(double jarg1, double jarg2, double jarg3);
  public final static native void delete_Point3d(long jarg1);
  public final static native void Point3d_x_set(long jarg1, Point3d jarg1_, double jarg2);
  public final static native double Point3d_x_get(long jarg1, Point3d jarg1_);
  public final static native void Point3d_y_set(long jarg1, Point3d jarg1_, double jarg2);
  public final static native double Point3d_y_get(long jarg1, Point3d jarg1_);
  public final static native void Point3d_z_set(long jarg1, Point3d jarg1_, double jarg2);
  public final static native double Point3d_z_get(long jarg1, Point3d jarg1_);
  public final static native long new_ResultMetadata();
  public final static native void delete_ResultMetadata(long jarg1);
  public final static native void ResultMetadata_isFinalAccumulation_set(long jarg1, ResultMetadata jarg1_, boolean jarg2);
  public final static native boolean ResultMetadata_isFinalAccumulation_get(long jarg1, ResultMetadata jarg1_);
  public final static native void ResultMetadata_queryID_set(long jarg1, ResultMetadata jarg1_, String jarg2);
  public final static native String ResultMetadata_queryID_get(long jarg1, ResultMetadata jarg1_);
  public final static native void ResultMetadata_mobileDecorator_set(long jarg1, ResultMetadata jarg1_, String jarg2);
  public final static native String ResultMetadata_mobileDecorator_get(long jarg1, ResultMetadata jarg1_);
  public final static native void ResultMetadata_accumulatedQueries_set(long jarg1, ResultMetadata jarg1_, long jarg2, VectorOfString jarg2_);
  public final static native long ResultMetadata_accumulatedQueries_get(long jarg1, ResultMetadata jarg1_);
  public final static native void ResultMetadata_clear(long jarg1, ResultMetadata jarg1_);
  public final static native long new_ObjectInfo__SWIG_0(int jarg1);
  public final static native long new_ObjectInfo__SWIG_1();
  public final static native void delete_ObjectInfo(long jarg1);
  public final static native void ObjectInfo_srcObjectModule_set(long jarg1, ObjectInfo jarg1_, int jarg2);
  public final static native int ObjectInfo_srcObjectModule_get(long jarg1, ObjectInfo jarg1_);
  public final static native void ObjectInfo_contentType_set(long jarg1, ObjectInfo jarg1_, int jarg2);
  public final static native int ObjectInfo_contentType_get(long jarg1, ObjectInfo jarg1_);
  public final static native void ObjectInfo_content_set(long jarg1, ObjectInfo jarg1_, String jarg2);
  public final static native String ObjectInfo_content_get(long jarg1, ObjectInfo jarg1_);
  public final static native void ObjectInfo_properties_set(long jarg1, ObjectInfo jarg1_, String jarg2);
  public final static native String ObjectInfo_properties_get(long jarg1, ObjectInfo jarg1_);
  public final static native void ObjectInfo_subContents_set(long jarg1, ObjectInfo jarg1_, long jarg2, VectorOfObjectInfo jarg2_);
  public final static native long ObjectInfo_subContents_get(long jarg1, ObjectInfo jarg1_);
  public final static native void ObjectInfo_location_set(long jarg1, ObjectInfo jarg1_, long jarg2, VectorOfPoint2f jarg2_);
  public final static native long ObjectInfo_location_get(long jarg1, ObjectInfo jarg1_);
  public final static native long new_ServerResponse();
  public final static native void delete_ServerResponse(long jarg1);
  public final static native void ServerResponse_id_set(long jarg1, ServerResponse jarg1_, String jarg2);
  public final static native String ServerResponse_id_get(long jarg1, ServerResponse jarg1_);
  public final static native void ServerResponse_responseCode_set(long jarg1, ServerResponse jarg1_, int jarg2);
  public final static native int ServerResponse_responseCode_get(long jarg1, ServerResponse jarg1_);
  public final static native void ServerResponse_responseStr_set(long jarg1, ServerResponse jarg1_, String jarg2);
  public final static native String ServerResponse_responseStr_get(long jarg1, ServerResponse jarg1_);
  public final static native void ServerResponse_roundtripTime_set(long jarg1, ServerResponse jarg1_, double jarg2);
  public final static native double ServerResponse_roundtripTime_get(long jarg1, ServerResponse jarg1_);
  public final static native void ServerResponse_compressed_set(long jarg1, ServerResponse jarg1_, boolean jarg2);
  public final static native boolean ServerResponse_compressed_get(long jarg1, ServerResponse jarg1_);
  public final static native void ServerResponseHandler_handleServerResponse(long jarg1, ServerResponseHandler jarg1_, long jarg2, ServerResponse jarg2_);
  public final static native void delete_ServerResponseHandler(long jarg1);
  public final static native long new_ServerRequest__SWIG_0();
  public final static native long new_ServerRequest__SWIG_1(long jarg1, ByteArray jarg1_, String jarg2, long jarg3, MapOfStringToString jarg3_, long jarg4, MapOfStringToString jarg4_);
  public final static native long new_ServerRequest__SWIG_2(long jarg1, ByteArray jarg1_, String jarg2, long jarg3, MapOfStringToString jarg3_);
  public final static native long new_ServerRequest__SWIG_3(long jarg1, ByteArray jarg1_, String jarg2);
  public final static native void delete_ServerRequest(long jarg1);
  public final static native void ServerRequest_id_set(long jarg1, ServerRequest jarg1_, String jarg2);
  public final static native String ServerRequest_id_get(long jarg1, ServerRequest jarg1_);
  public final static native void ServerRequest_params_set(long jarg1, ServerRequest jarg1_, long jarg2, MapOfStringToString jarg2_);
  public final static native long ServerRequest_params_get(long jarg1, ServerRequest jarg1_);
  public final static native void ServerRequest_data_set(long jarg1, ServerRequest jarg1_, long jarg2, ByteArray jarg2_);
  public final static native long ServerRequest_data_get(long jarg1, ServerRequest jarg1_);
  public final static native void ServerRequest_metadata_set(long jarg1, ServerRequest jarg1_, long jarg2, MapOfStringToString jarg2_);
  public final static native long ServerRequest_metadata_get(long jarg1, ServerRequest jarg1_);
  public final static native void ServerRequest_responseHandler_set(long jarg1, ServerRequest jarg1_, long jarg2, ServerResponseHandler jarg2_);
  public final static native long ServerRequest_responseHandler_get(long jarg1, ServerRequest jarg1_);
  public final static native void ServerRequest_clear(long jarg1, ServerRequest jarg1_);
  public final static native long new_NEONAccelerationResult();
  public final static native void delete_NEONAccelerationResult(long jarg1);
  public final static native void NEONAccelerationResult_resultStr_set(long jarg1, NEONAccelerationResult jarg1_, String jarg2);
  public final static native String NEONAccelerationResult_resultStr_get(long jarg1, NEONAccelerationResult jarg1_);
  public final static native long new_MobileUtils();
  public final static native void delete_MobileUtils(long jarg1);
  public final static native boolean MobileUtils_setupLogging(String jarg1);
  public final static native boolean MobileUtils_testNeonSupport();
  public final static native boolean MobileUtils_setupNeonFunctions();
  public final static native void MobileUtils_testNeon(long jarg1, NEONAccelerationResult jarg1_);
  public final static native long new_VectorOfInt__SWIG_0();
  public final static native long new_VectorOfInt__SWIG_1(int jarg1);
  public final static native int VectorOfInt_size(long jarg1, VectorOfInt jarg1_);
  public final static native int VectorOfInt_capacity(long jarg1, VectorOfInt jarg1_);
  public final static native void VectorOfInt_reserve(long jarg1, VectorOfInt jarg1_, int jarg2);
  public final static native boolean VectorOfInt_isEmpty(long jarg1, VectorOfInt jarg1_);
  public final static native void VectorOfInt_clear(long jarg1, VectorOfInt jarg1_);
  public final static native void VectorOfInt_add(long jarg1, VectorOfInt jarg1_, int jarg2);
  public final static native int VectorOfInt_get(long jarg1, VectorOfInt jarg1_, int jarg2);
  public final static native void VectorOfInt_set(long jarg1, VectorOfInt jarg1_, int jarg2, int jarg3);
  public final static native void delete_VectorOfInt(long jarg1);
  public final static native long new_VectorOfDouble__SWIG_0();
  public final static native long new_VectorOfDouble__SWIG_1(int jarg1);
  public final static native int VectorOfDouble_size(long jarg1, VectorOfDouble jarg1_);
  public final static native int VectorOfDouble_capacity(long jarg1, VectorOfDouble jarg1_);
  public final static native void VectorOfDouble_reserve(long jarg1, VectorOfDouble jarg1_, int jarg2);
  public final static native boolean VectorOfDouble_isEmpty(long jarg1, VectorOfDouble jarg1_);
  public final static native void VectorOfDouble_clear(long jarg1, VectorOfDouble jarg1_);
  public final static native void VectorOfDouble_add(long jarg1, VectorOfDouble jarg1_, double jarg2);
  public final static native double VectorOfDouble_get(long jarg1, VectorOfDouble jarg1_, int jarg2);
  public final static native void VectorOfDouble_set(long jarg1, VectorOfDouble jarg1_, int jarg2, double jarg3);
  public final static native void delete_VectorOfDouble(long jarg1);
  public final static native long new_VectorOfString__SWIG_0();
  public final static native long new_VectorOfString__SWIG_1(int jarg1);
  public final static native int VectorOfString_size(long jarg1, VectorOfString jarg1_);
  public final static native int VectorOfString_capacity(long jarg1, VectorOfString jarg1_);
  public final static native void VectorOfString_reserve(long jarg1, VectorOfString jarg1_, int jarg2);
  public final static native boolean VectorOfString_isEmpty(long jarg1, VectorOfString jarg1_);
  public final static native void VectorOfString_clear(long jarg1, VectorOfString jarg1_);
  public final static native void VectorOfString_add(long jarg1, VectorOfString jarg1_, String jarg2);
  public final static native String VectorOfString_get(long jarg1, VectorOfString jarg1_, int jarg2);
  public final static native void VectorOfString_set(long jarg1, VectorOfString jarg1_, int jarg2, String jarg3);
  public final static native void delete_VectorOfString(long jarg1);
  public final static native long new_VectorOfPoint2f__SWIG_0();
  public final static native long new_VectorOfPoint2f__SWIG_1(int jarg1);
  public final static native int VectorOfPoint2f_size(long jarg1, VectorOfPoint2f jarg1_);
  public final static native int VectorOfPoint2f_capacity(long jarg1, VectorOfPoint2f jarg1_);
  public final static native void VectorOfPoint2f_reserve(long jarg1, VectorOfPoint2f jarg1_, int jarg2);
  public final static native boolean VectorOfPoint2f_isEmpty(long jarg1, VectorOfPoint2f jarg1_);
  public final static native void VectorOfPoint2f_clear(long jarg1, VectorOfPoint2f jarg1_);
  public final static native void VectorOfPoint2f_add(long jarg1, VectorOfPoint2f jarg1_, long jarg2, Point2f jarg2_);
  public final static native long VectorOfPoint2f_get(long jarg1, VectorOfPoint2f jarg1_, int jarg2);
  public final static native void VectorOfPoint2f_set(long jarg1, VectorOfPoint2f jarg1_, int jarg2, long jarg3, Point2f jarg3_);
  public final static native void delete_VectorOfPoint2f(long jarg1);
  public final static native long new_VectorOfObjectInfo__SWIG_0();
  public final static native long new_VectorOfObjectInfo__SWIG_1(int jarg1);
  public final static native int VectorOfObjectInfo_size(long jarg1, VectorOfObjectInfo jarg1_);
  public final static native int VectorOfObjectInfo_capacity(long jarg1, VectorOfObjectInfo jarg1_);
  public final static native void VectorOfObjectInfo_reserve(long jarg1, VectorOfObjectInfo jarg1_, int jarg2);
  public final static native boolean VectorOfObjectInfo_isEmpty(long jarg1, VectorOfObjectInfo jarg1_);
  public final static native void VectorOfObjectInfo_clear(long jarg1, VectorOfObjectInfo jarg1_);
  public final static native void VectorOfObjectInfo_add(long jarg1, VectorOfObjectInfo jarg1_, long jarg2, ObjectInfo jarg2_);
  public final static native long VectorOfObjectInfo_get(long jarg1, VectorOfObjectInfo jarg1_, int jarg2);
  public final static native void VectorOfObjectInfo_set(long jarg1, VectorOfObjectInfo jarg1_, int jarg2, long jarg3, ObjectInfo jarg3_);
  public final static native void delete_VectorOfObjectInfo(long jarg1);
  public final static native long new_MapOfStringToUInt__SWIG_0();
  public final static native long new_MapOfStringToUInt__SWIG_1(long jarg1, MapOfStringToUInt jarg1_);
  public final static native int MapOfStringToUInt_size(long jarg1, MapOfStringToUInt jarg1_);
  public final static native boolean MapOfStringToUInt_empty(long jarg1, MapOfStringToUInt jarg1_);
  public final static native void MapOfStringToUInt_clear(long jarg1, MapOfStringToUInt jarg1_);
  public final static native long MapOfStringToUInt_get(long jarg1, MapOfStringToUInt jarg1_, String jarg2);
  public final static native void MapOfStringToUInt_set(long jarg1, MapOfStringToUInt jarg1_, String jarg2, long jarg3);
  public final static native void MapOfStringToUInt_del(long jarg1, MapOfStringToUInt jarg1_, String jarg2);
  public final static native boolean MapOfStringToUInt_has_key(long jarg1, MapOfStringToUInt jarg1_, String jarg2);
  public final static native long MapOfStringToUInt_getKeysForIntMap(long jarg1, MapOfStringToUInt jarg1_);
  public final static native void delete_MapOfStringToUInt(long jarg1);
  public final static native long new_MapOfStringToDouble__SWIG_0();
  public final static native long new_MapOfStringToDouble__SWIG_1(long jarg1, MapOfStringToDouble jarg1_);
  public final static native int MapOfStringToDouble_size(long jarg1, MapOfStringToDouble jarg1_);
  public final static native boolean MapOfStringToDouble_empty(long jarg1, MapOfStringToDouble jarg1_);
  public final static native void MapOfStringToDouble_clear(long jarg1, MapOfStringToDouble jarg1_);
  public final static native double MapOfStringToDouble_get(long jarg1, MapOfStringToDouble jarg1_, String jarg2);
  public final static native void MapOfStringToDouble_set(long jarg1, MapOfStringToDouble jarg1_, String jarg2, double jarg3);
  public final static native void MapOfStringToDouble_del(long jarg1, MapOfStringToDouble jarg1_, String jarg2);
  public final static native boolean MapOfStringToDouble_has_key(long jarg1, MapOfStringToDouble jarg1_, String jarg2);
  public final static native long MapOfStringToDouble_getKeysForDoubleMap(long jarg1, MapOfStringToDouble jarg1_);
  public final static native void delete_MapOfStringToDouble(long jarg1);
  public final static native long new_MapOfStringToString__SWIG_0();
  public final static native long new_MapOfStringToString__SWIG_1(long jarg1, MapOfStringToString jarg1_);
  public final static native int MapOfStringToString_size(long jarg1, MapOfStringToString jarg1_);
  public final static native boolean MapOfStringToString_empty(long jarg1, MapOfStringToString jarg1_);
  public final static native void MapOfStringToString_clear(long jarg1, MapOfStringToString jarg1_);
  public final static native String MapOfStringToString_get(long jarg1, MapOfStringToString jarg1_, String jarg2);
  public final static native void MapOfStringToString_set(long jarg1, MapOfStringToString jarg1_, String jarg2, String jarg3);
  public final static native void MapOfStringToString_del(long jarg1, MapOfStringToString jarg1_, String jarg2);
  public final static native boolean MapOfStringToString_has_key(long jarg1, MapOfStringToString jarg1_, String jarg2);
  public final static native long MapOfStringToString_getKeys(long jarg1, MapOfStringToString jarg1_);
  public final static native void delete_MapOfStringToString(long jarg1);
  public final static native long new_EventDelegateBase();
  public final static native void delete_EventDelegateBase(long jarg1);
  public final static native void EventDelegateBase_didReceiveEvent(long jarg1, EventDelegateBase jarg1_, int jarg2, int jarg3, int jarg4, int jarg5);
  public final static native void EventDelegateBase_didReceiveEventSwigExplicitEventDelegateBase(long jarg1, EventDelegateBase jarg1_, int jarg2, int jarg3, int jarg4, int jarg5);
  public final static native void EventDelegateBase_didProcessFrame(long jarg1, EventDelegateBase jarg1_, int jarg2, int jarg3, long jarg4, int jarg5);
  public final static native void EventDelegateBase_didProcessFrameSwigExplicitEventDelegateBase(long jarg1, EventDelegateBase jarg1_, int jarg2, int jarg3, long jarg4, int jarg5);
  public final static native void EventDelegateBase_didDetect(long jarg1, EventDelegateBase jarg1_, long jarg2, VectorOfObjectInfo jarg2_);
  public final static native void EventDelegateBase_didDetectSwigExplicitEventDelegateBase(long jarg1, EventDelegateBase jarg1_, long jarg2, VectorOfObjectInfo jarg2_);
  public final static native void EventDelegateBase_didDecode(long jarg1, EventDelegateBase jarg1_, long jarg2, VectorOfObjectInfo jarg2_, long jarg3, ResultMetadata jarg3_);
  public final static native void EventDelegateBase_didDecodeSwigExplicitEventDelegateBase(long jarg1, EventDelegateBase jarg1_, long jarg2, VectorOfObjectInfo jarg2_, long jarg3, ResultMetadata jarg3_);
  public final static native void EventDelegateBase_didDetectInterestPoints(long jarg1, EventDelegateBase jarg1_, long jarg2, VectorOfPoint2f jarg2_);
  public final static native void EventDelegateBase_didDetectInterestPointsSwigExplicitEventDelegateBase(long jarg1, EventDelegateBase jarg1_, long jarg2, VectorOfPoint2f jarg2_);
  public final static native void EventDelegateBase_didReceiveServerError(long jarg1, EventDelegateBase jarg1_, int jarg2, int jarg3, int jarg4);
  public final static native void EventDelegateBase_didReceiveServerErrorSwigExplicitEventDelegateBase(long jarg1, EventDelegateBase jarg1_, int jarg2, int jarg3, int jarg4);
  public final static native void EventDelegateBase_suggestDarkScene(long jarg1, EventDelegateBase jarg1_);
  public final static native void EventDelegateBase_suggestDarkSceneSwigExplicitEventDelegateBase(long jarg1, EventDelegateBase jarg1_);
  public final static native void EventDelegateBase_suggestBoringEvent(long jarg1, EventDelegateBase jarg1_);
  public final static native void EventDelegateBase_suggestBoringEventSwigExplicitEventDelegateBase(long jarg1, EventDelegateBase jarg1_);
  public final static native void EventDelegateBase_showMessage(long jarg1, EventDelegateBase jarg1_, String jarg2);
  public final static native void EventDelegateBase_showMessageSwigExplicitEventDelegateBase(long jarg1, EventDelegateBase jarg1_, String jarg2);
  public final static native void EventDelegateBase_didProcessFrameDecision(long jarg1, EventDelegateBase jarg1_, int jarg2, double jarg3);
  public final static native void EventDelegateBase_didProcessFrameDecisionSwigExplicitEventDelegateBase(long jarg1, EventDelegateBase jarg1_, int jarg2, double jarg3);
  public final static native void EventDelegateBase_didProcessModuleDecision(long jarg1, EventDelegateBase jarg1_, int jarg2, int jarg3);
  public final static native void EventDelegateBase_didProcessModuleDecisionSwigExplicitEventDelegateBase(long jarg1, EventDelegateBase jarg1_, int jarg2, int jarg3);
  public final static native void EventDelegateBase_director_connect(EventDelegateBase obj, long cptr, boolean mem_own, boolean weak_global);
  public final static native void EventDelegateBase_change_ownership(EventDelegateBase obj, long cptr, boolean take_or_release);
  public final static native long new_ServerDelegate();
  public final static native void delete_ServerDelegate(long jarg1);
  public final static native boolean ServerDelegate_sendServerRequest(long jarg1, ServerDelegate jarg1_, long jarg2, ServerRequest jarg2_);
  public final static native boolean ServerDelegate_sendServerRequestSwigExplicitServerDelegate(long jarg1, ServerDelegate jarg1_, long jarg2, ServerRequest jarg2_);
  public final static native boolean ServerDelegate_sendServerRequestImpl(long jarg1, ServerDelegate jarg1_, long jarg2, ServerRequest jarg2_);
  public final static native void ServerDelegate_pushServerResponse(long jarg1, ServerDelegate jarg1_, long jarg2, ServerResponse jarg2_);
  public final static native void ServerDelegate_director_connect(ServerDelegate obj, long cptr, boolean mem_own, boolean weak_global);
  public final static native void ServerDelegate_change_ownership(ServerDelegate obj, long cptr, boolean take_or_release);
  public final static native long ServerDelegate_SWIGUpcast(long jarg1);
  public final static native boolean ServerDelegateInterface_sendServerRequest(long jarg1, ServerDelegateInterface jarg1_, long jarg2, ServerRequest jarg2_);
  public final static native void delete_ServerDelegateInterface(long jarg1);
  public final static native long new_TovraStateEngineFacade(long jarg1, EventDelegateBase jarg1_);
  public final static native void delete_TovraStateEngineFacade(long jarg1);
  public final static native void TovraStateEngineFacade_startEngine(long jarg1, TovraStateEngineFacade jarg1_);
  public final static native void TovraStateEngineFacade_stopEngine(long jarg1, TovraStateEngineFacade jarg1_);
  public final static native void TovraStateEngineFacade_pauseEngine(long jarg1, TovraStateEngineFacade jarg1_);
  public final static native void TovraStateEngineFacade_resumeEngine(long jarg1, TovraStateEngineFacade jarg1_);
  public final static native void TovraStateEngineFacade_process__SWIG_0(long jarg1, TovraStateEngineFacade jarg1_, long jarg2, ImageBuffer jarg2_, long jarg3, ExtraFrameData jarg3_);
  public final static native void TovraStateEngineFacade_process__SWIG_1(long jarg1, TovraStateEngineFacade jarg1_, String jarg2, long jarg3, ImageBuffer jarg3_, long jarg4, ExtraFrameData jarg4_);
  public final static native void TovraStateEngineFacade_processSingleImage(long jarg1, TovraStateEngineFacade jarg1_, long jarg2, ImageBuffer jarg2_, long jarg3, ExtraFrameData jarg3_);
  public final static native void TovraStateEngineFacade_requestImageBuffer(long jarg1, TovraStateEngineFacade jarg1_, long jarg2, ImageBuffer jarg2_, String[] jarg3);
  public final static native void TovraStateEngineFacade_enableSingleImageMode(long jarg1, TovraStateEngineFacade jarg1_);
  public final static native void TovraStateEngineFacade_disableSingleImageMode(long jarg1, TovraStateEngineFacade jarg1_);
  public final static native void TovraStateEngineFacade_addObjectModule__SWIG_0(long jarg1, TovraStateEngineFacade jarg1_, int jarg2, long jarg3, ServerDelegate jarg3_);
  public final static native void TovraStateEngineFacade_addObjectModule__SWIG_1(long jarg1, TovraStateEngineFacade jarg1_, int jarg2, long jarg3, ServerDelegate jarg3_, String jarg4);
  public final static native void TovraStateEngineFacade_addObjectModule__SWIG_2(long jarg1, TovraStateEngineFacade jarg1_, int jarg2, long jarg3, MapOfStringToString jarg3_);
  public final static native void TovraStateEngineFacade_removeObjectModule(long jarg1, TovraStateEngineFacade jarg1_, int jarg2);
  public final static native void TovraStateEngineFacade_removeAllObjectModules(long jarg1, TovraStateEngineFacade jarg1_);
  public final static native void TovraStateEngineFacade_readProps(long jarg1, TovraStateEngineFacade jarg1_, String jarg2);
  public final static native void TovraStateEngineFacade_readObjectModuleProps__SWIG_0(long jarg1, TovraStateEngineFacade jarg1_, int jarg2, String jarg3);
  public final static native void TovraStateEngineFacade_readObjectModuleProps__SWIG_1(long jarg1, TovraStateEngineFacade jarg1_, long jarg2, MapOfStringToString jarg2_);
  public final static native void TovraStateEngineFacade_getCameraResRequirement(long jarg1, TovraStateEngineFacade jarg1_, long jarg2, CameraResRequirement jarg2_);
  public final static native void TovraStateEngineFacade_getAndClearMetrics(long jarg1, TovraStateEngineFacade jarg1_, long jarg2, MapOfStringToUInt jarg2_, long jarg3, MapOfStringToDouble jarg3_);
  public final static native void TovraStateEngineFacade_enableEventLogging(long jarg1, TovraStateEngineFacade jarg1_);
  public final static native void TovraStateEngineFacade_saveEventLog(long jarg1, TovraStateEngineFacade jarg1_, String jarg2);
  public final static native boolean isYUVFormat(int jarg1);

  // ---------------------------------------------------------------------------------------
  // Upcalls from the directors. Arguments arrive as integers and handles; the handles point at
  // the native caller's objects, which are borrowed for the duration of the call only (copy
  // what you keep). Enumeration values without a Java constant arrive as null.

  public static void SwigDirector_EventDelegateBase_didReceiveEvent(EventDelegateBase jself,
      int module, int contentType, int action, int status) {
    jself.didReceiveEvent(ObjectModuleID.fromNative(module), ContentType.fromNative(contentType),
        ActionID.fromNative(action), StatusID.fromNative(status));
  }

  public static void SwigDirector_EventDelegateBase_didProcessFrame(EventDelegateBase jself,
      int module, int status, long value64, int value32) {
    jself.didProcessFrame(ObjectModuleID.fromNative(module), StatusID.fromNative(status), value64,
        value32);
  }

  // Borrowed arguments: views of the caller's objects for the duration of the call only. Each is
  // ended when the override returns, so that a view kept beyond the call fails cleanly
  // (IllegalStateException) instead of reading memory the engine has released.

  public static void SwigDirector_EventDelegateBase_didDetect(EventDelegateBase jself,
      long objects) {
    VectorOfObjectInfo list = new VectorOfObjectInfo(objects, false);
    try {
      jself.didDetect(list);
    } finally {
      list.nref.endBorrow();
    }
  }

  public static void SwigDirector_EventDelegateBase_didDecode(EventDelegateBase jself,
      long objects, long metadata) {
    VectorOfObjectInfo list = new VectorOfObjectInfo(objects, false);
    ResultMetadata meta = new ResultMetadata(metadata, false);
    try {
      jself.didDecode(list, meta);
    } finally {
      list.nref.endBorrow();
      meta.nref.endBorrow();
    }
  }

  public static void SwigDirector_EventDelegateBase_didDetectInterestPoints(
      EventDelegateBase jself, long points) {
    VectorOfPoint2f list = new VectorOfPoint2f(points, false);
    try {
      jself.didDetectInterestPoints(list);
    } finally {
      list.nref.endBorrow();
    }
  }

  public static void SwigDirector_EventDelegateBase_didReceiveServerError(EventDelegateBase jself,
      int module, int status, int responseCode) {
    jself.didReceiveServerError(ObjectModuleID.fromNative(module),
        ResponseStatus.fromNative(status), responseCode);
  }

  public static void SwigDirector_EventDelegateBase_suggestDarkScene(EventDelegateBase jself) {
    jself.suggestDarkScene();
  }

  public static void SwigDirector_EventDelegateBase_suggestBoringEvent(EventDelegateBase jself) {
    jself.suggestBoringEvent();
  }

  public static void SwigDirector_EventDelegateBase_showMessage(EventDelegateBase jself,
      String message) {
    jself.showMessage(message);
  }

  public static void SwigDirector_EventDelegateBase_didProcessFrameDecision(
      EventDelegateBase jself, int issue, double value) {
    jself.didProcessFrameDecision(CameraStabilityIssue.fromNative(issue), value);
  }

  public static void SwigDirector_EventDelegateBase_didProcessModuleDecision(
      EventDelegateBase jself, int module, int verdict) {
    jself.didProcessModuleDecision(ObjectModuleID.fromNative(module),
        JudgeVerdictOnModule.fromNative(verdict));
  }

  public static boolean SwigDirector_ServerDelegate_sendServerRequest(ServerDelegate jself,
      long request) {
    ServerRequest borrowed = new ServerRequest(request, false);
    try {
      return jself.sendServerRequest(borrowed);
    } finally {
      borrowed.nref.endBorrow();
    }
  }

  public static boolean SwigDirector_ServerDelegate_sendServerRequestImpl(ServerDelegate jself,
      long request) {
    ServerRequest borrowed = new ServerRequest(request, false);
    try {
      return jself.sendServerRequestImpl(borrowed);
    } finally {
      borrowed.nref.endBorrow();
    }
  }

  // Called by the library with an exception that a callback threw on a thread where no Java
  // call into the library is waiting for it (the engine's worker). Never throws.
  @SuppressWarnings("unused")
  private static void reportUncaughtCallbackException(Throwable thrown) {
    OrzaVSMobile.reportUncaught(thrown);
  }
}
