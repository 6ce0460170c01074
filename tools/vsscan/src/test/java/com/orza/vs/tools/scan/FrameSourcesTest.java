package com.orza.vs.tools.scan;

import static org.junit.jupiter.api.Assertions.*;

import java.awt.image.BufferedImage;
import java.io.File;
import java.io.IOException;
import java.nio.charset.StandardCharsets;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.List;
import java.util.stream.IntStream;
import javax.imageio.ImageIO;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.io.TempDir;

/** Colour conversion and the frame sources. */
class FrameSourcesTest {
  @TempDir
  Path tmp;

  @Test
  void nv21LayoutAndColourRoundTrip() {
    // Blocks of 2x2 pixels of one colour each, so that 4:2:0 subsampling loses nothing.
    int[] colours = {0xff0000, 0x00ff00, 0x0000ff, 0xffffff, 0x000000, 0x808080, 0xc08040, 0x20a0e0};
    BufferedImage img = new BufferedImage(8, 4, BufferedImage.TYPE_INT_RGB);
    for (int y = 0; y < 4; y++) {
      for (int x = 0; x < 8; x++) img.setRGB(x, y, colours[(y / 2) * 4 + x / 2]);
    }
    Frame f = Yuv.toNv21(img, 3);
    assertEquals(List.of(3, Frame.NV21, 8 * 4 * 3 / 2), List.of(f.index, f.format, f.data.length));
    // Pure red: Y 76, then V (Cr) 255 before U (Cb) 85.
    assertEquals(List.of(76, 255, 85), List.of(f.data[0] & 0xff, f.data[32] & 0xff, f.data[33] & 0xff));
    BufferedImage back = Yuv.toImage(f);
    for (int i = 0; i < 8 * 4; i++) {
      int a = img.getRGB(i % 8, i / 8), b = back.getRGB(i % 8, i / 8);
      for (int shift = 0; shift <= 16; shift += 8) {
        int d = Math.abs(((a >> shift) & 0xff) - ((b >> shift) & 0xff));
        assertTrue(d <= 3, "pixel " + i % 8 + "," + i / 8 + " channel " + shift + " off by " + d);
      }
    }
  }

  @Test
  void oddImagesLoseTheirLastColumnAndRowAndBadFramesAreRefused() {
    Frame f = Yuv.toNv21(new BufferedImage(7, 5, BufferedImage.TYPE_INT_RGB), 0);
    assertEquals(List.of(6, 4), List.of(f.width, f.height));
    assertThrows(IllegalArgumentException.class, () -> Yuv.toNv21(new BufferedImage(1, 9, BufferedImage.TYPE_INT_RGB), 0));
    assertThrows(IllegalArgumentException.class, () -> new Frame(0, 4, 2, Frame.NV21, new byte[11]));
    assertThrows(IllegalArgumentException.class, () -> new Frame(0, 3, 2, Frame.NV21, new byte[9]));
  }

  /** A Y4M file in {@code dir}: the header line, then each frame after its FRAME line. */
  static File y4m(Path dir, String header, byte[]... frames) throws IOException {
    StringBuilder b = new StringBuilder(header).append('\n');
    for (byte[] f : frames) b.append("FRAME\n").append(new String(f, StandardCharsets.ISO_8859_1));
    return Files.writeString(dir.resolve("v" + System.nanoTime() + ".y4m"), b, StandardCharsets.ISO_8859_1).toFile();
  }

  private static byte[] ramp(int n, int start) {
    byte[] b = new byte[n];
    for (int i = 0; i < n; i++) b[i] = (byte) (start + i);
    return b;
  }

  @Test
  void y4mFramesArriveAsI420WithTheirRate() throws IOException {
    byte[] a = ramp(12, 0), b = ramp(12, 100);
    try (FrameSource s = FileSources.open(y4m(tmp, "YUV4MPEG2 W4 H2 F15:2 Ip A1:1 C420jpeg XYSCSS=420JPEG", a, b), null, -1, 1)) {
      assertEquals(7.5, s.fps(), 1e-9);
      Frame f0 = s.next();
      Frame f1 = s.next();
      assertNull(s.next());
      assertEquals(List.of(Frame.I420, 4, 2, 1), List.of(f0.format, f0.width, f0.height, f1.index));
      assertArrayEquals(a, f0.data);
      assertArrayEquals(b, f1.data);
    }
    // Mono video gets neutral chroma; --fps overrides the header's rate.
    try (FrameSource s = FileSources.open(y4m(tmp, "YUV4MPEG2 W4 H2 Cmono", ramp(8, 1)), null, 24, 1)) {
      Frame f = s.next();
      assertEquals(24, s.fps(), 1e-9);
      assertArrayEquals(ramp(8, 1), Arrays.copyOf(f.data, 8));
      for (int i = 8; i < 12; i++) assertEquals(128, f.data[i] & 0xff);
    }
  }

