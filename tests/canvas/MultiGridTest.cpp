// The collage control: view size and paddings, crops, save size, golden
// renders of the saved picture (margins, gaps, rounded corners, background),
// partial redraws, photo changes and save failures.

#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cmath>
#include <cstdlib>
#include <string>
#include <vector>

#include "app-assist/WWindowController.h"
#include "codec/Bitmap.h"
#include "codec/BitmapFactory.h"
#include "common/CLyCairoCanvas.h"
#include "common/CLyEvent.h"
#include "common/ILyEventListener.h"
#include "control/CLyMultiGrid.h"
#include "control/CLyMultiGridSaver.h"
#include "model/CLyMultiGridDrawRectList.h"
#include "model/CLyMultiGridSrcItem.h"
#include "model/CLyMultiGridSrcItemList.h"
#include "platform/media_content.h"
#include "tests/canvas/MultiGridTestPeer.h"
#include "tests/support/TestSupport.h"

using pictavo::test::LogCapture;
using pictavo::test::TempDir;
using Peer = CLyMultiGridTestPeer;

namespace {

Bitmap* solid(int w, int h, uint32_t argb) {
  Bitmap* b = BitmapFactory::createBitmap(w, h, BITMAP_FORMAT_BGRA);
  auto* p = reinterpret_cast<uint32_t*>(b->getPixels());
  for (int i = 0; i < w * h; i++) p[i] = argb;
  return b;
}

CLyMultiGridSrcItem* itemOf(Bitmap* b) {
  auto* item = new CLyMultiGridSrcItem();
  item->setBitmap(b, true);
  return item;
}

void addCell(CLyMultiGridDrawRectList& list, float l, float t, float r, float b) {
  list.addItem(new CLyFloatRectangle(l, t, r, b));
}

struct Rgb {
  int r, g, b;
};

Rgb pixelOf(const Bitmap* b, int x, int y) {
  const unsigned char* p = b->getPixels() + ((size_t)y * b->getWidth() + x) * 4;
  return {p[2], p[1], p[0]};
}

::testing::AssertionResult near(const Rgb& got, const Rgb& want, int tol = 40) {
  if (std::abs(got.r - want.r) <= tol && std::abs(got.g - want.g) <= tol && std::abs(got.b - want.b) <= tol)
    return ::testing::AssertionSuccess();
  return ::testing::AssertionFailure() << "got (" << got.r << "," << got.g << "," << got.b << ") want ("
                                       << want.r << "," << want.g << "," << want.b << ")";
}

Bitmap* decodeJpeg(const std::string& path) {
  DecodeOptions o;
  if (!BitmapFactory::parseImage(path, o)) return nullptr;
  DecodeOptions d;
  d.colorFormat = BITMAP_FORMAT_BGRA;
  return BitmapFactory::decodeFile(path, d, o.outWidth, o.outHeight, 0);
}

size_t dbRows(const std::string& path) {
  media_info_s* rows = nullptr;
  size_t count = 0;
  if (media_content_connect() != MEDIA_CONTENT_ERROR_NONE) return 0;
  media_content_list(path.c_str(), &rows, &count);
  media_content_free_rows(rows, count);
  media_content_disconnect();
  return count;
}

class MultiGridTest : public ::testing::Test {
 protected:
  void SetUp() override {
    pictavo::test::ensureElm();
    mWindow = new app_assist::WWindowController("multigrid-test");
    ASSERT_TRUE(mWindow->precreate());
    mParent = mWindow->getBaseLayout() ? mWindow->getBaseLayout() : mWindow->getEvasObj();
  }
  void TearDown() override {
    mCells.clear(true);
    mItems.clear(true);
    mWindow->destroy();
  }
  // An on-screen (or save-mode) control over mCells and mItems, created and refreshed.
  CLyMultiGrid* makeGrid(int w, int h, bool saveMode) {
    auto* g = new CLyMultiGrid(&mCells, &mItems, w, h);
    g->setSaveMode(saveMode);
    g->setUseGl(false);
    EXPECT_TRUE(g->prepare(mWindow->getEvasObj(), mParent));
    EXPECT_TRUE(g->create(mParent, nullptr));
    g->refresh();
    return g;
  }
  // Red and blue photos side by side.
  void twoSideBySide(int w = 800, int h = 600) {
    addCell(mCells, 0, 0, 0.5f, 1);
    addCell(mCells, 0.5f, 0, 1, 1);
    mItems.add(itemOf(solid(w, h, 0xFFFF0000u)));
    mItems.add(itemOf(solid(w, h, 0xFF0000FFu)));
  }
  bool saveCollage(const std::string& path, double margin, double roundness, const CLyRectangle& bg,
                   int ratio = 0) {
    CLyMultiGridSaveRequest r;
    r.cells = &mCells;
    r.items = &mItems;
    r.ratio = ratio;
    r.margin = margin;
    r.roundness = roundness;
    r.background = bg;
    return CLyMultiGridSaver::save(mWindow->getEvasObj(), mParent, r, path);
  }

