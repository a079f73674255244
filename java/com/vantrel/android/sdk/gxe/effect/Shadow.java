package com.vantrel.android.sdk.gxe.effect;

/**
 * Parameters of an outer or inner shadow: a blurred copy of the text's shape, offset in a direction.
 *
 * <pre>{@code
 * text.addOuterShadow(new Shadow().angle(135).distance(4).size(6).color(0x000000).opacity(0.6f));
 * }</pre>
 *
 * <p>The library clamps: the angle is taken in whole degrees modulo 360, distance and size in whole pixels
 * within 0..100, opacity within 0..1. The colour's alpha byte is ignored; opacity sets it.
 */
public final class Shadow {
    private float angle = 120f;
    private float distance = 5f;
    private float size = 5f;
    private int color = 0xFF000000;
    private float opacity = 0.75f;

    /**
     * Direction the light comes from, in degrees counter-clockwise from the positive x axis: 0 casts the
     * shadow to the left, 90 downwards.
     */
    public Shadow angle(float degrees) {
        this.angle = degrees;
        return this;
    }

    /** Offset of the shadow from the text, in pixels. */
    public Shadow distance(float pixels) {
        this.distance = pixels;
        return this;
    }

    /** Blur radius, in pixels. */
    public Shadow size(float pixels) {
        this.size = pixels;
        return this;
    }

    /** Colour as 0xRRGGBB (an alpha byte is ignored). */
    public Shadow color(int rgb) {
        this.color = rgb;
        return this;
    }

    /** Opacity, 0 (invisible) to 1. */
    public Shadow opacity(float opacity) {
        this.opacity = opacity;
        return this;
    }

    public float getAngle() {
        return angle;
    }

    public float getDistance() {
        return distance;
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
