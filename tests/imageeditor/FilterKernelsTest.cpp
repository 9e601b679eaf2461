// The image filter's shared kernels against plain reference versions: box
// downscaling, box blurs, bilinear enlargement, the streamed unsharp mask and
// the working-image memory cache.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <thread>
#include <vector>

#include "platform/image-filter/filter_looks.h"
#include "platform/image-filter/filter_resample.h"
#include "tests/imageeditor/EffectTestImages.h"

using namespace imgfilter;
using effects_test::makeImage;

namespace {

// Runs fn once with the vector kernels and once without.
template <typename Fn>
void withAndWithoutSimd(Fn fn) {
  fn();
  setenv("PICTAVO_FILTER_NO_SIMD", "1", 1);
  chooseSimd();
  fn();
  unsetenv("PICTAVO_FILTER_NO_SIMD");
  chooseSimd();
}

Frame frameOf(const std::vector<uint8_t>& src, std::vector<uint8_t>& dst, int w, int h, Channels ch) {
  return Frame{src.data(), w * 4, dst.data(), w * 4, w, h, ch};
}

// Edge-clamped box of radius r along rows, then along columns, each pass
// rounded as the filter rounds.
template <int N>
std::vector<uint8_t> referenceBox(const std::vector<uint8_t>& in, int w, int h, int r) {
  const uint32_t inv = (1u << 24) / (uint32_t)(2 * r + 1);
  auto round = [inv](uint32_t s) { return (uint8_t)((s * inv + (1u << 23)) >> 24); };
  std::vector<uint8_t> rows(in.size()), out(in.size());
  for (int y = 0; y < h; ++y)
    for (int x = 0; x < w; ++x)
      for (int c = 0; c < N; ++c) {
        uint32_t s = 0;
        for (int k = -r; k <= r; ++k) s += in[((size_t)y * w + std::clamp(x + k, 0, w - 1)) * N + c];
        rows[((size_t)y * w + x) * N + c] = round(s);
      }
  for (int y = 0; y < h; ++y)
    for (int x = 0; x < w; ++x)
      for (int c = 0; c < N; ++c) {
        uint32_t s = 0;
        for (int k = -r; k <= r; ++k) s += rows[((size_t)std::clamp(y + k, 0, h - 1) * w + x) * N + c];
        out[((size_t)y * w + x) * N + c] = round(s);
      }
  return out;
}

template <int N>
Image<N> imageOf(const std::vector<uint8_t>& px, int w, int h) {
  Image<N> img;
  img.resize(w, h);
  std::copy(px.begin(), px.end(), img.px.data());
  return img;
}

template <int N>
std::vector<uint8_t> bytesOf(const Image<N>& img) {
  return std::vector<uint8_t>(img.px.data(), img.px.data() + img.px.size());
}

}  // namespace

TEST(FilterKernels, DownscaleAveragesEveryBlockIncludingTheRaggedEdges) {
  const int w = 53, h = 38;
  const auto src = makeImage(w, h, 5);
  std::vector<uint8_t> unused(src.size());
  for (Channels ch : {kOrderARGB, kOrderBGRA})
    for (int factor : {1, 2, 3, 5, 16, 17}) {
      const Frame f = frameOf(src, unused, w, h, ch);
      Rgba small;
      downscale(f, factor, small);
      const int sw = (w + factor - 1) / factor, sh = (h + factor - 1) / factor;
      ASSERT_EQ(small.w, sw);
      ASSERT_EQ(small.h, sh);
      const int order[4] = {ch.r, ch.g, ch.b, ch.a};
      for (int by = 0; by < sh; ++by)
        for (int bx = 0; bx < sw; ++bx)
          for (int c = 0; c < 4; ++c) {
            uint32_t sum = 0, n = 0;
            for (int y = by * factor; y < std::min(h, (by + 1) * factor); ++y)
              for (int x = bx * factor; x < std::min(w, (bx + 1) * factor); ++x, ++n)
                sum += src[((size_t)y * w + x) * 4 + order[c]];
            ASSERT_EQ(small.row(by)[bx * 4 + c], (sum + n / 2) / n)
                << "factor " << factor << " block " << bx << "," << by << " channel " << c;
          }
    }
}

TEST(FilterKernels, BoxBlursMatchTheClampedReferenceForShortAndLongWindows) {
  const int w = 37, h = 23;
  const auto rgba = makeImage(w, h, 8);
  std::vector<uint8_t> gray(rgba.begin(), rgba.begin() + w * h);
  withAndWithoutSimd([&] {
    for (int r : {1, 3, 8, 9, 40}) {
      Image<4> four = imageOf<4>(rgba, w, h);
      boxBlur(four, r, 1);
      EXPECT_EQ(bytesOf(four), referenceBox<4>(rgba, w, h, r)) << "four channels, radius " << r;
      Image<1> one = imageOf<1>(gray, w, h);
      boxBlur(one, r, 1);
      EXPECT_EQ(bytesOf(one), referenceBox<1>(gray, w, h, r)) << "one channel, radius " << r;
    }
  });
}

