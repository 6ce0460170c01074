package com.orza.vs.mobile.library.bench;

import com.orza.vs.mobile.library.impl.jni.EventDelegateBase;
import com.orza.vs.mobile.library.impl.jni.ExtraFrameData;
import com.orza.vs.mobile.library.impl.jni.ImageBuffer;
import com.orza.vs.mobile.library.impl.jni.ImageFormat;
import com.orza.vs.mobile.library.impl.jni.TovraStateEngineFacade;
import com.orza.vs.mobile.library.impl.jni.VectorOfPoint2f;
import java.nio.ByteBuffer;
import java.util.Arrays;
import java.util.Locale;

/**
 * Frames per second of process() driven from Java (requestImageBuffer, a direct-buffer fill,
 * process with the frame key) against the same loop in native code, on the same frames, in the
 * same process, rounds interleaved. Usage:
 *
 * <pre>
 *   JavaBench [--size 1280x720] [--frames 300] [--rounds 5]
 * </pre>
 *
 * No transport is registered, so frames chosen for a server query end at the job without being
 * encoded: the figures are those of the per-frame path (interest points, frame choice), which
 * runs entirely on the calling thread. Frames per second are computed from that thread's CPU
 * time, which a busy machine disturbs far less than wall time (also printed).
 */
public final class JavaBench {
  static native long nativeLoop(ByteBuffer[] frames, int width, int height, int count,
                                boolean countPoints, long[] pointsOut, long[] wallOut);

  static final java.lang.management.ThreadMXBean THREADS =
      java.lang.management.ManagementFactory.getThreadMXBean();

  /** Reads every frame's interest points in Java, as an app that draws them does. */
  static final class CountingDelegate extends EventDelegateBase {
    long total;

    @Override
    public void didDetectInterestPoints(VectorOfPoint2f points) {
      total += points.size();
    }
  }

  private JavaBench() {}

  static ByteBuffer[] makeFrames(int width, int height, int count) {
    ByteBuffer[] frames = new ByteBuffer[count];
    for (int f = 0; f < count; f++) {
      ByteBuffer frame = ByteBuffer.allocateDirect(width * height * 3 / 2);
      // Smooth shading with a textured patch that moves from frame to frame.
      for (int y = 0; y < height; y++) {
        for (int x = 0; x < width; x++) {
          int value = (x + y) * 255 / (width + height);
          int px = x - f * 8 - width / 4;
          int py = y - height / 4;
          if (px >= 0 && px < width / 3 && py >= 0 && py < height / 3) {
            value = ((px * 7919 + py * 104729) % 251);
          }
          frame.put(y * width + x, (byte) value);
        }
      }
      for (int i = width * height; i < frame.capacity(); i++) frame.put(i, (byte) 128);
      frames[f] = frame;
    }
    return frames;
  }

  static long javaLoop(ByteBuffer[] frames, int width, int height, int count, boolean countPoints,
                       long[] pointsOut, long[] wallOut) {
    CountingDelegate counting = new CountingDelegate();
    EventDelegateBase absorbing = new EventDelegateBase();
    TovraStateEngineFacade engine = new TovraStateEngineFacade(countPoints ? counting : absorbing);
    engine.startEngine();
    ImageBuffer image = new ImageBuffer();
    ExtraFrameData extra = new ExtraFrameData();
    String[] key = new String[1];
    double time = 100.0;

    long cpuStart = THREADS.getCurrentThreadCpuTime();
    long start = System.nanoTime();
    for (int i = 0; i < count; i++) {
      ByteBuffer frame = frames[i % frames.length];
      image.setFormat(ImageFormat.NV21);
      image.setWidth(width);
      image.setHeight(height);
      image.setWidthStep(width);
      image.setNumChannels(1);
      key[0] = null;
      engine.requestImageBuffer(image, key);
      image.fillBufferWithByteBuffer(frame, frame.capacity());
      time += 1.0 / 30.0;
      extra.setTimeStamp(time);
      engine.process(key[0], image, extra);
    }
    wallOut[0] = System.nanoTime() - start;
    long cpu = THREADS.getCurrentThreadCpuTime() - cpuStart;

    engine.stopEngine();
    engine.delete();
    image.delete();
    extra.delete();
    counting.delete();
    absorbing.delete();
    pointsOut[0] = counting.total;
    return cpu;
  }

