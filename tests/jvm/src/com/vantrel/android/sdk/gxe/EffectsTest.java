package com.vantrel.android.sdk.gxe;

import com.vantrel.android.sdk.gxe.effect.Bevel;
import com.vantrel.android.sdk.gxe.effect.Emboss;
import com.vantrel.android.sdk.gxe.effect.Glow;
import com.vantrel.android.sdk.gxe.effect.LinearGradient;
import com.vantrel.android.sdk.gxe.effect.Pattern;
import com.vantrel.android.sdk.gxe.effect.RadialGradient;
import com.vantrel.android.sdk.gxe.effect.Shadow;
import com.vantrel.android.sdk.gxe.effect.Stroke;
import java.util.Arrays;
import java.util.List;
import java.util.function.BiConsumer;
import java.util.function.Consumer;
import jvmtest.Check;

/**
 * Effects through the natives (ids, margins, the picture, refusals) and through the builder API, whose
 * layer style (a fixed stacking order, a fill opacity) is the default and the engine's exact behaviour one
 * switch away.
 */
public class EffectsTest {
    private static int[] margins(GxText text) {
        return new int[] {text.GxText_GetEffectLeftOffset(), text.GxText_GetEffectTopOffset(),
            text.GxText_GetEffectRightOffset(), text.GxText_GetEffectBottomOffset()};
    }

    public void idsCountFromZeroAndBadArgumentsAreRefusedSilentlyWithAReason() {
        try (GxText t = new GxText()) {
            Check.equal(0, t.GxText_AddOuterShadowTextEffect(45f, 3f, 3f, 0, 1f), "shadow");
            Check.equal(1, t.GxText_AddStrokeTextEffect(2f, 0, 1f, 0, 1), "stroke");
            Check.equal(0, t.GxText_AddOuterShadowTextEffect(90f, 1f, 1f, 0, 1f), "shadow again");
            t.GxText_ClearAllTextEffect();
            Check.equal(new int[] {0, 0, 0, 0}, margins(t), "margins after clear");
            float[] two = {0f, 1f};
            Fixtures.refused("linear 2, 2, 1", -1, "2 colours, 2 opacities and 1 positions", null,
                    () -> t.GxText_AddLinearGradientTextEffect(0f, 1f, new int[2], two, new float[1], 1f));
            Fixtures.refused("radial null", -1, "null", null, () -> t.GxText_AddRadialGradientTextEffect(1f, null, two,
                    two, 1f));
            Fixtures.refused("glow 2, 1, 2", -1, "2 colours, 1 opacities", null,
                    () -> t.GxText_AddInnerGlowTextEffect(4f, 0, 1f, new int[2], new float[1], two));
            Fixtures.refused("no tile", -1, "no pixels", null, () -> t.GxText_AddPatternTextEffect(null, 1, 1, 1f, 1f));
            Fixtures.refused("tile 0 x 4", -1, "0 x 4", null, () -> t.GxText_AddPatternTextEffect(new int[4], 0, 4, 1f,
                    1f));
            Fixtures.refused("tile too short", -1, "5 pixels are too few", null,
                    () -> t.GxText_AddPatternTextEffect(new int[5], 2, 3, 1f, 1f));
            Fixtures.refused("tile overflowing", -1, "cannot be made", null,
                    () -> t.GxText_AddPatternTextEffect(new int[4], 0x10000, 0x10000, 1f, 1f));
            float[] none = {};
            Check.equal(0, t.GxText_AddLinearGradientTextEffect(0f, 1f, new int[0], none, none, 1f),
                    "the first id after clear and refusals, for three empty stop arrays");
            Check.raises(IllegalArgumentException.class, () -> new Pattern().tile(new int[3], 2, 2), "short tile");
            Check.raises(IllegalArgumentException.class, () -> t.addPattern(new Pattern()), "no tile");
        }
        try (GxText t = new GxText()) {
            Check.equal(0, t.render().getPixels().length, "a text with nothing set draws an empty picture");
        }
    }

