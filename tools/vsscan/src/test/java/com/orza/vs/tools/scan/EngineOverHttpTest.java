package com.orza.vs.tools.scan;

import static java.util.stream.Collectors.toList;
import static org.junit.jupiter.api.Assertions.*;

import com.orza.vs.tools.server.ReferenceServer;
import java.net.InetAddress;
import java.net.ServerSocket;
import java.util.HashSet;
import java.util.List;
import java.util.Set;
import org.junit.jupiter.api.Test;

/** The engine through the Java API, with the HTTP transport and the reference server on loopback. */
class EngineOverHttpTest {
  static final ReferenceServer server = TestServers.shared();

  /** Feeds the built-in scene in real time until {@code minRequests} were sent, then waits for the outcomes. */
  static ScanLog scan(GeneratedSource source, String url, int minRequests, int readTimeoutMs) throws Exception {
    ScanLog log = new ScanLog();
    try (ScanEngine engine = new ScanEngine(log, url, 1000, readTimeoutMs, null)) {
      long start = System.nanoTime();
      Frame f;
      for (int i = 0; log.requests().size() < minRequests && (f = source.next()) != null; i++) {
        long wait = start + (long) (i / 30.0 * 1e9) - System.nanoTime();
        if (wait > 0) Thread.sleep(wait / 1_000_000);
        engine.feed(f, i / 30.0, 0);
      }
      assertTrue(engine.awaitOutcomes(5000), "every request gets an outcome");
      assertEquals(0, engine.refusedFrames());
    }
    return log;
  }

  @Test
  void requestsNameTheProductInViewWithItsOutline() throws Exception {
    GeneratedSource source = new GeneratedSource(640, 480, 100, 30);
    ScanLog log = scan(source, server.url(), 4, 5000);
    List<ScanLog.RequestEntry> requests = log.requests();
    assertTrue(requests.size() >= 4, "requests: " + requests.size());
    Set<String> queryIds = new HashSet<>();
    int named = 0;
    for (ScanLog.RequestEntry r : requests) {
      assertTrue(r.decoded && r.code == 200, "request " + r.number + ": " + r.body);
      assertEquals("90", r.metadata.get("orientation"));
      assertTrue(queryIds.add(r.queryId) && r.accumulated.contains(r.queryId), "fresh query id " + r.queryId);

      // A frame smeared by a jerk may go unrecognised; a wrong product never comes back.
      ScanLog.Result product = Measurements.product(r.results);
      Truth truth = source.truth(r.frameIndex);
      if (product == null) continue;
      assertEquals(truth.product, product.content, "request " + r.number + ": " + r.body);
      named++;
      double[] box = new double[8];
      for (int i = 0; i < 8; i++) box[i] = product.location[i];
      assertTrue(Truth.iou(box, truth.corners) > 0.8, "outline of request " + r.number + ": " + r.body);
      assertTrue(product.properties.startsWith("{\"boundingBox\":{\"blx\":"), product.properties);
      assertEquals(List.of("SearchTerms", "ExternalResult"), product.subContents.stream().map(x -> x.type).collect(toList()));
    }
    assertTrue(named >= requests.size() - 1, named + " of " + requests.size() + " requests named the product");
    // The engine chains queries (lastQueryId), so sessions of 3 accumulate them; after a final reply a new one opens.
    assertEquals(requests.get(0).queryId, requests.get(1).metadata.get("lastQueryId"));
    assertEquals(List.of(1, 2, 3, 1), requests.stream().limit(4).map(r -> r.accumulated.size()).collect(toList()));
    assertEquals(List.of(false, false, true, false), requests.stream().limit(4).map(r -> r.finalAccumulation).collect(toList()));
    for (ScanLog.FrameEntry f : log.frames()) assertTrue(f.points != null && f.pointCount() <= 50, "points of frame " + f.index);
  }

  @Test
  void failuresEndInTheirServerErrorWithoutHanging() throws Exception {
    int closedPort;
    try (ServerSocket s = new ServerSocket(0, 1, InetAddress.getLoopbackAddress())) {
      closedPort = s.getLocalPort();
    }
    // url, read timeout, status, code: server down, 500, a body that is not JSON, too slow.
    Object[][] cases = {
        {"http://127.0.0.1:" + closedPort + "/vsearch", 1000, 1, -1},
        {server.baseUrl() + "/test/500", 2000, 1, 500},
        {server.baseUrl() + "/test/notjson", 2000, 2, 200},
        {server.baseUrl() + "/test/slow/3000", 300, 1, -2},
    };
    for (Object[] c : cases) {
      long t0 = System.nanoTime();
      ScanLog log = scan(new GeneratedSource(160, 120, 30, 30), (String) c[0], 1, (Integer) c[1]);
      assertTrue((System.nanoTime() - t0) / 1e9 < 5, "no hang with " + c[0]);
      ScanLog.RequestEntry r = log.requests().get(0);
      assertTrue(r.isError(), "reported as an error: " + r.body);
      assertEquals(List.of(c[2], c[3]), List.of(r.errorStatus, r.errorCode), (String) c[0]);
    }
  }

  @Test
  void closingTheTransportAnswersTheRequestInFlightAndEveryLaterOne() throws Exception {
    ScanLog log = new ScanLog();
    int before = server.requestCount();
    GeneratedSource source = new GeneratedSource(160, 120, 60, 30);
    try (ScanEngine engine = new ScanEngine(log, server.baseUrl() + "/test/slow/5000", 1000, 10_000, null)) {
      engine.feed(source.next(), 0, 0);
      for (int i = 0; i < 300 && server.requestCount() == before; i++) Thread.sleep(10);
      assertEquals(before + 1, server.requestCount(), "the request reached the server");
      long t0 = System.nanoTime();
      engine.closeTransport();
      assertTrue((System.nanoTime() - t0) / 1e9 < 2, "close() breaks the connection at once");
      // The engine's job is free again; a request sent after close() is answered -3 as well.
      for (int i = 1; i < 60 && log.requests().size() < 2; i++) {
        engine.feed(source.next(), i * 0.2, 0);
        Thread.sleep(30);
      }
      assertTrue(engine.awaitOutcomes(3000));
    }
    assertEquals(List.of(-3, -3), log.requests().stream().map(r -> r.errorCode).collect(toList()));
    assertEquals(before + 1, server.requestCount(), "nothing is sent after close()");
  }
}
