#pragma once
// An application event: what happened (type), how it is delivered (mode)
// and a small payload (data). Copied by value wherever it is kept.

class CLyEvent {
 public:
  // Event ids. 1, 3 and 8 are valid slots that nothing raises yet.
  enum Type {
    TYPE_MIN = 1,
    LANGUAGE_CHANGED = 2,
    WINDOW_ROTATED = 4,  // data: window rotation in degrees
    CLOSE_OPTIONS = 5,
    LOW_MEMORY = 6,
    APP_PAUSED = 7,
    TYPE_MAX = 8,
  };
  // Immediate events go out at once; throttled ones are coalesced while
  // they keep coming (see CLyEventManager).
  enum Mode { MODE_IMMEDIATE = 0, MODE_THROTTLED = 1 };

  CLyEvent(int type = 0, int mode = MODE_IMMEDIATE, int data = 0) : type(type), mode(mode), data(data) {}
  virtual ~CLyEvent() = default;
  CLyEvent(const CLyEvent&) = default;
  CLyEvent& operator=(const CLyEvent&) = default;

  int getType() const { return type; }
  int getMode() const { return mode; }
  int getData() const { return data; }
  bool isValid() const { return type >= TYPE_MIN && type <= TYPE_MAX && (mode == 0 || mode == 1); }

  int type;
  int mode;
  int data;
};
