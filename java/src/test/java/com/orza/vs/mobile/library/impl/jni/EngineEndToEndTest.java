package com.orza.vs.mobile.library.impl.jni;

import static com.orza.vs.mobile.library.impl.jni.RecordFamiliesTest.assertNpe;
import static org.junit.jupiter.api.Assertions.*;

import java.nio.ByteBuffer;
import java.util.ArrayList;
import java.util.Collections;
import java.util.List;
import java.util.concurrent.LinkedBlockingQueue;
import java.util.concurrent.TimeUnit;
import org.junit.jupiter.api.AfterEach;
import org.junit.jupiter.api.Test;

/** The engine driven through Java as an app does: frames in, a Java transport, Java callbacks. */
class EngineEndToEndTest {
  static final int WIDTH = 320;
  static final int HEIGHT = 240;

  /** What the app's delegate saw, copied out of the borrowed arguments. */
  static class Events extends EventDelegateBase {
    final LinkedBlockingQueue<String> decoded = new LinkedBlockingQueue<String>();
    final List<Thread> pointThreads = Collections.synchronizedList(new ArrayList<Thread>());
    volatile int lastPointCount = -1;
    volatile RuntimeException throwFromPoints;
    volatile RuntimeException throwFromDecode;

    @Override
    public void didDetectInterestPoints(VectorOfPoint2f points) {
      pointThreads.add(Thread.currentThread());
      lastPointCount = points.size();
      if (throwFromPoints != null) throw throwFromPoints;
    }

    @Override
    public void didDecode(VectorOfObjectInfo objects, ResultMetadata metadata) {
      if (throwFromDecode != null) throw throwFromDecode;
      StringBuilder text = new StringBuilder(Thread.currentThread().getName());
      text.append('|').append(metadata.getQueryID()).append('|').append(metadata.getIsFinalAccumulation())
          .append('|').append(metadata.getMobileDecorator()).append('|').append(metadata.getAccumulatedQueries());
      for (ObjectInfo o : objects) {
        text.append('|').append(o.getSrcObjectModule()).append(' ').append(o.getContentType())
            .append(' ').append(o.getContent());
        for (Point2f p : o.getLocation()) text.append(String.format(" (%.0f,%.0f)", p.getX(), p.getY()));
      }
      decoded.add(text.toString());
    }
  }

  final Events events = new Events();
  final TestTransport transport = new TestTransport();
  final TovraStateEngineFacade engine = new TovraStateEngineFacade(events);
  final ImageBuffer image = emptyFrame();
  final ExtraFrameData extra = new ExtraFrameData();
  final ByteBuffer frame = ByteBuffer.allocateDirect(WIDTH * HEIGHT * 3 / 2);
  double time = 100.0;

  EngineEndToEndTest() {
    engine.addObjectModule(ObjectModuleID.VISUAL_SEARCH_SERVICE_MOD, transport);
    // A densely textured NV21 frame: a fixed pseudo-random luminance pattern, grey chroma.
    for (int i = 0; i < frame.capacity(); i++) {
      frame.put(i, (byte) (i < WIDTH * HEIGHT ? (i % WIDTH * 7919 + i / WIDTH * 104729) % 251 : 128));
    }
  }

  @AfterEach
  void tearDown() {
    engine.close();
    engine.close();  // once only
  }

  /** An NV21 image of the test frame's geometry, without memory. */
  static ImageBuffer emptyFrame() {
    return new ImageBuffer(0, ImageFormat.NV21, WIDTH, HEIGHT, WIDTH, 1, null);
  }

  /** One frame through the lent-buffer path. */
  void streamFrame() {
    String[] key = new String[1];
    engine.requestImageBuffer(image, key);
    assertNotNull(key[0]);
    assertEquals(frame.capacity(), image.fillBufferWithByteBuffer(frame, frame.capacity()));
    extra.setTimeStamp(time += 0.2);
    engine.process(key[0], image, extra);
  }

  /** Streams frames until the transport got a request, and takes that request. */
  String streamUntilSent() throws InterruptedException {
    for (int i = 0; i < 50 && transport.sent.isEmpty(); i++) {
      streamFrame();
      Thread.sleep(20);
    }
    String sent = transport.sent.poll(10, TimeUnit.SECONDS);
    assertNotNull(sent, "no request reached the transport");
    return sent;
  }

