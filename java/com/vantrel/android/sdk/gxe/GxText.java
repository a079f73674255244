package com.vantrel.android.sdk.gxe;

import android.content.res.AssetManager;
import android.graphics.Paint;
import android.text.Layout;
import android.widget.TextView;
import com.vantrel.android.sdk.gxe.effect.Bevel;
import com.vantrel.android.sdk.gxe.effect.Emboss;
import com.vantrel.android.sdk.gxe.effect.Glow;
import com.vantrel.android.sdk.gxe.effect.LinearGradient;
import com.vantrel.android.sdk.gxe.effect.Pattern;
import com.vantrel.android.sdk.gxe.effect.RadialGradient;
import com.vantrel.android.sdk.gxe.effect.Relief;
import com.vantrel.android.sdk.gxe.effect.Shadow;
import com.vantrel.android.sdk.gxe.effect.Stroke;
import com.vantrel.android.sdk.gxe.util.GxError;
import com.vantrel.android.sdk.gxe.util.NativeLibrary;
import java.util.ArrayList;
import java.util.Collections;
import java.util.Comparator;
import java.util.LinkedHashMap;
import java.util.List;
import java.util.Map;
import java.util.function.IntSupplier;

/**
 * A piece of text drawn with effects (strokes, shadows, glows, gradient and pattern fills, bevel, emboss) by
 * the native library.
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
 * <p><b>Layer style.</b> By default effects stack as layer styles do, whatever the order they were added
 * in; bottom to top:
 * <ol>
 *   <li>outer shadow, outer glow, stroke outside or centred on the edges (the outline, under the fill);
 *   <li>the text's fill, then pattern, radial gradient, linear gradient, inner glow, inner shadow, stroke
 *       inside the edges;
 *   <li>bevel, emboss.
 * </ol>
 * Effects inside the glyphs (inner shadow and glow, inside stroke, inner bevel and the fills) never paint
 * outside them, and {@link #setFillOpacity(float)} fades only the fill: at 0 a stroked or glowing text keeps
 * its outline and glow around empty letters. The alpha of the view's text colour fades the whole picture.
 * {@link #setExactMode(boolean)} switches to the engine's exact behaviour instead: layers stack by the
 * order of adding and by the engine's own rules, inner effects may paint the whole box, and the fill
 * opacity only changes how layers are merged.
 *
 * <p>A text has at most one effect of each kind (one stroke, whatever its position): adding a kind again
 * replaces it. Effect ids are the library's numbers for the layers; in layer style they are renumbered when
 * an effect has to go below others.
 *
 * <p>The native state lives until {@link #close()}; a text that becomes unreachable without being closed is
 * released later on a background thread. Methods are synchronized: one object may be shared between
 * threads, and different objects render in parallel. Methods of a closed object throw
 * {@link IllegalStateException}; a null effect throws {@link NullPointerException}. Calls that fail return
 * {@code false}, {@code -1} or {@code null}; {@link GxError#getLastReason()} and
 * {@link GxError#getLastError()} then tell why.
 */
public class GxText implements AutoCloseable {
    /**
     * Handle of the native object; negative until the first native call makes one. Read and written by
     * the library only.
     */
    private int mHandle = -1;

    // Effect kinds as the library numbers them.
    private static final int OUTER_SHADOW = 1;
    private static final int INNER_SHADOW = 2;
    private static final int OUTER_GLOW = 3;
    private static final int INNER_GLOW = 4;
    private static final int BEVEL = 5;
    private static final int EMBOSS = 6;
    private static final int LINEAR_GRADIENT = 7;
    private static final int RADIAL_GRADIENT = 8;
    private static final int STROKE = 10;
    private static final int PATTERN = 11;

