package com.orza.vs.tools.scan;

import java.awt.image.BufferedImage;
import java.io.BufferedInputStream;
import java.io.ByteArrayOutputStream;
import java.io.EOFException;
import java.io.File;
import java.io.FileInputStream;
import java.io.IOException;
import java.io.InputStream;
import java.nio.charset.StandardCharsets;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.List;
import java.util.Map;
import java.util.Locale;
import javax.imageio.ImageIO;

/** Frame sources read from files: image folders, Y4M videos and raw NV21 streams. */
public final class FileSources {
  /** Largest frame accepted from a file (pixels), so that a bad header cannot exhaust memory. */
  static final long MAX_PIXELS = 8192L * 8192L;

  private FileSources() {}

  /**
   * Opens {@code path}: a folder of PNG/JPEG images, a single image, a {@code .y4m} video, or a
   * raw NV21 stream (any other file; needs {@code size} as {width, height}).
   */
  public static FrameSource open(File path, int[] size, double fps, int repeat) throws IOException {
    if (path.isDirectory()) return new ImageFolder(imagesIn(path), fps, repeat, "images in " + path, Truth.load(path));
    if (!path.isFile()) throw new IOException("no such file or folder: " + path);
    String name = path.getName().toLowerCase(Locale.ROOT);
    if (isImageName(name)) return new ImageFolder(Arrays.asList(path), fps, repeat, "image " + path, null);
    if (name.endsWith(".y4m")) return new Y4m(path, fps);
    if (size == null) throw new IOException(path + ": a raw NV21 stream needs --size WxH");
    return new RawNv21(path, size[0], size[1], fps > 0 ? fps : 30);
  }

  static boolean isImageName(String lower) {
    return lower.endsWith(".png") || lower.endsWith(".jpg") || lower.endsWith(".jpeg");
  }

  static List<File> imagesIn(File dir) throws IOException {
    File[] all = dir.listFiles();
    List<File> out = new ArrayList<>();
    if (all != null) {
      for (File f : all) {
        if (f.isFile() && isImageName(f.getName().toLowerCase(Locale.ROOT))) out.add(f);
      }
    }
    out.sort((a, b) -> a.getName().compareTo(b.getName()));
    if (out.isEmpty()) throw new IOException("no .png or .jpg images in " + dir);
    return out;
  }

  /** Still images, each fed {@code repeat} times, in name order. */
  static final class ImageFolder implements FrameSource {
    private final List<File> files;
    private final double fps;
    private final int repeat;
    private final String description;
    /** File name -> truth, from the folder's truth.json; null without one. */
    private final Map<String, Truth> truth;
    private int fileIndex;
    private int repeatIndex;
    private int frameIndex;
    private Frame current;

    ImageFolder(List<File> files, double fps, int repeat, String description, Map<String, Truth> truth) {
      this.truth = truth;
      this.files = files;
      this.fps = fps > 0 ? fps : 5; // time stamps 0.2 s apart: the engine takes every image
      this.repeat = Math.max(1, repeat);
      this.description = description;
    }

    @Override
    public Frame next() throws IOException {
      if (fileIndex >= files.size()) return null;
      if (repeatIndex == 0) {
        File f = files.get(fileIndex);
        BufferedImage img = ImageIO.read(f);
        if (img == null) throw new IOException(f + ": not a readable PNG or JPEG image");
        if ((long) img.getWidth() * img.getHeight() > MAX_PIXELS) throw new IOException(f + ": image too large");
        current = Yuv.toNv21(img, 0);
      }
      Frame out = new Frame(frameIndex++, current.width, current.height, current.format, current.data.clone());
      out.file = files.get(fileIndex).getName();
      // A file the truth does not list shows no product.
      if (truth != null) out.truth = truth.getOrDefault(out.file, new Truth(null, null));
      if (++repeatIndex >= repeat) {
        repeatIndex = 0;
        fileIndex++;
      }
      return out;
    }

    @Override
    public double fps() {
      return fps;
    }

    @Override
    public int expectedFrames() {
      return files.size() * repeat;
    }

    @Override
    public boolean stills() {
      return true;
    }

    @Override
    public String describe() {
      return description + " (" + files.size() + " file" + (files.size() == 1 ? "" : "s")
          + (repeat > 1 ? ", each " + repeat + " times" : "") + ")";
    }
  }

  /** YUV4MPEG2 video with 4:2:0 chroma (or mono), fed as I420. */
  static final class Y4m implements FrameSource {
    private final File file;
    private final InputStream in;
    private final int width;
    private final int height;
    private final boolean mono;
    private final double fps;
    private int frameIndex;