  /** An image in memory of its own holding the test frame. */
  ImageBuffer ownFrame() {
    ImageBuffer own = emptyFrame();
    own.allocateBuffer(frame.capacity());
    assertEquals(frame.capacity(), own.fillBufferWithByteBuffer(frame, frame.capacity()));
    return own;
  }

  String nextEvent() throws InterruptedException {
    String event = events.decoded.poll(10, TimeUnit.SECONDS);
    assertNotNull(event, "no callback within 10 s");
    return event;
  }

  @Test
  void framesGoOutAndResultsComeBackThroughJava() throws Exception {
    engine.startEngine();
    String[] parts = streamUntilSent().split("\\|");
    assertTrue(parts[0].startsWith("TovraStateEngine-"), parts[0]);
    assertEquals("true", parts[1], "the body is a JPEG");
    assertEquals("true", parts[2], "the request carries vsearch_params_json");
    assertNotEquals(Thread.currentThread().getName(), parts[3], "sent from the engine's worker");
    assertSame(Thread.currentThread(), events.pointThreads.get(0),
        "interest points arrive on the thread that called process");
    assertTrue(events.lastPointCount > 0 && events.lastPointCount <= 50, "points: " + events.lastPointCount);

    // The results arrive on the thread that pushes the reply, before the push returns.
    transport.answer(200, TestTransport.REPLY);
    assertEquals(Thread.currentThread().getName() + "|q-1|true|TeskarMobileDecorator|[q-0]"
        + "|VISUAL_SEARCH_SERVICE_MOD PIDN shoe"
        + "|VISUAL_SEARCH_SERVICE_MOD BOUNDING_BOX  (10,20) (110,20) (110,90) (10,90)", events.decoded.poll());
    // A failing didDecode: the transport's pushServerResponse throws that very exception.
    events.throwFromDecode = new IllegalStateException("app failure", new Error("cause"));
    streamUntilSent();
    assertSame(events.throwFromDecode,
        assertThrows(IllegalStateException.class, () -> transport.answer(200, TestTransport.REPLY)));
  }

  @Test
  void aTransportAnsweringOnTheWorkerDeliversResultsThere() throws Exception {
    transport.mode = TestTransport.Mode.PUSHED_AT_ONCE;
    engine.startEngine();
    String sent = streamUntilSent();
    String event = nextEvent();
    String worker = sent.substring(sent.lastIndexOf('|') + 1);
    assertTrue(event.startsWith(worker + "|q-1|true|"), event + " / " + sent);
    assertFalse(worker.equals(Thread.currentThread().getName()));

    // The response handler of a request can be called directly as well.
    transport.mode = TestTransport.Mode.THROUGH_HANDLER_AT_ONCE;
    streamUntilSent();
    assertTrue(nextEvent().contains("|q-1|true|"));
    assertThrows(NullPointerException.class,
        () -> new ServerResponseHandler(0, false).handleServerResponse(new ServerResponse()));
  }

  @Test
  void aThrowingCallbackReturnsToTheCallerAndTheEngineGoesOn() throws Exception {
    engine.startEngine();
    events.throwFromPoints = new IllegalStateException("no thanks");
    // More frames than the engine has records: a lent buffer must not be lost per exception.
    for (int i = 0; i < 8; i++) {
      assertSame(events.throwFromPoints, assertThrows(IllegalStateException.class, this::streamFrame));
    }
    events.throwFromPoints = null;
    streamFrame();
    assertEquals(9, events.pointThreads.size());
  }

  @Test
  void singleImageReturnsAfterItsReplyWasHandled() throws Exception {
    transport.mode = TestTransport.Mode.PUSHED_FROM_OWN_THREAD;
    engine.startEngine();
    engine.processSingleImage(ownFrame(), extra);
    String event = events.decoded.poll();
    assertNotNull(event, "the reply was handled before processSingleImage returned");
    assertTrue(event.startsWith("transport|q-1|"), event);
  }

  private static void abandonRunningEngine() {
    TovraStateEngineFacade abandoned = new TovraStateEngineFacade(new EventDelegateBase());
    abandoned.addObjectModule(ObjectModuleID.VISUAL_SEARCH_SERVICE_MOD, new ServerDelegate());
    abandoned.startEngine();
  }