  app_assist::WWindowController* mWindow = nullptr;
  Evas_Object* mParent = nullptr;
  CLyMultiGridDrawRectList mCells;
  CLyMultiGridSrcItemList mItems;
};

}  // namespace

TEST_F(MultiGridTest, ViewSizeWithoutPaddingsFitsTheRatioAndCentres) {
  auto* g = new CLyMultiGrid(&mCells, &mItems, 720, 1000);
  g->setSaveMode(true);
  g->setViewSize(LY_RATIO_1_1, 720, 1000);
  EXPECT_EQ(720, mCells.getWidth());
  EXPECT_EQ(720, mCells.getHeight());
  EXPECT_EQ(0, mCells.getOffsetX());
  EXPECT_EQ(140, mCells.getOffsetY());
  ASSERT_NE(nullptr, g->getCollageRect());
  EXPECT_EQ(CLyRectangle(0, 140, 720, 720), *g->getCollageRect());
  // 9:16 does not fit at full width: 562.5 x 1000 at x = 78.75.
  g->setViewSize(LY_RATIO_9_16, 720, 1000);
  EXPECT_EQ(562, mCells.getWidth());
  EXPECT_EQ(1000, mCells.getHeight());
  EXPECT_EQ(78, mCells.getOffsetX());
  EXPECT_EQ(0, mCells.getOffsetY());
  // A zero view counts as 1 x 1 and never divides by zero.
  g->setViewSize(LY_RATIO_3_4, 0, 0);
  EXPECT_GE(mCells.getWidth(), 0);
  g->destroy();
}

TEST_F(MultiGridTest, CropTakesTheAspectRatioOfItsCell) {
  auto* g = new CLyMultiGrid(&mCells, &mItems, 100, 100);
  CLyRectangle out;
  ASSERT_TRUE(
      Peer::calculateRectSize(g, CLyRectangle(0, 0, 1000, 750), CLyFloatRectangle(0, 0, 300, 300), out));
  EXPECT_EQ(CLyRectangle(0, 0, 1000, 1000), out);  // keeps its width
  ASSERT_TRUE(
      Peer::calculateRectSize(g, CLyRectangle(0, 0, 600, 800), CLyFloatRectangle(0, 0, 400, 200), out));
  EXPECT_EQ(CLyRectangle(0, 0, 1600, 800), out);  // keeps its height
  // The corner stays.
  ASSERT_TRUE(
      Peer::calculateRectSize(g, CLyRectangle(10, 20, 110, 70), CLyFloatRectangle(5, 5, 50, 50), out));
  EXPECT_EQ(CLyRectangle(10, 20, 110, 120), out);
  // Empty crops and cells have no answer.
  EXPECT_FALSE(Peer::calculateRectSize(g, CLyRectangle(5, 5, 5, 50), CLyFloatRectangle(0, 0, 10, 10), out));
  EXPECT_FALSE(Peer::calculateRectSize(g, CLyRectangle(0, 0, 50, 50), CLyFloatRectangle(0, 0, 0, 10), out));
  g->destroy();
}

