#pragma once
// The emboss layer (kind 6): the glyphs look pressed up out of the surface,
// the slope rising inside the edge and falling outside it. The algorithm is
// described at the top of GxEmboss.cpp; the pieces it shares with the bevel
// are in GxRelief.h.

#include <cstdint>

#include "effect/GxProperty.h"
#include "effect/filters/GxRelief.h"

namespace Glimmer {

// Everything an emboss derives from its property before touching a pixel.
struct GxEmbossGeometry {
    bool drawable = false;  // false for sizes past the radius limit, or whose frame
                            // or smoothing radius would come out negative
    int size = 0;           // r = int(size), truncated toward zero
    bool smooth = false;    // the smooth technique (0): the planes are blurred with Rs
    int outRange = 0;       // Ro
    int inRange = 0;        // Ri
    int smoothRadius = 0;   // Rs (0 for the hard technique)
    int soften = 0;
    int margin = 0;         // Ro + max(2 Rs, 2 soften)
    bool exact = false;     // exact transform and soft lighting (smooth, r >= 26)
    float gain = 1.0f;      // colouring gain: 2.03 smooth, 1.0 hard
};

class GxEmboss : public GxReliefLayer<GxEmbossProperty> {
public:
    // The two local passes over rows [y0, y1) of a width x height signed field.
    struct DistanceJob {
        float* field;
        int height;
        int width;
        int outRadius;
        int inRadius;
        int y0, y1;
        GxScratch* scratch = nullptr;  // planes and tables from its kPlaneC and kRows slots
    };

    // Lighting of the region [x0, x1) x [y0, y1) (one pixel inside the frame).
    // `field` is the signed field (hard) or the outward distance (soft);
    // `innerField` the inward distance (soft only, else null).
    struct LightJob {
        unsigned char* secondPlane;
        unsigned char* firstPlane;
        const float* field;
        const float* innerField;
        int stride;
        int outRange;
        int inRange;
        float normalZ;
        float lightX, lightY, lightZ;
        int secondAlpha;
        int firstAlpha;
        int x0, x1;
        int y0, y1;
    };

    GxEmboss();

    void doPostProcessing(GxECore::ParamPostProcessing* pp) override;
    // int(ceil(size * 0.5 + 1)) + soften, from the untruncated size; 0 without
    // a property or past the radius limit.
    int32_t getOffset() override;

    static GxEmbossGeometry geometry(const GxEmbossProperty& property);

    // Work functions: one job record each, return 0.
    static int partialOutDT(void* job);
    static int partialInDT(void* job);
    static int partialLightSoftProcess(void* job);
    static int partialLightHardProcess(void* job);
};

}  // namespace Glimmer
