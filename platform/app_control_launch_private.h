#pragma once
// Sending requests to the other applications and carrying their replies back.
// The services standing for those applications on the desktop (image picker,
// share, storage settings) live in their own files; this header joins them to
// app_control_launch.cpp. Not for application code.

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include <Evas.h>

#include "platform/app_control_private.h"

// Shared by a sent request, its clones and the copy the service received.
struct app_control_launch_state {
  app_control_reply_cb replyCb = nullptr;
  void* userData = nullptr;
  // The sender's request as sent (without launch state), handed to replyCb.
  app_control_h sent = nullptr;
  std::string target;       // for logs
  bool terminated = false;  // the sender asked the service to close
  bool replied = false;     // the service has answered
  // Closes the running service (set by services that stay open).
  std::function<void()> terminate;

  ~app_control_launch_state();
};

// Services. Each takes the request copy it received (owned from then on) and
// answers through app_control_reply_to_launch_request on it.
int image_picker_launch(app_control_h request, const std::shared_ptr<app_control_launch_state>& state);
int share_service_launch(app_control_h request, const std::shared_ptr<app_control_launch_state>& state);

// --- Test hooks of the image picker ---
// The picker window and its file selector while a picker is open, else NULL.
Evas_Object* image_picker_get_window(void);
Evas_Object* image_picker_get_fileselector(void);
// Answers the open picker as its "done" button does with these paths
// (validated: image files only, at most "max-count"). False when no picker is
// open or the choice is refused (then the picker stays open).
bool image_picker_submit(const std::vector<std::string>& paths);
// Cancels the open picker (reply without data).
bool image_picker_cancel(void);
// Number of pickers opened so far in this process.
int image_picker_get_open_count(void);
