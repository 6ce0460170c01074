package com.orza.vs.tools.server;

import java.nio.charset.StandardCharsets;
import java.util.LinkedHashMap;
import java.util.Locale;
import java.util.Map;

/**
 * Reads a {@code multipart/form-data} body: text fields by name, and the bytes of file parts
 * (parts that carry a {@code filename}) by name. Malformed bodies raise
 * {@link IllegalArgumentException} with a short reason; nothing is read outside the body.
 */
public final class Multipart {
  /** Text fields (parts without a filename), decoded as UTF-8, in body order. */
  public final Map<String, String> fields = new LinkedHashMap<>();
  /** File parts by field name, in body order. */
  public final Map<String, byte[]> files = new LinkedHashMap<>();

  private Multipart() {}

  /** Extracts the boundary parameter of a Content-Type header, or null if there is none. */
  public static String boundaryOf(String contentType) {
    if (contentType == null) return null;
    String lower = contentType.toLowerCase(Locale.ROOT);
    if (!lower.startsWith("multipart/form-data")) return null;
    for (String param : contentType.split(";")) {
      String p = param.trim();
      if (p.toLowerCase(Locale.ROOT).startsWith("boundary=")) {
        String b = p.substring("boundary=".length()).trim();
        if (b.length() >= 2 && b.startsWith("\"") && b.endsWith("\"")) b = b.substring(1, b.length() - 1);
        // RFC 2046 limits boundaries to 70 characters.
        return b.isEmpty() || b.length() > 70 ? null : b;
      }
    }
    return null;
  }

  /** Parses {@code body} delimited by {@code boundary} (without the leading dashes). */
  public static Multipart parse(byte[] body, String boundary) {
    if (boundary == null || boundary.isEmpty()) throw new IllegalArgumentException("no multipart boundary");
    byte[] delim = ("--" + boundary).getBytes(StandardCharsets.ISO_8859_1);
    byte[] nextDelim = ("\r\n--" + boundary).getBytes(StandardCharsets.ISO_8859_1);
    Multipart out = new Multipart();

    int pos = indexOf(body, delim, 0);
    if (pos < 0) throw new IllegalArgumentException("multipart boundary not found");
    pos += delim.length;
    while (true) {
      // After a delimiter: "--" closes the body, CRLF starts a part.
      if (pos + 2 <= body.length && body[pos] == '-' && body[pos + 1] == '-') return out;
      if (pos + 2 > body.length || body[pos] != '\r' || body[pos + 1] != '\n') {
        throw new IllegalArgumentException("malformed multipart delimiter line");
      }
      pos += 2;
      int headerEnd = indexOf(body, new byte[] {'\r', '\n', '\r', '\n'}, pos);
      if (headerEnd < 0) throw new IllegalArgumentException("unterminated part headers");
      String headers = new String(body, pos, headerEnd - pos, StandardCharsets.UTF_8);
      int contentStart = headerEnd + 4;
      int contentEnd = indexOf(body, nextDelim, contentStart);
      if (contentEnd < 0) throw new IllegalArgumentException("unterminated multipart part");

      String name = null;
      String filename = null;
      for (String line : headers.split("\r\n")) {
        int colon = line.indexOf(':');
        if (colon < 0) continue;
        if (!line.substring(0, colon).trim().equalsIgnoreCase("content-disposition")) continue;
        name = dispositionParam(line.substring(colon + 1), "name");
        filename = dispositionParam(line.substring(colon + 1), "filename");
      }
      if (name == null) throw new IllegalArgumentException("part without a name");
      byte[] content = new byte[contentEnd - contentStart];
      System.arraycopy(body, contentStart, content, 0, content.length);
      if (filename != null) {
        out.files.put(name, content);
      } else {
        out.fields.put(name, new String(content, StandardCharsets.UTF_8));
      }
      pos = contentEnd + nextDelim.length;
    }
  }

  /** Value of parameter {@code key} in a Content-Disposition header value, or null. */
  static String dispositionParam(String value, String key) {
    int i = 0;
    while (i < value.length()) {
      int semi = value.indexOf(';', i);
      // Quoted values may contain ';': find the end of a quoted value first.
      int eq = value.indexOf('=', i);
      if (eq < 0) return null;
      if (semi >= 0 && semi < eq) {
        i = semi + 1;
        continue;
      }
      String k = value.substring(i, eq).trim();
      int vStart = eq + 1;
      String v;
      int next;
      if (vStart < value.length() && value.charAt(vStart) == '"') {
        StringBuilder sb = new StringBuilder();
        int j = vStart + 1;
        while (j < value.length() && value.charAt(j) != '"') {
          if (value.charAt(j) == '\\' && j + 1 < value.length()) j++;
          sb.append(value.charAt(j++));
        }
        v = sb.toString();
        int after = value.indexOf(';', j);
        next = after < 0 ? value.length() : after + 1;
      } else {
        int end = value.indexOf(';', vStart);
        v = value.substring(vStart, end < 0 ? value.length() : end).trim();
        next = end < 0 ? value.length() : end + 1;
      }
      if (k.equalsIgnoreCase(key)) return v;
      i = next;
    }
    return null;
  }

  /** First index of {@code needle} in {@code hay} at or after {@code from}, or -1. */
  static int indexOf(byte[] hay, byte[] needle, int from) {
    outer:
    for (int i = Math.max(0, from); i + needle.length <= hay.length; i++) {
      for (int j = 0; j < needle.length; j++) {
        if (hay[i + j] != needle[j]) continue outer;
      }
      return i;
    }
    return -1;
  }
}
