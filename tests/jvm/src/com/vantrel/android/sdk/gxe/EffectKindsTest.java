package com.vantrel.android.sdk.gxe;

import com.vantrel.android.sdk.gxe.effect.Bevel;
import com.vantrel.android.sdk.gxe.effect.Emboss;
import com.vantrel.android.sdk.gxe.effect.Glow;
import com.vantrel.android.sdk.gxe.effect.LinearGradient;
import com.vantrel.android.sdk.gxe.effect.Pattern;
import com.vantrel.android.sdk.gxe.effect.RadialGradient;
import com.vantrel.android.sdk.gxe.effect.Shadow;
import com.vantrel.android.sdk.gxe.effect.Stroke;
import com.vantrel.android.sdk.gxe.util.GxError;
import java.util.Arrays;
import java.util.LinkedHashMap;
import java.util.Map;
import java.util.function.ToIntFunction;
import jvmtest.Check;
import jvmtest.Test;

/** Every effect kind through the builder API, and what the natives added for them refuse. */
public class EffectKindsTest {
    /** A 40 px BLOCK: one solid square of ink, ink box known from a plain render. */
    private static GxText block() {
        return Fixtures.text(Fixtures.BLOCK, Fixtures.view(60, 60), 40f, 45);
    }

    private static int red(int argb) {
        return (argb >> 16) & 0xFF;
    }

    private static int blue(int argb) {
        return argb & 0xFF;
    }

    @Test
    public void everyKindIsReachableAndDrawsSomethingOfItsOwn() {
        int[] checker = {0xFFFF0000, 0xFF0000FF, 0xFF0000FF, 0xFFFF0000};
        Map<String, ToIntFunction<GxText>> kinds = new LinkedHashMap<>();
        kinds.put("outer shadow", t -> t.addOuterShadow(new Shadow()));
        kinds.put("inner shadow", t -> t.addInnerShadow(new Shadow().color(0xFF0000).opacity(1f)));
        kinds.put("outer glow", t -> t.addOuterGlow(new Glow()));
        kinds.put("outer glow ramp", t -> t.addOuterGlow(new Glow().stop(0xFF0000, 1f, 0f).stop(0x0000FF, 1f, 1f)));
        kinds.put("inner glow", t -> t.addInnerGlow(new Glow().opacity(1f)));
        kinds.put("stroke", t -> t.addStroke(new Stroke()));
        kinds.put("linear gradient", t -> t.addLinearGradient(new LinearGradient().stop(0xFF0000, 1f, 0f)));
        kinds.put("radial gradient", t -> t.addRadialGradient(new RadialGradient().stop(0xFF0000, 1f, 0f)));
        kinds.put("pattern", t -> t.addPattern(new Pattern().tile(checker, 2, 2)));
        kinds.put("inner bevel", t -> t.addBevel(new Bevel()));
        kinds.put("outer bevel", t -> t.addBevel(new Bevel().style(Bevel.Style.OUTER)));
        kinds.put("emboss", t -> t.addEmboss(new Emboss()));
        int[] plain;
        try (GxText text = block()) {
            plain = text.render().getPixels();
        }
        for (Map.Entry<String, ToIntFunction<GxText>> kind : kinds.entrySet()) {
            try (GxText text = block()) {
                Check.equal(0, kind.getValue().applyAsInt(text), kind.getKey() + " id");
                GxText.Picture p = text.render();
                Check.isTrue(!Arrays.equals(plain, p.getPixels()), kind.getKey() + " changes the picture");
            }
        }
    }

