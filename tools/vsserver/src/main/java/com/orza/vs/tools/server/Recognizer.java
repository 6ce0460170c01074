package com.orza.vs.tools.server;

import java.awt.image.BufferedImage;
import java.io.File;
import java.io.IOException;
import java.nio.charset.StandardCharsets;
import java.nio.file.Files;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.List;
import org.opencv.calib3d.Calib3d;
import org.opencv.core.Core;
import org.opencv.core.CvType;
import org.opencv.core.DMatch;
import org.opencv.core.KeyPoint;
import org.opencv.core.Mat;
import org.opencv.core.MatOfDMatch;
import org.opencv.core.MatOfKeyPoint;
import org.opencv.core.MatOfPoint2f;
import org.opencv.core.Point;
import org.opencv.features2d.FlannBasedMatcher;
import org.opencv.features2d.ORB;

/**
 * Finds catalogue products in a camera frame: ORB features, nearest neighbours in one LSH index
 * over the whole catalogue's descriptors with a ratio test, then for the products with enough
 * matches a RANSAC homography from the product's image into the frame. A product counts as seen
 * only when enough matches agree with the homography and the product's outline, projected into
 * the frame, is a plausible view of a flat rectangle (convex, of sensible size, not mirrored).
 *
 * <p>The index is built once; {@link #find} is serialised (OpenCV's matcher objects are not
 * shared between threads).
 *
 * <p>Where OpenCV's Java library does not exist for the JVM (Debian ships it for some
 * architectures only, and a 32-bit ARM JVM under emulation is one without it), the search can
 * run in another process: with the system property {@code orzavs.recognizer}, or else the
 * environment variable {@code ORZAVS_RECOGNIZER}, naming a reference server's
 * {@code /recognize} address, each frame's luminance goes there and the product comes back
 * ({@link RemoteRecognizer}). The answer is the one this class would give locally, since the
 * search starts from that same luminance.
 */
public final class Recognizer {
  /** Longest side of a product image as it is indexed, and of a query frame as it is searched. */
  static final int PRODUCT_SIDE = 480;
  static final int QUERY_SIDE = 800;
  static final int PRODUCT_FEATURES = 400;
  static final int FAST_THRESHOLD = 12;
  static final int QUERY_FEATURES = 700;
  /** Lowe's ratio: the best match must be clearly closer than the second. */
  static final double RATIO = 0.8;
  static final int MIN_MATCHES = 12;
  static final int MIN_INLIERS = 15;
  static final double MIN_INLIER_SHARE = 0.3;
  static final double RANSAC_PIXELS = 5.0;
  /** Products tried with a homography per query, the best-matched first. */
  static final int CANDIDATES = 4;

  /** A product seen in a frame. */
  public static final class Match {
    public final Catalog.Product product;
    /** The product's corners in the frame: top-left, top-right, bottom-right, bottom-left as x,y. */
    public final double[] corners;
    public final int inliers;
    public final int matches;

    Match(Catalog.Product product, double[] corners, int inliers, int matches) {
      this.product = product;
      this.corners = corners;
      this.inliers = inliers;
      this.matches = matches;
    }
  }

  private static boolean loaded;

  /**
   * Loads OpenCV's Java library: the file named by the system property
   * {@code orzavs.opencv.library} (the launchers set it), else the library path's
   * {@code opencv_java460}. Throws UnsatisfiedLinkError with a hint when neither is there.
   */
  public static synchronized void loadOpenCv() {
    if (loaded) return;
    String path = System.getProperty("orzavs.opencv.library");
    try {
      if (path != null && !path.isEmpty()) System.load(path);
      else System.loadLibrary(Core.NATIVE_LIBRARY_NAME);
    } catch (UnsatisfiedLinkError e) {
      UnsatisfiedLinkError hint = new UnsatisfiedLinkError("cannot load OpenCV's Java library ("
          + e.getMessage() + "); install libopencv406-jni (scripts/install-deps.sh), or search through a reference "
          + "server elsewhere: ORZAVS_RECOGNIZER=http://HOST:PORT/recognize");
      hint.initCause(e);
      throw hint;
    }
    loaded = true;
  }

