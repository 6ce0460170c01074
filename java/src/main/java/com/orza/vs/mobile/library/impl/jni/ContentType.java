package com.orza.vs.mobile.library.impl.jni;

/**
 * What kind of content a result carries.
 */
public enum ContentType {
  BARCODE_UPC_EAN(0),
  BARCODE_128(1),
  QR_CODE(2),
  DATA_MATRIX(3),
  PDF_417(4),
  GIFT_CARD(5),
  PIDN(6),
  SEARCH_TERMS(7),
  DIRECTED_RESULT(8),
  EXTERNAL_RESULT(9),
  /** Unnamed natively; the visual search reply gives it to "BoundingBox" results. */
  BOUNDING_BOX(10),
  UNSPECIFIED_CONTENT_TYPE(11),
  NUM_CONTENT_TYPES(12);

  private final int swigValue;

  ContentType(int swigValue) {
    this.swigValue = swigValue;
  }

  /** The native integer of this constant. */
  public final int swigValue() {
    return swigValue;
  }

  /** The constant for a native integer; IllegalArgumentException for a value without one. */
  public static ContentType swigToEnum(int swigValue) {
    ContentType e = fromNative(swigValue);
    if (e == null) {
      throw new IllegalArgumentException("No enum " + ContentType.class + " with value " + swigValue);
    }
    return e;
  }

  /**
   * The constant for a native integer, or null for a value without one. Callbacks from the
   * engine use this form: a value unknown to this class reaches the delegate as null rather
   * than as an exception thrown inside the callback.
   */
  public static ContentType fromNative(int swigValue) {
    ContentType[] values = VALUES;
    if (swigValue >= 0 && swigValue < values.length && values[swigValue] != null
        && values[swigValue].swigValue == swigValue) {
      return values[swigValue];
    }
    for (ContentType e : values) {
      if (e != null && e.swigValue == swigValue) {
        return e;
      }
    }
    return null;
  }

  private static final ContentType[] VALUES = values();
}
