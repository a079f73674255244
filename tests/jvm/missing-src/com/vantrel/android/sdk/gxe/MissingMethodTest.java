package com.vantrel.android.sdk.gxe;

import android.graphics.Paint;
import android.graphics.Typeface;
import android.os.LocaleList;
import android.text.FontConfig;
import android.text.Layout;
import android.widget.TextView;
import com.vantrel.android.sdk.gxe.font.FontManager;
import com.vantrel.android.sdk.gxe.util.GxError;
import java.util.List;
import java.util.concurrent.atomic.AtomicReference;
import jvmtest.Check;
import jvmtest.LogTap;
import jvmtest.Test;

/**
 * Framework classes of another version, each missing a method the natives look up: the native fails (or
 * skips the step) with its log line, sets no error code, changes nothing and leaves no exception pending.
 */
public class MissingMethodTest {
    /** The Paint here has no getColor, which SetPaint looks up without calling it; this one has. */
    static final class PaintWithColor extends Paint {
        public int getColor() {
            return 0xFF123456;
        }
    }

    /** The TextView here has no getMaxLines; this one has. */
    static final class TextViewWithMaxLines extends TextView {
        public int getMaxLines() {
            return 5;
        }
    }

    /** The Layout here has no getLineMax; this one has. */
    static final class LayoutWithLineMax extends Layout {
        LayoutWithLineMax(Layout.Line line) {
            super(Fixtures.BLOCK, 100, line);
        }

        public float getLineMax(int line) {
            return 12f;
        }
    }

    /** The FontConfig here has no getFamilies; this one has. */
    static final class FontConfigWithFamilies extends FontConfig {
        FontConfigWithFamilies(FontConfig.Family... families) {
            super(families);
        }

        public FontConfig.Family[] getFamilies() {
            return families;
        }
    }

    private static Layout.Line blockLine() {
        return new Layout.Line(0, 1, 1, 10, 30, 35, -20, 5, 0f, 12f);
    }

    /** A text of one BLOCK at size 20 drawn with DejaVu Sans, everything set with complete classes. */
    private static GxText blockText() {
        GxText text = new GxText();
        Check.isTrue(text.GxText_SetFont(Fixtures.SANS), "SetFont");
        Paint paint = new PaintWithColor();
        paint.setTextSize(20f);
        Check.isTrue(text.GxText_SetPaint(paint), "SetPaint");
        TextView view = new TextViewWithMaxLines();
        view.setSize(60, 50);
        Check.isTrue(text.GxText_SetView(view), "SetView");
        Check.isTrue(text.GxText_SetLayout(new LayoutWithLineMax(blockLine())), "SetLayout");
        return text;
    }

    /** Runs the call on a fresh thread; checks it set no error code. Returns the log it wrote. */
    private static List<String> noErrorCode(Runnable call) {
        AtomicReference<List<String>> log = new AtomicReference<>();
        int code = Fixtures.errorAfter(() -> log.set(LogTap.capture(call)));
        Check.equal(GxError.NONE, code, "error code");
        return log.get();
    }

    @Test
    public void paintWithoutAMethodOfTheTableChangesNothing() {
        try (GxText text = blockText()) {
            int[] before = text.render().getPixels();
            Paint big = new Paint();
            big.setTextSize(40f);
            List<String> log = noErrorCode(() -> Check.isTrue(!text.GxText_SetPaint(big), "SetPaint"));
            Check.isTrue(LogTap.contains(log, 'E', "GxText_JNI", "Java function getColor not found"), "log " + log);
            Check.equal(before, text.render().getPixels(), "same picture");
        }
    }

