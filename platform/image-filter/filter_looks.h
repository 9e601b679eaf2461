#pragma once
// Internal to the image filter: the looks behind the filter codes, one
// family per file (tone and colour grades, blurs and glows, detail and
// drawing looks, light looks).

#include "platform/image-filter/filter_frame.h"

namespace imgfilter {

// Runs the look of `code`; false when the code is unknown.
bool runLook(int code, const Frame& f);
bool isKnownCode(int code);

// Plain copy of the source (codes without a look of their own).
void lookIdentity(const Frame& f);

// Tone and colour grades (filter_tone.cpp).
void lookPastel(const Frame& f);
void lookDeep(const Frame& f);
void lookRetro(const Frame& f);
void lookFilm(const Frame& f);
void lookCalm(const Frame& f);
void lookDawn(const Frame& f);
void lookGreyscale(const Frame& f);
void lookEvergreen(const Frame& f);
void lookFaded(const Frame& f);
void lookOldPhoto(const Frame& f);
void lookVintage(const Frame& f);
void lookSepia(const Frame& f);
void lookWarm(const Frame& f);
void lookCool(const Frame& f);

// Blurs and glows (filter_glow.cpp).
void lookBlur(const Frame& f);
void lookSoftGlow(const Frame& f);
void lookNostalgia(const Frame& f);
void lookSunshine(const Frame& f);

// Detail and drawing looks (filter_sharpen.cpp, filter_cartoon.cpp).
void lookSharpen(const Frame& f);
void lookCartoon(const Frame& f);

// Light looks (filter_light.cpp).
void lookStardust(const Frame& f);
void lookLightFlare(const Frame& f);

}  // namespace imgfilter