    public void aShadowAtAngleZeroFallsLeftInAPictureWithItsMargins() {
        int[] glyph = Fixtures.blockInk();
        try (GxText text = Fixtures.block()) {
            Check.equal(new int[] {0, 0}, text.GxText_GetDrawingBitmapSize(), "size before a render");
            Check.equal(0, text.GxText_AddOuterShadowTextEffect(0f, 10f, 0f, 0x00FF00, 1f), "shadow");
            int[] m = margins(text);
            Check.isTrue(m[0] >= 10 && m[0] > m[2], "left margin " + m[0] + ", right " + m[2]);
            int[] pixels = text.GxText_RenderTextEffect(); // adds the text's own layer, without margins
            int w = 60 + m[0] + m[2];
            Check.equal(new int[] {w, 50 + m[1] + m[3]}, text.GxText_GetDrawingBitmapSize(), "bitmap size");
            int row = ((glyph[1] + glyph[3]) / 2 + m[1]) * w + m[0];
            Check.pixel(0xFF00FF00, pixels[row + glyph[0] - 5], "shadow");
            Check.pixel(0xFF000000, pixels[row + glyph[0] + 5], "glyph over the shadow");
            Check.pixel(0, pixels[row + glyph[2] + 2], "nothing on the right");
            GxText.Picture p = text.render();
            Check.equal(m, new int[] {p.getLeft(), p.getTop(), p.getRight(), p.getBottom()}, "picture margins");
            Check.equal(p.getPixels(), text.render().getPixels(), "a second render");
            text.clearEffects();
            Check.equal(new int[] {0, 0, 0, 0}, text.getEffectMargins(), "margins after clearing");
        }
    }

    public void everyKindDrawsAtOpacityOneAndLeavesThePlainTextAtZero() {
        List<BiConsumer<GxText, Float>> kinds = Arrays.asList((t, o) -> t.addOuterShadow(new Shadow().opacity(o)),
                (t, o) -> t.addInnerShadow(new Shadow().color(0xFF0000).opacity(o)),
                (t, o) -> t.addOuterGlow(new Glow().opacity(o)), (t, o) -> t.addInnerGlow(new Glow().opacity(o)),
                (t, o) -> t.addOuterGlow(new Glow().stop(0xFF0000, 1f, 0f).stop(0x0000FF, 1f, 1f).opacity(o)),
                (t, o) -> t.addStroke(new Stroke().opacity(o)),
                (t, o) -> t.addLinearGradient(new LinearGradient().stop(0xFF0000, 1f, 0f).opacity(o)),
                (t, o) -> t.addRadialGradient(new RadialGradient().stop(0xFF0000, 1f, 0f).opacity(o)),
                (t, o) -> t.addPattern(new Pattern().tile(new int[] {0xFFFF0000, 0xFF0000FF}, 2, 1).opacity(o)),
                (t, o) -> t.addBevel(new Bevel().opacity(o)),
                (t, o) -> t.addBevel(new Bevel().style(Bevel.Style.OUTER).opacity(o)),
                (t, o) -> t.addEmboss(new Emboss().opacity(o)));
        int[] plain = null;
        for (int i = 0; i < kinds.size(); i++) {
            try (GxText text = Fixtures.text(Fixtures.SANS, Fixtures.BLOCK, 60, 60, 40f)) {
                plain = plain != null ? plain : text.render().getPixels();
                kinds.get(i).accept(text, 1f);
                Check.isTrue(!Arrays.equals(plain, Fixtures.viewPixels(text.render())), "effect " + i + " draws nothing");
                kinds.get(i).accept(text, 0f);
                Check.equal(plain, Fixtures.viewPixels(text.render()), "effect " + i + " at opacity 0");
            }
        }
    }

    public void coloursReachTheLayers() {
        try (GxText text = Fixtures.text(Fixtures.SANS, Fixtures.BLOCK, 60, 60, 40f)) {
            int[] ink = Fixtures.inkBox(text.render());
            int y = (ink[1] + ink[3]) / 2;
            text.addLinearGradient(new LinearGradient().angle(0).stop(0xFF0000, 1f, 0f).stop(0x0000FF, 1f, 1f));
            GxText.Picture p = text.render();
            int left = p.getPixel(ink[0] + 2 + p.getLeft(), y + p.getTop());
            int right = p.getPixel(ink[2] - 3 + p.getLeft(), y + p.getTop());
            Check.isTrue((left >> 16 & 0xFF) > (left & 0xFF) && (right >> 16 & 0xFF) < (right & 0xFF),
                    String.format("gradient from red to blue: %08X on the left, %08X on the right", left, right));
            text.clearEffects();
            text.addPattern(new Pattern().tile(new int[] {0xFFFF8000}, 1, 1)); // a tile's words are 0xAARRGGBB
            p = text.render();
            int c = p.getPixel(ink[0] + 10 + p.getLeft(), y + p.getTop());
            Check.isTrue((c >>> 24) == 0xFF && (c >> 16 & 0xFF) > 0xF0 && Math.abs((c >> 8 & 0xFF) - 0x80) < 8
                    && (c & 0xFF) < 8, String.format("a one-pixel tile of FFFF8000 draws %08X", c));
            text.clearEffects();
            Check.isTrue(text.setFillOpacity(0f) && Fixtures.inkBox(text.render()) == null, "a fill of opacity 0");
        }
    }

