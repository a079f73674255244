package com.vantrel.android.sdk.gxe;

import android.content.res.AssetManager;
import android.graphics.Paint;
import android.text.Layout;
import android.widget.TextView;
import com.vantrel.android.sdk.gxe.effect.Glow;
import com.vantrel.android.sdk.gxe.effect.LinearGradient;
import com.vantrel.android.sdk.gxe.effect.Shadow;
import com.vantrel.android.sdk.gxe.effect.Stroke;
import com.vantrel.android.sdk.gxe.util.GxError;
import com.vantrel.android.sdk.gxe.util.NativeLibrary;

/**
 * A piece of text drawn with effects (strokes, shadows, glows, gradient fills) by the native library.
 *
 * <p>Give it the paint, view and layout of a {@link TextView}, optionally a font, add effects, and render:
 *
 * <pre>{@code
 * try (GxText text = new GxText()) {
 *     text.setPaint(view.getPaint());
 *     text.setView(view);
 *     text.setLayout(view.getLayout());
 *     text.addStroke(new Stroke().size(3).color(0x000000));
 *     text.addOuterShadow(new Shadow().angle(90).distance(4).size(4));
 *     GxText.Picture picture = text.render();
 *     Bitmap bitmap = Bitmap.createBitmap(picture.getPixels(), picture.getWidth(), picture.getHeight(),
 *             Bitmap.Config.ARGB_8888);
 *     // draw it at (viewX - picture.getLeft(), viewY - picture.getTop())
 * }
 * }</pre>
 *
 * <p>The native state lives until {@link #close()} (or, as a last resort, until the object is
 * finalised). Methods are synchronized: one object may be shared between threads, and different objects
 * render in parallel. Methods of a closed object throw {@link IllegalStateException}. Calls that fail
 * return {@code false}, {@code -1} or {@code null}; {@link GxError#getLastError()} then tells why when the
 * library recorded a reason.
 */
public class GxText implements AutoCloseable {
    /**
     * Handle of the native object; negative until the first native call makes one. Read and written by
     * the library only.
     */
    private int mHandle = -1;

    private boolean closed; // guarded by this

    public GxText() {
        NativeLibrary.load();
    }

    // The natives, registered by the library when it loads.
    native void GxText_finalize();

    native int GxText_AddInnerShadowTextEffect(float angle, float distance, float size, int color,
            float opacity);

    native int GxText_AddLinearGradientTextEffect(float angle, float scale, int[] colors, float[] opacities,
            float[] positions, float opacity);

    native int GxText_AddOuterGlowTextEffect(float size, int color, float opacity);

    native int GxText_AddOuterShadowTextEffect(float angle, float distance, float size, int color,
            float opacity);

    native int GxText_AddStrokeTextEffect(float size, int color, float opacity, int a, int position);

    native void GxText_ClearAllTextEffect();

    native int[] GxText_RenderTextEffect();

    native boolean GxText_SetFont(String fontFile);

    native boolean GxText_SetFont2(String fontName, byte[] buffer);

    native boolean GxText_SetFont3(AssetManager assetManager, String fontName);

    native boolean GxText_SetPaint(Paint paint);

    native boolean GxText_SetLayout(Layout layout);

    native boolean GxText_SetLine(int lines);

    native boolean GxText_SetView(TextView view);

    native int[] GxText_GetDrawingBitmapSize();

    native int GxText_GetEffectLeftOffset();

    native int GxText_GetEffectTopOffset();

    native int GxText_GetEffectRightOffset();

    native int GxText_GetEffectBottomOffset();

    // Natives of a later library version, each registered on its own.
    native int GxText_AddInnerGlowTextEffect(float size, int color, float opacity, int[] colors,
            float[] opacities, float[] positions);

    native int GxText_AddOuterGlowGradientTextEffect(float size, int color, float opacity, int[] colors,
            float[] opacities, float[] positions);

    native int GxText_AddRadialGradientTextEffect(float scale, int[] colors, float[] opacities,
            float[] positions, float opacity);

    native int GxText_AddPatternTextEffect(int[] pixels, int width, int height, float scale, float opacity);

    native int GxText_AddBevelTextEffect(int style, float depth, float size, int direction, int technique,
            int soften, float opacity, float angle, float altitude, int highlightColor, float highlightOpacity,
            int shadowColor, float shadowOpacity);

    native int GxText_AddEmbossTextEffect(int style, float depth, float size, int direction, int technique,
            int soften, float opacity, float angle, float altitude, int highlightColor, float highlightOpacity,
            int shadowColor, float shadowOpacity);

    native boolean GxText_SetTextOpacity(float opacity);

    native boolean GxText_SetLayerStyle(boolean on);

    /** Text size, scale, skew, letter spacing, flags, font features, locales and alignment of the paint. */
    public synchronized boolean setPaint(Paint paint) {
        checkOpen();
        return GxText_SetPaint(paint);
    }

    /** Size, padding, gravity, maximum lines, text colour and typeface style of the view. */
    public synchronized boolean setView(TextView view) {
        checkOpen();
        return GxText_SetView(view);
    }

    /**
     * Shows at most {@code lines} lines of the layout (when 1 or more), in place of the view's maximum
     * lines. Call before {@link #setLayout(Layout)}.
     */
    public synchronized boolean setLineLimit(int lines) {
        checkOpen();
        return GxText_SetLine(lines);
    }

    /**
     * The text and its lines as the layout placed them, the view's gravity applied, and the background
     * colour of its last {@code BackgroundColorSpan}. Call after {@link #setView(TextView)}; with neither a
     * line limit nor the view's maximum lines set, no line is shown.
     */
    public synchronized boolean setLayout(Layout layout) {
        checkOpen();
        return GxText_SetLayout(layout);
    }

