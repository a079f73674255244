package com.vantrel.android.sdk.gxe;

import android.graphics.Paint;
import android.graphics.Typeface;
import android.os.LocaleList;
import android.text.Layout;
import android.text.SpannableString;
import android.text.style.BackgroundColorSpan;
import android.widget.TextView;
import java.util.Arrays;
import java.util.List;
import com.vantrel.android.sdk.gxe.util.GxError;
import jvmtest.Check;
import jvmtest.LogTap;
import jvmtest.Test;

/** Paint, view, line limit and layout reaching the native text, seen in what it renders. */
public class TextStateTest {
    private static final int TOP_LEFT = 0x33;
    private static final int CENTER_VERTICAL_LEFT = 0x13;
    private static final int BOTTOM_LEFT = 0x53;

    /** Five lines of one BLOCK each, 30 pixels apart, the n-th line's pen at x = 12 n. */
    private static Layout fiveLines() {
        Layout.Line[] lines = new Layout.Line[5];
        for (int i = 0; i < 5; i++) {
            int baseline = 20 + 30 * i;
            lines[i] = new Layout.Line(i, i + 1, i + 1, baseline - 20, baseline, baseline + 5, -20, 5, 12f * i, 12f);
        }
        return new Layout(Fixtures.BLOCK.repeat(5), 100, lines);
    }

    private static GxText blockText(TextView view) {
        GxText text = new GxText();
        Check.isTrue(text.GxText_SetFont(Fixtures.SANS), "SetFont");
        Check.isTrue(text.GxText_SetPaint(Fixtures.paint(20f)), "SetPaint");
        Check.isTrue(text.GxText_SetView(view), "SetView");
        return text;
    }

    @Test
    public void textColourComesFromTheViewNotThePaint() {
        TextView view = Fixtures.view(60, 50);
        view.setTextColor(0xFF2040C0);
        Paint paint = Fixtures.paint(20f);
        paint.setColor(0xFFFF0000);
        try (GxText text = blockText(view)) {
            Check.isTrue(text.GxText_SetPaint(paint), "SetPaint");
            Check.isTrue(text.GxText_SetLayout(Fixtures.line(Fixtures.BLOCK, 30, -20, 5, 0f, 12f)), "SetLayout");
            GxText.Picture picture = text.render();
            Check.pixel(0xFF2040C0, picture.getPixel(7, 25), "inside the block");
            Check.pixel(0, picture.getPixel(40, 25), "beside it");
        }
    }

    @Test
    public void paddingMovesTheLinesAndTheBitmapKeepsTheViewSize() {
        TextView view = Fixtures.view(60, 50);
        view.setPadding(5, 7, 3, 2);
        try (GxText text = blockText(view)) {
            Check.isTrue(text.GxText_SetLayout(Fixtures.line(Fixtures.BLOCK, 30, -20, 5, 2.9f, 12f)), "SetLayout");
            GxText.Picture picture = text.render();
            Check.equal(new int[] {60, 50}, new int[] {picture.getWidth(), picture.getHeight()}, "size");
            // x = paddingLeft + the line's left truncated; y = paddingTop + baseline.
            Check.equal(Fixtures.blockAt(5 + 2, 7 + 30), Fixtures.inkBox(picture), "ink");
        }
    }

    @Test
    public void centreGravityMovesTheFirstBaselineByHalfTheRoomLeft() {
        TextView view = Fixtures.view(60, 100);
        view.setGravity(CENTER_VERTICAL_LEFT);
        view.setPadding(0, 4, 0, 6);
        try (GxText text = blockText(view)) {
            Check.isTrue(text.GxText_SetLayout(Fixtures.line(Fixtures.BLOCK, 20, -20, 5, 0f, 12f)), "SetLayout");
            // Room: 100 - 4 - 6 = 90 against a line bottom of 25: down by (90 - 25) / 2 = 32.
            Check.equal(Fixtures.blockAt(0, 4 + 20 + 32), Fixtures.inkBox(text.render()), "ink");
        }
    }

    @Test
    public void bottomGravityShowsTheLastLinesUpToTheLimit() {
        TextView view = Fixtures.view(80, 100);
        view.setGravity(BOTTOM_LEFT);
        view.setPadding(0, 0, 0, 3);
        try (GxText text = blockText(view)) {
            Check.isTrue(text.GxText_SetLine(2), "SetLine");
            Check.isTrue(text.GxText_SetLayout(fiveLines()), "SetLayout");
            GxText.Picture picture = text.render();
            // Lines 3 and 4: the last line's bottom sits on the padding, 100 - 3 - (145 - 140) = 92.
            int[] line3 = Fixtures.blockAt(36, 62);
            int[] line4 = Fixtures.blockAt(48, 92);
            Check.equal(new int[] {line3[0], line3[1], line4[2], line4[3]}, Fixtures.inkBox(picture), "ink");
            Check.isTrue(!Fixtures.inkInRows(picture, line3[3], line4[1]), "gap between the two lines");
            Check.pixel(0, picture.getPixel(line4[0] + 6, line3[1] + 6), "line 4's column beside line 3");
        }
    }