    private static final Consumer<GxText> STROKE = t -> t.addStroke(new Stroke().size(3).color(0x2040C0));
    private static final Consumer<GxText> SHADOW =
            t -> t.addOuterShadow(new Shadow().angle(90).distance(6).size(2).color(0).opacity(1f));
    private static final Consumer<GxText> GLOW = t -> t.addInnerGlow(new Glow().size(4).color(0xFFFF00).opacity(1f));
    private static final Consumer<GxText> GRADIENT =
            t -> t.addLinearGradient(new LinearGradient().stop(0xFF0000, 1f, 0f).stop(0xFFFF00, 1f, 1f));

    /** An "H" of DejaVu Sans at 48 px in an 80 x 80 view, its baseline at 64. */
    private static GxText letterH() {
        return Fixtures.text(Fixtures.SANS, "H", 80, 80, 48f);
    }

    /** The pixels of letterH() in either mode with these effects added in order. */
    @SafeVarargs
    private static int[] letterH(boolean exact, Consumer<GxText>... effects) {
        try (GxText text = letterH()) {
            Check.isTrue(text.setExactMode(exact), "mode");
            for (Consumer<GxText> add : effects) {
                add.accept(text);
            }
            return text.render().getPixels();
        }
    }

    public void layerStyleStacksWhateverTheOrderOfAddingAndExactModeByIt() {
        int[] layered = letterH(false, STROKE, SHADOW, GLOW, GRADIENT);
        Check.equal(layered, letterH(false, GRADIENT, GLOW, SHADOW, STROKE), "layer style, another order");
        Check.equal(layered, letterH(false, SHADOW, GRADIENT, STROKE, GLOW), "layer style, a third order");
        int[] exact = letterH(true, STROKE, SHADOW, GLOW);
        Check.isTrue(!Arrays.equals(exact, letterH(true, SHADOW, STROKE, GLOW)), "exact mode: the order of adding shows");
        try (GxText text = letterH()) {
            text.GxText_AddStrokeTextEffect(3f, 0x2040C0, 1f, 0, 1);
            text.GxText_AddOuterShadowTextEffect(90f, 6f, 2f, 0, 1f);
            text.GxText_AddInnerGlowTextEffect(4f, 0xFFFF00, 1f, null, null, null);
            Check.equal(exact, text.GxText_RenderTextEffect(), "exact mode is the natives' engine as it is");
        }
        int[] ink = Fixtures.inkBox(letterH(false), 80);
        try (GxText text = letterH()) {
            Arrays.asList(STROKE, SHADOW, GLOW).forEach(add -> add.accept(text));
            int[] style = text.render().getPixels();
            Check.isTrue(text.setExactMode(true) && text.isExactMode(), "to exact");
            Check.equal(exact, text.render().getPixels(), "switched to exact after adding");
            Check.isTrue(text.setExactMode(false), "back");
            GxText.Picture p = text.render();
            Check.equal(style, p.getPixels(), "switched back");
            // The outline lies over the shadow: below the H's foot, where both reach, the stroke's colour shows.
            Check.pixel(0xFF2040C0, p.getPixel(p.getLeft() + ink[0] + 2, p.getTop() + 65), "stroke over shadow");
        }
    }

    public void addingAKindAgainReplacesItAndAnInsideStrokeMovesAboveTheFill() {
        try (GxText text = letterH()) {
            Check.equal(0, text.addOuterGlow(new Glow()), "glow");
            // The shadow goes under the glow: the stack is added again from the bottom.
            Check.equal(0, text.addOuterShadow(new Shadow()), "shadow under it");
            Check.equal(2, text.addStroke(new Stroke().color(0xFF0000)), "outline on top");
            int[] once = text.render().getPixels();
            Check.equal(2, text.addStroke(new Stroke().color(0xFF0000)), "the same outline again");
            Check.equal(once, text.render().getPixels(), "same picture");
            Check.equal(2, text.addStroke(new Stroke().color(0xFF0000).position(Stroke.Position.INSIDE)),
                    "an inside stroke, still the one stroke");
            Check.isTrue(!Arrays.equals(once, text.render().getPixels()), "moved inside");
        }
    }
}
