package com.vantrel.android.sdk.gxe.effect;

import java.util.Arrays;

/** The colour stops of a ramp as three parallel arrays, grown one stop at a time. */
final class Stops {
    private int[] colors = new int[0];
    private float[] opacities = new float[0];
    private float[] positions = new float[0];

    void add(int rgb, float opacity, float position) {
        int n = colors.length;
        colors = Arrays.copyOf(colors, n + 1);
        opacities = Arrays.copyOf(opacities, n + 1);
        positions = Arrays.copyOf(positions, n + 1);
        colors[n] = rgb;
        opacities[n] = opacity;
        positions[n] = position;
    }

    int count() {
        return colors.length;
    }

    int[] colors() {
        return colors.clone();
    }

    float[] opacities() {
        return opacities.clone();
    }

    float[] positions() {
        return positions.clone();
    }
}