  /** The indexed form of one product. */
  private static final class Indexed {
    final Catalog.Product product;
    /** Keypoint positions in the product image's own pixels, x,y per keypoint. */
    final float[] points;
    final int firstRow;

    Indexed(Catalog.Product product, float[] points, int firstRow) {
      this.product = product;
      this.points = points;
      this.firstRow = firstRow;
    }
  }

  private final List<Indexed> indexed = new ArrayList<>();
  /** Descriptor row -> index into {@link #indexed}. */
  private final int[] owner;
  private final FlannBasedMatcher matcher;
  private final ORB queryOrb;
  private final Catalog catalog;
  /** Non-null when the search runs in another process; the fields above are then unused. */
  private final RemoteRecognizer remote;

  public Recognizer(Catalog catalog) throws IOException {
    this.catalog = catalog;
    String url = System.getProperty("orzavs.recognizer", System.getenv("ORZAVS_RECOGNIZER"));
    if (url != null && !url.isEmpty()) {
      remote = new RemoteRecognizer(url, catalog);
      owner = null;
      matcher = null;
      queryOrb = null;
      return;
    }
    remote = null;
    loadOpenCv();
    ORB orb = orb(PRODUCT_FEATURES);
    List<Mat> descriptors = new ArrayList<>();
    List<Integer> owners = new ArrayList<>();
    int rows = 0;
    for (Catalog.Product p : catalog.products) {
      double scale = Math.min(1.0, (double) PRODUCT_SIDE / Math.max(p.image.getWidth(), p.image.getHeight()));
      Mat grey = grey(luminance(p.image), p.image.getWidth(), p.image.getHeight(), scale);
      MatOfKeyPoint kp = new MatOfKeyPoint();
      Mat d = new Mat();
      orb.detectAndCompute(grey, new Mat(), kp, d);
      KeyPoint[] kps = kp.toArray();
      kp.release();
      if (kps.length < MIN_INLIERS) {
        d.release();
        continue; // too plain to be recognised; it can never match
      }
      grey.release();
      float[] pts = new float[2 * kps.length];
      for (int i = 0; i < kps.length; i++) {
        pts[2 * i] = (float) (kps[i].pt.x / scale);
        pts[2 * i + 1] = (float) (kps[i].pt.y / scale);
      }
      indexed.add(new Indexed(p, pts, rows));
      descriptors.add(d);
      for (int i = 0; i < kps.length; i++) owners.add(indexed.size() - 1);
      rows += kps.length;
    }
    if (indexed.isEmpty()) throw new IOException("no product of " + catalog.origin + " has enough texture to be recognised");
    owner = new int[rows];
    for (int i = 0; i < rows; i++) owner[i] = owners.get(i);
    Mat all = new Mat();
    Core.vconcat(descriptors, all);
    for (Mat d : descriptors) d.release();
    matcher = lshMatcher();
    matcher.add(List.of(all));
    matcher.train();
    queryOrb = orb(QUERY_FEATURES);
  }

  /** ORB with a low corner threshold, so that soft photographs still give features. */
  private static ORB orb(int features) {
    return ORB.create(features, 1.2f, 8, 31, 0, 2, ORB.HARRIS_SCORE, 31, FAST_THRESHOLD);
  }

  /** How many features the catalogue would index for this image (a plain one has too few). */
  static boolean indexable(BufferedImage img) {
    loadOpenCv();
    double scale = Math.min(1.0, (double) PRODUCT_SIDE / Math.max(img.getWidth(), img.getHeight()));
    Mat grey = grey(luminance(img), img.getWidth(), img.getHeight(), scale);
    MatOfKeyPoint kp = new MatOfKeyPoint();
    orb(PRODUCT_FEATURES).detect(grey, kp);
    grey.release();
    boolean enough = kp.rows() >= MIN_INLIERS;
    kp.release();
    return enough;
  }

  /** Products that could be indexed (those with enough texture). */
  public int indexedProducts() {
    return remote != null ? remote.indexedProducts() : indexed.size();
  }

  /** The ids of the products that could be indexed. */
  List<String> indexedIds() {
    List<String> ids = new ArrayList<>();
    for (Indexed p : indexed) ids.add(p.product.id);
    return ids;
  }

  public Catalog catalog() {
    return catalog;
  }

