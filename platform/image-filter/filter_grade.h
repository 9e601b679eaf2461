#pragma once
// Internal to the image filter: the two per-pixel colour grades most looks
// are built from. A Grade is a 3 x 3 colour matrix followed by one curve per
// channel, with optional vignette and grain; a Selective grade changes the
// saturation by hue (greens, or yellows and oranges) before its curves.

#include <cstdint>

#include "platform/image-filter/filter_frame.h"

namespace imgfilter {

struct Grade {
  int m[3][3];  // rows: output R, G, B; columns: input R, G, B; 4.12 fixed point
  WideLut lut[3];
  double vignette = 0.0;  // darkening at the corners, 0..1
  int grain = 0;          // grain amplitude in levels
  uint64_t seed = 0;

  Grade();
  // Matrix that scales the distance from Rec. 709 luma by `s` (1 = unchanged, 0 = grey).
  void setSaturation(double s);
  // Matrix that replaces every channel by Rec. 709 luma.
  void setMonochrome();
  // Adds `t` (0..1 per channel) to the matrix output, e.g. a colour cast.
  template <typename FR, typename FG, typename FB>
  void setCurves(FR&& fr, FG&& fg, FB&& fb) {
    lut[0].build(fr);
    lut[1].build(fg);
    lut[2].build(fb);
  }
};

void applyGrade(const Frame& f, const Grade& g);

struct Selective {
  enum Target { kGreens, kWarmHues } target = kGreens;
  double satOther = 1.0;      // saturation of the other hues
  double satTarget = 1.0;     // saturation of the target hue
  double darkenTarget = 0.0;  // 0..1: the target hue gets darker by this at full weight
  WideLut lut[3];
  template <typename FR, typename FG, typename FB>
  void setCurves(FR&& fr, FG&& fg, FB&& fb) {
    lut[0].build(fr);
    lut[1].build(fg);
    lut[2].build(fb);
  }
};

void applySelective(const Frame& f, const Selective& s);

// Curve helpers on 0..1.
inline double shadows(double t) {
  return (1.0 - t) * (1.0 - t);
}
inline double highlights(double t) {
  return t * t;
}
inline double mids(double t) {
  return 4.0 * t * (1.0 - t);
}
// k > 0 adds an S-curve (k = 1: smoothstep), k < 0 flattens towards mid grey.
inline double contrast(double t, double k) {
  return k >= 0.0 ? t + k * (smooth01(t) - t) : 0.5 + (t - 0.5) * (1.0 + k);
}
// Maps 0..1 onto black..white (lifted blacks, dimmed whites).
inline double range(double t, double black, double white) {
  return black + t * (white - black);
}

}  // namespace imgfilter
