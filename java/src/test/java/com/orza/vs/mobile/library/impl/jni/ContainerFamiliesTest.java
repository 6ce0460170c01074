package com.orza.vs.mobile.library.impl.jni;

import static com.orza.vs.mobile.library.impl.jni.RecordFamiliesTest.assertThrowsWithMessage;
import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertFalse;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;

import java.util.Arrays;
import java.util.List;
import org.junit.jupiter.api.Test;

class ContainerFamiliesTest {
  private static final String OUT_OF_RANGE = "vector index out of range";

  private static <T> void assertIndexChecked(List<T> vector, T value) {
    int size = vector.size();
    assertThrowsWithMessage(IndexOutOfBoundsException.class, OUT_OF_RANGE, () -> vector.get(-1));
    assertThrowsWithMessage(IndexOutOfBoundsException.class, OUT_OF_RANGE, () -> vector.get(size));
    assertThrowsWithMessage(IndexOutOfBoundsException.class, OUT_OF_RANGE,
        () -> vector.set(size, value));
    assertEquals(size, vector.size());
  }

  @Test
  void vectorOfInt() {
    VectorOfInt v = new VectorOfInt();
    assertTrue(v.isEmpty());
    v.reserve(10);
    assertTrue(v.capacity() >= 10);
    v.add(1);
    v.add(2);
    v.add(3);
    assertEquals(2, (int) v.set(1, 20));
    assertEquals(Arrays.asList(1, 20, 3), v);
    assertIndexChecked(v, 9);
    assertEquals(Arrays.asList(1, 20, 3), v);
    v.clear();
    assertEquals(0, v.size());
    VectorOfInt filled = new VectorOfInt(4);
    assertEquals(Arrays.asList(0, 0, 0, 0), filled);
    assertThrows(IllegalArgumentException.class, () -> new VectorOfInt(-1));
    assertThrows(IllegalArgumentException.class, () -> filled.reserve(-1));
    v.delete();
    filled.delete();
  }

  @Test
  void vectorOfDoubleAndString() {
    VectorOfDouble d = new VectorOfDouble(2);
    d.set(0, 0.25);
    d.add(-1e300);
    assertEquals(Arrays.asList(0.25, 0.0, -1e300), d);
    assertIndexChecked(d, 1.0);

    VectorOfString s = new VectorOfString();
    s.add("x");
    s.add("\u00fc\u00df");
    s.add("");
    assertEquals(Arrays.asList("x", "\u00fc\u00df", ""), s);
    assertEquals("x", s.set(0, "y"));
    assertIndexChecked(s, "z");
    assertThrowsWithMessage(NullPointerException.class, "null string", () -> s.add(null));
    assertThrowsWithMessage(NullPointerException.class, "null string", () -> s.set(0, null));
    assertEquals(Arrays.asList("y", "\u00fc\u00df", ""), s);
    assertEquals(Arrays.asList("", ""), new VectorOfString(2));
    d.delete();
    s.delete();
  }

  @Test
  void vectorsOfRecordsCopyInAndViewOut() {
    VectorOfPoint2f points = new VectorOfPoint2f();
    Point2f p = new Point2f(1, 2);
    points.add(p);
    p.setX(100);  // the vector holds its own copy
    assertEquals(1f, points.get(0).getX());
    Point2f view = points.get(0);
    view.setY(5);  // a view writes into the vector
    assertEquals(5f, points.get(0).getY());
    Point2f previous = points.set(0, new Point2f(9, 9));
    assertEquals(1f, previous.getX());
    assertEquals(9f, points.get(0).getX());
    assertIndexChecked(points, new Point2f());
    assertThrowsWithMessage(NullPointerException.class,
        "std::vector< OrzaVSMobile::Point2< float > >::value_type const & reference is null",
        () -> points.add(null));

    VectorOfObjectInfo infos = new VectorOfObjectInfo(1);
    assertEquals(ContentType.UNSPECIFIED_CONTENT_TYPE, infos.get(0).getContentType());
    ObjectInfo info = new ObjectInfo(ContentType.PIDN);
    info.setContent("first");
    infos.add(info);
    ObjectInfo old = infos.set(1, new ObjectInfo(ContentType.SEARCH_TERMS));
    assertEquals("first", old.getContent());
    assertEquals(ContentType.SEARCH_TERMS, infos.get(1).getContentType());
    assertIndexChecked(infos, info);
    assertThrowsWithMessage(NullPointerException.class,
        "std::vector< Tovra::ObjectInfo >::value_type const & reference is null",
        () -> infos.set(0, null));
    points.delete();
    infos.delete();
  }