    /**
     * Where each effect goes in layer style, bottom first. The stack draws the layer added last on top, so
     * the effects are added in this order; the text's fill is always placed under the inside group.
     */
    private static final int OUTER_SHADOW_LEVEL = 0;
    private static final int OUTER_GLOW_LEVEL = 1;
    private static final int OUTLINE_LEVEL = 2;
    private static final int PATTERN_LEVEL = 3;
    private static final int RADIAL_GRADIENT_LEVEL = 4;
    private static final int LINEAR_GRADIENT_LEVEL = 5;
    private static final int INNER_GLOW_LEVEL = 6;
    private static final int INNER_SHADOW_LEVEL = 7;
    private static final int INSIDE_STROKE_LEVEL = 8;
    private static final int BEVEL_LEVEL = 9;
    private static final int EMBOSS_LEVEL = 10;

    /** An effect as added: its level in layer style and the native call that adds it (again). */
    private static final class Effect {
        final int level;
        final IntSupplier add;

        Effect(int level, IntSupplier add) {
            this.level = level;
            this.add = add;
        }
    }

    /** Releases a native text whose Java object went away unclosed. Reaches no GxText but a stand-in. */
    private static final class Release implements Runnable {
        volatile int handle = -1;

        @Override
        public void run() {
            int h = handle;
            if (h >= 0) {
                new GxText(h).GxText_finalize();
            }
        }
    }

    private boolean closed; // guarded by this, as is everything below
    private boolean prepared; // the native text exists and knows the mode
    private boolean exact;
    private float fillOpacity = 1f;
    /** By kind, in the order first added: a kind added again keeps its place, as in the native stack. */
    private final Map<Integer, Effect> effects = new LinkedHashMap<>();
    private final Release release;
    private final NativeReleaser.Registration registration;

    /** A text without native state yet: the first call makes it. Loads the library when needed. */
    public GxText() {
        NativeLibrary.load();
        release = new Release();
        registration = NativeReleaser.register(this, release);
    }

    /** A stand-in through which the release native reaches the native text of a handle. */
    private GxText(int handle) {
        mHandle = handle;
        release = null;
        registration = null;
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
        prepare();
        return GxText_SetPaint(paint);
    }

    /** Size, padding, gravity, maximum lines, text colour and typeface style of the view. */
    public synchronized boolean setView(TextView view) {
        prepare();
        return GxText_SetView(view);
    }

    /**
     * Shows at most {@code lines} lines of the layout (when 1 or more), in place of the view's maximum
     * lines. Call before {@link #setLayout(Layout)}.
     */
    public synchronized boolean setLineLimit(int lines) {
        prepare();
        return GxText_SetLine(lines);
    }

    /**
     * The text and its lines as the layout placed them, the view's gravity applied, and the background
     * colour of its last {@code BackgroundColorSpan}. Call after {@link #setView(TextView)}; with neither a
     * line limit nor the view's maximum lines set, no line is shown.
     */
    public synchronized boolean setLayout(Layout layout) {
        prepare();
        return GxText_SetLayout(layout);
    }

    /**
     * The font file at {@code path}, or a font made known under that name by the font manager. A file is
     * read once per process: one that could not be used is not tried again.
     *
     * @return false when the file is missing, cannot be read or is no font ({@link GxError#getLastReason()}
     *     says which)
     */
    public synchronized boolean setFont(String path) {
        prepare();
        return GxText_SetFont(path);
    }

    /** The font in {@code data}, known under {@code name} from now on. The bytes are copied. */
    public synchronized boolean setFont(String name, byte[] data) {
        prepare();
        return GxText_SetFont2(name, data);
    }

    /** The font asset {@code name} of the application, unless a font of that name is known already. */
    public synchronized boolean setFont(AssetManager assets, String name) {
        prepare();
        return GxText_SetFont3(assets, name);
    }

    /**
     * Adds a blurred copy of the glyphs behind the text.
     *
     * @return the effect's id, or -1
     */
    public synchronized int addOuterShadow(Shadow shadow) {
        final float angle = shadow.getAngle();
        final float distance = shadow.getDistance();
        final float size = shadow.getSize();
        final int color = shadow.getColor();
        final float opacity = shadow.getOpacity();
        return add(OUTER_SHADOW, OUTER_SHADOW_LEVEL,
                () -> GxText_AddOuterShadowTextEffect(angle, distance, size, color, opacity));
    }

