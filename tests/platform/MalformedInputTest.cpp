// Damaged files given to the header probe (media database) and to the theme
// tables: seeded random mutations of valid files, which must be refused or
// read sensibly, never crash.

#include <gtest/gtest.h>

#include <fstream>
#include <iterator>
#include <random>
#include <string>

#include "PlatformTestImages.h"
#include "platform/image_probe.h"
#include "platform/uxt_theme.h"
#include "tests/support/TestSupport.h"

using pictavo::test::TempDir;
using pictavo::test::writeFileBytes;

namespace {

std::string readAll(const std::string& path) {
  std::ifstream in(path, std::ios::binary);
  return std::string((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
}

std::string mutate(std::string bytes, std::mt19937& rng, size_t window) {
  size_t span = std::min(window, bytes.size());
  std::uniform_int_distribution<size_t> pos(0, span - 1);
  std::uniform_int_distribution<int> byte(0, 255);
  int edits = 1 + static_cast<int>(rng() % 4);
  for (int i = 0; i < edits; ++i) bytes[pos(rng)] = static_cast<char>(byte(rng));
  if (rng() % 4 == 0) bytes.resize(pos(rng));  // cut short
  return bytes;
}

}  // namespace

TEST(MalformedInputTest, HeaderProbeNeverTrustsDamagedHeaders) {
  TempDir dir;
  ASSERT_TRUE(pictavo::test::writeTestPng(dir.file("ok.png"), 30, 20));
  std::string png = readAll(dir.file("ok.png"));
  std::string gif = std::string("GIF89a\x1E\x00\x14\x00\x80\x00\x00", 13) + std::string(32, '\0');
  std::string bmp = std::string("BM", 2) + std::string(12, '\0') +
                    std::string("\x28\0\0\0\x1E\0\0\0\xEC\xFF\xFF\xFF", 12) + std::string(40, '\0');
  std::string wbmp = std::string("\0\0\x1E\x14", 4) + std::string(80, '\0');
  // Minimal JPEG: SOI, an APP0 segment, a frame header.
  std::string jpeg =
      std::string("\xFF\xD8\xFF\xE0\x00\x10JFIF\0\x01\x01\0\0\x01\0\x01\0\0", 20) +
      std::string("\xFF\xC0\x00\x11\x08\x00\x14\x00\x1E\x03\x01\x22\x00\x02\x11\x01\x03\x11\x01", 19) +
      std::string("\xFF\xD9", 2);
  platform_image::ProbeResult result;
  for (const auto& [bytes, w, h] : {std::tuple{png, 30, 20}, std::tuple{gif, 30, 20}, std::tuple{bmp, 30, 20},
                                    std::tuple{wbmp, 30, 20}, std::tuple{jpeg, 30, 20}}) {
    ASSERT_TRUE(writeFileBytes(dir.file("sample"), bytes));
    ASSERT_TRUE(platform_image::probe(dir.file("sample").c_str(), result)) << result.mimeType;
    EXPECT_EQ(result.width, w);
    EXPECT_EQ(result.height, h);
  }

  std::mt19937 rng(20261206);
  int accepted = 0;
  for (int round = 0; round < 1000; ++round) {
    const std::string* base[] = {&png, &gif, &bmp, &wbmp, &jpeg};
    std::string bytes = mutate(*base[round % 5], rng, 48);
    ASSERT_TRUE(writeFileBytes(dir.file("damaged"), bytes));
    platform_image::ProbeResult damaged;
    if (platform_image::probe(dir.file("damaged").c_str(), damaged)) {
      ++accepted;
      EXPECT_GT(damaged.width, 0);
      EXPECT_GT(damaged.height, 0);
      EXPECT_LE(damaged.width, 1 << 20);
      EXPECT_LE(damaged.height, 1 << 20);
      EXPECT_FALSE(damaged.mimeType.empty());
    }
  }
  // Many mutations leave the size fields alone; some must still pass.
  EXPECT_GT(accepted, 0);
}

TEST(MalformedInputTest, ThemeTablesSurviveDamage) {
  TempDir dir;
  const std::string table =
      "<ColorTable>\n"
      "  <Color code=\"AO013\" main=\"#3DB9CCFF\" outline=\"#3DB9CC\" shadow=\"#00000000\"/>\n"
      "  <Theme style=\"1\"><Color code=\"AO014\" main=\"#FFFFFF\"/></Theme>\n"
      "</ColorTable>\n";
  std::mt19937 rng(7);
  for (int round = 0; round < 400; ++round) {
    std::string bytes = mutate(table, rng, table.size());
    ASSERT_TRUE(writeFileBytes(dir.file("colors.xml"), bytes));
    if (Uxt_Theme_Color_Table* parsed = uxt_theme_add_color_table(dir.file("colors.xml").c_str())) {
      uxt_theme_delete_color_table(parsed);
    }
    ASSERT_TRUE(writeFileBytes(dir.file("fonts.xml"), bytes));
    if (Uxt_Theme_Font_Table* parsed = uxt_theme_add_font_table(dir.file("fonts.xml").c_str())) {
      uxt_theme_delete_font_table(parsed);
    }
  }
}
