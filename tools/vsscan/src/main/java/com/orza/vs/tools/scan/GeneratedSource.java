package com.orza.vs.tools.scan;

import com.orza.vs.tools.server.BuiltInCatalog;
import com.orza.vs.tools.server.Catalog;
import com.orza.vs.tools.server.Recognizer;
import java.awt.image.BufferedImage;
import java.io.IOException;
import java.util.ArrayDeque;
import java.util.List;
import java.util.Random;
import java.util.concurrent.ExecutionException;
import java.util.concurrent.ExecutorService;
import java.util.concurrent.Executors;
import java.util.concurrent.Future;

/**
 * The built-in scene: the built-in catalogue's products (photographs) held in turn in front of
 * a hand-held camera over a table. Each product gets an equal share of the frames; within it
 * the camera pans slowly, looks at the product at a changing slant (a true perspective view),
 * shakes a little, and its motion blur comes and goes from frame to frame, with sensor noise
 * and a slowly drifting exposure. Now and then the camera catches a lamp: veiling glare washes
 * the frame out for a fraction of a second, fading in over two frames to a few frames of plain
 * white and out again. Every frame carries its truth: the product and its corners (the product
 * is still there when glare hides it).
 *
 * <p>Everything is drawn from a fixed seed, so a scene of a given size and length is the same
 * on every run.
 */
public final class GeneratedSource implements FrameSource {
  private final int width;
  private final int height;
  private final int frames;
  private final double fps;
  private final List<Catalog.Product> products;
  private final BufferedImage table;
  /** Per-frame blur length in pixels and direction, drawn once. */
  private final double[] blur;
  private final double[] blurAngle;
  /** Per-frame glare: a light level added to every pixel (0 = none, 300 = washed out to white). */
  private final double[] glare;
  private int next;
  /** Frames being drawn ahead of {@link #next}, in order. */
  private static final int AHEAD = 4;
  private final ArrayDeque<Future<Frame>> ahead = new ArrayDeque<>();
  private final ExecutorService drawer = Executors.newSingleThreadExecutor(r -> {
    Thread t = new Thread(r, "vsscan-scene");
    t.setDaemon(true);
    return t;
  });
  /** Sensor noise: normally distributed values of standard deviation 3, drawn once. */
  private static final double[] NOISE = new double[65521];

  static {
    Random r = new Random(3);
    for (int i = 0; i < NOISE.length; i++) NOISE[i] = 3.0 * r.nextGaussian();
  }

  public GeneratedSource(int width, int height, int frames, double fps) throws IOException {
    if (width < 64 || height < 64 || (width & 1) != 0 || (height & 1) != 0) {
      throw new IllegalArgumentException("generated frames must be even and at least 64x64, not " + width + "x" + height);
    }
    this.width = width;
    this.height = height;
    this.frames = frames;
    this.fps = fps;
    this.products = BuiltInCatalog.load().products;
    this.table = BuiltInCatalog.background();
    Random rnd = new Random(20260514L);
    blur = new double[frames];
    blurAngle = new double[frames];
    double angle = rnd.nextDouble() * Math.PI;
    for (int i = 0; i < frames; i++) {
      // Mostly a steady hand (1-3 px of blur), with jerks that smear the frame over many pixels.
      double u = rnd.nextDouble();
      blur[i] = u < 0.25 ? 6 + 10 * rnd.nextDouble() : 1 + 2.5 * rnd.nextDouble();
      angle += 0.5 * (rnd.nextDouble() - 0.5);
      blurAngle[i] = angle;
    }
    // Glare episodes of 5 to 9 frames, about one every 2.5 s: two frames fading in, plain white,
    // two frames fading out.
    glare = new double[frames];
    Random lamp = new Random(31L);
    for (int i = 0; i < frames; i++) {
      if (lamp.nextDouble() >= 1 / (2.5 * fps)) continue;
      int len = 5 + lamp.nextInt(5);
      for (int j = 0; j < len && i + j < frames; j++) {
        int edge = Math.min(j, len - 1 - j);
        glare[i + j] = edge == 0 ? 60 : edge == 1 ? 130 : 300;
      }
      i += len;
    }
  }

