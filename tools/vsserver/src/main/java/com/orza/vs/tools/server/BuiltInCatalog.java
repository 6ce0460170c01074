package com.orza.vs.tools.server;

import java.awt.Graphics2D;
import java.awt.image.BufferedImage;
import java.io.File;
import java.io.IOException;
import java.nio.file.Files;
import java.util.ArrayList;
import java.util.List;

/**
 * The catalogue the tools use when none is given: five products made from public-domain and CC0
 * photographs that Debian's python3-skimage ships (scripts/install-deps.sh copies them to
 * {@link #photosDir()}), plus the other photographs of that set, which the scene uses as a
 * background and the benchmark cuts into look-alike distractor products.
 */
public final class BuiltInCatalog {
  private BuiltInCatalog() {}

  /** id, photograph, title, search terms. */
  static final String[][] PRODUCTS = {
      {"astronaut", "astronaut.png", "Astronaut portrait poster", "astronaut portrait space poster"},
      {"chelsea", "chelsea.png", "Chelsea the cat, photo print", "tabby cat photo print"},
      {"coffee", "coffee.png", "Espresso cup, cafe menu card", "espresso coffee cup cafe"},
      {"camera", "camera.png", "Cameraman, classic photo print", "cameraman tripod black and white print"},
      {"ihc", "ihc.png", "Tissue stain, lab atlas plate", "immunohistochemistry stain microscopy"},
  };
  /** The scenes' background photograph: a gravel surface, not a product. */
  static final String BACKGROUND = "gravel.png";
  /** Photographs that are neither products nor the background. */
  static final String[] OTHERS = {"brick.png", "grass.png", "text.png", "coins.png", "retina.jpg",
      "cell.png", "rocket.jpg", "hubble_deep_field.jpg"};

  /** Where the photographs are: property orzavs.photos, else the install script's folder. */
  public static File photosDir() {
    return new File(System.getProperty("orzavs.photos", "/usr/local/share/orzavs/photos"));
  }

  /** Reads one of the photographs; a missing one is an IOException that says how to get it. */
  public static BufferedImage photo(String file) throws IOException {
    File f = new File(photosDir(), file);
    if (!f.isFile()) {
      throw new IOException("missing photograph " + f + " (scripts/install-deps.sh installs the built-in catalogue's photographs)");
    }
    BufferedImage img = ReferenceServer.decode(Files.readAllBytes(f.toPath()));
    if (img == null) throw new IOException(f + ": not a readable image");
    return rgb(img);
  }

  /**
   * The surface products lie on in generated views: the gravel photograph at a third of its
   * contrast, tinted like a wooden table, so that it has texture without drowning the products.
   */
  public static BufferedImage background() throws IOException {
    BufferedImage img = photo(BACKGROUND);
    for (int y = 0; y < img.getHeight(); y++) {
      for (int x = 0; x < img.getWidth(); x++) {
        double v = 0.33 * (((img.getRGB(x, y) >> 8) & 255) - 128);
        int r = clamp(150 + v), g = clamp(122 + v), b = clamp(96 + v);
        img.setRGB(x, y, (r << 16) | (g << 8) | b);
      }
    }
    return img;
  }

  private static int clamp(double v) {
    return (int) Math.max(0, Math.min(255, Math.round(v)));
  }

  static BufferedImage rgb(BufferedImage img) {
    if (img.getType() == BufferedImage.TYPE_INT_RGB) return img;
    BufferedImage out = new BufferedImage(img.getWidth(), img.getHeight(), BufferedImage.TYPE_INT_RGB);
    Graphics2D g = out.createGraphics();
    g.drawImage(img, 0, 0, null);
    g.dispose();
    return out;
  }

  /** The five products. */
  public static Catalog load() throws IOException {
    List<Catalog.Product> products = new ArrayList<>();
    for (String[] p : PRODUCTS) {
      products.add(new Catalog.Product(p[0], p[2], p[3], "https://shop.example.org/products/" + p[0], photo(p[1])));
    }
    return new Catalog(products, "built-in catalogue (" + photosDir() + ")");
  }

  /**
   * {@code base}'s products followed by distractors up to {@code size} products: tiles of the
   * photographs that are not products, at two scales and mirrored (a mirrored view has other
   * ORB descriptors), so that the index holds real-world descriptors from many images.
   */
  public static Catalog withDistractors(Catalog base, int size) throws IOException {
    List<Catalog.Product> products = new ArrayList<>(base.products);
    int n = 0;
    outer:
    for (int tile : new int[] {256, 180, 128}) {
      for (boolean mirror : new boolean[] {false, true}) {
        for (String name : OTHERS) {
          BufferedImage img = photo(name);
          for (int y = 0; y + tile <= img.getHeight(); y += tile) {
            for (int x = 0; x + tile <= img.getWidth(); x += tile) {
              if (products.size() >= size) break outer;
              BufferedImage t = new BufferedImage(tile, tile, BufferedImage.TYPE_INT_RGB);
              Graphics2D g = t.createGraphics();
              if (mirror) g.drawImage(img, tile, 0, 0, tile, x, y, x + tile, y + tile, null);
              else g.drawImage(img, 0, 0, tile, tile, x, y, x + tile, y + tile, null);
              g.dispose();
              if (!Recognizer.indexable(t)) continue; // a plain patch (sky, a dark border) is no product
              String id = "distractor-" + (++n);
              products.add(new Catalog.Product(id, null, null, null, t));
            }
          }
        }
      }
    }
    return new Catalog(products, base.origin + " + " + n + " distractors");
  }
}
