package com.vantrel.android.sdk.gxe;

import com.vantrel.android.sdk.gxe.effect.Glow;
import com.vantrel.android.sdk.gxe.effect.LinearGradient;
import com.vantrel.android.sdk.gxe.effect.Shadow;
import com.vantrel.android.sdk.gxe.effect.Stroke;
import com.vantrel.android.sdk.gxe.util.GxError;
import java.util.List;
import jvmtest.Check;
import jvmtest.LogTap;
import jvmtest.Test;

/** Effects, margins and the rendered picture. */
public class EffectRenderTest {
    private static GxText block() {
        return Fixtures.text(Fixtures.BLOCK, Fixtures.view(60, 50), 20f, 30);
    }

    private static int[] margins(GxText text) {
        return new int[] {text.GxText_GetEffectLeftOffset(), text.GxText_GetEffectTopOffset(),
            text.GxText_GetEffectRightOffset(), text.GxText_GetEffectBottomOffset()};
    }

    @Test
    public void effectIdsCountFromZeroOneLayerPerKindAndRestartAfterClear() {
        try (GxText text = new GxText()) {
            Check.equal(0, text.GxText_AddOuterShadowTextEffect(45f, 3f, 3f, 0, 1f), "shadow");
            Check.equal(1, text.GxText_AddStrokeTextEffect(2f, 0, 1f, 0, 1), "stroke");
            Check.equal(2, text.GxText_AddOuterGlowTextEffect(4f, 0, 1f), "glow");
            Check.equal(3, text.GxText_AddInnerShadowTextEffect(45f, 3f, 3f, 0, 1f), "inner shadow");
            Check.equal(0, text.GxText_AddOuterShadowTextEffect(90f, 1f, 1f, 0, 1f), "shadow again");
            text.GxText_ClearAllTextEffect();
            Check.equal(new int[] {0, 0, 0, 0}, margins(text), "margins after clear");
            Check.equal(0, text.GxText_AddStrokeTextEffect(2f, 0, 1f, 0, 1), "first id after clear");
        }
    }

    @Test
    public void gradientArraysOfDifferentLengthsAddNothing() {
        try (GxText text = new GxText()) {
            float[] three = {0f, 0.5f, 1f};
            List<String> log = LogTap.capture(() -> {
                Check.equal(-1, text.GxText_AddLinearGradientTextEffect(0f, 1f, new int[3], three,
                        new float[2], 1f), "3, 3, 2");
                Check.equal(-1, text.GxText_AddLinearGradientTextEffect(0f, 1f, new int[2], three, three, 1f),
                        "2, 3, 3");
                Check.equal(-1, text.GxText_AddLinearGradientTextEffect(0f, 1f, null, three, three, 1f), "null");
                Check.equal(-1, text.GxText_AddLinearGradientTextEffect(0f, 1f, new int[3], three, null, 1f),
                        "null");
            });
            Check.equal(0, LogTap.count(log, "E/"), "silent: " + log);
            Check.equal(0, text.GxText_AddStrokeTextEffect(2f, 0, 1f, 0, 1), "no id was used");
            Check.equal(1, text.GxText_AddLinearGradientTextEffect(0f, 1f, new int[0], new float[0], new float[0],
                    1f), "three empty arrays add a layer");
        }
    }

    @Test
    public void clearingNeverMakesANativeText() {
        GxText fresh = new GxText();
        Check.equal(GxError.NONE, Fixtures.errorAfter(fresh::GxText_ClearAllTextEffect), "code");
        Check.equal(-1, Fixtures.handleOf(fresh), "handle");
        fresh.close();
    }

