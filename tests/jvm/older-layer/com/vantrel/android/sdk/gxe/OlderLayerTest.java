package com.vantrel.android.sdk.gxe;

import android.graphics.*;
import android.text.*;
import android.widget.TextView;
import com.vantrel.android.sdk.gxe.effect.Bevel;
import com.vantrel.android.sdk.gxe.font.FontManager;
import com.vantrel.android.sdk.gxe.util.GxError;
import java.util.*;
import java.util.function.BooleanSupplier;
import jvmtest.Check;
import jvmtest.LogTap;

/**
 * The library under the error class of its first Java layer, which declares no failure reason, and under
 * framework classes of another version, each missing a method the natives look up. It loads, says which
 * native it left out and registers the rest; a native missing a framework method fails (or skips that
 * step) with its log line, sets no error code and changes nothing.
 */
public class OlderLayerTest {
    private static final List<String> LOAD_LOG = LogTap.capture(() -> System.loadLibrary("GxEffect.glimmer.vantrel"));

    // Complete classes: each has the method its framework class here lacks.
    static final class PaintWithColor extends Paint {
        PaintWithColor() { super(20f); }

        public int getColor() { return color; }
    }

    static final class TextViewWithMaxLines extends TextView {
        TextViewWithMaxLines() { super(60, 50); }

        public int getMaxLines() { return maxLines; }
    }

    static final class LayoutWithLineMax extends Layout {
        LayoutWithLineMax() { super("\u2588", new float[] {0, 1, 30, -20, 5, 0f, 12f}); }

        public float getLineMax(int line) { return 12f; }
    }

    /** The call's result and log line; it sets no error code (none is set before), and if it fails, nothing changes. */
    private static void check(GxText text, boolean expected, String line, BooleanSupplier call) {
        int[] before = text.GxText_RenderTextEffect();
        boolean[] result = {!expected};
        List<String> log = LogTap.capture(() -> result[0] = call.getAsBoolean());
        Check.isTrue(result[0] == expected && log.contains(line), "result " + result[0] + ", log " + log);
        Check.equal(0, GxError.getLastError(), line + ": error code");
        Check.isTrue(expected || Arrays.equals(before, text.GxText_RenderTextEffect()), line + ": picture changed");
    }

    public void theNativesLeftOutAreNamedAndAMissingFrameworkMethodFailsOrSkipsItsStep() {
        Check.equal(Arrays.asList("D/GxText_Common_JNI: Error_GetReason ()Ljava/lang/String;: not in com/vantrel/"
                + "android/sdk/gxe/util/GxError, not registered"), LOAD_LOG.stream().filter(line -> line.endsWith(
                ", not registered")).collect(java.util.stream.Collectors.toList()), "natives left out");
        GxText text = new GxText();
        Check.isTrue(text.GxText_SetFont("/usr/share/fonts/truetype/dejavu/DejaVuSans.ttf")
                && text.GxText_SetPaint(new PaintWithColor()) && text.GxText_SetView(new TextViewWithMaxLines())
                && text.GxText_SetLayout(new LayoutWithLineMax()), "set-up");
        Check.isTrue(text.addBevel(new Bevel()) == 0 && text.render().getPixels().length > 0, "the later natives work");
        check(text, false, "E/GxText_JNI: Java function getColor not found", () -> text.GxText_SetPaint(new Paint()));
        check(text, false, "E/GxText_JNI: GxText_SetView - Function getMaxLines not found",
                () -> text.GxText_SetView(new TextView()));
        TextView boldItalic = new TextViewWithMaxLines();
        boldItalic.typeface = Typeface.defaultFromStyle(Typeface.BOLD_ITALIC);
        check(text, true, "D/GxText_JNI: getTypeFace cannot find 'isItalic' method id",
                () -> text.GxText_SetView(boldItalic));
        FontConfig.Family family = new FontConfig.Family("sans", null, new FontConfig.Font("x.ttf", 400, false, null));
        check(text, false, "E/Init_GxFontManager_JNI: Java Function getFamilies not found",
                () -> FontManager.setFontConfig(new FontConfig(family)));
        text.close();
    }
}
