package com.orza.vs.tools.scan;

import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertNotEquals;
import static org.junit.jupiter.api.Assertions.assertTrue;

import com.orza.vs.tools.server.ReferenceServer;
import java.awt.Rectangle;
import java.io.IOException;
import java.net.InetAddress;
import java.net.ServerSocket;
import java.util.HashSet;
import java.util.List;
import java.util.Set;
import org.junit.jupiter.api.AfterEach;
import org.junit.jupiter.api.BeforeEach;
import org.junit.jupiter.api.Test;

/**
 * The engine, through the Java API, with the HTTP transport and the reference server on
 * loopback: results of real requests, and every failure path ending in the right
 * didReceiveServerError instead of a hang.
 */
class EngineOverHttpTest {
  static final int W = 320, H = 240, FRAMES = 30;

  ReferenceServer server;

  @BeforeEach
  void start() throws IOException {
    ReferenceServer.Options o = new ReferenceServer.Options();
    o.log = null;
    o.accumulate = 3;
    server = new ReferenceServer(o).start();
  }

  @AfterEach
  void stop() {
    server.close();
  }

  /**
   * Feeds the generated scene (cyclically) at 30 fps in real time until {@code minRequests}
   * requests were sent or {@code maxFrames} frames fed, then waits for the outcomes.
   */
  static ScanLog scan(String url, int minRequests, int maxFrames, int readTimeoutMs) throws Exception {
    ScanLog log = new ScanLog();
    GeneratedSource source = new GeneratedSource(W, H, FRAMES, 30);
    try (ScanEngine engine = new ScanEngine(log, url, 1000, readTimeoutMs, null)) {
      long start = System.nanoTime();
      for (int i = 0; i < maxFrames && log.requests().size() < minRequests; i++) {
        long due = start + (long) (i / 30.0 * 1e9);
        long wait = due - System.nanoTime();
        if (wait > 0) Thread.sleep(wait / 1_000_000);
        Frame f = source.next();
        if (f == null) {
          source = new GeneratedSource(W, H, FRAMES, 30); // the card's path is periodic
          f = source.next();
        }
        engine.feed(f, i / 30.0, 0);
      }
      assertTrue(engine.awaitOutcomes(5000), "every request gets an outcome");
      assertEquals(0, engine.refusedFrames());
    }
    return log;
  }

  static double iou(Rectangle a, float[] q) {
    Rectangle b = new Rectangle(Math.round(q[0]), Math.round(q[1]), Math.round(q[4] - q[0]), Math.round(q[5] - q[1]));
    Rectangle i = a.intersection(b);
    if (i.isEmpty()) return 0;
    double inter = (double) i.width * i.height;
    return inter / ((double) a.width * a.height + (double) b.width * b.height - inter);
  }

  @Test
  void resultsComeBackWithABoxAroundTheMovingCard() throws Exception {
    ScanLog log = scan(server.url(), 4, 300, 5000);
    List<ScanLog.RequestEntry> requests = log.requests();
    assertTrue(requests.size() >= 4, "requests: " + requests.size());
    Set<String> queryIds = new HashSet<>();
    for (ScanLog.RequestEntry r : requests) {
      assertTrue(r.decoded, "request " + r.number + ": " + r.body);
      assertEquals(200, r.code);
      assertTrue(r.frameIndex >= 0, "request id names a frame that was fed: " + r.id);
      assertTrue(r.id.startsWith("TovraStateEngine-"), r.id);
      assertTrue(r.roundTrip > 0 && r.roundTrip < 5, "round trip in seconds: " + r.roundTrip);
      assertTrue(r.jpeg.length > 1000 && (r.jpeg[0] & 0xff) == 0xff && (r.jpeg[1] & 0xff) == 0xd8, "a JPEG was sent");
      assertEquals("90", r.metadata.get("orientation"));
      assertTrue(queryIds.add(r.queryId), "fresh query id " + r.queryId);
      assertTrue(r.accumulated.contains(r.queryId));

      ScanLog.Result box = null, terms = null;
      for (ScanLog.Result x : r.results) {
        if (x.type.equals("BoundingBox")) box = x;
        if (x.type.equals("SearchTerms")) terms = x;
      }
      assertTrue(box != null && box.location != null, "a bounding box in request " + r.number);
      Rectangle card = GeneratedSource.objectRect(r.frameIndex, W, H, FRAMES);
      double overlap = iou(card, box.location);
      assertTrue(overlap > 0.5, "box of request " + r.number + " overlaps the card by " + overlap);
      assertTrue(box.properties.startsWith("{\"boundingBox\":{\"blx\":"), box.properties);
      assertTrue(terms != null && terms.content.startsWith("texture energy "), "search terms in request " + r.number);
    }
    // The engine chains queries (lastQueryId), so the server's sessions accumulate them.
    ScanLog.RequestEntry second = requests.get(1);
    assertEquals(requests.get(0).queryId, second.metadata.get("lastQueryId"));
    assertEquals(2, second.accumulated.size());
    assertTrue(requests.get(2).finalAccumulation);
    if (requests.size() > 3) {
      // After a final reply the next query opens a new session.
      assertFalse(requests.get(3).finalAccumulation);
      assertEquals(1, requests.get(3).accumulated.size());
    }
    // Interest points arrive for every frame fed, up to 50.
    for (ScanLog.FrameEntry f : log.frames()) {
      assertTrue(f.points != null && f.pointCount() <= 50, "points of frame " + f.index);
    }
    assertTrue(new Summary(log).maxPoints > 10);
  }

  /** Runs a few frames against {@code url} and returns the first request, which must have failed. */
  static ScanLog.RequestEntry firstFailure(String url, int readTimeoutMs) throws Exception {
    long t0 = System.nanoTime();
    ScanLog log = scan(url, 1, 30, readTimeoutMs);
    double s = (System.nanoTime() - t0) / 1e9;
    assertTrue(s < 5, "no hang: " + s + " s");
    List<ScanLog.RequestEntry> requests = log.requests();
    assertFalse(requests.isEmpty());
    ScanLog.RequestEntry r = requests.get(0);
    assertTrue(r.isError(), "reported as an error: " + r.body);
    return r;
  }

  @Test
  void serverDownIsAConnectionFailure() throws Exception {
    int port;
    try (ServerSocket s = new ServerSocket(0, 1, InetAddress.getLoopbackAddress())) {
      port = s.getLocalPort();
    }
    ScanLog.RequestEntry r = firstFailure("http://127.0.0.1:" + port + "/vsearch", 1000);
    assertEquals(1, r.errorStatus);
    assertEquals(-1, r.errorCode);
  }

  @Test
  void status500IsAServerError() throws Exception {
    ScanLog.RequestEntry r = firstFailure(server.baseUrl() + "/test/500", 2000);
    assertEquals(1, r.errorStatus);
    assertEquals(500, r.errorCode);
  }

  @Test
  void aBodyThatIsNotJsonIsAParseError() throws Exception {
    ScanLog.RequestEntry r = firstFailure(server.baseUrl() + "/test/notjson", 2000);
    assertEquals(2, r.errorStatus);
    assertEquals(200, r.errorCode);
  }

  @Test
  void aSlowServerTimesOut() throws Exception {
    ScanLog.RequestEntry r = firstFailure(server.baseUrl() + "/test/slow/3000", 300);
    assertEquals(1, r.errorStatus);
    assertEquals(-2, r.errorCode);
    assertNotEquals(-1.0, r.roundTrip);
  }
}