TEST_F(MultiGridTest, SaveSizeFollowsTheLargestPhotoAndTheLimit) {
  mItems.add(itemOf(solid(720, 540, 0xFF000000u)));
  mItems.add(itemOf(solid(720, 960, 0xFF000000u)));
  int w = 0, h = 0;
  ASSERT_TRUE(CLyMultiGrid::computeSaveSize(&mItems, LY_RATIO_3_4, 2000, w, h));
  EXPECT_EQ(960, w);
  EXPECT_EQ(1280, h);
  ASSERT_TRUE(CLyMultiGrid::computeSaveSize(&mItems, LY_RATIO_1_1, 500, w, h));
  EXPECT_EQ(500, w);
  EXPECT_EQ(500, h);
  ASSERT_TRUE(CLyMultiGrid::computeSaveSize(&mItems, LY_RATIO_9_16, 2000, w, h));
  EXPECT_EQ(960, w);
  EXPECT_EQ(1706, h);
  CLyMultiGridSrcItemList empty;
  EXPECT_FALSE(CLyMultiGrid::computeSaveSize(&empty, LY_RATIO_1_1, 2000, w, h));
}

// 800 x 800 save, margin step 5: m = (int)(800 x 0.0199999) = 15, so the
// border and the gap are 30 px of background; roundness step 3: r = 48.
TEST_F(MultiGridTest, SavedPictureHasBorderGapCornersAndBackground) {
  twoSideBySide();
  TempDir dir;
  const std::string path = dir.file("golden.jpg");
  ASSERT_TRUE(saveCollage(path, 5, 3, CLyRectangle(0, 200, 0, 255)));
  Bitmap* out = decodeJpeg(path);
  ASSERT_NE(nullptr, out);
  EXPECT_EQ(800, out->getWidth());
  EXPECT_EQ(800, out->getHeight());
  const Rgb green{0, 200, 0}, red{255, 0, 0}, blue{0, 0, 255};
  // outer border: 30 px on every side
  EXPECT_TRUE(near(pixelOf(out, 3, 400), green));
  EXPECT_TRUE(near(pixelOf(out, 26, 400), green));
  EXPECT_TRUE(near(pixelOf(out, 400, 3), green));
  EXPECT_TRUE(near(pixelOf(out, 400, 796), green));
  EXPECT_TRUE(near(pixelOf(out, 796, 400), green));
  // cells: red 30..385, blue 415..770
  EXPECT_TRUE(near(pixelOf(out, 34, 400), red));
  EXPECT_TRUE(near(pixelOf(out, 380, 400), red));
  EXPECT_TRUE(near(pixelOf(out, 420, 400), blue));
  EXPECT_TRUE(near(pixelOf(out, 765, 400), blue));
  // the gap between them: 385..415
  EXPECT_TRUE(near(pixelOf(out, 390, 400), green));
  EXPECT_TRUE(near(pixelOf(out, 400, 400), green));
  EXPECT_TRUE(near(pixelOf(out, 410, 400), green));
  // rounded corners (radius 48) show the background; the edge midpoints do not
  EXPECT_TRUE(near(pixelOf(out, 34, 34), green));
  EXPECT_TRUE(near(pixelOf(out, 381, 766), green));
  EXPECT_TRUE(near(pixelOf(out, 207, 34), red));
  EXPECT_TRUE(near(pixelOf(out, 34, 78 + 30), red));
  delete out;
  EXPECT_EQ(1u, dbRows(path));
}

TEST_F(MultiGridTest, SavedPictureWithoutMarginOrRoundnessIsEdgeToEdge) {
  twoSideBySide(640, 480);
  TempDir dir;
  const std::string path = dir.file("flat.jpg");
  ASSERT_TRUE(saveCollage(path, 0, 0, CLyRectangle(255, 255, 255, 255)));
  Bitmap* out = decodeJpeg(path);
  ASSERT_NE(nullptr, out);
  EXPECT_EQ(640, out->getWidth());
  EXPECT_TRUE(near(pixelOf(out, 1, 1), {255, 0, 0}));
  EXPECT_TRUE(near(pixelOf(out, 316, 320), {255, 0, 0}));
  EXPECT_TRUE(near(pixelOf(out, 324, 320), {0, 0, 255}));
  EXPECT_TRUE(near(pixelOf(out, 638, 638), {0, 0, 255}));
  delete out;
}