  @Test
  void nestedResultsCopyTheWholeTree() {
    ObjectInfo root = new ObjectInfo(ContentType.PIDN);
    ObjectInfo child = new ObjectInfo(ContentType.SEARCH_TERMS);
    ObjectInfo grandChild = new ObjectInfo(ContentType.EXTERNAL_RESULT);
    grandChild.setContent("deep");
    child.getSubContents().add(grandChild);
    root.getSubContents().add(child);
    VectorOfObjectInfo list = new VectorOfObjectInfo();
    list.add(root);
    root.getSubContents().get(0).getSubContents().get(0).setContent("changed");
    assertEquals("deep", list.get(0).getSubContents().get(0).getSubContents().get(0).getContent());
    list.delete();
    root.delete();
    child.delete();
    grandChild.delete();
  }

  @Test
  void mapOfStringToString() {
    MapOfStringToString map = new MapOfStringToString();
    assertTrue(map.empty());
    map.set("b", "2");
    map.set("a", "1");
    map.set("b", "3");
    assertEquals(2, map.size());
    assertEquals("3", map.get("b"));
    assertThrowsWithMessage(IndexOutOfBoundsException.class, "key not found", () -> map.get("c"));
    assertFalse(map.has_key("c"));
    assertThrowsWithMessage(IndexOutOfBoundsException.class, "key not found", () -> map.del("c"));
    assertThrowsWithMessage(NullPointerException.class, "null string", () -> map.get(null));
    assertThrowsWithMessage(NullPointerException.class, "null string", () -> map.set("k", null));
    VectorOfString keys = map.getKeys();
    assertEquals(Arrays.asList("a", "b"), keys);
    keys.delete();
    MapOfStringToString copy = new MapOfStringToString(map);
    map.del("a");
    assertFalse(map.has_key("a"));
    assertTrue(copy.has_key("a"));
    assertThrowsWithMessage(NullPointerException.class,
        "std::map< std::string,std::string > const & reference is null",
        () -> new MapOfStringToString(null));
    map.clear();
    VectorOfString none = map.getKeys();
    assertTrue(none.isEmpty());
    none.delete();
    map.delete();
    copy.delete();
  }

  @Test
  void mapsOfNumbers() {
    MapOfStringToUInt counts = new MapOfStringToUInt();
    counts.set("max", 4294967295L);
    counts.set("wrapped", 4294967296L + 7);  // taken modulo 2^32
    assertEquals(4294967295L, counts.get("max"));
    assertEquals(7L, counts.get("wrapped"));
    assertEquals(Arrays.asList("max", "wrapped"), counts.getKeysForIntMap());
    assertThrowsWithMessage(IndexOutOfBoundsException.class, "key not found",
        () -> counts.get("none"));
    assertThrowsWithMessage(NullPointerException.class,
        "std::map< std::string,unsigned int > const & reference is null",
        () -> new MapOfStringToUInt(null));

    MapOfStringToDouble values = new MapOfStringToDouble();
    values.set("pi", 3.25);
    assertEquals(3.25, values.get("pi"));
    assertTrue(values.has_key("pi"));
    values.del("pi");
    assertTrue(values.empty());
    assertTrue(values.getKeysForDoubleMap().isEmpty());
    MapOfStringToDouble copy = new MapOfStringToDouble(values);
    assertEquals(0, copy.size());
    assertThrowsWithMessage(NullPointerException.class,
        "std::map< std::string,double > const & reference is null",
        () -> new MapOfStringToDouble(null));
    counts.delete();
    values.delete();
    copy.delete();
  }
}
