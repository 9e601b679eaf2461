#include "app-entry/CLyApp.h"

#include <Elementary.h>
#include <gtest/gtest.h>
#include <signal.h>

#include <functional>
#include <string>
#include <vector>

#include "app-assist/WNaviframeController.h"
#include "app-assist/WWindowController.h"
#include "common/CLyAppData.h"
#include "common/CLyEvent.h"
#include "common/ILyEventListener.h"
#include "manager/CLyEventManager.h"
#include "platform/app_private.h"
#include "tests/support/TestSupport.h"

using pictavo::test::LogCapture;

namespace {

// Runs steps on the application's main loop, one after another with the
// given delays; the last step should end the application.
struct Script {
  std::vector<std::pair<double, std::function<void()>>> steps;
  size_t next = 0;

  static Eina_Bool tick(void* data) {
    auto* script = static_cast<Script*>(data);
    script->steps[script->next].second();
    ++script->next;
    if (script->next < script->steps.size()) {
      ecore_timer_add(script->steps[script->next].first, tick, script);
    }
    return ECORE_CALLBACK_CANCEL;
  }
  void start() { ecore_timer_add(steps[0].first, tick, this); }
};

class TestApp : public CLyApp {
 public:
  std::function<void()> afterCreate;

 protected:
  bool onCreate() override {
    bool ok = CLyApp::onCreate();
    if (afterCreate) afterCreate();
    return ok;
  }
};

struct Recorder : ILyEventListener {
  std::vector<int> types;
  std::vector<std::string>* sequence = nullptr;
  void onEvent(const CLyEvent& event) override {
    types.push_back(event.type);
    if (sequence) sequence->push_back("event " + std::to_string(event.type));
  }
};

class CLyAppTest : public ::testing::Test {
 protected:
  void SetUp() override {
    pictavo::test::ensureElm();
    struct sigaction current = {};
    sigaction(SIGTERM, nullptr, &mSavedTerm);
    (void)current;
    CLyEventManager::getInstance()->setThrottleTimeScale(0.01);
  }
  void TearDown() override {
    sigaction(SIGTERM, &mSavedTerm, nullptr);
    if (CLyEventManager::getInstance()->getThrottleInterval() != 0)
      CLyEventManager::getInstance()->endThrottleWindow();
  }
  struct sigaction mSavedTerm = {};
};

}  // namespace

TEST_F(CLyAppTest, StartsWithWindowThemeAndTextDomain) {
  TestApp app;
  bool checked = false;
  Script script;
  script.steps = {
      {0.2,
       [&] {
         app_assist::WWindowController* window = app.getWindowController();
         ASSERT_NE(window, nullptr);
         Evas_Object* win = window->getEvasObj();
         EXPECT_STREQ(elm_win_title_get(win), "pictavo");
         EXPECT_DOUBLE_EQ(elm_app_base_scale_get(), 2.6);
         EXPECT_EQ(CLyAppData::getInstance()->getWindowController(), window);
         EXPECT_NE(CLyAppData::getInstance()->getColorTable(), nullptr);
         EXPECT_NE(CLyAppData::getInstance()->getFontTable(), nullptr);
         EXPECT_EQ(elm_win_indicator_opacity_get(win), ELM_WIN_INDICATOR_TRANSPARENT);
         ASSERT_NE(window->getConformant(), nullptr);
         EXPECT_EQ(evas_object_data_get(window->getConformant(), "overlap"), reinterpret_cast<void*>(1));
         auto* naviframe = dynamic_cast<app_assist::WNaviframeController*>(window->getBaseViewController());
         ASSERT_NE(naviframe, nullptr);
         // The first launch request put a page up.
         EXPECT_NE(naviframe->getTopViewController(), nullptr);
         const char* domain = bindtextdomain("pictavo", nullptr);
         ASSERT_NE(domain, nullptr);
         EXPECT_NE(std::string(domain).find("locale"), std::string::npos);
         checked = true;
       }},
      {0.0, [] { ui_app_exit(); }}};
  app.afterCreate = [&] { script.start(); };
  LogCapture log;
  EXPECT_EQ(app.run(0, nullptr), 0);
  EXPECT_TRUE(checked);
  EXPECT_TRUE(log.contains("Caller is Homescreen"));
  // Terminate let the application data go.
  EXPECT_FALSE(CLyAppData::hasInstance());
}

