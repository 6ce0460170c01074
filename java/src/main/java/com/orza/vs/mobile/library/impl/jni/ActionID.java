package com.orza.vs.mobile.library.impl.jni;

/**
 * Actions reported with module events.
 */
public enum ActionID {
  NO_ACTION(0);

  private final int swigValue;

  ActionID(int swigValue) {
    this.swigValue = swigValue;
  }

  /** The native integer of this constant. */
  public final int swigValue() {
    return swigValue;
  }

  /** The constant for a native integer; IllegalArgumentException for a value without one. */
  public static ActionID swigToEnum(int swigValue) {
    ActionID e = fromNative(swigValue);
    if (e == null) {
      throw new IllegalArgumentException("No enum " + ActionID.class + " with value " + swigValue);
    }
    return e;
  }

  /**
   * The constant for a native integer, or null for a value without one. Callbacks from the
   * engine use this form: a value unknown to this class reaches the delegate as null rather
   * than as an exception thrown inside the callback.
   */
  public static ActionID fromNative(int swigValue) {
    ActionID[] values = VALUES;
    if (swigValue >= 0 && swigValue < values.length && values[swigValue] != null
        && values[swigValue].swigValue == swigValue) {
      return values[swigValue];
    }
    for (ActionID e : values) {
      if (e != null && e.swigValue == swigValue) {
        return e;
      }
    }
    return null;
  }

  private static final ActionID[] VALUES = values();
}
