#include <gtest/gtest.h>

#include <csignal>
#include <cstdlib>
#include <functional>
#include <string>
#include <vector>

#include "app-assist/WApp.h"
#include "app-assist/WAppEventHandler.h"
#include "app-assist/WMenuPopupController.h"
#include "app-assist/WNaviframeController.h"
#include "platform/app_private.h"
#include "tests/appassist/AppAssistTestUtil.h"

using namespace app_assist;
using pictavo::test::AssertionFired;
using pictavo::test::LogCapture;

namespace {

class TestApp : public WApp {
 public:
  std::vector<std::string> calls;
  std::function<bool(TestApp&)> create;
  std::function<void(TestApp&, app_control_h, bool)> control;
  std::function<void(TestApp&)> pause;
  WViewControllerWeakPtr naviframe;

  // The usual start: window, naviframe as its base view.
  bool buildWindow() {
    auto* window = new WWindowController("lifecycle");
    if (!attachWindowController(window)) return false;
    auto* nf = new WNaviframeController();
    if (!window->attachBaseViewController(nf)) return false;
    naviframe = nf->getWeakPtr();
    return true;
  }
  void cleanUp() {
    if (WWindowController* window = getWindowController()) window->destroy();
  }

 protected:
  bool onCreate() override {
    calls.push_back("create");
    return create ? create(*this) : buildWindow();
  }
  void onTerminate() override { calls.push_back("terminate"); }
  void onPause() override {
    calls.push_back("pause");
    if (pause) pause(*this);
  }
  void onResume() override { calls.push_back("resume"); }
  void onAppControl(app_control_h request, bool firstLaunch) override {
    calls.push_back(firstLaunch ? "first-control" : "control");
    if (control)
      control(*this, request, firstLaunch);
    else
      ui_app_exit();
  }
};

int runApp(TestApp& app, std::vector<std::string> args) {
  pictavo::test::ensureElm();
  std::vector<char*> argv;
  for (auto& arg : args) argv.push_back(arg.data());
  argv.push_back(nullptr);
  return app.run(static_cast<int>(args.size()), argv.data());
}

// Ends a test application that would otherwise wait forever.
Ecore_Timer* safetyExit(double seconds) {
  return ecore_timer_add(
      seconds,
      [](void*) -> Eina_Bool {
        ADD_FAILURE() << "application did not end by itself";
        ui_app_exit();
        return ECORE_CALLBACK_CANCEL;
      },
      nullptr);
}

}  // namespace

TEST(AppLifecycle, LaunchWithImagePathsComesFromTheGallery) {
  TestApp app;
  std::vector<std::string> paths;
  std::string caller;
  app.control = [&](TestApp&, app_control_h request, bool) {
    char** values = nullptr;
    int length = 0;
    EXPECT_EQ(app_control_get_extra_data_array(request, "appcontrol/data/selected", &values, &length),
              APP_CONTROL_ERROR_NONE);
    for (int i = 0; i < length; ++i) {
      paths.push_back(values[i] ? values[i] : "(null)");
      free(values[i]);
    }
    free(values);
    char* id = nullptr;
    app_control_get_caller(request, &id);
    caller = id ? id : "";
    free(id);
    ui_app_exit();
  };
  EXPECT_EQ(runApp(app, {"pictavo", "--verbose", "/photos/a.jpg", "b.png"}), APP_ERROR_NONE);
  ASSERT_EQ(paths.size(), 2u);
  EXPECT_EQ(paths[0], "/photos/a.jpg");
  EXPECT_EQ(paths[1].front(), '/');
  EXPECT_EQ(paths[1].substr(paths[1].size() - 6), "/b.png");
  EXPECT_EQ(caller, APP_CONTROL_GALLERY_APP_ID);
  EXPECT_EQ(app.calls, (std::vector<std::string>{"create", "first-control", "terminate"}));
  // Terminate destroys the window's base view.
  EXPECT_TRUE(app.naviframe.expired());
  app.cleanUp();
}

