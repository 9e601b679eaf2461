#include "model/size-modifier/CLySizeModifierBase.h"
