package com.orza.vs.tools.scan;

/** One camera frame as the engine takes it: YUV 4:2:0 bytes, tightly packed (stride = width). */
public final class Frame {
  /** Engine format codes (ImageFormat): planar I420 and semi-planar NV21. */
  public static final int I420 = 0;
  public static final int NV21 = 1;

  public final int index;
  public final int width;
  public final int height;
  public final int format;
  public final byte[] data;
  /** What the frame shows, when the source knows it; else null. */
  public Truth truth;
  /** The image file the frame was read from, for sources that are folders; else null. */
  public String file;

  public Frame(int index, int width, int height, int format, byte[] data) {
    if (width <= 0 || height <= 0 || (width & 1) != 0 || (height & 1) != 0) {
      throw new IllegalArgumentException("frame size must be even and positive: " + width + "x" + height);
    }
    if (format != I420 && format != NV21) throw new IllegalArgumentException("format " + format);
    if (data.length != byteCount(width, height)) {
      throw new IllegalArgumentException("frame of " + width + "x" + height + " needs " + byteCount(width, height)
          + " bytes, got " + data.length);
    }
    this.index = index;
    this.width = width;
    this.height = height;
    this.format = format;
    this.data = data;
  }

  /** Bytes of a 4:2:0 frame of even size. */
  public static int byteCount(int width, int height) {
    return width * height * 3 / 2;
  }

  public String formatName() {
    return format == I420 ? "I420" : "NV21";
  }
}
