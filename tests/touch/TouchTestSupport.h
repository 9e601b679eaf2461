#pragma once
// Helpers of the touch tests: unit scale and fed input on a buffer canvas.

#include <Elementary.h>

#include "common/CLyAppData.h"
#include "tests/support/TestSupport.h"

namespace pictavo::test::touch {

// Scaled sizes equal design sizes (elm scale 1 over base scale 1).
inline void setUnitScale() {
  ensureElm();
  // The application's colour table: frame, handler and press colours.
  CLyAppData::getInstance()->setColorTable();
  elm_app_base_scale_set(1.0);
  elm_config_scale_set(1.0);
}

}  // namespace pictavo::test::touch
