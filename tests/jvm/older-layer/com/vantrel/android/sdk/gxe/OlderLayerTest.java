package com.vantrel.android.sdk.gxe;

import android.graphics.Paint;
import android.text.Layout;
import android.widget.TextView;
import com.vantrel.android.sdk.gxe.font.FontManager;
import com.vantrel.android.sdk.gxe.util.GxError;
import java.nio.file.Files;
import java.nio.file.Paths;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.List;
import jvmtest.Check;
import jvmtest.LogTap;
import jvmtest.Test;

/**
 * The library under the Java classes of its first version, which declare none of the natives added since:
 * it loads, says at debug level which natives it left out, and the first natives work as they did.
 */
public class OlderLayerTest {
    private static final List<String> LOAD_LOG = LogTap.capture(() -> System.loadLibrary("GxEffect.glimmer.vantrel"));
    private static final String SANS = "/usr/share/fonts/truetype/dejavu/DejaVuSans.ttf";

    @Test
    public void loadsAndNamesTheNativesItLeftOut() {
        List<String> bridge = new ArrayList<>();
        for (String line : LOAD_LOG) {
            if (line.matches("^./(GxText_Common_JNI|GxError_JNI|Init_GxFontManager_JNI|GxText_JNI): .*")) {
                bridge.add(line);
            }
        }
        String gxe = "com/vantrel/android/sdk/gxe/";
        String text = ": not in " + gxe + "GxText, not registered";
        Check.equal(Arrays.asList(
                "D/GxText_Common_JNI: GxText_JNI_OnLoad",
                "D/GxError_JNI: Init .. Done",
                "D/Init_GxFontManager_JNI: Init_GxFontManager_JNI",
                "D/GxText_JNI: JNI_OnLoad .. Done",
                "D/GxText_Common_JNI: Error_GetReason ()Ljava/lang/String;: not in " + gxe + "util/GxError, not registered",
                "D/GxText_Common_JNI: GxFontManager_InstallSystemFontFamilies ()Z: not in " + gxe
                        + "font/FontManager, not registered",
                "D/GxText_Common_JNI: GxText_AddInnerGlowTextEffect (FIF[I[F[F)I" + text,
                "D/GxText_Common_JNI: GxText_AddOuterGlowGradientTextEffect (FIF[I[F[F)I" + text,
                "D/GxText_Common_JNI: GxText_AddRadialGradientTextEffect (F[I[F[FF)I" + text,
                "D/GxText_Common_JNI: GxText_AddPatternTextEffect ([IIIFF)I" + text,
                "D/GxText_Common_JNI: GxText_AddBevelTextEffect (IFFIIIFFFIFIF)I" + text,
                "D/GxText_Common_JNI: GxText_AddEmbossTextEffect (IFFIIIFFFIFIF)I" + text,
                "D/GxText_Common_JNI: GxText_SetTextOpacity (F)Z" + text,
                "D/GxText_Common_JNI: GxText_SetLayerStyle (Z)Z" + text,
                "D/GxText_Common_JNI: GxText_JNI_OnLoad .... done"), bridge, "load log");
    }

    @Test
    public void theFirstNativesWorkAsBefore() throws Exception {
        Check.isTrue(FontManager.insertFontData("older-sans", Files.readAllBytes(Paths.get(SANS))), "insert");
        GxText text = new GxText();
        Check.isTrue(text.GxText_SetFont("older-sans"), "SetFont");
        Paint paint = new Paint();
        paint.setTextSize(20f);
        Check.isTrue(text.GxText_SetPaint(paint), "SetPaint");
        TextView view = new TextView();
        view.setSize(60, 50);
        view.setMaxLines(1);
        Check.isTrue(text.GxText_SetView(view), "SetView");
        Check.isTrue(text.GxText_SetLayout(new Layout("\u2588", 100,
                new Layout.Line(0, 1, 1, 10, 30, 35, -20, 5, 0f, 12f))), "SetLayout");
        Check.equal(0, text.GxText_AddStrokeTextEffect(3f, 0xFF0000, 1f, 0, 1), "stroke");
        int[] pixels = text.GxText_RenderTextEffect();
        int[] size = text.GxText_GetDrawingBitmapSize();
        Check.equal(size[0] * size[1], pixels.length, "pixels");
        int red = 0;
        int black = 0;
        for (int p : pixels) {
            red += p == 0xFFFF0000 ? 1 : 0;
            black += p == 0xFF000000 ? 1 : 0;
        }
        Check.isTrue(red > 20 && black > 20, "a stroked block: " + red + " red, " + black + " black");
        Check.equal(0, GxError.getLastError(), "no error");
        text.GxText_finalize();
    }
}
