package com.orza.vs.mobile.library.http;

import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertNotNull;
import static org.junit.jupiter.api.Assertions.assertTrue;

import com.orza.vs.mobile.library.impl.jni.EventDelegateBase;
import com.orza.vs.mobile.library.impl.jni.ExtraFrameData;
import com.orza.vs.mobile.library.impl.jni.ImageBuffer;
import com.orza.vs.mobile.library.impl.jni.ImageFormat;
import com.orza.vs.mobile.library.impl.jni.ObjectModuleID;
import com.orza.vs.mobile.library.impl.jni.ResponseStatus;
import com.orza.vs.mobile.library.impl.jni.ResultMetadata;
import com.orza.vs.mobile.library.impl.jni.TovraStateEngineFacade;
import com.orza.vs.mobile.library.impl.jni.VectorOfObjectInfo;
import com.orza.vs.tools.scan.TestServers;
import com.orza.vs.tools.server.ReferenceServer;
import java.io.IOException;
import java.nio.ByteBuffer;
import java.util.concurrent.BlockingQueue;
import java.util.concurrent.LinkedBlockingQueue;
import java.util.concurrent.TimeUnit;
import org.junit.jupiter.api.AfterEach;
import org.junit.jupiter.api.BeforeEach;
import org.junit.jupiter.api.Test;

/** The transport used as an app uses it: plain engine API, no tool code in between. */
class HttpServerDelegateTest {
  static final int W = 160, H = 120;

  /** Outcomes as "decoded" or "error <module> <status> <code>", in arrival order. */
  static final class Events extends EventDelegateBase {
    final BlockingQueue<String> outcomes = new LinkedBlockingQueue<>();

    @Override
    public void didDecode(VectorOfObjectInfo objects, ResultMetadata metadata) {
      outcomes.add("decoded");
    }

    @Override
    public void didReceiveServerError(ObjectModuleID module, ResponseStatus status, int value) {
      outcomes.add("error " + module + " " + status + " " + value);
    }
  }

  ReferenceServer server;
  Events events;
  TovraStateEngineFacade engine;
  HttpServerDelegate transport;
  final ExtraFrameData extra = new ExtraFrameData();
  final ByteBuffer frame = ByteBuffer.allocateDirect(W * H * 3 / 2);
  int frames;

  @BeforeEach
  void start() throws IOException {
    server = TestServers.start(5);
    // A textured frame: a pattern of bright and dark squares, neutral chroma.
    for (int y = 0; y < H; y++) {
      for (int x = 0; x < W; x++) frame.put(y * W + x, (byte) ((((x / 8) + (y / 8)) & 1) == 0 ? 30 : 220));
    }
    for (int i = W * H; i < W * H * 3 / 2; i++) frame.put(i, (byte) 128);
  }

  void open(String path, int readTimeoutMs) throws IOException {
    events = new Events();
    transport = new HttpServerDelegate(server.baseUrl() + path, 1000, readTimeoutMs);
    engine = new TovraStateEngineFacade(events);
    engine.addObjectModule(ObjectModuleID.VISUAL_SEARCH_SERVICE_MOD, transport);
    engine.startEngine();
  }

  /** One NV21 frame through requestImageBuffer, the direct-buffer fill and process. */
  void feed() {
    ImageBuffer image = new ImageBuffer();
    try {
      image.setFormat(ImageFormat.NV21);
      image.setWidth(W);
      image.setHeight(H);
      image.setWidthStep(W);
      String[] key = new String[1];
      engine.requestImageBuffer(image, key);
      assertNotNull(key[0], "the engine lends a frame record");
      assertEquals(W * H * 3 / 2, image.fillBufferWithByteBuffer(frame, W * H * 3 / 2));
      extra.setTimeStamp(frames++ * 0.5);
      engine.process(key[0], image, extra);
    } finally {
      image.delete();
    }
  }

  @AfterEach
  void stop() {
    if (engine != null) {
      engine.stopEngine();
      transport.close();
      engine.delete();
      transport.delete();
      events.delete();
    }
    extra.delete();
    server.close();
  }

  /**
   * Streams frames, as a camera does, until the next outcome arrives (at most 5 s). A frame fed
   * while the engine's job is still finishing the previous reply is held, and only a later
   * frame dispatches it.
   */
  String streamUntilOutcome() throws InterruptedException {
    long deadline = System.nanoTime() + 5_000_000_000L;
    while (System.nanoTime() < deadline) {
      feed();
      String outcome = events.outcomes.poll(100, TimeUnit.MILLISECONDS);
      if (outcome != null) return outcome;
    }
    return null;
  }

  @Test
  void closingAnswersTheRequestInFlightAndEveryLaterOne() throws Exception {
    open("/test/slow/5000", 10_000);
    feed();
    long deadline = System.nanoTime() + 3_000_000_000L;
    while (server.requestCount() == 0 && System.nanoTime() < deadline) Thread.sleep(10);
    assertEquals(1, server.requestCount(), "the request reached the server");

    long t0 = System.nanoTime();
    transport.close();
    double closeSeconds = (System.nanoTime() - t0) / 1e9;
    assertTrue(closeSeconds < 2, "close() took " + closeSeconds + " s");
    assertEquals("error VISUAL_SEARCH_SERVICE_MOD RESPONSE_SERVER_ERROR -3", events.outcomes.poll(2, TimeUnit.SECONDS));

    // The engine's job is free again; a request sent after close() is answered -3 as well.
    assertEquals("error VISUAL_SEARCH_SERVICE_MOD RESPONSE_SERVER_ERROR -3", streamUntilOutcome());
    assertEquals(1, server.requestCount(), "nothing is sent after close()");
  }
}