  /**
   * A FLANN matcher over locality-sensitive hashes of the binary descriptors. The Java binding
   * has no setter for index parameters, so they are read from a small settings file.
   */
  private static FlannBasedMatcher lshMatcher() throws IOException {
    String settings = String.join("\n",
        "%YAML:1.0",
        "---",
        "format: 3",
        "indexParams:",
        "   - { name: algorithm, type: 9, value: 6 }", // FLANN_INDEX_LSH
        "   - { name: table_number, type: 4, value: 6 }",
        "   - { name: key_size, type: 4, value: 18 }",
        "   - { name: multi_probe_level, type: 4, value: 1 }",
        "searchParams:",
        "   - { name: checks, type: 4, value: 32 }",
        "   - { name: eps, type: 5, value: 0. }",
        "   - { name: sorted, type: 8, value: 1 }",
        "");
    File f = File.createTempFile("vsserver-lsh", ".yml");
    try {
      Files.write(f.toPath(), settings.getBytes(StandardCharsets.US_ASCII));
      FlannBasedMatcher m = FlannBasedMatcher.create();
      m.read(f.getPath());
      return m;
    } finally {
      Files.deleteIfExists(f.toPath());
    }
  }

  /** The image's luminance, one byte a pixel, row after row. */
  static byte[] luminance(BufferedImage img) {
    int w = img.getWidth(), h = img.getHeight();
    int[] rgb = img.getRGB(0, 0, w, h, null, 0, w);
    byte[] y = new byte[w * h];
    for (int i = 0; i < rgb.length; i++) {
      int p = rgb[i];
      y[i] = (byte) ((77 * ((p >> 16) & 255) + 150 * ((p >> 8) & 255) + 29 * (p & 255) + 128) >> 8);
    }
    return y;
  }

  /** A w x h luminance plane as an 8-bit matrix, scaled by {@code scale} (at most 1). */
  static Mat grey(byte[] y, int w, int h, double scale) {
    Mat m = new Mat(h, w, CvType.CV_8UC1);
    m.put(0, 0, y);
    if (scale >= 1.0) return m;
    Mat small = new Mat();
    org.opencv.imgproc.Imgproc.resize(m, small, new org.opencv.core.Size(Math.max(1, Math.round(w * scale)),
        Math.max(1, Math.round(h * scale))), 0, 0, org.opencv.imgproc.Imgproc.INTER_AREA);
    m.release();
    return small;
  }

  /**
   * The product seen in {@code frame}, or null when none is verified. A frame in which nothing
   * is found is searched once more at half the size, where motion blur spans half as many
   * pixels and the corner detector finds the edges it smeared.
   */
  public Match find(BufferedImage frame) {
    byte[] y = luminance(frame);
    if (remote != null) return remote.find(y, frame.getWidth(), frame.getHeight());
    return find(y, frame.getWidth(), frame.getHeight());
  }

  /** {@link #find(BufferedImage)} for a frame given as its w x h luminance plane. */
  synchronized Match find(byte[] y, int w, int h) {
    double scale = Math.min(1.0, (double) QUERY_SIDE / Math.max(w, h));
    Match m = find(y, w, h, scale);
    return m != null ? m : find(y, w, h, scale / 2);
  }

  private Match find(byte[] y, int frameW, int frameH, double scale) {
    Mat grey = grey(y, frameW, frameH, scale);
    MatOfKeyPoint kp = new MatOfKeyPoint();
    Mat d = new Mat();
    queryOrb.detectAndCompute(grey, new Mat(), kp, d);
    grey.release();
    KeyPoint[] kps = kp.toArray();
    kp.release();
    if (kps.length < MIN_INLIERS) {
      d.release();
      return null;
    }
    List<MatOfDMatch> knn = new ArrayList<>();
    matcher.knnMatch(d, knn, 2);
    d.release();

    // Ratio-tested matches, grouped by product: [query keypoint, catalogue row] pairs.
    List<List<int[]>> byProduct = new ArrayList<>();
    for (int i = 0; i < indexed.size(); i++) byProduct.add(new ArrayList<>());
    for (MatOfDMatch m : knn) {
      DMatch[] pair = m.toArray();
      m.release();
      if (pair.length < 2 || pair[0].trainIdx < 0 || pair[0].trainIdx >= owner.length) continue;
      if (pair[0].distance >= RATIO * pair[1].distance) continue;
      byProduct.get(owner[pair[0].trainIdx]).add(new int[] {pair[0].queryIdx, pair[0].trainIdx});
    }
    Integer[] order = new Integer[indexed.size()];
    for (int i = 0; i < order.length; i++) order[i] = i;
    Arrays.sort(order, (a, b) -> byProduct.get(b).size() - byProduct.get(a).size());

    Match best = null;
    for (int c = 0; c < Math.min(CANDIDATES, order.length); c++) {
      List<int[]> pairs = byProduct.get(order[c]);
      if (pairs.size() < MIN_MATCHES) break;
      Match m = verify(indexed.get(order[c]), pairs, kps, scale, frameW, frameH);
      if (m != null && (best == null || m.inliers > best.inliers)) best = m;
    }
    return best;
  }