  @Test
  void badY4mInputIsReportedNotCrashed() throws IOException {
    // (A truncated frame: VsScanTest, where the scan stops there.)
    String[] badHeaders = {"NOTY4M W4 H2", "YUV4MPEG2 H2", "YUV4MPEG2 W4 H2 C444", "YUV4MPEG2 W4 H2 C420p10", "YUV4MPEG2 W4 H2 Cmono16", "YUV4MPEG2 W4 H2 It", "YUV4MPEG2 W3 H2",
        "YUV4MPEG2 Wx H2", "YUV4MPEG2 W100000 H100000"};
    for (String h : badHeaders) {
      File f = y4m(tmp, h);
      assertThrows(IOException.class, () -> FileSources.open(f, null, -1, 1), h);
    }
    File garbage = Files.write(tmp.resolve("g.y4m"), new byte[10_000]).toFile(); // no newline: header longer than allowed
    assertThrows(IOException.class, () -> FileSources.open(garbage, null, -1, 1));
  }

  @Test
  void rawStreamNeedsASizeAndIgnoresTrailingBytes() throws IOException {
    byte[] data = ramp(3 * 12 + 5, 0);
    File raw = Files.write(tmp.resolve("cam.nv21"), data).toFile();
    IOException e = assertThrows(IOException.class, () -> FileSources.open(raw, null, -1, 1));
    assertTrue(e.getMessage().contains("--size"));
    try (FrameSource s = FileSources.open(raw, new int[] {4, 2}, -1, 1)) {
      assertEquals(List.of(3, 30.0), List.of(s.expectedFrames(), s.fps()));
      for (int i = 0; i < 3; i++) {
        Frame f = s.next();
        assertEquals(Frame.NV21, f.format);
        assertArrayEquals(Arrays.copyOfRange(data, 12 * i, 12 * i + 12), f.data);
      }
      assertNull(s.next());
    }
    assertThrows(IOException.class, () -> FileSources.open(raw, new int[] {3, 2}, -1, 1));
    assertThrows(IOException.class, () -> FileSources.open(tmp.resolve("missing").toFile(), new int[] {4, 2}, -1, 1));
  }

  private void png(String name, int rgb) throws IOException {
    BufferedImage img = new BufferedImage(6, 4, BufferedImage.TYPE_INT_RGB);
    img.setRGB(0, 0, 6, 4, IntStream.generate(() -> rgb).limit(24).toArray(), 0, 6);
    ImageIO.write(img, "png", tmp.resolve(name).toFile());
  }

  @Test
  void imageFoldersGoInNameOrderAndRepeat() throws IOException {
    png("b.png", 0xffffff);
    png("a.PNG", 0x000000);
    Files.write(tmp.resolve("notes.txt"), new byte[] {1});
    try (FrameSource s = FileSources.open(tmp.toFile(), null, -1, 2)) {
      assertEquals(List.of(4, 5.0), List.of(s.expectedFrames(), s.fps()));
      for (int i = 0; i < 4; i++) {
        Frame f = s.next();
        assertEquals(List.of(i, i < 2 ? 0 : 255), List.of(f.index, f.data[0] & 0xff), "a.PNG (black) twice, then b.png");
      }
      assertNull(s.next());
    }
    Files.write(tmp.resolve("c.png"), "not a png".getBytes(StandardCharsets.UTF_8));
    try (FrameSource s = FileSources.open(tmp.toFile(), null, -1, 1)) {
      s.next();
      s.next();
      assertThrows(IOException.class, s::next);
    }
    File empty = Files.createDirectory(tmp.resolve("empty")).toFile();
    assertThrows(IOException.class, () -> FileSources.open(empty, null, -1, 1));
  }

  @Test
  void generatedSceneShowsEachProductInTurnInsideTheFrame() throws IOException {
    GeneratedSource s = new GeneratedSource(320, 240, 10, 30);
    List<String> shown = new ArrayList<>();
    for (Frame f; (f = s.next()) != null; ) {
      if (!shown.contains(f.truth.product)) shown.add(f.truth.product);
      double[] c = f.truth.corners;
      for (int k = 0; k < 8; k += 2) assertTrue(c[k] > 0 && c[k] < 320 && c[k + 1] > 0 && c[k + 1] < 240, "corner in frame " + f.index);
    }
    assertEquals(List.of("astronaut", "chelsea", "coffee", "camera", "ihc"), shown);
    assertEquals(1.0 / 7, Truth.iou(new double[] {0, 0, 4, 0, 4, 4, 0, 4}, new double[] {2, 2, 6, 2, 6, 6, 2, 6}), 1e-9);
    assertArrayEquals(new GeneratedSource(320, 240, 10, 30).next().data, new GeneratedSource(320, 240, 10, 30).next().data);
    assertThrows(IllegalArgumentException.class, () -> new GeneratedSource(63, 64, 1, 30));
  }
}