    /** Adds a shadow inside the glyphs, as if they were cut out. @return the effect's id, or -1 */
    public synchronized int addInnerShadow(Shadow shadow) {
        final float angle = shadow.getAngle();
        final float distance = shadow.getDistance();
        final float size = shadow.getSize();
        final int color = shadow.getColor();
        final float opacity = shadow.getOpacity();
        return add(INNER_SHADOW, INNER_SHADOW_LEVEL,
                () -> GxText_AddInnerShadowTextEffect(angle, distance, size, color, opacity));
    }

    /** Adds a glow around the text. @return the effect's id, or -1 */
    public synchronized int addOuterGlow(Glow glow) {
        final float size = glow.getSize();
        final int color = glow.getColor();
        final float opacity = glow.getOpacity();
        if (!glow.hasStops()) {
            return add(OUTER_GLOW, OUTER_GLOW_LEVEL, () -> GxText_AddOuterGlowTextEffect(size, color, opacity));
        }
        final int[] colors = glow.getColors();
        final float[] opacities = faded(glow.getOpacities(), opacity);
        final float[] positions = glow.getPositions();
        return add(OUTER_GLOW, OUTER_GLOW_LEVEL,
                () -> GxText_AddOuterGlowGradientTextEffect(size, color, opacity, colors, opacities, positions));
    }

    /** Adds light along the inside of the glyph edges. @return the effect's id, or -1 */
    public synchronized int addInnerGlow(Glow glow) {
        final float size = glow.getSize();
        final int color = glow.getColor();
        final float opacity = glow.getOpacity();
        final boolean ramp = glow.hasStops();
        final int[] colors = ramp ? glow.getColors() : null;
        final float[] opacities = ramp ? faded(glow.getOpacities(), opacity) : null;
        final float[] positions = ramp ? glow.getPositions() : null;
        return add(INNER_GLOW, INNER_GLOW_LEVEL,
                () -> GxText_AddInnerGlowTextEffect(size, color, opacity, colors, opacities, positions));
    }

    /**
     * Adds an outline: outside or centred on the glyph edges it goes under the fill, inside them above it.
     *
     * @return the effect's id, or -1
     */
    public synchronized int addStroke(Stroke stroke) {
        final float size = stroke.getSize();
        final int color = stroke.getColor();
        final float opacity = stroke.getOpacity();
        final int position = stroke.getPosition().value();
        int level = stroke.getPosition() == Stroke.Position.INSIDE ? INSIDE_STROKE_LEVEL : OUTLINE_LEVEL;
        return add(STROKE, level, () -> GxText_AddStrokeTextEffect(size, color, opacity, 0, position));
    }

    /** Fills the glyphs with a linear gradient. @return the effect's id, or -1 */
    public synchronized int addLinearGradient(LinearGradient gradient) {
        final float angle = gradient.getAngle();
        final float scale = gradient.getScale();
        final float opacity = gradient.getOpacity();
        final int[] colors = gradient.getColors();
        final float[] opacities = faded(gradient.getOpacities(), opacity);
        final float[] positions = gradient.getPositions();
        return add(LINEAR_GRADIENT, LINEAR_GRADIENT_LEVEL,
                () -> GxText_AddLinearGradientTextEffect(angle, scale, colors, opacities, positions, opacity));
    }

    /** Fills the glyphs with a radial gradient. @return the effect's id, or -1 */
    public synchronized int addRadialGradient(RadialGradient gradient) {
        final float scale = gradient.getScale();
        final float opacity = gradient.getOpacity();
        final int[] colors = gradient.getColors();
        final float[] opacities = faded(gradient.getOpacities(), opacity);
        final float[] positions = gradient.getPositions();
        return add(RADIAL_GRADIENT, RADIAL_GRADIENT_LEVEL,
                () -> GxText_AddRadialGradientTextEffect(scale, colors, opacities, positions, opacity));
    }

