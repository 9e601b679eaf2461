// Tone and colour grades: looks that change every pixel on its own.
#include <cmath>
#include <cstring>

#include "platform/image-filter/filter_grade.h"
#include "platform/image-filter/filter_looks.h"

namespace imgfilter {

namespace {

// Sepia print tones: shadow, middle and highlight colours, joined linearly.
double sepiaTone(double t, double shadow, double mid, double high) {
  return t < 0.5 ? shadow + (mid - shadow) * (t / 0.5) : mid + (high - mid) * ((t - 0.5) / 0.5);
}

}  // namespace

void lookIdentity(const Frame& f) {
  const size_t rowBytes = (size_t)f.width * 4;
  for (int y = 0; y < f.height; ++y)
    if (f.dstRow(y) != f.srcRow(y)) memmove(f.dstRow(y), f.srcRow(y), rowBytes);
}

void lookPastel(const Frame& f) {
  // Light and soft: lifted shadows, low contrast, a pink cast in the
  // highlights and a mint one in the shadows.
  Grade g;
  g.setSaturation(0.82);
  auto base = [](double t) { return range(std::pow(contrast(t, -0.12), 0.85), 0.1, 0.99); };
  g.setCurves([base](double t) { return base(t) + 0.06 * highlights(t) - 0.02 * shadows(t); },
              [base](double t) { return base(t) - 0.015 * highlights(t) + 0.05 * shadows(t); },
              [base](double t) { return base(t) + 0.035 * highlights(t) + 0.03 * shadows(t); });
  applyGrade(f, g);
}

void lookDeep(const Frame& f) {
  // Rich: a strong S-curve, deeper shadows, more saturation, a light vignette.
  Grade g;
  g.setSaturation(1.32);
  auto base = [](double t) { return std::pow(contrast(t, 0.55), 1.12); };
  g.setCurves(base, base, [base](double t) { return base(t) + 0.015 * shadows(t); });
  g.vignette = 0.28;
  applyGrade(f, g);
}

void lookRetro(const Frame& f) {
  // Cross-processed: warm yellow highlights, teal shadows, faded blacks.
  Grade g;
  g.setSaturation(0.85);
  auto base = [](double t) { return range(contrast(t, 0.25), 0.07, 0.97); };
  g.setCurves([base](double t) { return base(t) + 0.07 * highlights(t) - 0.05 * shadows(t); },
              [base](double t) { return base(t) + 0.05 * highlights(t) + 0.025 * shadows(t); },
              [base](double t) { return base(t) - 0.12 * highlights(t) + 0.07 * shadows(t); });
  applyGrade(f, g);
}

void lookFilm(const Frame& f) {
  // Colour-negative print: gentle S-curve, cyan-green shadows, warm
  // highlights and fine grain.
  Grade g;
  g.setSaturation(0.94);
  auto base = [](double t) { return range(contrast(t, 0.3), 0.03, 0.98); };
  g.setCurves([base](double t) { return base(t) + 0.04 * highlights(t) - 0.05 * shadows(t); },
              [base](double t) { return base(t) + 0.01 * highlights(t) + 0.025 * shadows(t); },
              [base](double t) { return base(t) - 0.05 * highlights(t) + 0.03 * shadows(t); });
  g.grain = 6;
  g.seed = 0x46494c4d;  // "FILM"
  applyGrade(f, g);
}

void lookCalm(const Frame& f) {
  // Cool and quiet: blue-shifted, desaturated, soft contrast.
  Grade g;
  g.setSaturation(0.62);
  auto base = [](double t) { return range(contrast(t, -0.18), 0.04, 0.97); };
  g.setCurves([base](double t) { return base(t) - 0.035 * mids(t) - 0.01; },
              [base](double t) { return base(t) + 0.005 * mids(t); },
              [base](double t) { return base(t) + 0.06 * mids(t) + 0.02; });
  applyGrade(f, g);
}

void lookDawn(const Frame& f) {
  // Early light: a warm pink-orange tone, lifted shadows, soft highlights.
  Grade g;
  g.setSaturation(0.95);
  auto base = [](double t) { return range(std::pow(t, 0.93), 0.06, 0.95); };
  g.setCurves([base](double t) { return base(t) + 0.09 * mids(t) + 0.03 * highlights(t); },
              [base](double t) { return base(t) + 0.025 * mids(t); },
              [base](double t) { return base(t) - 0.03 * shadows(t) + 0.03 * highlights(t); });
  applyGrade(f, g);
}

void lookGreyscale(const Frame& f) {
  Grade g;
  g.setMonochrome();
  applyGrade(f, g);
}

void lookEvergreen(const Frame& f) {
  // Greens emphasised and deepened, other hues muted, cool shadows.
  Selective s;
  s.target = Selective::kGreens;
  s.satOther = 0.55;
  s.satTarget = 1.4;
  s.darkenTarget = 0.14;
  auto base = [](double t) { return contrast(t, 0.15); };
  s.setCurves([base](double t) { return base(t) - 0.03 * shadows(t); },
              [base](double t) { return base(t) + 0.005 * shadows(t); },
              [base](double t) { return base(t) + 0.045 * shadows(t); });
  applySelective(f, s);
}

void lookFaded(const Frame& f) {
  // Washed out: less saturation and contrast, lifted blacks, dimmer whites.
  Grade g;
  g.setSaturation(0.58);
  auto base = [](double t) { return range(contrast(t, -0.15), 0.13, 0.9); };
  g.setCurves(base, base, base);
  applyGrade(f, g);
}

void lookOldPhoto(const Frame& f) {
  // Sepia print: brown monochrome, yellowed highlights, vignette, soft grain.
  Grade g;
  g.setMonochrome();
  auto t2 = [](double t) { return contrast(t, 0.2); };
  g.setCurves([t2](double t) { return sepiaTone(t2(t), 0.17, 0.62, 1.0); },
              [t2](double t) { return sepiaTone(t2(t), 0.11, 0.47, 0.95); },
              [t2](double t) { return sepiaTone(t2(t), 0.07, 0.32, 0.78); });
  g.vignette = 0.45;
  g.grain = 5;
  g.seed = 0x4f4c4450;  // "OLDP"
  applyGrade(f, g);
}

void lookVintage(const Frame& f) {
  // Aged colour print: muted, a warm-brown cast, brown lifted blacks, vignette.
  Grade g;
  g.setSaturation(0.68);
  g.setCurves([](double t) { return range(contrast(t, 0.1), 0.12, 0.98) + 0.04 * mids(t); },
              [](double t) { return range(contrast(t, 0.1), 0.09, 0.95) + 0.01 * mids(t); },
              [](double t) { return range(contrast(t, 0.1), 0.06, 0.85) - 0.02 * mids(t); });
  g.vignette = 0.38;
  applyGrade(f, g);
}

void lookSepia(const Frame& f) {
  Grade g;
  g.setMonochrome();
  g.setCurves([](double t) { return sepiaTone(t, 0.1, 0.6, 1.0); },
              [](double t) { return sepiaTone(t, 0.06, 0.46, 0.96); },
              [](double t) { return sepiaTone(t, 0.03, 0.32, 0.84); });
  applyGrade(f, g);
}

void lookWarm(const Frame& f) {
  Grade g;
  g.setCurves([](double t) { return t + 0.06 * mids(t); }, [](double t) { return t + 0.015 * mids(t); },
              [](double t) { return t - 0.06 * mids(t); });
  applyGrade(f, g);
}

void lookCool(const Frame& f) {
  Grade g;
  g.setCurves([](double t) { return t - 0.05 * mids(t); }, [](double t) { return t + 0.01 * mids(t); },
              [](double t) { return t + 0.07 * mids(t); });
  applyGrade(f, g);
}

}  // namespace imgfilter