    @Test
    public void renderAddsTheMarginsAroundTheView() {
        try (GxText text = block()) {
            Check.equal(new int[] {0, 0}, text.GxText_GetDrawingBitmapSize(), "size before a render");
            int[] plain = text.GxText_RenderTextEffect();
            Check.equal(60 * 50, plain.length, "pixels without effects");
            Check.equal(new int[] {60, 50}, text.GxText_GetDrawingBitmapSize(), "size without effects");

            // The render added the plain-text layer: the stroke is not the first layer.
            Check.equal(1, text.GxText_AddStrokeTextEffect(4f, 0xFF0000, 1f, 0, 1), "stroke");
            int[] m = margins(text);
            Check.isTrue(m[0] > 0 && m[0] == m[1] && m[1] == m[2] && m[2] == m[3], "even margins");
            int w = 60 + 2 * m[0];
            int h = 50 + 2 * m[0];
            int[] pixels = text.GxText_RenderTextEffect();
            Check.equal(w * h, pixels.length, "pixels");
            Check.equal(new int[] {w, h}, text.GxText_GetDrawingBitmapSize(), "size");

            // The text's origin moved to (left, top); the stroke lies outside the glyph.
            int[] glyph = Fixtures.blockAt(m[0], 30 + m[1]);
            int mid = (glyph[1] + glyph[3]) / 2;
            Check.pixel(0xFF000000, pixels[mid * w + (glyph[0] + glyph[2]) / 2], "glyph");
            Check.pixel(0xFFFF0000, pixels[mid * w + glyph[0] - 2], "stroke left of the glyph");
            Check.pixel(0xFFFF0000, pixels[mid * w + glyph[2] + 1], "stroke right of the glyph");
            Check.pixel(0xFFFF0000, pixels[(glyph[3] + 1) * w + (glyph[0] + glyph[2]) / 2], "stroke below");
            Check.pixel(0, pixels[mid * w + glyph[2] + 8], "clear beyond the stroke");
        }
    }

    @Test
    public void shadowAtAngleZeroFallsLeft() {
        try (GxText text = block()) {
            Check.equal(0, text.GxText_AddOuterShadowTextEffect(0f, 10f, 0f, 0x00FF00, 1f), "shadow");
            int[] m = margins(text);
            Check.isTrue(m[0] >= 10 && m[0] > m[2], "left margin " + m[0] + ", right " + m[2]);
            GxText.Picture picture = text.render();
            Check.equal(m[0], picture.getLeft(), "picture margin");
            int[] glyph = Fixtures.blockAt(m[0], 30 + m[1]);
            int mid = (glyph[1] + glyph[3]) / 2;
            Check.pixel(0xFF00FF00, picture.getPixel(glyph[0] - 5, mid), "shadow");
            Check.pixel(0xFF000000, picture.getPixel(glyph[0] + 5, mid), "glyph over the shadow");
            Check.pixel(0, picture.getPixel(glyph[2] + 2, mid), "nothing on the right");
        }
    }

    @Test
    public void linearGradientFillsTheGlyphFromFirstToLastStop() {
        try (GxText text = Fixtures.text(Fixtures.BLOCK, Fixtures.view(60, 50), 40f, 40)) {
            int id = text.addLinearGradient(new LinearGradient().angle(0).stop(0xFF0000, 1f, 0f)
                    .stop(0x0000FF, 1f, 1f));
            Check.equal(0, id, "id");
            GxText.Picture picture = text.render();
            int[] ink = Fixtures.inkBox(picture);
            int y = (ink[1] + ink[3]) / 2;
            int left = picture.getPixel(ink[0] + 2, y);
            int right = picture.getPixel(ink[2] - 3, y);
            Check.isTrue((left >>> 24) == 0xFF && (right >>> 24) == 0xFF, "opaque fill");
            Check.isTrue(((left >> 16) & 0xFF) > (left & 0xFF), String.format("red on the left: %08X", left));
            Check.isTrue(((right >> 16) & 0xFF) < (right & 0xFF), String.format("blue on the right: %08X", right));
        }
    }

    @Test
    public void publicApiRendersThePictureWithItsMargins() {
        try (GxText text = block()) {
            text.addStroke(new Stroke().size(3).color(0x0000FF).position(Stroke.Position.OUTSIDE));
            text.addOuterGlow(new Glow().size(6).color(0xFFFF00).opacity(0.5f));
            text.addInnerShadow(new Shadow().angle(45).distance(2).size(2));
            int[] m = text.getEffectMargins();
            GxText.Picture picture = text.render();
            Check.equal(new int[] {m[0], m[1], m[2], m[3]},
                    new int[] {picture.getLeft(), picture.getTop(), picture.getRight(), picture.getBottom()},
                    "margins");
            Check.equal(60 + m[0] + m[2], picture.getWidth(), "width");
            Check.equal(50 + m[1] + m[3], picture.getHeight(), "height");
            Check.equal(picture.getPixels(), text.render().getPixels(), "a second render draws the same");
            text.clearEffects();
            Check.equal(new int[] {0, 0, 0, 0}, text.getEffectMargins(), "cleared");
        }
    }

    @Test
    public void renderWithoutAnythingSetIsAnEmptyPicture() {
        try (GxText text = new GxText()) {
            GxText.Picture picture = text.render();
            Check.equal(0, picture.getWidth(), "width");
            Check.equal(0, picture.getPixels().length, "pixels");
        }
    }
}