TEST(AppLifecycle, LaunchWithoutPathsHasNoCallerAndLaterRequestsAreNotFirst) {
  TestApp app;
  bool hadCaller = true;
  int missingArray = 0;
  app.control = [&](TestApp&, app_control_h request, bool first) {
    char* id = nullptr;
    app_control_get_caller(request, &id);
    hadCaller = id != nullptr;
    free(id);
    char** values = nullptr;
    int length = 0;
    if (app_control_get_extra_data_array(request, APP_CONTROL_DATA_SELECTED, &values, &length) ==
        APP_CONTROL_ERROR_KEY_NOT_FOUND)
      ++missingArray;
    if (first) {
      EXPECT_TRUE(ui_app_post_app_control(request));
    } else {
      ui_app_exit();
    }
  };
  Ecore_Timer* safety = safetyExit(5.0);
  EXPECT_EQ(runApp(app, {"pictavo"}), APP_ERROR_NONE);
  ecore_timer_del(safety);
  EXPECT_FALSE(hadCaller);
  EXPECT_EQ(missingArray, 2);
  EXPECT_EQ(app.calls, (std::vector<std::string>{"create", "first-control", "control", "terminate"}));
  app.cleanUp();
}

TEST(AppLifecycle, FailedCreateEndsWithoutTerminate) {
  TestApp app;
  app.create = [](TestApp&) { return false; };
  EXPECT_NE(runApp(app, {"pictavo"}), APP_ERROR_NONE);
  EXPECT_EQ(app.calls, (std::vector<std::string>{"create"}));
  EXPECT_FALSE(ui_app_is_running());
}

TEST(AppLifecycle, ExitDuringCreateSkipsTheLaunchRequest) {
  TestApp app;
  app.create = [](TestApp& self) {
    ui_app_exit();
    return self.buildWindow();
  };
  EXPECT_EQ(runApp(app, {"pictavo", "x.jpg"}), APP_ERROR_NONE);
  EXPECT_EQ(app.calls, (std::vector<std::string>{"create", "terminate"}));
  app.cleanUp();
}

TEST(AppLifecycle, HidingTheWindowPausesAndClosesTheMenuFirst) {
  TestApp app;
  WViewControllerWeakPtr menu;
  bool menuOpenAtPause = true;
  bool iconifyPaused = false;
  app.control = [&](TestApp& self, app_control_h, bool) {
    Evas_Object* win = self.getWindowController()->getEvasObj();
    auto* m = new WMenuPopupController();
    ASSERT_TRUE(m->createMenu(win, self.getWindowController()->getBaseLayout()));
    m->appendItem("item", [] {});
    m->showMenu();
    menu = m->getWeakPtr();
    evas_object_hide(win);
    EXPECT_TRUE(ui_app_is_paused());
    evas_object_hide(win);  // already paused: no second pause
    evas_object_show(win);
    EXPECT_FALSE(ui_app_is_paused());
    // Iconified by the window manager, then restored (the buffer engine has
    // no window manager: its notifications are raised by hand).
    elm_win_iconified_set(win, EINA_TRUE);
    evas_object_smart_callback_call(win, "iconified", nullptr);
    iconifyPaused = ui_app_is_paused();
    elm_win_iconified_set(win, EINA_FALSE);
    evas_object_smart_callback_call(win, "normal", nullptr);
    EXPECT_FALSE(ui_app_is_paused());
    ui_app_exit();
  };
  app.pause = [&](TestApp&) { menuOpenAtPause = WMenuPopupController::getCurrentMenu() != nullptr; };
  EXPECT_EQ(runApp(app, {"pictavo"}), APP_ERROR_NONE);
  EXPECT_FALSE(menuOpenAtPause);
  EXPECT_TRUE(menu.expired());
  EXPECT_TRUE(iconifyPaused);
  EXPECT_EQ(app.calls, (std::vector<std::string>{"create", "first-control", "pause", "resume", "pause",
                                                 "resume", "terminate"}));
  app.cleanUp();
}

