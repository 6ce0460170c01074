package com.orza.vs.tools.server;

import java.io.ByteArrayOutputStream;
import java.io.IOException;
import java.io.InputStream;
import java.io.OutputStream;
import java.io.UncheckedIOException;
import java.net.HttpURLConnection;
import java.net.URL;
import java.nio.charset.StandardCharsets;
import java.util.HashMap;
import java.util.List;
import java.util.Map;

/**
 * The search of a {@link Recognizer} done by a reference server in another process, through its
 * {@code /recognize} address: {@code GET} lists the ids of the products it indexed, {@code POST
 * ?width=W&height=H} with a frame's luminance plane answers {@code {"product": id, "corners":
 * [8 numbers], "inliers": n, "matches": m}}, or {@code {}} when no product is seen. The products
 * are this side's catalogue's, by id: the other side must index the same catalogue.
 */
final class RemoteRecognizer {
  private final URL url;
  private final Map<String, Catalog.Product> products = new HashMap<>();
  private final int indexed;

  RemoteRecognizer(String url, Catalog catalog) throws IOException {
    this.url = new URL(url);
    for (Catalog.Product p : catalog.products) products.put(p.id, p);
    Object ids = Json.member(Json.parse(exchange(null, this.url)), "products");
    if (!(ids instanceof List)) throw new IOException(url + " did not list its products");
    int known = 0;
    for (Object id : (List<?>) ids) {
      if (!products.containsKey(id)) {
        throw new IOException("the recognizer at " + url + " indexes product " + id + ", which " + catalog.origin + " lacks");
      }
      known++;
    }
    indexed = known;
  }

  int indexedProducts() {
    return indexed;
  }

  /** The product in a w x h frame given by its luminance, or null; I/O failures are unchecked. */
  Recognizer.Match find(byte[] y, int w, int h) {
    try {
      Object reply = Json.parse(exchange(y, new URL(url, url.getPath() + "?width=" + w + "&height=" + h)));
      Object id = Json.member(reply, "product");
      if (id == null) return null;
      Catalog.Product product = products.get(id);
      if (product == null) throw new IOException(url + " named product " + id + ", which is not in the catalogue");
      List<?> c = (List<?>) Json.member(reply, "corners");
      double[] corners = new double[8];
      for (int i = 0; i < 8; i++) corners[i] = ((Number) c.get(i)).doubleValue();
      return new Recognizer.Match(product, corners, ((Number) Json.member(reply, "inliers")).intValue(),
          ((Number) Json.member(reply, "matches")).intValue());
    } catch (IOException e) {
      throw new UncheckedIOException("recognizer at " + url + ": " + e.getMessage(), e);
    }
  }

  /** GET (body null) or POST of {@code body}; the answer's text, or IOException unless 200. */
  private static String exchange(byte[] body, URL to) throws IOException {
    HttpURLConnection c = (HttpURLConnection) to.openConnection();
    try {
      c.setConnectTimeout(10_000);
      c.setReadTimeout(60_000);
      if (body != null) {
        c.setRequestMethod("POST");
        c.setDoOutput(true);
        c.setFixedLengthStreamingMode(body.length);
        c.setRequestProperty("Content-Type", "application/octet-stream");
        try (OutputStream out = c.getOutputStream()) {
          out.write(body);
        }
      }
      int code = c.getResponseCode();
      InputStream in = code == 200 ? c.getInputStream() : c.getErrorStream();
      ByteArrayOutputStream text = new ByteArrayOutputStream();
      if (in != null) {
        try (InputStream i = in) {
          i.transferTo(text);
        }
      }
      String answer = text.toString(StandardCharsets.UTF_8);
      if (code != 200) throw new IOException("HTTP " + code + ": " + answer);
      return answer;
    } finally {
      c.disconnect();
    }
  }
}
