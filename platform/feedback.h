#pragma once
// Haptic and sound feedback. On the desktop the tap is a logged stand-in; with
// a sound device present (/dev/snd) and canberra-gtk-play installed, the
// desktop's click sound is played in the background instead.

#ifdef __cplusplus
extern "C" {
#endif

typedef enum {
  FEEDBACK_PATTERN_TAP = 0,
  FEEDBACK_PATTERN_SIP,
} feedback_pattern_e;

typedef enum {
  FEEDBACK_ERROR_NONE = 0,
  FEEDBACK_ERROR_INVALID_PARAMETER = -22,
  FEEDBACK_ERROR_NOT_INITIALIZED = -0x01B20000 | 0x01,
  FEEDBACK_ERROR_OPERATION_FAILED = -0x01B20000 | 0x02,
} feedback_error_e;

int feedback_initialize(void);
int feedback_deinitialize(void);
int feedback_play(feedback_pattern_e pattern);

// For tests: how many times feedback was played since start, and whether the
// service is initialised now.
int feedback_get_play_count(void);
int feedback_is_initialized(void);

#ifdef __cplusplus
}
#endif
