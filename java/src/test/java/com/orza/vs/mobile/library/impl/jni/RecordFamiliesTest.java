package com.orza.vs.mobile.library.impl.jni;

import static org.junit.jupiter.api.Assertions.assertArrayEquals;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertNotEquals;
import static org.junit.jupiter.api.Assertions.assertNull;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;

import java.nio.ByteBuffer;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.function.Executable;

class RecordFamiliesTest {
  static void assertThrowsWithMessage(Class<? extends Throwable> type, String message,
                                      Executable call) {
    Throwable thrown = assertThrows(type, call);
    assertEquals(message, thrown.getMessage());
  }

  @Test
  void stringPairConstructorsAndFields() {
    StringPair empty = new StringPair();
    assertEquals("", empty.getFirst());
    StringPair pair = new StringPair("a", "b");
    StringPair copy = new StringPair(pair);
    pair.setFirst("changed");
    assertEquals("a", copy.getFirst());
    assertEquals("b", copy.getSecond());
    assertThrowsWithMessage(NullPointerException.class,
        "std::pair< std::string,std::string > const & reference is null",
        () -> new StringPair((StringPair) null));
    assertThrowsWithMessage(NullPointerException.class, "null string", () -> new StringPair(null, "x"));
    assertThrowsWithMessage(NullPointerException.class, "null string", () -> pair.setSecond(null));
    assertEquals("b", pair.getSecond());
    for (StringPair p : new StringPair[] {empty, pair, copy}) p.delete();
  }

  @Test
  void stringsRoundTripIncludingNonAsciiAndNul() {
    FrameID id = new FrameID();
    assertEquals("", id.getId());
    String text = "caf\u00e9 \u20ac \ud83d\ude00 a\u0000b";
    id.setId(text);
    assertEquals(text, id.getId());
    id.delete();
  }

  @Test
  void extraFrameDataDefaultsAndRectangleFields() {
    ExtraFrameData extra = new ExtraFrameData();
    assertEquals(-1.0, extra.getTimeStamp());
    assertEquals(0, extra.getScreenOrient());
    assertFalse(extra.getFlat());
    FrameROI display = extra.getDisplayROI();
    assertEquals(-1, display.getX());
    assertEquals(-1, display.getHeight());

    // The getter is a view into the parent; the setter copies.
    display.setWidth(640);
    assertEquals(640, extra.getDisplayROI().getWidth());
    FrameROI focus = new FrameROI();
    focus.setX(1);
    focus.setY(2);
    focus.setWidth(3);
    focus.setHeight(4);
    extra.setFocusROI(focus);
    focus.setX(99);
    assertEquals(1, extra.getFocusROI().getX());
    assertEquals(4, extra.getFocusROI().getHeight());
    assertThrowsWithMessage(NullPointerException.class,
        "OrzaVSMobile::FrameROI const & reference is null", () -> extra.setFocusROI(null));

    extra.setFlat(true);
    extra.setScreenOrient(270);
    extra.setFieldOfView(62.5);
    extra.setTimeStamp(12.25);
    assertTrue(extra.getFlat());
    assertEquals(270, extra.getScreenOrient());
    assertEquals(62.5, extra.getFieldOfView());
    assertEquals(12.25, extra.getTimeStamp());
    focus.delete();
    extra.delete();
  }

  @Test
  void fieldSetterWithNullObjectDoesNothingAndGetterRaises() {
    OrzaVSMobileJNI.FrameROI_x_set(0, null, 5);
    OrzaVSMobileJNI.FrameID_id_set(0, null, "ignored");
    OrzaVSMobileJNI.ExtraFrameData_flat_set(0, null, true);
    assertThrowsWithMessage(NullPointerException.class, "OrzaVSMobile::FrameROI object is null",
        () -> OrzaVSMobileJNI.FrameROI_x_get(0, null));
    assertThrowsWithMessage(NullPointerException.class, "OrzaVSMobile::ImageBuffer object is null",
        () -> OrzaVSMobileJNI.ImageBuffer_fillBuffer(0, null, new byte[4], 4));
    // A deleted proxy has a null handle: its use is an exception, not a crash.
    FrameROI roi = new FrameROI();
    roi.delete();
    assertThrows(NullPointerException.class, roi::getX);
    roi.delete();  // freeing twice is harmless
  }

