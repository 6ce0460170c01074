package com.orza.vs.mobile.library.session;

import static org.junit.jupiter.api.Assertions.*;

import com.orza.vs.mobile.library.impl.jni.ContentType;
import com.orza.vs.mobile.library.impl.jni.ImageBuffer;
import com.orza.vs.mobile.library.impl.jni.ResponseStatus;
import com.orza.vs.mobile.library.impl.jni.TestTransport;
import java.nio.ByteBuffer;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.List;
import java.util.Random;
import org.junit.jupiter.api.AfterEach;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.function.Executable;

/** The session as an app drives it: frames in every camera layout, a transport, a listener. */
class VisualSearchSessionTest {
  static final int W = 64;
  static final int H = 48;
  final TestTransport transport = new TestTransport();
  final List<Object> heard = new ArrayList<Object>();
  final SessionListener listener = new SessionListener() {  // keeps all it hears, in order
    @Override public void onInterestPoints(float[] xy) { heard.add(xy); }
    @Override public void onResults(SearchResults results) { heard.add(results); }
    @Override public void onServerError(ResponseStatus status, int code) { heard.add(code); }
  };
  final VisualSearchSession session = VisualSearchSession.builder().transport(transport).listener(listener).build();
  final byte[] y = new byte[W * H];
  final byte[] u = new byte[W * H / 4];
  final byte[] v = new byte[W * H / 4];

  VisualSearchSessionTest() {
    Random random = new Random(7);
    random.nextBytes(y);
    random.nextBytes(u);
    random.nextBytes(v);
  }

  @AfterEach
  void tearDown() {
    session.close();
    transport.delete();
  }

  byte[] nv21() {
    byte[] out = new byte[W * H * 3 / 2];
    planes(LAYOUTS[0])[0].get(out);  // NV21 in one block
    return out;
  }

  // Camera layouts: row stride, chroma pixel stride, all planes in one block, V before U, and
  // what wrapPlanes answers (1 NV21 / 2 NV12 read in place, -1 copied). Planes end after their
  // last sample, as Android's do: so a padded last chroma row lies past them and forces a copy.
  static final int[][] LAYOUTS = {
    {W, 2, 1, 1, 1}, {W, 2, 1, 0, 2}, {W + 16, 2, 1, 1, -1}, {W + 16, 2, 0, 1, -1}, {W, 2, 0, 0, -1},
    {W + 8, 1, 0, 0, -1},
  };

  ByteBuffer[] planes(int[] l) {
    int stride = l[0];
    int ps = l[1];
    boolean oneBlock = l[2] == 1;
    int chromaLength = (H / 2 - 1) * stride + (W / 2 - 1) * ps + 1;
    ByteBuffer block = ByteBuffer.allocateDirect(stride * H + (ps == 2 ? stride * H / 2 : 0));
    ByteBuffer yb = oneBlock ? block : ByteBuffer.allocateDirect((H - 1) * stride + W);
    ByteBuffer chroma = oneBlock ? block : ByteBuffer.allocateDirect(stride * H / 2);
    ByteBuffer ub = ps == 2 ? chroma : ByteBuffer.allocateDirect(chromaLength);
    ByteBuffer vb = ps == 2 ? chroma : ByteBuffer.allocateDirect(chromaLength);
    int base = oneBlock ? stride * H : 0;
    int uAt = ps == 2 ? base + l[3] : 0;
    int vAt = ps == 2 ? base + 1 - l[3] : 0;
    for (int r = 0; r < H; r++) for (int c = 0; c < W; c++) yb.put(r * stride + c, y[r * W + c]);
    for (int i = 0; i < u.length; i++) {
      int at = i / (W / 2) * stride + i % (W / 2) * ps;
      ub.put(uAt + at, u[i]);
      vb.put(vAt + at, v[i]);
    }
    return new ByteBuffer[] {yb, slice(ub, uAt, chromaLength), slice(vb, vAt, chromaLength)};
  }

  static ByteBuffer slice(ByteBuffer b, int at, int length) {
    ByteBuffer d = b.duplicate();
    d.position(at);
    d.limit(at + length);
    return d.slice();
  }

  /** One frame after a fresh start, answered with `code`; returns the JPEG the engine sent. */
  byte[] scan(int code, Executable submit) throws Throwable {
    session.pause();
    session.start();
    submit.execute();
    return transport.answer(code, code == 200 ? TestTransport.REPLY : "busy");
  }

