package com.vantrel.android.sdk.gxe.effect;

import java.util.Arrays;

/**
 * Parameters of a linear gradient fill of the glyphs.
 *
 * <pre>{@code
 * text.addLinearGradient(new LinearGradient().angle(90)
 *         .stop(0xFF0000, 1f, 0f)
 *         .stop(0x0000FF, 1f, 1f));
 * }</pre>
 *
 * <p>Stops are given in order of position; each has its own colour (alpha byte ignored), opacity (0..1)
 * and position (0..1, taken to two decimals). The angle is taken in whole degrees modulo 360, the scale
 * within 0..2.
 */
public final class LinearGradient {
    private float angle = 90f;
    private float scale = 1f;
    private float opacity = 1f;
    private int[] colors = new int[0];
    private float[] opacities = new float[0];
    private float[] positions = new float[0];

    /** Direction of the gradient, in degrees. */
    public LinearGradient angle(float degrees) {
        this.angle = degrees;
        return this;
    }

    /** Length of the gradient relative to the text's box, 0..2. */
    public LinearGradient scale(float scale) {
        this.scale = scale;
        return this;
    }

    /** Opacity of the whole fill, 0 (invisible) to 1. */
    public LinearGradient opacity(float opacity) {
        this.opacity = opacity;
        return this;
    }

    /** Appends a stop: colour as 0xRRGGBB, its opacity, its position along the gradient (0..1). */
    public LinearGradient stop(int rgb, float opacity, float position) {
        int n = colors.length;
        colors = Arrays.copyOf(colors, n + 1);
        opacities = Arrays.copyOf(opacities, n + 1);
        positions = Arrays.copyOf(positions, n + 1);
        colors[n] = rgb;
        opacities[n] = opacity;
        positions[n] = position;
        return this;
    }

    public float getAngle() {
        return angle;
    }

    public float getScale() {
        return scale;
    }

    public float getOpacity() {
        return opacity;
    }

    /** Colours of the stops (a copy). */
    public int[] getColors() {
        return colors.clone();
    }

    /** Opacities of the stops (a copy). */
    public float[] getOpacities() {
        return opacities.clone();
    }

    /** Positions of the stops (a copy). */
    public float[] getPositions() {
        return positions.clone();
    }
}