TEST_F(CLyAppTest, SigtermEndsTheProgram) {
  signal(SIGTERM, SIG_DFL);
  TestApp app;
  bool fallback = false;
  Script script;
  script.steps = {{0.2, [] { raise(SIGTERM); }}, {3.0, [&] {
                                                    fallback = true;
                                                    ui_app_exit();
                                                  }}};
  app.afterCreate = [&] { script.start(); };
  EXPECT_EQ(app.run(0, nullptr), 0);
  EXPECT_FALSE(fallback) << "SIGTERM should have ended the main loop";
}

TEST_F(CLyAppTest, SigtermWhileIgnoredKeepsTheProgramRunning) {
  signal(SIGTERM, SIG_IGN);
  TestApp app;
  bool stillRunning = false;
  Script script;
  script.steps = {{0.2, [] { raise(SIGTERM); }}, {0.5, [&] {
                                                    stillRunning = true;
                                                    ui_app_exit();
                                                  }}};
  app.afterCreate = [&] { script.start(); };
  LogCapture log;
  EXPECT_EQ(app.run(0, nullptr), 0);
  EXPECT_TRUE(stillRunning);
  EXPECT_TRUE(log.contains("SIGTERM stays ignored"));
  struct sigaction current = {};
  sigaction(SIGTERM, nullptr, &current);
  EXPECT_EQ(current.sa_handler, SIG_IGN);
}

TEST_F(CLyAppTest, SystemEventsReachTheBus) {
  TestApp app;
  Recorder recorder;
  std::vector<std::string> sequence;
  recorder.sequence = &sequence;
  CLyEventManager::getInstance()->attach(&recorder);
  Script script;
  script.steps = {{0.1,
                   [&] {
                     evas_object_smart_callback_add(
                         app.getWindowController()->getEvasObj(), "language,changed",
                         [](void* data, Evas_Object*, void*) {
                           static_cast<std::vector<std::string>*>(data)->push_back("language set");
                         },
                         &sequence);
                     ui_app_raise_event(APP_EVENT_LANGUAGE_CHANGED, "de_DE");
                   }},
                  {0.1, [] { ui_app_raise_event(APP_EVENT_LOW_MEMORY, nullptr); }},
                  {0.1, [] { ui_app_exit(); }}};
  app.afterCreate = [&] { script.start(); };
  EXPECT_EQ(app.run(0, nullptr), 0);
  CLyEventManager::getInstance()->detach(&recorder);
  ASSERT_GE(recorder.types.size(), 2u);
  EXPECT_EQ(recorder.types[0], CLyEvent::LANGUAGE_CHANGED);
  EXPECT_EQ(recorder.types[1], CLyEvent::LOW_MEMORY);
  // The listeners hear of the change after the language was set.
  ASSERT_GE(sequence.size(), 2u);
  EXPECT_EQ(sequence[0], "language set");
  EXPECT_EQ(sequence[1], "event 2");
}

TEST_F(CLyAppTest, PopOfTheOnlyScreenEndsTheProgram) {
  TestApp app;
  bool fallback = false;
  Script script;
  script.steps = {{0.2,
                   [&] {
                     auto* naviframe = dynamic_cast<app_assist::WNaviframeController*>(
                         app.getWindowController()->getBaseViewController());
                     ASSERT_NE(naviframe, nullptr);
                     elm_naviframe_item_pop(naviframe->getEvasObj());
                   }},
                  {3.0, [&] {
                     fallback = true;
                     ui_app_exit();
                   }}};
  app.afterCreate = [&] { script.start(); };
  EXPECT_EQ(app.run(0, nullptr), 0);
  EXPECT_FALSE(fallback);
}