    @Test
    public void paintWithoutLocaleOrAlignNamesSkipsThoseSteps() {
        try (GxText text = blockText()) {
            int[] before = text.render().getPixels();
            Paint paint = new PaintWithColor();
            paint.setTextSize(20f);
            paint.setTextLocales(LocaleList.forLanguageTags("ja"));
            paint.setTextAlign(Paint.Align.RIGHT);
            List<String> log = noErrorCode(() -> Check.isTrue(text.GxText_SetPaint(paint), "SetPaint"));
            Check.isTrue(LogTap.contains(log, 'D', "GxText_JNI", "LocaleList cannot find 'toLanguageTags' method id"),
                    "log " + log);
            Check.isTrue(LogTap.contains(log, 'D', "GxText_JNI", "Paint.Align cannot find 'name' method id"),
                    "log " + log);
            Check.equal(before, text.render().getPixels(), "the rest of the paint was taken");
        }
    }

    @Test
    public void viewWithoutAMethodOfTheTableChangesNothing() {
        try (GxText text = blockText()) {
            text.render();
            TextView other = new TextView();
            other.setSize(90, 70);
            other.setTextColor(0xFFFF0000);
            List<String> log = noErrorCode(() -> Check.isTrue(!text.GxText_SetView(other), "SetView"));
            Check.isTrue(LogTap.contains(log, 'E', "GxText_JNI", "GxText_SetView - Function getMaxLines not found"),
                    "log " + log);
            GxText.Picture picture = text.render();
            Check.equal(new int[] {60, 50}, new int[] {picture.getWidth(), picture.getHeight()}, "old size");
            Check.pixel(0xFF000000, picture.getPixel(7, 25), "old colour");
        }
    }

    @Test
    public void typefaceWithoutIsItalicReadsOnlyBold() {
        try (GxText text = blockText()) {
            TextView view = new TextViewWithMaxLines();
            view.setSize(60, 50);
            view.setTypeface(Typeface.defaultFromStyle(Typeface.BOLD_ITALIC));
            List<String> log = noErrorCode(() -> Check.isTrue(text.GxText_SetView(view), "SetView"));
            Check.isTrue(LogTap.contains(log, 'D', "GxText_JNI", "getTypeFace cannot find 'isItalic' method id"),
                    "log " + log);
        }
    }

    @Test
    public void layoutWithoutAMethodOfTheTableChangesNothing() {
        try (GxText text = blockText()) {
            int[] before = text.render().getPixels();
            Layout moved = new Layout(Fixtures.BLOCK, 100, new Layout.Line(0, 1, 1, 0, 20, 25, -20, 5, 30f, 12f));
            List<String> log = noErrorCode(() -> Check.isTrue(!text.GxText_SetLayout(moved), "SetLayout"));
            Check.isTrue(LogTap.contains(log, 'E', "GxText_JNI", "GxText_SetLayout - Function getLineMax not found"),
                    "log " + log);
            Check.equal(before, text.render().getPixels(), "same picture");
        }
    }

    @Test
    public void fontConfigWithoutAMethodIsRefusedAndCanBeGivenAgain() {
        FontConfig.Family family = new FontConfig.Family("sans-serif", null, 0,
                new FontConfig.Font(Fixtures.SANS, 0, 400, false, null));
        List<String> log = noErrorCode(() -> Check.isTrue(!FontManager.setFontConfig(new FontConfig(family)), "old"));
        Check.isTrue(LogTap.contains(log, 'E', "Init_GxFontManager_JNI", "Java Function getFamilies not found"),
                "log " + log);
        Check.isTrue(LogTap.contains(log, 'E', "Init_GxFontManager_JNI",
                "GxFontManager_SetFontConfig - cannot convert to native families"), "log " + log);

        log = noErrorCode(() -> Check.isTrue(!FontManager.setFontConfig(new FontConfigWithFamilies(family)), "font"));
        Check.isTrue(LogTap.contains(log, 'E', "Init_GxFontManager_JNI", "Java function getFallbackFor not found"),
                "log " + log);

        // Nothing was taken: a configuration that can be read still is.
        FontConfig.Family noFonts = new FontConfig.Family(null, "und-Zsye", 0);
        Check.isTrue(FontManager.setFontConfig(new FontConfigWithFamilies(noFonts)), "readable configuration");
    }
}
