#pragma once
// Resource limits of the effect filters, each with its reason. The effect
// stack never comes near them (it clamps every size and distance to 0..100);
// they exist so that a record filled in by hand cannot make a filter overflow
// an int or run for hours.

namespace Glimmer {

// Largest blur or stroke radius, in whole pixels, that a filter works with.
// The filters' work grows with radius x area (stroke: radius^2 x edge
// pixels), so ten times what the stack can ask for is already minutes per
// drawing. Past it the layer draws nothing and asks for no margin. It also
// keeps every weight sum x 255 and every padded plane size inside int32.
inline constexpr int kMaxFilterRadius = 1024;

// Shadow displacements are clamped to +-2^30 pixels before rounding. No
// canvas can be that wide (pixel blocks stop at 2^31 bytes, 4 bytes a
// pixel), so the clamp changes no picture, and offset + radius sums stay
// inside int32.
inline constexpr float kMaxShadowDisplacement = 1073741824.0f;

}  // namespace Glimmer
