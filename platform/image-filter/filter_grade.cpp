#include "platform/image-filter/filter_grade.h"

#include <cmath>
#include <cstring>
#include <memory>
#include <vector>

#include "platform/image-filter/filter_simd.h"

#if defined(__x86_64__)
#include <immintrin.h>
#endif

namespace imgfilter {

namespace {
constexpr double kLumaW[3] = {0.2126, 0.7152, 0.0722};
constexpr int kOne = 4096;
}  // namespace

Grade::Grade() {
  setSaturation(1.0);
  setCurves([](double t) { return t; }, [](double t) { return t; }, [](double t) { return t; });
}

void Grade::setSaturation(double s) {
  s = s < 0.0 ? 0.0 : (s > 2.0 ? 2.0 : s);  // keeps results inside the curve tables
  for (int c = 0; c < 3; ++c)
    for (int k = 0; k < 3; ++k)
      m[c][k] = (int)std::lround(kOne * ((1.0 - s) * kLumaW[k] + (c == k ? s : 0.0)));
}

void Grade::setMonochrome() {
  setSaturation(0.0);
}

namespace {

// Everything one row of a grade needs; the scalar and AVX2 kernels compute
// the same integers, so results do not depend on the processor.
struct GradeRow {
  const int* m;            // 3 x 3, 4.12 fixed point
  const uint32_t* lut[3];  // curve tables, indexed -256..511 (pointer at 0)
  const uint16_t* vigCol;  // null without vignette
  int vigRow;
  const int8_t* noise;  // 256 + 8 grain values (wrapped), null without grain
  int noiseStart;       // grain index of pixel 0
};

template <int SR, int SG, int SB, int SA>
inline uint32_t gradePixel(uint32_t px, int x, const GradeRow& gr) {
  const int* m = gr.m;
  const int r = (int)((px >> SR) & 255u), g = (int)((px >> SG) & 255u), b = (int)((px >> SB) & 255u);
  int o0 = (int)gr.lut[0][(m[0] * r + m[1] * g + m[2] * b + 2048) >> 12];
  int o1 = (int)gr.lut[1][(m[3] * r + m[4] * g + m[5] * b + 2048) >> 12];
  int o2 = (int)gr.lut[2][(m[6] * r + m[7] * g + m[8] * b + 2048) >> 12];
  if (gr.vigCol) {
    const int v = (gr.vigCol[x] * gr.vigRow) >> 8;
    o0 = (o0 * v) >> 8;
    o1 = (o1 * v) >> 8;
    o2 = (o2 * v) >> 8;
  }
  if (gr.noise) {
    const int n = gr.noise[(gr.noiseStart + x) & 255];
    o0 = clamp255(o0 + n);
    o1 = clamp255(o1 + n);
    o2 = clamp255(o2 + n);
  }
  return (uint32_t)o0 << SR | (uint32_t)o1 << SG | (uint32_t)o2 << SB | (px & (255u << SA));
}

template <int SR, int SG, int SB, int SA>
void gradeRowScalar(const uint8_t* s, uint8_t* d, int from, int width, const GradeRow& gr) {
  for (int x = from; x < width; ++x)
    store32(d + (size_t)x * 4, gradePixel<SR, SG, SB, SA>(load32(s + (size_t)x * 4), x, gr));
}

#if defined(__x86_64__)
__attribute__((target("avx2"))) inline __m256i matRow(const __m256i* mm, int k, __m256i r, __m256i g,
                                                      __m256i b, __m256i round) {
  __m256i v = _mm256_add_epi32(_mm256_mullo_epi32(mm[k], r), _mm256_mullo_epi32(mm[k + 1], g));
  v = _mm256_add_epi32(v, _mm256_mullo_epi32(mm[k + 2], b));
  return _mm256_srai_epi32(_mm256_add_epi32(v, round), 12);
}

template <int SR, int SG, int SB, int SA>
__attribute__((target("avx2"))) int gradeRowAvx2(const uint8_t* s, uint8_t* d, int from, int width,
                                                 const GradeRow& gr) {
  using namespace simd;
  const __m256i k255 = _mm256_set1_epi32(255), kRound = _mm256_set1_epi32(2048);
  __m256i mm[9];
  for (int i = 0; i < 9; ++i) mm[i] = _mm256_set1_epi32(gr.m[i]);
  const int* t0 = reinterpret_cast<const int*>(gr.lut[0]);
  const int* t1 = reinterpret_cast<const int*>(gr.lut[1]);
  const int* t2 = reinterpret_cast<const int*>(gr.lut[2]);
  const __m256i vigRow = _mm256_set1_epi32(gr.vigRow);
  int x = from;
  for (; x + 8 <= width; x += 8) {
    const __m256i px = load8(s + (size_t)x * 4);
    const __m256i r = channel<SR>(px), g = channel<SG>(px), b = channel<SB>(px);

    __m256i o0 = _mm256_i32gather_epi32(t0, matRow(mm, 0, r, g, b, kRound), 4);
    __m256i o1 = _mm256_i32gather_epi32(t1, matRow(mm, 3, r, g, b, kRound), 4);
    __m256i o2 = _mm256_i32gather_epi32(t2, matRow(mm, 6, r, g, b, kRound), 4);
    if (gr.vigCol) {
      const __m256i col =
          _mm256_cvtepu16_epi32(_mm_loadu_si128(reinterpret_cast<const __m128i*>(gr.vigCol + x)));
      const __m256i v = _mm256_srai_epi32(_mm256_mullo_epi32(col, vigRow), 8);
      o0 = _mm256_srai_epi32(_mm256_mullo_epi32(o0, v), 8);
      o1 = _mm256_srai_epi32(_mm256_mullo_epi32(o1, v), 8);
      o2 = _mm256_srai_epi32(_mm256_mullo_epi32(o2, v), 8);
    }
    if (gr.noise) {
      const __m256i n = _mm256_cvtepi8_epi32(
          _mm_loadl_epi64(reinterpret_cast<const __m128i*>(gr.noise + ((gr.noiseStart + x) & 255))));
      const __m256i zero = _mm256_setzero_si256();
      o0 = _mm256_min_epi32(_mm256_max_epi32(_mm256_add_epi32(o0, n), zero), k255);
      o1 = _mm256_min_epi32(_mm256_max_epi32(_mm256_add_epi32(o1, n), zero), k255);
      o2 = _mm256_min_epi32(_mm256_max_epi32(_mm256_add_epi32(o2, n), zero), k255);
    }
    store8(d + (size_t)x * 4, pack<SR, SG, SB, SA>(o0, o1, o2, px));
  }
  return x;
}

// GCC 12's AVX-512 headers build vectors from an undefined value, which its
// own uninitialised-use warning then flags; the warning is a known false alarm.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wmaybe-uninitialized"
#pragma GCC diagnostic ignored "-Wuninitialized"
#define IF_AVX512 __attribute__((target("avx512f,avx512bw,avx512vbmi")))
// Lane inserts and extracts take immediates; q is a loop counter.
IF_AVX512 inline __m512i insertLane(__m512i a, __m128i b, int q) {
  switch (q) {
    case 0:
      return _mm512_inserti32x4(a, b, 0);
    case 1:
      return _mm512_inserti32x4(a, b, 1);
    case 2:
      return _mm512_inserti32x4(a, b, 2);
    default:
      return _mm512_inserti32x4(a, b, 3);
  }
}
IF_AVX512 inline __m128i extractLane(__m512i a, int q) {
  switch (q) {
    case 0:
      return _mm512_extracti32x4_epi32(a, 0);
    case 1:
      return _mm512_extracti32x4_epi32(a, 1);
    case 2:
      return _mm512_extracti32x4_epi32(a, 2);
    default:
      return _mm512_extracti32x4_epi32(a, 3);
  }
}

// 64 pixels at a time with AVX-512: the curve tables (clamped to 256
// entries, which is the same lookup) sit in registers and are read with
// byte permutes instead of gathers.
template <int SR, int SG, int SB, int SA>
IF_AVX512 int gradeRowVbmi(const uint8_t* s, uint8_t* d, int width, const GradeRow& gr, const uint8_t* lut8) {
  __m512i t[3][4];
  for (int k = 0; k < 3; ++k)
    for (int q = 0; q < 4; ++q) t[k][q] = _mm512_loadu_si512(lut8 + k * 256 + q * 64);
  __m512i mm[9];
  for (int i = 0; i < 9; ++i) mm[i] = _mm512_set1_epi32(gr.m[i]);
  const __m512i k255 = _mm512_set1_epi32(255), zero = _mm512_setzero_si512(), round = _mm512_set1_epi32(2048);
  const __m512i alpha = _mm512_set1_epi32((int)(255u << SA)), vigRow = _mm512_set1_epi32(gr.vigRow);
  int x = 0;
  for (; x + 64 <= width; x += 64) {
    __m512i px[4];
    __m512i idx[3] = {zero, zero, zero};
    for (int q = 0; q < 4; ++q) {
      px[q] = _mm512_loadu_si512(s + (size_t)(x + 16 * q) * 4);
      const __m512i r = _mm512_and_si512(_mm512_srli_epi32(px[q], SR), k255);
      const __m512i g = _mm512_and_si512(_mm512_srli_epi32(px[q], SG), k255);
      const __m512i b = _mm512_and_si512(_mm512_srli_epi32(px[q], SB), k255);
      for (int c = 0; c < 3; ++c) {
        __m512i v = _mm512_add_epi32(_mm512_mullo_epi32(mm[3 * c], r), _mm512_mullo_epi32(mm[3 * c + 1], g));
        v = _mm512_add_epi32(_mm512_add_epi32(v, _mm512_mullo_epi32(mm[3 * c + 2], b)), round);
        v = _mm512_max_epi32(_mm512_srai_epi32(v, 12), zero);
        // Saturating narrowing clamps at 255 as the table does.
        idx[c] = insertLane(idx[c], _mm512_cvtusepi32_epi8(v), q);
      }
    }
    __m512i o[3];
    for (int c = 0; c < 3; ++c) {
      const __m512i lo = _mm512_permutex2var_epi8(t[c][0], idx[c], t[c][1]);
      const __m512i hi = _mm512_permutex2var_epi8(t[c][2], idx[c], t[c][3]);
      o[c] = _mm512_mask_blend_epi8(_mm512_movepi8_mask(idx[c]), lo, hi);
    }
    for (int q = 0; q < 4; ++q) {
      __m512i c0 = _mm512_cvtepu8_epi32(extractLane(o[0], q));
      __m512i c1 = _mm512_cvtepu8_epi32(extractLane(o[1], q));
      __m512i c2 = _mm512_cvtepu8_epi32(extractLane(o[2], q));
      const int x0 = x + 16 * q;
      if (gr.vigCol) {
        const __m512i col =
            _mm512_cvtepu16_epi32(_mm256_loadu_si256(reinterpret_cast<const __m256i*>(gr.vigCol + x0)));
        const __m512i v = _mm512_srai_epi32(_mm512_mullo_epi32(col, vigRow), 8);
        c0 = _mm512_srai_epi32(_mm512_mullo_epi32(c0, v), 8);
        c1 = _mm512_srai_epi32(_mm512_mullo_epi32(c1, v), 8);
        c2 = _mm512_srai_epi32(_mm512_mullo_epi32(c2, v), 8);
      }
      if (gr.noise) {
        const __m512i n = _mm512_cvtepi8_epi32(
            _mm_loadu_si128(reinterpret_cast<const __m128i*>(gr.noise + ((gr.noiseStart + x0) & 255))));
        c0 = _mm512_min_epi32(_mm512_max_epi32(_mm512_add_epi32(c0, n), zero), k255);
        c1 = _mm512_min_epi32(_mm512_max_epi32(_mm512_add_epi32(c1, n), zero), k255);
        c2 = _mm512_min_epi32(_mm512_max_epi32(_mm512_add_epi32(c2, n), zero), k255);
      }
      __m512i out = _mm512_or_si512(_mm512_slli_epi32(c0, SR), _mm512_slli_epi32(c1, SG));
      out = _mm512_or_si512(_mm512_or_si512(out, _mm512_slli_epi32(c2, SB)), _mm512_and_si512(px[q], alpha));
      _mm512_storeu_si512(d + (size_t)x0 * 4, out);
    }
  }
  return x;
}

#pragma GCC diagnostic pop
#undef IF_AVX512

bool haveVbmi() {
  return __builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512bw") &&
         __builtin_cpu_supports("avx512vbmi");
}
#endif

}  // namespace

void applyGrade(const Frame& f, const Grade& g) {
  dispatchOrder(f.ch, [&](auto order) {
    constexpr Channels c = decltype(order)::ch;
    constexpr int SR = 8 * c.r, SG = 8 * c.g, SB = 8 * c.b, SA = 8 * c.a;
    int m[9];
    for (int i = 0; i < 9; ++i) m[i] = g.m[i / 3][i % 3];
    std::vector<uint32_t> tables(3 * 768);
    for (int k = 0; k < 3; ++k)
      for (int i = 0; i < 768; ++i) tables[(size_t)k * 768 + (size_t)i] = g.lut[k].v[i];
    std::unique_ptr<Vignette> vig;
    std::unique_ptr<GrainTile> grain;
    if (g.vignette > 0.0) vig = std::make_unique<Vignette>(f.width, f.height, g.vignette);
    if (g.grain > 0) grain = std::make_unique<GrainTile>(g.seed, g.grain);
    int8_t noiseRow[256 + 16];
    GradeRow gr{m,
                {&tables[256], &tables[768 + 256], &tables[1536 + 256]},
                vig ? vig->col.data() : nullptr,
                256,
                grain ? noiseRow : nullptr,
                0};
#if defined(__x86_64__)
    // The byte tables of the AVX-512 kernel: the wide tables clamped to 0..255.
    uint8_t lut8[3 * 256];
    for (int k = 0; k < 3; ++k)
      for (int i = 0; i < 256; ++i) lut8[k * 256 + i] = g.lut[k].v[i + 256];
    const bool avx2 = simdAvx2();
    const bool vbmi = avx2 && haveVbmi();
#endif
    for (int y = 0; y < f.height; ++y) {
      if (vig) gr.vigRow = vig->row[(size_t)y];
      if (grain) {
        memcpy(noiseRow, grain->row(y), 256);
        memcpy(noiseRow + 256, noiseRow, 16);
        gr.noiseStart = GrainTile::column(0, y);
      }
      int x = 0;
#if defined(__x86_64__)
      if (vbmi) x = gradeRowVbmi<SR, SG, SB, SA>(f.srcRow(y), f.dstRow(y), f.width, gr, lut8);
      if (avx2) x = gradeRowAvx2<SR, SG, SB, SA>(f.srcRow(y), f.dstRow(y), x, f.width, gr);
#endif
      gradeRowScalar<SR, SG, SB, SA>(f.srcRow(y), f.dstRow(y), x, f.width, gr);
    }
  });
}

namespace {

struct SelectiveRow {
  int satO, satT, dark;
  bool greens;
  const uint32_t* lut[3];  // indexed -256..511 (pointer at 0)
};

template <int SR, int SG, int SB, int SA>
inline uint32_t selectivePixel(uint32_t px, const SelectiveRow& sr) {
  const int r = (int)((px >> SR) & 255u), g = (int)((px >> SG) & 255u), b = (int)((px >> SB) & 255u);
  const int l = luma709(r, g, b);
  int w;
  if (sr.greens) {
    w = (g - (r > b ? r : b)) * 5;
  } else {
    const int greenish = g > r ? g - r : 0;
    w = 2 * (g - b) - 4 * greenish;
  }
  w = w < 0 ? 0 : (w > 255 ? 255 : w);
  const int sat = sr.satO + (((sr.satT - sr.satO) * w) >> 8);
  const int k = 256 - ((sr.dark * w) >> 8);
  auto adjust = [&](int c) { return ((l + (((c - l) * sat) >> 8)) * k) >> 8; };
  return sr.lut[0][adjust(r)] << SR | sr.lut[1][adjust(g)] << SG | sr.lut[2][adjust(b)] << SB |
         (px & (255u << SA));
}

#if defined(__x86_64__)
// ((l + ((c - l) * sat >> 8)) * k) >> 8, as the plain pixel does.
__attribute__((target("avx2"))) inline __m256i adjustSelective(__m256i c, __m256i l, __m256i sat, __m256i k) {
  const __m256i toward = _mm256_srai_epi32(_mm256_mullo_epi32(_mm256_sub_epi32(c, l), sat), 8);
  return _mm256_srai_epi32(_mm256_mullo_epi32(_mm256_add_epi32(l, toward), k), 8);
}

template <int SR, int SG, int SB, int SA>
__attribute__((target("avx2"))) int selectiveRowAvx2(const uint8_t* s, uint8_t* d, int from, int width,
                                                     const SelectiveRow& sr) {
  using namespace simd;
  const __m256i k255 = _mm256_set1_epi32(255), zero = _mm256_setzero_si256();
  const __m256i satO = _mm256_set1_epi32(sr.satO), satD = _mm256_set1_epi32(sr.satT - sr.satO);
  const __m256i dark = _mm256_set1_epi32(sr.dark), k256 = _mm256_set1_epi32(256);
  const int* t0 = reinterpret_cast<const int*>(sr.lut[0]);
  const int* t1 = reinterpret_cast<const int*>(sr.lut[1]);
  const int* t2 = reinterpret_cast<const int*>(sr.lut[2]);
  int x = from;
  for (; x + 8 <= width; x += 8) {
    const __m256i px = load8(s + (size_t)x * 4);
    const __m256i r = channel<SR>(px), g = channel<SG>(px), b = channel<SB>(px);
    const __m256i l = luma(r, g, b);
    __m256i w;
    if (sr.greens) {
      w = _mm256_mullo_epi32(_mm256_sub_epi32(g, _mm256_max_epi32(r, b)), _mm256_set1_epi32(5));
    } else {
      const __m256i greenish = _mm256_max_epi32(_mm256_sub_epi32(g, r), zero);
      w = _mm256_sub_epi32(_mm256_slli_epi32(_mm256_sub_epi32(g, b), 1), _mm256_slli_epi32(greenish, 2));
    }
    w = _mm256_min_epi32(_mm256_max_epi32(w, zero), k255);
    const __m256i sat = _mm256_add_epi32(satO, _mm256_srai_epi32(_mm256_mullo_epi32(satD, w), 8));
    const __m256i k = _mm256_sub_epi32(k256, _mm256_srai_epi32(_mm256_mullo_epi32(dark, w), 8));
    store8(d + (size_t)x * 4,
           pack<SR, SG, SB, SA>(_mm256_i32gather_epi32(t0, adjustSelective(r, l, sat, k), 4),
                                _mm256_i32gather_epi32(t1, adjustSelective(g, l, sat, k), 4),
                                _mm256_i32gather_epi32(t2, adjustSelective(b, l, sat, k), 4), px));
  }
  return x;
}

#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wmaybe-uninitialized"
#pragma GCC diagnostic ignored "-Wuninitialized"
// 64 pixels at a time, curves read with byte permutes (see gradeRowVbmi).
template <int SR, int SG, int SB, int SA>
__attribute__((target("avx512f,avx512bw,avx512vbmi"))) int selectiveRowVbmi(const uint8_t* s, uint8_t* d,
                                                                            int width, const SelectiveRow& sr,
                                                                            const uint8_t* lut8) {
  __m512i t[3][4];
  for (int k = 0; k < 3; ++k)
    for (int q = 0; q < 4; ++q) t[k][q] = _mm512_loadu_si512(lut8 + k * 256 + q * 64);
  const __m512i k255 = _mm512_set1_epi32(255), zero = _mm512_setzero_si512();
  const __m512i alpha = _mm512_set1_epi32((int)(255u << SA));
  const __m512i wR = _mm512_set1_epi32(54), wG = _mm512_set1_epi32(183), wB = _mm512_set1_epi32(19);
  const __m512i satO = _mm512_set1_epi32(sr.satO), satD = _mm512_set1_epi32(sr.satT - sr.satO);
  const __m512i dark = _mm512_set1_epi32(sr.dark), k256 = _mm512_set1_epi32(256), five = _mm512_set1_epi32(5);
  int x = 0;
  for (; x + 64 <= width; x += 64) {
    __m512i px[4];
    __m512i idx[3] = {zero, zero, zero};
    for (int q = 0; q < 4; ++q) {
      px[q] = _mm512_loadu_si512(s + (size_t)(x + 16 * q) * 4);
      const __m512i r = _mm512_and_si512(_mm512_srli_epi32(px[q], SR), k255);
      const __m512i g = _mm512_and_si512(_mm512_srli_epi32(px[q], SG), k255);
      const __m512i b = _mm512_and_si512(_mm512_srli_epi32(px[q], SB), k255);
      const __m512i l = _mm512_srai_epi32(
          _mm512_add_epi32(_mm512_add_epi32(_mm512_mullo_epi32(r, wR), _mm512_mullo_epi32(g, wG)),
                           _mm512_mullo_epi32(b, wB)),
          8);
      __m512i w;
      if (sr.greens) {
        w = _mm512_mullo_epi32(_mm512_sub_epi32(g, _mm512_max_epi32(r, b)), five);
      } else {
        const __m512i greenish = _mm512_max_epi32(_mm512_sub_epi32(g, r), zero);
        w = _mm512_sub_epi32(_mm512_slli_epi32(_mm512_sub_epi32(g, b), 1), _mm512_slli_epi32(greenish, 2));
      }
      w = _mm512_min_epi32(_mm512_max_epi32(w, zero), k255);
      const __m512i sat = _mm512_add_epi32(satO, _mm512_srai_epi32(_mm512_mullo_epi32(satD, w), 8));
      const __m512i kk = _mm512_sub_epi32(k256, _mm512_srai_epi32(_mm512_mullo_epi32(dark, w), 8));
      const __m512i ch[3] = {r, g, b};
      for (int c = 0; c < 3; ++c) {
        const __m512i moved = _mm512_srai_epi32(_mm512_mullo_epi32(_mm512_sub_epi32(ch[c], l), sat), 8);
        __m512i v = _mm512_srai_epi32(_mm512_mullo_epi32(_mm512_add_epi32(l, moved), kk), 8);
        v = _mm512_max_epi32(v, zero);
        idx[c] = insertLane(idx[c], _mm512_cvtusepi32_epi8(v), q);
      }
    }
    __m512i o[3];
    for (int c = 0; c < 3; ++c) {
      const __m512i lo = _mm512_permutex2var_epi8(t[c][0], idx[c], t[c][1]);
      const __m512i hi = _mm512_permutex2var_epi8(t[c][2], idx[c], t[c][3]);
      o[c] = _mm512_mask_blend_epi8(_mm512_movepi8_mask(idx[c]), lo, hi);
    }
    for (int q = 0; q < 4; ++q) {
      const __m512i c0 = _mm512_cvtepu8_epi32(extractLane(o[0], q));
      const __m512i c1 = _mm512_cvtepu8_epi32(extractLane(o[1], q));
      const __m512i c2 = _mm512_cvtepu8_epi32(extractLane(o[2], q));
      __m512i out = _mm512_or_si512(_mm512_slli_epi32(c0, SR), _mm512_slli_epi32(c1, SG));
      out = _mm512_or_si512(_mm512_or_si512(out, _mm512_slli_epi32(c2, SB)), _mm512_and_si512(px[q], alpha));
      _mm512_storeu_si512(d + (size_t)(x + 16 * q) * 4, out);
    }
  }
  return x;
}
#pragma GCC diagnostic pop
#endif

}  // namespace

void applySelective(const Frame& f, const Selective& sel) {
  dispatchOrder(f.ch, [&](auto order) {
    constexpr Channels c = decltype(order)::ch;
    constexpr int SR = 8 * c.r, SG = 8 * c.g, SB = 8 * c.b, SA = 8 * c.a;
    std::vector<uint32_t> tables(3 * 768);
    for (int k = 0; k < 3; ++k)
      for (int i = 0; i < 768; ++i) tables[(size_t)k * 768 + (size_t)i] = sel.lut[k].v[i];
    const SelectiveRow sr{(int)std::lround(sel.satOther * 256.0),
                          (int)std::lround(sel.satTarget * 256.0),
                          (int)std::lround(sel.darkenTarget * 256.0),
                          sel.target == Selective::kGreens,
                          {&tables[256], &tables[768 + 256], &tables[1536 + 256]}};
#if defined(__x86_64__)
    uint8_t lut8[3 * 256];
    for (int k = 0; k < 3; ++k)
      for (int i = 0; i < 256; ++i) lut8[k * 256 + i] = sel.lut[k].v[i + 256];
    const bool avx2 = simdAvx2();
    const bool vbmi = avx2 && haveVbmi();
#endif
    for (int y = 0; y < f.height; ++y) {
      const uint8_t* s = f.srcRow(y);
      uint8_t* d = f.dstRow(y);
      int x = 0;
#if defined(__x86_64__)
      if (vbmi) x = selectiveRowVbmi<SR, SG, SB, SA>(s, d, f.width, sr, lut8);
      if (avx2) x = selectiveRowAvx2<SR, SG, SB, SA>(s, d, x, f.width, sr);
#endif
      for (; x < f.width; ++x)
        store32(d + (size_t)x * 4, selectivePixel<SR, SG, SB, SA>(load32(s + (size_t)x * 4), sr));
    }
  });
}

}  // namespace imgfilter