  @Test
  void theEngineHoldsItsDelegatesUntilItIsDeletedOrFinalized() {
    EventDelegateBase held = new EventDelegateBase();
    ServerDelegate heldTransport = new ServerDelegate();
    TovraStateEngineFacade other = new TovraStateEngineFacade(held);
    other.addObjectModule(ObjectModuleID.VISUAL_SEARCH_SERVICE_MOD, heldTransport);
    assertFalse(held.swigCMemOwn, "the engine owns its delegates while it lives");
    assertFalse(heldTransport.swigCMemOwn);
    heldTransport.delete();  // deleted too early: its native object lives until the engine goes
    other.startEngine();
    other.delete();
    assertTrue(held.swigCMemOwn, "ownership is handed back");
    assertEquals(0, ServerDelegate.getCPtr(heldTransport));
    held.delete();

    // Engines and delegates unreachable together: whatever order their finalizers run in, the
    // delegates' native objects outlive the engine.
    for (int round = 0; round < 3; round++) abandonRunningEngine();
    for (int i = 0; i < 10; i++) {
      System.gc();
      System.runFinalization();
    }
  }

  @Test
  void facadeOperationsAndArgumentChecks() {
    CameraResRequirement requirement = new CameraResRequirement();
    engine.getCameraResRequirement(requirement);
    assertEquals(320, requirement.getMinHeight());
    assertEquals(720, requirement.getMaxHeight());
    MapOfStringToUInt counts = new MapOfStringToUInt();
    counts.set("frames", 3);
    MapOfStringToDouble values = new MapOfStringToDouble();
    engine.getAndClearMetrics(counts, values);
    assertEquals(3L, counts.get("frames"));
    assertTrue(values.empty());
    engine.addObjectModule(ObjectModuleID.BARCODE_MOD, transport, "z");
    engine.pauseEngine();
    engine.resumeEngine();

    assertNpe("Tovra::CameraResRequirement & reference is null", () -> engine.getCameraResRequirement(null));
    assertNpe("OrzaVSMobile::ImageBuffer & reference is null", () -> engine.process(null, extra));
    assertNpe("OrzaVSMobile::ExtraFrameData & reference is null", () -> engine.process("k", image, null));
    assertNpe("null string", () -> engine.process(null, image, extra));
    assertNpe("std::map< std::string,std::string > const & reference is null",
        () -> engine.readObjectModuleProps(null));
    assertNpe("std::map< std::string,unsigned int > & reference is null", () -> engine.getAndClearMetrics(null, values));
    assertNpe("null string", () -> engine.readProps(null));
    assertThrows(NullPointerException.class, () -> engine.requestImageBuffer(image, null));
    assertThrows(IndexOutOfBoundsException.class, () -> engine.requestImageBuffer(image, new String[0]));

    // Stopped: no buffer is lent and the key stays as it was.
    engine.stopEngine();
    String[] key = {"unchanged"};
    engine.requestImageBuffer(image, key);
    assertEquals("unchanged", key[0]);

    // A deleted engine is an exception, not a crash.
    TovraStateEngineFacade other = new TovraStateEngineFacade(null);
    other.delete();
    assertThrows(NullPointerException.class, other::startEngine);
    other.close();
  }

  @Test
  void framesInTheCallersOwnMemoryAndTheDiagnosticLinesTheyCause() throws InterruptedException {
    LinkedBlockingQueue<String> lines = new LinkedBlockingQueue<String>();
    Thread caller = Thread.currentThread();
    transport.fail = new IllegalStateException("no network");
    ImageBuffer own = ownFrame();
    Diagnostics.setListener(line -> {
      lines.add((Thread.currentThread() == caller ? "caller: " : "worker: ") + line);
      throw new IllegalStateException("a failing listener is ignored");
    });
    try {
      engine.process(own, extra);  // not started
      assertEquals("caller: Skipped input frame: TSE not in RUNNING state", lines.poll());
      engine.startEngine();
      // Sent from the worker, where the transport throws: the line comes from that native
      // thread, which the listener's call has to attach to the VM.
      engine.process(own, extra);
      assertEquals(1, events.pointThreads.size());
      assertTrue(events.lastPointCount > 0);
      assertEquals("worker: Visual search request failed: no network", lines.poll(20, TimeUnit.SECONDS));
      // A geometry larger than the buffer holds is refused, not read.
      own.setHeight(HEIGHT * 4);
      engine.process(own, extra);
      assertEquals("caller: Skipped input frame: image buffer holds 115200 bytes,"
          + " a 320x960 image needs 307200", lines.poll());
      assertEquals(1, events.pointThreads.size());
    } finally {
      Diagnostics.setListener(null);
    }
    engine.stopEngine();
    engine.process(own, extra);  // to standard output again
    assertNull(lines.poll());
  }
}
