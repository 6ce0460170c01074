package com.orza.vs.tools.scan;

import static org.junit.jupiter.api.Assertions.*;

import java.awt.image.BufferedImage;
import java.util.Arrays;
import java.util.HashMap;
import java.util.List;
import java.util.Map;
import org.junit.jupiter.api.Test;

class BitmapFontTest {
  private static final int INK = 0x102030;

  /** The glyph pixels of {@code text} drawn at (x, top) on an empty w x h image, as '#' and '.'. */
  private static String render(String text, int w, int h, int x, int top, int scale) {
    BufferedImage img = new BufferedImage(w, h, BufferedImage.TYPE_INT_RGB);
    BitmapFont.draw(img, text, x, top, scale, INK);
    StringBuilder b = new StringBuilder();
    for (int y = 0; y < h; y++) {
      for (int px = 0; px < w; px++) {
        int rgb = img.getRGB(px, y) & 0xFFFFFF;
        if (rgb != 0 && rgb != INK) throw new AssertionError("pixel (" + px + "," + y + ") is " + Integer.toHexString(rgb));
        b.append(rgb == INK ? '#' : '.');
      }
      b.append('\n');
    }
    return b.toString();
  }

  private static long ink(String picture) {
    return picture.chars().filter(c -> c == '#').count();
  }

  @Test
  void everyPrintableCharacterHasItsOwnGlyphInsideItsCell() {
    // Drawn on its 5x9 cell alone and with a margin of 2 around it: the margin gets no ink.
    Map<String, Character> seen = new HashMap<>();
    for (char c = '!'; c <= '~'; c++) {
      String glyph = render(String.valueOf(c), BitmapFont.GLYPH_WIDTH, BitmapFont.HEIGHT, 0, 0, 1);
      String framed = render(String.valueOf(c), BitmapFont.GLYPH_WIDTH + 4, BitmapFont.HEIGHT + 4, 2, 2, 1);
      assertEquals(ink(glyph), ink(framed), "'" + c + "' spills out of its cell:\n" + framed);
      assertTrue(glyph.contains("#"), "'" + c + "' draws nothing");
      Character twin = seen.put(glyph, c);
      assertEquals(null, twin, "'" + c + "' looks the same as '" + twin + "'");
    }
    assertFalse(render(" ", 8, 12, 1, 1, 1).contains("#"), "a space draws nothing");
  }

  @Test
  void textFillsExactlyItsMeasuredBoxAndScalesByWholePixels() {
    // Starts and ends with glyphs that touch their cell's left and right columns; 'B' reaches the
    // top row and 'y' the bottom (descender) row, so the box is touched on all four sides.
    String text = "Box: (12,34) y-H";
    int scale = 3, x = 7, top = 5;
    int w = BitmapFont.width(text, scale), h = BitmapFont.height(scale);
    assertEquals((text.length() * BitmapFont.ADVANCE - 1) * scale, w);
    String big = render(text, w + 20, h + 12, x, top, scale);
    String[] rows = big.split("\n");
    int minX = Arrays.stream(rows).mapToInt(r -> r.indexOf('#')).filter(i -> i >= 0).min().getAsInt();
    int maxX = Arrays.stream(rows).mapToInt(r -> r.lastIndexOf('#')).max().getAsInt();
    int rowLength = w + 20 + 1; // with its '\n'
    int minY = big.indexOf('#') / rowLength, maxY = big.lastIndexOf('#') / rowLength;
    assertEquals(List.of(x, x + w - 1, top, top + h - 1), List.of(minX, maxX, minY, maxY));

    // Every font pixel becomes a solid scale x scale square: scale^2 times the ink of scale 1.
    String small = render(text, w / scale, h / scale, 0, 0, 1);
    assertEquals(scale * scale * ink(small), ink(big));
  }

  @Test
  void textRunningOffTheImageIsClippedNotFailed() {
    String text = "clip me: gjpqy";
    int scale = 2;
    int w = BitmapFont.width(text, scale), h = BitmapFont.height(scale);
    String[] whole = render(text, w, h, 0, 0, scale).split("\n");
    // The same text 9 pixels to the left and 5 up, on an image that cuts off its right end.
    int cw = w - 30;
    String[] cut = render(text, cw, h, -9, -5, scale).split("\n");
    for (int y = 0; y < h; y++) {
      assertEquals(y + 5 < h ? whole[y + 5].substring(9, 9 + cw) : ".".repeat(cw), cut[y], "row " + y);
    }
    // Far outside nothing is drawn and nothing throws, even where positions overflow an int: in
    // int arithmetic the second H here would wrap round to x = 3.
    assertFalse(render("HH", 20, 20, Integer.MAX_VALUE, 0, 357913942).contains("#"));
    assertFalse(render(text, 20, 20, Integer.MIN_VALUE + 3, Integer.MIN_VALUE, 1000).contains("#"));
    assertFalse(render(text, 20, 20, 0, Integer.MAX_VALUE - 1, 7).contains("#"));
  }

  @Test
  void foreignCharactersAndLongTextsStayWithinTheirSpace() {
    // One '?' per code point, so that measuring and drawing agree on the length.
    assertEquals("caf? ?? ok", BitmapFont.printable("caf\u00e9\t\ud83d\ude00\u4e2d\nok"));
    assertEquals(render("a?b", 30, 12, 1, 1, 1), render("a\u00e9b", 30, 12, 1, 1, 1));

    String terms = "SearchTerms: texture energy 106.3 in 180x120 at (160,60) of 640x480, brightness 0.76";
    int max = 300;
    String fitted = BitmapFont.fit(terms, max, 2);
    assertTrue(BitmapFont.width(fitted, 2) <= max && fitted.endsWith("..."), fitted);
    assertTrue(BitmapFont.width(BitmapFont.fit(terms, max + BitmapFont.ADVANCE * 2, 2), 2) > max, "fit uses the room it has");
    assertEquals("short", BitmapFont.fit("short", max, 2));

    List<String> lines = BitmapFont.wrap(terms, max, 2, 3);
    assertEquals(3, lines.size());
    assertEquals("SearchTerms: texture", lines.get(0), "breaks at a space");
    for (String line : lines) assertTrue(BitmapFont.width(line, 2) <= max, line);
    assertTrue(lines.get(2).endsWith("..."), "the last line says that text is missing");
    assertEquals(1, BitmapFont.wrap(terms, 10000, 2, 3).size());
    assertTrue(BitmapFont.wrap("   ", max, 2, 2).isEmpty());
  }
}
