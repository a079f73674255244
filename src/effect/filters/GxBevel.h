#pragma once
// The bevel layer (kind 5): the glyphs look raised, lit from one direction.
// The algorithm is described at the top of GxBevel.cpp; the pieces it shares
// with the emboss layer are in GxRelief.h.

#include <cstdint>

#include "effect/GxProperty.h"
#include "effect/filters/GxRelief.h"

namespace Glimmer {

// Everything a bevel derives from its property before touching a pixel.
struct GxBevelGeometry {
    bool drawable = false;  // false for sizes past the radius limit, or whose frame
                            // or smoothing radius would come out negative
    int size = 0;           // r = int(size), truncated toward zero
    bool smooth = false;    // the smooth technique (0): the planes are blurred with Rs
    int smoothRadius = 0;   // Rs: ceil(2r / 3 + 1) for the smooth technique, else 0
    int range = 0;          // Rd: Rs for the smooth technique, r + 2 for the hard one
    int soften = 0;
    int margin = 0;         // Rd + max(2 Rs, 2 soften)
    bool exact = false;     // exact distance transform (smooth and Rd >= 11), else local search
    float gain = 1.0f;      // colouring gain: 1.83 smooth, 1.0 hard
};

class GxBevel : public GxReliefLayer<GxBevelProperty> {
public:
    // The local search over rows [y0, y1) of a width x height field.
    struct DistanceJob {
        float* field;
        int height;
        int width;
        int radius;
        int y0, y1;
        GxScratch* scratch = nullptr;  // tables from its kRows and kPlaneC slots
    };

    // Lighting of the region [x0, x1) x [y0, y1) (one pixel inside the frame).
    struct LightJob {
        unsigned char* secondPlane;
        unsigned char* firstPlane;
        int stride;
        int range;
        float normalZ;
        float lightX, lightY, lightZ;
        int secondAlpha;
        int firstAlpha;
        bool inside;
        const float* field;
        int x0, x1;
        int y0, y1;
    };

    GxBevel();

    void doPostProcessing(GxECore::ParamPostProcessing* pp) override;
    // soften + int(size + 0.5); 0 without a property or past the radius limit.
    int32_t getOffset() override;

    static GxBevelGeometry geometry(const GxBevelProperty& property);

    // Work functions: one job record each, return 0.
    static int partialDT(void* job);
    static int partialLightProcess(void* job);
};

}  // namespace Glimmer
