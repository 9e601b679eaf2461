// The focus box on a real buffer-engine canvas: grips pressed and dragged
// with fed mouse events, the movement filter, the frame pixels.

#include <Elementary.h>
#include <gtest/gtest.h>

#include <memory>
#include <vector>

#include "control/CLyFocusBox.h"
#include "tests/support/TestSupport.h"
#include "tests/touch/TouchTestSupport.h"

using pictavo::test::LogCapture;

namespace {

struct Step {
  CLyPoint delta;
  int dot;
};

class FocusBoxTest : public ::testing::Test {
 protected:
  void SetUp() override {
    pictavo::test::touch::setUnitScale();
    win = pictavo::test::createTestWindow(720, 1280);
    parent = elm_box_add(win);
    evas_object_move(parent, 0, 0);
    evas_object_resize(parent, 720, 1280);
    evas_object_show(parent);
    box = std::make_unique<CLyFocusBox>();
    ASSERT_TRUE(box->create(parent, parent));
    box->setMoveCallback([this](const CLyPoint& d, int dot) { steps.push_back({d, dot}); });
    box->setPressCallback([this](bool pressed) { presses.push_back(pressed); });
    box->show(CLyFloatRectangle(100, 200, 200, 200), 0);
    box->showHandlers(
        {CLyFloatPoint(400, 300), CLyFloatPoint(250, 600), CLyFloatPoint(100, 600), CLyFloatPoint(250, 200)});
    pictavo::test::runMainLoop(0.01);
  }
  void TearDown() override {
    box.reset();
    evas_object_del(win);
  }
  Evas* evas() const { return evas_object_evas_get(win); }

