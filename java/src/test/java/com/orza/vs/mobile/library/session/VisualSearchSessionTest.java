package com.orza.vs.mobile.library.session;

import static org.junit.jupiter.api.Assertions.assertArrayEquals;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertNotNull;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;

import com.orza.vs.mobile.library.impl.jni.ContentType;
import com.orza.vs.mobile.library.impl.jni.ImageBuffer;
import com.orza.vs.mobile.library.impl.jni.ServerDelegate;
import com.orza.vs.mobile.library.impl.jni.ServerRequest;
import com.orza.vs.mobile.library.impl.jni.ServerResponse;
import java.nio.ByteBuffer;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.List;
import java.util.Random;
import java.util.concurrent.LinkedBlockingQueue;
import java.util.concurrent.TimeUnit;
import org.junit.jupiter.api.AfterEach;
import org.junit.jupiter.api.BeforeEach;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.function.Executable;

/** The session as an app drives it: frames in every camera layout, a transport, a listener. */
class VisualSearchSessionTest {
  static final int W = 64;
  static final int H = 48;
  static final String REPLY = "{\"queryId\":\"q-1\",\"quillmark\":{\"searchResult\":["
      + "{\"content\":\"shoe\",\"contentType\":\"PIDN\",\"properties\":{\"brand\":\"x\"},"
      + "\"subContent\":[{\"content\":\"lace\",\"contentType\":\"SearchTerms\",\"properties\":{}}]},"
      + "{\"content\":\"\",\"contentType\":\"BoundingBox\",\"properties\":{\"boundingBox\":"
      + "{\"tlx\":10,\"tly\":20,\"trx\":110,\"try\":20,\"brx\":110,\"bry\":90,\"blx\":10,\"bly\":90}}}],"
      + "\"resultMetadata\":{\"finalAccumulation\":true,\"accumulatedQueries\":[\"q-0\"]}}}";

  /** Answers nothing by itself: the test takes each request (id, JPEG) and pushes the reply. */
  static final class Transport extends ServerDelegate {
    final LinkedBlockingQueue<Object[]> requests = new LinkedBlockingQueue<Object[]>();

    @Override
    public boolean sendServerRequestImpl(ServerRequest request) {
      requests.add(new Object[] {request.getId(), request.getData().getData()});
      return true;
    }

    byte[] answer(int code, String body) throws InterruptedException {
      Object[] request = requests.poll(20, TimeUnit.SECONDS);
      assertNotNull(request, "the engine sent a request");
      ServerResponse response = new ServerResponse();
      response.setId((String) request[0]);
      response.setResponseCode(code);
      response.setResponseStr(body);
      pushServerResponse(response);
      response.delete();
      return (byte[]) request[1];
    }
  }

  static final class Listener implements SessionListener {
    final List<SearchResults> results = new ArrayList<SearchResults>();
    final List<Integer> errors = new ArrayList<Integer>();
    float[] points;

    @Override
    public void onInterestPoints(float[] xy) {
      points = xy;
    }

    @Override
    public void onResults(SearchResults r) {
      results.add(r);
    }

    @Override
    public void onServerError(com.orza.vs.mobile.library.impl.jni.ResponseStatus status, int code) {
      errors.add(code);
    }
  }

  final Transport transport = new Transport();
  final Listener listener = new Listener();
  VisualSearchSession session;
  final byte[] y = new byte[W * H];
  final byte[] u = new byte[W * H / 4];
  final byte[] v = new byte[W * H / 4];

  @BeforeEach
  void setUp() {
    Random random = new Random(7);
    random.nextBytes(y);
    random.nextBytes(u);
    random.nextBytes(v);
    session = VisualSearchSession.builder().transport(transport).listener(listener).build();
  }

  @AfterEach
  void tearDown() {
    session.close();
    transport.delete();
  }

  byte[] nv21() {
    byte[] out = Arrays.copyOf(y, W * H * 3 / 2);
    for (int i = 0; i < u.length; i++) {
      out[W * H + 2 * i] = v[i];
      out[W * H + 2 * i + 1] = u[i];
    }
    return out;
  }

  /** Camera planes: rows of `stride` bytes; chroma interleaved (pixel stride 2) or planar. */
  static final class Layout {
    final String name;
    final int stride;
    final int pixelStride;
    final boolean oneBlock;
    final boolean vFirst;
    final int wrapped;

    Layout(String name, int stride, int pixelStride, boolean oneBlock, boolean vFirst, int wrapped) {
      this.name = name;
      this.stride = stride;
      this.pixelStride = pixelStride;
      this.oneBlock = oneBlock;
      this.vFirst = vFirst;
      this.wrapped = wrapped;
    }
  }

  static final Layout[] LAYOUTS = {
    new Layout("NV21 in one block", W, 2, true, true, 1),
    new Layout("NV12 in one block", W, 2, true, false, 2),
    // The last chroma row's padding lies past the planes, so the engine must not read them in place.
    new Layout("NV21 in one block, padded rows", W + 16, 2, true, true, -1),
    new Layout("NV21 chroma apart, padded rows", W + 16, 2, false, true, -1),
    new Layout("NV12 chroma apart", W, 2, false, false, -1),
    new Layout("I420-like planes, padded rows", W + 8, 1, false, false, -1),
  };

