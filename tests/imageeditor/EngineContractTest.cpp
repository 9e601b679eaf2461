// The effects engine's contract: byte orders, return codes, the effect and
// filter-code tables, sizes, determinism and threads.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <set>
#include <string>
#include <thread>

#include "image-editor/IE_Effects.h"
#include "image-editor/IE_Engine.h"
#include "tests/imageeditor/EffectTestImages.h"

using effects_test::apply;
using effects_test::makeImage;
using effects_test::reversed;

namespace {

std::vector<int> offeredEffects() {
  std::vector<int> out;
  for (int i = 0; i < IE_Engine_Effect_Count(); ++i) out.push_back(IE_Engine_Effect_Get(i)->effectNumber);
  return out;
}

}  // namespace

TEST(EffectTables, EffectTableIsTheEditorsNineteenInDisplayOrder) {
  const std::pair<const char*, int> expected[] = {{"IDS_IMGE_BUTTON_PASTEL_M_EFFECT_ABB", 35},
                                                  {"IDS_IMGE_BUTTON_DEEP_M_EFFECT_ABB", 32},
                                                  {"IDS_IV_OPT_RETRO_M_EFFECT", 15},
                                                  {"IDS_IMGE_BUTTON_FILM_M_EFFECT_ABB", 34},
                                                  {"IDS_IMGE_BUTTON_CALM_M_EFFECT_ABB", 30},
                                                  {"IDS_IMGE_BUTTON_DAWN_M_EFFECT_ABB", 31},
                                                  {"IDS_IV_OPT_GREYSCALE_M_EFFECT", 3},
                                                  {"IDS_IMGE_BUTTON_EVERGREEN_M_EFFECT_ABB", 33},
                                                  {"IDS_IV_OPT_FADED_COLOURS_M_EFFECT", 5},
                                                  {"IDS_IV_OPT_OLD_PHOTO_M_EFFECT", 1},
                                                  {"IDS_IV_OPT_BLUR_M_EFFECT", 14},
                                                  {"IDS_IV_OPT_NOSTALGIA_M_EFFECT", 17},
                                                  {"IDS_IV_OPT_SUNSHINE_M_EFFECT", 16},
                                                  {"IDS_IV_OPT_VINTAGE_M_EFFECT", 0},
                                                  {"IDS_IV_OPT_SHARPEN_M_EFFECT", 8},
                                                  {"IDS_IV_OPT_SOFT_GLOW_M_EFFECT", 9},
                                                  {"IDS_IMGE_BUTTON_STARDUST_M_EFFECT_ABB", 22},
                                                  {"IDS_IMGE_BUTTON_LIGHT_FLARE_M_EFFECT", 23},
                                                  {"IDS_IV_OPT_CARTOON_M_EFFECT", 7}};
  ASSERT_EQ(IE_Engine_Effect_Count(), 19);
  for (int i = 0; i < 19; ++i) {
    EXPECT_STREQ(IE_Engine_Effect_Get(i)->labelId, expected[i].first) << i;
    EXPECT_EQ(IE_Engine_Effect_Get(i)->effectNumber, expected[i].second) << i;
  }
  EXPECT_EQ(IE_Engine_Effect_Get(-1), nullptr);
  EXPECT_EQ(IE_Engine_Effect_Get(19), nullptr);
}

TEST(EffectTables, FilterCodesByEffectNumberAnd400AboveTheTable) {
  const int codes[37] = {203, 410, 204, 205, 202, 206, 213, 201, 211, 210, 207, 605, 208,
                         606, 602, 412, 212, 603, 604, 209, 607, 214, 608, 609, 610, 611,
                         215, 218, 217, 216, 417, 418, 419, 420, 421, 422, 423};
  for (int n = 0; n < 37; ++n) EXPECT_EQ(IE_Engine_Filter_Code(n), codes[n]) << n;
  EXPECT_EQ(IE_Engine_Filter_Code(37), 400);
  EXPECT_EQ(IE_Engine_Filter_Code(1000), 400);
  EXPECT_EQ(IE_Engine_Filter_Code(-1), 400);
}

TEST(EngineContract, EffectNumbersAbove36RunCode400WhichLeavesThePhotoAsItIs) {
  const auto src = makeImage(31, 17);
  for (int format : {8, 9})
    for (int effect : {37, 38, 500}) {
      int rc = -1;
      EXPECT_EQ(apply(src, 31, 17, format, effect, &rc), src) << effect;
      EXPECT_EQ(rc, IE_ERROR_NONE);
    }
}