  /** Fits and checks the homography of one product's matches; null when it does not hold. */
  private static Match verify(Indexed p, List<int[]> pairs, KeyPoint[] kps, double scale, int frameW, int frameH) {
    Point[] src = new Point[pairs.size()];
    Point[] dst = new Point[pairs.size()];
    for (int i = 0; i < src.length; i++) {
      int row = pairs.get(i)[1] - p.firstRow;
      src[i] = new Point(p.points[2 * row], p.points[2 * row + 1]);
      KeyPoint k = kps[pairs.get(i)[0]];
      dst[i] = new Point(k.pt.x / scale, k.pt.y / scale);
    }
    MatOfPoint2f s = new MatOfPoint2f(src);
    MatOfPoint2f t = new MatOfPoint2f(dst);
    Mat mask = new Mat();
    Mat h = Calib3d.findHomography(s, t, Calib3d.RANSAC, RANSAC_PIXELS / scale, mask, 2000, 0.995);
    s.release();
    t.release();
    int inliers = mask.empty() ? 0 : Core.countNonZero(mask);
    mask.release();
    if (h.empty() || inliers < MIN_INLIERS || inliers < MIN_INLIER_SHARE * pairs.size()) {
      h.release();
      return null;
    }
    double[] m = new double[9];
    h.get(0, 0, m);
    h.release();
    int w = p.product.image.getWidth(), ph = p.product.image.getHeight();
    double[] corners = project(m, new double[] {0, 0, w, 0, w, ph, 0, ph});
    if (corners == null || !plausible(corners, frameW, frameH)) return null;
    return new Match(p.product, corners, inliers, pairs.size());
  }

  /** Applies the row-major 3x3 homography to x,y pairs; null when a point falls behind the camera. */
  public static double[] project(double[] h, double[] xy) {
    double[] out = new double[xy.length];
    for (int i = 0; i < xy.length; i += 2) {
      double w = h[6] * xy[i] + h[7] * xy[i + 1] + h[8];
      if (!(w > 1e-9)) return null;
      out[i] = (h[0] * xy[i] + h[1] * xy[i + 1] + h[2]) / w;
      out[i + 1] = (h[3] * xy[i] + h[4] * xy[i + 1] + h[5]) / w;
    }
    return out;
  }

  /**
   * Whether a projected outline (tl, tr, br, bl) can be a flat rectangle seen by a camera: a
   * convex quadrilateral turning the same way as the original (not mirrored), with sides of at
   * least 10 pixels, and neither tiny nor far larger than the frame.
   */
  static boolean plausible(double[] c, int frameW, int frameH) {
    double area = 0;
    for (int i = 0; i < 4; i++) {
      double ax = c[2 * i], ay = c[2 * i + 1];
      double bx = c[(2 * i + 2) % 8], by = c[(2 * i + 3) % 8];
      double cx = c[(2 * i + 4) % 8], cy = c[(2 * i + 5) % 8];
      double cross = (bx - ax) * (cy - by) - (by - ay) * (cx - bx);
      if (!(cross > 0)) return false; // image coordinates: y down, so clockwise turns are positive
      if (Math.hypot(bx - ax, by - ay) < 10) return false;
      area += ax * by - bx * ay;
    }
    area /= 2;
    double frameArea = (double) frameW * frameH;
    return area >= 0.002 * frameArea && area <= 4 * frameArea;
  }
}
