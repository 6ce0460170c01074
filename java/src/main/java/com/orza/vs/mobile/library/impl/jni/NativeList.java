package com.orza.vs.mobile.library.impl.jni;

import java.util.AbstractList;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.List;
import java.util.RandomAccess;

/**
 * A native vector ({@code std::vector}) as a {@link java.util.List}: random access, add and
 * remove anywhere, {@code set}, {@code clear}, iteration, and {@code equals}/{@code hashCode}
 * as {@code List} defines them. Indices outside the vector raise IndexOutOfBoundsException
 * "vector index out of range".
 *
 * <p>Elements of records ({@link Point2f}, {@link ObjectInfo}) are returned by {@link #get} as
 * views into the vector, not copies: writing to one writes into the vector, and a view becomes
 * unusable (IllegalStateException) once the vector grows, shrinks or ends. To keep elements,
 * copy them: {@code new ArrayList<>(list)} (or {@link #toArray()}) gives owned copies of record
 * elements and plain values of the others.
 *
 * <p>A vector handed to a callback lives only during that callback; one owned by Java is freed
 * by {@link #delete}/{@link #close} (or when it is collected).
 *
 * @param <E> the element type
 */
public abstract class NativeList<E> extends AbstractList<E> implements RandomAccess, NativeProxy {
  private static final String OUT_OF_RANGE = "vector index out of range";

  final NativeRef nref;

  NativeList(long cPtr, boolean cMemoryOwn) {
    nref = new NativeRef(this, cPtr, cMemoryOwn);
  }

  /** A view of a vector that lives inside {@code parent}. */
  NativeList(long cPtr, NativeRef parent) {
    nref = new NativeRef(this, cPtr, parent);
  }

  // The native family behind the list; each gets the vector's checked address.
  abstract int nativeSize(long cPtr);

  abstract boolean nativeIsEmpty(long cPtr);

  abstract int nativeCapacity(long cPtr);

  abstract void nativeReserve(long cPtr, int n);

  abstract E nativeGet(long cPtr, int i);

  abstract void nativeSet(long cPtr, int i, E x);

  abstract void nativeAdd(long cPtr, E x);

  abstract void nativeClear(long cPtr);

  abstract void deleteNative(long cPtr);

  /** An element that stays valid on its own: an owned copy of a record, a value itself. */
  E detach(E element) {
    return element;
  }

  @Override
  public int size() {
    return nativeSize(nref.get());
  }

  @Override
  public boolean isEmpty() {
    return nativeIsEmpty(nref.get());
  }

  /** The number of elements the vector can hold before it reallocates. */
  public int capacity() {
    return nativeCapacity(nref.get());
  }

  /** Reserves room for {@code n} elements; IllegalArgumentException when {@code n} is negative. */
  public void reserve(int n) {
    nativeReserve(nref.get(), n);
    storageChanged();
  }

  @Override
  public E get(int i) {
    return nativeGet(nref.get(), i);
  }

  /** Assigns a copy of {@code x} to element {@code i}; returns (a copy of) the previous element. */
  @Override
  public E set(int i, E x) {
    long cPtr = nref.get();
    E previous = detach(nativeGet(cPtr, i));
    nativeSet(cPtr, i, x);
    return previous;
  }

  /** Appends a copy of {@code x}. */
  @Override
  public boolean add(E x) {
    nativeAdd(nref.get(), x);
    storageChanged();
    return true;
  }

  /** Inserts a copy of {@code x} before element {@code i} (0 &lt;= i &lt;= size()). */
  @Override
  public void add(int i, E x) {
    long cPtr = nref.get();
    int n = nativeSize(cPtr);
    if (i < 0 || i > n) throw new IndexOutOfBoundsException(OUT_OF_RANGE);
    if (x instanceof NativeObject && ((NativeObject) x).nref.isWithin(nref)) {
      x = detach(x);  // a view into this vector would not survive the reallocation below
    }
    if (i == n) {
      add(x);
      return;
    }
    nativeAdd(cPtr, nativeGet(cPtr, n - 1));
    storageChanged();
    for (int j = n - 1; j > i; j--) nativeSet(cPtr, j, nativeGet(cPtr, j - 1));
    nativeSet(cPtr, i, x);
  }

  /** Removes element {@code i}; returns (a copy of) it. */
  @Override
  public E remove(int i) {
    long cPtr = nref.get();
    int n = nativeSize(cPtr);
    if (i < 0 || i >= n) throw new IndexOutOfBoundsException(OUT_OF_RANGE);
    E removed = detach(nativeGet(cPtr, i));
    // The vector has no native erase: the others are kept aside, then put back in order.
    List<E> kept = new ArrayList<E>(n - 1);
    for (int j = 0; j < n; j++) {
      if (j != i) kept.add(detach(nativeGet(cPtr, j)));
    }
    nativeClear(cPtr);
    storageChanged();
    for (E e : kept) {
      nativeAdd(cPtr, e);
      if (e instanceof NativeObject) ((NativeObject) e).delete();
    }
    return removed;
  }

  @Override
  protected void removeRange(int from, int to) {
    for (int i = to - 1; i >= from; i--) remove(i);
  }

  @Override
  public void clear() {
    nativeClear(nref.get());
    storageChanged();
  }

  /** Every element as an independent value: owned copies of records, the values of others. */
  @Override
  public Object[] toArray() {
    long cPtr = nref.get();
    int n = nativeSize(cPtr);
    Object[] out = new Object[n];
    for (int i = 0; i < n; i++) out[i] = detach(nativeGet(cPtr, i));
    return out;
  }

  @Override
  @SuppressWarnings("unchecked")
  public <T> T[] toArray(T[] a) {
    Object[] all = toArray();
    if (a.length < all.length) return (T[]) Arrays.copyOf(all, all.length, a.getClass());
    System.arraycopy(all, 0, a, 0, all.length);
    if (a.length > all.length) a[all.length] = null;
    return a;
  }

  private void storageChanged() {
    nref.changed();
    modCount++;
  }

  @Override
  protected void finalize() {
    delete();
  }

  @Override
  public void delete() {
    nref.delete(this::deleteNative);
  }
}