TEST_F(MultiGridTest, EveryCropGetsTheAspectRatioOfItsCellAndSavingKeepsScreenCrops) {
  twoSideBySide(800, 600);
  auto* g = makeGrid(720, 1000, false);
  for (int i = 0; i < 2; i++) {
    const CLyFloatRectangle d = mCells.get(i);
    const CLyRectangle* c = mItems.get(i)->getSrcRect();
    ASSERT_NE(nullptr, c);
    const double crop = (double)(c->w - c->x) / (c->h - c->y), cell = (double)d.x2 / d.y2;
    EXPECT_NEAR(cell, crop, 0.02) << "cell " << i;
    // and the crop lies inside the photo
    EXPECT_GE(c->x, 0);
    EXPECT_GE(c->y, 0);
    EXPECT_LE(c->w, 800);
    EXPECT_LE(c->h, 600);
  }
  const CLyRectangle before = *mItems.get(0)->getSrcRect();
  TempDir dir;
  ASSERT_TRUE(saveCollage(dir.file("a.jpg"), 4, 4, CLyRectangle(1, 2, 3, 255)));
  EXPECT_EQ(before, *mItems.get(0)->getSrcRect());
  g->destroy();
}

TEST_F(MultiGridTest, SameValuesRedrawNothingAndChangesNotify) {
  twoSideBySide();
  auto* g = makeGrid(720, 1000, false);
  int calls = 0;
  bool lastChanged = false, lastSelected = true;
  g->setChangeCallback([&](bool changed, bool selected) {
    calls++;
    lastChanged = changed;
    lastSelected = selected;
  });
  LogCapture log;
  g->setBorderMarginValue(3);
  EXPECT_EQ(1, calls);
  EXPECT_TRUE(lastChanged);
  EXPECT_FALSE(lastSelected);
  EXPECT_EQ(3, mCells.getSpacingStep());
  log.clear();
  g->setBorderMarginValue(3);
  EXPECT_EQ(1, calls);
  EXPECT_FALSE(log.contains("marginValue"));
  EXPECT_FALSE(log.contains("count: 0"));
  g->setBorderRoundnessValue(2);
  g->setBorderRoundnessValue(2);
  EXPECT_EQ(2, calls);
  EXPECT_EQ(2, mCells.getRoundStep());
  g->setBackgroundColor(CLyRectangle(255, 255, 255, 255));  // the default: no change
  EXPECT_EQ(2, calls);
  g->setBackgroundColor(CLyRectangle(10, 20, 30, 255));
  EXPECT_EQ(3, calls);
  EXPECT_EQ(CLyRectangle(10, 20, 30, 255), g->getBackgroundColor());
  g->setLayoutIndex(0);
  EXPECT_EQ(4, calls);
  g->setViewRatio(LY_RATIO_9_16, true);
  EXPECT_EQ(5, calls);
  EXPECT_EQ(LY_RATIO_9_16, g->getRatio());
  g->destroy();
}

TEST_F(MultiGridTest, SaveModeNeverNotifies) {
  twoSideBySide();
  auto* g = makeGrid(800, 800, true);
  int calls = 0;
  g->setChangeCallback([&](bool, bool) { calls++; });
  g->setBorderMarginValue(4);
  g->notifyChanged(true);
  EXPECT_EQ(0, calls);
  g->destroy();
}