  @Test
  void pointsAndCameraRequirement() {
    Point2f p = new Point2f(1.5f, -2.25f);
    assertEquals(1.5f, p.getX());
    assertEquals(-2.25f, p.getY());
    Point2f origin = new Point2f();
    assertEquals(0f, origin.getX());
    Point3d q = new Point3d(1, 2, 3);
    q.setZ(4.5);
    assertEquals(2.0, q.getY());
    assertEquals(4.5, q.getZ());
    assertEquals(0.0, new Point3d().getX());
    CameraResRequirement requirement = new CameraResRequirement();
    assertEquals(0, requirement.getMinHeight());
    requirement.setMaxHeight(720);
    assertEquals(720, requirement.getMaxHeight());
  }

  @Test
  void resultMetadataAndObjectInfo() {
    ResultMetadata metadata = new ResultMetadata();
    assertFalse(metadata.getIsFinalAccumulation());
    metadata.setIsFinalAccumulation(true);
    metadata.setQueryID("q");
    metadata.getAccumulatedQueries().add("a");
    metadata.getAccumulatedQueries().add("b");
    assertEquals(2, metadata.getAccumulatedQueries().size());
    metadata.clear();
    assertFalse(metadata.getIsFinalAccumulation());
    assertEquals("", metadata.getQueryID());
    assertTrue(metadata.getAccumulatedQueries().isEmpty());

    ObjectInfo unspecified = new ObjectInfo();
    assertEquals(ObjectModuleID.UNSPECIFIED_OBJECT_MOD, unspecified.getSrcObjectModule());
    assertEquals(ContentType.UNSPECIFIED_CONTENT_TYPE, unspecified.getContentType());
    ObjectInfo qr = new ObjectInfo(ContentType.QR_CODE);
    assertEquals(ContentType.QR_CODE, qr.getContentType());
    assertEquals(ObjectModuleID.UNSPECIFIED_OBJECT_MOD, qr.getSrcObjectModule());
    qr.setContentType(ContentType.BOUNDING_BOX);
    assertEquals(10, OrzaVSMobileJNI.ObjectInfo_contentType_get(ObjectInfo.getCPtr(qr), qr));
    qr.setSrcObjectModule(ObjectModuleID.RESERVED_MOD);
    assertEquals(ObjectModuleID.RESERVED_MOD, qr.getSrcObjectModule());
    qr.setContent("0123");
    qr.setProperties("{}");
    qr.getLocation().add(new Point2f(3, 4));
    qr.getSubContents().add(unspecified);
    assertEquals("0123", qr.getContent());
    assertEquals(4f, qr.getLocation().get(0).getY());
    assertEquals(ContentType.UNSPECIFIED_CONTENT_TYPE, qr.getSubContents().get(0).getContentType());

    VectorOfPoint2f outline = new VectorOfPoint2f();
    outline.add(new Point2f(7, 8));
    qr.setLocation(outline);
    outline.set(0, new Point2f(0, 0));
    assertEquals(7f, qr.getLocation().get(0).getX());

    // A value without a Java constant: swigToEnum refuses it, fromNative maps it to null.
    OrzaVSMobileJNI.ObjectInfo_contentType_set(ObjectInfo.getCPtr(qr), qr, 42);
    assertThrows(IllegalArgumentException.class, qr::getContentType);
    assertNull(ContentType.fromNative(42));
    assertEquals(ContentType.BOUNDING_BOX, ContentType.fromNative(10));
    qr.delete();
    unspecified.delete();
  }

