package com.orza.vs.tools.scan;

import java.awt.image.BufferedImage;

/**
 * Colour conversions between RGB images and 4:2:0 frames, with the full-range (JFIF) BT.601
 * equations, the same that JPEG uses: a frame converted here and encoded as JPEG decodes to the
 * original colours.
 */
public final class Yuv {
  private Yuv() {}

  /**
   * Converts an image to NV21 (Y plane, then interleaved V,U at half resolution). Odd widths or
   * heights lose their last column or row, since 4:2:0 frames here have even sizes.
   */
  public static Frame toNv21(BufferedImage img, int index) {
    int w = img.getWidth() & ~1;
    int h = img.getHeight() & ~1;
    if (w == 0 || h == 0) throw new IllegalArgumentException("image too small: " + img.getWidth() + "x" + img.getHeight());
    int[] rgb = img.getRGB(0, 0, w, h, null, 0, w);
    byte[] out = new byte[Frame.byteCount(w, h)];
    for (int i = 0; i < w * h; i++) {
      int p = rgb[i];
      out[i] = (byte) luma((p >> 16) & 0xff, (p >> 8) & 0xff, p & 0xff);
    }
    int chroma = w * h;
    for (int y = 0; y < h; y += 2) {
      for (int x = 0; x < w; x += 2) {
        int r = 0, g = 0, b = 0;
        for (int dy = 0; dy < 2; dy++) {
          for (int dx = 0; dx < 2; dx++) {
            int p = rgb[(y + dy) * w + x + dx];
            r += (p >> 16) & 0xff;
            g += (p >> 8) & 0xff;
            b += p & 0xff;
          }
        }
        // Average of the four pixels, then the chroma equations.
        double rr = r / 4.0, gg = g / 4.0, bb = b / 4.0;
        int cb = clamp((int) Math.round(128 - 0.168736 * rr - 0.331264 * gg + 0.5 * bb));
        int cr = clamp((int) Math.round(128 + 0.5 * rr - 0.418688 * gg - 0.081312 * bb));
        int o = chroma + (y / 2) * w + x;
        out[o] = (byte) cr;
        out[o + 1] = (byte) cb;
      }
    }
    return new Frame(index, w, h, Frame.NV21, out);
  }

  static int luma(int r, int g, int b) {
    return clamp((int) Math.round(0.299 * r + 0.587 * g + 0.114 * b));
  }

  static int clamp(int v) {
    return v < 0 ? 0 : (v > 255 ? 255 : v);
  }

  /** Renders a frame back to RGB (for thumbnails and tests). */
  public static BufferedImage toImage(Frame f) {
    int w = f.width, h = f.height;
    BufferedImage img = new BufferedImage(w, h, BufferedImage.TYPE_INT_RGB);
    int ySize = w * h;
    int q = ySize / 4;
    int[] rgb = new int[w * h];
    for (int y = 0; y < h; y++) {
      for (int x = 0; x < w; x++) {
        int yy = f.data[y * w + x] & 0xff;
        int ci = (y / 2) * (w / 2) + x / 2;
        int u, v;
        if (f.format == Frame.NV21) {
          v = f.data[ySize + 2 * ci] & 0xff;
          u = f.data[ySize + 2 * ci + 1] & 0xff;
        } else {
          u = f.data[ySize + ci] & 0xff;
          v = f.data[ySize + q + ci] & 0xff;
        }
        int r = clamp((int) Math.round(yy + 1.402 * (v - 128)));
        int g = clamp((int) Math.round(yy - 0.344136 * (u - 128) - 0.714136 * (v - 128)));
        int b = clamp((int) Math.round(yy + 1.772 * (u - 128)));
        rgb[y * w + x] = (r << 16) | (g << 8) | b;
      }
    }
    img.setRGB(0, 0, w, h, rgb, 0, w);
    return img;
  }
}
