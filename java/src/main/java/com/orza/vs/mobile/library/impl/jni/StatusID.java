package com.orza.vs.mobile.library.impl.jni;

/**
 * Statuses reported with module events and processed frames.
 */
public enum StatusID {
  SUCCESS_STATUS(0),
  FAILURE_STATUS(1);

  private final int swigValue;

  StatusID(int swigValue) {
    this.swigValue = swigValue;
  }

  /** The native integer of this constant. */
  public final int swigValue() {
    return swigValue;
  }

  /** The constant for a native integer; IllegalArgumentException for a value without one. */
  public static StatusID swigToEnum(int swigValue) {
    StatusID e = fromNative(swigValue);
    if (e == null) {
      throw new IllegalArgumentException("No enum " + StatusID.class + " with value " + swigValue);
    }
    return e;
  }

  /**
   * The constant for a native integer, or null for a value without one. Callbacks from the
   * engine use this form: a value unknown to this class reaches the delegate as null rather
   * than as an exception thrown inside the callback.
   */
  public static StatusID fromNative(int swigValue) {
    StatusID[] values = VALUES;
    if (swigValue >= 0 && swigValue < values.length && values[swigValue] != null
        && values[swigValue].swigValue == swigValue) {
      return values[swigValue];
    }
    for (StatusID e : values) {
      if (e != null && e.swigValue == swigValue) {
        return e;
      }
    }
    return null;
  }

  private static final StatusID[] VALUES = values();
}
