#pragma once
// Shared pieces of the framework tests: a real window controller on the
// buffer engine and view controllers that count their life cycle.

#include <Elementary.h>

#include <cstdlib>
#include <string>

#include "app-assist/WContentViewController.h"
#include "app-assist/WViewController.h"
#include "app-assist/WWindowController.h"
#include "platform/core/app_common.h"
#include "tests/support/TestSupport.h"

namespace appassist_test {

struct LifeCounts {
  int created = 0;
  int destroyed = 0;
  int deleted = 0;
};

// A window controller with its window, background, conformant and base layout.
inline app_assist::WWindowController* makeWindow(const char* name = "test-window") {
  pictavo::test::ensureElm();
  auto* window = new app_assist::WWindowController(name);
  window->create();
  return window;
}

// A plain view whose object is an elm box (or a layout with swallow parts).
class CountingView : public app_assist::WViewController {
 public:
  explicit CountingView(LifeCounts* counts, bool withParts = false)
      : mCounts(counts), mWithParts(withParts) {}
  bool failOnCreate = false;

 protected:
  ~CountingView() override { ++mCounts->deleted; }
  bool onCreate(void*) override { return !failOnCreate; }
  Evas_Object* onCreateView(Evas_Object* parent, void*) override {
    if (mWithParts) {
      Evas_Object* layout = elm_layout_add(parent);
      std::string edj =
          std::string(getenv("PICTAVO_RES_DIR") ? getenv("PICTAVO_RES_DIR") : "") + "/edje/WDefaultView.edj";
      elm_layout_file_set(layout, edj.c_str(), "default-view");
      return layout;
    }
    return elm_box_add(parent);
  }
  void onCreated() override { ++mCounts->created; }
  void onDestroy() override { ++mCounts->destroyed; }

 private:
  LifeCounts* mCounts;
  bool mWithParts;
};

// A naviframe page that counts its life and lets a test veto pops.
class CountingPage : public app_assist::WContentViewController {
 public:
  explicit CountingPage(LifeCounts* counts, const char* name = "page")
      : WContentViewController(name), mCounts(counts) {}
  bool allowPop = true;
  int popAsked = 0;
  int becameTop = 0;
  int pushed = 0;

 protected:
  ~CountingPage() override { ++mCounts->deleted; }
  Evas_Object* onCreateView(Evas_Object* parent, void*) override { return elm_box_add(parent); }
  void onCreated() override { ++mCounts->created; }
  void onDestroy() override { ++mCounts->destroyed; }
  void onPushed(Elm_Object_Item*) override { ++pushed; }
  bool onPop() override {
    ++popAsked;
    return allowPop;
  }
  void onBecomeTop() override { ++becameTop; }

 private:
  LifeCounts* mCounts;
};

inline void pressKey(Evas_Object* anyObj, const char* key) {
  Evas* evas = evas_object_evas_get(anyObj);
  evas_event_feed_key_down(evas, key, key, nullptr, nullptr, 0, nullptr);
  evas_event_feed_key_up(evas, key, key, nullptr, nullptr, 0, nullptr);
}

}  // namespace appassist_test