TEST_F(MultiGridTest, PartialRedrawRepaintsMovedCellsAndClearsWhereTheyWere) {
  twoSideBySide();
  auto* g = makeGrid(800, 800, true);  // save mode: no paddings, the canvas is the collage
  CLyCairoCanvas* canvas = Peer::impl(g)->canvas;
  ASSERT_NE(nullptr, canvas);
  auto alphaAt = [&](int x, int y) {
    cairo_surface_flush(canvas->getSurface());
    const unsigned char* d = cairo_image_surface_get_data(canvas->getSurface());
    return d[y * cairo_image_surface_get_stride(canvas->getSurface()) + x * 4 + 3];
  };
  EXPECT_EQ(255, alphaAt(350, 400));
  // The divider moves left: cell 0 shrinks to 0.3, cell 1 grows.
  mCells.getItem(0)->x2 = 0.3f;
  mCells.getItem(1)->x1 = 0.3f;
  LogCapture log;
  Peer::drawGridImages(g);
  EXPECT_EQ(255, alphaAt(100, 400));
  EXPECT_EQ(255, alphaAt(350, 400));  // now blue, cell 1
  const unsigned char* d = cairo_image_surface_get_data(canvas->getSurface());
  const int stride = cairo_image_surface_get_stride(canvas->getSurface());
  EXPECT_EQ(255, d[400 * stride + 350 * 4 + 0]);  // blue channel
  // Nothing moved: nothing is redrawn.
  log.clear();
  Peer::drawGridImages(g);
  EXPECT_EQ(2u, log.count("Same Rect"));
  // The other way: cell 0 grows into the place cell 1 leaves.
  mCells.getItem(0)->x2 = 0.7f;
  mCells.getItem(1)->x1 = 0.7f;
  Peer::drawGridImages(g);
  for (int x : {100, 350, 450, 520}) {
    EXPECT_EQ(255, alphaAt(x, 400)) << x;
    EXPECT_EQ(255, d[400 * stride + x * 4 + 2]) << x;  // red channel: cell 0
  }
  EXPECT_EQ(255, d[400 * stride + 650 * 4 + 0]);  // blue: cell 1
  g->destroy();
}

// A divider drag redraws with the canvas copying (SOURCE) and the cheap
// filter, wiping only what no photo paints over: after every step the
// canvas must hold exactly what clearing it and drawing every cell gives,
// with no trace of the cells' old edges, rounded corners or gaps.
TEST_F(MultiGridTest, CopyingPartialRedrawsEqualAFullRedraw) {
  auto photo = [](int w, int h, uint32_t seed) {
    Bitmap* b = BitmapFactory::createBitmap(w, h, BITMAP_FORMAT_BGRA);
    auto* p = reinterpret_cast<uint32_t*>(b->getPixels());
    for (int i = 0; i < w * h; i++) {
      seed = seed * 1664525u + 1013904223u;
      p[i] = 0xFF000000u | (seed >> 8);
    }
    return b;
  };
  addCell(mCells, 0, 0, 0.5f, 0.5f);
  addCell(mCells, 0.5f, 0, 1, 0.5f);
  addCell(mCells, 0, 0.5f, 1, 1);
  mItems.add(itemOf(photo(400, 300, 1)));
  mItems.add(itemOf(photo(300, 400, 2)));
  mItems.add(itemOf(photo(500, 250, 3)));
  auto* g = makeGrid(601, 601, true);  // odd size: cells get fractional edges
  g->setBorderMarginValue(3);
  g->setBorderRoundnessValue(11);
  CLyCairoCanvas* canvas = Peer::impl(g)->canvas;
  ASSERT_NE(nullptr, canvas);
  canvas->setFilter(CAIRO_FILTER_FAST);
  auto snapshot = [&]() {
    cairo_surface_flush(canvas->getSurface());
    const unsigned char* d = cairo_image_surface_get_data(canvas->getSurface());
    const int stride = cairo_image_surface_get_stride(canvas->getSurface());
    const int h = cairo_image_surface_get_height(canvas->getSurface());
    return std::string(reinterpret_cast<const char*>(d), (size_t)stride * h);
  };
  Peer::draw(g);
  const float steps[][2] = {{0.37f, 0.55f}, {0.61f, 0.43f}, {0.44f, 0.71f}, {0.52f, 0.29f}, {0.52f, 0.29f}};
  for (const auto& s : steps) {
    mCells.getItem(0)->x2 = s[0];
    mCells.getItem(1)->x1 = s[0];
    mCells.getItem(0)->y2 = s[1];
    mCells.getItem(1)->y2 = s[1];
    mCells.getItem(2)->y1 = s[1];
    cairo_t* cr = canvas->getContext();
    cairo_save(cr);
    cairo_set_operator(cr, CAIRO_OPERATOR_SOURCE);
    Peer::drawGridImages(g);
    cairo_restore(cr);
    const std::string partial = snapshot();
    cairo_save(cr);
    cairo_set_operator(cr, CAIRO_OPERATOR_SOURCE);
    Peer::updateGridImages(g);  // clears, then draws every cell with its crop
    cairo_restore(cr);
    EXPECT_TRUE(partial == snapshot()) << "divider at " << s[0] << ", " << s[1];
  }
  g->destroy();
}

