#pragma once
// Records the replies of app_control launch requests for tests of the
// platform's launcher and of the shell around it. Header only: the support
// library itself does not link the platform.

#include <cstdlib>
#include <string>
#include <vector>

#include "platform/app_control.h"

namespace pictavo::test {

struct AppControlReplies {
  int count = 0;
  app_control_result_e result = APP_CONTROL_RESULT_APP_STARTED;
  std::vector<std::string> selected;  // of the latest reply
  bool hadArray = false;
  app_control_h request = nullptr;
  // The extra-data key the selection is read under.
  const char* selectedKey = APP_CONTROL_DATA_SELECTED;

  // An app_control_reply_cb; `data` is the AppControlReplies.
  static void onReply(app_control_h request, app_control_h reply, app_control_result_e result, void* data) {
    auto* replies = static_cast<AppControlReplies*>(data);
    ++replies->count;
    replies->result = result;
    replies->request = request;
    replies->selected.clear();
    char** values = nullptr;
    int length = 0;
    replies->hadArray = app_control_get_extra_data_array(reply, replies->selectedKey, &values, &length) ==
                        APP_CONTROL_ERROR_NONE;
    for (int i = 0; i < length; ++i) {
      if (values[i]) replies->selected.emplace_back(values[i]);
      free(values[i]);
    }
    free(values);
  }
};

}  // namespace pictavo::test
