package com.orza.vs.mobile.library.bench;

import com.orza.vs.mobile.library.impl.jni.EventDelegateBase;
import com.orza.vs.mobile.library.impl.jni.ExtraFrameData;
import com.orza.vs.mobile.library.impl.jni.ImageBuffer;
import com.orza.vs.mobile.library.impl.jni.ImageFormat;
import com.orza.vs.mobile.library.impl.jni.ObjectModuleID;
import com.orza.vs.mobile.library.impl.jni.ServerDelegate;
import com.orza.vs.mobile.library.impl.jni.ServerRequest;
import com.orza.vs.mobile.library.impl.jni.TovraStateEngineFacade;
import com.orza.vs.mobile.library.session.VisualSearchSession;
import java.nio.ByteBuffer;
import java.util.Arrays;
import java.util.Locale;

/**
 * The session's cost per frame against the low-level loop, and camera planes handed to the
 * session against packing them into NV21 in Java first. Usage:
 *
 * <pre>
 *   SessionBench [--size 1280x720] [--frames 300] [--rounds 5]
 * </pre>
 *
 * Every loop runs the same frames with the same time stamps into an engine with the same
 * transport (it takes the first query and never answers, so no frame is encoded and the
 * figures are those of the per-frame path on the calling thread). Frames per second come from
 * the calling thread's CPU time; rounds are interleaved and the median is printed.
 */
public final class SessionBench {
  /** Keeps the first query pending for ever: the engine then only runs its per-frame path. */
  static final class Silent extends ServerDelegate {
    @Override
    public boolean sendServerRequestImpl(ServerRequest request) {
      return true;
    }
  }

  /** One way of feeding `count` frames; returns the calling thread's CPU nanoseconds. */
  interface Loop {
    long run(int count);
  }

  static int width = 1280;
  static int height = 720;
  static ByteBuffer[] direct;
  static byte[][] arrays;
  static ByteBuffer[][] planar;  // I420-like: pixel stride 1, rows padded to width + 64
  static ByteBuffer[][] block;   // NV21 in one block, as views of the direct frames

  private SessionBench() {}

  static long cpu() {
    return JavaBench.THREADS.getCurrentThreadCpuTime();
  }

  static long time(int i) {
    return 100_000_000_000L + i * 33_333_333L;
  }

  static long lowLevel(int count, boolean fromArray) {
    Silent transport = new Silent();
    EventDelegateBase events = new EventDelegateBase();
    TovraStateEngineFacade engine = new TovraStateEngineFacade(events);
    engine.addObjectModule(ObjectModuleID.VISUAL_SEARCH_SERVICE_MOD, transport);
    engine.startEngine();
    ImageBuffer image = new ImageBuffer();
    ExtraFrameData extra = new ExtraFrameData();
    image.setFormat(ImageFormat.NV21);
    image.setWidth(width);
    image.setHeight(height);
    image.setWidthStep(width);
    image.setNumChannels(1);
    String[] key = new String[1];
    int size = width * height * 3 / 2;
    long start = cpu();
    for (int i = 0; i < count; i++) {
      key[0] = null;
      engine.requestImageBuffer(image, key);
      if (fromArray) {
        image.fillBuffer(arrays[i % arrays.length], size);
      } else {
        image.fillBufferWithByteBuffer(direct[i % direct.length], size);
      }
      extra.setTimeStamp(time(i) / 1e9);
      engine.process(key[0], image, extra);
    }
    long cpu = cpu() - start;
    engine.stopEngine();
    engine.delete();
    image.delete();
    extra.delete();
    events.delete();
    transport.delete();
    return cpu;
  }

  /** kind: 0 NV21 array, 1 direct NV21 buffer, 2 planar planes, 3 planar packed in Java, 4 NV21 block, 5 block packed in Java. */
  static long session(int count, int kind) {
    Silent transport = new Silent();
    VisualSearchSession session = VisualSearchSession.builder().transport(transport).build();
    session.start();
    byte[] packed = new byte[width * height * 3 / 2];
    long start = cpu();
    for (int i = 0; i < count; i++) {
      int f = i % direct.length;
      if (kind == 0) {
        session.processNv21(arrays[f], width, height, time(i));
      } else if (kind == 1) {
        session.processNv21(direct[f], width, height, time(i));
      } else {
        ByteBuffer[] p = kind <= 3 ? planar[f] : block[f];
        int stride = kind <= 3 ? width + 64 : width;
        int ps = kind <= 3 ? 1 : 2;
        if (kind == 2 || kind == 4) {
          session.processYuv420(width, height, p[0], stride, p[1], p[2], stride, ps, time(i));
        } else {
          packNv21(p[0], stride, p[1], p[2], stride, ps, packed);
          session.processNv21(packed, width, height, time(i));
        }
      }
    }
    long cpu = cpu() - start;
    session.close();
    transport.delete();
    return cpu;
  }