    @Test
    public void lineLimitWinsOverMaxLinesAndNeitherShowsNothing() {
        TextView view = Fixtures.view(80, 160);
        view.setMaxLines(3);
        try (GxText text = blockText(view)) {
            Check.isTrue(text.GxText_SetLayout(fiveLines()), "SetLayout");
            int[] third = Fixtures.blockAt(24, 80);
            Check.equal(new int[] {0, Fixtures.blockAt(0, 20)[1], third[2], third[3]},
                    Fixtures.inkBox(text.render()), "three lines by maxLines");

            Check.isTrue(text.GxText_SetLine(1), "SetLine");
            Check.isTrue(text.GxText_SetLayout(fiveLines()), "SetLayout");
            Check.equal(Fixtures.blockAt(0, 20), Fixtures.inkBox(text.render()), "one line by the limit");
        }
        view.setMaxLines(0);
        try (GxText text = blockText(view)) {
            Check.isTrue(text.GxText_SetLayout(fiveLines()), "SetLayout");
            Check.isNull(Fixtures.inkBox(text.render()), "no limit and no maxLines");
        }
    }

    @Test
    public void aTextHoldingU0000FailsTheLayoutAndChangesNothing() {
        try (GxText text = blockText(Fixtures.view(60, 50))) {
            Check.isTrue(text.GxText_SetLayout(Fixtures.line(Fixtures.BLOCK, 30, -20, 5, 0f, 12f)), "SetLayout");
            int[] before = text.render().getPixels();
            String nul = Fixtures.BLOCK + "\u0000" + Fixtures.BLOCK;
            Check.isTrue(!text.GxText_SetLayout(Fixtures.line(nul, 40, -20, 5, 20f, 36f)), "refused");
            Check.isTrue(GxError.getLastReason().contains("U+0000"), "reason: " + GxError.getLastReason());
            Check.equal(before, text.render().getPixels(), "the old text and lines are kept");
        }
    }

    @Test
    public void backgroundIsTheLastSpansColourOverTheLineBox() {
        SpannableString spanned = new SpannableString(Fixtures.BLOCK);
        spanned.setSpan(new BackgroundColorSpan(0xFF00FF00), 0, 1, 0);
        spanned.setSpan(new BackgroundColorSpan(0xFFFF0000), 0, 1, 0);
        try (GxText text = blockText(Fixtures.view(60, 50))) {
            Check.isTrue(text.GxText_SetLayout(Fixtures.line(spanned, 40, -38, 8, 0f, 12f)), "SetLayout");
            GxText.Picture picture = text.render();
            Check.pixel(0xFFFF0000, picture.getPixel(6, 4), "box above the glyph");
            Check.pixel(0xFFFF0000, picture.getPixel(6, 47), "box below the glyph");
            Check.pixel(0xFF000000, picture.getPixel(6, 30), "glyph over the box");
            Check.pixel(0, picture.getPixel(40, 30), "outside the box");
        }
        try (GxText text = blockText(Fixtures.view(60, 50))) {
            Check.isTrue(text.GxText_SetLayout(Fixtures.line(Fixtures.BLOCK, 40, -38, 8, 0f, 12f)), "SetLayout");
            Check.pixel(0, text.render().getPixel(6, 4), "no span, no box");
        }
    }

