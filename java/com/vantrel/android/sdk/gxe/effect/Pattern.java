package com.vantrel.android.sdk.gxe.effect;

/**
 * Parameters of a pattern fill: the glyphs filled with a tile repeated across the text's box.
 *
 * <pre>{@code
 * int[] argb = new int[tile.getWidth() * tile.getHeight()];
 * tile.getPixels(argb, 0, tile.getWidth(), 0, 0, tile.getWidth(), tile.getHeight());
 * text.addPattern(new Pattern().tile(argb, tile.getWidth(), tile.getHeight()).scale(2));
 * }</pre>
 *
 * <p>The tile is 0xAARRGGBB pixels with straight alpha, row by row, as a bitmap hands them out; the scale
 * magnifies it, within 0..10 (below 0.1 nothing is drawn); opacity within 0..1.
 */
public final class Pattern {
    private int[] pixels;
    private int width;
    private int height;
    private float scale = 1f;
    private float opacity = 1f;

    /**
     * The tile: {@code width} x {@code height} pixels from the start of {@code argb} (copied).
     *
     * @throws NullPointerException when {@code argb} is null
     * @throws IllegalArgumentException when a side is not positive or {@code argb} holds too few pixels
     */
    public Pattern tile(int[] argb, int width, int height) {
        if (argb == null) {
            throw new NullPointerException("argb");
        }
        if (width <= 0 || height <= 0 || (long) width * height > argb.length) {
            throw new IllegalArgumentException("a tile of " + width + " x " + height + " from " + argb.length
                    + " pixels");
        }
        this.pixels = java.util.Arrays.copyOf(argb, width * height);
        this.width = width;
        this.height = height;
        return this;
    }

    /** Magnification of the tile, 0..10. */
    public Pattern scale(float scale) {
        this.scale = scale;
        return this;
    }

    /** Opacity, 0 (invisible) to 1. */
    public Pattern opacity(float opacity) {
        this.opacity = opacity;
        return this;
    }

    /** The tile's pixels (a copy), or null before {@link #tile(int[], int, int)}. */
    public int[] getPixels() {
        return pixels == null ? null : pixels.clone();
    }

    /** Width of the tile in pixels; 0 before a tile is given. */
    public int getWidth() {
        return width;
    }

    /** Height of the tile in pixels; 0 before a tile is given. */
    public int getHeight() {
        return height;
    }

    public float getScale() {
        return scale;
    }

    public float getOpacity() {
        return opacity;
    }
}
