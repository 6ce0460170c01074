package com.orza.vs.tools.server;

import java.awt.Graphics2D;
import java.awt.RenderingHints;
import java.awt.geom.AffineTransform;
import java.awt.image.BufferedImage;
import java.io.ByteArrayOutputStream;
import java.io.IOException;
import java.io.PrintStream;
import java.util.ArrayList;
import java.util.List;
import java.util.Locale;
import javax.imageio.ImageIO;

/**
 * {@code vsserver --bench}: indexes a 200-product catalogue (the given or built-in products plus
 * distractors) and times queries of 640x480 JPEG frames the way the server handles them
 * (decode, then search): views of each product, turned and scaled over a background, and
 * frames of background alone. Prints the figures; never fails on them.
 */
final class RecognitionBench {
  static final int PRODUCTS = 200;
  static final int VIEWS = 8;

  private RecognitionBench() {}

  static void run(Catalog given, PrintStream out) throws IOException {
    Catalog base = given != null ? given : BuiltInCatalog.load();
    Catalog catalog = BuiltInCatalog.withDistractors(base, PRODUCTS);
    long t0 = System.nanoTime();
    Recognizer r = new Recognizer(catalog);
    out.printf(Locale.ROOT, "bench: indexed %d of %d products in %.0f ms (%s)%n", r.indexedProducts(),
        catalog.products.size(), (System.nanoTime() - t0) / 1e6, catalog.origin);

    BufferedImage background = BuiltInCatalog.background();
    List<byte[]> frames = new ArrayList<>();
    List<String> truth = new ArrayList<>();
    for (Catalog.Product p : base.products) {
      for (int v = 0; v < VIEWS; v++) {
        frames.add(jpeg(view(p.image, background, v)));
        truth.add(p.id);
      }
    }
    for (int v = 0; v < VIEWS; v++) {
      frames.add(jpeg(view(null, background, v)));
      truth.add(null);
    }
    // One untimed pass compiles the code paths; the second is measured.
    for (byte[] f : frames) r.find(ReferenceServer.decode(f));
    com.sun.management.OperatingSystemMXBean os =
        (com.sun.management.OperatingSystemMXBean) java.lang.management.ManagementFactory.getOperatingSystemMXBean();
    List<Double> ms = new ArrayList<>();
    List<Double> cpu = new ArrayList<>();
    int right = 0, wrong = 0, rejected = 0;
    for (int i = 0; i < frames.size(); i++) {
      long s = System.nanoTime();
      long c = os.getProcessCpuTime();
      Recognizer.Match m = r.find(ReferenceServer.decode(frames.get(i)));
      ms.add((System.nanoTime() - s) / 1e6);
      cpu.add((os.getProcessCpuTime() - c) / 1e6);
      String id = m == null ? null : m.product.id;
      if (id == null) rejected++;
      else if (id.equals(truth.get(i))) right++;
      else wrong++;
    }
    out.printf(Locale.ROOT, "bench: %d queries of 640x480, decode + search: %s wall clock; %s processor time (all threads)%n",
        ms.size(), figures(ms), figures(cpu));
    out.printf(Locale.ROOT, "bench: %d named the right product, %d a wrong one, %d none (%d of the queries show no product)%n",
        right, wrong, rejected, VIEWS);
  }

  static String figures(List<Double> v) {
    v.sort(null);
    return String.format(Locale.ROOT, "median %.1f ms, p90 %.1f ms, max %.1f ms", v.get(v.size() / 2),
        v.get((int) Math.ceil(v.size() * 0.9) - 1), v.get(v.size() - 1));
  }

  /** A 640x480 frame: the background, and the product turned and scaled in the middle. */
  static BufferedImage view(BufferedImage product, BufferedImage background, int v) {
    BufferedImage f = new BufferedImage(640, 480, BufferedImage.TYPE_INT_RGB);
    Graphics2D g = f.createGraphics();
    g.setRenderingHint(RenderingHints.KEY_INTERPOLATION, RenderingHints.VALUE_INTERPOLATION_BILINEAR);
    g.drawImage(background, 0, 0, 640, 480, null);
    if (product != null) {
      double scale = (0.45 + 0.1 * v) * 480 / Math.max(product.getWidth(), product.getHeight());
      AffineTransform t = new AffineTransform();
      t.translate(320 + 20 * (v - 1.5), 240 - 10 * (v - 1.5));
      t.rotate(Math.toRadians(-20 + 13 * v));
      t.scale(scale, scale);
      t.translate(-product.getWidth() / 2.0, -product.getHeight() / 2.0);
      g.drawImage(product, t, null);
    }
    g.dispose();
    return f;
  }

  static byte[] jpeg(BufferedImage img) throws IOException {
    ByteArrayOutputStream out = new ByteArrayOutputStream();
    ImageIO.write(img, "jpg", out);
    return out.toByteArray();
  }
}
