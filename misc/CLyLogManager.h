#pragma once
// Records which features are used, as small records in the platform's
// usage-log provider.

#include "common/CLySingleton.h"
#include "platform/brelmo_log.h"

#define LY_LOG_APP_ID "com.brelmo.pictavo"
#define LY_LOG_URI "content://com.brelmo.logprovider/log/use_app_feature_survey"

// Features and extras recorded by the screens.
#define LY_LOG_FEATURE_COLLAGE "CLAY"
#define LY_LOG_FEATURE_REPLACE_OR_EFFECT "RPEF"
#define LY_LOG_EXTRA_REPLACE "REPL"
#define LY_LOG_EXTRA_EFFECT "EFFE"

class CLyLogManager : public CLySingleton<CLyLogManager> {
 public:
  ~CLyLogManager() override;

  // `extra` and `value` may be null. False (logged) on any failure.
  bool insertLog(const char* feature, const char* extra, const char* value);

 private:
  friend class CLySingleton<CLyLogManager>;
  CLyLogManager();

  bool __insert_log(const char* uri, const char* feature, const char* extra, const char* value);

  brelmo_log_manager_h _handle = nullptr;
};