TEST(AppLifecycle, SignalsRaiseLanguageAndLowMemoryEvents) {
  TestApp app;
  WAppEventHandler language, lowMemory;
  std::string lang;
  int lows = 0;
  app.create = [&](TestApp& self) {
    language.addEventHandler(
        APP_EVENT_LANGUAGE_CHANGED,
        [&](app_event_info_h info, void*) {
          char* value = nullptr;
          EXPECT_EQ(app_event_get_language(info, &value), APP_ERROR_NONE);
          lang = value ? value : "";
          free(value);
        },
        nullptr);
    lowMemory.addEventHandler(
        APP_EVENT_LOW_MEMORY,
        [&](app_event_info_h info, void* data) {
          EXPECT_EQ(data, &lows);
          app_event_low_memory_status_e status;
          EXPECT_EQ(app_event_get_low_memory_status(info, &status), APP_ERROR_NONE);
          ++lows;
        },
        &lows);
    return self.buildWindow();
  };
  app.control = [&](TestApp&, app_control_h, bool) {
    setenv("LANGUAGE", "fr_FR.UTF-8", 1);
    raise(SIGUSR1);
    raise(SIGUSR2);
    ecore_timer_add(
        0.01,
        [](void* data) -> Eina_Bool {
          auto* state = static_cast<std::pair<std::string*, int*>*>(data);
          if (state->first->empty() || *state->second == 0) return ECORE_CALLBACK_RENEW;
          ui_app_exit();
          return ECORE_CALLBACK_CANCEL;
        },
        new std::pair<std::string*, int*>(&lang, &lows));
  };
  Ecore_Timer* safety = safetyExit(5.0);
  EXPECT_EQ(runApp(app, {"pictavo"}), APP_ERROR_NONE);
  ecore_timer_del(safety);
  unsetenv("LANGUAGE");
  EXPECT_EQ(lang, "fr_FR");
  EXPECT_EQ(lows, 1);
  app.cleanUp();
}

TEST(AppLifecycle, EventHandlerRegisteredTwiceHoldsOneRegistration) {
  WAppEventHandler handler;
  int first = 0, second = 0;
  EXPECT_TRUE(handler.addEventHandler(
      APP_EVENT_LOW_MEMORY, [&](app_event_info_h, void*) { ++first; }, nullptr));
  EXPECT_TRUE(handler.addEventHandler(
      APP_EVENT_LOW_MEMORY, [&](app_event_info_h, void*) { ++second; }, nullptr));
  ui_app_raise_event(APP_EVENT_LOW_MEMORY, nullptr);
  ui_app_raise_event(APP_EVENT_LANGUAGE_CHANGED, "de_DE");
  EXPECT_EQ(first, 0);
  EXPECT_EQ(second, 1);
  handler.removeEventHandler();
  EXPECT_FALSE(handler.isRegistered());
  ui_app_raise_event(APP_EVENT_LOW_MEMORY, nullptr);
  EXPECT_EQ(second, 1);

  // A handler that removes itself while being called.
  auto* selfRemoving = new WAppEventHandler();
  int calls = 0;
  selfRemoving->addEventHandler(
      APP_EVENT_LOW_MEMORY,
      [&](app_event_info_h, void*) {
        ++calls;
        delete selfRemoving;
      },
      nullptr);
  ui_app_raise_event(APP_EVENT_LOW_MEMORY, nullptr);
  ui_app_raise_event(APP_EVENT_LOW_MEMORY, nullptr);
  EXPECT_EQ(calls, 1);
}

TEST(AppLifecycle, WindowClosedWhileRunningAndSecondWindowAsserts) {
  TestApp app;
  LogCapture log;
  bool asserted = false;
  int nested = APP_ERROR_NONE;
  app.control = [&](TestApp& self, app_control_h, bool) {
    try {
      self.attachWindowController(new WWindowController("second"));
    } catch (const AssertionFired&) {
      asserted = true;
    }
    ui_app_lifecycle_callback_s callbacks{};
    nested = ui_app_main(0, nullptr, &callbacks, nullptr);
    // Closing the window deletes its controller; terminate must not reach it.
    evas_object_del(self.getWindowController()->getEvasObj());
    EXPECT_EQ(self.getWindowController(), nullptr);
    ui_app_exit();
  };
  EXPECT_EQ(runApp(app, {"pictavo"}), APP_ERROR_NONE);
  EXPECT_TRUE(asserted);
  EXPECT_TRUE(log.contains("WASSERT! _pv->_window == nullptr"));
  EXPECT_EQ(nested, APP_ERROR_ALREADY_RUNNING);
  EXPECT_EQ(app.calls.back(), "terminate");
  EXPECT_TRUE(app.naviframe.expired());
}

TEST(AppLifecycle, VersionString) {
  EXPECT_STREQ(WApp::getVersion(), "2.1.9");
}