TEST(FilterKernels, UpsamplerMixesTheTwoNearestReducedPixels) {
  const int sw = 19, sh = 7, factor = 3, w = 57, h = 20;
  const Image<4> small = imageOf<4>(makeImage(sw, sh, 9), sw, sh);
  std::vector<std::vector<uint8_t>> results;
  withAndWithoutSimd([&] {
    Upsampler<4> up(small, factor, w, h);
    std::vector<uint8_t> all;
    for (int y = 0; y < h; ++y) all.insert(all.end(), up.row(y), up.row(y) + w * 4);
    results.push_back(all);
  });
  EXPECT_EQ(results[0], results[1]);
  // Every enlarged value lies between its reduced neighbours; column 1 of
  // row 1 sits at the centre of reduced pixel (0, 0), the last ones clamp
  // to the last reduced pixel.
  const uint8_t* px = results[0].data();
  for (int c = 0; c < 4; ++c) EXPECT_EQ(px[(1 * w + 1) * 4 + c], small.row(0)[c]) << c;
  const uint8_t* last = small.row(sh - 1) + (sw - 1) * 4;
  for (int c = 0; c < 4; ++c) EXPECT_EQ(px[((size_t)(h - 1) * w + (w - 1)) * 4 + c], last[c]) << c;
}

namespace {

// The unsharp mask written plainly over whole images.
std::vector<uint8_t> referenceSharpen(const std::vector<uint8_t>& src, int w, int h, Channels ch) {
  const int r = std::max(1, (int)std::lround(std::min(w, h) / 1500.0));
  std::vector<uint8_t> luma((size_t)w * h);
  for (size_t i = 0; i < luma.size(); ++i)
    luma[i] = (uint8_t)luma709(src[i * 4 + ch.r], src[i * 4 + ch.g], src[i * 4 + ch.b]);
  const auto blur = referenceBox<1>(luma, w, h, r);
  std::vector<uint8_t> out(src);
  for (size_t i = 0; i < luma.size(); ++i) {
    const int d = luma[i] - blur[i];
    int k = std::min(((std::abs(d) - 2) * 105) >> 6, 44);
    if (std::abs(d) <= 2) k = 0;
    if (d < 0) k = -k;
    for (int c : {ch.r, ch.g, ch.b}) out[i * 4 + c] = (uint8_t)std::clamp(src[i * 4 + c] + k, 0, 255);
  }
  return out;
}

}  // namespace

TEST(FilterKernels, StreamedSharpenEqualsTheWholeImageReferenceInPlaceOrNot) {
  // 2300 x 2260 has a short side that asks for a radius of 2; the thin
  // images are shorter than the vertical window.
  for (auto [w, h] : {std::pair{61, 37}, {3, 1}, {1, 5}, {2300, 2260}})
    for (Channels ch : {kOrderARGB, kOrderBGRA}) {
      const auto src = makeImage(w, h, 11);
      const auto want = referenceSharpen(src, w, h, ch);
      withAndWithoutSimd([&] {
        std::vector<uint8_t> out(src.size());
        lookSharpen(frameOf(src, out, w, h, ch));
        EXPECT_EQ(out, want) << w << "x" << h;
        std::vector<uint8_t> same(src);
        lookSharpen(Frame{same.data(), w * 4, same.data(), w * 4, w, h, ch});
        EXPECT_EQ(same, want) << "in place " << w << "x" << h;
      });
    }
}

TEST(FilterKernels, ReusedWorkingMemoryStartsZeroedOnEveryThread) {
  auto dirtyThenFresh = [] {
    for (int round = 0; round < 3; ++round) {
      {
        Image<4> a;
        a.resize(300, 200);
        std::fill(a.px.data(), a.px.data() + a.px.size(), (uint8_t)0xAB);
        Image<1> b;
        b.resize(1000, 7);
        std::fill(b.px.data(), b.px.data() + b.px.size(), (uint8_t)0xCD);
      }
      Image<4> c;
      c.resize(250, 200);  // fits in a's released block
      if (std::any_of(c.px.data(), c.px.data() + c.px.size(), [](uint8_t v) { return v != 0; })) return false;
      Image<4> d = std::move(c);
      if (d.px.size() != 250u * 200u * 4u || c.px.data() != nullptr) return false;
    }
    return true;
  };
  EXPECT_TRUE(dirtyThenFresh());
  std::vector<std::thread> threads;
  std::vector<char> ok(4, 0);
  for (size_t i = 0; i < ok.size(); ++i) threads.emplace_back([&, i] { ok[i] = dirtyThenFresh(); });
  for (auto& t : threads) t.join();
  for (size_t i = 0; i < ok.size(); ++i) EXPECT_TRUE(ok[i]) << "thread " << i;
}

TEST(FilterKernels, WorkingMemoryCacheStaysWithinItsBounds) {
  {
    std::vector<Image<4>> images(8);
    for (auto& img : images) img.resize(1600, 1600);  // about 10 MB each
  }
  EXPECT_GT(ScratchBlock::cachedBytes(), 0u);
  EXPECT_LE(ScratchBlock::cachedBytes(), size_t{48} << 20);
  const size_t before = ScratchBlock::cachedBytes();
  {
    Image<4> huge;
    huge.resize(3000, 2000);  // 24 MB: too large to keep
  }
  EXPECT_EQ(ScratchBlock::cachedBytes(), before);
}