    /** The font file at {@code path}, or a font made known under that name by the font manager. */
    public synchronized boolean setFont(String path) {
        checkOpen();
        return GxText_SetFont(path);
    }

    /** The font in {@code data}, known under {@code name} from now on. The bytes are copied. */
    public synchronized boolean setFont(String name, byte[] data) {
        checkOpen();
        return GxText_SetFont2(name, data);
    }

    /** The font asset {@code name} of the application, unless a font of that name is known already. */
    public synchronized boolean setFont(AssetManager assets, String name) {
        checkOpen();
        return GxText_SetFont3(assets, name);
    }

    /**
     * Adds a shadow behind the text. A text has at most one effect of each kind: adding one again replaces
     * its parameters and keeps its id.
     *
     * @return the effect's id, or -1
     */
    public synchronized int addOuterShadow(Shadow shadow) {
        checkOpen();
        return GxText_AddOuterShadowTextEffect(shadow.getAngle(), shadow.getDistance(), shadow.getSize(),
                shadow.getColor(), shadow.getOpacity());
    }

    /** Adds a shadow inside the glyphs, as if they were cut out. @return the effect's id, or -1 */
    public synchronized int addInnerShadow(Shadow shadow) {
        checkOpen();
        return GxText_AddInnerShadowTextEffect(shadow.getAngle(), shadow.getDistance(), shadow.getSize(),
                shadow.getColor(), shadow.getOpacity());
    }

    /** Adds a glow around the text. @return the effect's id, or -1 */
    public synchronized int addOuterGlow(Glow glow) {
        checkOpen();
        return GxText_AddOuterGlowTextEffect(glow.getSize(), glow.getColor(), glow.getOpacity());
    }

    /** Adds an outline. @return the effect's id, or -1 */
    public synchronized int addStroke(Stroke stroke) {
        checkOpen();
        return GxText_AddStrokeTextEffect(stroke.getSize(), stroke.getColor(), stroke.getOpacity(), 0,
                stroke.getPosition().value());
    }

    /** Fills the glyphs with a linear gradient. @return the effect's id, or -1 */
    public synchronized int addLinearGradient(LinearGradient gradient) {
        checkOpen();
        return GxText_AddLinearGradientTextEffect(gradient.getAngle(), gradient.getScale(),
                gradient.getColors(), gradient.getOpacities(), gradient.getPositions(), gradient.getOpacity());
    }

    /** Removes every effect; ids start again from 0. */
    public synchronized void clearEffects() {
        checkOpen();
        GxText_ClearAllTextEffect();
    }

    /**
     * How far the current effects reach past the text on each side, in pixels: the margins a render adds
     * around the view.
     *
     * @return {left, top, right, bottom}
     */
    public synchronized int[] getEffectMargins() {
        checkOpen();
        return new int[] {GxText_GetEffectLeftOffset(), GxText_GetEffectTopOffset(),
                GxText_GetEffectRightOffset(), GxText_GetEffectBottomOffset()};
    }

    /**
     * Draws the text with its effects.
     *
     * @return the picture, larger than the view by the effect margins; null when it could not be drawn
     */
    public synchronized Picture render() {
        checkOpen();
        int[] pixels = GxText_RenderTextEffect();
        if (pixels == null) {
            return null;
        }
        int[] size = GxText_GetDrawingBitmapSize();
        if (size == null || (long) size[0] * size[1] != pixels.length) {
            return null;
        }
        return new Picture(pixels, size[0], size[1], GxText_GetEffectLeftOffset(), GxText_GetEffectTopOffset(),
                GxText_GetEffectRightOffset(), GxText_GetEffectBottomOffset());
    }

    /** Releases the native text. Further calls on this object throw; closing again does nothing. */
    @Override
    public synchronized void close() {
        if (closed) {
            return;
        }
        closed = true;
        GxText_finalize();
    }

    /** Whether {@link #close()} has run. */
    public synchronized boolean isClosed() {
        return closed;
    }

    /** Releases the native text of an object nobody closed; nothing when it was closed. */
    @Override
    @SuppressWarnings("deprecation")
    protected void finalize() throws Throwable {
        try {
            close();
        } finally {
            super.finalize();
        }
    }

    private void checkOpen() {
        if (closed) {
            throw new IllegalStateException("GxText is closed");
        }
    }

    /**
     * A rendered text: 0xAARRGGBB pixels (straight alpha), row by row, and the margins by which the
     * picture reaches past the view. The view's top-left corner is at ({@link #getLeft()},
     * {@link #getTop()}).
     */
    public static final class Picture {
        private final int[] pixels;
        private final int width;
        private final int height;
        private final int left;
        private final int top;
        private final int right;
        private final int bottom;

        Picture(int[] pixels, int width, int height, int left, int top, int right, int bottom) {
            this.pixels = pixels;
            this.width = width;
            this.height = height;
            this.left = left;
            this.top = top;
            this.right = right;
            this.bottom = bottom;
        }

        /** The pixels, width × height of them; the array is the picture's own, not a copy. */
        public int[] getPixels() {
            return pixels;
        }

        public int getWidth() {
            return width;
        }

        public int getHeight() {
            return height;
        }

        /** The pixel at column x, row y. */
        public int getPixel(int x, int y) {
            if (x < 0 || y < 0 || x >= width || y >= height) {
                throw new IndexOutOfBoundsException("(" + x + ", " + y + ") outside " + width + "x" + height);
            }
            return pixels[y * width + x];
        }

        public int getLeft() {
            return left;
        }

        public int getTop() {
            return top;
        }

        public int getRight() {
            return right;
        }

        public int getBottom() {
            return bottom;
        }
    }
}
