#include "common/CLyEflHelp.h"

#include <Elementary.h>
#include <gtest/gtest.h>

#include <cstdlib>

#include "common/CLyUtil.h"
#include "tests/support/TestSupport.h"

using pictavo::test::LogCapture;

TEST(CLyEflHelpTest, LayoutFromAnEdjeGroup) {
  Evas_Object* win = pictavo::test::createTestWindow(200, 200);
  char* edj = CLyUtil::getEdjPath("edje/LyTheme.edj");
  ASSERT_NE(edj, nullptr);
  Evas_Object* layout = CLyEflHelp::createLayout(win, edj, "pictavo/accent_bar", "accent");
  ASSERT_NE(layout, nullptr);
  EXPECT_STREQ(evas_object_name_get(layout), "accent");
  EXPECT_FALSE(evas_object_visible_get(layout)) << "the caller shows it";
  double wx = 0, wy = 0, ax = 0, ay = 0;
  evas_object_size_hint_weight_get(layout, &wx, &wy);
  evas_object_size_hint_align_get(layout, &ax, &ay);
  EXPECT_EQ(wx, EVAS_HINT_EXPAND);
  EXPECT_EQ(wy, EVAS_HINT_EXPAND);
  EXPECT_EQ(ax, EVAS_HINT_FILL);
  EXPECT_EQ(ay, EVAS_HINT_FILL);

  // A missing group gives no layout, and nothing is left behind.
  LogCapture log;
  EXPECT_EQ(CLyEflHelp::createLayout(win, edj, "no/such/group", "x"), nullptr);
  EXPECT_EQ(evas_object_name_find(evas_object_evas_get(win), "x"), nullptr);
  EXPECT_EQ(CLyEflHelp::createLayout(win, "/no/such/file.edj", "pictavo/accent_bar", "y"), nullptr);
  free(edj);
  evas_object_del(win);
}

TEST(CLyEflHelpTest, DefaultApplicationLayoutIsShown) {
  Evas_Object* win = pictavo::test::createTestWindow(200, 200);
  Evas_Object* layout = CLyEflHelp::createLayout(win, "app-layout");
  ASSERT_NE(layout, nullptr);
  EXPECT_TRUE(evas_object_visible_get(layout));
  EXPECT_STREQ(evas_object_name_get(layout), "app-layout");
  // The default layout has the content part every screen swallows into.
  Evas_Object* rect = evas_object_rectangle_add(evas_object_evas_get(win));
  EXPECT_TRUE(elm_layout_content_set(layout, "elm.swallow.content", rect));
  EXPECT_EQ(elm_layout_content_get(layout, "elm.swallow.content"), rect);
  evas_object_del(win);
}
