package com.vantrel.android.sdk.gxe.effect;

/**
 * What bevels and embosses share: a height field grown from the glyph edges and lit by one light, its lit
 * slopes washed with a highlight colour and the others with a shadow colour.
 *
 * <p>The size (pixels, from 0) is how far the slopes reach from the edges; the depth, 0..10, how steep
 * they look. The smooth technique rounds the slopes, the hard one keeps them crisp; soften (whole pixels,
 * 0..16) blurs the result. The light comes from {@code angle} degrees (as for shadows: 0 from the right,
 * 90 from above; folded modulo 360) at {@code altitude} degrees above the surface (folded modulo 90).
 * Colours are 0xRRGGBB (an alpha byte is ignored); each has its own opacity, and the relief's opacity
 * scales both.
 *
 * @param <T> the relief kind, so that the setters chain
 */
public abstract class Relief<T extends Relief<T>> {
    /** Which way the relief rises. */
    public enum Direction {
        /** Raised: the slopes facing the light are lit. */
        UP(1),
        /** Sunk: lit and shaded slopes swap. */
        DOWN(0);

        private final int value;

        Direction(int value) {
            this.value = value;
        }

        /** The number the library knows the direction by. */
        public int value() {
            return value;
        }
    }

    /** How the slopes are shaped. */
    public enum Technique {
        /** Blurred, rounded slopes. */
        SMOOTH(0),
        /** Crisp slopes straight from the distance to the edge. */
        HARD(1);

        private final int value;

        Technique(int value) {
            this.value = value;
        }

        /** The number the library knows the technique by. */
        public int value() {
            return value;
        }
    }

    private float size = 5f;
    private float depth = 3f;
    private Direction direction = Direction.UP;
    private Technique technique = Technique.SMOOTH;
    private int soften;
    private float angle = 120f;
    private float altitude = 30f;
    private int highlight = 0xFFFFFF;
    private float highlightOpacity = 0.75f;
    private int shadow = 0x000000;
    private float shadowOpacity = 0.75f;
    private float opacity = 1f;

    Relief() {}

    /** This object, typed as its kind. */
    abstract T self();

    /** How far the slopes reach from the glyph edges, in pixels. */
    public T size(float pixels) {
        this.size = pixels;
        return self();
    }

    /** How steep the slopes look, 0..10. */
    public T depth(float depth) {
        this.depth = depth;
        return self();
    }

    public T direction(Direction direction) {
        if (direction == null) {
            throw new NullPointerException("direction");
        }
        this.direction = direction;
        return self();
    }

    public T technique(Technique technique) {
        if (technique == null) {
            throw new NullPointerException("technique");
        }
        this.technique = technique;
        return self();
    }

    /** Blur radius of the result, in whole pixels, 0..16. */
    public T soften(int pixels) {
        this.soften = pixels;
        return self();
    }

    /** Direction the light comes from, in degrees. */
    public T angle(float degrees) {
        this.angle = degrees;
        return self();
    }

    /** Height of the light above the surface, in degrees. */
    public T altitude(float degrees) {
        this.altitude = degrees;
        return self();
    }

    /** Colour (0xRRGGBB) and opacity of the slopes facing the light. */
    public T highlight(int rgb, float opacity) {
        this.highlight = rgb;
        this.highlightOpacity = opacity;
        return self();
    }

    /** Colour (0xRRGGBB) and opacity of the slopes facing away from the light. */
    public T shadow(int rgb, float opacity) {
        this.shadow = rgb;
        this.shadowOpacity = opacity;
        return self();
    }

    /** Opacity of the whole relief, 0 (invisible) to 1. */
    public T opacity(float opacity) {
        this.opacity = opacity;
        return self();
    }

    public float getSize() {
        return size;
    }

    public float getDepth() {
        return depth;
    }

    public Direction getDirection() {
        return direction;
    }

    public Technique getTechnique() {
        return technique;
    }

    public int getSoften() {
        return soften;
    }

    public float getAngle() {
        return angle;
    }

    public float getAltitude() {
        return altitude;
    }

    public int getHighlightColor() {
        return highlight;
    }

    public float getHighlightOpacity() {
        return highlightOpacity;
    }

    public int getShadowColor() {
        return shadow;
    }

    public float getShadowOpacity() {
        return shadowOpacity;
    }

    public float getOpacity() {
        return opacity;
    }

    /** The number the library knows the relief's style by. */
    public abstract int styleValue();
}
