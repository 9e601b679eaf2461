#include "image-editor/IE_Effects.h"

namespace {

const IeEffect kEffects[] = {
    {"IDS_IMGE_BUTTON_PASTEL_M_EFFECT_ABB", 35},
    {"IDS_IMGE_BUTTON_DEEP_M_EFFECT_ABB", 32},
    {"IDS_IV_OPT_RETRO_M_EFFECT", 15},
    {"IDS_IMGE_BUTTON_FILM_M_EFFECT_ABB", 34},
    {"IDS_IMGE_BUTTON_CALM_M_EFFECT_ABB", 30},
    {"IDS_IMGE_BUTTON_DAWN_M_EFFECT_ABB", 31},
    {"IDS_IV_OPT_GREYSCALE_M_EFFECT", 3},
    {"IDS_IMGE_BUTTON_EVERGREEN_M_EFFECT_ABB", 33},
    {"IDS_IV_OPT_FADED_COLOURS_M_EFFECT", 5},
    {"IDS_IV_OPT_OLD_PHOTO_M_EFFECT", 1},
    {"IDS_IV_OPT_BLUR_M_EFFECT", 14},
    {"IDS_IV_OPT_NOSTALGIA_M_EFFECT", 17},
    {"IDS_IV_OPT_SUNSHINE_M_EFFECT", 16},
    {"IDS_IV_OPT_VINTAGE_M_EFFECT", 0},
    {"IDS_IV_OPT_SHARPEN_M_EFFECT", 8},
    {"IDS_IV_OPT_SOFT_GLOW_M_EFFECT", 9},
    {"IDS_IMGE_BUTTON_STARDUST_M_EFFECT_ABB", 22},
    {"IDS_IMGE_BUTTON_LIGHT_FLARE_M_EFFECT", 23},
    {"IDS_IV_OPT_CARTOON_M_EFFECT", 7},
};

}  // namespace

int IE_Engine_Effect_Count() {
  return (int)(sizeof(kEffects) / sizeof(kEffects[0]));
}

const IeEffect* IE_Engine_Effect_Get(int order) {
  return order >= 0 && order < IE_Engine_Effect_Count() ? &kEffects[order] : nullptr;
}