  static double median(double[] values) {
    double[] sorted = values.clone();
    Arrays.sort(sorted);
    int n = sorted.length;
    return n % 2 == 1 ? sorted[n / 2] : (sorted[n / 2 - 1] + sorted[n / 2]) / 2;
  }

  /**
   * The options both benchmarks take: {width, height, frames a round, rounds}; prints the usage
   * of {@code name} and exits on anything else.
   */
  static int[] options(String name, String[] args) {
    int[] o = {1280, 720, 300, 5};
    for (int i = 0; i < args.length; i++) {
      if (args[i].equals("--size") && i + 1 < args.length) {
        String[] wh = args[++i].split("x");
        o[0] = Integer.parseInt(wh[0]);
        o[1] = Integer.parseInt(wh[1]);
      } else if (args[i].equals("--frames") && i + 1 < args.length) {
        o[2] = Integer.parseInt(args[++i]);
      } else if (args[i].equals("--rounds") && i + 1 < args.length) {
        o[3] = Integer.parseInt(args[++i]);
      } else {
        System.out.println("usage: " + name + " [--size WxH] [--frames N] [--rounds R]");
        System.exit(args[i].equals("--help") ? 0 : 2);
      }
    }
    return o;
  }

  public static void main(String[] args) {
    int[] o = options("JavaBench", args);
    int width = o[0];
    int height = o[1];
    int count = o[2];
    int rounds = o[3];
    System.load(System.getProperty("orzavs.javabench.native"));
    ByteBuffer[] frames = makeFrames(width, height, 8);
    long[] points = new long[1];

    long[] wall = new long[1];
    // Warm-up: the JIT, the engine's first allocations.
    javaLoop(frames, width, height, Math.min(count, 60), true, points, wall);
    nativeLoop(frames, width, height, Math.min(count, 60), true, points, wall);

    StringBuilder table = new StringBuilder();
    for (boolean countPoints : new boolean[] {false, true}) {
      double[] javaFps = new double[rounds];
      double[] nativeFps = new double[rounds];
      double[] javaWallFps = new double[rounds];
      double[] nativeWallFps = new double[rounds];
      long javaPoints = 0;
      long nativePoints = 0;
      for (int r = 0; r < rounds; r++) {
        long ns = javaLoop(frames, width, height, count, countPoints, points, wall);
        javaFps[r] = count * 1e9 / ns;
        javaWallFps[r] = count * 1e9 / wall[0];
        javaPoints = points[0];
        ns = nativeLoop(frames, width, height, count, countPoints, points, wall);
        nativeFps[r] = count * 1e9 / ns;
        nativeWallFps[r] = count * 1e9 / wall[0];
        nativePoints = points[0];
      }
      double j = median(javaFps);
      double n = median(nativeFps);
      String label = countPoints ? "reads interest points (upcall)" : "absorbs callbacks (no override)";
      table.append(String.format(Locale.ROOT, "%-32s %10.1f %10.1f %8.1f%% %11.1f %10.1f %7.1f/%.1f%n",
          label, n, j, (n / j - 1) * 100, median(nativeWallFps), median(javaWallFps),
          nativePoints / (double) count, javaPoints / (double) count));
    }
    System.out.printf(Locale.ROOT,
        "process() through Java vs native: %dx%d NV21, %d frames a round, median of %d rounds%n",
        width, height, count, rounds);
    System.out.printf(Locale.ROOT, "%-32s %10s %10s %9s %11s %10s %s%n", "delegate", "native fps",
        "java fps", "overhead", "native wall", "java wall", "points/frame");
    System.out.print(table);
    System.out.println("fps from the calling thread's CPU time; wall columns: fps by wall clock;");
    System.out.println("overhead = native fps / java fps - 1 (target: at most 10%)");
  }
}
