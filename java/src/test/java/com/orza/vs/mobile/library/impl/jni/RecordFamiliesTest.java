package com.orza.vs.mobile.library.impl.jni;

import static org.junit.jupiter.api.Assertions.*;

import java.nio.ByteBuffer;
import java.util.Collections;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.function.Executable;

class RecordFamiliesTest {
  static void assertThrowsWithMessage(Class<? extends Throwable> type, String message, Executable call) {
    assertEquals(message, assertThrows(type, call).getMessage());
  }

  /** The call raises NullPointerException with exactly {@code message}. */
  static void assertNpe(String message, Executable call) {
    assertThrowsWithMessage(NullPointerException.class, message, call);
  }

  @Test
  void stringsAndStringPairs() {
    StringPair pair = new StringPair("a", "b");
    StringPair copy = new StringPair(pair);
    pair.setFirst("changed");
    assertEquals("a", copy.getFirst());
    assertEquals("", new StringPair().getSecond());
    assertNpe("std::pair< std::string,std::string > const & reference is null",
        () -> new StringPair((StringPair) null));
    assertNpe("null string", () -> new StringPair(null, "x"));
    assertNpe("null string", () -> pair.setSecond(null));
    assertEquals("b", pair.getSecond());
    FrameID id = new FrameID();
    String text = "caf\u00e9 \u20ac \ud83d\ude00 a\u0000b";
    id.setId(text);
    assertEquals(text, id.getId());
  }

  @Test
  void rectangleFieldsAreViewsAndSettersCopy() {
    ExtraFrameData extra = new ExtraFrameData();
    assertEquals(-1.0, extra.getTimeStamp());
    assertFalse(extra.getFlat());
    FrameROI display = extra.getDisplayROI();
    assertEquals(-1, display.getX());
    display.setWidth(640);
    assertEquals(640, extra.getDisplayROI().getWidth());
    FrameROI focus = new FrameROI();
    focus.setX(1);
    focus.setHeight(4);
    extra.setFocusROI(focus);
    focus.setX(99);
    assertEquals(1, extra.getFocusROI().getX());
    assertEquals(4, extra.getFocusROI().getHeight());
    assertNpe("OrzaVSMobile::FrameROI const & reference is null", () -> extra.setFocusROI(null));
    extra.setScreenOrient(270);
    extra.setFieldOfView(62.5);
    assertEquals(270, extra.getScreenOrient());
    assertEquals(62.5, extra.getFieldOfView());
    // A field view dies with its parent.
    extra.close();
    assertThrowsWithMessage(IllegalStateException.class,
        "FrameROI is part of another object that is no longer usable: ExtraFrameData has been deleted",
        display::getWidth);
  }

  @Test
  void nullAndDeletedObjects() {
    OrzaVSMobileJNI.FrameROI_x_set(0, null, 5);  // a setter on null does nothing
    OrzaVSMobileJNI.FrameID_id_set(0, null, "ignored");
    assertNpe("OrzaVSMobile::FrameROI object is null", () -> OrzaVSMobileJNI.FrameROI_x_get(0, null));
    assertNpe("OrzaVSMobile::ImageBuffer object is null",
        () -> OrzaVSMobileJNI.ImageBuffer_fillBuffer(0, null, new byte[4], 4));
    // A deleted proxy is an exception, not a crash; freeing twice is harmless.
    FrameROI roi = new FrameROI();
    roi.delete();
    assertThrowsWithMessage(IllegalStateException.class, "FrameROI has been deleted", roi::getX);
    roi.close();
    Point3d q = new Point3d(1, 2, 3);
    q.setZ(4.5);
    assertEquals(2.0, q.getY());
    assertEquals(4.5, q.getZ());
  }

  @Test
  void resultMetadataAndObjectInfo() {
    ResultMetadata metadata = new ResultMetadata();
    metadata.setIsFinalAccumulation(true);
    metadata.setQueryID("q");
    VectorOfString queries = metadata.getAccumulatedQueries();
    queries.add("a");
    assertEquals(1, metadata.getAccumulatedQueries().size());
    metadata.clear();
    assertFalse(metadata.getIsFinalAccumulation());
    assertEquals("", metadata.getQueryID());
    assertTrue(metadata.getAccumulatedQueries().isEmpty());
    assertThrows(IllegalStateException.class, queries::size, "cleared under the view");

    ObjectInfo qr = new ObjectInfo(ContentType.QR_CODE);
    assertEquals(ContentType.QR_CODE, qr.getContentType());
    assertEquals(ObjectModuleID.UNSPECIFIED_OBJECT_MOD, qr.getSrcObjectModule());
    assertEquals(ContentType.UNSPECIFIED_CONTENT_TYPE, new ObjectInfo().getContentType());
    qr.setContentType(ContentType.BOUNDING_BOX);
    assertEquals(10, OrzaVSMobileJNI.ObjectInfo_contentType_get(ObjectInfo.getCPtr(qr), qr));
    qr.setContent("0123");
    qr.setProperties("{}");
    VectorOfPoint2f outline = new VectorOfPoint2f(Collections.singletonList(new Point2f(7, 8)));
    qr.setLocation(outline);
    outline.set(0, new Point2f(0, 0));
    assertEquals(7f, qr.getLocation().get(0).getX());
    // A value without a Java constant: swigToEnum refuses it, fromNative gives null, a copy keeps it.
    OrzaVSMobileJNI.ObjectInfo_contentType_set(ObjectInfo.getCPtr(qr), qr, 42);
    assertThrows(IllegalArgumentException.class, qr::getContentType);
    assertNull(ContentType.fromNative(42));
    ObjectInfo copy = qr.copy();
    assertEquals(42, OrzaVSMobileJNI.ObjectInfo_contentType_get(ObjectInfo.getCPtr(copy), copy));
    assertEquals("{}", copy.getProperties());
  }