  /** Y, U, V buffers for a layout; planes apart end after their last sample, as Android's do. */
  ByteBuffer[] planes(Layout l) {
    int chromaRows = H / 2;
    int chromaLength = (chromaRows - 1) * l.stride + (W / 2 - 1) * l.pixelStride + 1;
    ByteBuffer block = ByteBuffer.allocateDirect(l.stride * H + (l.pixelStride == 2 ? l.stride * chromaRows : 0));
    ByteBuffer yb = l.oneBlock ? block : ByteBuffer.allocateDirect((H - 1) * l.stride + W);
    ByteBuffer chroma = l.oneBlock ? block : ByteBuffer.allocateDirect(l.stride * chromaRows);
    int base = l.oneBlock ? l.stride * H : 0;
    ByteBuffer ub = l.pixelStride == 2 ? chroma : ByteBuffer.allocateDirect(chromaLength);
    ByteBuffer vb = l.pixelStride == 2 ? chroma : ByteBuffer.allocateDirect(chromaLength);
    for (int r = 0; r < H; r++) for (int c = 0; c < W; c++) yb.put(r * l.stride + c, y[r * W + c]);
    int uAt = l.pixelStride == 2 ? base + (l.vFirst ? 1 : 0) : 0;
    int vAt = l.pixelStride == 2 ? base + (l.vFirst ? 0 : 1) : 0;
    for (int r = 0; r < chromaRows; r++) {
      for (int c = 0; c < W / 2; c++) {
        ub.put(uAt + r * l.stride + c * l.pixelStride, u[r * W / 2 + c]);
        vb.put(vAt + r * l.stride + c * l.pixelStride, v[r * W / 2 + c]);
      }
    }
    return new ByteBuffer[] {yb, slice(ub, uAt, chromaLength), slice(vb, vAt, chromaLength)};
  }

  static ByteBuffer slice(ByteBuffer b, int at, int length) {
    ByteBuffer d = b.duplicate();
    d.position(at);
    d.limit(at + length);
    return d.slice();
  }

  /** One frame through a fresh start; returns the JPEG the engine sent for it. */
  byte[] scan(Executable submit) throws Throwable {
    session.pause();
    session.start();
    submit.execute();
    return transport.answer(200, REPLY);
  }

  @Test
  void everyPlaneLayoutGivesTheEngineTheFramePackedNv21Gives() throws Throwable {
    assertFalse(session.processNv21(nv21(), W, H, 0), "not started: the frame is refused");
    byte[] reference = scan(() -> assertTrue(session.processNv21(nv21(), W, H, 1_000_000_000L)));
    assertTrue(listener.points.length > 0 && listener.points.length % 2 == 0, "interest points as x,y pairs");
    ByteBuffer direct = ByteBuffer.allocateDirect(W * H * 3 / 2);
    direct.put(nv21());
    assertArrayEquals(reference, scan(() -> session.processNv21(direct, W, H, 0)), "direct NV21");
    ImageBuffer probe = new ImageBuffer();
    for (Layout l : LAYOUTS) {
      ByteBuffer[] p = planes(l);
      assertEquals(l.wrapped, FrameNatives.wrapPlanes(ImageBuffer.getCPtr(probe), p[0], l.stride, p[1], p[2],
          l.stride, l.pixelStride, W, H), l.name + ": read in place or copied");
      byte[] jpeg = scan(() -> assertTrue(session.processYuv420(W, H, p[0], l.stride, p[1], p[2], l.stride,
          l.pixelStride, 0)));
      assertArrayEquals(reference, jpeg, l.name);
    }
    probe.delete();
    assertEquals(2 + LAYOUTS.length, listener.results.size());
  }

  @Test
  void resultsAndErrorsArriveAsOwnedValues() throws Throwable {
    scan(() -> session.processNv21(nv21(), W, H, 0));
    scan(() -> session.processNv21(nv21(), W, H, 0));
    transport.requests.clear();
    session.pause();
    session.start();
    session.processNv21(nv21(), W, H, 0);
    transport.answer(503, "busy");
    session.close();
    SearchResults r = listener.results.get(0);  // read after the session and its engine are gone
    assertEquals("q-1", r.queryId());
    assertTrue(r.isFinal());
    assertEquals(Arrays.asList("q-0"), r.accumulatedQueries());
    assertEquals(2, r.results().size());
    SearchResult shoe = r.results().get(0);
    assertEquals(ContentType.PIDN, shoe.contentType());
    assertEquals("shoe", shoe.content());
    assertEquals("{\"brand\":\"x\"}", shoe.properties());
    assertEquals("lace", shoe.subResults().get(0).content());
    assertEquals(ContentType.BOUNDING_BOX, r.results().get(1).contentType());
    assertArrayEquals(new float[] {10, 20, 110, 20, 110, 90, 10, 90}, r.results().get(1).location());
    assertEquals(Arrays.asList(503), listener.errors);
  }

  @Test
  void lifecycle() {
    assertFalse(session.isRunning());
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
      {IllegalArgumentException.class, "NV21 frame holds 10 bytes", (Executable) () -> session.processNv21(ByteBuffer.allocateDirect(10), W, H, 0)},
      {NullPointerException.class, "NV21 frame is null", (Executable) () -> session.processNv21((byte[]) null, W, H, 0)},
    };
    for (Object[] c : cases) {
      @SuppressWarnings("unchecked")
      Throwable e = assertThrows((Class<Throwable>) c[0], (Executable) c[2], (String) c[1]);
      assertTrue(e.getMessage().contains((String) c[1]), e.getMessage());
    }
    assertTrue(scan(() -> session.processNv21(nv21(), W, H, 0)).length > 0, "the session still works");
  }

  Executable yuv(ByteBuffer yb, int yStride, ByteBuffer ub, ByteBuffer vb, int uvStride, int ps, int width) {
    return () -> session.processYuv420(width, H, yb, yStride, ub, vb, uvStride, ps, 0);
  }
}