  /** What an app does without the session: the planes into one NV21 array, in Java. */
  static void packNv21(ByteBuffer y, int yStride, ByteBuffer u, ByteBuffer v, int uvStride, int ps, byte[] out) {
    ByteBuffer rows = y.duplicate();
    for (int r = 0; r < height; r++) {
      rows.position(r * yStride);
      rows.get(out, r * width, width);
    }
    int o = width * height;
    if (ps == 2 && uvStride == width) {
      ByteBuffer vu = v.duplicate();
      vu.position(0);
      vu.get(out, o, Math.min(vu.remaining(), width * height / 2));
      out[out.length - 1] = u.get(u.limit() - 1);
      return;
    }
    for (int r = 0; r < height / 2; r++) {
      for (int c = 0; c < width / 2; c++) {
        out[o++] = v.get(r * uvStride + c * ps);
        out[o++] = u.get(r * uvStride + c * ps);
      }
    }
  }

  static ByteBuffer view(ByteBuffer b, int at, int length) {
    ByteBuffer d = b.duplicate();
    d.position(at);
    d.limit(at + length);
    return d.slice();
  }

  static void makeFrames() {
    direct = JavaBench.makeFrames(width, height, 8);
    int n = direct.length;
    arrays = new byte[n][];
    planar = new ByteBuffer[n][];
    block = new ByteBuffer[n][];
    int luma = width * height;
    int stride = width + 64;
    for (int f = 0; f < n; f++) {
      arrays[f] = new byte[luma * 3 / 2];
      direct[f].duplicate().get(arrays[f]);
      ByteBuffer y = ByteBuffer.allocateDirect((height - 1) * stride + width);
      ByteBuffer u = ByteBuffer.allocateDirect((height / 2 - 1) * stride + width / 2);
      ByteBuffer v = ByteBuffer.allocateDirect(u.capacity());
      for (int r = 0; r < height; r++) for (int c = 0; c < width; c++) y.put(r * stride + c, arrays[f][r * width + c]);
      for (int r = 0; r < height / 2; r++) {
        for (int c = 0; c < width / 2; c++) {
          v.put(r * stride + c, arrays[f][luma + r * width + 2 * c]);
          u.put(r * stride + c, arrays[f][luma + r * width + 2 * c + 1]);
        }
      }
      planar[f] = new ByteBuffer[] {y, u, v};
      block[f] = new ByteBuffer[] {view(direct[f], 0, luma), view(direct[f], luma + 1, luma / 2 - 1),
                                   view(direct[f], luma, luma / 2 - 1)};
    }
  }

  public static void main(String[] args) {
    int[] o = JavaBench.options("SessionBench", args);
    width = o[0];
    height = o[1];
    int count = o[2];
    int rounds = o[3];
    makeFrames();
    String[] names = {
      "low-level loop, NV21 byte[]", "session, NV21 byte[]",
      "low-level loop, direct NV21", "session, direct NV21",
      "Java packs planar -> session", "session, planar planes (1 pass)",
      "Java packs NV21 block -> session", "session, NV21 block (in place)",
    };
    Loop[] loops = {
      n -> lowLevel(n, true), n -> session(n, 0),
      n -> lowLevel(n, false), n -> session(n, 1),
      n -> session(n, 3), n -> session(n, 2),
      n -> session(n, 5), n -> session(n, 4),
    };
    for (Loop loop : loops) loop.run(Math.min(count, 60));  // warm-up: JIT, first allocations
    double[][] fps = new double[loops.length][rounds];
    for (int r = 0; r < rounds; r++) {
      for (int pair = 0; pair < loops.length; pair += 2) {
        for (int k = 0; k < 2; k++) {
          int l = pair + (k + r) % 2;  // the pair's order alternates from round to round
          fps[l][r] = count * 1e9 / loops[l].run(count);
        }
      }
    }
    System.out.printf(Locale.ROOT, "session vs low-level loop: %dx%d, %d frames a round, median of %d rounds%n",
        width, height, count, rounds);
    System.out.printf(Locale.ROOT, "%-34s %10s %10s %14s%n", "loop (baseline, then compared)", "fps", "us/frame",
        "vs baseline");
    for (int l = 0; l < loops.length; l++) {
      double m = JavaBench.median(fps[l]);
      String versus = "";
      if (l % 2 == 1) {
        // Paired by round: both loops of a pair ran back to back, so a slow spell of the
        // machine weighs on both; the median of the per-round ratios is printed.
        double[] ratio = new double[rounds];
        for (int r = 0; r < rounds; r++) ratio[r] = fps[l - 1][r] / fps[l][r] - 1;
        versus = String.format(Locale.ROOT, "%+.1f%% time", JavaBench.median(ratio) * 100);
      }
      System.out.printf(Locale.ROOT, "%-34s %10.1f %10.1f %14s%n", names[l], m, 1e6 / m, versus);
    }
    System.out.println("fps: median over rounds, from the calling thread's CPU time; \"vs baseline\": extra time a");
    System.out.println("frame takes over the line above, median of the per-round ratios");
    System.out.println("(goal for the session against the low-level loop: at most +5%)");
  }
}
