#pragma once
// A generated landscape "photo" for the effect benchmark and contact sheet:
// sky with sun and clouds, far mountains, green hills and trees, a field of
// yellow and red flowers, a red house and a face, with fine sensor noise.
// Returned as 32-bit pixels in memory order B, G, R, A (cairo and evas).

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <vector>

namespace effects_sample {

inline uint32_t hash2(int x, int y, uint32_t seed) {
  uint32_t h = (uint32_t)x * 374761393u + (uint32_t)y * 668265263u + seed * 2246822519u;
  h = (h ^ (h >> 13)) * 1274126177u;
  return h ^ (h >> 16);
}
inline double rnd(int x, int y, uint32_t seed) {
  return (hash2(x, y, seed) & 0xffffff) / 16777215.0;
}

// Smooth value noise, 0..1, period-free.
inline double valueNoise(double x, double y, uint32_t seed) {
  const int xi = (int)std::floor(x), yi = (int)std::floor(y);
  const double fx = x - xi, fy = y - yi;
  const double sx = fx * fx * (3 - 2 * fx), sy = fy * fy * (3 - 2 * fy);
  const double a = rnd(xi, yi, seed), b = rnd(xi + 1, yi, seed), c = rnd(xi, yi + 1, seed),
               d = rnd(xi + 1, yi + 1, seed);
  return (a + (b - a) * sx) + ((c + (d - c) * sx) - (a + (b - a) * sx)) * sy;
}
inline double fractal(double x, double y, uint32_t seed, int octaves = 4) {
  double v = 0, amp = 0.5, tot = 0;
  for (int o = 0; o < octaves; ++o) {
    v += amp * valueNoise(x, y, seed + (uint32_t)o * 17u);
    tot += amp;
    x *= 2.03;
    y *= 2.03;
    amp *= 0.5;
  }
  return v / tot;
}

struct Col {
  double r, g, b;
};
inline Col mix(Col a, Col b, double t) {
  return {a.r + (b.r - a.r) * t, a.g + (b.g - a.g) * t, a.b + (b.b - a.b) * t};
}
inline double sstep(double e0, double e1, double x) {
  double t = std::clamp((x - e0) / (e1 - e0), 0.0, 1.0);
  return t * t * (3 - 2 * t);
}

inline std::vector<uint8_t> makePhoto(int w, int h) {
  std::vector<uint8_t> px((size_t)w * (size_t)h * 4);
  const double s = std::min(w, h);
  for (int y = 0; y < h; ++y) {
    for (int x = 0; x < w; ++x) {
      // Normalised coordinates: u across 0..w/s, v down 0..1 (of the height).
      const double u = x / s, v = (double)y / h, vs = y / s;
      // Sky.
      Col c = mix(Col{0.16, 0.36, 0.72}, Col{0.98, 0.83, 0.62}, std::pow(v / 0.5, 1.6));
      const double sunX = 0.72 * w / s, sunY = 0.2 * h / s;
      const double ds = std::hypot(u - sunX, vs - sunY);
      c = mix(c, Col{1.0, 0.93, 0.72}, 0.55 * std::exp(-ds * ds / 0.02));
      c = mix(c, Col{1.0, 0.99, 0.93}, sstep(0.07, 0.06, ds));
      const double cloud = sstep(0.55, 0.75, fractal(u * 3.0, vs * 8.0, 7)) * sstep(0.45, 0.1, v);
      c = mix(c, Col{0.97, 0.96, 0.95}, 0.85 * cloud);
      // Far mountains.
      const double ridge = 0.42 - 0.12 * fractal(u * 2.2, 0.5, 11, 5);
      if (v > ridge) c = mix(Col{0.42, 0.48, 0.62}, Col{0.33, 0.40, 0.52}, fractal(u * 9, vs * 9, 3));
      // Green hills with texture.
      const double hill = 0.55 - 0.07 * std::sin(u * 2.3 + 0.7) - 0.03 * fractal(u * 4, 1.5, 13);
      if (v > hill) {
        const double t = fractal(u * 18, vs * 18, 21);
        c = mix(Col{0.22, 0.52, 0.16}, Col{0.50, 0.68, 0.22}, t);
        c = mix(c, Col{0.12, 0.30, 0.10}, 0.5 * sstep(0.55, 0.9, fractal(u * 6, vs * 6, 5)));
      }
      // A row of dark trees on the hill line.
      const double treeTop = hill - 0.05 - 0.04 * fractal(u * 25, 2.5, 31, 2);
      if (u < 0.45 * w / s && v > treeTop && v < hill + 0.02)
        c = mix(Col{0.07, 0.24, 0.10}, Col{0.16, 0.38, 0.14}, fractal(u * 40, vs * 40, 41));
      // Flower field in the foreground.
      if (v > 0.78) {
        const int cx = (int)(u * 60), cy = (int)(vs * 60);
        const double fx = u * 60 - cx - 0.5, fy = vs * 60 - cy - 0.5;
        const double kind = rnd(cx, cy, 77);
        if (fx * fx + fy * fy < 0.09 && kind < 0.7)
          c = kind < 0.45 ? Col{0.98, 0.80, 0.12} : Col{0.92, 0.22, 0.15};
      }
      // A red house with a white window.
      const double hx = 0.62 * w / s, hy = 0.6;
      if (u > hx && u < hx + 0.16 && v > hy && v < hy + 0.12) {
        c = Col{0.72, 0.16, 0.12};
        if (u > hx + 0.05 && u < hx + 0.1 && v > hy + 0.03 && v < hy + 0.07) c = Col{0.95, 0.95, 0.9};
      }
      if (v <= hy && v > hy - 0.08 && std::fabs(u - (hx + 0.08)) < (v - (hy - 0.08)) * 1.1)
        c = Col{0.35, 0.2, 0.16};
      // A face: skin, hair, eyes, mouth.
      const double fxc = 0.22 * w / s, fyc = 0.68;
      const double ex = (u - fxc) / 0.085, ey = (v - fyc) / 0.16;
      if (ex * ex + ey * ey < 1.0) {
        const double shade = 0.9 + 0.1 * ex;
        c = Col{0.93 * shade, 0.74 * shade, 0.62 * shade};
        if (ey < -0.55) c = Col{0.25, 0.14, 0.08};
        for (int e = -1; e <= 1; e += 2) {
          const double dx = ex - 0.38 * e, dy = ey + 0.15;
          if (dx * dx + dy * dy * 4 < 0.02) c = Col{0.15, 0.25, 0.35};
        }
        if (std::fabs(ex) < 0.35 && std::fabs(ey - 0.45) < 0.05) c = Col{0.75, 0.3, 0.3};
      }
      // Sensor noise.
      const double n = (rnd(x, y, 99) - 0.5) * 0.016;
      uint8_t* p = &px[((size_t)y * (size_t)w + (size_t)x) * 4];
      p[0] = (uint8_t)std::clamp((int)std::lround((c.b + n) * 255), 0, 255);
      p[1] = (uint8_t)std::clamp((int)std::lround((c.g + n) * 255), 0, 255);
      p[2] = (uint8_t)std::clamp((int)std::lround((c.r + n) * 255), 0, 255);
      p[3] = 255;
    }
  }
  return px;
}

}  // namespace effects_sample