// During a handler drag a cell whose scale holds keeps (or moves) its pixels
// and draws only what is new. Step by step the canvas must match a control
// that draws everything afresh: the same shapes (alpha) exactly, and colours
// within a texel of smooth photos (a kept pixel may show the neighbouring
// texel; the release redraw puts every texel back).
TEST_F(MultiGridTest, ReusedPixelsMatchAFreshDrawing) {
  // Smooth, no wrap-around: neighbouring texels differ by at most 1.
  auto gradient = [](int w, int h, int shift) {
    Bitmap* b = BitmapFactory::createBitmap(w, h, BITMAP_FORMAT_BGRA);
    auto* p = reinterpret_cast<uint32_t*>(b->getPixels());
    for (int y = 0; y < h; y++)
      for (int x = 0; x < w; x++)
        p[y * w + x] = 0xFF000000u | (uint32_t)(x * 255 / w) << 16 | (uint32_t)(y * 255 / h) << 8 |
                       (uint32_t)((x + y + shift) * 255 / (w + h + shift));
    return b;
  };
  addCell(mCells, 0, 0, 0.5f, 1);
  addCell(mCells, 0.5f, 0, 1, 1);
  mItems.add(itemOf(gradient(500, 600, 0)));  // portrait crops: they keep their height
  mItems.add(itemOf(gradient(520, 640, 40)));
  auto* reusing = makeGrid(601, 601, true);
  auto* fresh = makeGrid(601, 601, true);
  for (CLyMultiGrid* g : {reusing, fresh}) {
    g->setBorderMarginValue(3);
    g->setBorderRoundnessValue(11);
    Peer::impl(g)->canvas->setFilter(CAIRO_FILTER_FAST);
  }
  auto copying = [](CLyMultiGrid* g, void (*draw)(CLyMultiGrid*)) {
    cairo_t* cr = Peer::impl(g)->canvas->getContext();
    cairo_save(cr);
    cairo_set_operator(cr, CAIRO_OPERATOR_SOURCE);
    draw(g);
    cairo_restore(cr);
  };
  auto pixelsOf = [](CLyMultiGrid* g) {
    cairo_surface_t* s = Peer::impl(g)->canvas->getSurface();
    cairo_surface_flush(s);
    const auto* d = reinterpret_cast<const uint32_t*>(cairo_image_surface_get_data(s));
    return std::vector<uint32_t>(
        d, d + cairo_image_surface_get_stride(s) / 4 * cairo_image_surface_get_height(s));
  };
  LogCapture log;
  for (float divider : {0.45f, 0.40f, 0.48f, 0.57f, 0.53f, 0.53f, 0.31f}) {
    mCells.getItem(0)->x2 = divider;
    mCells.getItem(1)->x1 = divider;
    Peer::impl(reusing)->reusePixels = true;
    copying(reusing, Peer::drawGridImages);
    Peer::impl(reusing)->reusePixels = false;
    copying(fresh, Peer::updateGridImages);
    const std::vector<uint32_t> a = pixelsOf(reusing), b = pixelsOf(fresh);
    ASSERT_EQ(a.size(), b.size());
    size_t shape = 0, colour = 0;
    for (size_t i = 0; i < a.size(); i++) {
      if ((a[i] >> 24) != (b[i] >> 24)) shape++;
      for (int c = 0; c < 24; c += 8)
        if (std::abs((int)(a[i] >> c & 255) - (int)(b[i] >> c & 255)) > 3) {
          colour++;
          break;
        }
    }
    EXPECT_EQ(0u, shape) << "divider at " << divider;
    EXPECT_EQ(0u, colour) << "divider at " << divider;
  }
  EXPECT_GT(log.count("Reuse pixels of cell"), 4u) << "the steps kept pixels";
  reusing->destroy();
  fresh->destroy();
}

