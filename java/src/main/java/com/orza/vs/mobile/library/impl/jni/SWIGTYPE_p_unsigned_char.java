package com.orza.vs.mobile.library.impl.jni;

/** An opaque native byte address (an image buffer's pixels). Never owned by Java. */
public class SWIGTYPE_p_unsigned_char {
  private transient long swigCPtr;

  protected SWIGTYPE_p_unsigned_char(long cPtr, @SuppressWarnings("unused") boolean futureUse) {
    swigCPtr = cPtr;
  }

  protected SWIGTYPE_p_unsigned_char() {
    swigCPtr = 0;
  }

  public static long getCPtr(SWIGTYPE_p_unsigned_char obj) {
    return (obj == null) ? 0 : obj.swigCPtr;
  }
}
