package com.orza.vs.tools.server;

import java.awt.image.BufferedImage;
import java.io.File;
import java.io.IOException;
import java.nio.charset.StandardCharsets;
import java.nio.file.Files;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.Collections;
import java.util.List;
import java.util.Locale;
import java.util.Map;

/**
 * The products the server recognises: one reference image per product, with the title, search
 * terms and link its replies carry.
 *
 * <p>A catalogue folder holds one PNG or JPEG image per product, the product id being the file
 * name without its extension, and optionally {@code catalog.json}, an object that maps ids to
 * {@code {"title": ..., "searchTerms": ..., "url": ...}} (every member optional; the title and
 * the search terms default to the id, the link to none).
 */
public final class Catalog {
  /** One product. */
  public static final class Product {
    public final String id;
    public final String title;
    public final String searchTerms;
    /** The product's page, or null. */
    public final String url;
    public final BufferedImage image;

    public Product(String id, String title, String searchTerms, String url, BufferedImage image) {
      this.id = id;
      this.title = title == null ? id : title;
      this.searchTerms = searchTerms == null ? id : searchTerms;
      this.url = url;
      this.image = image;
    }
  }

  public final List<Product> products;
  /** Where the catalogue came from, for log lines. */
  public final String origin;

  public Catalog(List<Product> products, String origin) {
    this.products = Collections.unmodifiableList(new ArrayList<>(products));
    this.origin = origin;
  }

  /** Reads a catalogue folder; throws IOException with a one-line message when it is unusable. */
  public static Catalog load(File dir) throws IOException {
    if (!dir.isDirectory()) throw new IOException("catalogue " + dir + " is not a folder");
    File[] files = dir.listFiles();
    if (files == null) throw new IOException("cannot list catalogue " + dir);
    Arrays.sort(files);
    Object details = null;
    File json = new File(dir, "catalog.json");
    if (json.isFile()) {
      try {
        details = Json.parse(new String(Files.readAllBytes(json.toPath()), StandardCharsets.UTF_8));
      } catch (IllegalArgumentException e) {
        throw new IOException(json + ": " + e.getMessage());
      }
      if (!(details instanceof Map)) throw new IOException(json + ": expected an object of products");
    }
    List<Product> products = new ArrayList<>();
    for (File f : files) {
      String name = f.getName();
      String lower = name.toLowerCase(Locale.ROOT);
      int dot = name.lastIndexOf('.');
      if (!f.isFile() || dot <= 0 || !(lower.endsWith(".png") || lower.endsWith(".jpg") || lower.endsWith(".jpeg"))) continue;
      BufferedImage img;
      try {
        img = ReferenceServer.decode(Files.readAllBytes(f.toPath()));
      } catch (IllegalArgumentException e) {
        throw new IOException(f + ": " + e.getMessage());
      }
      if (img == null) throw new IOException(f + ": not a readable image");
      String id = name.substring(0, dot);
      Object d = Json.member(details, id);
      products.add(new Product(id, text(d, "title"), text(d, "searchTerms"), text(d, "url"), img));
    }
    if (products.isEmpty()) throw new IOException("catalogue " + dir + " holds no PNG or JPEG image");
    return new Catalog(products, dir.getPath());
  }

  private static String text(Object details, String key) {
    Object v = Json.member(details, key);
    return v instanceof String ? (String) v : null;
  }

  public Product get(String id) {
    for (Product p : products) {
      if (p.id.equals(id)) return p;
    }
    return null;
  }
}