    /**
     * Fills the glyphs with a repeated tile.
     *
     * @return the effect's id, or -1
     * @throws IllegalArgumentException when the pattern has no tile
     */
    public synchronized int addPattern(Pattern pattern) {
        final int[] pixels = pattern.getPixels();
        if (pixels == null) {
            throw new IllegalArgumentException("a pattern without a tile");
        }
        final int width = pattern.getWidth();
        final int height = pattern.getHeight();
        final float scale = pattern.getScale();
        final float opacity = pattern.getOpacity();
        return add(PATTERN, PATTERN_LEVEL,
                () -> GxText_AddPatternTextEffect(pixels, width, height, scale, opacity));
    }

    /** Makes the glyphs look raised. @return the effect's id, or -1 */
    public synchronized int addBevel(Bevel bevel) {
        final ReliefArguments r = new ReliefArguments(bevel);
        return add(BEVEL, BEVEL_LEVEL, () -> GxText_AddBevelTextEffect(r.style, r.depth, r.size, r.direction,
                r.technique, r.soften, r.opacity, r.angle, r.altitude, r.highlight, r.highlightOpacity, r.shadow,
                r.shadowOpacity));
    }

    /** Makes the glyphs look pressed up out of the surface. @return the effect's id, or -1 */
    public synchronized int addEmboss(Emboss emboss) {
        final ReliefArguments r = new ReliefArguments(emboss);
        return add(EMBOSS, EMBOSS_LEVEL, () -> GxText_AddEmbossTextEffect(r.style, r.depth, r.size, r.direction,
                r.technique, r.soften, r.opacity, r.angle, r.altitude, r.highlight, r.highlightOpacity, r.shadow,
                r.shadowOpacity));
    }

    /** Removes every effect; ids start again from 0. The mode and the fill opacity stay. */
    public synchronized void clearEffects() {
        prepare();
        effects.clear();
        GxText_ClearAllTextEffect();
    }

    /**
     * Opacity of the text's fill, 0..1 (1 by default). In layer style it fades the fill alone: the effects
     * keep theirs, and at 0 only the effects are drawn. In exact mode it is the engine's text opacity, which
     * below 1 merges the layers through a work image without fading the fill.
     *
     * @return false when the library refused it
     */
    public synchronized boolean setFillOpacity(float opacity) {
        prepare();
        boolean set = GxText_SetTextOpacity(opacity);
        if (set) {
            fillOpacity = opacity > 1f ? 1f : opacity > 0f ? opacity : 0f;
        }
        return set;
    }

    /** The fill opacity, as clamped into 0..1. */
    public synchronized float getFillOpacity() {
        checkOpen();
        return fillOpacity;
    }

    /**
     * Layer style (false, the default) or the engine's exact behaviour (true): effects stacked in the order
     * they were added, and drawn by the engine's literal rules. The effects added so far are kept and
     * stacked anew.
     *
     * @return false when the library refused it
     */
    public synchronized boolean setExactMode(boolean exact) {
        checkOpen();
        boolean changed = this.exact != exact;
        this.exact = exact;
        if (!prepared) {
            return prepare();
        }
        if (!changed) {
            return true;
        }
        boolean set = GxText_SetLayerStyle(!exact);
        if (set && !effects.isEmpty()) {
            addAllAgain(-1);
        }
        return set;
    }

    /** Whether the engine's exact behaviour is on. */
    public synchronized boolean isExactMode() {
        checkOpen();
        return exact;
    }

    /**
     * How far the current effects reach past the text on each side, in pixels: the margins a render adds
     * around the view.
     *
     * @return {left, top, right, bottom}
     */
    public synchronized int[] getEffectMargins() {
        prepare();
        return new int[] {GxText_GetEffectLeftOffset(), GxText_GetEffectTopOffset(),
                GxText_GetEffectRightOffset(), GxText_GetEffectBottomOffset()};
    }

    /**
     * Draws the text with its effects.
     *
     * @return the picture, larger than the view by the effect margins; null when it could not be drawn
     */
    public synchronized Picture render() {
        prepare();
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
        registration.forget();
        GxText_finalize();
    }

    /** Whether {@link #close()} has run. */
    public synchronized boolean isClosed() {
        return closed;
    }

    private void checkOpen() {
        if (closed) {
            throw new IllegalStateException("GxText is closed");
        }
    }

