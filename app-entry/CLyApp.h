#pragma once
// The application: prepares the process-wide resources, creates the window
// with its naviframe, turns the platform's language, low-memory and pause
// events into events on the bus, and answers launch requests.

#include "app-assist/WApp.h"
#include "app-assist/WAppEventHandler.h"

class CLyMainView;

class CLyApp : public app_assist::WApp {
 public:
  CLyApp();
  ~CLyApp() override;

  // The application id of the gallery, the caller that hands images over.
  static const char* getGalleryAppId();

 protected:
  bool onCreate() override;
  void onTerminate() override;
  void onPause() override;
  void onResume() override;
  void onAppControl(app_control_h request, bool firstLaunch) override;

 private:
  void _installSigtermHandler();
  void _onLanguageChanged();
  void _onLowMemory();
  void _pushPlaceholder();
  static void __onSigterm(int signal);

  bool _launchedFromHome = false;
  CLyMainView* _mainView = nullptr;
  app_assist::WAppEventHandler _languageHandler;
  app_assist::WAppEventHandler _lowMemoryHandler;
};