    Y4m(File file, double fpsOverride) throws IOException {
      this.file = file;
      this.in = new BufferedInputStream(new FileInputStream(file), 1 << 20);
      try {
        String header = readLine(in, 4096);
        if (header == null || !header.startsWith("YUV4MPEG2")) throw new IOException(file + ": not a YUV4MPEG2 file");
        int w = -1, h = -1;
        double rate = 30;
        String colour = "420jpeg";
        for (String tag : header.split(" ")) {
          if (tag.length() < 2) continue;
          String v = tag.substring(1);
          switch (tag.charAt(0)) {
            case 'W': w = parseInt(v, "width"); break;
            case 'H': h = parseInt(v, "height"); break;
            case 'C': colour = v; break;
            case 'I':
              if (!v.equals("p") && !v.equals("?")) throw new IOException(file + ": interlaced video (I" + v + ") is not supported");
              break;
            case 'F': {
              String[] nd = v.split(":");
              if (nd.length == 2) {
                double num = parseInt(nd[0], "frame rate");
                double den = parseInt(nd[1], "frame rate");
                if (num > 0 && den > 0) rate = num / den;
              }
              break;
            }
            default: break;
          }
        }
        if (w <= 0 || h <= 0) throw new IOException(file + ": header lacks W and H");
        if ((w & 1) != 0 || (h & 1) != 0) throw new IOException(file + ": odd frame size " + w + "x" + h + " is not supported");
        if ((long) w * h > MAX_PIXELS) throw new IOException(file + ": frame size " + w + "x" + h + " too large");
        // 8-bit 4:2:0 (any chroma siting) or 8-bit grey; deeper samples (C420p10, Cmono16) or
        // other subsamplings would be misread, so they are refused.
        if (!colour.equals("420") && !colour.equals("420jpeg") && !colour.equals("420paldv")
            && !colour.equals("420mpeg2") && !colour.equals("mono")) {
          throw new IOException(file + ": colour space C" + colour + " is not supported (use 8-bit 4:2:0 or mono)");
        }
        this.width = w;
        this.height = h;
        this.mono = colour.equals("mono");
        this.fps = fpsOverride > 0 ? fpsOverride : rate;
      } catch (IOException | RuntimeException e) {
        in.close();
        throw e;
      }
    }

    private int parseInt(String v, String what) throws IOException {
      try {
        return Integer.parseInt(v);
      } catch (NumberFormatException e) {
        throw new IOException(file + ": bad " + what + " '" + v + "'");
      }
    }

    @Override
    public Frame next() throws IOException {
      String line = readLine(in, 4096);
      if (line == null) return null;
      if (!line.startsWith("FRAME")) throw new IOException(file + ": expected FRAME at frame " + frameIndex);
      int ySize = width * height;
      byte[] data = new byte[Frame.byteCount(width, height)];
      if (mono) {
        readFully(in, data, 0, ySize);
        Arrays.fill(data, ySize, data.length, (byte) 128);
      } else {
        readFully(in, data, 0, data.length);
      }
      return new Frame(frameIndex++, width, height, Frame.I420, data);
    }

    private void readFully(InputStream s, byte[] b, int off, int len) throws IOException {
      int done = 0;
      while (done < len) {
        int n = s.read(b, off + done, len - done);
        if (n < 0) throw new EOFException(file + ": truncated frame " + frameIndex);
        done += n;
      }
    }

    @Override
    public double fps() {
      return fps;
    }

    @Override
    public String describe() {
      return String.format(Locale.ROOT, "Y4M video %s (%dx%d%s, %.4g fps)", file, width, height, mono ? " mono" : " 4:2:0", fps);
    }

    @Override
    public void close() throws IOException {
      in.close();
    }
  }

  /** A line of at most {@code max} bytes ended by '\n', without it; null at end of input. */
  static String readLine(InputStream in, int max) throws IOException {
    ByteArrayOutputStream b = new ByteArrayOutputStream();
    int c;
    while ((c = in.read()) >= 0 && c != '\n') {
      if (b.size() >= max) throw new IOException("header line longer than " + max + " bytes");
      b.write(c);
    }
    if (c < 0 && b.size() == 0) return null;
    return new String(b.toByteArray(), StandardCharsets.US_ASCII);
  }

  /** Consecutive NV21 frames of a given size, as a camera dump gives them. */
  static final class RawNv21 implements FrameSource {
    private final File file;
    private final InputStream in;
    private final int width;
    private final int height;
    private final double fps;
    private final long frameCount;
    private int frameIndex;

    RawNv21(File file, int width, int height, double fps) throws IOException {
      if (width <= 0 || height <= 0 || (width & 1) != 0 || (height & 1) != 0) {
        throw new IOException("--size must be even and positive, not " + width + "x" + height);
      }
      if ((long) width * height > MAX_PIXELS) throw new IOException("--size " + width + "x" + height + " too large");
      this.file = file;
      this.width = width;
      this.height = height;
      this.fps = fps;
      long frameBytes = Frame.byteCount(width, height);
      this.frameCount = file.length() / frameBytes;
      if (file.length() % frameBytes != 0) {
        System.out.println("vsscan: " + file + ": " + (file.length() % frameBytes)
            + " trailing bytes do not make a whole frame; they are ignored");
      }
      this.in = new BufferedInputStream(new FileInputStream(file), 1 << 20);
    }

    @Override
    public Frame next() throws IOException {
      if (frameIndex >= frameCount) return null;
      byte[] data = new byte[Frame.byteCount(width, height)];
      int done = 0;
      while (done < data.length) {
        int n = in.read(data, done, data.length - done);
        if (n < 0) return null;
        done += n;
      }
      return new Frame(frameIndex++, width, height, Frame.NV21, data);
    }

    @Override
    public double fps() {
      return fps;
    }

    @Override
    public int expectedFrames() {
      return (int) Math.min(Integer.MAX_VALUE, frameCount);
    }

    @Override
    public String describe() {
      return String.format(Locale.ROOT, "raw NV21 stream %s (%dx%d, %d frames)", file, width, height, frameCount);
    }

    @Override
    public void close() throws IOException {
      in.close();
    }
  }
}
