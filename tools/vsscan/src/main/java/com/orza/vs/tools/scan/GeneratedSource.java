package com.orza.vs.tools.scan;

import java.awt.BasicStroke;
import java.awt.Color;
import java.awt.GradientPaint;
import java.awt.Graphics2D;
import java.awt.Rectangle;
import java.awt.RenderingHints;
import java.awt.image.BufferedImage;
import java.util.Random;

/**
 * A built-in scene, so that the tool runs with nothing to download: a printed, strongly
 * textured card (checkerboard, bars and lettering) moving along an ellipse over a smooth
 * background with one soft table edge. The card's position in each frame is known
 * ({@link #objectRect}), which lets tests check the boxes that come back.
 */
public final class GeneratedSource implements FrameSource {
  private final int width;
  private final int height;
  private final int frames;
  private final double fps;
  private final BufferedImage card;
  private final BufferedImage background;
  private int next;

  public GeneratedSource(int width, int height, int frames, double fps) {
    if (width < 64 || height < 64 || (width & 1) != 0 || (height & 1) != 0) {
      throw new IllegalArgumentException("generated frames must be even and at least 64x64, not " + width + "x" + height);
    }
    this.width = width;
    this.height = height;
    this.frames = frames;
    this.fps = fps;
    Rectangle r = objectRect(0, width, height, frames);
    this.card = drawCard(r.width, r.height);
    this.background = drawBackground(width, height);
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
    return String.format("built-in scene: textured card moving over a smooth background, %dx%d, %d frames", width, height, frames);
  }

  /** Where the card lies in frame {@code i} (pixels). */
  public static Rectangle objectRect(int i, int width, int height, int frames) {
    int cw = Math.max(16, width * 11 / 40); // 176 x 128 at 640x480
    int ch = Math.max(16, height * 4 / 15);
    double t = 2 * Math.PI * i / Math.max(1, frames);
    double cx = width / 2.0 + (width / 2.0 - cw / 2.0 - width / 16.0) * Math.cos(t);
    double cy = height / 2.0 + (height / 2.0 - ch / 2.0 - height / 12.0) * Math.sin(t);
    return new Rectangle((int) Math.round(cx - cw / 2.0), (int) Math.round(cy - ch / 2.0), cw, ch);
  }

  public Rectangle objectRect(int i) {
    return objectRect(i, width, height, frames);
  }

  @Override
  public Frame next() {
    if (next >= frames) return null;
    int i = next++;
    BufferedImage img = new BufferedImage(width, height, BufferedImage.TYPE_INT_RGB);
    Graphics2D g = img.createGraphics();
    g.drawImage(background, 0, 0, null);
    Rectangle r = objectRect(i);
    // A soft shadow, then the card.
    g.setColor(new Color(0, 0, 0, 40));
    g.fillRect(r.x + 4, r.y + 5, r.width, r.height);
    g.drawImage(card, r.x, r.y, null);
    g.dispose();
    return Yuv.toNv21(img, i);
  }

  private static BufferedImage drawBackground(int w, int h) {
    BufferedImage img = new BufferedImage(w, h, BufferedImage.TYPE_INT_RGB);
    Graphics2D g = img.createGraphics();
    g.setRenderingHint(RenderingHints.KEY_ANTIALIASING, RenderingHints.VALUE_ANTIALIAS_ON);
    g.setPaint(new GradientPaint(0, 0, new Color(196, 206, 222), w, h * 0.8f, new Color(226, 214, 196)));
    g.fillRect(0, 0, w, h);
    // The table: a darker band below a soft edge.
    int edge = h * 5 / 6;
    g.setPaint(new GradientPaint(0, edge, new Color(170, 150, 128), 0, h, new Color(150, 128, 108)));
    g.fillRect(0, edge, w, h - edge);
    g.dispose();
    return img;
  }

  private static BufferedImage drawCard(int w, int h) {
    BufferedImage img = new BufferedImage(w, h, BufferedImage.TYPE_INT_RGB);
    Graphics2D g = img.createGraphics();
    g.setRenderingHint(RenderingHints.KEY_ANTIALIASING, RenderingHints.VALUE_ANTIALIAS_ON);
    g.setColor(new Color(248, 246, 236));
    g.fillRect(0, 0, w, h);
    // Checkerboard band across the top, lettering in the middle, bars like a barcode below.
    int sq = Math.max(4, w / 22);
    int checkerBottom = (h * 3 / 8) / sq * sq;
    for (int y = 0; y < checkerBottom; y += sq) {
      for (int x = 0; x < w; x += sq) {
        boolean dark = ((x / sq) + (y / sq)) % 2 == 0;
        g.setColor(dark ? new Color(30, 40, 90) : new Color(235, 180, 40));
        g.fillRect(x, y, sq, sq);
      }
    }
    // Lettering in the built-in pixel font, capitals about a sixth of the card's height tall.
    int textSize = Math.max(8, h / 5);
    int textScale = Math.max(1, Math.round(textSize * 0.72f / BitmapFont.ASCENT));
    int textBase = checkerBottom + textSize;
    BitmapFont.draw(img, "ORZA", sq, textBase - BitmapFont.ASCENT * textScale, textScale, 0xBE1E28);
    Random rnd = new Random(7);
    int x = sq / 2;
    int top = textBase + sq / 2;
    while (x < w - sq / 2) {
      int bw = 1 + rnd.nextInt(Math.max(2, sq / 2));
      g.setColor(new Color(20, 20, 20));
      g.fillRect(x, top, bw, Math.max(1, h - top - sq / 2));
      x += bw + 1 + rnd.nextInt(Math.max(2, sq / 2));
    }
    g.setStroke(new BasicStroke(2f));
    g.setColor(new Color(30, 30, 30));
    g.drawRect(1, 1, w - 3, h - 3);
    g.dispose();
    return img;
  }
}
