package com.orza.vs.mobile.library.impl.jni;

/**
 * Pixel layout of an {@link ImageBuffer}.
 */
public enum ImageFormat {
  /** Planar 4:2:0: Y plane, then U, then V. */
  I420(0),
  /** Semi-planar 4:2:0: Y plane, then interleaved V,U pairs (Android camera default). */
  NV21(1),
  /** Semi-planar 4:2:0: Y plane, then interleaved U,V pairs. */
  NV12(2),
  /** Packed R,G,B. */
  RGB(3),
  /** Packed B,G,R (numChannels 3). */
  BGR(4),
  /** Packed B,G,R,A (numChannels 4). */
  BGRA(5),
  /** Packed B,G,R,pad (numChannels 4). */
  BGRX(6),
  /** One luminance byte a pixel. */
  GRAY(7);

  private final int swigValue;

  ImageFormat(int swigValue) {
    this.swigValue = swigValue;
  }

  /** The native integer of this constant. */
  public final int swigValue() {
    return swigValue;
  }

  /** The constant for a native integer; IllegalArgumentException for a value without one. */
  public static ImageFormat swigToEnum(int swigValue) {
    ImageFormat e = fromNative(swigValue);
    if (e == null) {
      throw new IllegalArgumentException("No enum " + ImageFormat.class + " with value " + swigValue);
    }
    return e;
  }

  /**
   * The constant for a native integer, or null for a value without one. Callbacks from the
   * engine use this form: a value unknown to this class reaches the delegate as null rather
   * than as an exception thrown inside the callback.
   */
  public static ImageFormat fromNative(int swigValue) {
    ImageFormat[] values = VALUES;
    if (swigValue >= 0 && swigValue < values.length && values[swigValue] != null
        && values[swigValue].swigValue == swigValue) {
      return values[swigValue];
    }
    for (ImageFormat e : values) {
      if (e != null && e.swigValue == swigValue) {
        return e;
      }
    }
    return null;
  }

  private static final ImageFormat[] VALUES = values();
}
