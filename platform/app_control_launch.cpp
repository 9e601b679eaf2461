#include <Ecore.h>

#include <cstdlib>
#include <cstring>
#include <new>

#include "common/CLyLog.h"
#include "platform/app_control.h"
#include "platform/app_control_apps.h"
#include "platform/app_control_launch_private.h"

namespace {

struct PendingReply {
  std::shared_ptr<app_control_launch_state> state;
  app_control_h reply;
  app_control_result_e result;
};

// Replies reach the sender from the main loop, after the service's own
// callback has returned (as they would from another process).
void deliverReply(void* data) {
  auto* pending = static_cast<PendingReply*>(data);
  app_control_launch_state& state = *pending->state;
  if (state.terminated) {
    LYLOG_W("reply of %s dropped: the request was withdrawn", state.target.c_str());
  } else if (state.replyCb) {
    state.replyCb(state.sent, pending->reply, pending->result, state.userData);
  }
  app_control_destroy(pending->reply);
  delete pending;
}

std::string describe(app_control_h request) {
  std::string text = request->operation ? *request->operation : "(no operation)";
  if (request->appId) text += " -> " + *request->appId;
  return text;
}

// The storage settings page: nothing to show on the desktop.
int storageSettingsLaunch(app_control_h request) {
  char* viewtype = nullptr;
  app_control_get_extra_data(request, APP_CONTROL_SETTINGS_VIEWTYPE, &viewtype);
  LYLOG_W("storage settings (viewtype=%s): no settings page on the desktop", viewtype ? viewtype : "");
  free(viewtype);
  app_control_destroy(request);
  return APP_CONTROL_ERROR_NONE;
}

}  // namespace

app_control_launch_state::~app_control_launch_state() {
  app_control_destroy(sent);
}

extern "C" int app_control_send_launch_request(app_control_h app_control, app_control_reply_cb callback,
                                               void* user_data) {
  if (!app_control) return APP_CONTROL_ERROR_INVALID_PARAMETER;
  bool pick = app_control->operation && *app_control->operation == APP_CONTROL_OPERATION_PICK;
  bool share = app_control->operation && *app_control->operation == APP_CONTROL_OPERATION_SHARE;
  bool picker = app_control->appId && *app_control->appId == APP_CONTROL_PICKER_APP_ID;
  bool settings = app_control->appId && *app_control->appId == APP_CONTROL_STORAGE_SETTINGS_APP_ID;
  if (!((pick && picker) || (share && !app_control->appId) || settings)) {
    LYLOG_E("No application for %s", describe(app_control).c_str());
    return APP_CONTROL_ERROR_APP_NOT_FOUND;
  }

  auto state = std::shared_ptr<app_control_launch_state>(new (std::nothrow) app_control_launch_state);
  app_control_h received = nullptr;
  if (!state || app_control_clone(&state->sent, app_control) != APP_CONTROL_ERROR_NONE ||
      app_control_clone(&received, app_control) != APP_CONTROL_ERROR_NONE) {
    return APP_CONTROL_ERROR_OUT_OF_MEMORY;
  }
  state->sent->launch.reset();
  state->replyCb = callback;
  state->userData = user_data;
  state->target = describe(app_control);
  // The service sees this application as the caller and answers into the
  // state shared with the sender's request.
  received->caller = std::string(APP_CONTROL_SELF_APP_ID);
  received->replyRequested = callback != nullptr;
  received->launch = state;
  app_control->launch = state;
  LYLOG_I("launch %s (%s mode)", state->target.c_str(),
          app_control->launchMode == APP_CONTROL_LAUNCH_MODE_GROUP ? "group" : "single");

  int ret;
  if (pick) {
    ret = image_picker_launch(received, state);
  } else if (share) {
    ret = share_service_launch(received, state);
  } else {
    ret = storageSettingsLaunch(received);
  }
  if (ret != APP_CONTROL_ERROR_NONE) app_control->launch.reset();
  return ret;
}

extern "C" int app_control_send_terminate_request(app_control_h app_control) {
  if (!app_control || !app_control->launch) return APP_CONTROL_ERROR_INVALID_PARAMETER;
  std::shared_ptr<app_control_launch_state> state = app_control->launch;
  if (state->terminated) return APP_CONTROL_ERROR_NONE;
  state->terminated = true;
  LYLOG_I("terminate %s", state->target.c_str());
  if (state->terminate) {
    auto terminate = std::move(state->terminate);
    state->terminate = nullptr;
    terminate();
  }
  return APP_CONTROL_ERROR_NONE;
}

extern "C" int app_control_reply_to_launch_request(app_control_h reply, app_control_h request,
                                                   app_control_result_e result) {
  if (!reply || !request) return APP_CONTROL_ERROR_INVALID_PARAMETER;
  std::shared_ptr<app_control_launch_state> state = request->launch;
  if (!state) {
    // Launched from the desktop (command line): nobody waits for an answer.
    LYLOG_I("reply %d to the desktop launch", static_cast<int>(result));
    return APP_CONTROL_ERROR_NONE;
  }
  if (state->replied) {
    LYLOG_E("%s was already answered", state->target.c_str());
    return APP_CONTROL_ERROR_INVALID_PARAMETER;
  }
  state->replied = true;
  auto* pending = new (std::nothrow) PendingReply{state, nullptr, result};
  if (!pending || app_control_clone(&pending->reply, reply) != APP_CONTROL_ERROR_NONE) {
    delete pending;
    return APP_CONTROL_ERROR_OUT_OF_MEMORY;
  }
  pending->reply->launch.reset();
  if (!ecore_job_add(deliverReply, pending)) {
    LYLOG_E("Cannot queue the reply of %s", state->target.c_str());
    app_control_destroy(pending->reply);
    delete pending;
    return APP_CONTROL_ERROR_IO_ERROR;
  }
  return APP_CONTROL_ERROR_NONE;
}
