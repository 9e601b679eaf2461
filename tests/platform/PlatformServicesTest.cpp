#include <Elementary.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <string>

#include "platform/app_resource_manager.h"
#include "platform/feedback.h"
#include "platform/notification.h"
#include "platform/system_settings.h"
#include "platform/uxt_theme.h"
#include "tests/support/TestSupport.h"

using pictavo::test::TempDir;

namespace {

std::string take(char* s) {
  std::string result = s ? s : "";
  free(s);
  return result;
}

std::string writeFile(const TempDir& dir, const char* name, const std::string& content) {
  std::string path = dir.file(name);
  FILE* f = fopen(path.c_str(), "w");
  fputs(content.c_str(), f);
  fclose(f);
  return path;
}

}  // namespace

TEST(ResourceManagerTest, ResolvesNamesInsideTheResourceDirectory) {
  ASSERT_EQ(app_resource_manager_init(), APP_RESOURCE_ERROR_NONE);
  char* path = nullptr;
  ASSERT_EQ(app_resource_manager_get(APP_RESOURCE_TYPE_IMAGE, "code/changeableColorInfo.xml", &path),
            APP_RESOURCE_ERROR_NONE);
  std::string color = take(path);
  EXPECT_NE(color.find("/code/changeableColorInfo.xml"), std::string::npos);
  ASSERT_EQ(app_resource_manager_get(APP_RESOURCE_TYPE_LAYOUT, "edje/LyTheme.edj", &path),
            APP_RESOURCE_ERROR_NONE);
  EXPECT_NE(take(path).find("/edje/LyTheme.edj"), std::string::npos);
  // A layout may also be named without its folder.
  ASSERT_EQ(app_resource_manager_get(APP_RESOURCE_TYPE_LAYOUT, "LyTheme.edj", &path),
            APP_RESOURCE_ERROR_NONE);
  free(path);

  EXPECT_NE(app_resource_manager_get(APP_RESOURCE_TYPE_IMAGE, "images/none.png", &path),
            APP_RESOURCE_ERROR_NONE);
  EXPECT_EQ(path, nullptr);
  // Names must stay inside the directory.
  EXPECT_EQ(app_resource_manager_get(APP_RESOURCE_TYPE_IMAGE, "../res/code/changeableColorInfo.xml", &path),
            APP_RESOURCE_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(app_resource_manager_get(APP_RESOURCE_TYPE_IMAGE, color.c_str(), &path),
            APP_RESOURCE_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(app_resource_manager_get(APP_RESOURCE_TYPE_IMAGE, "code/../../x", &path),
            APP_RESOURCE_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(app_resource_manager_get(APP_RESOURCE_TYPE_IMAGE, nullptr, &path),
            APP_RESOURCE_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(app_resource_manager_get(APP_RESOURCE_TYPE_IMAGE, "code", nullptr),
            APP_RESOURCE_ERROR_INVALID_PARAMETER);
  // A folder is not a resource.
  EXPECT_NE(app_resource_manager_get(APP_RESOURCE_TYPE_IMAGE, "code", &path), APP_RESOURCE_ERROR_NONE);
  EXPECT_EQ(app_resource_manager_release(), APP_RESOURCE_ERROR_NONE);
}

TEST(ThemeServiceTest, ColourTableOfTheResourcesHoldsTheScreensCodes) {
  pictavo::test::ensureElm();
  char* path = nullptr;
  ASSERT_EQ(app_resource_manager_get(APP_RESOURCE_TYPE_IMAGE, "code/changeableColorInfo.xml", &path),
            APP_RESOURCE_ERROR_NONE);
  Uxt_Theme_Color_Table* table = uxt_theme_add_color_table(path);
  free(path);
  ASSERT_NE(table, nullptr);
  ASSERT_EQ(uxt_theme_set_style(0), UXT_THEME_ERROR_NONE);
  ASSERT_EQ(uxt_theme_set_color_table(table), UXT_THEME_ERROR_NONE);
  for (const char* code : {"AO012", "AO013", "AO013A", "AO014", "AO015", "B043", "B043A"}) {
    int r = -1, g = -1, b = -1, a = -1;
    EXPECT_EQ(uxt_theme_get_color(code, &r, &g, &b, &a, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr,
                                  nullptr, nullptr),
              UXT_THEME_ERROR_NONE)
        << code;
    EXPECT_GE(r, 0);
    EXPECT_LE(a, 255);
  }
  int r = 7;
  EXPECT_EQ(uxt_theme_get_color("NOPE", &r, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr,
                                nullptr, nullptr, nullptr, nullptr),
            UXT_THEME_ERROR_NOT_FOUND);
  EXPECT_EQ(r, 7);
  EXPECT_EQ(uxt_theme_delete_color_table(table), UXT_THEME_ERROR_NONE);
  // With the table gone no colour resolves.
  EXPECT_EQ(uxt_theme_get_color("AO013", &r, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr,
                                nullptr, nullptr, nullptr, nullptr),
            UXT_THEME_ERROR_NOT_FOUND);
}

TEST(ThemeServiceTest, StylesOverrideAndObjectsTakeColours) {
  pictavo::test::ensureElm();
  TempDir dir;
  std::string file = writeFile(dir, "colors.xml",
                               "<ColorTable>\n"
                               "  <Color code=\"X1\" main=\"#FF000080\" outline=\"#00FF00\"/>\n"
                               "  <Color code=\"X2\" main=\"#010203\"/>\n"
                               "  <Color code=\"BAD\" main=\"red\"/>\n"
                               "  <Theme style=\"2\"><Color code=\"X2\" main=\"#0A0B0C\"/></Theme>\n"
                               "</ColorTable>\n");
  Uxt_Theme_Color_Table* table = uxt_theme_add_color_table(file.c_str());
  ASSERT_NE(table, nullptr);
  uxt_theme_set_style(0);
  uxt_theme_set_color_table(table);
  int r, g, b, a, orr, og, ob, oa, sr, sg, sb, sa;
  ASSERT_EQ(uxt_theme_get_color("X1", &r, &g, &b, &a, &orr, &og, &ob, &oa, &sr, &sg, &sb, &sa),
            UXT_THEME_ERROR_NONE);
  EXPECT_EQ((std::vector<int>{r, g, b, a}), (std::vector<int>{255, 0, 0, 128}));
  EXPECT_EQ((std::vector<int>{orr, og, ob, oa}), (std::vector<int>{0, 255, 0, 255}));
  // The shadow defaults to the main colour.
  EXPECT_EQ((std::vector<int>{sr, sg, sb, sa}), (std::vector<int>{255, 0, 0, 128}));
  EXPECT_EQ(uxt_theme_get_color("BAD", &r, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr,
                                nullptr, nullptr, nullptr, nullptr),
            UXT_THEME_ERROR_NOT_FOUND);
  ASSERT_EQ(uxt_theme_get_color("X2", &r, &g, &b, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr,
                                nullptr, nullptr, nullptr),
            UXT_THEME_ERROR_NONE);
  EXPECT_EQ(r, 1);
  uxt_theme_set_style(2);
  ASSERT_EQ(uxt_theme_get_color("X2", &r, &g, &b, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr,
                                nullptr, nullptr, nullptr),
            UXT_THEME_ERROR_NONE);
  EXPECT_EQ((std::vector<int>{r, g, b}), (std::vector<int>{10, 11, 12}));
  uxt_theme_set_style(0);

  Evas_Object* win = pictavo::test::createTestWindow(100, 100);
  Evas_Object* rect = evas_object_rectangle_add(evas_object_evas_get(win));
  ASSERT_EQ(uxt_theme_object_set_color(rect, "X1"), UXT_THEME_ERROR_NONE);
  evas_object_color_get(rect, &r, &g, &b, &a);
  // Premultiplied: red 255 at alpha 128.
  EXPECT_EQ((std::vector<int>{r, g, b, a}), (std::vector<int>{128, 0, 0, 128}));
  EXPECT_EQ(uxt_theme_object_set_color(rect, "NOPE"), UXT_THEME_ERROR_NOT_FOUND);
  EXPECT_EQ(uxt_theme_object_set_color(nullptr, "X1"), UXT_THEME_ERROR_INVALID_PARAMETER);

  Evas_Object* button = elm_button_add(win);
  EXPECT_EQ(uxt_theme_object_replace_color(button, "B043", "X2"), UXT_THEME_ERROR_NONE);
  EXPECT_TRUE(edje_object_color_class_get(elm_layout_edje_get(button), "B043", &r, &g, &b, &a, &orr, &og, &ob,
                                          &oa, &sr, &sg, &sb, &sa));
  EXPECT_EQ((std::vector<int>{r, g, b}), (std::vector<int>{1, 2, 3}));
  EXPECT_EQ(uxt_theme_object_replace_color(rect, "B043", "X2"), UXT_THEME_ERROR_NOT_SUPPORTED);
  evas_object_del(win);
  uxt_theme_delete_color_table(table);
}

TEST(ThemeServiceTest, BrokenTablesAreRefused) {
  TempDir dir;
  EXPECT_EQ(uxt_theme_add_color_table(dir.file("missing.xml").c_str()), nullptr);
  EXPECT_EQ(uxt_theme_add_color_table(nullptr), nullptr);
  EXPECT_EQ(uxt_theme_add_color_table(writeFile(dir, "empty.xml", "<ColorTable></ColorTable>").c_str()),
            nullptr);
  EXPECT_EQ(uxt_theme_add_color_table(writeFile(dir, "junk.xml", "\x01\x02 not xml <<<<").c_str()), nullptr);
  EXPECT_EQ(uxt_theme_add_font_table(
                writeFile(dir, "nofamily.xml", "<FontTable><Font code=\"T\"/></FontTable>").c_str()),
            nullptr);
  EXPECT_EQ(uxt_theme_set_color_table(nullptr), UXT_THEME_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(uxt_theme_delete_font_table(nullptr), UXT_THEME_ERROR_INVALID_PARAMETER);
}

TEST(ThemeServiceTest, FontTableOfTheResources) {
  pictavo::test::ensureElm();
  char* path = nullptr;
  ASSERT_EQ(app_resource_manager_get(APP_RESOURCE_TYPE_IMAGE, "code/changeableFontInfo.xml", &path),
            APP_RESOURCE_ERROR_NONE);
  Uxt_Theme_Font_Table* table = uxt_theme_add_font_table(path);
  free(path);
  ASSERT_NE(table, nullptr);
  ASSERT_EQ(uxt_theme_set_font_table(table), UXT_THEME_ERROR_NONE);
  char* family = nullptr;
  char* style = nullptr;
  int size = 0;
  ASSERT_EQ(uxt_theme_get_font("T011", &family, &style, &size), UXT_THEME_ERROR_NONE);
  EXPECT_STREQ(family, "Sans");
  EXPECT_GT(size, 0);
  free(family);
  free(style);
  EXPECT_EQ(uxt_theme_get_font("NOPE", &family, &style, &size), UXT_THEME_ERROR_NOT_FOUND);
  uxt_theme_delete_font_table(table);
}

TEST(NotificationTest, PostedTextsAreKeptAndToastedOnTheWindow) {
  pictavo::test::ensureElm();
  notification_clear_posted();
  EXPECT_EQ(notification_status_message_post(nullptr), NOTIFICATION_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(notification_get_posted_count(), 0u);

  Evas_Object* win = pictavo::test::createTestWindow(480, 800);
  notification_set_window(win);
  EXPECT_EQ(notification_status_message_post("Saved."), NOTIFICATION_ERROR_NONE);
  ASSERT_EQ(notification_get_posted_count(), 1u);
  EXPECT_EQ(take(notification_get_posted(0)), "Saved.");
  EXPECT_EQ(notification_get_posted(1), nullptr);
  Evas* evas = evas_object_evas_get(win);
  EXPECT_NE(evas_object_name_find(evas, NOTIFICATION_TOAST_NAME), nullptr);
  // The toast goes by itself after about two seconds.
  EXPECT_TRUE(pictavo::test::runMainLoopUntil(
      [&] { return evas_object_name_find(evas, NOTIFICATION_TOAST_NAME) == nullptr; }, 5.0));

  // A deleted window is forgotten: posting later only logs.
  evas_object_del(win);
  EXPECT_EQ(notification_status_message_post("After"), NOTIFICATION_ERROR_NONE);
  EXPECT_EQ(notification_get_posted_count(), 2u);
  notification_clear_posted();
  EXPECT_EQ(notification_get_posted_count(), 0u);

  // Also a window deleted while its events are frozen.
  Evas_Object* frozen = pictavo::test::createTestWindow(100, 100);
  notification_set_window(frozen);
  evas_object_freeze_events_set(frozen, EINA_TRUE);
  evas_object_del(frozen);
  EXPECT_EQ(notification_get_window(), nullptr);
}

TEST(FeedbackTest, PlayNeedsInitialisation) {
  setenv("PICTAVO_NO_SOUND", "1", 1);
  while (feedback_is_initialized()) feedback_deinitialize();
  EXPECT_EQ(feedback_play(FEEDBACK_PATTERN_TAP), FEEDBACK_ERROR_NOT_INITIALIZED);
  EXPECT_EQ(feedback_deinitialize(), FEEDBACK_ERROR_NOT_INITIALIZED);
  int before = feedback_get_play_count();
  ASSERT_EQ(feedback_initialize(), FEEDBACK_ERROR_NONE);
  EXPECT_EQ(feedback_play(FEEDBACK_PATTERN_TAP), FEEDBACK_ERROR_NONE);
  EXPECT_EQ(feedback_play(static_cast<feedback_pattern_e>(99)), FEEDBACK_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(feedback_get_play_count(), before + 1);
  EXPECT_EQ(feedback_deinitialize(), FEEDBACK_ERROR_NONE);
  EXPECT_FALSE(feedback_is_initialized());
}

TEST(SystemSettingsTest, LocaleLanguageFromTheEnvironment) {
  const char* saved[] = {getenv("LC_ALL"), getenv("LC_MESSAGES"), getenv("LANG"), getenv("LANGUAGE")};
  std::string copies[4];
  for (int i = 0; i < 4; ++i) copies[i] = saved[i] ? saved[i] : "";
  unsetenv("LC_ALL");
  unsetenv("LC_MESSAGES");
  unsetenv("LANGUAGE");
  setenv("LANG", "de_DE.UTF-8", 1);
  char* value = nullptr;
  ASSERT_EQ(system_settings_get_value_string(SYSTEM_SETTINGS_KEY_LOCALE_LANGUAGE, &value),
            SYSTEM_SETTINGS_ERROR_NONE);
  EXPECT_EQ(take(value), "de_DE");
  setenv("LC_ALL", "fr_FR@euro", 1);
  ASSERT_EQ(system_settings_get_value_string(SYSTEM_SETTINGS_KEY_LOCALE_LANGUAGE, &value),
            SYSTEM_SETTINGS_ERROR_NONE);
  EXPECT_EQ(take(value), "fr_FR");
  setenv("LC_ALL", "C", 1);
  setenv("LANG", "POSIX", 1);
  ASSERT_EQ(system_settings_get_value_string(SYSTEM_SETTINGS_KEY_LOCALE_LANGUAGE, &value),
            SYSTEM_SETTINGS_ERROR_NONE);
  EXPECT_EQ(take(value), "en_US");
  EXPECT_EQ(system_settings_get_value_string(SYSTEM_SETTINGS_KEY_LOCALE_LANGUAGE, nullptr),
            SYSTEM_SETTINGS_ERROR_INVALID_PARAMETER);
  const char* names[] = {"LC_ALL", "LC_MESSAGES", "LANG", "LANGUAGE"};
  for (int i = 0; i < 4; ++i) {
    if (saved[i])
      setenv(names[i], copies[i].c_str(), 1);
    else
      unsetenv(names[i]);
  }
}
