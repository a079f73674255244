package com.vantrel.android.sdk.gxe.effect;

/**
 * Parameters of an outer glow: a soft halo of one colour around the text.
 *
 * <pre>{@code
 * text.addOuterGlow(new Glow().size(8).color(0xFFE080).opacity(0.9f));
 * }</pre>
 *
 * <p>The size is taken in whole pixels within 0..100 and opacity within 0..1; the colour's alpha byte is
 * ignored.
 */
public final class Glow {
    private float size = 5f;
    private int color = 0xFFFFFFBE;
    private float opacity = 0.75f;

    /** How far the glow reaches past the text, in pixels. */
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

    public float getSize() {
        return size;
    }

    public int getColor() {
        return color;
    }

    public float getOpacity() {
        return opacity;
    }
}
