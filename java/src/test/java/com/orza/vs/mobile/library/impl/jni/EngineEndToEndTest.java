package com.orza.vs.mobile.library.impl.jni;

import static com.orza.vs.mobile.library.impl.jni.RecordFamiliesTest.assertThrowsWithMessage;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertNotNull;
import static org.junit.jupiter.api.Assertions.assertSame;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;

import java.nio.ByteBuffer;
import java.util.ArrayList;
import java.util.Collections;
import java.util.List;
import java.util.concurrent.ExecutorService;
import java.util.concurrent.Executors;
import java.util.concurrent.LinkedBlockingQueue;
import java.util.concurrent.TimeUnit;
import org.junit.jupiter.api.AfterEach;
import org.junit.jupiter.api.Test;

/** The engine driven through Java as an app does: frames in, a Java transport, Java callbacks. */
class EngineEndToEndTest {
  static final int WIDTH = 320;
  static final int HEIGHT = 240;
  static final String REPLY = "{\"queryId\":\"q-1\",\"quillmark\":{\"searchResult\":["
      + "{\"content\":\"shoe\",\"contentType\":\"PIDN\",\"properties\":{\"brand\":\"x\"}},"
      + "{\"content\":\"\",\"contentType\":\"BoundingBox\",\"properties\":{\"boundingBox\":"
      + "{\"tlx\":10,\"tly\":20,\"trx\":110,\"try\":20,\"brx\":110,\"bry\":90,\"blx\":10,\"bly\":90}}},"
      + "{\"content\":\"dropped\",\"contentType\":\"Unknown\",\"properties\":{}}],"
      + "\"resultMetadata\":{\"finalAccumulation\":true,\"accumulatedQueries\":[\"q-0\"]}}}";

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
      text.append('|').append(metadata.getQueryID()).append('|')
          .append(metadata.getIsFinalAccumulation()).append('|')
          .append(metadata.getMobileDecorator()).append('|').append(metadata.getAccumulatedQueries());
      for (ObjectInfo o : objects) {
        text.append('|').append(o.getSrcObjectModule()).append(' ').append(o.getContentType())
            .append(' ').append(o.getContent());
        for (Point2f p : o.getLocation()) {
          text.append(" (").append((int) p.getX()).append(',').append((int) p.getY()).append(')');
        }
      }
      decoded.add(text.toString());
    }

    @Override
    public void didReceiveServerError(ObjectModuleID module, ResponseStatus status, int code) {
      decoded.add(Thread.currentThread().getName() + "|error " + module + " " + status + " " + code);
    }
  }

  /** A transport that answers REPLY from a thread of its own, or at once on the caller's. */
  static class Transport extends ServerDelegate {
    final ExecutorService executor = Executors.newSingleThreadExecutor(r -> {
      Thread t = new Thread(r, "transport");
      t.setDaemon(true);
      return t;
    });
    final LinkedBlockingQueue<String> sent = new LinkedBlockingQueue<String>();
    final LinkedBlockingQueue<Throwable> pushFailures = new LinkedBlockingQueue<Throwable>();
    volatile boolean answerAtOnce;
    volatile boolean answerThroughHandler;

    @Override
    public boolean sendServerRequestImpl(ServerRequest request) {
      if (answerAtOnce || answerThroughHandler) {
        // Answer on the calling thread (the engine's worker), before returning.
        ServerResponse response = new ServerResponse();
        response.setId(request.getId());
        response.setResponseStr(REPLY);
        sent.add(request.getId() + "|at once|" + Thread.currentThread().getName());
        if (answerThroughHandler) {
          request.getResponseHandler().handleServerResponse(response);
        } else {
          pushServerResponse(response);
        }
        return true;
      }
      // The request is borrowed: copy what is needed before returning.
      final String id = request.getId();
      byte[] jpeg = request.getData().getData();
      boolean hasParams = request.getParams().has_key("vsearch_params_json");
      sent.add(id + "|" + (jpeg.length > 2 && (jpeg[0] & 0xff) == 0xff && (jpeg[1] & 0xff) == 0xd8)
          + "|" + hasParams + "|" + Thread.currentThread().getName());
      executor.execute(() -> {
        ServerResponse response = new ServerResponse();
        response.setId(id);
        response.setResponseStr(REPLY);
        response.setRoundtripTime(0.01);
        try {
          pushServerResponse(response);
        } catch (RuntimeException e) {
          pushFailures.add(e);
        }
      });
      return true;
    }
  }

  Events events = new Events();
  Transport transport = new Transport();
  TovraStateEngineFacade engine = new TovraStateEngineFacade(events);
  ImageBuffer image = new ImageBuffer();
  ExtraFrameData extra = new ExtraFrameData();
  ByteBuffer frame = ByteBuffer.allocateDirect(WIDTH * HEIGHT * 3 / 2);
  double time = 100.0;

  EngineEndToEndTest() {
    engine.addObjectModule(ObjectModuleID.VISUAL_SEARCH_SERVICE_MOD, transport);
    fillFrame(frame, 0);
  }

  @AfterEach
  void tearDown() throws Exception {
    engine.close();
    engine.close();  // once only
    transport.executor.shutdown();
    assertTrue(transport.executor.awaitTermination(5, TimeUnit.SECONDS));
  }

  /** A densely textured NV21 frame (a fixed pseudo-random pattern), shifted by {@code shift}. */
  static void fillFrame(ByteBuffer frame, int shift) {
    for (int y = 0; y < HEIGHT; y++) {
      for (int x = 0; x < WIDTH; x++) {
        frame.put(y * WIDTH + x, (byte) (((x + shift) * 7919 + y * 104729) % 251));
      }
    }
    for (int i = WIDTH * HEIGHT; i < frame.capacity(); i++) frame.put(i, (byte) 128);
  }

  /** One frame through the lent-buffer path; returns the frame key. */
  String streamFrame() {
    image.setFormat(ImageFormat.NV21);
    image.setWidth(WIDTH);
    image.setHeight(HEIGHT);
    image.setWidthStep(WIDTH);
    image.setNumChannels(1);
    String[] key = new String[1];
    engine.requestImageBuffer(image, key);
    assertNotNull(key[0]);
    assertEquals(frame.capacity(), image.fillBufferWithByteBuffer(frame, frame.capacity()));
    time += 0.2;
    extra.setTimeStamp(time);
    engine.process(key[0], image, extra);
    return key[0];
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
    ImageBuffer own = new ImageBuffer();
    own.setFormat(ImageFormat.NV21);
    own.setWidth(WIDTH);
    own.setHeight(HEIGHT);
    own.setWidthStep(WIDTH);
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
    String sent = streamUntilSent();
    String[] parts = sent.split("\\|");
    assertTrue(parts[0].startsWith("TovraStateEngine-"), sent);
    assertEquals("true", parts[1], "the body is a JPEG");
    assertEquals("true", parts[2], "the request carries vsearch_params_json");
    assertFalse(parts[3].equals(Thread.currentThread().getName()), "sent from the engine's worker");

    assertEquals("transport|q-1|true|TeskarMobileDecorator|[q-0]"
        + "|VISUAL_SEARCH_SERVICE_MOD PIDN shoe"
        + "|VISUAL_SEARCH_SERVICE_MOD BOUNDING_BOX  (10,20) (110,20) (110,90) (10,90)",
        nextEvent());
    assertSame(Thread.currentThread(), events.pointThreads.get(0),
        "interest points arrive on the thread that called process");
    assertTrue(events.lastPointCount > 0 && events.lastPointCount <= 50,
        "points: " + events.lastPointCount);

    // (A failed exchange as a server error: EngineOverHttpTest, over HTTP.)
    // A failing didDecode: the transport's pushServerResponse throws that very exception.
    events.throwFromDecode = new IllegalStateException("app failure", new Error("cause"));
    streamUntilSent();
    assertSame(events.throwFromDecode, transport.pushFailures.poll(10, TimeUnit.SECONDS));
  }

  @Test
  void aTransportAnsweringOnTheWorkerDeliversResultsThere() throws Exception {
    transport.answerAtOnce = true;
    engine.startEngine();
    String sent = streamUntilSent();
    String event = nextEvent();
    String worker = sent.substring(sent.lastIndexOf('|') + 1);
    assertTrue(event.startsWith(worker + "|q-1|true|"), event + " / " + sent);
    assertFalse(worker.equals(Thread.currentThread().getName()));

    // The response handler of a request can be called directly as well.
    transport.answerAtOnce = false;
    transport.answerThroughHandler = true;
    streamUntilSent();
    assertTrue(nextEvent().contains("|q-1|true|"));
    ServerResponseHandler none = new ServerResponseHandler(0, false);
    assertThrows(NullPointerException.class, () -> none.handleServerResponse(new ServerResponse()));
  }

  @Test
  void framesInTheCallersOwnMemory() {
    engine.startEngine();
    ImageBuffer own = ownFrame();
    extra.setTimeStamp(time += 0.2);
    engine.process(own, extra);
    assertEquals(1, events.pointThreads.size());
    assertTrue(events.lastPointCount > 0);
    // A geometry larger than the buffer holds is refused by the engine, not read.
    own.setHeight(HEIGHT * 4);
    engine.process(own, extra);
    assertEquals(1, events.pointThreads.size());
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
    engine.startEngine();
    ImageBuffer still = ownFrame();
    engine.processSingleImage(still, extra);
    String event = events.decoded.poll();
    assertNotNull(event, "the reply was handled before processSingleImage returned");
    assertTrue(event.startsWith("transport|q-1|"), event);
  }

  @Test
  void theEngineHoldsItsDelegatesUntilItIsDeleted() {
    Events held = new Events();
    Transport heldTransport = new Transport();
    TovraStateEngineFacade other = new TovraStateEngineFacade(held);
    other.addObjectModule(ObjectModuleID.VISUAL_SEARCH_SERVICE_MOD, heldTransport);
    assertFalse(held.swigCMemOwn, "the engine owns its delegate while it lives");
    assertFalse(heldTransport.swigCMemOwn);
    java.lang.ref.WeakReference<Events> ref = new java.lang.ref.WeakReference<Events>(held);
    held = null;
    for (int i = 0; i < 5; i++) System.gc();
    assertNotNull(ref.get(), "a delegate in use is not collected");
    heldTransport.delete();  // deleted too early: its native object lives until the engine goes
    other.startEngine();
    other.delete();
    assertTrue(ref.get().swigCMemOwn, "ownership is handed back");
    assertEquals(0, ServerDelegate.getCPtr(heldTransport));
    ref.get().delete();
    heldTransport.executor.shutdown();
  }

  private static void abandonRunningEngine() {
    Events abandoned = new Events();
    Transport abandonedTransport = new Transport();
    abandonedTransport.executor.shutdown();
    TovraStateEngineFacade engine = new TovraStateEngineFacade(abandoned);
    engine.addObjectModule(ObjectModuleID.VISUAL_SEARCH_SERVICE_MOD, abandonedTransport);
    engine.startEngine();
  }

  @Test
  void anAbandonedEngineIsFinalizedBeforeItsDelegates() {
    // Engine and delegates become unreachable together; whatever order their finalizers run
    // in, the delegates' native objects outlive the engine.
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

    assertThrowsWithMessage(NullPointerException.class,
        "Tovra::CameraResRequirement & reference is null", () -> engine.getCameraResRequirement(null));
    assertThrowsWithMessage(NullPointerException.class,
        "OrzaVSMobile::ImageBuffer & reference is null", () -> engine.process(null, extra));
    assertThrowsWithMessage(NullPointerException.class,
        "OrzaVSMobile::ExtraFrameData & reference is null", () -> engine.process("k", image, null));
    assertThrowsWithMessage(NullPointerException.class, "null string",
        () -> engine.process(null, image, extra));
    assertThrowsWithMessage(NullPointerException.class,
        "std::map< std::string,std::string > const & reference is null",
        () -> engine.readObjectModuleProps(null));
    assertThrowsWithMessage(NullPointerException.class,
        "std::map< std::string,unsigned int > & reference is null",
        () -> engine.getAndClearMetrics(null, values));
    assertThrowsWithMessage(NullPointerException.class, "null string", () -> engine.readProps(null));
    assertThrows(NullPointerException.class, () -> engine.requestImageBuffer(image, null));
    assertThrows(IndexOutOfBoundsException.class,
        () -> engine.requestImageBuffer(image, new String[0]));

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
}
