package com.vantrel.android.sdk.gxe.effect;

/**
 * Parameters of a radial gradient fill of the glyphs: rings of colour around the centre of the text's box.
 *
 * <pre>{@code
 * text.addRadialGradient(new RadialGradient().scale(1.2f)
 *         .stop(0xFFFFFF, 1f, 0f)
 *         .stop(0x3060C0, 1f, 1f));
 * }</pre>
 *
 * <p>Stops run from the centre (position 0) outward (position 1); each has its own colour (alpha byte
 * ignored), opacity (0..1) and position (taken to two decimals). The scale, within 0..2, is the radius of
 * the last stop against half the box's width (below 0.1 nothing is drawn). The opacity of the whole fill
 * scales every stop's own.
 */
public final class RadialGradient {
    private float scale = 1f;
    private float opacity = 1f;
    private final Stops stops = new Stops();

    /** Radius of the gradient against half the width of the text's box, 0..2. */
    public RadialGradient scale(float scale) {
        this.scale = scale;
        return this;
    }

    /** Opacity of the whole fill, 0 (invisible) to 1. */
    public RadialGradient opacity(float opacity) {
        this.opacity = opacity;
        return this;
    }

    /** Appends a stop: colour as 0xRRGGBB, its opacity, its distance from the centre (0..1). */
    public RadialGradient stop(int rgb, float opacity, float position) {
        stops.add(rgb, opacity, position);
        return this;
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
