package com.vantrel.android.sdk.gxe;

import android.graphics.*;
import android.text.*;
import android.widget.TextView;
import com.vantrel.android.sdk.gxe.font.FontManager;
import com.vantrel.android.sdk.gxe.util.GxError;
import java.util.*;
import java.util.function.BooleanSupplier;
import jvmtest.Check;
import jvmtest.LogTap;

/**
 * The library under the text class of its first Java layer, which declares none of the natives added since,
 * and framework classes of another version, each missing a method the natives look up. It loads and says
 * which natives it left out; a native missing a framework method fails (or skips that step) with its log
 * line, sets no error code and changes nothing; the first natives work as they did.
 */
public class OlderLayerTest {
    private static final List<String> LOAD_LOG = LogTap.capture(() -> System.loadLibrary("GxEffect.glimmer.vantrel"));

    public void loadsAndNamesTheNativesItLeftOut() {
        Check.isTrue(LOAD_LOG.contains("D/GxText_JNI: JNI_OnLoad .. Done") && LOAD_LOG.contains("D/GxText_Common_JNI: "
                + "GxText_SetLayerStyle (Z)Z: not in com/vantrel/android/sdk/gxe/GxText, not registered"), "" + LOAD_LOG);
        Check.equal(8L, LOAD_LOG.stream().filter(line -> line.endsWith(", not registered")).count(), "natives left out");
    }

    // Complete classes: each has the method its framework class here lacks.
    static final class PaintWithColor extends Paint {
        public int getColor() { return color; }
    }

    static final class TextViewWithMaxLines extends TextView {
        public int getMaxLines() { return maxLines; }
    }

    static final class LayoutWithLineMax extends Layout {
        LayoutWithLineMax() { super("\u2588", new float[] {0, 1, 30, -20, 5, 0f, 12f}); }

        public float getLineMax(int line) { return 12f; }
    }

    /** A 20-pixel BLOCK in DejaVu Sans in a 60 x 50 view, everything set through complete classes. */
    private static GxText blockText() {
        GxText text = new GxText();
        Paint paint = new PaintWithColor();
        paint.textSize = 20f;
        TextView view = new TextViewWithMaxLines();
        view.width = 60;
        view.height = 50;
        Check.isTrue(text.GxText_SetFont("/usr/share/fonts/truetype/dejavu/DejaVuSans.ttf") && text.GxText_SetPaint(paint)
                && text.GxText_SetView(view) && text.GxText_SetLayout(new LayoutWithLineMax()), "set-up");
        return text;
    }

    /** The call's result and log line; it sets no error code (nothing here sets one), and if it fails, nothing changes. */
    private static void check(GxText text, boolean expected, String line, BooleanSupplier call) {
        int[] before = text.GxText_RenderTextEffect();
        boolean[] result = {!expected};
        List<String> log = LogTap.capture(() -> result[0] = call.getAsBoolean());
        Check.isTrue(result[0] == expected && log.contains(line), "result " + result[0] + ", log " + log);
        Check.equal(GxError.NONE, GxError.getLastError(), line + ": error code");
        Check.isTrue(expected || Arrays.equals(before, text.GxText_RenderTextEffect()), line + ": picture changed");
    }

    public void theFirstNativesWorkAndAMissingFrameworkMethodFailsOrSkipsItsStep() {
        GxText text = blockText();
        Check.equal(0, text.GxText_AddStrokeTextEffect(3f, 0xFF0000, 1f, 0, 1), "stroke");
        int[] pixels = text.GxText_RenderTextEffect();
        long red = Arrays.stream(pixels).filter(p -> p == 0xFFFF0000).count();
        long black = Arrays.stream(pixels).filter(p -> p == 0xFF000000).count();
        Check.isTrue(red > 20 && black > 20, "a stroked block: " + red + " red, " + black + " black pixels");
        check(text, false, "E/GxText_JNI: Java function getColor not found", () -> text.GxText_SetPaint(new Paint()));
        check(text, false, "E/GxText_JNI: GxText_SetView - Function getMaxLines not found",
                () -> text.GxText_SetView(new TextView()));
        TextView boldItalic = new TextViewWithMaxLines();
        boldItalic.typeface = Typeface.defaultFromStyle(Typeface.BOLD_ITALIC);
        check(text, true, "D/GxText_JNI: getTypeFace cannot find 'isItalic' method id",
                () -> text.GxText_SetView(boldItalic));
        FontConfig.Family family = new FontConfig.Family("sans-serif", null, new FontConfig.Font("x.ttf", 400, false, null));
        check(text, false, "E/Init_GxFontManager_JNI: Java Function getFamilies not found",
                () -> FontManager.setFontConfig(new FontConfig(family)));
        text.GxText_finalize();
    }
}