TEST_F(MultiGridTest, OneCellUpdateTouchesOnlyThatCell) {
  twoSideBySide();
  auto* g = makeGrid(800, 800, true);
  CLyCairoCanvas* canvas = Peer::impl(g)->canvas;
  mItems.get(0)->setBitmap(solid(800, 600, 0xFF00FF00u), true);
  // The surface still wraps the freed pixels until it is recreated.
  Peer::updateImage(g, 0, mCells.get(0), true);
  cairo_surface_flush(canvas->getSurface());
  const unsigned char* d = cairo_image_surface_get_data(canvas->getSurface());
  const int stride = cairo_image_surface_get_stride(canvas->getSurface());
  EXPECT_EQ(255, d[400 * stride + 200 * 4 + 1]);  // cell 0 green
  EXPECT_EQ(255, d[400 * stride + 600 * 4 + 0]);  // cell 1 still blue
  g->destroy();
}

TEST_F(MultiGridTest, PhotoChangesRotateCloneAndBadInput) {
  twoSideBySide(800, 600);
  auto* g = makeGrid(800, 800, false);
  int calls = 0;
  g->setChangeCallback([&](bool, bool) { calls++; });
  LogCapture log;
  g->updateBitmap(nullptr, 0, false);
  EXPECT_TRUE(log.contains("Invalid buffer"));
  g->updateBitmap(solid(10, 10, 0xFF000000u), 7, false);  // dropped, not leaked
  EXPECT_TRUE(log.contains("Invalid index [7]"));
  EXPECT_EQ(nullptr, g->clone(-1));  // nothing selected
  Peer::impl(g)->currentIndex = 1;
  Bitmap* copy = g->clone(-1);
  ASSERT_NE(nullptr, copy);
  EXPECT_NE(copy->getPixels(), mItems.get(1)->getBitmap()->getPixels());
  EXPECT_EQ(0, memcmp(copy->getPixels(), mItems.get(1)->getBitmap()->getPixels(), 800 * 600 * 4));
  // The effect result takes over the buffer of the current photo.
  Bitmap* effect = solid(800, 600, 0xFF00FF00u);
  unsigned char* pixels = effect->getPixels();
  g->updateBitmap(effect, -1, true);
  EXPECT_EQ(pixels, mItems.get(1)->getBitmap()->getPixels());
  delete copy;
  g->rotate();
  EXPECT_EQ(600, mItems.get(1)->getBitmap()->getWidth());
  EXPECT_EQ(800, mItems.get(1)->getBitmap()->getHeight());
  const CLyRectangle* c = mItems.get(1)->getSrcRect();
  const CLyFloatRectangle d = mCells.get(1);
  EXPECT_NEAR((double)d.x2 / d.y2, (double)(c->w - c->x) / (c->h - c->y), 0.02);
  EXPECT_EQ(1, calls);
  g->destroy();
}

