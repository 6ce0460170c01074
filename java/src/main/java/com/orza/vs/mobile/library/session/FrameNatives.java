package com.orza.vs.mobile.library.session;

import com.orza.vs.mobile.library.impl.jni.OrzaVSMobileJNI;
import java.nio.ByteBuffer;

/**
 * Native frame input of the session, bound by the library when it loads (RegisterNatives, so
 * the library's exported functions stay those of {@link OrzaVSMobileJNI}). Every argument is
 * checked natively: null planes raise NullPointerException, heap buffers, odd or non-positive
 * sizes, strides too short for a row and planes too small for the frame raise
 * IllegalArgumentException, all with a one-line message, and nothing is written then.
 */
final class FrameNatives {
  static {
    try {
      // Loading the binding's class loads the library, which binds the methods below.
      Class.forName(OrzaVSMobileJNI.class.getName(), true, FrameNatives.class.getClassLoader());
    } catch (ClassNotFoundException e) {
      throw new NoClassDefFoundError(e.getMessage());
    }
  }

  private FrameNatives() {}

  /**
   * Points {@code image} at the planes when they already form one NV21 or NV12 block (chroma
   * pixel stride 2, chroma rows right after the luminance rows, one row stride): the engine then
   * reads the camera's memory where it lies. Returns the ImageFormat value used (1 NV21, 2 NV12),
   * or -1 when the planes must be copied (the image is then left as it was).
   */
  static native int wrapPlanes(long image, ByteBuffer y, int yRowStride, ByteBuffer u, ByteBuffer v,
                               int uvRowStride, int uvPixelStride, int width, int height);

  /**
   * Writes the planes as NV21, in one pass, into the memory lent to {@code image}, which must
   * describe an NV21 frame of the same size (IllegalStateException otherwise).
   */
  static native void copyPlanes(long image, ByteBuffer y, int yRowStride, ByteBuffer u, ByteBuffer v,
                                int uvRowStride, int uvPixelStride, int width, int height);

  /** The points of a native point vector as x0, y0, x1, y1, ... (a new array). */
  static native float[] points(long vector);
}
