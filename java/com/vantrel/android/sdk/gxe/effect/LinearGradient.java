package com.vantrel.android.sdk.gxe.effect;

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
 * within 0..2 (below 0.1 nothing is drawn). The opacity of the whole fill scales every stop's own.
 */
public final class LinearGradient {
    private float angle = 90f;
    private float scale = 1f;
    private float opacity = 1f;
    private final Stops stops = new Stops();

    /**
     * Direction of the gradient, in degrees: 0 runs from the first stop on the left to the last on the
     * right, 90 from the bottom up.
     */
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
        stops.add(rgb, opacity, position);
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
        return stops.colors();
    }

    /** Opacities of the stops (a copy). */
    public float[] getOpacities() {
        return stops.opacities();
    }

    /** Positions of the stops (a copy). */
    public float[] getPositions() {
        return stops.positions();
    }
}