    /**
     * Makes sure the native text exists and has this object's mode: the first call makes it (as any native
     * call would) and tells the releaser its handle.
     */
    private boolean prepare() {
        checkOpen();
        if (!prepared && GxText_SetLayerStyle(!exact)) {
            prepared = true;
            release.handle = mHandle;
        }
        return prepared;
    }

    /** Records the effect and adds it to the native stack where its mode stacks it. */
    private int add(int kind, int level, IntSupplier add) {
        prepare();
        Effect previous = effects.put(kind, new Effect(level, add));
        boolean inPlace = exact || (previous != null ? previous.level == level : isAboveAll(level));
        int id = inPlace ? add.getAsInt() : addAllAgain(kind);
        if (id < 0) {
            if (previous != null) {
                effects.put(kind, previous);
            } else {
                effects.remove(kind);
            }
            if (!inPlace) {
                addAllAgain(-1);
            }
        }
        return id;
    }

    private boolean isAboveAll(int level) {
        for (Effect e : effects.values()) {
            if (e.level > level) {
                return false;
            }
        }
        return true;
    }

    /**
     * Clears the native stack and adds every recorded effect again: in layer style from the bottom level up
     * (the stack puts the last one on top), in exact mode in the order of adding.
     *
     * @return the id the effect of {@code kind} got; -1 when it was refused, or for kind -1
     */
    private int addAllAgain(int kind) {
        GxText_ClearAllTextEffect();
        List<Map.Entry<Integer, Effect>> order = new ArrayList<>(effects.entrySet());
        if (!exact) {
            Collections.sort(order, Comparator.comparingInt(e -> e.getValue().level));
        }
        int id = -1;
        for (Map.Entry<Integer, Effect> e : order) {
            int added = e.getValue().add.getAsInt();
            if (e.getKey() == kind) {
                id = added;
            }
        }
        return id;
    }

    /**
     * Stop opacities with the layer's folded in: the gradient and glow layers draw their ramps with the
     * stops' own opacities only.
     */
    private static float[] faded(float[] opacities, float layer) {
        float f = clampUnit(layer);
        for (int i = 0; i < opacities.length; i++) {
            opacities[i] = clampUnit(opacities[i]) * f;
        }
        return opacities;
    }

    private static float clampUnit(float value) {
        return value > 1f ? 1f : value > 0f ? value : 0f;
    }

    /**
     * A relief's parameters as the natives take them. The relief layers read the alpha bytes of their two
     * colours only, so each colour carries its own opacity times the relief's.
     */
    private static final class ReliefArguments {
        final int style;
        final float depth;
        final float size;
        final int direction;
        final int technique;
        final int soften;
        final float opacity;
        final float angle;
        final float altitude;
        final int highlight;
        final float highlightOpacity;
        final int shadow;
        final float shadowOpacity;

        ReliefArguments(Relief<?> relief) {
            style = relief.styleValue();
            depth = relief.getDepth();
            size = relief.getSize();
            direction = relief.getDirection().value();
            technique = relief.getTechnique().value();
            soften = relief.getSoften();
            opacity = relief.getOpacity();
            angle = relief.getAngle();
            altitude = relief.getAltitude();
            highlightOpacity = relief.getHighlightOpacity();
            shadowOpacity = relief.getShadowOpacity();
            highlight = withAlpha(relief.getHighlightColor(), highlightOpacity * clampUnit(opacity));
            shadow = withAlpha(relief.getShadowColor(), shadowOpacity * clampUnit(opacity));
        }

        private static int withAlpha(int rgb, float opacity) {
            int alpha = (int) (255f * clampUnit(opacity) + 0.5f);
            return (rgb & 0xFFFFFF) | alpha << 24;
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

        /** Margin left of the view, in pixels. */
        public int getLeft() {
            return left;
        }

        /** Margin above the view, in pixels. */
        public int getTop() {
            return top;
        }

        /** Margin right of the view, in pixels. */
        public int getRight() {
            return right;
        }

        /** Margin below the view, in pixels. */
        public int getBottom() {
            return bottom;
        }
    }
}