  @Test
  void imageBufferFillsStayInsideMemoryTheBufferWasGiven() {
    ImageBuffer empty = new ImageBuffer();
    assertEquals(ImageFormat.NV21, empty.getFormat());
    assertEquals(0, empty.fillBuffer(new byte[10], 10));
    assertNull(empty.getData());

    ImageBuffer buffer = new ImageBuffer();
    assertEquals(100, buffer.allocateBuffer(100));
    byte[] source = new byte[150];
    assertEquals(100, buffer.fillBuffer(source, 150));
    assertEquals(3, buffer.fillBuffer(new byte[3], 50));  // only what the array holds
    assertEquals(0, buffer.fillBuffer(null, 10));
    assertEquals(0, buffer.fillBuffer(source, -5));
    assertEquals(40, buffer.fillBufferWithByteBuffer(ByteBuffer.allocateDirect(40), 1000));
    assertEquals(0, buffer.fillBufferWithByteBuffer(ByteBuffer.allocate(40), 40));
    assertEquals(0, buffer.fillBufferWithByteBuffer(null, 40));

    ImageBuffer planes = new ImageBuffer();
    planes.allocateBuffer(150);
    ByteBuffer uv = ByteBuffer.allocateDirect(100);
    assertEquals(150, planes.fillBufferWithByteBuffer(ByteBuffer.allocateDirect(100), 100, uv, 100));
    assertEquals(140, planes.fillBufferWithByteBuffer(ByteBuffer.allocateDirect(40), 100, uv, 100));

    SWIGTYPE_p_unsigned_char before = buffer.getData();
    buffer.releaseBuffer();
    assertEquals(0, buffer.getAllocLen());
    assertEquals(SWIGTYPE_p_unsigned_char.getCPtr(before), SWIGTYPE_p_unsigned_char.getCPtr(buffer.getData()));
    assertEquals(0, buffer.fillBuffer(source, 10));

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
    borrowed.setWidthStep(6);
    borrowed.setNumChannels(3);
    assertEquals(6, borrowed.getWidthStep());
    assertEquals(3, borrowed.getNumChannels());
  }

  @Test
  void serverRecordsAndByteArrays() {
    ServerResponse response = new ServerResponse();
    assertEquals(200, response.getResponseCode());
    assertEquals(-1.0, response.getRoundtripTime());
    response.setResponseStr("{}");
    response.setCompressed(true);
    assertEquals("{}", response.getResponseStr());
    assertTrue(response.getCompressed());

    ByteArray body = new ByteArray();
    assertArrayEquals(new byte[0], new ByteArray(body).getData());
    assertNpe("OrzaVSMobile::ByteArray const & reference is null", () -> new ByteArray((ByteArray) null));
    MapOfStringToString params = new MapOfStringToString(Collections.singletonMap("p", "1"));
    MapOfStringToString metadata = new MapOfStringToString(Collections.singletonMap("m", "2"));
    ServerRequest full = new ServerRequest(body, "id-4", params, metadata);
    assertEquals("id-4", full.getId());
    assertEquals("1", full.getParams().get("p"));
    assertEquals("2", full.getMetadata().get("m"));
    assertNull(full.getResponseHandler());
    assertEquals(0, new ServerRequest(body, "id-3", params).getMetadata().size());
    assertEquals(0, new ServerRequest(body, "id-2").getData().getLength());
    assertNpe("Tovra::Server::ServerRequest::ParamMap const & reference is null",
        () -> new ServerRequest(body, "x", null));
    assertNpe("OrzaVSMobile::ByteArray const & reference is null", () -> new ServerRequest(null, "x"));
    assertNpe("null string", () -> new ServerRequest(body, null));
    MapOfStringToString view = full.getParams();
    full.clear();
    assertEquals("", full.getId());
    assertEquals(0, full.getParams().size());
    assertThrows(IllegalStateException.class, view::size);
    full.setParams(params);
    params.put("p", "changed");
    assertEquals("1", full.getParams().get("p"));
  }

  @Test
  void inertUtilitiesAndFreeFunction() {
    assertFalse(MobileUtils.setupLogging("/tmp/log"));
    assertFalse(MobileUtils.testNeonSupport());
    assertFalse(MobileUtils.setupNeonFunctions());
    NEONAccelerationResult result = new NEONAccelerationResult();
    result.setResultStr("kept");
    MobileUtils.testNeon(result);
    assertEquals("kept", result.getResultStr());
    assertNpe("NEONAccelerationResult & reference is null", () -> MobileUtils.testNeon(null));
    assertNpe("null string", () -> MobileUtils.setupLogging(null));
    for (int f = -1; f <= 7; f++) assertEquals(f >= 0 && f <= 2, OrzaVSMobile.isYUVFormat(f), "format " + f);
    assertTrue(OrzaVSMobile.isYUVFormat(ImageFormat.NV12));
  }
}
