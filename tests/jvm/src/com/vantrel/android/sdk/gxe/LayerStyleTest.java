package com.vantrel.android.sdk.gxe;

import com.vantrel.android.sdk.gxe.effect.Bevel;
import com.vantrel.android.sdk.gxe.effect.Glow;
import com.vantrel.android.sdk.gxe.effect.LinearGradient;
import com.vantrel.android.sdk.gxe.effect.Shadow;
import com.vantrel.android.sdk.gxe.effect.Stroke;
import java.util.Arrays;
import java.util.List;
import java.util.function.Consumer;
import jvmtest.Check;
import jvmtest.Test;

/**
 * The builder API's two modes: layer style by default (a fixed stacking order, inner effects inside the
 * glyphs, a fill opacity) and the engine's exact behaviour one switch away.
 */
public class LayerStyleTest {
    /** An "H" of DejaVu Sans at 48 px in an 80 x 80 view: holes between the bars, room for the effects. */
    static GxText letterH() {
        return Fixtures.text("H", Fixtures.view(80, 80), 48f, 60);
    }

    /** The alpha of each view pixel of a picture (the margins cut off), row by row. */
    static int[] viewAlpha(GxText.Picture p) {
        int[] alpha = Fixtures.viewPixels(p, 80, 80);
        for (int i = 0; i < alpha.length; i++) {
            alpha[i] >>>= 24;
        }
        return alpha;
    }

    /** Glyph coverage of the plain "H": the alpha of an effect-less render in opaque black. */
    private static int[] coverage() {
        try (GxText text = letterH()) {
            return viewAlpha(text.render());
        }
    }

    /** How many view pixels are painted where the coverage passes the test. */
    private static int painted(GxText.Picture p, int[] coverage, java.util.function.IntPredicate where) {
        int[] alpha = viewAlpha(p);
        int n = 0;
        for (int i = 0; i < alpha.length; i++) {
            if (alpha[i] != 0 && where.test(coverage[i])) {
                n++;
            }
        }
        return n;
    }

    private static GxText.Picture render(boolean exact, Consumer<GxText> effects) {
        try (GxText text = letterH()) {
            Check.isTrue(text.setExactMode(exact), "mode");
            effects.accept(text);
            return text.render();
        }
    }

    @Test
    public void insideEffectsNeverPaintOutsideTheGlyphs() {
        int[] coverage = coverage();
        List<Consumer<GxText>> inside = Arrays.asList(
                t -> t.addStroke(new Stroke().size(4).color(0xFFD000).position(Stroke.Position.INSIDE)),
                t -> t.addInnerGlow(new Glow().size(6).color(0xFFFF00).opacity(1f)),
                t -> t.addInnerShadow(new Shadow().angle(45).distance(4).size(3).opacity(1f)),
                t -> t.addBevel(new Bevel().size(5).style(Bevel.Style.INNER)));
        for (int i = 0; i < inside.size(); i++) {
            GxText.Picture p = render(false, inside.get(i));
            Check.equal(0, painted(p, coverage, c -> c == 0), "effect " + i + ": pixels painted outside");
        }
        // The engine as it is paints the inside band over the whole box.
        Check.isTrue(painted(render(true, inside.get(0)), coverage, c -> c == 0) > 100, "exact inside stroke");
    }

