package com.orza.vs.mobile.library.impl.jni;

/** Free functions of the library. */
public class OrzaVSMobile {
  private OrzaVSMobile() {}

  /** True exactly for I420, NV21 and NV12 (the value taken as unsigned, so negatives are not). */
  public static boolean isYUVFormat(int format) {
    return OrzaVSMobileJNI.isYUVFormat(format);
  }

  public static boolean isYUVFormat(ImageFormat format) {
    return OrzaVSMobileJNI.isYUVFormat(format.swigValue());
  }
}