  @Override
  public double fps() {
    return fps;
  }

  @Override
  public int expectedFrames() {
    return frames;
  }

  @Override
  public String describe() {
    return String.format("built-in scene: %d products in turn, hand-held over a table, %dx%d, %d frames",
        products.size(), width, height, frames);
  }

  /** The product shown in frame {@code i}. */
  public Catalog.Product productAt(int i) {
    return products.get(Math.min(products.size() - 1, i * products.size() / frames));
  }

  /**
   * Where the camera sees the product in frame {@code i}: the homography (row-major 3x3) from
   * the product image's pixels to the frame's.
   */
  double[] homography(int i) {
    Catalog.Product p = productAt(i);
    int segment = Math.min(products.size() - 1, i * products.size() / frames);
    int first = (int) Math.ceil((double) segment * frames / products.size());
    int last = (int) Math.ceil((double) (segment + 1) * frames / products.size()) - 1;
    double s = last > first ? (double) (i - first) / (last - first) : 0.5; // 0..1 through the segment
    double t = i / fps;
    Random seg = new Random(1000 + segment);
    double sign = seg.nextBoolean() ? 1 : -1;
    // Slow pan across the table, slant that turns through the segment, a little hand shake.
    double panX = sign * (0.12 * width) * (s - 0.5);
    double panY = 0.05 * height * Math.sin(Math.PI * s + segment);
    double yaw = Math.toRadians(sign * (-22 + 44 * s));
    double pitch = Math.toRadians(15 * Math.sin(2 * Math.PI * s + segment));
    double roll = Math.toRadians(8 * Math.sin(Math.PI * s + 2 * segment) + 0.6 * Math.sin(2 * Math.PI * 3.1 * t));
    double shakeX = 2.5 * Math.sin(2 * Math.PI * 2.3 * t + segment) + 1.5 * Math.sin(2 * Math.PI * 5.7 * t);
    double shakeY = 2.5 * Math.sin(2 * Math.PI * 1.9 * t + 2 * segment) + 1.5 * Math.sin(2 * Math.PI * 6.3 * t);

    // The product as a flat card of its image's shape, 0.62 of the frame's height at its largest
    // side, seen by a pinhole camera whose focal length equals the frame width.
    double f = width;
    double side = 0.62 * height * (0.9 + 0.2 * seg.nextDouble());
    double k = side / Math.max(p.image.getWidth(), p.image.getHeight());
    double hw = p.image.getWidth() * k / 2, hh = p.image.getHeight() * k / 2;
    double depth = f; // the card's centre lies at distance f: there 1 unit is 1 pixel
    double[] src = {0, 0, p.image.getWidth(), 0, p.image.getWidth(), p.image.getHeight(), 0, p.image.getHeight()};
    double[] dst = new double[8];
    double[][] local = {{-hw, -hh}, {hw, -hh}, {hw, hh}, {-hw, hh}};
    double cy = Math.cos(yaw), sy = Math.sin(yaw), cp = Math.cos(pitch), sp = Math.sin(pitch);
    double cr = Math.cos(roll), sr = Math.sin(roll);
    for (int c = 0; c < 4; c++) {
      double x = local[c][0] * cr - local[c][1] * sr, y = local[c][0] * sr + local[c][1] * cr, z = 0;
      double x1 = x * cy + z * sy, z1 = -x * sy + z * cy; // yaw about the vertical axis
      double y2 = y * cp - z1 * sp, z2 = y * sp + z1 * cp; // pitch about the horizontal axis
      double zc = depth + z2;
      dst[2 * c] = width / 2.0 + panX + shakeX + f * x1 / zc;
      dst[2 * c + 1] = height / 2.0 + panY + shakeY + f * y2 / zc;
    }
    return fit(src, dst);
  }

