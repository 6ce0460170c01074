package com.orza.vs.mobile.library.impl.jni;

/**
 * Why a server exchange failed ({@link EventDelegateBase#didReceiveServerError}).
 */
public enum ResponseStatus {
  /** Never reported. */
  RESPONSE_SUCCESS(0),
  /** The server answered with a response code other than 200. */
  RESPONSE_SERVER_ERROR(1),
  /** The code was 200 but the body could not be read. */
  RESPONSE_PARSE_ERROR(2);

  private final int swigValue;

  ResponseStatus(int swigValue) {
    this.swigValue = swigValue;
  }

  /** The native integer of this constant. */
  public final int swigValue() {
    return swigValue;
  }

  /** The constant for a native integer; IllegalArgumentException for a value without one. */
  public static ResponseStatus swigToEnum(int swigValue) {
    ResponseStatus e = fromNative(swigValue);
    if (e == null) {
      throw new IllegalArgumentException("No enum " + ResponseStatus.class + " with value " + swigValue);
    }
    return e;
  }

  /**
   * The constant for a native integer, or null for a value without one. Callbacks from the
   * engine use this form: a value unknown to this class reaches the delegate as null rather
   * than as an exception thrown inside the callback.
   */
  public static ResponseStatus fromNative(int swigValue) {
    ResponseStatus[] values = VALUES;
    if (swigValue >= 0 && swigValue < values.length && values[swigValue] != null
        && values[swigValue].swigValue == swigValue) {
      return values[swigValue];
    }
    for (ResponseStatus e : values) {
      if (e != null && e.swigValue == swigValue) {
        return e;
      }
    }
    return null;
  }

  private static final ResponseStatus[] VALUES = values();
}
