package com.orza.vs.mobile.library.impl.jni;

/**
 * The lifecycle of one native object as its Java proxy sees it: the address, whether the proxy
 * frees it, and, for a view (a field or element inside another native object), the object it
 * lives in. Every proxy holds one of these, so the rules below are written once.
 *
 * <p>A proxy asks {@link #get} for the address before each native call. The address is refused
 * with IllegalStateException once the object has ended (deleted, closed, or a callback argument
 * whose callback returned), and for a view also once its parent has ended or changed its storage
 * (a vector that grew or shrank, a record whose nested field was replaced). Java therefore never
 * hands the library an address of freed memory through a proxy.
 *
 * <p>Like the native objects themselves, a proxy is not synchronised: ending a borrowed object
 * while another thread is still reading it is the application's race to avoid.
 */
final class NativeRef {
  private final long cPtr;
  private boolean owned;
  // Why the object can no longer be used (one of the constants below); null while it can. The
  // message is built only when it is needed: ending a borrow happens on every callback.
  private String ended;
  private static final String DELETED = "deleted";
  private static final String BORROW_ENDED = "borrow ended";
  // For a view: the object it lives in, and that object's generation when the view was taken.
  private final NativeRef parent;
  private final int parentGeneration;
  // Bumped whenever views into this object may have been left pointing at released storage.
  private int generation;
  // The proxy, kept reachable by the views taken from it so that it is not finalized (and its
  // native object freed) while they are in use.
  private final Object proxy;

  /** An object that a proxy reaches directly; {@code owned}: the proxy frees it. */
  NativeRef(Object proxy, long cPtr, boolean owned) {
    this(proxy, cPtr, owned, null);
  }

  /** A view that lives inside {@code parent} and dies with it. */
  NativeRef(Object proxy, long cPtr, NativeRef parent) {
    this(proxy, cPtr, false, parent);
  }

  private NativeRef(Object proxy, long cPtr, boolean owned, NativeRef parent) {
    this.proxy = proxy;
    this.cPtr = cPtr;
    this.owned = owned;
    this.parent = parent;
    this.parentGeneration = parent == null ? 0 : parent.generation;
  }

  /** The address for a native call; IllegalStateException when the object is gone. */
  long get() {
    if (ended != null || parent != null) check();
    return cPtr;
  }

  private void check() {
    if (ended != null) throw new IllegalStateException(endedMessage());
    for (NativeRef child = this, up = parent; up != null; child = up, up = up.parent) {
      if (up.ended != null) {
        throw new IllegalStateException(type() + " is part of another object that is no longer usable: "
            + up.endedMessage());
      }
      if (up.generation != child.parentGeneration) {
        throw new IllegalStateException(type() + " is no longer valid: the " + up.type()
            + " it was taken from has changed since (take it again)");
      }
    }
  }

  /** The address without any check (for identity comparisons only). */
  long raw() {
    return cPtr;
  }

  boolean owned() {
    return owned;
  }

  /** Views taken before this call are invalid from now on. */
  void changed() {
    generation++;
  }

  /** True when this object is {@code ancestor} or lives inside it. */
  boolean isWithin(NativeRef ancestor) {
    for (NativeRef r = this; r != null; r = r.parent) {
      if (r == ancestor) return true;
    }
    return false;
  }

  private String endedMessage() {
    if (ended == BORROW_ENDED) {
      return type() + " lives only during the callback that received it; copy what you keep"
          + " (new ArrayList<>(list), copy())";
    }
    return type() + " has been deleted";
  }

  /**
   * Deletion by the proxy's owner (or its finalizer): the object is unusable afterwards. Returns
   * the address that the caller must now free, or 0 when the proxy does not own it or it had
   * ended already.
   */
  private synchronized long endDeleted() {
    if (ended != null) return 0;
    ended = DELETED;
    boolean free = owned;
    owned = false;
    return free ? cPtr : 0;
  }

  /** Ends the object as deleted and, if it was owned, frees it through {@code deleteNative}; once only. */
  void delete(java.util.function.LongConsumer deleteNative) {
    long cPtr = endDeleted();
    if (cPtr != 0) deleteNative.accept(cPtr);
  }

  /** The end of a callback: the argument it lent (never owned) is gone. */
  void endBorrow() {
    if (ended == null) ended = BORROW_ENDED;
  }

  /** Java stops owning the object (native code frees it). */
  synchronized void disown() {
    owned = false;
  }

  // The proxy's class name, for messages only (computing it costs more than a field read).
  private String type() {
    String name = proxy.getClass().getSimpleName();
    return name.isEmpty() ? proxy.getClass().getName() : name;
  }

  /** The proxy this state belongs to. */
  Object proxy() {
    return proxy;
  }
}