    @Test
    public void rampsPatternsAndReliefsGetTheirColoursWhereTheyBelong() {
        try (GxText text = block()) {
            int[] ink = Fixtures.inkBox(text.render());
            int cx = (ink[0] + ink[2]) / 2;
            int cy = (ink[1] + ink[3]) / 2;

            text.addRadialGradient(new RadialGradient().stop(0xFF0000, 1f, 0f).stop(0x0000FF, 1f, 1f));
            GxText.Picture p = text.render();
            int centre = p.getPixel(cx + p.getLeft(), cy + p.getTop());
            int corner = p.getPixel(ink[0] + p.getLeft(), ink[1] + p.getTop());
            Check.isTrue(red(centre) > 200 && blue(corner) > red(corner), String.format("radial %08X .. %08X",
                    centre, corner));

            // A tile of a red and a blue column, magnified 4 times: both inside the glyph, nothing outside.
            text.clearEffects();
            text.addPattern(new Pattern().tile(new int[] {0xFFFF0000, 0xFF0000FF}, 2, 1).scale(4));
            p = text.render();
            boolean redSeen = false;
            boolean blueSeen = false;
            for (int x = ink[0] + 1; x < ink[2] - 1; x++) {
                int c = p.getPixel(x + p.getLeft(), cy + p.getTop());
                // Texels blend into their neighbours: each colour peaks once a tile.
                redSeen |= red(c) > 240 && blue(c) < 16;
                blueSeen |= blue(c) > 240 && red(c) < 16;
            }
            Check.isTrue(redSeen && blueSeen, "both tile colours inside");
            Check.pixel(0, p.getPixel(ink[2] + 2 + p.getLeft(), cy + p.getTop()), "nothing outside");

            // The glow's ramp starts at the edge with its first stop.
            text.clearEffects();
            text.addOuterGlow(new Glow().size(8).stop(0xFF0000, 1f, 0f).stop(0x0000FF, 1f, 1f));
            p = text.render();
            int edge = p.getPixel(ink[2] + 1 + p.getLeft(), cy + p.getTop());
            Check.isTrue(red(edge) > blue(edge) && (edge >>> 24) > 0, String.format("glow at the edge %08X", edge));
        }
        // Opacity 0 of a whole relief or gradient leaves the plain text: the layer opacities reach the colours.
        int[] plain;
        try (GxText text = block()) {
            plain = text.render().getPixels();
        }
        try (GxText text = block()) {
            text.addBevel(new Bevel().opacity(0f));
            Check.isTrue(Arrays.equals(plain, Fixtures.viewPixels(text.render(), 60, 60)), "invisible bevel");
            text.clearEffects();
            text.addLinearGradient(new LinearGradient().opacity(0f).stop(0xFF0000, 1f, 0f));
            Check.isTrue(Arrays.equals(plain, Fixtures.viewPixels(text.render(), 60, 60)), "invisible gradient");
        }
    }

    @Test
    public void addingAKindAgainReplacesItAndAnInsideStrokeMovesAboveTheFill() {
        try (GxText text = block()) {
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

    @Test
    public void badArgumentsAreRefusedWithAReasonAndNoLayer() {
        try (GxText text = block()) {
            float[] two = {0f, 1f};
            Fixtures.onFreshThread(() -> text.GxText_AddRadialGradientTextEffect(1f, new int[2], two, new float[1], 1f))
                    .failed(-1, "2 colours, 2 opacities and 1 positions", GxError.NONE, "radial 2, 2, 1");
            Fixtures.onFreshThread(() -> text.GxText_AddRadialGradientTextEffect(1f, null, two, two, 1f))
                    .failed(-1, "null", GxError.NONE, "radial null");
            Fixtures.onFreshThread(() -> text.GxText_AddInnerGlowTextEffect(4f, 0, 1f, new int[2], new float[1], two))
                    .failed(-1, "2 colours, 1 opacities", GxError.NONE, "glow 2, 1, 2");
            Fixtures.onFreshThread(() -> text.GxText_AddPatternTextEffect(null, 1, 1, 1f, 1f))
                    .failed(-1, "no pixels", GxError.NONE, "tile null");
            Fixtures.onFreshThread(() -> text.GxText_AddPatternTextEffect(new int[4], 0, 4, 1f, 1f))
                    .failed(-1, "0 x 4", GxError.NONE, "tile 0 x 4");
            Fixtures.onFreshThread(() -> text.GxText_AddPatternTextEffect(new int[5], 2, 3, 1f, 1f))
                    .failed(-1, "5 pixels are too few", GxError.NONE, "tile too short");
            Fixtures.onFreshThread(() -> text.GxText_AddPatternTextEffect(new int[4], 0x10000, 0x10000, 1f, 1f))
                    .failed(-1, "cannot be made", GxError.NONE, "tile overflowing");
            Check.equal(0, text.addStroke(new Stroke()), "no id was taken");
            Check.raises(IllegalArgumentException.class, () -> new Pattern().tile(new int[3], 2, 2), "short tile");
            Check.raises(IllegalArgumentException.class, () -> text.addPattern(new Pattern()), "no tile");
        }
        GxText released = new GxText();
        released.GxText_SetLine(1);
        released.GxText_finalize();
        Fixtures.onFreshThread(() -> released.GxText_AddBevelTextEffect(1, 3f, 5f, 1, 0, 0, 1f, 120f, 30f, 0, 1f, 0, 1f))
                .failed(-1, "error 19", GxError.NOT_BOUND, "released");
        released.close();
    }
}