TEST(EngineContract, Format9SourceComesBackUnchangedAndResultIsFormat9) {
  const int w = 40, h = 30;
  const auto original = makeImage(w, h, 3);
  for (int effect : {3, 14, 22, 35}) {  // surface and buffer paths
    std::vector<uint8_t> in = original, out(original.size(), 0);
    IeImageInfo s{w, h, IE_FORMAT_ARGB8888, in.data()};
    IeImageInfo d{w, h, 0, out.data()};
    ASSERT_EQ(IE_Engine_Apply_Effect(&s, &d, effect), IE_ERROR_NONE);
    EXPECT_EQ(in, original) << effect;
    EXPECT_EQ(s.format, IE_FORMAT_ARGB8888);
    EXPECT_EQ(d.format, IE_FORMAT_ARGB8888);
    // The same look in the other byte order: format 9 is format 8 turned round.
    EXPECT_EQ(out, reversed(apply(reversed(original), w, h, 8, effect))) << effect;
  }
}

TEST(EngineContract, Format8ResultIsFormat8AndTheSourceIsNotWritten) {
  const auto original = reversed(makeImage(20, 20, 4));
  std::vector<uint8_t> in = original, out(original.size(), 0);
  IeImageInfo s{20, 20, IE_FORMAT_BGRA8888, in.data()};
  IeImageInfo d{20, 20, 9, out.data()};
  ASSERT_EQ(IE_Engine_Apply_Effect(&s, &d, 1), IE_ERROR_NONE);
  EXPECT_EQ(d.format, IE_FORMAT_BGRA8888);
  EXPECT_EQ(in, original);
}

TEST(EngineContract, DestinationOfAnotherSizeTakesTheSourceSize) {
  const auto src = makeImage(12, 9);
  std::vector<uint8_t> in = src, out(src.size(), 0);
  IeImageInfo s{12, 9, IE_FORMAT_ARGB8888, in.data()};
  IeImageInfo d{3, 4, IE_FORMAT_BGRA8888, out.data()};
  ASSERT_EQ(IE_Engine_Apply_Effect(&s, &d, 5), IE_ERROR_NONE);
  EXPECT_EQ(d.width, 12);
  EXPECT_EQ(d.height, 9);
  EXPECT_EQ(d.format, IE_FORMAT_ARGB8888);
}