    @Test
    public void stackingOrderDoesNotDependOnTheOrderOfAdding() {
        Consumer<GxText> stroke = t -> t.addStroke(new Stroke().size(3).color(0x2040C0));
        Consumer<GxText> shadow = t -> t.addOuterShadow(new Shadow().angle(90).distance(6).size(2).opacity(1f));
        Consumer<GxText> glow = t -> t.addOuterGlow(new Glow().size(6).color(0xFF8000));
        Consumer<GxText> innerShadow = t -> t.addInnerShadow(new Shadow().angle(45).distance(2).size(2));
        Consumer<GxText> gradient = t -> t.addLinearGradient(
                new LinearGradient().stop(0xFF0000, 1f, 0f).stop(0xFFFF00, 1f, 1f));
        List<List<Consumer<GxText>>> orders = Arrays.asList(
                Arrays.asList(stroke, shadow, glow, innerShadow, gradient),
                Arrays.asList(gradient, innerShadow, glow, shadow, stroke),
                Arrays.asList(shadow, gradient, stroke, innerShadow, glow));
        int[] first = null;
        for (List<Consumer<GxText>> order : orders) {
            int[] pixels = render(false, t -> order.forEach(add -> add.accept(t))).getPixels();
            if (first == null) {
                first = pixels;
            } else {
                Check.equal(first, pixels, "same picture in another order");
            }
        }

        // The outline lies over the shadow: below the H's foot, where both reach, the stroke's colour shows.
        try (GxText text = letterH()) {
            int[] ink = Fixtures.inkBox(text.render());
            shadow.accept(text);
            stroke.accept(text);
            GxText.Picture p = text.render();
            int x = p.getLeft() + ink[0] + 2;
            int y = p.getTop() + 60 + 1;
            Check.pixel(0xFF2040C0, p.getPixel(x, y), "stroke over shadow");
        }
        // The engine as it is draws them by the order of adding.
        int[] strokeFirst = render(true, t -> { stroke.accept(t); shadow.accept(t); }).getPixels();
        int[] shadowFirst = render(true, t -> { shadow.accept(t); stroke.accept(t); }).getPixels();
        Check.isTrue(!Arrays.equals(strokeFirst, shadowFirst), "exact: the order of adding shows");
    }

    @Test
    public void fillOpacityFadesTheFillAlone() {
        int[] coverage = coverage();
        Consumer<GxText> outline = t -> t.addStroke(new Stroke().size(3).color(0xFF0000));
        GxText.Picture empty = render(false, t -> {
            outline.accept(t);
            Check.isTrue(t.setFillOpacity(0f), "fill opacity");
        });
        Check.equal(0, painted(empty, coverage, c -> c == 255), "painted inside the glyphs");
        Check.isTrue(painted(empty, coverage, c -> c == 0) > 100, "the outline stays");

        GxText.Picture half = render(false, t -> t.setFillOpacity(0.5f));
        int[] alpha = viewAlpha(half);
        for (int i = 0; i < alpha.length; i++) {
            if (coverage[i] == 255) {
                Check.isTrue(Math.abs(alpha[i] - 128) <= 1, "half alpha inside: " + alpha[i]);
            }
        }
        // The engine as it is keeps the fill opaque.
        GxText.Picture exact = render(true, t -> {
            outline.accept(t);
            t.setFillOpacity(0f);
        });
        Check.isTrue(painted(exact, coverage, c -> c == 255) > 300, "exact: opaque fill");
    }

    @Test
    public void exactModeIsTheEngineAsIsAndTheSwitchKeepsTheEffects() {
        int[] natives;
        try (GxText text = letterH()) {
            text.GxText_AddStrokeTextEffect(3f, 0x2040C0, 1f, 0, 1);
            text.GxText_AddOuterShadowTextEffect(90f, 6f, 2f, 0, 1f);
            text.GxText_AddInnerGlowTextEffect(4f, 0xFFFF00, 1f, null, null, null);
            natives = text.GxText_RenderTextEffect();
        }
        Consumer<GxText> effects = t -> {
            t.addStroke(new Stroke().size(3).color(0x2040C0));
            t.addOuterShadow(new Shadow().angle(90).distance(6).size(2).color(0).opacity(1f));
            t.addInnerGlow(new Glow().size(4).color(0xFFFF00).opacity(1f));
        };
        Check.equal(natives, render(true, effects).getPixels(), "exact mode from the start");
        int[] layered = render(false, effects).getPixels();
        Check.isTrue(!Arrays.equals(natives, layered), "layer style differs");

        try (GxText text = letterH()) {
            effects.accept(text);
            Check.isTrue(text.setExactMode(true), "to exact");
            Check.isTrue(text.isExactMode(), "exact");
            Check.equal(natives, text.render().getPixels(), "switched to exact after adding");
            Check.isTrue(text.setExactMode(false), "back");
            Check.equal(layered, text.render().getPixels(), "switched back");
        }
    }
}
