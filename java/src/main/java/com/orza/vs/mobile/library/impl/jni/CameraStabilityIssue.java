package com.orza.vs.mobile.library.impl.jni;

/**
 * Camera stability issues reported with frame decisions.
 */
public enum CameraStabilityIssue {
  NO_STABILITY_ISSUE(0);

  private final int swigValue;

  CameraStabilityIssue(int swigValue) {
    this.swigValue = swigValue;
  }

  /** The native integer of this constant. */
  public final int swigValue() {
    return swigValue;
  }

  /** The constant for a native integer; IllegalArgumentException for a value without one. */
  public static CameraStabilityIssue swigToEnum(int swigValue) {
    CameraStabilityIssue e = fromNative(swigValue);
    if (e == null) {
      throw new IllegalArgumentException("No enum " + CameraStabilityIssue.class + " with value " + swigValue);
    }
    return e;
  }

  /**
   * The constant for a native integer, or null for a value without one. Callbacks from the
   * engine use this form: a value unknown to this class reaches the delegate as null rather
   * than as an exception thrown inside the callback.
   */
  public static CameraStabilityIssue fromNative(int swigValue) {
    CameraStabilityIssue[] values = VALUES;
    if (swigValue >= 0 && swigValue < values.length && values[swigValue] != null
        && values[swigValue].swigValue == swigValue) {
      return values[swigValue];
    }
    for (CameraStabilityIssue e : values) {
      if (e != null && e.swigValue == swigValue) {
        return e;
      }
    }
    return null;
  }

  private static final CameraStabilityIssue[] VALUES = values();
}