  Evas_Object* win = nullptr;
  Evas_Object* parent = nullptr;
  std::unique_ptr<CLyFocusBox> box;
  std::vector<Step> steps;
  std::vector<bool> presses;
};

TEST(FocusBoxFilter, ThresholdAndFastEvents) {
  CLyPoint d, next;
  const CLyPoint last(100, 100);
  // 4 px on both axes stays below the 5 px threshold.
  EXPECT_FALSE(CLyFocusBox::filterMove(last, 0, 104, 104, 1000, 5, d, next));
  // 6 px across and 2 down reports only the across part and keeps y.
  ASSERT_TRUE(CLyFocusBox::filterMove(last, 0, 106, 102, 1000, 5, d, next));
  EXPECT_EQ(CLyPoint(6, 0), d);
  EXPECT_EQ(CLyPoint(106, 100), next);
  // 50 ms apart: the step must reach 150 / 50 * 5 = 15 px on one axis.
  EXPECT_FALSE(CLyFocusBox::filterMove(last, 1000, 114, 114, 1050, 5, d, next));
  ASSERT_TRUE(CLyFocusBox::filterMove(last, 1000, 115, 100, 1050, 5, d, next));
  EXPECT_EQ(CLyPoint(15, 0), d);
  // Exactly 150 ms apart is slow enough for the plain threshold.
  EXPECT_TRUE(CLyFocusBox::filterMove(last, 1000, 95, 94, 1150, 5, d, next));
  EXPECT_EQ(CLyPoint(-5, -6), d);
  // Two events in the same millisecond neither divide by zero nor pass for a small move.
  EXPECT_FALSE(CLyFocusBox::filterMove(last, 1000, 120, 100, 1000, 5, d, next));
  EXPECT_TRUE(CLyFocusBox::filterMove(last, 1000, 900, 100, 1000, 5, d, next));
  // A clock that wrapped around counts as a long pause, not a fast burst.
  EXPECT_TRUE(CLyFocusBox::filterMove(last, 4000000000u, 106, 100, 10, 5, d, next));
}

TEST_F(FocusBoxTest, GripDragReportsFilteredStepsWithItsDotIndex) {
  // Grip 1 sits at (250, 600).
  Evas* e = evas();
  evas_event_feed_mouse_move(e, 250, 600, 1000, nullptr);
  evas_event_feed_mouse_down(e, 1, EVAS_BUTTON_NONE, 1000, nullptr);
  ASSERT_EQ(std::vector<bool>{true}, presses);
  EXPECT_TRUE(box->isDragging());

  evas_event_feed_mouse_move(e, 254, 604, 1200, nullptr);  // 4 px: ignored
  EXPECT_TRUE(steps.empty());
  evas_event_feed_mouse_move(e, 256, 602, 1400, nullptr);  // (6, 2) -> (6, 0)
  ASSERT_EQ(1u, steps.size());
  EXPECT_EQ(CLyPoint(6, 0), steps[0].delta);
  EXPECT_EQ(1, steps[0].dot);
  // 50 ms after the accepted step a 14 px move is not enough, 15 px is.
  evas_event_feed_mouse_move(e, 270, 600, 1450, nullptr);
  EXPECT_EQ(1u, steps.size());
  evas_event_feed_mouse_move(e, 271, 600, 1450, nullptr);
  ASSERT_EQ(2u, steps.size());
  EXPECT_EQ(CLyPoint(15, 0), steps[1].delta);

  evas_event_feed_mouse_up(e, 1, EVAS_BUTTON_NONE, 1600, nullptr);
  EXPECT_EQ((std::vector<bool>{true, false}), presses);
  EXPECT_FALSE(box->isDragging());
  // Movement after the release reports nothing.
  evas_event_feed_mouse_move(e, 400, 700, 2000, nullptr);
  EXPECT_EQ(2u, steps.size());
}

TEST_F(FocusBoxTest, FastEventsNeedLargerSteps) {
  Evas* e = evas();
  evas_event_feed_mouse_move(e, 400, 300, 1000, nullptr);  // grip 0
  evas_event_feed_mouse_down(e, 1, EVAS_BUTTON_NONE, 1000, nullptr);
  evas_event_feed_mouse_move(e, 414, 300, 1050, nullptr);
  EXPECT_TRUE(steps.empty());
  evas_event_feed_mouse_move(e, 415, 300, 1050, nullptr);
  ASSERT_EQ(1u, steps.size());
  EXPECT_EQ(CLyPoint(15, 0), steps[0].delta);
  EXPECT_EQ(0, steps[0].dot);
  evas_event_feed_mouse_up(e, 1, EVAS_BUTTON_NONE, 1100, nullptr);
}

TEST_F(FocusBoxTest, EachGripReportsItsOwnDot) {
  const int pos[4][2] = {{400, 300}, {250, 600}, {100, 600}, {250, 200}};
  Evas* e = evas();
  unsigned int t = 1000;
  for (int i = 0; i < 4; ++i) {
    evas_event_feed_mouse_move(e, pos[i][0], pos[i][1], t, nullptr);
    evas_event_feed_mouse_down(e, 1, EVAS_BUTTON_NONE, t, nullptr);
    t += 500;
    evas_event_feed_mouse_move(e, pos[i][0] - 10, pos[i][1] + 10, t, nullptr);
    evas_event_feed_mouse_up(e, 1, EVAS_BUTTON_NONE, t, nullptr);
    t += 500;
  }
  ASSERT_EQ(4u, steps.size());
  for (int i = 0; i < 4; ++i) {
    EXPECT_EQ(i, steps[i].dot);
    EXPECT_EQ(CLyPoint(-10, 10), steps[i].delta);
  }
}

TEST_F(FocusBoxTest, FrozenBoxIgnoresMovement) {
  LogCapture log;
  box->setFrozen(true);
  Evas* e = evas();
  evas_event_feed_mouse_move(e, 400, 300, 1000, nullptr);
  evas_event_feed_mouse_down(e, 1, EVAS_BUTTON_NONE, 1000, nullptr);
  evas_event_feed_mouse_move(e, 450, 300, 2000, nullptr);
  evas_event_feed_mouse_up(e, 1, EVAS_BUTTON_NONE, 2000, nullptr);
  EXPECT_TRUE(steps.empty());
  EXPECT_TRUE(log.contains("Freezed"));
  EXPECT_EQ((std::vector<bool>{true, false}), presses);
}

TEST_F(FocusBoxTest, TouchOutsideTheGripsIsNotAHandler) {
  Evas* e = evas();
  evas_event_feed_mouse_move(e, 600, 1000, 1000, nullptr);
  evas_event_feed_mouse_down(e, 1, EVAS_BUTTON_NONE, 1000, nullptr);
  evas_event_feed_mouse_move(e, 650, 1000, 2000, nullptr);
  evas_event_feed_mouse_up(e, 1, EVAS_BUTTON_NONE, 2000, nullptr);
  EXPECT_TRUE(presses.empty());
  EXPECT_TRUE(steps.empty());
}

TEST_F(FocusBoxTest, FrameIsDrawnAndClearHidesEverything) {
  EXPECT_EQ(CLyRectangle(100, 200, 200, 200), box->getBoxRect());
  Evas_Object* img = box->getImageObject();
  ASSERT_NE(nullptr, img);
  int stride = evas_object_image_stride_get(img) / 4;
  auto* px = static_cast<const uint32_t*>(evas_object_image_data_get(img, EINA_FALSE));
  ASSERT_NE(nullptr, px);
  EXPECT_NE(0u, px[300 * stride + 100] >> 24) << "left edge of the frame";
  EXPECT_NE(0u, px[400 * stride + 200] >> 24) << "bottom edge of the frame";
  EXPECT_EQ(0u, px[300 * stride + 200] >> 24) << "inside the frame";
  evas_object_image_data_set(img, (void*)px);
  ASSERT_NE(nullptr, box->getGrip(0));
  EXPECT_TRUE(evas_object_visible_get(box->getGrip(0)));
  // Touch areas stay invisible although an elementary parent colours its new members.
  int alpha = -1;
  evas_object_color_get(box->getGrip(0), nullptr, nullptr, nullptr, &alpha);
  EXPECT_EQ(0, alpha);

  box->clear();
  px = static_cast<const uint32_t*>(evas_object_image_data_get(img, EINA_FALSE));
  EXPECT_EQ(0u, px[300 * stride + 100] >> 24);
  evas_object_image_data_set(img, (void*)px);
  for (int i = 0; i < CLyFocusBox::kGripCount; ++i) EXPECT_FALSE(evas_object_visible_get(box->getGrip(i)));
  // Hidden grips catch nothing.
  evas_event_feed_mouse_move(evas(), 400, 300, 1000, nullptr);
  evas_event_feed_mouse_down(evas(), 1, EVAS_BUTTON_NONE, 1000, nullptr);
  evas_event_feed_mouse_up(evas(), 1, EVAS_BUTTON_NONE, 1100, nullptr);
  EXPECT_TRUE(presses.empty());
}

TEST_F(FocusBoxTest, FewerPositionsShowFewerHandlers) {
  box->clear();
  box->showHandlers({CLyFloatPoint(10, 10)});
  EXPECT_TRUE(evas_object_visible_get(box->getGrip(0)));
  for (int i = 1; i < CLyFocusBox::kGripCount; ++i) EXPECT_FALSE(evas_object_visible_get(box->getGrip(i)));
  // More than four positions use the first four.
  box->showHandlers(std::vector<CLyFloatPoint>(6, CLyFloatPoint(20, 20)));
  for (int i = 0; i < CLyFocusBox::kGripCount; ++i) EXPECT_TRUE(evas_object_visible_get(box->getGrip(i)));
  EXPECT_EQ(nullptr, box->getGrip(4));
  EXPECT_EQ(nullptr, box->getGrip(-1));
}

TEST_F(FocusBoxTest, ParentDeletedBeforeTheBox) {
  evas_object_del(parent);
  parent = nullptr;
  EXPECT_EQ(nullptr, box->getImageObject());
  EXPECT_EQ(nullptr, box->getGrip(0));
  box->show(CLyFloatRectangle(0, 0, 10, 10), 0);  // nothing to draw on, no crash
  box->clear();
  box.reset();
}

TEST_F(FocusBoxTest, ParentDeletedWhileItsEventsAreFrozen) {
  // Evas holds back deletion callbacks of frozen objects; the box must still
  // let go of its objects, or it would delete them a second time later.
  evas_object_freeze_events_set(parent, EINA_TRUE);
  evas_object_freeze_events_set(box->getImageObject(), EINA_TRUE);
  evas_object_del(parent);
  parent = nullptr;
  EXPECT_EQ(nullptr, box->getImageObject());
  EXPECT_EQ(nullptr, box->getGrip(0));
  box->show(CLyFloatRectangle(0, 0, 10, 10), 0);
  box.reset();
}

TEST(FocusBoxCreate, NullParentIsRefused) {
  LogCapture log;
  CLyFocusBox box;
  EXPECT_FALSE(box.create(nullptr, nullptr));
  EXPECT_TRUE(log.contains("Invalid param parent"));
  // A box that never got its objects is harmless.
  box.show(CLyFloatRectangle(0, 0, 10, 10), 0);
  box.showHandlers({CLyFloatPoint(1, 1)});
  box.clear();
  box.resize();
  EXPECT_FALSE(box.isDragging());
}

}  // namespace
