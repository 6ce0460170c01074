package com.orza.vs.tools.server;

import java.awt.image.BufferedImage;
import java.util.ArrayDeque;

/**
 * Finds the region of strongest texture in a frame.
 *
 * <p>The luminance plane is divided into square cells; each cell's energy is the mean absolute
 * central-difference gradient of its pixels. The region starts at the most energetic cell and
 * grows over the 8-connected cells whose energy reaches {@link #GROW_FRACTION} of it. A frame
 * whose best cell stays below {@link #MIN_ENERGY} has no region (a blank wall, a lens cap).
 */
public final class TextureRegionFinder {
  /** Cells grow into the region when their energy is at least this fraction of the best. */
  public static final double GROW_FRACTION = 0.3;
  /** Mean gradient (grey levels per pixel) below which a frame counts as untextured. */
  public static final double MIN_ENERGY = 4.0;

  /** What one analysis measured. Coordinates are frame pixels, right/bottom exclusive. */
  public static final class Result {
    public final int frameWidth;
    public final int frameHeight;
    public final boolean found;
    public final int left;
    public final int top;
    public final int right;
    public final int bottom;
    /** Mean gradient energy inside the region (0 when none was found). */
    public final double regionEnergy;
    /** Mean gradient energy of the whole frame. */
    public final double frameEnergy;
    /** Mean luminance of the whole frame, 0..1. */
    public final double brightness;
    public final int cellSize;

    Result(int w, int h, boolean found, int left, int top, int right, int bottom, double regionEnergy,
           double frameEnergy, double brightness, int cellSize) {
      this.frameWidth = w;
      this.frameHeight = h;
      this.found = found;
      this.left = left;
      this.top = top;
      this.right = right;
      this.bottom = bottom;
      this.regionEnergy = regionEnergy;
      this.frameEnergy = frameEnergy;
      this.brightness = brightness;
      this.cellSize = cellSize;
    }

    public int width() {
      return right - left;
    }

    public int height() {
      return bottom - top;
    }
  }

  private TextureRegionFinder() {}

  /** Luminance (BT.601, 0..255) of every pixel, row by row. */
  public static int[] luminance(BufferedImage img) {
    int w = img.getWidth();
    int h = img.getHeight();
    int[] y = new int[w * h];
    // What the JPEG reader produces, read from the raster directly (getRGB converts pixel by
    // pixel through the colour model and is several times slower).
    if (img.getType() == BufferedImage.TYPE_3BYTE_BGR || img.getType() == BufferedImage.TYPE_BYTE_GRAY) {
      int bands = img.getRaster().getNumBands();
      int[] row = new int[w * bands];
      for (int r = 0; r < h; r++) {
        img.getRaster().getPixels(0, r, w, 1, row);
        int o = r * w;
        if (bands == 1) {
          System.arraycopy(row, 0, y, o, w);
        } else {
          for (int x = 0, i = 0; x < w; x++, i += 3) {
            y[o + x] = (77 * row[i] + 150 * row[i + 1] + 29 * row[i + 2] + 128) >> 8; // bands R, G, B
          }
        }
      }
      return y;
    }
    int[] rgb = img.getRGB(0, 0, w, h, null, 0, w);
    for (int i = 0; i < rgb.length; i++) {
      int p = rgb[i];
      int r = (p >> 16) & 0xff;
      int g = (p >> 8) & 0xff;
      int b = p & 0xff;
      y[i] = (77 * r + 150 * g + 29 * b + 128) >> 8;
    }
    return y;
  }

  public static Result analyse(BufferedImage img) {
    return analyse(luminance(img), img.getWidth(), img.getHeight());
  }

  /** Analyses a luminance plane of {@code w x h} pixels (row stride {@code w}). */
  public static Result analyse(int[] lum, int w, int h) {
    if (w <= 0 || h <= 0 || lum.length < (long) w * h) {
      throw new IllegalArgumentException("bad frame geometry " + w + "x" + h);
    }
    int cell = Math.max(8, Math.min(w, h) / 24);
    int cols = (w + cell - 1) / cell;
    int rows = (h + cell - 1) / cell;
    double[] sum = new double[cols * rows];
    int[] count = new int[cols * rows];
    long lumSum = 0;
    double gradSum = 0;
    for (int y = 0; y < h; y++) {
      int row = y * w;
      int up = (y > 0 ? y - 1 : y) * w;
      int down = (y < h - 1 ? y + 1 : y) * w;
      int cellRow = (y / cell) * cols;
      for (int x = 0; x < w; x++) {
        int l = lum[row + (x > 0 ? x - 1 : x)];
        int r = lum[row + (x < w - 1 ? x + 1 : x)];
        int g = Math.abs(r - l) + Math.abs(lum[down + x] - lum[up + x]);
        int c = cellRow + x / cell;
        sum[c] += g;
        count[c]++;
        gradSum += g;
        lumSum += lum[row + x];
      }
    }
    double frameEnergy = gradSum / ((double) w * h);
    double brightness = lumSum / (255.0 * w * h);

    double[] energy = new double[cols * rows];
    int best = 0;
    for (int i = 0; i < energy.length; i++) {
      energy[i] = count[i] == 0 ? 0 : sum[i] / count[i];
      if (energy[i] > energy[best]) best = i;
    }
    if (energy[best] < MIN_ENERGY) {
      return new Result(w, h, false, 0, 0, 0, 0, 0, frameEnergy, brightness, cell);
    }

    // Grow from the best cell over 8-connected cells above the threshold.
    double threshold = energy[best] * GROW_FRACTION;
    boolean[] in = new boolean[energy.length];
    ArrayDeque<Integer> queue = new ArrayDeque<>();
    in[best] = true;
    queue.add(best);
    int minC = cols, minR = rows, maxC = -1, maxR = -1;
    double regionSum = 0;
    long regionPixels = 0;
    while (!queue.isEmpty()) {
      int i = queue.poll();
      int cx = i % cols;
      int cy = i / cols;
      minC = Math.min(minC, cx);
      maxC = Math.max(maxC, cx);
      minR = Math.min(minR, cy);
      maxR = Math.max(maxR, cy);
      regionSum += sum[i];
      regionPixels += count[i];
      for (int dy = -1; dy <= 1; dy++) {
        for (int dx = -1; dx <= 1; dx++) {
          int nx = cx + dx;
          int ny = cy + dy;
          if (nx < 0 || ny < 0 || nx >= cols || ny >= rows) continue;
          int n = ny * cols + nx;
          if (!in[n] && energy[n] >= threshold) {
            in[n] = true;
            queue.add(n);
          }
        }
      }
    }
    int left = minC * cell;
    int top = minR * cell;
    int right = Math.min(w, (maxC + 1) * cell);
    int bottom = Math.min(h, (maxR + 1) * cell);
    return new Result(w, h, true, left, top, right, bottom, regionSum / Math.max(1, regionPixels),
        frameEnergy, brightness, cell);
  }
}
