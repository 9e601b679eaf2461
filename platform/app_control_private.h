#pragma once
// The record behind app_control_h, shared by the files of the platform layer
// that build, send and answer requests. Not for application code.

#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "platform/app_control.h"

// State of a request that was sent or received, owned by the launching code;
// clones of a request share it, so a kept clone can still be answered.
struct app_control_launch_state;

struct app_control_extra {
  bool isArray = false;
  // A single string is values[0]; array entries may be absent (sent as NULL).
  std::vector<std::optional<std::string>> values;
};

struct app_control_s {
  std::optional<std::string> operation;
  std::optional<std::string> appId;
  std::optional<std::string> uri;
  std::optional<std::string> mime;
  std::optional<std::string> caller;
  app_control_launch_mode_e launchMode = APP_CONTROL_LAUNCH_MODE_SINGLE;
  bool replyRequested = false;
  // Keyed by the normalised key (see app_control_normalize_key).
  std::map<std::string, app_control_extra> extras;
  std::shared_ptr<app_control_launch_state> launch;
};

// The key under which an extra is stored: the short form without the
// "http://tizen.org/" prefix, so both spellings reach the same entry.
std::string app_control_normalize_key(const char* key);

// Makes a request record directly (nullptr when out of memory).
app_control_h app_control_new_record();

// The launch request of a program started from the command line:
// arguments that are not options ("-x", "--xyz") are image paths; they are
// made absolute and handed over as the string array APP_CONTROL_DATA_SELECTED,
// with the gallery as caller. Without paths the request has no caller (the
// home screen). "--" ends the options. The caller destroys the request.
app_control_h app_control_create_launch_request(int argc, char** argv);
