package com.vantrel.android.sdk.gxe.effect;

/**
 * Parameters of a glow: a soft halo around the text (outer glow), or light along the inside of the glyph
 * edges (inner glow).
 *
 * <pre>{@code
 * text.addOuterGlow(new Glow().size(8).color(0xFFE080).opacity(0.9f));
 * text.addInnerGlow(new Glow().size(4).stop(0xFFFFFF, 1f, 0f).stop(0xFF8000, 1f, 1f));
 * }</pre>
 *
 * <p>The size is taken in whole pixels within 0..100 and opacity within 0..1; the colour's alpha byte is
 * ignored. Stops, when given, make a colour ramp that replaces the colour: position 0 at the glyph edge, 1
 * farthest from it; the glow's opacity then scales every stop's own.
 */
public final class Glow {
    private float size = 5f;
    private int color = 0xFFFFFFBE;
    private float opacity = 0.75f;
    private final Stops stops = new Stops();

    /** How far the glow reaches from the glyph edges, in pixels. */
    public Glow size(float pixels) {
        this.size = pixels;
        return this;
    }

    /** Colour as 0xRRGGBB (an alpha byte is ignored). */
    public Glow color(int rgb) {
        this.color = rgb;
        return this;
    }

    /** Opacity, 0 (invisible) to 1. */
    public Glow opacity(float opacity) {
        this.opacity = opacity;
        return this;
    }

    /** Appends a stop of the colour ramp: colour as 0xRRGGBB, its opacity, its distance from the edge (0..1). */
    public Glow stop(int rgb, float opacity, float position) {
        stops.add(rgb, opacity, position);
        return this;
    }

    public float getSize() {
        return size;
    }

    public int getColor() {
        return color;
    }

    public float getOpacity() {
        return opacity;
    }

    /** Whether stops were given. */
    public boolean hasStops() {
        return stops.count() > 0;
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
