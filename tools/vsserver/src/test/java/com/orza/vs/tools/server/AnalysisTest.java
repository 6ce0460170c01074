package com.orza.vs.tools.server;

import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertNotEquals;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;

import java.util.Arrays;
import java.util.HashSet;
import java.util.Random;
import java.util.Set;
import org.junit.jupiter.api.Test;

/** Texture region finding and query sessions. */
class AnalysisTest {
  /** A smooth ramp with a noisy square of strong texture at (x0, y0) of the given size. */
  static int[] scene(int w, int h, int x0, int y0, int size) {
    int[] lum = new int[w * h];
    Random rnd = new Random(3);
    for (int y = 0; y < h; y++) {
      for (int x = 0; x < w; x++) {
        int v = 60 + x * 100 / w;
        if (x >= x0 && x < x0 + size && y >= y0 && y < y0 + size) v = rnd.nextBoolean() ? 20 : 230;
        lum[y * w + x] = v;
      }
    }
    return lum;
  }

  @Test
  void boxSurroundsTheTexturedSquareWithinOneCell() {
    int w = 320, h = 240;
    TextureRegionFinder.Result r = TextureRegionFinder.analyse(scene(w, h, 150, 60, 80), w, h);
    assertTrue(r.found);
    int cell = r.cellSize;
    assertTrue(Math.abs(r.left - 150) <= cell, "left " + r.left);
    assertTrue(Math.abs(r.top - 60) <= cell, "top " + r.top);
    assertTrue(Math.abs(r.right - 230) <= cell, "right " + r.right);
    assertTrue(Math.abs(r.bottom - 140) <= cell, "bottom " + r.bottom);
    assertTrue(r.regionEnergy > 10 * r.frameEnergy / 2, "region energy stands out");
    assertTrue(r.brightness > 0.2 && r.brightness < 0.8);
  }

  @Test
  void luminanceIsTheSameWhateverTheImageLayout() {
    java.awt.image.BufferedImage rgb = new java.awt.image.BufferedImage(5, 3, java.awt.image.BufferedImage.TYPE_INT_RGB);
    java.awt.image.BufferedImage bgr = new java.awt.image.BufferedImage(5, 3, java.awt.image.BufferedImage.TYPE_3BYTE_BGR);
    java.awt.image.BufferedImage gray = new java.awt.image.BufferedImage(5, 3, java.awt.image.BufferedImage.TYPE_BYTE_GRAY);
    Random rnd = new Random(5);
    for (int y = 0; y < 3; y++) {
      for (int x = 0; x < 5; x++) {
        int p = rnd.nextInt(0x1000000);
        rgb.setRGB(x, y, p);
        bgr.setRGB(x, y, p);
        gray.getRaster().setSample(x, y, 0, p & 0xff);
      }
    }
    int[] a = TextureRegionFinder.luminance(rgb);
    assertEquals(Arrays.toString(a), Arrays.toString(TextureRegionFinder.luminance(bgr)));
    int[] g = TextureRegionFinder.luminance(gray);
    for (int i = 0; i < g.length; i++) assertEquals(gray.getRaster().getSample(i % 5, i / 5, 0), g[i]);
    // Pure colours: BT.601 weights.
    rgb.setRGB(0, 0, 0xff0000);
    rgb.setRGB(1, 0, 0x00ff00);
    rgb.setRGB(2, 0, 0xffffff);
    int[] l = TextureRegionFinder.luminance(rgb);
    assertEquals(77, l[0]);
    assertEquals(149, l[1]);
    assertEquals(255, l[2]);
  }

  @Test
  void flatAndTinyFramesHaveNoRegion() {
    int[] flat = new int[64 * 48];
    Arrays.fill(flat, 128);
    TextureRegionFinder.Result r = TextureRegionFinder.analyse(flat, 64, 48);
    assertFalse(r.found);
    assertEquals(128 / 255.0, r.brightness, 1e-9);
    assertEquals(0.0, r.frameEnergy);
    // A single pixel and a single row must not fail (edges are clamped).
    assertFalse(TextureRegionFinder.analyse(new int[] {7}, 1, 1).found);
    TextureRegionFinder.Result row = TextureRegionFinder.analyse(new int[] {0, 0, 255, 255, 0, 0, 255, 255, 0, 0}, 10, 1);
    assertTrue(row.found);
    assertTrue(row.left >= 0 && row.left < row.right && row.right <= 10 && row.bottom == 1, row.left + ".." + row.right);
    assertThrows(IllegalArgumentException.class, () -> TextureRegionFinder.analyse(new int[10], 4, 4));
    assertThrows(IllegalArgumentException.class, () -> TextureRegionFinder.analyse(new int[10], 0, 4));
  }

  @Test
  void sessionsChainByLastQueryIdAndCloseAtTheLimit() {
    QuerySessions s = new QuerySessions("t", 3);
    QuerySessions.Entry a = s.next(null);
    QuerySessions.Entry b = s.next(a.queryId);
    QuerySessions.Entry c = s.next(b.queryId);
    assertEquals(Arrays.asList(a.queryId), a.accumulated);
    assertEquals(Arrays.asList(a.queryId, b.queryId, c.queryId), c.accumulated);
    assertFalse(a.isFinal);
    assertFalse(b.isFinal);
    assertTrue(c.isFinal);
    assertEquals(a.session, c.session);
    // After the final reply the chain starts over, even when the client names the final id.
    QuerySessions.Entry d = s.next(c.queryId);
    assertNotEquals(a.session, d.session);
    assertEquals(1, d.accumulated.size());
    // An unknown id or an id that is not the latest of its session opens a new session.
    QuerySessions.Entry e = s.next("q-from-elsewhere");
    assertEquals(1, e.accumulated.size());
    QuerySessions.Entry f = s.next(d.queryId);
    QuerySessions.Entry g = s.next(d.queryId);
    assertEquals(2, f.accumulated.size());
    assertEquals(1, g.accumulated.size());
  }

  @Test
  void queryIdsAreFreshAcrossThreadsAndRuns() throws Exception {
    QuerySessions s = new QuerySessions("ab", 5);
    Set<String> ids = java.util.Collections.synchronizedSet(new HashSet<>());
    Thread[] threads = new Thread[4];
    for (int t = 0; t < threads.length; t++) {
      threads[t] = new Thread(() -> {
        String last = null;
        for (int i = 0; i < 500; i++) {
          QuerySessions.Entry e = s.next(last);
          ids.add(e.queryId);
          last = e.queryId;
        }
      });
      threads[t].start();
    }
    for (Thread t : threads) t.join();
    assertEquals(2000, ids.size());
    assertFalse(ids.contains(new QuerySessions("cd", 5).next(null).queryId));
  }
}
