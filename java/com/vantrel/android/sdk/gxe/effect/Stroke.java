package com.vantrel.android.sdk.gxe.effect;

/**
 * Parameters of a stroke: an outline of the glyphs, drawn outside, inside or centred on their edges.
 *
 * <pre>{@code
 * text.addStroke(new Stroke().size(3).color(0x202020).position(Stroke.Position.OUTSIDE));
 * }</pre>
 *
 * <p>The width is taken in whole pixels within 0..100 and opacity within 0..1; the colour's alpha byte is
 * ignored.
 */
public final class Stroke {
    /** Where the band lies relative to the glyph edges. */
    public enum Position {
        CENTER(0),
        OUTSIDE(1),
        INSIDE(2);

        private final int value;

        Position(int value) {
            this.value = value;
        }

        /** The number the library knows the position by. */
        public int value() {
            return value;
        }
    }

    private float size = 3f;
    private int color = 0xFF000000;
    private float opacity = 1f;
    private Position position = Position.OUTSIDE;

    /** Width of the band, in pixels. */
    public Stroke size(float pixels) {
        this.size = pixels;
        return this;
    }

    /** Colour as 0xRRGGBB (an alpha byte is ignored). */
    public Stroke color(int rgb) {
        this.color = rgb;
        return this;
    }

    /** Opacity, 0 (invisible) to 1. */
    public Stroke opacity(float opacity) {
        this.opacity = opacity;
        return this;
    }

    public Stroke position(Position position) {
        if (position == null) {
            throw new NullPointerException("position");
        }
        this.position = position;
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

    public Position getPosition() {
        return position;
    }
}