    @Test
    public void paintSizeScaleAndSpacingReachTheGlyphs() {
        int[] base = Fixtures.blockInk();
        try (GxText text = blockText(Fixtures.view(200, 100))) {
            Paint paint = Fixtures.paint(40f);
            Check.isTrue(text.GxText_SetPaint(paint), "SetPaint");
            Check.isTrue(text.GxText_SetLayout(Fixtures.line(Fixtures.BLOCK, 60, -45, 10, 0f, 40f)), "SetLayout");
            int[] big = Fixtures.inkBox(text.render());
            int height = base[3] - base[1];
            Check.isTrue(Math.abs((big[3] - big[1]) - 2 * height) <= 2, "twice the size: " + Arrays.toString(big));

            paint.setTextScaleX(2f);
            Check.isTrue(text.GxText_SetPaint(paint), "SetPaint");
            Check.isTrue(text.GxText_SetLayout(Fixtures.line(Fixtures.BLOCK, 60, -45, 10, 0f, 40f)), "SetLayout");
            int[] wide = Fixtures.inkBox(text.render());
            Check.isTrue(Math.abs((wide[2] - wide[0]) - 2 * (big[2] - big[0])) <= 2,
                    "twice as wide: " + Arrays.toString(wide) + " vs " + Arrays.toString(big));
        }
        try (GxText text = blockText(Fixtures.view(200, 100))) {
            String two = Fixtures.BLOCK + Fixtures.BLOCK;
            Check.isTrue(text.GxText_SetLayout(Fixtures.line(two, 40, -20, 5, 0f, 40f)), "SetLayout");
            int[] tight = Fixtures.inkBox(text.render());
            Paint spaced = Fixtures.paint(20f);
            spaced.setLetterSpacing(0.5f);
            spaced.setTextLocales(LocaleList.forLanguageTags("en-US"));
            spaced.setFontFeatureSettings("'liga' 0");
            spaced.setTextAlign(Paint.Align.CENTER);
            Check.isTrue(text.GxText_SetPaint(spaced), "SetPaint");
            Check.isTrue(text.GxText_SetLayout(Fixtures.line(two, 40, -20, 5, 0f, 40f)), "SetLayout");
            int[] loose = Fixtures.inkBox(text.render());
            // Half an em (10 pixels) more between the two blocks.
            Check.isTrue((loose[2] - loose[0]) - (tight[2] - tight[0]) >= 10,
                    "letter spacing: " + Arrays.toString(loose) + " vs " + Arrays.toString(tight));
        }
    }

    @Test
    public void viewWithoutTypefaceKeepsTheStyleBits() {
        TextView view = Fixtures.view(60, 50);
        Layout layout = Fixtures.line(Fixtures.BLOCK, 30, -20, 5, 0f, 12f);
        int[] upright;
        int[] italic;
        try (GxText text = blockText(view)) {
            Check.isTrue(text.GxText_SetLayout(layout), "SetLayout");
            upright = text.render().getPixels();
            view.setTypeface(Typeface.defaultFromStyle(Typeface.ITALIC));
            Check.isTrue(text.GxText_SetView(view), "SetView italic");
            italic = text.render().getPixels();
            Check.isTrue(!Arrays.equals(upright, italic), "italic draws slanted");
            view.setTypeface(null);
            Check.isTrue(text.GxText_SetView(view), "SetView without typeface");
            Check.equal(italic, text.render().getPixels(), "still italic");
            view.setTypeface(Typeface.defaultFromStyle(Typeface.NORMAL));
            Check.isTrue(text.GxText_SetView(view), "SetView normal");
            Check.equal(upright, text.render().getPixels(), "upright again");
        }
    }

    @Test
    public void nullArgumentsAreRefused() {
        try (GxText text = blockText(Fixtures.view(60, 50))) {
            int handle = Fixtures.handleOf(text);
            List<String> log = LogTap.capture(() -> Check.isTrue(!text.GxText_SetLayout(null), "SetLayout(null)"));
            Check.isTrue(LogTap.contains(log, 'D', "GxText_JNI", "GxText_SetLayout - RH(" + handle + ") null"),
                    "log " + log);
            Check.isTrue(!text.GxText_SetPaint(null), "SetPaint(null)");
            Check.isTrue(!text.GxText_SetView(null), "SetView(null)");
        }
    }

    /** A layout whose line widths cannot be read. */
    private static final class BrokenLayout extends Layout {
        BrokenLayout(CharSequence text) {
            super(text, 100, new Layout.Line(0, 1, 1, 0, 20, 25, -20, 5, 0f, 12f));
        }

        @Override
        public float getLineWidth(int line) {
            throw new IllegalStateException("no widths today");
        }
    }

    @Test
    public void layoutThatThrowsChangesNothingAndLeavesNoException() {
        try (GxText text = blockText(Fixtures.view(60, 50))) {
            Check.isTrue(text.GxText_SetLayout(Fixtures.line(Fixtures.BLOCK, 30, -20, 5, 0f, 12f)), "SetLayout");
            int[] before = text.render().getPixels();
            List<String> log = LogTap.capture(
                    () -> Check.isTrue(!text.GxText_SetLayout(new BrokenLayout("x")), "SetLayout(broken)"));
            Check.isTrue(LogTap.contains(log, 'E', "GxText_JNI", "GxText_SetLayout - Java exception"), "log " + log);
            Check.equal(before, text.render().getPixels(), "same picture");
        }
    }

    @Test
    public void layoutWithoutLinesDrawsNothing() {
        try (GxText text = blockText(Fixtures.view(60, 50))) {
            Check.isTrue(text.GxText_SetLayout(new Layout(Fixtures.BLOCK, 100)), "SetLayout");
            Check.isNull(Fixtures.inkBox(text.render()), "ink");
            // A text of characters that are not UTF-16 pairs still makes the trip (U+0000 does not: below).
            Check.isTrue(text.GxText_SetLayout(Fixtures.line("\uD800x", 30, -20, 5, 0f, 12f)), "SetLayout");
        }
    }
}