  @Test
  void imageBufferAllocationAndFills() {
    ImageBuffer empty = new ImageBuffer();
    assertEquals(ImageFormat.NV21, empty.getFormat());
    assertEquals(0, empty.fillBuffer(new byte[10], 10));
    assertNull(empty.getData());

    ImageBuffer buffer = new ImageBuffer();
    assertEquals(100, buffer.allocateBuffer(100));
    assertEquals(100, buffer.getAllocLen());
    byte[] source = new byte[150];
    for (int i = 0; i < source.length; i++) source[i] = (byte) i;
    assertEquals(100, buffer.fillBuffer(source, 150));
    assertEquals(0, buffer.fillBuffer(source, 0));
    // A length beyond the array copies only what the array holds.
    assertEquals(3, buffer.fillBuffer(new byte[3], 50));
    assertEquals(0, buffer.fillBuffer(null, 10));
    assertEquals(0, buffer.fillBuffer(source, -5));

    ByteBuffer direct = ByteBuffer.allocateDirect(40);
    assertEquals(40, buffer.fillBufferWithByteBuffer(direct, 1000));
    assertEquals(0, buffer.fillBufferWithByteBuffer(ByteBuffer.allocate(40), 40));
    assertEquals(0, buffer.fillBufferWithByteBuffer(null, 40));

    ImageBuffer planes = new ImageBuffer();
    planes.allocateBuffer(150);
    ByteBuffer y = ByteBuffer.allocateDirect(100);
    ByteBuffer uv = ByteBuffer.allocateDirect(100);
    assertEquals(150, planes.fillBufferWithByteBuffer(y, 100, uv, 100));
    assertEquals(150, planes.fillBufferWithByteBuffer(ByteBuffer.allocateDirect(200), 200, uv, 100));
    assertEquals(140, planes.fillBufferWithByteBuffer(ByteBuffer.allocateDirect(40), 100, uv, 100));

    SWIGTYPE_p_unsigned_char before = buffer.getData();
    buffer.releaseBuffer();
    assertEquals(0, buffer.getAllocLen());
    assertEquals(SWIGTYPE_p_unsigned_char.getCPtr(before),
        SWIGTYPE_p_unsigned_char.getCPtr(buffer.getData()));
    assertEquals(0, buffer.fillBuffer(source, 10));
    for (ImageBuffer b : new ImageBuffer[] {empty, buffer, planes}) b.delete();
  }

  @Test
  void imageBufferDataAndAllocLenCannotOpenForeignMemory() {
    ImageBuffer owner = new ImageBuffer();
    owner.allocateBuffer(64);
    ImageBuffer other = new ImageBuffer();
    other.allocateBuffer(16);
    // Pointing `data` at memory the buffer does not own makes it a borrower: nothing is filled.
    other.setData(owner.getData());
    assertEquals(0, other.getAllocLen());
    assertEquals(0, other.fillBuffer(new byte[16], 16));
    assertThrows(IllegalArgumentException.class, () -> other.setAllocLen(64));
    assertThrows(IllegalArgumentException.class, () -> owner.setAllocLen(-1));
    assertThrows(IllegalArgumentException.class, () -> owner.setAllocLen(65));
    owner.setAllocLen(10);  // lowering is allowed
    assertEquals(10, owner.fillBuffer(new byte[64], 64));
    owner.setAllocLen(64);  // and back up to the size of the block it owns
    assertEquals(64, owner.fillBuffer(new byte[64], 64));

    // The full constructor borrows memory: allocLen 0.
    ImageBuffer borrowed = new ImageBuffer(7, ImageFormat.GRAY, 8, 8, 8, 1, owner.getData());
    assertEquals(0, borrowed.getAllocLen());
    assertEquals(7, borrowed.getDefinition());
    assertEquals(ImageFormat.GRAY, borrowed.getFormat());
    assertEquals(0, borrowed.fillBuffer(new byte[8], 8));
    borrowed.setWidth(4);
    borrowed.setHeight(5);
    borrowed.setWidthStep(6);
    borrowed.setNumChannels(3);
    assertEquals(4, borrowed.getWidth());
    assertEquals(5, borrowed.getHeight());
    assertEquals(6, borrowed.getWidthStep());
    assertEquals(3, borrowed.getNumChannels());
    for (ImageBuffer b : new ImageBuffer[] {borrowed, other, owner}) b.delete();
  }

