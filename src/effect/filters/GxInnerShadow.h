#pragma once
// The inner shadow layer: darkens the inside of the glyphs along the edges
// on the light's side, as if the text were cut into the surface. See
// GxInnerShadow.cpp.

#include <cstdint>

#include "effect/GxECoreBase.h"
#include "effect/GxProperty.h"

namespace Glimmer {

class GxInnerShadow : public GxECoreBase {
public:
    GxInnerShadow();
    ~GxInnerShadow() override;

    void setProperty(GxProperty* p) override;
    GxProperty* getProperty() override;
    // 0: an inner shadow never draws outside the text rectangle.
    int32_t getOffset() override;
    void doPostProcessing(GxECore::ParamPostProcessing* p) override;

    // Weights w[0..radius] (centre 100) and their total; the +0.5 of the
    // rounding is added in single precision.
    static void computeGaussianWeights(int* weights, int* sum, int radius);

private:
    GxInnerShadowProperty* property = nullptr;
};

}  // namespace Glimmer
