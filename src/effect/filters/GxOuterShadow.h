#pragma once
// The outer shadow layer: a blurred copy of the text mask, moved away from the
// light and drawn behind the text. See GxOuterShadow.cpp.

#include <cstdint>

#include "effect/GxECoreBase.h"
#include "effect/GxProperty.h"

namespace Glimmer {

class GxOuterShadow : public GxECoreBase {
public:
    GxOuterShadow();
    ~GxOuterShadow() override;

    // Copies the record and recomputes the displacement from its angle and
    // distance.
    void setProperty(GxProperty* p) override;
    GxProperty* getProperty() override;

    // The blur radius plus the displacement toward that side, or the radius
    // less the displacement away from it (never below 0).
    int32_t getLeftOffset() override;
    int32_t getRightOffset() override;
    int32_t getTopOffset() override;
    int32_t getBottomOffset() override;

    void doPostProcessing(GxECore::ParamPostProcessing* p) override;

    // Weights w[0..radius] (centre 100) and their total; the +0.5 of the
    // rounding is added in double precision.
    static void computeGaussianWeights(int* weights, int* sum, int radius);

    int32_t getOffsetX() const { return offsetX; }
    int32_t getOffsetY() const { return offsetY; }

private:
    // Blur radius for the margins (single-precision rounding), clamped to 0;
    // -1 when the filter refuses the size.
    int32_t marginRadius() const;

    GxOuterShadowProperty* property = nullptr;
    int32_t offsetX = 0;
    int32_t offsetY = 0;
};

}  // namespace Glimmer
