package com.orza.vs.tools.server;

import static org.junit.jupiter.api.Assertions.*;

import java.nio.charset.StandardCharsets;
import java.util.Arrays;
import java.util.LinkedHashMap;
import java.util.List;
import java.util.Map;
import org.junit.jupiter.api.Test;

/** The reader side of the server: JSON documents and multipart bodies from the network. */
class ParsingTest {
  @Test
  void jsonRoundTripKeepsStructureAndEscapes() {
    Map<String, Object> inner = new LinkedHashMap<>();
    inner.put("tlx", 12);
    inner.put("ratio", 0.25);
    inner.put("text", "quote \" backslash \\ newline \n tab \t ctl \u0001 \u00e9");
    Map<String, Object> doc = new LinkedHashMap<>();
    doc.put("list", Arrays.asList(1, "two", true, null, inner));
    doc.put("empty", new LinkedHashMap<>());
    String text = Json.write(doc);
    assertEquals("{\"list\":[1,\"two\",true,null,{\"tlx\":12,\"ratio\":0.25,\"text\":"
        + "\"quote \\\" backslash \\\\ newline \\n tab \\t ctl \\u0001 \u00e9\"}],\"empty\":{}}", text);
    Object back = Json.parse(text);
    List<?> list = (List<?>) Json.member(back, "list");
    assertEquals(5, list.size());
    assertEquals(1.0, list.get(0));
    assertNull(list.get(3));
    assertEquals(inner.get("text"), Json.member(list.get(4), "text"));
  }

  @Test
  void jsonReadsEscapesNumbersAndBlanks() {
    Object v = Json.parse(" {\"a\" : [ -1.5e2 , 0 ] , \"b\":\"\\u0041\\/\"}\n");
    assertEquals(Arrays.asList(-150.0, 0.0), Json.member(v, "a"));
    assertEquals("A/", Json.member(v, "b"));
    assertNull(Json.member("not an object", "a"));
  }

  @Test
  void jsonRejectsMalformedAndOverlyDeepInput() {
    for (String bad : new String[] {"", "{", "{\"a\":}", "[1,]", "{\"a\" 1}", "\"open", "tru", "1 2", "{\"a\":1,}",
        "<html>", "\"\\x\"", "\"\\u12\"", "-", "{'a':1}"}) {
      assertThrows(IllegalArgumentException.class, () -> Json.parse(bad), bad);
    }
    StringBuilder deep = new StringBuilder();
    for (int i = 0; i < 10_000; i++) deep.append('[');
    IllegalArgumentException e = assertThrows(IllegalArgumentException.class, () -> Json.parse(deep.toString()));
    assertTrue(e.getMessage().contains("nesting"), e.getMessage());
    // Exactly at the limit is fine.
    StringBuilder ok = new StringBuilder();
    for (int i = 0; i <= Json.MAX_DEPTH; i++) ok.append('[');
    for (int i = 0; i <= Json.MAX_DEPTH; i++) ok.append(']');
    Json.parse(ok.toString());
  }

  private static byte[] bytes(String s) {
    return s.getBytes(StandardCharsets.ISO_8859_1);
  }

  @Test
  void multipartSeparatesFieldsAndFilesWithBinaryContent() {
    byte[] jpeg = {(byte) 0xff, (byte) 0xd8, '\r', '\n', '-', '-', 'x', (byte) 0xff, (byte) 0xd9};
    String head = "--XyZ\r\nContent-Disposition: form-data; name=\"vsearch_params_json\"\r\n\r\n{\"a\":1}\r\n"
        + "--XyZ\r\nContent-Disposition: form-data; name=\"orientation\"\r\nContent-Type: text/plain\r\n\r\n90\r\n"
        + "--XyZ\r\ncontent-disposition: form-data; name=\"file\"; filename=\"a;b.jpg\"\r\n\r\n";
    byte[] tail = bytes("\r\n--XyZ--\r\n");
    byte[] body = new byte[head.length() + jpeg.length + tail.length];
    System.arraycopy(bytes(head), 0, body, 0, head.length());
    System.arraycopy(jpeg, 0, body, head.length(), jpeg.length);
    System.arraycopy(tail, 0, body, head.length() + jpeg.length, tail.length);

    Multipart m = Multipart.parse(body, Multipart.boundaryOf("multipart/form-data; boundary=\"XyZ\""));
    assertEquals("{\"a\":1}", m.fields.get("vsearch_params_json"));
    assertEquals("90", m.fields.get("orientation"));
    assertArrayEquals(jpeg, m.files.get("file"));
    assertEquals(2, m.fields.size());
  }

  @Test
  void multipartBoundaryHeaderVariants() {
    assertEquals("abc", Multipart.boundaryOf("multipart/form-data; boundary=abc"));
    assertEquals("abc", Multipart.boundaryOf("Multipart/Form-Data;charset=utf-8;BOUNDARY=abc"));
    assertNull(Multipart.boundaryOf("application/json"));
    assertNull(Multipart.boundaryOf("multipart/form-data"));
    assertNull(Multipart.boundaryOf(null));
    assertNull(Multipart.boundaryOf("multipart/form-data; boundary=" + "b".repeat(71)));
  }

  @Test
  void multipartRejectsTruncatedOrMalformedBodies() {
    String ok = "--B\r\nContent-Disposition: form-data; name=\"a\"\r\n\r\nv\r\n--B--";
    assertEquals("v", Multipart.parse(bytes(ok), "B").fields.get("a"));
    String[] bad = {
        "",                                                              // no boundary at all
        "--B\r\nContent-Disposition: form-data; name=\"a\"\r\n\r\nv",     // part never closed
        "--B\r\nContent-Disposition: form-data; name=\"a\"",             // headers never end
        "--B\r\nContent-Type: text/plain\r\n\r\nv\r\n--B--",             // part without a name
        "--Bjunk",                                                       // bad delimiter line
        "--B\r\nContent-Disposition: form-data; name=\"a\"\r\n\r\nv\r\n--B", // body ends after a delimiter
    };
    for (String b : bad) {
      assertThrows(IllegalArgumentException.class, () -> Multipart.parse(bytes(b), "B"), b);
    }
    assertThrows(IllegalArgumentException.class, () -> Multipart.parse(bytes(ok), null));
  }
}