TEST_F(MultiGridTest, FailedSaveLeavesNoFileAndNoDatabaseRow) {
  twoSideBySide();
  TempDir dir;
  const std::string folder = dir.file("readonly");
  ASSERT_EQ(0, mkdir(folder.c_str(), 0555));
  std::string path = folder + "/collage.jpg";
  // Permissions do not stop root: use a folder nobody may create files in.
  if (access(folder.c_str(), W_OK) == 0) path = "/proc/pictavo-collage.jpg";
  LogCapture log;
  EXPECT_FALSE(saveCollage(path, 1, 0, CLyRectangle(255, 255, 255, 255)));
  EXPECT_TRUE(log.contains("evas_object_image_save failed"));
  EXPECT_NE(0, access(path.c_str(), F_OK));
  EXPECT_EQ(0u, dbRows(path));
  EXPECT_EQ(0, rmdir(folder.c_str()));  // empty: no temporary file left either
  // A missing folder fails the same way.
  EXPECT_FALSE(saveCollage(dir.file("missing/collage.jpg"), 1, 0, CLyRectangle(255, 255, 255, 255)));
  EXPECT_EQ(0u, dbRows(dir.file("missing/collage.jpg")));
}

TEST_F(MultiGridTest, NothingToDrawIsHandledQuietly) {
  addCell(mCells, 0, 0, 1, 1);
  auto* g = makeGrid(400, 400, true);  // no items
  LogCapture log;
  g->refresh();
  g->setLayoutIndex(0);
  EXPECT_TRUE(log.contains("Surfaces are not created yet"));
  g->destroy();
  // A bitmap-less item stops drawing there, without using another item's data.
  mItems.add(new CLyMultiGridSrcItem());
  auto* g2 = makeGrid(400, 400, true);
  log.clear();
  g2->refresh();
  EXPECT_TRUE(log.contains("Invalid src item image data"));
  g2->destroy();
}

TEST_F(MultiGridTest, WindowRotationRelaysOutAndRedraws) {
  twoSideBySide();
  auto* g = makeGrid(720, 1000, false);
  const CLyRectangle before = *g->getCollageRect();
  LogCapture log;
  ILyEventListener& listener = *g;
  listener.onEvent(CLyEvent(CLyEvent::CLOSE_OPTIONS));
  EXPECT_FALSE(log.contains("win size"));
  listener.onEvent(CLyEvent(CLyEvent::WINDOW_ROTATED, CLyEvent::MODE_IMMEDIATE, 90));
  EXPECT_TRUE(log.contains("win size"));
  EXPECT_TRUE(log.contains("count: 1"));  // drawn again
  // Without a known screen size the collage keeps a usable size.
  const CLyRectangle* after = g->getCollageRect();
  ASSERT_NE(nullptr, after);
  EXPECT_GT(after->w, 100);
  EXPECT_GT(after->h, 100);
  EXPECT_LE(after->w, std::max(before.w, 1000));
  g->destroy();
}

TEST_F(MultiGridTest, SavingFromTheScreenControlLeavesTheScreenPictureAlone) {
  twoSideBySide();
  auto* g = makeGrid(800, 800, false);
  g->setBorderMarginValue(5);
  CLyCairoCanvas* canvas = Peer::impl(g)->canvas;
  const CLyRectangle* area = g->getCollageRect();
  TempDir dir;
  ASSERT_TRUE(g->save(dir.file("screen.jpg")));
  Bitmap* out = decodeJpeg(dir.file("screen.jpg"));
  ASSERT_NE(nullptr, out);
  EXPECT_EQ(area->w, out->getWidth());
  EXPECT_TRUE(near(pixelOf(out, 2, out->getHeight() / 2), {255, 255, 255}));  // white border in the file
  delete out;
  // ... but on screen the border stays transparent over the background object.
  cairo_surface_flush(canvas->getSurface());
  EXPECT_EQ(0,
            cairo_image_surface_get_data(
                canvas->getSurface())[(area->h / 2) * cairo_image_surface_get_stride(canvas->getSurface()) +
                                      2 * 4 + 3]);
  g->destroy();
  // Nothing to save is refused.
  CLyMultiGridSrcItemList none;
  CLyMultiGridSaveRequest r;
  r.cells = &mCells;
  r.items = &none;
  LogCapture log;
  EXPECT_FALSE(CLyMultiGridSaver::save(mWindow->getEvasObj(), mParent, r, dir.file("none.jpg")));
  EXPECT_NE(0, access(dir.file("none.jpg").c_str(), F_OK));
}
