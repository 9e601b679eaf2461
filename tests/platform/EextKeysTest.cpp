#include <Elementary.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "platform/efl_extension.h"
#include "tests/support/TestSupport.h"

namespace {

std::vector<std::string> gCalls;

void record(void* data, Evas_Object*, void*) {
  gCalls.push_back(static_cast<const char*>(data));
}

void press(Evas_Object* obj, const char* key) {
  Evas* evas = evas_object_evas_get(obj);
  evas_event_feed_key_down(evas, key, key, nullptr, nullptr, 0, nullptr);
  evas_event_feed_key_up(evas, key, key, nullptr, nullptr, 0, nullptr);
}

class EextKeysTest : public ::testing::Test {
 protected:
  void SetUp() override {
    gCalls.clear();
    win = pictavo::test::createTestWindow(200, 200);
  }
  void TearDown() override { evas_object_del(win); }
  Evas_Object* box(bool shown = true) {
    Evas_Object* b = elm_box_add(win);
    if (shown) evas_object_show(b);
    return b;
  }
  Evas_Object* win = nullptr;
};

}  // namespace

TEST_F(EextKeysTest, TheLatestVisibleObjectGetsTheKey) {
  Evas_Object* lower = box();
  Evas_Object* upper = box();
  eext_object_event_callback_add(lower, EEXT_CALLBACK_BACK, record, (void*)"lower");
  eext_object_event_callback_add(upper, EEXT_CALLBACK_BACK, record, (void*)"upper");
  eext_object_event_callback_add(lower, EEXT_CALLBACK_MORE, record, (void*)"lower-more");
  press(win, "Escape");
  press(win, "XF86Back");
  press(win, "Menu");
  press(win, "a");
  EXPECT_EQ(gCalls, (std::vector<std::string>{"upper", "upper", "lower-more"}));

  gCalls.clear();
  evas_object_hide(upper);
  press(win, "Escape");
  evas_object_show(upper);  // shown again: on top again
  press(win, "Escape");
  EXPECT_EQ(gCalls, (std::vector<std::string>{"lower", "upper"}));

  gCalls.clear();
  EXPECT_EQ(eext_object_event_callback_del(upper, EEXT_CALLBACK_BACK, record), (void*)"upper");
  EXPECT_EQ(eext_object_event_callback_del(upper, EEXT_CALLBACK_BACK, record), nullptr);
  press(win, "Escape");
  EXPECT_EQ(gCalls, (std::vector<std::string>{"lower"}));
}

TEST_F(EextKeysTest, AHiddenParentHidesTheObject) {
  Evas_Object* outer = elm_layout_add(win);
  evas_object_show(outer);
  Evas_Object* inner = elm_box_add(outer);
  evas_object_show(inner);
  elm_box_pack_end(inner, elm_box_add(inner));
  Evas_Object* frontBox = elm_box_add(win);
  eext_object_event_callback_add(inner, EEXT_CALLBACK_BACK, record, (void*)"inner");
  eext_object_event_callback_add(frontBox, EEXT_CALLBACK_BACK, record, (void*)"hidden");
  press(win, "Escape");
  evas_object_hide(outer);
  press(win, "Escape");
  EXPECT_EQ(gCalls, (std::vector<std::string>{"inner"}));
}

TEST_F(EextKeysTest, CallbackDeletingItsObjectStopsTheRest) {
  Evas_Object* target = box();
  eext_object_event_callback_add(
      target, EEXT_CALLBACK_BACK,
      [](void*, Evas_Object* obj, void*) {
        gCalls.push_back("deleting");
        evas_object_del(obj);
      },
      nullptr);
  eext_object_event_callback_add(target, EEXT_CALLBACK_BACK, record, (void*)"after");
  press(win, "Escape");
  EXPECT_EQ(gCalls, (std::vector<std::string>{"deleting"}));
  press(win, "Escape");  // nothing registered any more
  EXPECT_EQ(gCalls.size(), 1u);
}

TEST_F(EextKeysTest, BadArgumentsAreIgnored) {
  eext_object_event_callback_add(nullptr, EEXT_CALLBACK_BACK, record, nullptr);
  eext_object_event_callback_add(box(), EEXT_CALLBACK_LAST, record, nullptr);
  eext_object_event_callback_add(box(), EEXT_CALLBACK_BACK, nullptr, nullptr);
  EXPECT_EQ(eext_object_event_callback_del(nullptr, EEXT_CALLBACK_BACK, record), nullptr);
  press(win, "Escape");
  EXPECT_TRUE(gCalls.empty());
}

TEST_F(EextKeysTest, AnObjectDeletedWithFrozenEventsIsForgotten) {
  // Evas holds back the DEL callback of an object whose events are frozen;
  // its record must go all the same, or keys keep visiting a dead object.
  Evas_Object* lower = box();
  Evas_Object* frozen = box();
  eext_object_event_callback_add(lower, EEXT_CALLBACK_BACK, record, (void*)"lower");
  eext_object_event_callback_add(frozen, EEXT_CALLBACK_BACK, record, (void*)"frozen");
  evas_object_freeze_events_set(frozen, EINA_TRUE);
  evas_object_del(frozen);
  // Only the address is compared: nothing is registered for it any more.
  EXPECT_EQ(eext_object_event_callback_del(frozen, EEXT_CALLBACK_BACK, record), nullptr);
  press(win, "Escape");
  EXPECT_EQ(gCalls, (std::vector<std::string>{"lower"}));
}