TEST(EngineContract, InvalidRecordsGiveTheirCodesAndLeaveTheDestination) {
  std::vector<uint8_t> px = makeImage(4, 4), out(px.size(), 7);
  IeImageInfo good{4, 4, IE_FORMAT_ARGB8888, px.data()};
  IeImageInfo d{4, 4, 0, out.data()};
  EXPECT_EQ(IE_Engine_Apply_Effect(nullptr, &d, 3), IE_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(IE_Engine_Apply_Effect(&good, nullptr, 3), IE_ERROR_INVALID_PARAMETER);
  IeImageInfo noBuf{4, 4, IE_FORMAT_ARGB8888, nullptr};
  EXPECT_EQ(IE_Engine_Apply_Effect(&noBuf, &d, 3), IE_ERROR_INVALID_PARAMETER);
  IeImageInfo dNoBuf{4, 4, 0, nullptr};
  EXPECT_EQ(IE_Engine_Apply_Effect(&good, &dNoBuf, 3), IE_ERROR_INVALID_PARAMETER);
  for (auto [w, h] : {std::pair{0, 4}, {4, 0}, {-2, 4}, {4, -1}}) {
    IeImageInfo s{w, h, IE_FORMAT_ARGB8888, px.data()};
    EXPECT_EQ(IE_Engine_Apply_Effect(&s, &d, 3), IE_ERROR_INVALID_SIZE) << w << "x" << h;
  }
  for (int format : {0, 10, 255}) {
    IeImageInfo s{4, 4, (uint16_t)format, px.data()};
    EXPECT_EQ(IE_Engine_Apply_Effect(&s, &d, 3), IE_ERROR_INVALID_FORMAT) << format;
  }
  // Valid codes that are not 32-bit cannot be filtered: reported, not passed off as done.
  for (int format : {1, 2, 3, 7}) {
    IeImageInfo s{4, 4, (uint16_t)format, px.data()};
    EXPECT_EQ(IE_Engine_Apply_Effect(&s, &d, 3), IE_ERROR_INVALID_FORMAT) << format;
  }
  EXPECT_EQ(out, std::vector<uint8_t>(px.size(), 7));
  EXPECT_EQ(px, makeImage(4, 4));
}

TEST(EngineContract, EveryEffectKeepsSizeAndAlphaChangesTheImageAndRepeatsExactly) {
  const int w = 64, h = 48;
  const auto src = makeImage(w, h, 7);
  std::set<std::vector<uint8_t>> distinct;
  for (int effect : offeredEffects()) {
    std::vector<uint8_t> in = src, out(src.size(), 0);
    IeImageInfo s{w, h, IE_FORMAT_ARGB8888, in.data()};
    IeImageInfo d{1, 1, 0, out.data()};
    ASSERT_EQ(IE_Engine_Apply_Effect(&s, &d, effect), IE_ERROR_NONE) << effect;
    EXPECT_EQ(d.width, w);
    EXPECT_EQ(d.height, h);
    EXPECT_NE(out, src) << "effect " << effect << " changed nothing";
    for (size_t i = 3; i < out.size(); i += 4) ASSERT_EQ(out[i], src[i]) << "alpha of effect " << effect;
    EXPECT_EQ(apply(src, w, h, 9, effect), out) << "effect " << effect << " is not repeatable";
    distinct.insert(out);
  }
  EXPECT_EQ(distinct.size(), 19u) << "two effects give the same look";
}

TEST(EngineContract, EffectsOnTinyAndThinImagesKeepTheirSize) {
  for (auto [w, h] : {std::pair{1, 1}, {1, 9}, {9, 1}, {2, 3}, {3, 2}}) {
    const auto src = makeImage(w, h, 11);
    for (int effect : offeredEffects()) {
      int rc = -1;
      const auto out = apply(src, w, h, 9, effect, &rc);
      EXPECT_EQ(rc, IE_ERROR_NONE) << effect << " on " << w << "x" << h;
      EXPECT_EQ(out.size(), src.size());
    }
  }
}

TEST(EngineContract, SameBytesOnSeveralThreadsSharingOneSource) {
  // The editor filters thumbnails of one source on worker threads.
  const int w = 96, h = 64;
  std::vector<uint8_t> shared = makeImage(w, h, 13);
  const std::vector<uint8_t> original = shared;
  const std::vector<int> effects = offeredEffects();
  std::vector<std::vector<uint8_t>> expected;
  for (int e : effects) expected.push_back(apply(original, w, h, 9, e));

  std::vector<std::vector<uint8_t>> results[2];
  auto worker = [&](int t) {
    for (int round = 0; round < 3; ++round)
      for (size_t i = 0; i < effects.size(); ++i) {
        std::vector<uint8_t> out(shared.size(), 0);
        IeImageInfo s{w, h, IE_FORMAT_ARGB8888, shared.data()};
        IeImageInfo d{w, h, 0, out.data()};
        IE_Engine_Apply_Effect(&s, &d, effects[(i + (size_t)t * 7) % effects.size()]);
        results[t].push_back(std::move(out));
      }
  };
  std::thread a(worker, 0), b(worker, 1);
  a.join();
  b.join();
  for (int t = 0; t < 2; ++t)
    for (size_t k = 0; k < results[t].size(); ++k)
      EXPECT_EQ(results[t][k], expected[(k % effects.size() + (size_t)t * 7) % effects.size()])
          << t << "/" << k;
  EXPECT_EQ(shared, original);
}

TEST(EffectTables, EveryLabelHasAnEnglishText) {
  const char* res = getenv("PICTAVO_RES_DIR");
  ASSERT_NE(res, nullptr);
  FILE* f = fopen((std::string(res) + "/locale/en/LC_MESSAGES/pictavo.mo").c_str(), "rb");
  ASSERT_NE(f, nullptr) << "compiled English catalogue missing";
  std::string mo;
  char buf[4096];
  for (size_t n; (n = fread(buf, 1, sizeof buf, f)) > 0;) mo.append(buf, n);
  fclose(f);
  for (int i = 0; i < IE_Engine_Effect_Count(); ++i) {
    const std::string id = IE_Engine_Effect_Get(i)->labelId;
    EXPECT_NE(mo.find(id + '\0'), std::string::npos) << id;
  }
  EXPECT_NE(mo.find(std::string("Faded colours") + '\0'), std::string::npos);
}

TEST(EngineContract, VectorAndPlainKernelsGiveTheSameBytes) {
  // Odd widths leave pixels for the plain tail after the vector kernels.
  for (auto [w, h] : {std::pair{61, 37}, {203, 9}}) {
    const auto src = makeImage(w, h, 17);
    std::vector<std::vector<uint8_t>> vector;
    for (int e : offeredEffects()) vector.push_back(apply(src, w, h, 9, e));
    setenv("PICTAVO_FILTER_NO_SIMD", "1", 1);
    std::vector<std::vector<uint8_t>> plain;
    for (int e : offeredEffects()) plain.push_back(apply(src, w, h, 9, e));
    unsetenv("PICTAVO_FILTER_NO_SIMD");
    for (size_t i = 0; i < plain.size(); ++i)
      EXPECT_EQ(vector[i], plain[i]) << "effect " << offeredEffects()[i];
  }
}

TEST(EngineContract, SourceAndDestinationMayBeOneBuffer) {
  const int w = 45, h = 31;
  const auto src = makeImage(w, h, 19);
  for (int format : {8, 9})
    for (int effect : {3, 7, 14, 22, 35}) {
      std::vector<uint8_t> same = src;
      IeImageInfo s{w, h, (uint16_t)format, same.data()};
      IeImageInfo d{w, h, 0, same.data()};
      ASSERT_EQ(IE_Engine_Apply_Effect(&s, &d, effect), IE_ERROR_NONE);
      EXPECT_EQ(same, apply(src, w, h, format, effect)) << format << "/" << effect;
    }
}