  @Test
  void byteArrayCopiesAndNeverOwns() {
    ByteArray bytes = new ByteArray();
    assertEquals(0, bytes.getLength());
    assertArrayEquals(new byte[0], bytes.getData());
    ByteArray copy = new ByteArray(bytes);
    copy.clear();
    assertEquals(0, copy.getLength());
    assertThrowsWithMessage(NullPointerException.class,
        "OrzaVSMobile::ByteArray const & reference is null", () -> new ByteArray((ByteArray) null));
    bytes.delete();
    copy.delete();
  }

  @Test
  void serverRecords() {
    ServerResponse response = new ServerResponse();
    assertEquals(200, response.getResponseCode());
    assertEquals(-1.0, response.getRoundtripTime());
    assertFalse(response.getCompressed());
    assertEquals("", response.getId());
    response.setId("r");
    response.setResponseCode(404);
    response.setResponseStr("{}");
    response.setRoundtripTime(0.5);
    response.setCompressed(true);
    assertEquals("r", response.getId());
    assertEquals(404, response.getResponseCode());
    assertEquals("{}", response.getResponseStr());
    assertEquals(0.5, response.getRoundtripTime());
    assertTrue(response.getCompressed());

    ByteArray body = new ByteArray();
    MapOfStringToString params = new MapOfStringToString();
    params.set("p", "1");
    MapOfStringToString metadata = new MapOfStringToString();
    metadata.set("m", "2");
    ServerRequest full = new ServerRequest(body, "id-4", params, metadata);
    assertEquals("id-4", full.getId());
    assertEquals("1", full.getParams().get("p"));
    assertEquals("2", full.getMetadata().get("m"));
    assertNull(full.getResponseHandler());
    ServerRequest three = new ServerRequest(body, "id-3", params);
    assertEquals(0, three.getMetadata().size());
    ServerRequest two = new ServerRequest(body, "id-2");
    assertEquals(0, two.getParams().size());
    assertEquals(0, two.getData().getLength());
    assertThrowsWithMessage(NullPointerException.class,
        "Tovra::Server::ServerRequest::ParamMap const & reference is null",
        () -> new ServerRequest(body, "x", null));
    assertThrowsWithMessage(NullPointerException.class,
        "OrzaVSMobile::ByteArray const & reference is null", () -> new ServerRequest(null, "x"));
    assertThrowsWithMessage(NullPointerException.class, "null string",
        () -> new ServerRequest(body, null));
    full.clear();
    assertEquals("", full.getId());
    assertEquals(0, full.getParams().size());
    ServerRequest request = new ServerRequest();
    request.setParams(params);
    params.set("p", "changed");
    assertEquals("1", request.getParams().get("p"));
    for (ServerRequest r : new ServerRequest[] {full, three, two, request}) r.delete();
    body.delete();
    response.delete();
  }

  @Test
  void inertUtilitiesAndFreeFunction() {
    assertFalse(MobileUtils.setupLogging("/tmp/log"));
    assertFalse(MobileUtils.testNeonSupport());
    assertFalse(MobileUtils.setupNeonFunctions());
    NEONAccelerationResult result = new NEONAccelerationResult();
    assertEquals("", result.getResultStr());
    result.setResultStr("kept");
    MobileUtils.testNeon(result);
    assertEquals("kept", result.getResultStr());
    assertThrowsWithMessage(NullPointerException.class,
        "NEONAccelerationResult & reference is null", () -> MobileUtils.testNeon(null));
    assertThrowsWithMessage(NullPointerException.class, "null string",
        () -> MobileUtils.setupLogging(null));
    new MobileUtils().delete();
    result.delete();

    for (int format = 0; format <= 2; format++) assertTrue(OrzaVSMobile.isYUVFormat(format));
    for (int format = 3; format <= 7; format++) assertFalse(OrzaVSMobile.isYUVFormat(format));
    assertFalse(OrzaVSMobile.isYUVFormat(-1));
    assertTrue(OrzaVSMobile.isYUVFormat(ImageFormat.NV12));
    assertNotEquals(0, ImageFormat.GRAY.swigValue());
  }
}
