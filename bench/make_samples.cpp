// Writes procedural sample photos (JPEG) for the render command and the
// benchmarks: a few painted scenes, some stored sideways with an EXIF
// orientation tag so that only a viewer honouring the tag shows them upright.
//
//   bench_make_samples OUTDIR [--size WxH] [--count N] [--quality Q] [--noise SIGMA]
//
// Default: six 1600 x 1200 scenes, quality 90, light sensor noise; photos 2
// and 5 carry orientation 6 (stored turned a quarter counter-clockwise).
// Prints the written paths, one per line.

#include <sys/stat.h>

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <random>
#include <string>
#include <vector>

// jpeglib.h needs size_t and FILE declared first.
#include <jpeglib.h>

namespace {

struct Image {
  int w = 0, h = 0;
  std::vector<uint8_t> rgb;  // 3 bytes per pixel
  void put(int x, int y, float r, float g, float b) {
    if (x < 0 || y < 0 || x >= w || y >= h) return;
    uint8_t* p = &rgb[3 * ((size_t)y * w + x)];
    p[0] = (uint8_t)std::max(0.f, std::min(255.f, r));
    p[1] = (uint8_t)std::max(0.f, std::min(255.f, g));
    p[2] = (uint8_t)std::max(0.f, std::min(255.f, b));
  }
};

float mix(float a, float b, float t) {
  return a + (b - a) * t;
}
float smooth(float e0, float e1, float x) {
  float t = std::max(0.f, std::min(1.f, (x - e0) / (e1 - e0)));
  return t * t * (3 - 2 * t);
}

// Cheap value noise for texture (hills, water, clouds).
float hash2(int x, int y, int seed) {
  uint32_t h = (uint32_t)x * 374761393u + (uint32_t)y * 668265263u + (uint32_t)seed * 2246822519u;
  h = (h ^ (h >> 13)) * 1274126177u;
  return ((h ^ (h >> 16)) & 0xffff) / 65535.f;
}
float vnoise(float x, float y, int seed) {
  int xi = (int)std::floor(x), yi = (int)std::floor(y);
  float fx = x - xi, fy = y - yi;
  fx = fx * fx * (3 - 2 * fx);
  fy = fy * fy * (3 - 2 * fy);
  float a = hash2(xi, yi, seed), b = hash2(xi + 1, yi, seed);
  float c = hash2(xi, yi + 1, seed), d = hash2(xi + 1, yi + 1, seed);
  return mix(mix(a, b, fx), mix(c, d, fx), fy);
}
float fbm(float x, float y, int seed) {
  float s = 0, a = 0.5f;
  for (int o = 0; o < 4; o++, x *= 2, y *= 2, a *= 0.5f) s += a * vnoise(x, y, seed + o);
  return s;
}

// Each scene maps normalised coordinates (u right, v down, 0..1) to a colour.
using Scene = void (*)(float u, float v, float aspect, float* rgb);

void sceneHills(float u, float v, float, float* c) {  // sky, sun, green hills, lake
  float sky = v;
  c[0] = mix(90, 200, sky), c[1] = mix(150, 225, sky), c[2] = mix(235, 250, sky);
  float sd = std::hypot(u - 0.75f, (v - 0.2f) * 0.75f);
  float sun = 1 - smooth(0.06f, 0.075f, sd);
  for (int i = 0; i < 3; i++) c[i] = mix(c[i], i == 2 ? 120.f : 250.f, sun);
  float hill = 0.55f + 0.08f * std::sin(u * 7.f) + 0.05f * fbm(u * 4, 0, 3);
  if (v > hill) {
    float t = fbm(u * 30, v * 30, 5);
    c[0] = mix(40, 90, t), c[1] = mix(110, 170, t), c[2] = mix(30, 60, t);
  }
  if (v > 0.8f) {
    float t = fbm(u * 10, v * 60, 9);
    c[0] = mix(30, 80, t), c[1] = mix(80, 130, t), c[2] = mix(150, 200, t);
  }
}

void sceneSunset(float u, float v, float, float* c) {  // orange sky, dark mountains
  c[0] = mix(250, 120, v), c[1] = mix(160, 40, v), c[2] = mix(60, 90, v);
  float sd = std::hypot(u - 0.4f, v - 0.62f);
  float sun = 1 - smooth(0.1f, 0.12f, sd);
  c[0] = mix(c[0], 255, sun), c[1] = mix(c[1], 220, sun), c[2] = mix(c[2], 120, sun);
  float ridge = 0.6f - 0.25f * std::fabs(std::fmod(u * 3.f + 10.f, 2.f) - 1.f) + 0.05f * fbm(u * 8, 1, 2);
  if (v > ridge) c[0] = 40, c[1] = 25, c[2] = 50;
  float ridge2 = 0.78f - 0.1f * std::sin(u * 11.f) * std::cos(u * 3.f);
  if (v > ridge2) c[0] = 20, c[1] = 12, c[2] = 28;
}

void sceneCity(float u, float v, float, float* c) {  // night sky, buildings with windows
  c[0] = mix(10, 40, v), c[1] = mix(20, 30, v), c[2] = mix(60, 80, v);
  if (hash2((int)(u * 300), (int)(v * 300), 77) > 0.997f && v < 0.5f) c[0] = c[1] = c[2] = 240;
  int b = (int)(u * 9);
  float top = 0.25f + 0.45f * hash2(b, 0, 11);
  if (v > top) {
    float g = 50 + 40 * hash2(b, 1, 12);
    c[0] = g, c[1] = g, c[2] = g + 10;
    float lu = std::fmod(u * 9 * 6, 1.f), lv = std::fmod((v - top) * 40, 1.f);
    if (lu > 0.3f && lu < 0.7f && lv > 0.3f && lv < 0.75f &&
        hash2((int)(u * 54), (int)((v - top) * 40), 13) > 0.45f)
      c[0] = 250, c[1] = 210, c[2] = 110;
  }
}

void sceneFlower(float u, float v, float aspect, float* c) {  // petals on a leafy background
  float t = fbm(u * 12, v * 12, 21);
  c[0] = mix(20, 70, t), c[1] = mix(70, 140, t), c[2] = mix(20, 50, t);
  float x = (u - 0.5f) * aspect, y = v - 0.5f;
  float r = std::hypot(x, y), a = std::atan2(y, x);
  float petal = 0.33f * (0.65f + 0.35f * std::cos(a * 7));
  if (r < petal) {
    float s = r / petal;
    c[0] = mix(255, 215, s), c[1] = mix(150, 60, s), c[2] = mix(200, 140, s);
  }
  if (r < 0.08f) c[0] = 250, c[1] = mix(200, 150, r / 0.08f), c[2] = 40;
}

void sceneBeach(float u, float v, float, float* c) {  // sky, sea, sand, a parasol
  c[0] = mix(120, 200, v * 2), c[1] = mix(180, 230, v * 2), c[2] = 250;
  if (v > 0.45f) {
    float w = 0.5f + 0.5f * std::sin(u * 60 + v * 200);
    c[0] = mix(20, 60, w), c[1] = mix(110, 160, w), c[2] = mix(160, 200, w);
  }
  float shore = 0.68f + 0.03f * std::sin(u * 9);
  if (v > shore) {
    float t = fbm(u * 80, v * 80, 31);
    c[0] = mix(210, 240, t), c[1] = mix(185, 215, t), c[2] = mix(130, 160, t);
  }
  float pd = std::hypot(u - 0.3f, (v - 0.62f) * 1.6f);
  if (v < 0.62f && pd < 0.14f) {
    bool red = ((int)((std::atan2(v - 0.62f, u - 0.3f) + 4) * 4)) % 2;
    c[0] = red ? 220 : 250, c[1] = red ? 40 : 250, c[2] = red ? 50 : 240;
  }
  if (std::fabs(u - 0.3f) < 0.004f && v >= 0.62f && v < 0.85f) c[0] = c[1] = c[2] = 90;
}

void sceneBalloons(float u, float v, float aspect, float* c) {  // balloons in a blue sky
  c[0] = mix(60, 170, v), c[1] = mix(120, 210, v), c[2] = mix(220, 245, v);
  const float cols[5][3] = {{230, 60, 60}, {250, 200, 40}, {60, 190, 90}, {150, 80, 210}, {250, 130, 30}};
  for (int i = 0; i < 9; i++) {
    float bx = 0.1f + 0.8f * hash2(i, 3, 41), by = 0.15f + 0.6f * hash2(i, 4, 41);
    float br = 0.05f + 0.05f * hash2(i, 5, 41);
    float d = std::hypot((u - bx) * aspect, (v - by) * 0.85f);
    if (d < br) {
      float shade = 1.0f - 0.4f * d / br;
      for (int k = 0; k < 3; k++) c[k] = cols[i % 5][k] * shade;
    }
    if (std::fabs((u - bx) * aspect) < 0.002f && v > by + br * 1.1f && v < by + br * 3)
      c[0] = c[1] = c[2] = 60;
  }
}

const Scene kScenes[] = {sceneHills, sceneSunset, sceneCity, sceneFlower, sceneBeach, sceneBalloons};

Image paint(int w, int h, int sceneIndex, float noise, unsigned seed) {
  Image img;
  img.w = w, img.h = h;
  img.rgb.resize((size_t)w * h * 3);
  std::mt19937 rng(seed);
  std::normal_distribution<float> gauss(0.f, noise > 0 ? noise : 1.f);
  Scene scene = kScenes[sceneIndex % 6];
  const float aspect = (float)w / h;
  for (int y = 0; y < h; y++)
    for (int x = 0; x < w; x++) {
      float c[3];
      scene((x + 0.5f) / w, (y + 0.5f) / h, aspect, c);
      if (noise > 0) {
        float n = gauss(rng);
        c[0] += n, c[1] += n + gauss(rng) * 0.3f, c[2] += n;
      }
      img.put(x, y, c[0], c[1], c[2]);
    }
  return img;
}

// The upright picture stored a quarter turn counter-clockwise: a viewer must
// turn it clockwise (EXIF orientation 6) to show it upright.
Image turnCounterClockwise(const Image& in) {
  Image out;
  out.w = in.h, out.h = in.w;
  out.rgb.resize(in.rgb.size());
  for (int y = 0; y < out.h; y++)
    for (int x = 0; x < out.w; x++) {
      // out(x, y) = in(W - 1 - y, x)
      const uint8_t* s = &in.rgb[3 * ((size_t)x * in.w + (in.w - 1 - y))];
      memcpy(&out.rgb[3 * ((size_t)y * out.w + x)], s, 3);
    }
  return out;
}

bool writeJpeg(const std::string& path, const Image& img, int quality, int orientation) {
  FILE* f = fopen(path.c_str(), "wb");
  if (!f) {
    fprintf(stderr, "make_samples: cannot write %s: %s\n", path.c_str(), strerror(errno));
    return false;
  }
  jpeg_compress_struct cinfo;
  jpeg_error_mgr jerr;
  cinfo.err = jpeg_std_error(&jerr);
  jpeg_create_compress(&cinfo);
  jpeg_stdio_dest(&cinfo, f);
  cinfo.image_width = img.w;
  cinfo.image_height = img.h;
  cinfo.input_components = 3;
  cinfo.in_color_space = JCS_RGB;
  jpeg_set_defaults(&cinfo);
  jpeg_set_quality(&cinfo, quality, TRUE);
  jpeg_start_compress(&cinfo, TRUE);
  if (orientation >= 1) {
    // APP1 "Exif": little-endian TIFF header, IFD0 with the one Orientation entry.
    const uint8_t exif[] = {'E',  'x',  'i', 'f', 0, 0, 'I', 'I', 42,
                            0,    8,    0,   0,   0,  // header, IFD0 at 8
                            1,    0,                  // one entry
                            0x12, 0x01, 3,   0,   1, 0, 0,   0,   (uint8_t)orientation,
                            0,    0,    0,        // SHORT value
                            0,    0,    0,   0};  // no next IFD
    jpeg_write_marker(&cinfo, JPEG_APP0 + 1, exif, sizeof exif);
  }
  while (cinfo.next_scanline < cinfo.image_height) {
    JSAMPROW row = const_cast<JSAMPROW>(&img.rgb[(size_t)cinfo.next_scanline * img.w * 3]);
    jpeg_write_scanlines(&cinfo, &row, 1);
  }
  jpeg_finish_compress(&cinfo);
  jpeg_destroy_compress(&cinfo);
  bool ok = fflush(f) == 0 && !ferror(f);
  ok = (fclose(f) == 0) && ok;
  if (!ok) fprintf(stderr, "make_samples: failed writing %s\n", path.c_str());
  return ok;
}

int usage() {
  fprintf(stderr,
          "usage: bench_make_samples OUTDIR [--size WxH] [--count N] [--quality Q] [--noise SIGMA]\n");
  return 2;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc < 2 || argv[1][0] == '-') return usage();
  std::string dir = argv[1];
  int w = 1600, h = 1200, count = 6, quality = 90;
  float noise = 3.0f;
  for (int i = 2; i < argc; i++) {
    std::string a = argv[i];
    if (i + 1 >= argc) return usage();
    const char* v = argv[++i];
    if (a == "--size") {
      if (sscanf(v, "%dx%d", &w, &h) != 2 || w < 8 || h < 8 || w > 12000 || h > 12000) return usage();
    } else if (a == "--count") {
      count = atoi(v);
      if (count < 1 || count > 64) return usage();
    } else if (a == "--quality") {
      quality = atoi(v);
      if (quality < 1 || quality > 100) return usage();
    } else if (a == "--noise") {
      noise = (float)atof(v);
    } else {
      return usage();
    }
  }
  if (mkdir(dir.c_str(), 0755) != 0 && errno != EEXIST) {
    fprintf(stderr, "make_samples: cannot create %s: %s\n", dir.c_str(), strerror(errno));
    return 1;
  }
  for (int i = 0; i < count; i++) {
    // Photos 2 and 5 (1-based) are stored sideways with orientation 6.
    const bool sideways = (i % 3) == 1;
    Image img = paint(w, h, i, noise, 1234u + i);
    if (sideways) img = turnCounterClockwise(img);
    char name[64];
    snprintf(name, sizeof name, "/sample_%d.jpg", i + 1);
    if (!writeJpeg(dir + name, img, quality, sideways ? 6 : 1)) return 1;
    printf("%s%s\n", dir.c_str(), name);
  }
  return 0;
}
