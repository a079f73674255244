#pragma once
// The public effect values and the core's effect stack: checking them, the
// layer-style stacking order, and adding each through the stack's own
// operation for its kind.

#include <vector>

#include "glimmer/glimmer.h"

namespace Glimmer {
class GxEffect;
}

namespace glimmer::detail {

// "outer shadow", "stroke", ... for messages.
const char* EffectName(const Effect& effect);

// Finite numbers, known enum values, well-formed colour ramps and tiles.
Status CheckEffect(const Effect& effect);

// Bottom to top in layer style: of each kind the last one given, in the
// canonical order (see effects.h).
std::vector<const Effect*> LayerStyleOrder(const std::vector<Effect>& effects);

// Adds the effect to the stack (replacing the stack's layer of its kind).
Status AddToStack(const Effect& effect, Glimmer::GxEffect* stack);

}  // namespace glimmer::detail