  @Test
  void everyLayoutReachesTheEngineAsPackedNv21AndResultsAreOwned() throws Throwable {
    assertFalse(session.processNv21(nv21(), W, H, 0), "not started: the frame is refused");
    byte[] reference = scan(200, () -> assertTrue(session.processNv21(nv21(), W, H, 1_000_000_000L)));
    float[] points = (float[]) heard.get(0);
    assertTrue(points.length > 0 && points.length % 2 == 0 && points[0] < W && points[1] < H, "x,y pairs");
    ByteBuffer direct = ByteBuffer.allocateDirect(W * H * 3 / 2).put(nv21());
    assertArrayEquals(reference, scan(200, () -> session.processNv21(direct, W, H, 0)), "direct NV21");
    ImageBuffer probe = new ImageBuffer();
    for (int[] l : LAYOUTS) {
      String name = Arrays.toString(l);
      ByteBuffer[] p = planes(l);
      assertEquals(l[4], FrameNatives.wrapPlanes(ImageBuffer.getCPtr(probe), p[0], l[0], p[1], p[2], l[0], l[1], W, H),
          name + ": read in place or copied");
      assertArrayEquals(reference, scan(200, () -> assertTrue(
          session.processYuv420(W, H, p[0], l[0], p[1], p[2], l[0], l[1], 0))), name);
    }
    probe.delete();
    scan(503, () -> session.processNv21(nv21(), W, H, 0));
    session.close();
    // Read after the session and its engine are gone.
    List<SearchResults> results = new ArrayList<SearchResults>();
    for (Object o : heard) if (o instanceof SearchResults) results.add((SearchResults) o);
    assertEquals(2 + LAYOUTS.length, results.size());
    assertEquals(503, heard.get(heard.size() - 1));
    SearchResults r = results.get(0);
    assertEquals(Arrays.asList("q-1", true, Arrays.asList("q-0"), 2),
        Arrays.asList(r.queryId(), r.isFinal(), r.accumulatedQueries(), r.results().size()));
    SearchResult shoe = r.results().get(0);
    assertEquals(Arrays.asList(ContentType.PIDN, "shoe", "{\"brand\":\"x\"}", "lace"),
        Arrays.asList(shoe.contentType(), shoe.content(), shoe.properties(), shoe.subResults().get(0).content()));
    assertEquals(ContentType.BOUNDING_BOX, r.results().get(1).contentType());
    assertArrayEquals(new float[] {10, 20, 110, 20, 110, 90, 10, 90}, r.results().get(1).location());
  }

  @Test
  void lifecycle() {
    session.start();
    assertTrue(session.processNv21(nv21(), W, H, 0));
    session.pause();
    assertFalse(session.processNv21(nv21(), W, H, 0), "paused");
    session.resume();
    assertTrue(session.isRunning());
    session.close();
    session.close();
    assertFalse(session.processNv21(nv21(), W, H, 0), "closed");
    assertThrows(IllegalStateException.class, session::start);
    assertThrows(IllegalStateException.class, () -> VisualSearchSession.builder().build());
    assertThrows(IllegalStateException.class,
        () -> VisualSearchSession.builder().serverUrl("http://x/").transport(transport).build());
    assertThrows(IllegalArgumentException.class, () -> VisualSearchSession.builder().serverUrl("ftp://x/").build());
  }

  @Test
  void badFramesRaiseClearExceptions() throws Throwable {
    session.start();
    ByteBuffer[] p = planes(LAYOUTS[4]);
    ByteBuffer heap = ByteBuffer.allocate(W * H);
    Object[][] cases = {
      {NullPointerException.class, "Y plane is null", yuv(null, W, p[1], p[2], W, 2, W)},
      {IllegalArgumentException.class, "U plane is not a direct ByteBuffer", yuv(p[0], W, heap, p[2], W, 2, W)},
      {IllegalArgumentException.class, "must be even", yuv(p[0], W, p[1], p[2], W, 2, W - 1)},
      {IllegalArgumentException.class, "Y plane: row stride 32 is shorter", yuv(p[0], 32, p[1], p[2], W, 2, W)},
      {IllegalArgumentException.class, "pixel stride 0 must be positive", yuv(p[0], W, p[1], p[2], W, 0, W)},
      {IllegalArgumentException.class, "V plane holds", yuv(p[0], W, p[1], slice(p[2], 0, 100), W, 2, W)},
      {IllegalArgumentException.class, "row stride 2 is shorter", yuv(p[0], W, p[1], p[2], 2, 2, W)},
      {IllegalArgumentException.class, "NV21 frame holds 10 bytes", (Executable) () -> session.processNv21(new byte[10], W, H, 0)},
      {IllegalArgumentException.class, "NV21 frame holds 10 bytes",
        (Executable) () -> session.processNv21(ByteBuffer.allocateDirect(10), W, H, 0)},
      {NullPointerException.class, "NV21 frame is null", (Executable) () -> session.processNv21((byte[]) null, W, H, 0)},
    };
    for (Object[] c : cases) {
      @SuppressWarnings("unchecked")
      Throwable e = assertThrows((Class<Throwable>) c[0], (Executable) c[2], (String) c[1]);
      assertTrue(e.getMessage().contains((String) c[1]), e.getMessage());
    }
    assertTrue(scan(200, () -> session.processNv21(nv21(), W, H, 0)).length > 0, "the session still works");
  }

  Executable yuv(ByteBuffer yb, int yStride, ByteBuffer ub, ByteBuffer vb, int uvStride, int ps, int width) {
    return () -> session.processYuv420(width, H, yb, yStride, ub, vb, uvStride, ps, 0);
  }
}
