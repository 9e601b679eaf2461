#pragma once
// The effects the editor offers, in display order: the string id of each
// label (text domain "pictavo") and the effect number passed to
// IE_Engine_Apply_Effect.

struct IeEffect {
  const char* labelId;
  int effectNumber;
};

int IE_Engine_Effect_Count();
// The effect at display position `order` (0-based); null outside the table.
const IeEffect* IE_Engine_Effect_Get(int order);