  /** The truth of frame {@code i}: its product and the product's corners. */
  public Truth truth(int i) {
    Catalog.Product p = productAt(i);
    int w = p.image.getWidth(), h = p.image.getHeight();
    return new Truth(p.id, Recognizer.project(homography(i), new double[] {0, 0, w, 0, w, h, 0, h}));
  }

  /**
   * The next frame. Frames are drawn a few ahead on a background thread, as a camera exposes
   * the next frame while the app handles the last one: a scan then feeds in real time.
   */
  @Override
  public Frame next() throws IOException {
    if (next >= frames) return null;
    while (ahead.size() < AHEAD && next + ahead.size() < frames) {
      int i = next + ahead.size();
      ahead.add(drawer.submit(() -> draw(i)));
    }
    next++;
    try {
      return ahead.remove().get();
    } catch (InterruptedException e) {
      Thread.currentThread().interrupt();
      throw new IOException("interrupted while drawing a frame");
    } catch (ExecutionException e) {
      throw new IOException("cannot draw a frame: " + e.getCause(), e.getCause());
    }
  }

  Frame draw(int i) {
    Frame f = Yuv.toNv21(render(i), i);
    f.truth = truth(i);
    return f;
  }

  @Override
  public void close() {
    drawer.shutdownNow();
  }

  /** Draws frame {@code i}: table and product, then motion blur, exposure, glare and noise. */
  BufferedImage render(int i) {
    Catalog.Product p = productAt(i);
    double[] inv = invert(homography(i));
    int pw = p.image.getWidth(), ph = p.image.getHeight();
    int[] prod = p.image.getRGB(0, 0, pw, ph, null, 0, pw);
    int tw = table.getWidth(), th = table.getHeight();
    int[] tab = table.getRGB(0, 0, tw, th, null, 0, tw);
    double t = i / fps;
    // The table moves with the pan, at 1.5x magnification.
    int offX = (int) Math.round(40 * t * 1.5), offY = (int) Math.round(12 * Math.sin(t) * 1.5);
    int[] sharp = new int[width * height];
    for (int y = 0; y < height; y++) {
      for (int x = 0; x < width; x++) {
        double w = inv[6] * x + inv[7] * y + inv[8];
        double u = (inv[0] * x + inv[1] * y + inv[2]) / w, v = (inv[3] * x + inv[4] * y + inv[5]) / w;
        int px;
        if (u >= 0 && v >= 0 && u < pw - 1 && v < ph - 1) {
          px = bilinear(prod, pw, u, v);
        } else {
          int tx = Math.floorMod((int) ((x + offX) / 1.5), 2 * tw), ty = Math.floorMod((int) ((y + offY) / 1.5), 2 * th);
          if (tx >= tw) tx = 2 * tw - 1 - tx; // mirrored tiles: no seams
          if (ty >= th) ty = 2 * th - 1 - ty;
          px = tab[ty * tw + tx];
        }
        sharp[y * width + x] = px;
      }
    }
    int[] out = blur(sharp, blur[i], blurAngle[i]);
    double gain = 0.85 + 0.2 * Math.sin(2 * Math.PI * t / 3.7) + 0.05 * Math.sin(2 * Math.PI * t * 1.3);
    int walk = new Random(7L * i + 1).nextInt(NOISE.length); // a fresh walk through the table each frame
    for (int k = 0; k < out.length; k++) {
      int c = out[k];
      walk = (walk + 7919) % NOISE.length;
      double n = NOISE[walk];
      double lit = n + glare[i];
      int r = clamp(((c >> 16) & 255) * gain + lit), g = clamp(((c >> 8) & 255) * gain + lit), b = clamp((c & 255) * gain + lit);
      out[k] = (r << 16) | (g << 8) | b;
    }
    BufferedImage img = new BufferedImage(width, height, BufferedImage.TYPE_INT_RGB);
    img.setRGB(0, 0, width, height, out, 0, width);
    return img;
  }

