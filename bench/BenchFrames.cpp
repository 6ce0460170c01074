#include "bench/BenchFrames.h"

#include <algorithm>
#include <cmath>
#include <cstdint>

namespace orzavs_bench {
namespace {

constexpr double kPi = 3.14159265358979323846;

// Small deterministic generator (xorshift64*), so frames are identical everywhere.
class Rng {
 public:
  explicit Rng(uint64_t seed) : state_(seed * 0x9E3779B97F4A7C15ull + 1) {}
  uint64_t next() {
    state_ ^= state_ >> 12;
    state_ ^= state_ << 25;
    state_ ^= state_ >> 27;
    return state_ * 0x2545F4914F6CDD1Dull;
  }
  // Uniform in [0, 1).
  double unit() { return static_cast<double>(next() >> 11) * (1.0 / 9007199254740992.0); }
  double range(double lo, double hi) { return lo + (hi - lo) * unit(); }
  int below(int n) { return static_cast<int>(next() % static_cast<uint64_t>(n)); }

 private:
  uint64_t state_;
};

// Working plane in floating point, clamped to 8 bits at the end.
struct Plane {
  int w;
  int h;
  std::vector<float> v;
  Plane(int width, int height) : w(width), h(height), v(static_cast<size_t>(width) * height, 0.f) {}
  float& at(int x, int y) { return v[static_cast<size_t>(y) * w + x]; }
};

void addGaussianBlob(Plane& p, double cx, double cy, double sigma, double amplitude) {
  const int r = static_cast<int>(std::ceil(3.0 * sigma));
  const int x0 = std::max(0, static_cast<int>(cx) - r), x1 = std::min(p.w - 1, static_cast<int>(cx) + r);
  const int y0 = std::max(0, static_cast<int>(cy) - r), y1 = std::min(p.h - 1, static_cast<int>(cy) + r);
  const double k = -0.5 / (sigma * sigma);
  for (int y = y0; y <= y1; ++y) {
    const double dy2 = (y - cy) * (y - cy);
    for (int x = x0; x <= x1; ++x) {
      const double d2 = (x - cx) * (x - cx) + dy2;
      p.at(x, y) += static_cast<float>(amplitude * std::exp(d2 * k));
    }
  }
}

// Filled rectangle, rotated by `angle`, whose shade is `shade` plus a gentle internal gradient.
void fillRotatedRect(Plane& p, double cx, double cy, double hw, double hh, double angle, double shade,
                     double gradient) {
  const double c = std::cos(angle), s = std::sin(angle);
  const double reach = std::sqrt(hw * hw + hh * hh) + 1;
  const int x0 = std::max(0, static_cast<int>(cx - reach)), x1 = std::min(p.w - 1, static_cast<int>(cx + reach));
  const int y0 = std::max(0, static_cast<int>(cy - reach)), y1 = std::min(p.h - 1, static_cast<int>(cy + reach));
  for (int y = y0; y <= y1; ++y) {
    for (int x = x0; x <= x1; ++x) {
      const double u = (x - cx) * c + (y - cy) * s;
      const double w = -(x - cx) * s + (y - cy) * c;
      if (std::fabs(u) <= hw && std::fabs(w) <= hh) {
        p.at(x, y) = static_cast<float>(shade + gradient * (u / hw));
      }
    }
  }
}

void fillDisc(Plane& p, double cx, double cy, double radius, double shade) {
  const int x0 = std::max(0, static_cast<int>(cx - radius)), x1 = std::min(p.w - 1, static_cast<int>(cx + radius));
  const int y0 = std::max(0, static_cast<int>(cy - radius)), y1 = std::min(p.h - 1, static_cast<int>(cy + radius));
  for (int y = y0; y <= y1; ++y) {
    for (int x = x0; x <= x1; ++x) {
      if ((x - cx) * (x - cx) + (y - cy) * (y - cy) <= radius * radius) p.at(x, y) = static_cast<float>(shade);
    }
  }
}

// A stroke of the given width between two points (a thick segment with round ends).
void drawStroke(Plane& p, double ax, double ay, double bx, double by, double width, double shade) {
  const double half = width * 0.5;
  const int x0 = std::max(0, static_cast<int>(std::min(ax, bx) - half - 1));
  const int x1 = std::min(p.w - 1, static_cast<int>(std::max(ax, bx) + half + 1));
  const int y0 = std::max(0, static_cast<int>(std::min(ay, by) - half - 1));
  const int y1 = std::min(p.h - 1, static_cast<int>(std::max(ay, by) + half + 1));
  const double dx = bx - ax, dy = by - ay;
  const double len2 = std::max(1e-9, dx * dx + dy * dy);
  for (int y = y0; y <= y1; ++y) {
    for (int x = x0; x <= x1; ++x) {
      double t = ((x - ax) * dx + (y - ay) * dy) / len2;
      t = std::min(1.0, std::max(0.0, t));
      const double ex = ax + t * dx - x, ey = ay + t * dy - y;
      const double d = std::sqrt(ex * ex + ey * ey);
      if (d <= half) {
        p.at(x, y) = static_cast<float>(shade);
      } else if (d <= half + 1.0) {  // one pixel of anti-aliasing
        const double a = half + 1.0 - d;
        p.at(x, y) = static_cast<float>(a * shade + (1.0 - a) * p.at(x, y));
      }
    }
  }
}

// Mild sensor noise: roughly Gaussian (sum of three uniforms), standard deviation `sigma`.
void addNoise(Plane& p, Rng& rng, double sigma) {
  const double k = sigma * 2.0;  // 3 uniforms in [-1,1] have sd 1; k*sum/2 has sd sigma
  for (float& f : p.v) {
    const double n = rng.range(-1, 1) + rng.range(-1, 1) + rng.range(-1, 1);
    f += static_cast<float>(k * n * 0.5);
  }
}

void smoothContent(Plane& p, Rng& rng) {
  const double w = p.w, h = p.h, s = h / 720.0;
  // Sky-like gradient with a slow undulation.
  for (int y = 0; y < p.h; ++y) {
    for (int x = 0; x < p.w; ++x) {
      p.at(x, y) = static_cast<float>(70.0 + 70.0 * x / w + 50.0 * y / h +
                                      18.0 * std::sin(2 * kPi * x / (w * 0.8)) * std::cos(2 * kPi * y / (h * 1.1)));
    }
  }
  // Soft blobs: out-of-focus objects and shading.
  for (int i = 0; i < 14; ++i) {
    addGaussianBlob(p, rng.range(0, w), rng.range(0, h), rng.range(25, 120) * s, rng.range(-60, 60));
  }
  // A few hard-edged objects: a table edge, boxes, a round object.
  const double horizon = h * 0.68;
  for (int y = static_cast<int>(horizon); y < p.h; ++y) {
    for (int x = 0; x < p.w; ++x) p.at(x, y) = static_cast<float>(p.at(x, y) * 0.55 + 25.0 * (y - horizon) / h);
  }
  for (int i = 0; i < 4; ++i) {
    fillRotatedRect(p, rng.range(0.15, 0.85) * w, rng.range(0.35, 0.75) * h, rng.range(40, 140) * s,
                    rng.range(30, 110) * s, rng.range(-0.4, 0.4), rng.range(40, 210), rng.range(-25, 25));
  }
  fillDisc(p, rng.range(0.2, 0.8) * w, rng.range(0.2, 0.5) * h, rng.range(30, 70) * s, rng.range(150, 230));
  addNoise(p, rng, 1.5);
}

void textureContent(Plane& p, Rng& rng) {
  const double s = p.h / 720.0;
  // Woven fabric everywhere: alternating horizontal and vertical threads in small cells, each
  // thread shaded across its width and with its own brightness.
  const int cell = std::max(3, static_cast<int>(std::lround(4 * s)));
  std::vector<float> threadShade(static_cast<size_t>(std::max(p.w, p.h) / cell + 2));
  for (float& t : threadShade) t = static_cast<float>(rng.range(-30, 30));
  for (int y = 0; y < p.h; ++y) {
    for (int x = 0; x < p.w; ++x) {
      const int cx = x / cell, cy = y / cell;
      const bool vertical = ((cx + cy) & 1) != 0;
      const double phase = vertical ? (x % cell + 0.5) / cell : (y % cell + 0.5) / cell;
      const double across = std::sin(kPi * phase);
      p.at(x, y) = static_cast<float>(110.0 + 70.0 * across + threadShade[static_cast<size_t>(vertical ? cx : cy)]);
    }
  }
  // Foliage on the right part: many small overlapping leaves of varied brightness.
  const int leaves = static_cast<int>(p.w * p.h / 90);
  for (int i = 0; i < leaves; ++i) {
    const double cx = rng.range(0.55, 1.0) * p.w, cy = rng.range(0, 1.0) * p.h;
    const double len = rng.range(2, 7) * s, ang = rng.range(0, kPi);
    drawStroke(p, cx - len * std::cos(ang), cy - len * std::sin(ang), cx + len * std::cos(ang),
               cy + len * std::sin(ang), rng.range(1.5, 4.0) * s, rng.range(20, 220));
  }
  // Printed text on paper on the upper left: lines of glyphs built from strokes.
  const double paperX0 = 0.04 * p.w, paperX1 = 0.52 * p.w, paperY0 = 0.05 * p.h, paperY1 = 0.60 * p.h;
  for (int y = static_cast<int>(paperY0); y < static_cast<int>(paperY1); ++y) {
    for (int x = static_cast<int>(paperX0); x < static_cast<int>(paperX1); ++x) {
      p.at(x, y) = static_cast<float>(225.0 - 15.0 * (x - paperX0) / (paperX1 - paperX0));
    }
  }
  const double glyph = 14 * s, pen = std::max(1.2, 2.0 * s);
  for (double baseY = paperY0 + 1.5 * glyph; baseY < paperY1 - 0.3 * glyph; baseY += 1.6 * glyph) {
    for (double gx = paperX0 + glyph; gx < paperX1 - glyph; gx += 0.75 * glyph) {
      if (rng.below(8) == 0) {  // word gap
        gx += 0.4 * glyph;
        continue;
      }
      const int strokes = 1 + rng.below(3);
      for (int k = 0; k < strokes; ++k) {
        const double ax = gx + rng.range(0, 0.55) * glyph, ay = baseY - rng.range(0, 1.0) * glyph;
        const double bx = gx + rng.range(0, 0.55) * glyph, by = baseY - rng.range(0, 1.0) * glyph;
        drawStroke(p, ax, ay, bx, by, pen, rng.range(10, 50));
      }
    }
  }
  addNoise(p, rng, 2.0);
}

BenchFrame makeFrame(int width, int height, bool texture, uint64_t seed) {
  Rng rng(seed);
  Plane luma(width, height);
  if (texture) {
    textureContent(luma, rng);
  } else {
    smoothContent(luma, rng);
  }
  BenchFrame f;
  f.content = texture ? "texture" : "smooth";
  f.name = std::to_string(width) + "x" + std::to_string(height) + " " + f.content;
  f.width = width;
  f.height = height;
  const size_t ySize = static_cast<size_t>(width) * height;
  f.nv21.resize(ySize + ySize / 2);
  for (size_t i = 0; i < ySize; ++i) {
    f.nv21[i] = static_cast<uint8_t>(std::lround(std::min(255.f, std::max(0.f, luma.v[i]))));
  }
  // Chroma: slow colour washes, tinted by the local luminance so objects keep their colour.
  uint8_t* vu = f.nv21.data() + ySize;
  for (int y = 0; y < height / 2; ++y) {
    for (int x = 0; x < width / 2; ++x) {
      const double l = f.nv21[static_cast<size_t>(2 * y) * width + 2 * x];
      const double v = 128 + 22 * std::sin(2 * kPi * x / (width * 0.35)) + 0.08 * (l - 128);
      const double u = 128 + 22 * std::cos(2 * kPi * y / (height * 0.45)) - 0.06 * (l - 128);
      vu[static_cast<size_t>(y) * width + 2 * x] = static_cast<uint8_t>(std::lround(std::min(255.0, std::max(0.0, v))));
      vu[static_cast<size_t>(y) * width + 2 * x + 1] =
          static_cast<uint8_t>(std::lround(std::min(255.0, std::max(0.0, u))));
    }
  }
  return f;
}

}  // namespace

const std::vector<BenchFrame>& benchFrames() {
  static const std::vector<BenchFrame> frames = [] {
    std::vector<BenchFrame> out;
    const int sizes[3][2] = {{640, 480}, {1280, 720}, {1920, 1080}};
    uint64_t seed = 1;
    for (const auto& sz : sizes) {
      out.push_back(makeFrame(sz[0], sz[1], false, seed++));
      out.push_back(makeFrame(sz[0], sz[1], true, seed++));
    }
    return out;
  }();
  return frames;
}

std::vector<const BenchFrame*> selectFrames(const std::string& filter) {
  std::vector<const BenchFrame*> out;
  for (const BenchFrame& f : benchFrames()) {
    if (filter.empty() || f.name.find(filter) != std::string::npos) out.push_back(&f);
  }
  return out;
}

}  // namespace orzavs_bench
