package com.orza.vs.mobile.library.impl.jni;

/**
 * The pixels of one frame and their geometry. {@code allocLen} is the number of bytes that a
 * fill may write; it comes only from {@link #allocateBuffer} or from
 * {@link TovraStateEngineFacade#requestImageBuffer}. From Java it can be lowered but never
 * raised, and pointing {@code data} elsewhere makes the buffer borrow that memory
 * ({@code allocLen} 0), so that no fill can write outside memory the buffer was given.
 */
public class ImageBuffer extends NativeObject {
  public ImageBuffer(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  ImageBuffer(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(ImageBuffer obj) {
    return (obj == null) ? 0 : obj.swigCPtr();
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_ImageBuffer(cPtr);
  }

  public ImageBuffer() {
    this(OrzaVSMobileJNI.new_ImageBuffer__SWIG_0(), true);
  }

  public ImageBuffer(int definition, ImageFormat format, int width, int height, int widthStep, int numChannels, SWIGTYPE_p_unsigned_char data) {
    this(OrzaVSMobileJNI.new_ImageBuffer__SWIG_1(definition, format.swigValue(), width, height, widthStep, numChannels, SWIGTYPE_p_unsigned_char.getCPtr(data)), true);
  }

  public void setWidth(int value) {
    OrzaVSMobileJNI.ImageBuffer_width_set(swigCPtr(), this, value);
  }

  public int getWidth() {
    return OrzaVSMobileJNI.ImageBuffer_width_get(swigCPtr(), this);
  }

  public void setHeight(int value) {
    OrzaVSMobileJNI.ImageBuffer_height_set(swigCPtr(), this, value);
  }

  public int getHeight() {
    return OrzaVSMobileJNI.ImageBuffer_height_get(swigCPtr(), this);
  }

  public void setWidthStep(int value) {
    OrzaVSMobileJNI.ImageBuffer_widthStep_set(swigCPtr(), this, value);
  }

  public int getWidthStep() {
    return OrzaVSMobileJNI.ImageBuffer_widthStep_get(swigCPtr(), this);
  }

  public void setNumChannels(int value) {
    OrzaVSMobileJNI.ImageBuffer_numChannels_set(swigCPtr(), this, value);
  }

  public int getNumChannels() {
    return OrzaVSMobileJNI.ImageBuffer_numChannels_get(swigCPtr(), this);
  }

  public void setFormat(ImageFormat value) {
    OrzaVSMobileJNI.ImageBuffer_format_set(swigCPtr(), this, value.swigValue());
  }

  public ImageFormat getFormat() {
    return ImageFormat.swigToEnum(OrzaVSMobileJNI.ImageBuffer_format_get(swigCPtr(), this));
  }

  public void setDefinition(int value) {
    OrzaVSMobileJNI.ImageBuffer_definition_set(swigCPtr(), this, value);
  }

  public int getDefinition() {
    return OrzaVSMobileJNI.ImageBuffer_definition_get(swigCPtr(), this);
  }

  /**
   * Points the buffer at other memory. When the address changes the buffer borrows it:
   * allocLen becomes 0, so the new memory is read by the engine but never filled.
   */
  public void setData(SWIGTYPE_p_unsigned_char value) {
    OrzaVSMobileJNI.ImageBuffer_data_set(swigCPtr(), this, SWIGTYPE_p_unsigned_char.getCPtr(value));
  }

  public SWIGTYPE_p_unsigned_char getData() {
    long cPtr = OrzaVSMobileJNI.ImageBuffer_data_get(swigCPtr(), this);
    return (cPtr == 0) ? null : new SWIGTYPE_p_unsigned_char(cPtr, false);
  }

  public void setAllocLen(int value) {
    OrzaVSMobileJNI.ImageBuffer_allocLen_set(swigCPtr(), this, value);
  }

  public int getAllocLen() {
    return OrzaVSMobileJNI.ImageBuffer_allocLen_get(swigCPtr(), this);
  }

  /**
   * Frees owned memory, then allocates {@code length} bytes that this buffer owns. Returns
   * {@code length}, or 0 when the allocation fails.
   */
  public int allocateBuffer(int length) {
    return OrzaVSMobileJNI.ImageBuffer_allocateBuffer(swigCPtr(), this, length);
  }

  /**
   * Copies min(length, source.length, allocLen) bytes of {@code source} into the buffer and
   * returns the count copied (0 for a buffer without fillable memory or a null array).
   */
  public int fillBuffer(byte[] source, int length) {
    return OrzaVSMobileJNI.ImageBuffer_fillBuffer(swigCPtr(), this, source, length);
  }

  /**
   * Copies from the start of a direct byte buffer (its position is not used): min(length,
   * capacity, allocLen) bytes. A heap (non-direct) buffer or null copies nothing and returns 0.
   */
  public int fillBufferWithByteBuffer(java.nio.ByteBuffer source, int length) {
    return OrzaVSMobileJNI.ImageBuffer_fillBufferWithByteBuffer__SWIG_0(swigCPtr(), this, source, length);
  }

  /**
   * Two planes (luminance, then chroma) from two direct byte buffers, placed back to back.
   * Returns the total count copied.
   */
  public int fillBufferWithByteBuffer(java.nio.ByteBuffer first, int firstLength,
                                      java.nio.ByteBuffer second, int secondLength) {
    return OrzaVSMobileJNI.ImageBuffer_fillBufferWithByteBuffer__SWIG_1(swigCPtr(), this, first,
        firstLength, second, secondLength);
  }

  /** Gives up memory that this buffer allocated itself; allocLen becomes 0. */
  public void releaseBuffer() {
    OrzaVSMobileJNI.ImageBuffer_releaseBuffer(swigCPtr(), this);
  }
}