  /** Linear motion blur: the mean of the image shifted along a line of {@code length} pixels. */
  private int[] blur(int[] src, double length, double angle) {
    int taps = Math.max(1, (int) Math.round(length));
    if (taps == 1) return src.clone();
    int[] dx = new int[taps], dy = new int[taps];
    for (int k = 0; k < taps; k++) {
      double d = (k - (taps - 1) / 2.0) * length / taps;
      dx[k] = (int) Math.round(d * Math.cos(angle));
      dy[k] = (int) Math.round(d * Math.sin(angle));
    }
    int[] out = new int[src.length];
    for (int y = 0; y < height; y++) {
      for (int x = 0; x < width; x++) {
        int r = 0, g = 0, b = 0;
        for (int k = 0; k < taps; k++) {
          int sx = Math.min(width - 1, Math.max(0, x + dx[k])), sy = Math.min(height - 1, Math.max(0, y + dy[k]));
          int c = src[sy * width + sx];
          r += (c >> 16) & 255;
          g += (c >> 8) & 255;
          b += c & 255;
        }
        out[y * width + x] = ((r / taps) << 16) | ((g / taps) << 8) | (b / taps);
      }
    }
    return out;
  }

  private static int bilinear(int[] img, int w, double u, double v) {
    int x = (int) u, y = (int) v;
    double fx = u - x, fy = v - y;
    int a = img[y * w + x], b = img[y * w + x + 1], c = img[(y + 1) * w + x], d = img[(y + 1) * w + x + 1];
    int out = 0;
    for (int shift = 16; shift >= 0; shift -= 8) {
      double top = ((a >> shift) & 255) * (1 - fx) + ((b >> shift) & 255) * fx;
      double bottom = ((c >> shift) & 255) * (1 - fx) + ((d >> shift) & 255) * fx;
      out |= clamp(top * (1 - fy) + bottom * fy) << shift;
    }
    return out;
  }

  private static int clamp(double v) {
    return (int) Math.max(0, Math.min(255, Math.round(v)));
  }

  /** The homography (row-major, h[8] = 1) that maps four source points onto four others. */
  static double[] fit(double[] src, double[] dst) {
    double[][] a = new double[8][9];
    for (int c = 0; c < 4; c++) {
      double x = src[2 * c], y = src[2 * c + 1], u = dst[2 * c], v = dst[2 * c + 1];
      a[2 * c] = new double[] {x, y, 1, 0, 0, 0, -u * x, -u * y, u};
      a[2 * c + 1] = new double[] {0, 0, 0, x, y, 1, -v * x, -v * y, v};
    }
    for (int col = 0; col < 8; col++) { // Gauss-Jordan with partial pivoting
      int pivot = col;
      for (int r = col + 1; r < 8; r++) if (Math.abs(a[r][col]) > Math.abs(a[pivot][col])) pivot = r;
      double[] tmp = a[col];
      a[col] = a[pivot];
      a[pivot] = tmp;
      for (int r = 0; r < 8; r++) {
        if (r == col) continue;
        double m = a[r][col] / a[col][col];
        for (int k = col; k < 9; k++) a[r][k] -= m * a[col][k];
      }
    }
    double[] h = new double[9];
    for (int r = 0; r < 8; r++) h[r] = a[r][8] / a[r][r];
    h[8] = 1;
    return h;
  }

  static double[] invert(double[] m) {
    double a = m[0], b = m[1], c = m[2], d = m[3], e = m[4], f = m[5], g = m[6], h = m[7], i = m[8];
    double A = e * i - f * h, B = -(d * i - f * g), C = d * h - e * g;
    double det = a * A + b * B + c * C;
    return new double[] {A / det, -(b * i - c * h) / det, (b * f - c * e) / det, B / det, (a * i - c * g) / det,
        -(a * f - c * d) / det, C / det, -(a * h - b * g) / det, (a * e - b * d) / det};
  }
}
