#pragma once

#include "effect/GxECoreBase.h"

namespace Glimmer {

// A new layer of `kind` (1..8, 10, 11, 12) with its kind set and no property;
// null for any other kind or when no memory is left.
GxECoreBase* CreateEffectLayer(int kind);

}  // namespace Glimmer
