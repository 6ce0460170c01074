package com.orza.vs.mobile.library.impl.jni;

/**
 * The engine's object modules.
 */
public enum ObjectModuleID {
  BARCODE_MOD(0),
  VISUAL_SEARCH_SERVICE_MOD(1),
  TWOD_BARCODE_MOD(2),
  PACKAGE_LABEL_MOD(3),
  GIFTCARD_MOD(4),
  /** The module slot that has no native name. */
  RESERVED_MOD(5),
  UNSPECIFIED_OBJECT_MOD(6),
  NUM_OBJECT_MODS(7);

  private final int swigValue;

  ObjectModuleID(int swigValue) {
    this.swigValue = swigValue;
  }

  /** The native integer of this constant. */
  public final int swigValue() {
    return swigValue;
  }

  /** The constant for a native integer; IllegalArgumentException for a value without one. */
  public static ObjectModuleID swigToEnum(int swigValue) {
    ObjectModuleID e = fromNative(swigValue);
    if (e == null) {
      throw new IllegalArgumentException("No enum " + ObjectModuleID.class + " with value " + swigValue);
    }
    return e;
  }

  /**
   * The constant for a native integer, or null for a value without one. Callbacks from the
   * engine use this form: a value unknown to this class reaches the delegate as null rather
   * than as an exception thrown inside the callback.
   */
  public static ObjectModuleID fromNative(int swigValue) {
    ObjectModuleID[] values = VALUES;
    if (swigValue >= 0 && swigValue < values.length && values[swigValue] != null
        && values[swigValue].swigValue == swigValue) {
      return values[swigValue];
    }
    for (ObjectModuleID e : values) {
      if (e != null && e.swigValue == swigValue) {
        return e;
      }
    }
    return null;
  }

  private static final ObjectModuleID[] VALUES = values();
}
