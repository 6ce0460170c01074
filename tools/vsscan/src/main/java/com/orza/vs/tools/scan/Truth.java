package com.orza.vs.tools.scan;

import com.orza.vs.tools.server.Json;
import java.awt.geom.Area;
import java.awt.geom.Path2D;
import java.awt.geom.PathIterator;
import java.io.File;
import java.io.IOException;
import java.nio.charset.StandardCharsets;
import java.nio.file.Files;
import java.util.LinkedHashMap;
import java.util.List;
import java.util.Map;

/** What a frame really shows: a product id (null for none) and its corners tl, tr, br, bl. */
public final class Truth {
  public final String product;
  /** x,y of top-left, top-right, bottom-right, bottom-left in frame pixels, or null. */
  public final double[] corners;

  public Truth(String product, double[] corners) {
    this.product = product;
    this.corners = corners;
  }

  /**
   * A folder's truth.json: an object mapping image file names to {@code {"product": ID,
   * "corners": [tlx, tly, trx, try, brx, bry, blx, bly]}} ("product" null or absent: no product;
   * "corners" optional). Returns null when the folder has no truth.json.
   */
  static Map<String, Truth> load(File dir) throws IOException {
    File f = new File(dir, "truth.json");
    if (!f.isFile()) return null;
    Object doc;
    try {
      doc = Json.parse(new String(Files.readAllBytes(f.toPath()), StandardCharsets.UTF_8));
    } catch (IllegalArgumentException e) {
      throw new IOException(f + ": " + e.getMessage());
    }
    if (!(doc instanceof Map)) throw new IOException(f + ": expected an object mapping file names to products");
    Map<String, Truth> out = new LinkedHashMap<>();
    for (Map.Entry<?, ?> e : ((Map<?, ?>) doc).entrySet()) {
      Object product = Json.member(e.getValue(), "product");
      Object corners = Json.member(e.getValue(), "corners");
      if (product != null && !(product instanceof String)) throw new IOException(f + ": \"product\" of " + e.getKey() + " is not a string");
      double[] c = null;
      if (corners != null) {
        if (!(corners instanceof List) || ((List<?>) corners).size() != 8) {
          throw new IOException(f + ": \"corners\" of " + e.getKey() + " must be 8 numbers");
        }
        c = new double[8];
        for (int i = 0; i < 8; i++) {
          Object v = ((List<?>) corners).get(i);
          if (!(v instanceof Number)) throw new IOException(f + ": \"corners\" of " + e.getKey() + " must be 8 numbers");
          c[i] = ((Number) v).doubleValue();
        }
      }
      out.put(String.valueOf(e.getKey()), new Truth((String) product, c));
    }
    return out;
  }

  /** Intersection over union of two quadrilaterals given as 8 coordinates; 0 when either is missing. */
  public static double iou(double[] a, double[] b) {
    if (a == null || b == null) return 0;
    Area inter = new Area(quad(a));
    inter.intersect(new Area(quad(b)));
    double i = area(inter);
    double u = area(new Area(quad(a))) + area(new Area(quad(b))) - i;
    return u <= 0 ? 0 : i / u;
  }

  private static Path2D quad(double[] c) {
    Path2D.Double p = new Path2D.Double();
    p.moveTo(c[0], c[1]);
    for (int i = 2; i < 8; i += 2) p.lineTo(c[i], c[i + 1]);
    p.closePath();
    return p;
  }

  /** Area enclosed by a shape's (straight-edged) outline, by the shoelace formula per sub-path. */
  static double area(Area shape) {
    double total = 0, sub = 0, x0 = 0, y0 = 0, px = 0, py = 0;
    double[] c = new double[6];
    for (PathIterator it = shape.getPathIterator(null); !it.isDone(); it.next()) {
      switch (it.currentSegment(c)) {
        case PathIterator.SEG_MOVETO:
          x0 = px = c[0];
          y0 = py = c[1];
          sub = 0;
          break;
        case PathIterator.SEG_LINETO:
          sub += px * c[1] - c[0] * py;
          px = c[0];
          py = c[1];
          break;
        case PathIterator.SEG_CLOSE:
          sub += px * y0 - x0 * py;
          total += Math.abs(sub) / 2;
          sub = 0;
          break;
        default:
          break;
      }
    }
    return total;
  }
}
